#include "apps/kelform/terminal_canvas.h"

#include <algorithm>

#include "keltext/host/charset.h"

namespace kel::kelform {

Canvas::Canvas(int rows, int cols)
    : rows_(std::max(rows, 0)), cols_(std::max(cols, 0)), cells_(static_cast<std::size_t>(rows_) * cols_) {}

const Cell& Canvas::at(int row, int col) const {
    static constexpr Cell kOutside{};
    if (row < 0 || col < 0 || row >= rows_ || col >= cols_) return kOutside;
    return cells_[static_cast<std::size_t>(row) * cols_ + col];
}

void Canvas::put(int row, int col, char32_t ch, const CellStyle& style) {
    if (row < 0 || col < 0 || row >= rows_ || col >= cols_) return;
    // Control characters would move the terminal's cursor: show them as a middle dot.
    if (ch < 0x20 || (ch >= 0x7F && ch < 0xA0)) ch = U'\u00B7';
    cells_[static_cast<std::size_t>(row) * cols_ + col] = Cell{ch, style};
}

int Canvas::put_text(int row, int col, std::string_view cp1252, const CellStyle& style, int max_cols) {
    int n = 0;
    for (char c : cp1252) {
        if (max_cols >= 0 && n >= max_cols) break;
        put(row, col + n, to_unicode(static_cast<uint8_t>(c)), style);
        ++n;
    }
    return n;
}

int Canvas::put_utf8(int row, int col, std::string_view s, const CellStyle& style, int max_cols) {
    int n = 0;
    std::size_t i = 0;
    while (i < s.size()) {
        if (max_cols >= 0 && n >= max_cols) break;
        const auto b = static_cast<unsigned char>(s[i]);
        const int len = b < 0x80 ? 1 : b >= 0xF0 ? 4 : b >= 0xE0 ? 3 : b >= 0xC0 ? 2 : 1;
        char32_t cp = len == 1 ? b : b & (0xFF >> (len + 1));
        for (int k = 1; k < len && i + k < s.size(); ++k) cp = cp << 6 | (static_cast<unsigned char>(s[i + k]) & 0x3F);
        put(row, col + n, cp, style);
        ++n;
        i += static_cast<std::size_t>(len);
    }
    return n;
}

void Canvas::fill(int row, int col, int height, int width, const CellStyle& style, char32_t ch) {
    for (int r = row; r < row + height; ++r)
        for (int c = col; c < col + width; ++c) put(r, c, ch, style);
}

void Canvas::box(int row, int col, int height, int width, const CellStyle& style) {
    if (height < 2 || width < 2) return;
    fill(row, col, height, width, style);
    for (int c = col + 1; c < col + width - 1; ++c) {
        put(row, c, U'─', style);
        put(row + height - 1, c, U'─', style);
    }
    for (int r = row + 1; r < row + height - 1; ++r) {
        put(r, col, U'│', style);
        put(r, col + width - 1, U'│', style);
    }
    put(row, col, U'┌', style);
    put(row, col + width - 1, U'┐', style);
    put(row + height - 1, col, U'└', style);
    put(row + height - 1, col + width - 1, U'┘', style);
}

std::string Canvas::row_text(int row) const {
    std::string out;
    if (row < 0 || row >= rows_) return out;
    for (int c = 0; c < cols_; ++c) append_utf8(out, at(row, c).ch);
    while (!out.empty() && out.back() == ' ') out.pop_back();
    return out;
}

}  // namespace kel::kelform

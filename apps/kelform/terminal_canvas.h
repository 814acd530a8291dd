#pragma once
// What the terminal form draws, as a grid of character cells with styles, before it reaches
// the terminal. Drawing into a canvas needs no terminal, so the layout is tested directly and
// the curses side only copies cells to the screen.
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/host/font.h"

namespace kel::kelform {

struct CellStyle {
    std::optional<Colour> fg;  // host colours; nothing = the terminal's own
    std::optional<Colour> bg;
    bool bold = false;
    bool reverse = false;
    bool underline = false;
    bool dim = false;
    bool operator==(const CellStyle&) const = default;
};

struct Cell {
    char32_t ch = U' ';
    CellStyle style;
    bool operator==(const Cell&) const = default;
};

class Canvas {
public:
    Canvas(int rows, int cols);
    int rows() const { return rows_; }
    int cols() const { return cols_; }

    const Cell& at(int row, int col) const;
    // Cells outside the canvas are skipped, so callers may draw partly off screen.
    void put(int row, int col, char32_t ch, const CellStyle& style);
    // Text in the host's single-byte set (labels, field texts); returns the columns used.
    int put_text(int row, int col, std::string_view cp1252, const CellStyle& style, int max_cols = -1);
    // Text of the program's own (UTF-8 literals such as box drawing).
    int put_utf8(int row, int col, std::string_view utf8, const CellStyle& style, int max_cols = -1);
    void fill(int row, int col, int height, int width, const CellStyle& style, char32_t ch = U' ');
    void box(int row, int col, int height, int width, const CellStyle& style);

    // The terminal cursor: where the caret of the focused field stands, or hidden.
    void set_cursor(int row, int col) { cursor_ = {row, col}; }
    std::optional<std::pair<int, int>> cursor() const { return cursor_; }

    // One row as UTF-8, trailing blanks dropped (for tests and plain captures).
    std::string row_text(int row) const;

private:
    int rows_, cols_;
    std::vector<Cell> cells_;
    std::optional<std::pair<int, int>> cursor_;
};

}  // namespace kel::kelform

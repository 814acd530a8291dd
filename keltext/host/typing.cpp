#include "keltext/host/typing.h"

#include <algorithm>

#include "keltext/host/charset.h"

namespace kel {

bool in_set(std::string_view set, int code) {
    if (code <= 0 || code > 255) return false;
    return set.find(static_cast<char>(code)) != std::string_view::npos;
}

int16_t upper_code(int16_t code) {
    if (code < 0 || code > 255) return code;
    return static_cast<int16_t>(upper_case(static_cast<uint8_t>(code)));
}

std::string title_case_typed(std::string_view text, int32_t caret, int32_t sel_length, bool overwrite, char c,
                             int32_t limit) {
    const std::size_t n = text.size();
    // The widgets keep caret and selection inside the text; clamp anyway, so that a stale
    // caret can never read past the end.
    const auto p = static_cast<std::size_t>(std::clamp<int64_t>(caret, 0, static_cast<int64_t>(n)));
    const auto sel = static_cast<std::size_t>(std::clamp<int64_t>(sel_length, 0, static_cast<int64_t>(n - p)));
    const auto tail = [&](std::size_t from) { return from < n ? text.substr(from) : std::string_view(); };
    const auto fits = [&](std::size_t length) { return limit <= 0 || static_cast<std::size_t>(limit) > length; };

    std::string out;
    out.reserve(n + 1);
    out.append(text.substr(0, p));
    if (c != ' ') {
        const auto trimmed = text.find_last_not_of(' ');
        const std::size_t kept = trimmed == std::string_view::npos ? 0 : trimmed + 1;
        if (sel == 0 && !overwrite && !fits(kept)) {
            out.assign(text);
        } else {
            out += (p == 0 || text[p - 1] == ' ') ? upper_case(c) : c;
            out.append(tail(sel > 0 ? p + sel : overwrite ? p + 1 : p));
        }
    } else {
        // The character that comes to stand after the space; at the end of the text there is
        // none, and nothing to refuse either.
        const std::size_t next = sel > 0 ? p + sel : p < n && overwrite ? p + 1 : p;
        if (sel == 0 && !overwrite && p < n && !fits(n)) {
            out.assign(text);
        } else {
            out += ' ';
            if (next < n) {
                out += upper_case(text[next]);
                out.append(tail(next + 1));
            }
        }
    }
    if (!out.empty()) out[0] = upper_case(out[0]);
    return out;
}

}  // namespace kel

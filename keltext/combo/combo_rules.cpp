#include "keltext/combo/combo_rules.h"

#include <algorithm>
#include <cstddef>

#include "keltext/host/charset.h"

namespace kel {
namespace {

uint8_t byte_of(char c) { return static_cast<uint8_t>(c); }
char upper(char c) { return static_cast<char>(upper_case(byte_of(c))); }

bool in_set(std::string_view set, int16_t key) {
    return key > 0 && key <= 255 && set.find(static_cast<char>(key)) != std::string_view::npos;
}

// Upper case of a character code; a code outside the character set is left as it is.
int16_t upper_key(int16_t key) {
    if (key <= 0 || key > 255) return key;
    return upper_case(static_cast<uint8_t>(key));
}

}  // namespace

bool search_ignores_key(int16_t key_code) {
    return (key_code >= 1 && key_code <= 31) || (key_code >= 33 && key_code <= 47) || key_code == 144;
}

int prefix_order(std::string_view entry, std::string_view typed) {
    const std::size_t n = typed.size();
    const std::size_t m = std::min(n, entry.size());
    // The entry's prefix is the shorter when it runs out first.
    for (std::size_t j = 0; j < m; ++j) {
        const uint8_t a = upper_case(byte_of(entry[j]));
        const uint8_t b = upper_case(byte_of(typed[j]));
        if (a != b) return a < b ? -1 : 1;
    }
    return m < n ? -1 : 0;
}

std::string title_case_edit(std::string_view text, int32_t p_in, int32_t sel_length, bool overwrite, char c) {
    const std::size_t n = text.size();
    // The widget keeps its caret and selection inside the text; clamp anyway, so that a stale
    // caret can never read past the end.
    const std::size_t p = std::min<std::size_t>(static_cast<std::size_t>(std::max(p_in, 0)), n);
    const std::size_t len = std::min<std::size_t>(static_cast<std::size_t>(std::max(sel_length, 0)), n - p);
    const auto tail = [&](std::size_t from) { return from < n ? text.substr(from) : std::string_view(); };

    std::string out(text.substr(0, p));
    out.reserve(n + 1);
    if (c != ' ') {
        const bool word_start = p == 0 || text[p - 1] == ' ';
        out += word_start ? upper(c) : c;
        if (len > 0)
            out += tail(p + len);
        else if (overwrite)
            out += tail(p + 1);
        else
            out += tail(p);
    } else {
        // A space starts a new word: the character after it becomes a capital.
        out += ' ';
        std::size_t next = n;  // the character that follows the inserted space
        if (len > 0)
            next = p + len;
        else if (p < n)
            next = overwrite ? p + 1 : p;
        if (next < n) {
            out += upper(text[next]);
            out += tail(next + 1);
        }
    }
    if (!out.empty()) out[0] = upper(out[0]);
    return out;
}

ComboDecision filter_combo_key(int32_t text_type, const ComboEdit& edit, int16_t key) {
    ComboDecision d;
    d.key = key;
    if (key == 0) return d;
    // Overwrite: one character after the caret is selected, so that the typed one replaces
    // it. A selection the person made is replaced whole, as in insert mode.
    const bool overwrite_step = edit.overwrite && edit.sel_length == 0;

    switch (text_type) {
    case KelCboUserKeys: break;
    case KelCboUpperCase:
        d.select_one = overwrite_step;
        d.key = upper_key(key);
        break;
    case KelCboUAlphaNumeric:
        if (!in_set(kComboAlphaNumericSet, key)) {
            d.key = 0;
        } else {
            d.select_one = overwrite_step;
            d.key = upper_key(key);
        }
        break;
    case KelCboSentence:
        d.select_one = overwrite_step;
        if (edit.sel_start == 0) d.key = upper_key(key);
        break;
    case KelCboDigits:
        if (!in_set(kComboDigitSet, key))
            d.key = 0;
        else
            d.select_one = overwrite_step;
        break;
    case KelCboTitleCase: {
        if (key < 0 || key > 255) break;  // not a character of the set: left to the widget
        const char c = static_cast<char>(key);
        if (edit.text.empty())
            d.text = std::string(1, upper(c));
        else
            d.text = title_case_edit(edit.text, edit.saved_sel_start, edit.sel_length, edit.overwrite, c);
        d.sel_start = std::max(edit.saved_sel_start, 0) + 1;
        d.key = 0;
        break;
    }
    default: break;  // an unknown type lets every character through
    }
    return d;
}

int32_t length_without_trailing_spaces(std::string_view text) {
    const std::size_t last = text.find_last_not_of(' ');
    return last == std::string_view::npos ? 0 : static_cast<int32_t>(last + 1);
}

}  // namespace kel

#include "keltext/combo/combo_rules.h"

#include <algorithm>
#include <cstddef>

#include "keltext/host/charset.h"
#include "keltext/host/keys.h"

namespace kel {
namespace {

uint8_t byte_of(char c) { return static_cast<uint8_t>(c); }

}  // namespace

bool search_ignores_key(int16_t key_code) {
    return (key_code >= 1 && key_code < kVkSpace) || (key_code >= kVkPageUp && key_code <= kVkHelp) ||
           key_code == kVkNumLock;
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
        d.key = upper_code(key);
        break;
    case KelCboUAlphaNumeric:
        if (!in_set(kAlphaNumericSet, key)) {
            d.key = 0;
        } else {
            d.select_one = overwrite_step;
            d.key = upper_code(key);
        }
        break;
    case KelCboSentence:
        d.select_one = overwrite_step;
        if (edit.sel_start == 0) d.key = upper_code(key);
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
        d.text = title_case_typed(edit.text, edit.saved_sel_start, edit.sel_length, edit.overwrite, c);
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

#pragma once
// What typing a character means, the same in every control that filters keys: the character
// classes, the upper case of a key code and the title-case rebuild of a text.
#include <cstdint>
#include <string>
#include <string_view>

namespace kel {

// Letters, digits and the space (twice: the set is matched as published), for the
// upper-case alphanumeric text types of the box and the combo.
inline constexpr std::string_view kAlphaNumericSet =
    "ABCDEFGHIJKLMNOPQRSTUVWXYZ  abcdefghijklmnopqrstuvwxyz1234567890";

// True when the code is a character of the set, matched by code with no case folding; codes
// outside 1..255 never are.
bool in_set(std::string_view set, int code);

// The upper-case form of a key code (host/charset); codes outside 0..255 come back unchanged.
int16_t upper_code(int16_t code);

// The text after typing `c` at `caret` over `sel_length` characters (0: none selected) in
// title case: a character that starts a word is a capital, a typed space makes a capital of
// the character that comes to stand after it, and the first character is always a capital.
// Letters inside a word are never lowered. In overwrite mode the character after the caret
// is replaced. A `limit` above 0 refuses an insert that would pass it (trailing spaces do not
// count for a character, do for a space): the text comes back as it was, first letter raised.
// Caret and selection are clamped to the text.
std::string title_case_typed(std::string_view text, int32_t caret, int32_t sel_length, bool overwrite, char c,
                             int32_t limit = 0);

}  // namespace kel

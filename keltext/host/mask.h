#pragma once
// The masked edit field's mask characters: which positions take input and which characters
// each takes. The controls decide with it whether a key will land before they change the
// field for it; the hosts' masked fields apply it.
#include <cstdint>
#include <string_view>

namespace kel {

// "#" a digit, "?" a letter, "a" a letter or digit, "&" any character (a blank included);
// every other mask character is a literal shown in place.
inline constexpr char kMaskPrompt = '_';
bool mask_is_input(char mask_char);
bool mask_fits(char c, char mask_char);
// The first input position at or after `from`, or -1.
int32_t first_input_position(std::string_view mask, int32_t from);

}  // namespace kel

#pragma once
// The host's single-byte character set, Windows-1252: one byte is one character and one caret
// position. Front ends that speak UTF-8 convert at their boundary with these.
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace kel {

// The upper-case form of one character, back to one character (a-z, and the accented
// letters of the set: 0xE0-0xFE except 0xF7, plus 0x9A, 0x9C, 0x9E, 0xFF).
uint8_t upper_case(uint8_t c);
char upper_case(char c);
std::string upper_case(std::string_view s);
uint8_t lower_case(uint8_t c);

// The Unicode code point of a Windows-1252 byte (the five unassigned bytes map to themselves).
char32_t to_unicode(uint8_t c);
// The Windows-1252 byte for a code point, or nothing when the set has no such character.
std::optional<uint8_t> from_unicode(char32_t cp);

std::string to_utf8(std::string_view cp1252);
// Appends the UTF-8 form of any code point.
void append_utf8(std::string& out, char32_t cp);
// One character of UTF-8 text, from byte `at` (below the text's size): its code point, or
// nothing when the bytes there are malformed, and how many bytes it takes (at least one).
struct Utf8Unit {
    std::optional<char32_t> code_point;
    std::size_t used;
};
Utf8Unit next_utf8(std::string_view utf8, std::size_t at);
// Characters the set lacks (and malformed UTF-8) are dropped, or replaced by `replacement`.
std::string from_utf8(std::string_view utf8, std::optional<char> replacement = std::nullopt);

}  // namespace kel

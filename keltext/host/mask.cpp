#include "keltext/host/mask.h"

namespace kel {
namespace {

bool is_digit(uint8_t c) { return c >= '0' && c <= '9'; }

// Letters of the single-byte set: ASCII and the accented letters.
bool is_letter(uint8_t c) {
    if ((c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z')) return true;
    switch (c) {
    case 0x83: case 0x8A: case 0x8C: case 0x8E: case 0x9A: case 0x9C: case 0x9E: case 0x9F:
    case 0xAA: case 0xB5: case 0xBA: return true;
    default: return c >= 0xC0 && c != 0xD7 && c != 0xF7;
    }
}

}  // namespace

bool mask_is_input(char m) { return m == '#' || m == '?' || m == 'a' || m == '&'; }

bool mask_fits(char ch, char m) {
    const auto c = static_cast<uint8_t>(ch);
    switch (m) {
    case '#': return is_digit(c);
    case '?': return is_letter(c);
    case 'a': return is_digit(c) || is_letter(c);
    case '&': return c >= 32;
    default: return false;
    }
}

int32_t first_input_position(std::string_view mask, int32_t from) {
    for (auto i = static_cast<std::size_t>(from < 0 ? 0 : from); i < mask.size(); ++i)
        if (mask_is_input(mask[i])) return static_cast<int32_t>(i);
    return -1;
}

}  // namespace kel

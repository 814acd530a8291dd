#include "keltext/host/charset.h"

namespace kel {
namespace {

// Code points of the bytes 0x80-0x9F; the five bytes the set leaves unassigned keep their value.
constexpr char32_t kHighControls[32] = {
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021,  // 80-87
    0x02C6, 0x2030, 0x0160, 0x2039, 0x0152, 0x008D, 0x017D, 0x008F,  // 88-8F
    0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022, 0x2013, 0x2014,  // 90-97
    0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178,  // 98-9F
};

}  // namespace

void append_utf8(std::string& out, char32_t cp) {
    if (cp < 0x80) {
        out += static_cast<char>(cp);
    } else if (cp < 0x800) {
        out += static_cast<char>(0xC0 | (cp >> 6));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    } else if (cp < 0x10000) {
        out += static_cast<char>(0xE0 | (cp >> 12));
        out += static_cast<char>(0x80 | ((cp >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    } else {
        out += static_cast<char>(0xF0 | (cp >> 18));
        out += static_cast<char>(0x80 | ((cp >> 12) & 0x3F));
        out += static_cast<char>(0x80 | ((cp >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    }
}

uint8_t upper_case(uint8_t c) {
    if ((c >= 'a' && c <= 'z') || (c >= 0xE0 && c <= 0xFE && c != 0xF7)) return static_cast<uint8_t>(c - 0x20);
    switch (c) {
    case 0x9A: return 0x8A;  // s caron
    case 0x9C: return 0x8C;  // oe
    case 0x9E: return 0x8E;  // z caron
    case 0xFF: return 0x9F;  // y diaeresis
    default: return c;       // 0xB5 (micro) and 0xDF (sharp s) have no one-byte upper case
    }
}

char upper_case(char c) { return static_cast<char>(upper_case(static_cast<uint8_t>(c))); }

std::string upper_case(std::string_view s) {
    std::string out(s);
    for (char& c : out) c = upper_case(c);
    return out;
}

uint8_t lower_case(uint8_t c) {
    if ((c >= 'A' && c <= 'Z') || (c >= 0xC0 && c <= 0xDE && c != 0xD7)) return static_cast<uint8_t>(c + 0x20);
    switch (c) {
    case 0x8A: return 0x9A;
    case 0x8C: return 0x9C;
    case 0x8E: return 0x9E;
    case 0x9F: return 0xFF;
    default: return c;
    }
}

char32_t to_unicode(uint8_t c) { return c >= 0x80 && c <= 0x9F ? kHighControls[c - 0x80] : c; }

std::optional<uint8_t> from_unicode(char32_t cp) {
    if (cp < 0x80 || (cp >= 0xA0 && cp <= 0xFF)) return static_cast<uint8_t>(cp);
    for (int i = 0; i < 32; ++i)
        if (kHighControls[i] == cp) return static_cast<uint8_t>(0x80 + i);
    return std::nullopt;
}

std::string to_utf8(std::string_view cp1252) {
    std::string out;
    out.reserve(cp1252.size());
    for (char c : cp1252) append_utf8(out, to_unicode(static_cast<uint8_t>(c)));
    return out;
}

Utf8Unit next_utf8(std::string_view utf8, size_t at) {
    const size_t n = utf8.size();
    auto byte = [&](size_t k) { return static_cast<uint8_t>(utf8[k]); };
    const uint8_t lead = byte(at);
    char32_t cp = 0;
    size_t len = 0;
    char32_t min = 0;
    if (lead < 0x80) {
        cp = lead;
        len = 1;
    } else if (lead >= 0xC2 && lead <= 0xDF) {
        cp = lead & 0x1F;
        len = 2;
        min = 0x80;
    } else if (lead >= 0xE0 && lead <= 0xEF) {
        cp = lead & 0x0F;
        len = 3;
        min = 0x800;
    } else if (lead >= 0xF0 && lead <= 0xF4) {
        cp = lead & 0x07;
        len = 4;
        min = 0x10000;
    }
    // Take as many continuation bytes as the lead promises; a sequence cut short, overlong,
    // a surrogate or beyond U+10FFFF is one malformed unit made of the bytes read so far.
    size_t used = 1;
    bool ok = len != 0;
    while (ok && used < len) {
        if (at + used >= n || (byte(at + used) & 0xC0) != 0x80) {
            ok = false;
            break;
        }
        cp = (cp << 6) | (byte(at + used) & 0x3F);
        ++used;
    }
    if (ok && (cp < min || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF))) ok = false;
    return {ok ? std::optional<char32_t>(cp) : std::nullopt, used};
}

std::string from_utf8(std::string_view utf8, std::optional<char> replacement) {
    std::string out;
    out.reserve(utf8.size());
    for (size_t i = 0; i < utf8.size();) {
        const Utf8Unit u = next_utf8(utf8, i);
        i += u.used;
        const std::optional<uint8_t> b = u.code_point ? from_unicode(*u.code_point) : std::nullopt;
        if (b) out += static_cast<char>(*b);
        else if (replacement) out += *replacement;
    }
    return out;
}

}  // namespace kel

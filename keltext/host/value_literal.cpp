#include "keltext/host/value_literal.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <limits>
#include <memory>
#include <system_error>

#include "keltext/host/charset.h"
#include "keltext/host/conversions.h"
#include "keltext/host/float_chars.h"
#include "keltext/host/date.h"
#include "keltext/host/float_chars.h"
#include "keltext/host/font.h"

namespace kel {
namespace {

bool is_blank(char c) { return c == ' ' || c == '\t'; }
bool is_digit(char c) { return c >= '0' && c <= '9'; }

int hex_digit(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

[[noreturn]] void malformed_value(std::string_view word) {
    throw ValueLiteralError("malformed value '" + shown_word(word) + "'");
}

// Reads the quoted string that starts at s[pos] (a '"'); returns the bytes and moves pos past
// the closing quote.
std::string read_string(std::string_view s, std::size_t& pos, std::string_view word) {
    std::string out;
    std::size_t i = pos + 1;
    while (i < s.size() && s[i] != '"') {
        char c = s[i];
        if (c != '\\') {
            out += c;
            ++i;
            continue;
        }
        if (i + 1 >= s.size()) {
            i = s.size();  // a backslash at the very end: the string never closes
            break;
        }
        char e = s[i + 1];
        switch (e) {
        case '"': out += '"'; break;
        case '\\': out += '\\'; break;
        case 't': out += '\t'; break;
        case 'n': out += '\n'; break;
        case 'r': out += '\r'; break;
        case 'x': {
            int hi = i + 2 < s.size() ? hex_digit(s[i + 2]) : -1;
            int lo = i + 3 < s.size() ? hex_digit(s[i + 3]) : -1;
            if (hi < 0 || lo < 0)
                throw ValueLiteralError("malformed string '" + shown_word(word) + "': \\x needs two hex digits");
            out += static_cast<char>(hi * 16 + lo);
            i += 2;
            break;
        }
        default:
            throw ValueLiteralError("malformed string '" + shown_word(word) + "': unknown escape '\\" +
                              shown_word(std::string_view(&s[i + 1], 1)) + "'");
        }
        i += 2;
    }
    if (i >= s.size()) throw ValueLiteralError("malformed string '" + shown_word(word) + "': no closing quote");
    pos = i + 1;
    return out;
}

// The shape of a decimal number: [+-] (digits [. digits] | . digits) [e [+-] digits].
struct DecimalShape {
    bool ok = false;
    bool integral = false;  // no point, no exponent
};

DecimalShape decimal_shape(std::string_view s) {
    DecimalShape shape;
    std::size_t i = 0;
    if (i < s.size() && (s[i] == '+' || s[i] == '-')) ++i;
    std::size_t int_digits = 0, frac_digits = 0;
    while (i < s.size() && is_digit(s[i])) ++i, ++int_digits;
    bool point = false, exponent = false;
    if (i < s.size() && s[i] == '.') {
        point = true;
        ++i;
        while (i < s.size() && is_digit(s[i])) ++i, ++frac_digits;
    }
    if (int_digits + frac_digits == 0) return shape;
    if (i < s.size() && (s[i] == 'e' || s[i] == 'E')) {
        exponent = true;
        ++i;
        if (i < s.size() && (s[i] == '+' || s[i] == '-')) ++i;
        std::size_t exp_digits = 0;
        while (i < s.size() && is_digit(s[i])) ++i, ++exp_digits;
        if (exp_digits == 0) return shape;
    }
    if (i != s.size()) return shape;
    shape.ok = true;
    shape.integral = !point && !exponent;
    return shape;
}

// parse_float takes no '+'.
std::string_view without_plus(std::string_view s) { return (!s.empty() && s[0] == '+') ? s.substr(1) : s; }

template <class F>
std::optional<F> read_floating(std::string_view s) {
    if (!decimal_shape(s).ok) return std::nullopt;
    s = without_plus(s);
    F value{};
    auto [end, ec] = parse_float(s.data(), s.data() + s.size(), value);
    if (ec != std::errc() || end != s.data() + s.size() || !std::isfinite(value)) return std::nullopt;
    return value;
}

// A whole number written in decimal ([+-]digits) or as 0x hex of at most `hex_digits` digits
// (a bit pattern, returned as its unsigned value).
struct Whole {
    bool hex = false;
    int64_t value = 0;
};

std::optional<Whole> read_whole(std::string_view s, std::size_t max_hex_digits) {
    if (s.size() > 2 && s[0] == '0' && (s[1] == 'x' || s[1] == 'X')) {
        std::string_view digits = s.substr(2);
        if (digits.size() > max_hex_digits) return std::nullopt;
        int64_t v = 0;
        for (char c : digits) {
            int d = hex_digit(c);
            if (d < 0) return std::nullopt;
            v = v * 16 + d;
        }
        return Whole{true, v};
    }
    DecimalShape shape = decimal_shape(s);
    if (!shape.ok || !shape.integral) return std::nullopt;
    bool negative = s[0] == '-';
    std::size_t i = (s[0] == '-' || s[0] == '+') ? 1 : 0;
    while (i + 1 < s.size() && s[i] == '0') ++i;
    if (s.size() - i > 12) return std::nullopt;  // far outside every integer kind here
    int64_t v = 0;
    for (; i < s.size(); ++i) v = v * 10 + (s[i] - '0');
    return Whole{false, negative ? -v : v};
}

// A plain numeric literal, typed as BASIC types it.
std::optional<Variant> read_number(std::string_view s) {
    if (s.size() > 2 && s[0] == '0' && (s[1] == 'x' || s[1] == 'X')) {
        auto w = read_whole(s, 8);
        if (!w) return std::nullopt;
        return Variant(static_cast<int32_t>(static_cast<uint32_t>(w->value)));
    }
    DecimalShape shape = decimal_shape(s);
    if (!shape.ok) return std::nullopt;
    if (shape.integral) {
        if (auto w = read_whole(s, 0)) {
            if (w->value >= std::numeric_limits<int16_t>::min() && w->value <= std::numeric_limits<int16_t>::max())
                return Variant(static_cast<int16_t>(w->value));
            if (w->value >= std::numeric_limits<int32_t>::min() && w->value <= std::numeric_limits<int32_t>::max())
                return Variant(static_cast<int32_t>(w->value));
        }
    }
    auto d = read_floating<double>(s);
    if (!d) return std::nullopt;
    return Variant(*d);
}

std::optional<int64_t> read_typed_whole(std::string_view s, int64_t min, int64_t max, std::size_t hex_digits) {
    auto w = read_whole(s, hex_digits);
    if (!w) return std::nullopt;
    int64_t v = w->value;
    if (w->hex) {
        // A bit pattern of the kind's width: 0xFFFF is -1 as a 16-bit integer.
        int64_t span = max - min + 1;
        if (v > max) v -= span;
    }
    if (v < min || v > max) return std::nullopt;
    return v;
}

std::optional<Date> read_date(std::string_view s) {
    int parts[3] = {0, 0, 0};
    std::size_t widths[3] = {0, 0, 0};
    std::size_t field = 0;
    for (char c : s) {
        if (c == '-') {
            if (++field > 2) return std::nullopt;
            continue;
        }
        if (!is_digit(c)) return std::nullopt;
        if (++widths[field] > 4) return std::nullopt;
        parts[field] = parts[field] * 10 + (c - '0');
    }
    if (field != 2 || widths[0] == 0 || widths[1] == 0 || widths[1] > 2 || widths[2] == 0 || widths[2] > 2)
        return std::nullopt;
    return make_date(parts[0], parts[1], parts[2]);
}

Variant read_font(std::string_view word) {
    std::string_view rest = word.substr(5);  // after "font:"
    if (rest.empty() || rest[0] != '"') malformed_value(word);
    std::size_t pos = 0;
    std::string name = read_string(rest, pos, word);
    rest = rest.substr(pos);
    if (rest.empty() || rest[0] != ':') malformed_value(word);
    rest = rest.substr(1);
    std::size_t colon = rest.find(':');
    auto size = read_floating<double>(rest.substr(0, colon));
    if (!size || *size <= 0) malformed_value(word);
    bool bold = false, italic = false;
    while (colon != std::string_view::npos) {
        rest = rest.substr(colon + 1);
        colon = rest.find(':');
        std::string_view flag = rest.substr(0, colon);
        if (same_name(flag, "bold") && !bold)
            bold = true;
        else if (same_name(flag, "italic") && !italic)
            italic = true;
        else
            malformed_value(word);
    }
    return Variant(std::make_shared<Font>(std::move(name), *size, bold, italic));
}


void append_hex(std::string& out, unsigned char c) {
    static constexpr char kDigits[] = "0123456789ABCDEF";
    out += "\\x";
    out += kDigits[c >> 4];
    out += kDigits[c & 0xF];
}


// The shortest text that reads back as the same double; plain digits where that stays short
// (5000000, not 5e+06), so that a person reads the file easily.
std::string shortest_text(double v) {
    char buf[400];
    if (const auto r = format_float(buf, buf + sizeof buf, v, std::chars_format::fixed);
        r.ec == std::errc() && r.ptr - buf <= 20)
        return std::string(buf, r.ptr);
    const auto r = format_float(buf, buf + sizeof buf, v);
    return std::string(buf, r.ptr);
}

std::string double_literal(double v) {
    const std::string text = shortest_text(v);
    // A bare literal without a point or exponent would read back as an integer.
    const bool reads_as_double = text.find('.') != std::string::npos && text.find('e') == std::string::npos;
    return reads_as_double ? text : "f64:" + text;
}

bool names_colour(std::string_view key) {
    const std::string upper = upper_case(key);
    return upper.find("COLOR") != std::string::npos || upper.find("COLOUR") != std::string::npos;
}

}  // namespace

std::string float_text(float v) {
    char buf[32];
    const auto r = format_float(buf, buf + sizeof buf, v);
    return std::string(buf, r.ptr);
}

std::vector<std::string_view> split_words(std::string_view line) {
    std::vector<std::string_view> words;
    std::size_t i = 0;
    while (i < line.size()) {
        while (i < line.size() && is_blank(line[i])) ++i;
        if (i >= line.size() || line[i] == '#') break;
        std::size_t start = i;
        bool comment = false;
        while (i < line.size() && !is_blank(line[i])) {
            char c = line[i];
            if (c == '#') {
                comment = true;
                break;
            }
            if (c != '"') {
                ++i;
                continue;
            }
            ++i;
            while (i < line.size() && line[i] != '"') i += (line[i] == '\\') ? 2 : 1;
            if (i >= line.size())
                throw ValueLiteralError("malformed string '" + shown_word(line.substr(start)) + "': no closing quote");
            ++i;
        }
        words.push_back(line.substr(start, i - start));
        if (comment) break;
    }
    return words;
}

bool is_string_literal(std::string_view word) { return !word.empty() && word[0] == '"'; }

std::string decode_string(std::string_view word) {
    if (!is_string_literal(word)) throw ValueLiteralError("expected a quoted string, got '" + shown_word(word) + "'");
    std::size_t pos = 0;
    std::string s = read_string(word, pos, word);
    if (pos != word.size()) throw ValueLiteralError("malformed string '" + shown_word(word) + "': text after the closing quote");
    return s;
}

Variant parse_value(std::string_view word) {
    if (word.empty()) malformed_value(word);
    if (word[0] == '"') return Variant(decode_string(word));
    if (same_name(word, "empty")) return Variant();
    if (same_name(word, "true")) return Variant(true);
    if (same_name(word, "false")) return Variant(false);
    if (auto n = read_number(word)) return *n;
    if (starts_with_name(word, "u8:")) {
        if (auto v = read_typed_whole(word.substr(3), 0, 255, 2)) return Variant(static_cast<uint8_t>(*v));
    } else if (starts_with_name(word, "i16:")) {
        if (auto v = read_typed_whole(word.substr(4), std::numeric_limits<int16_t>::min(),
                                      std::numeric_limits<int16_t>::max(), 4))
            return Variant(static_cast<int16_t>(*v));
    } else if (starts_with_name(word, "i32:")) {
        if (auto v = read_typed_whole(word.substr(4), std::numeric_limits<int32_t>::min(),
                                      std::numeric_limits<int32_t>::max(), 8))
            return Variant(static_cast<int32_t>(*v));
    } else if (starts_with_name(word, "f32:")) {
        if (auto v = read_floating<float>(word.substr(4))) return Variant(*v);
    } else if (starts_with_name(word, "f64:")) {
        if (auto v = read_floating<double>(word.substr(4))) return Variant(*v);
    } else if (starts_with_name(word, "date:")) {
        if (auto d = read_date(word.substr(5))) return Variant(*d);
    } else if (starts_with_name(word, "font:")) {
        return read_font(word);
    }
    malformed_value(word);
}


std::string string_literal(std::string_view s) {
    static constexpr char kHex[] = "0123456789ABCDEF";
    std::string out = "\"";
    for (char c : s) {
        const auto b = static_cast<unsigned char>(c);
        if (c == '"' || c == '\\') {
            out += '\\';
            out += c;
        } else if (c == '\t') {
            out += "\\t";
        } else if (c == '\n') {
            out += "\\n";
        } else if (c == '\r') {
            out += "\\r";
        } else if (b < 0x20 || b >= 0x7F) {
            out += "\\x";
            out += kHex[b >> 4];
            out += kHex[b & 15];
        } else {
            out += c;
        }
    }
    return out + "\"";
}

std::string value_literal(const Variant& v, std::string_view key) {
    switch (v.kind()) {
        case VarKind::Empty: return "empty";
        case VarKind::Boolean: return *v.get_if<bool>() ? "true" : "false";
        case VarKind::Byte: return "u8:" + std::to_string(*v.get_if<uint8_t>());
        case VarKind::Int16: return std::to_string(*v.get_if<int16_t>());
        case VarKind::Int32: {
            const int32_t n = *v.get_if<int32_t>();
            if (names_colour(key)) {
                char buf[16];
                std::snprintf(buf, sizeof buf, "0x%06X", static_cast<uint32_t>(n));
                return buf;
            }
            if (n >= std::numeric_limits<int16_t>::min() && n <= std::numeric_limits<int16_t>::max())
                return "i32:" + std::to_string(n);
            return std::to_string(n);
        }
        case VarKind::Single: return "f32:" + float_text(*v.get_if<float>());
        case VarKind::Double: return double_literal(*v.get_if<double>());
        case VarKind::Date: {
            const Ymd d = to_ymd(*v.get_if<Date>());
            char buf[32];
            std::snprintf(buf, sizeof buf, "date:%04d-%02d-%02d", d.year, d.month, d.day);
            return buf;
        }
        case VarKind::String: return string_literal(v.str());
        case VarKind::Object: {
            if (const auto f = font_of(v)) {
                std::string out = "font:" + string_literal(f->name) + ":" + shortest_text(f->size);
                if (f->bold) out += ":bold";
                if (f->italic) out += ":italic";
                return out;
            }
            return "empty";
        }
    }
    return "empty";
}

std::string shown_word(std::string_view word) {
    constexpr std::size_t kLongest = 80;
    std::string out;
    for (std::size_t i = 0; i < word.size() && i < kLongest; ++i) {
        auto u = static_cast<unsigned char>(word[i]);
        if (u < 0x20 || u >= 0x7F)
            append_hex(out, u);
        else
            out += word[i];
    }
    if (word.size() > kLongest) out += "...";
    return out;
}


}  // namespace kel

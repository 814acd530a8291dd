#include "apps/kelform/script_syntax.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <limits>
#include <memory>
#include <system_error>

#include "keltext/host/conversions.h"
#include "keltext/host/date.h"
#include "keltext/host/font.h"
#include "keltext/host/value_literal.h"

namespace kel::kelform {
namespace {

bool is_name_char(char c) {
    return (c >= '0' && c <= '9') || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_';
}

void append_hex(std::string& out, unsigned char c) {
    static constexpr char kDigits[] = "0123456789ABCDEF";
    out += "\\x";
    out += kDigits[c >> 4];
    out += kDigits[c & 0xF];
}

// The literals are the host's (keltext/host/value_literal.h); a malformed one is the script's mistake.
template <class F>
auto as_script_error(F&& f) -> decltype(f()) {
    try {
        return f();
    } catch (const ValueLiteralError& e) {
        throw ScriptError(e.what());
    }
}

}  // namespace

std::vector<std::string_view> split_words(std::string_view line) {
    return as_script_error([&] { return kel::split_words(line); });
}

bool is_string_literal(std::string_view word) { return kel::is_string_literal(word); }

std::string decode_string(std::string_view word) {
    return as_script_error([&] { return kel::decode_string(word); });
}

Variant parse_value(std::string_view word) {
    return as_script_error([&] { return kel::parse_value(word); });
}

Expected parse_expected(std::string_view word) {
    if (starts_with_name(word, "error:")) {
        // A run-time error number: plain decimal digits, 0 to the largest 32-bit integer.
        const std::string_view digits = word.substr(6);
        const bool decimal = !digits.empty() && digits.find_first_not_of("+-0123456789") == std::string_view::npos;
        Variant n;
        try {
            if (decimal) n = kel::parse_value(digits);
        } catch (const ValueLiteralError&) {
            n = Variant();
        }
        if (!(n.kind() == VarKind::Int16 || n.kind() == VarKind::Int32) || n.number() < 0)
            throw ScriptError("malformed value '" + shown(word) + "'");
        return Expected{Variant(), static_cast<int>(n.number())};
    }
    return Expected{parse_value(word), std::nullopt};
}

std::string quote(std::string_view bytes) {
    std::string out = "\"";
    for (char c : bytes) {
        auto u = static_cast<unsigned char>(c);
        if (c == '"' || c == '\\') {
            out += '\\';
            out += c;
        } else if (u < 0x20 || u >= 0x7F) {
            append_hex(out, u);
        } else {
            out += c;
        }
    }
    out += '"';
    return out;
}

std::string format_value(const Variant& v) {
    switch (v.kind()) {
    case VarKind::Empty: return "empty";
    case VarKind::Boolean: return *v.get_if<bool>() ? "bool true" : "bool false";
    case VarKind::Byte: return "u8 " + std::to_string(*v.get_if<uint8_t>());
    case VarKind::Int16: return "i16 " + std::to_string(*v.get_if<int16_t>());
    case VarKind::Int32: return "i32 " + std::to_string(*v.get_if<int32_t>());
    case VarKind::Single: return "f32 " + plain_number_text(*v.get_if<float>());
    case VarKind::Double: return "f64 " + plain_number_text(*v.get_if<double>());
    case VarKind::Date: {
        Ymd d = to_ymd(*v.get_if<Date>());
        char buf[48];
        std::snprintf(buf, sizeof buf, "date %04d-%02d-%02d", d.year, d.month, d.day);
        return buf;
    }
    case VarKind::String: return "str " + quote(v.str());
    case VarKind::Object: {
        auto f = font_of(v);
        if (!f) return "object";
        std::string out = "font " + quote(f->name) + " " + plain_number_text(f->size);
        if (f->bold) out += " bold";
        if (f->italic) out += " italic";
        return out;
    }
    }
    return "object";
}

std::string format_error(int number) { return "error " + std::to_string(number); }

std::string format_expected(const Expected& e) { return e.error ? format_error(*e.error) : format_value(e.value); }

std::string format_plain(const Variant& v) {
    switch (v.kind()) {
    case VarKind::Byte:
    case VarKind::Int16:
    case VarKind::Int32:
    case VarKind::Double: return plain_number_text(v.number());
    case VarKind::Single: return plain_number_text(*v.get_if<float>());
    default: return format_value(v);
    }
}

std::string format_index(const Variant& v) {
    if (v.is_string()) return quote(v.str());
    return format_plain(v);
}

bool is_name(std::string_view word) {
    if (word.empty()) return false;
    for (char c : word)
        if (!is_name_char(c)) return false;
    return true;
}

Target parse_target(std::string_view word) {
    Target t;
    std::string_view dotted = word;
    std::size_t open = word.find('(');
    if (open != std::string_view::npos) {
        if (word.back() != ')' || word.size() - open < 3)
            throw ScriptError("malformed index in '" + shown(word) + "'");
        t.index = word.substr(open + 1, word.size() - open - 2);
        dotted = word.substr(0, open);
    }
    std::size_t start = 0;
    for (;;) {
        std::size_t dot = dotted.find('.', start);
        std::string_view name = dotted.substr(start, dot == std::string_view::npos ? dotted.npos : dot - start);
        if (!is_name(name)) throw ScriptError("malformed name '" + shown(word) + "'");
        t.names.push_back(name);
        if (dot == std::string_view::npos) break;
        start = dot + 1;
    }
    return t;
}

std::string shown(std::string_view word) { return shown_word(word); }

}  // namespace kel::kelform

#include "keltext/host/conversions.h"

#include <cfloat>
#include <charconv>
#include <cmath>
#include <limits>
#include <optional>
#include <system_error>

#include "keltext/host/errors.h"
#include "keltext/host/float_chars.h"

namespace kel {
namespace {

// Every number read from text goes through this shape: a sign, the digits of the integer and
// fraction parts (no separators) and a decimal exponent.
struct DecimalParts {
    bool negative = false;
    std::string int_digits;
    std::string frac_digits;
    int64_t exponent = 0;
};

struct ReadValue {
    double value = 0;
    bool overflow = false;  // the text names a number beyond the double range
};

// Exponents past this are far outside the double range already; stopping here keeps the
// arithmetic on the exponent itself small.
constexpr int64_t kExponentCap = 1'000'000;
// More significant digits than a double can ever need to round correctly (767), plus room.
constexpr size_t kMaxDigits = 800;

bool is_blank(char c) { return c == ' ' || c == '\t' || c == '\n'; }
bool is_digit(char c) { return c >= '0' && c <= '9'; }

int hex_digit(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

void add_exponent_digit(int64_t& exponent, char c) {
    if (exponent < kExponentCap) exponent = exponent * 10 + (c - '0');
}

// The double nearest to the decimal number; a magnitude beyond the double range gives the
// largest double with the overflow flag, one below it gives 0.
ReadValue decimal_value(const DecimalParts& p) {
    // Significant digits with the position of the first one: value = 0.DIGITS x 10^magnitude.
    std::string digits;
    int64_t magnitude = 0;
    size_t first = p.int_digits.find_first_not_of('0');
    if (first != std::string::npos) {
        digits = p.int_digits.substr(first);
        magnitude = static_cast<int64_t>(digits.size());
        digits += p.frac_digits;
    } else {
        first = p.frac_digits.find_first_not_of('0');
        if (first == std::string::npos) return {};
        digits = p.frac_digits.substr(first);
        magnitude = -static_cast<int64_t>(first);
    }
    const size_t last = digits.find_last_not_of('0');
    digits.resize(last + 1);
    magnitude += p.exponent;

    const double sign = p.negative ? -1.0 : 1.0;
    if (magnitude > 310) return {sign * DBL_MAX, true};
    if (magnitude < -330) return {};

    if (digits.size() > kMaxDigits) {
        // Beyond this many digits only "is anything left" can still matter to the rounding.
        const bool rest = digits.find_first_not_of('0', kMaxDigits - 1) != std::string::npos;
        digits.resize(kMaxDigits - 1);
        digits += rest ? '1' : '0';
    }
    const int64_t scale = magnitude - static_cast<int64_t>(digits.size());
    std::string text = digits + 'e' + std::to_string(scale);
    double value = 0;
    const auto res = parse_float(text.data(), text.data() + text.size(), value);
    if (res.ec == std::errc::result_out_of_range) {
        if (magnitude > 0) return {sign * DBL_MAX, true};
        return {};
    }
    if (res.ec != std::errc() || !std::isfinite(value)) return {sign * DBL_MAX, true};
    return {sign * value, false};
}

// Accumulates the digits of an &H or &O number; saturates rather than overflowing.
struct RadixAccumulator {
    uint64_t whole = 0;
    double big = 0;
    bool is_big = false;
    bool overflow = false;

    void add(int radix, int digit) {
        const auto r = static_cast<uint64_t>(radix);
        if (!is_big) {
            if (whole <= (UINT64_MAX - static_cast<uint64_t>(digit)) / r) {
                whole = whole * r + static_cast<uint64_t>(digit);
                return;
            }
            is_big = true;
            big = static_cast<double>(whole);
        }
        if (big > DBL_MAX / radix) {
            big = DBL_MAX;
            overflow = true;
            return;
        }
        big = big * radix + digit;
    }
    ReadValue result() const { return {is_big ? big : static_cast<double>(whole), overflow}; }
};

// The whole text as a number, or nothing when it is not one (see numeric_text).
std::optional<ReadValue> read_whole(std::string_view text) {
    size_t b = 0, e = text.size();
    while (b < e && is_blank(text[b])) ++b;
    while (e > b && is_blank(text[e - 1])) --e;
    const std::string_view t = text.substr(b, e - b);
    if (t.empty()) return std::nullopt;

    if (t[0] == '&') {
        if (t.size() < 3) return std::nullopt;
        int radix = 0;
        if (t[1] == 'H' || t[1] == 'h') radix = 16;
        else if (t[1] == 'O' || t[1] == 'o') radix = 8;
        else return std::nullopt;
        RadixAccumulator acc;
        for (size_t i = 2; i < t.size(); ++i) {
            const int d = hex_digit(t[i]);
            if (d < 0 || d >= radix) return std::nullopt;
            acc.add(radix, d);
        }
        return acc.result();
    }

    DecimalParts p;
    size_t i = 0;
    if (t[i] == '+' || t[i] == '-') p.negative = t[i++] == '-';
    // Integer part: digits, with grouping commas only between two digits, so that both the
    // western (1,234,567) and the Indian (12,34,567) groupings pass.
    while (i < t.size()) {
        if (is_digit(t[i])) {
            p.int_digits += t[i++];
        } else if (t[i] == ',' && !p.int_digits.empty() && i + 1 < t.size() && is_digit(t[i + 1])) {
            ++i;
        } else {
            break;
        }
    }
    if (i < t.size() && t[i] == '.') {
        ++i;
        while (i < t.size() && is_digit(t[i])) p.frac_digits += t[i++];
    }
    if (p.int_digits.empty() && p.frac_digits.empty()) return std::nullopt;
    if (i < t.size() && (t[i] == 'E' || t[i] == 'e' || t[i] == 'D' || t[i] == 'd')) {
        ++i;
        bool negative_exponent = false;
        if (i < t.size() && (t[i] == '+' || t[i] == '-')) negative_exponent = t[i++] == '-';
        if (i == t.size() || !is_digit(t[i])) return std::nullopt;
        while (i < t.size() && is_digit(t[i])) add_exponent_digit(p.exponent, t[i++]);
        if (negative_exponent) p.exponent = -p.exponent;
    }
    if (i != t.size()) return std::nullopt;
    return decimal_value(p);
}

// The double of a numeric text; error 13 when the text is not numeric, 6 beyond the range.
double text_value(std::string_view text) {
    const auto r = read_whole(text);
    if (!r) raise_error(kTypeMismatch);
    if (r->overflow) raise_error(kOverflow);
    return r->value + 0.0;  // no negative zero
}

// Significant digits (trailing zeros removed) and decimal exponent of a value rounded to
// `precision` significant digits: value = D.DDD x 10^exponent.
struct Rounded {
    std::string digits;
    int exponent = 0;
};

template <class T>
Rounded round_to_digits(T magnitude, int precision) {
    char buf[64];
    const auto res = format_float(buf, buf + sizeof buf, magnitude, std::chars_format::scientific, precision - 1);
    const std::string_view s(buf, static_cast<size_t>(res.ptr - buf));
    Rounded r;
    const size_t epos = s.find('e');
    for (char c : s.substr(0, epos))
        if (is_digit(c)) r.digits += c;
    const size_t last = r.digits.find_last_not_of('0');
    r.digits.resize(last == std::string::npos ? 1 : last + 1);
    int exponent = 0;
    const std::string_view es = s.substr(epos + 1);
    std::from_chars(es.data() + (es[0] == '+' ? 1 : 0), es.data() + es.size(), exponent);
    r.exponent = exponent;
    return r;
}

// The host's number printing: `precision` significant digits; the exponent form from
// 10^precision up, and for fractions whose fixed form would need more than `precision`
// decimals; otherwise the fixed form.
template <class T>
std::string number_text(T value, int precision) {
    if (std::isnan(value)) return "NaN";
    if (std::isinf(value)) return value < 0 ? "-Infinity" : "Infinity";
    if (value == 0) return "0";
    const Rounded r = round_to_digits(std::fabs(value), precision);
    const int n = static_cast<int>(r.digits.size());
    std::string out = value < 0 ? "-" : "";
    if (r.exponent >= precision || (r.exponent < 0 && n - 1 - r.exponent > precision)) {
        out += r.digits[0];
        if (n > 1) out += '.' + r.digits.substr(1);
        out += r.exponent < 0 ? "E-" : "E+";
        const int e = std::abs(r.exponent);
        if (e < 10) out += '0';
        out += std::to_string(e);
    } else if (r.exponent < 0) {
        out += "0.";
        out.append(static_cast<size_t>(-r.exponent - 1), '0');
        out += r.digits;
    } else if (n <= r.exponent + 1) {
        out += r.digits;
        out.append(static_cast<size_t>(r.exponent + 1 - n), '0');
    } else {
        out += r.digits.substr(0, static_cast<size_t>(r.exponent + 1));
        out += '.';
        out += r.digits.substr(static_cast<size_t>(r.exponent + 1));
    }
    return out;
}

// The number a variant holds for the checked conversions.
double checked_number(const Variant& v) {
    switch (v.kind()) {
    case VarKind::String: return text_value(v.str());
    case VarKind::Object: raise_error(kTypeMismatch);
    default: return v.number();
    }
}

// Rounds half to even and checks the range; NaN and infinities are overflows.
double whole_in_range(double value, double low, double high) {
    if (!std::isfinite(value)) raise_error(kOverflow);
    const double r = round_half_even(value);
    if (r < low || r > high) raise_error(kOverflow);
    return r;
}

}  // namespace

double leading_value(std::string_view text) {
    size_t i = 0;
    const size_t n = text.size();
    // The next character that is not a blank, or 0 at the end.
    auto peek = [&]() -> char {
        while (i < n && is_blank(text[i])) ++i;
        return i < n ? text[i] : '\0';
    };

    if (peek() == '&') {
        ++i;
        const char kind = peek();
        int radix = 0;
        if (kind == 'H' || kind == 'h') radix = 16;
        else if (kind == 'O' || kind == 'o') radix = 8;
        else return 0;
        ++i;
        RadixAccumulator acc;
        for (;;) {
            const int d = hex_digit(peek());
            if (d < 0 || d >= radix) break;
            acc.add(radix, d);
            ++i;
        }
        return acc.result().value;
    }

    DecimalParts p;
    if (const char c = peek(); c == '+' || c == '-') {
        p.negative = c == '-';
        ++i;
    }
    while (is_digit(peek())) p.int_digits += text[i++];
    if (peek() == '.') {
        ++i;
        while (is_digit(peek())) p.frac_digits += text[i++];
    }
    if (p.int_digits.empty() && p.frac_digits.empty()) return 0;
    if (const char c = peek(); c == 'E' || c == 'e' || c == 'D' || c == 'd') {
        // An exponent letter counts only when digits follow it; otherwise the number ends before it.
        ++i;
        bool negative_exponent = false;
        if (const char s = peek(); s == '+' || s == '-') {
            negative_exponent = s == '-';
            ++i;
        }
        int64_t exponent = 0;
        while (is_digit(peek())) add_exponent_digit(exponent, text[i++]);
        p.exponent = negative_exponent ? -exponent : exponent;
    }
    return decimal_value(p).value + 0.0;  // no negative zero
}

bool numeric_text(std::string_view text) { return read_whole(text).has_value(); }

bool numeric_test(const Variant& v) {
    switch (v.kind()) {
    case VarKind::String: return numeric_text(v.str());
    case VarKind::Object: return false;
    default: return true;
    }
}

std::string plain_number_text(double value) { return number_text(value, 15); }
std::string plain_number_text(float value) { return number_text(value, 7); }

std::string text_of(const Variant& v) {
    switch (v.kind()) {
    case VarKind::Empty: return "";
    case VarKind::Byte: return std::to_string(*v.get_if<uint8_t>());
    case VarKind::Int16: return std::to_string(*v.get_if<int16_t>());
    case VarKind::Int32: return std::to_string(*v.get_if<int32_t>());
    case VarKind::Single: return plain_number_text(*v.get_if<float>());
    case VarKind::Double: return plain_number_text(*v.get_if<double>());
    case VarKind::Date: return date_text(*v.get_if<Date>());
    case VarKind::String: return v.str();
    case VarKind::Boolean: return *v.get_if<bool>() ? "True" : "False";
    case VarKind::Object: break;
    }
    raise_error(kTypeMismatch);
}

double round_half_even(double value) {
    // From 2^52 up every double is already whole.
    if (!std::isfinite(value) || std::fabs(value) >= 4503599627370496.0) return value;
    const double low = std::floor(value);
    const double diff = value - low;  // exact in this range
    double r = low;
    if (diff > 0.5 || (diff == 0.5 && std::fmod(low, 2.0) != 0)) r = low + 1;
    return r + 0.0;  // no negative zero
}

double to_double(const Variant& v) { return checked_number(v); }

float to_single(const Variant& v) {
    const double d = checked_number(v);
    if (std::isnan(d) || std::fabs(d) > FLT_MAX) raise_error(kOverflow);
    return static_cast<float>(d);
}

uint8_t to_byte(double value) { return static_cast<uint8_t>(whole_in_range(value, 0, 255)); }
int16_t to_int16(double value) { return static_cast<int16_t>(whole_in_range(value, -32768, 32767)); }
int32_t to_int32(double value) {
    return static_cast<int32_t>(whole_in_range(value, -2147483648.0, 2147483647.0));
}

uint8_t to_byte(const Variant& v) { return to_byte(checked_number(v)); }
int16_t to_int16(const Variant& v) { return to_int16(checked_number(v)); }
int32_t to_int32(const Variant& v) { return to_int32(checked_number(v)); }

bool to_bool(const Variant& v) {
    switch (v.kind()) {
    case VarKind::Boolean: return *v.get_if<bool>();
    case VarKind::Object: raise_error(kTypeMismatch);
    case VarKind::String: {
        std::string_view t = v.str();
        while (!t.empty() && is_blank(t.front())) t.remove_prefix(1);
        while (!t.empty() && is_blank(t.back())) t.remove_suffix(1);
        if (same_name(t, "True")) return true;
        if (same_name(t, "False")) return false;
        return text_value(t) != 0;
    }
    default: return v.number() != 0;
    }
}

namespace {

// The number the checked conversions would read, or nothing where they would raise 13 or 6.
std::optional<double> convertible_number(const Variant& v) {
    if (v.is_string()) {
        const auto r = read_whole(v.str());
        if (!r || r->overflow) return std::nullopt;
        return r->value + 0.0;
    }
    if (v.is_object()) return std::nullopt;
    return v.number();
}

}  // namespace

int16_t returned_int16(const Variant& v, int16_t before) {
    const auto d = convertible_number(v);
    if (!d || !std::isfinite(*d)) return before;
    const double r = round_half_even(*d);
    return r >= -32768 && r <= 32767 ? static_cast<int16_t>(r) : before;
}

float returned_single(const Variant& v, float before) {
    const auto d = convertible_number(v);
    if (!d || std::isnan(*d) || std::fabs(*d) > FLT_MAX) return before;
    return static_cast<float>(*d);
}

bool same_name(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    for (size_t i = 0; i < a.size(); ++i) {
        char x = a[i], y = b[i];
        if (x >= 'A' && x <= 'Z') x = static_cast<char>(x + 32);
        if (y >= 'A' && y <= 'Z') y = static_cast<char>(y + 32);
        if (x != y) return false;
    }
    return true;
}

bool starts_with_name(std::string_view s, std::string_view prefix) {
    return s.size() >= prefix.size() && same_name(s.substr(0, prefix.size()), prefix);
}

std::string name_key(std::string_view name) {
    std::string key(name);
    for (char& c : key)
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c + 32);
    return key;
}

namespace {

std::optional<double> stored_whole_number(const Variant& v) {
    if (v.is_object() || !numeric_test(v)) return std::nullopt;
    const double d = round_half_even(to_double(v));
    if (!std::isfinite(d)) return std::nullopt;
    return d;
}

}  // namespace

std::optional<int32_t> stored_int32(const Variant& v) {
    const auto d = stored_whole_number(v);
    if (!d || *d < std::numeric_limits<int32_t>::min() || *d > std::numeric_limits<int32_t>::max()) return std::nullopt;
    return static_cast<int32_t>(*d);
}

std::optional<int16_t> stored_int16(const Variant& v) {
    const auto d = stored_whole_number(v);
    if (!d || *d < std::numeric_limits<int16_t>::min() || *d > std::numeric_limits<int16_t>::max()) return std::nullopt;
    return static_cast<int16_t>(*d);
}

std::optional<bool> stored_bool(const Variant& v) {
    if (v.is_string()) {
        if (same_name(v.str(), "True")) return true;
        if (same_name(v.str(), "False")) return false;
    }
    if (v.is_object() || !numeric_test(v)) return std::nullopt;
    return to_double(v) != 0;
}

// Which values convert is the conversions' own rule, so it is asked: 13 or 6 means the
// form left a value that does not take the kind, and the control's value stands.
Variant coerce_like(const Variant& value, const Variant& given) {
    try {
        switch (given.kind()) {
        case VarKind::Byte: return to_byte(value);
        case VarKind::Int16: return to_int16(value);
        case VarKind::Int32: return to_int32(value);
        case VarKind::Single: return to_single(value);
        case VarKind::Double: return to_double(value);
        case VarKind::Boolean: return to_bool(value);
        case VarKind::String: return text_of(value);
        case VarKind::Date: return value.kind() == VarKind::Date ? value : given;
        case VarKind::Object: return value.is_object() ? value : given;
        case VarKind::Empty: return value;
        }
    } catch (const RuntimeError&) {
    }
    return given;
}

}  // namespace kel

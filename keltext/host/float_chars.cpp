#include "keltext/host/float_chars.h"

#include <cerrno>
#include <clocale>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <string>
#include <string_view>
#include <version>

namespace kel {
namespace float_chars_fallback {
namespace {

bool is_digit(char c) { return c >= '0' && c <= '9'; }

std::to_chars_result put(char* first, char* last, std::string_view text) {
    if (text.size() > static_cast<std::size_t>(last - first)) return {last, std::errc::value_too_large};
    std::memcpy(first, text.data(), text.size());
    return {first + text.size(), std::errc()};
}

// The C library formats and reads with the locale's decimal point; the texts here always
// use ".".
const char* locale_point() {
    const char* point = std::localeconv()->decimal_point;
    return (point && *point) ? point : ".";
}

void replace_first(std::string& text, std::string_view from, std::string_view to) {
    if (from == to) return;
    if (const auto at = text.find(from); at != std::string::npos) text.replace(at, from.size(), to);
}

// printf's %.*e or %.*f of `value`, with "." for the point.
std::string c_format(const char* format, int precision, double value) {
    const int size = std::snprintf(nullptr, 0, format, precision, value);
    if (size <= 0) return {};
    std::string text(static_cast<std::size_t>(size) + 1, '\0');
    std::snprintf(text.data(), text.size(), format, precision, value);
    text.resize(static_cast<std::size_t>(size));
    replace_first(text, locale_point(), ".");
    return text;
}

double c_read(const char* text, char** end, double) { return std::strtod(text, end); }
float c_read(const char* text, char** end, float) { return std::strtof(text, end); }

// value = D.DDD x 10^exponent; digits hold no sign and no point.
struct Decimal {
    std::string digits;
    int exponent = 0;
};

Decimal scientific_digits(double magnitude, int decimals) {
    const std::string text = c_format("%.*e", decimals, magnitude);
    Decimal d;
    std::size_t i = 0;
    for (; i < text.size() && text[i] != 'e'; ++i)
        if (is_digit(text[i])) d.digits += text[i];
    if (i < text.size()) d.exponent = std::atoi(text.c_str() + i + 1);
    return d;
}

// The decimal read back as T (no point in the text, so no locale in the way).
template <class T>
T read_back(const Decimal& d) {
    const std::string text =
        d.digits + 'e' + std::to_string(d.exponent - static_cast<int>(d.digits.size()) + 1);
    char* end = nullptr;
    return c_read(text.c_str(), &end, T{});
}

// The neighbour one unit up or down in the last digit, with the same number of digits.
// Nothing when it runs out of digits.
bool step(Decimal& d, int direction) {
    std::string& s = d.digits;
    if (direction > 0) {
        std::size_t i = s.size();
        while (i > 0 && s[i - 1] == '9') s[--i] = '0';
        if (i == 0) {
            s.insert(s.begin(), '1');
            s.pop_back();
            ++d.exponent;
        } else {
            ++s[i - 1];
        }
        return true;
    }
    std::size_t i = s.size();
    while (i > 0 && s[i - 1] == '0') s[--i] = '9';
    if (i == 0) return false;
    --s[i - 1];
    if (s[0] == '0') {
        if (s.size() == 1) return false;
        s.erase(s.begin());
        s.push_back('9');
        --d.exponent;
    }
    return true;
}

void trim_zeros(Decimal& d) {
    const std::size_t last = d.digits.find_last_not_of('0');
    d.digits.resize(last == std::string::npos ? 1 : last + 1);
}

// The fewest significant digits that read back as `magnitude` (finite, above 0); of those, the
// nearest to it. printf gives the nearest with a given number of digits; next to a power of two
// the values that read back lie lopsided around it, so the neighbour on the far side may read
// back where the nearest does not.
template <class T>
Decimal shortest_digits(T magnitude) {
    constexpr int kMost = std::numeric_limits<T>::max_digits10;
    for (int n = 1; n < kMost; ++n) {
        Decimal d = scientific_digits(static_cast<double>(magnitude), n - 1);
        if (read_back<T>(d) == magnitude) {
            trim_zeros(d);
            return d;
        }
        Decimal other = d;
        const bool below = read_back<double>(d) < static_cast<double>(magnitude);
        if (step(other, below ? 1 : -1) && read_back<T>(other) == magnitude) {
            trim_zeros(other);
            return other;
        }
    }
    Decimal d = scientific_digits(static_cast<double>(magnitude), kMost - 1);
    trim_zeros(d);
    return d;
}

std::string scientific_text(bool negative, const Decimal& d) {
    std::string s = negative ? "-" : "";
    s += d.digits[0];
    if (d.digits.size() > 1) {
        s += '.';
        s.append(d.digits, 1);
    }
    s += d.exponent < 0 ? "e-" : "e+";
    const int e = d.exponent < 0 ? -d.exponent : d.exponent;
    if (e < 10) s += '0';
    s += std::to_string(e);
    return s;
}

// A whole number in fixed form is written exactly: of the texts of equal length that read back,
// the exact one is nearest.
std::string fixed_text(bool negative, const Decimal& d, double value) {
    const int n = static_cast<int>(d.digits.size());
    if (d.exponent >= n - 1) return c_format("%.*f", 0, value);
    std::string s = negative ? "-" : "";
    if (d.exponent < 0) {
        s += "0.";
        s.append(static_cast<std::size_t>(-d.exponent - 1), '0');
        s += d.digits;
    } else {
        s.append(d.digits, 0, static_cast<std::size_t>(d.exponent) + 1);
        s += '.';
        s.append(d.digits, static_cast<std::size_t>(d.exponent) + 1);
    }
    return s;
}

bool special(double value, std::string& text) {
    if (std::isnan(value)) text = std::signbit(value) ? "-nan" : "nan";
    else if (std::isinf(value)) text = value < 0 ? "-inf" : "inf";
    else return false;
    return true;
}

enum class Form { shortest, fixed, scientific };

template <class T>
std::to_chars_result format_shortest(char* first, char* last, T value, Form form) {
    std::string text;
    if (special(static_cast<double>(value), text)) return put(first, last, text);
    const bool negative = std::signbit(value);
    if (value == 0) return put(first, last, form == Form::scientific ? (negative ? "-0e+00" : "0e+00") : (negative ? "-0" : "0"));
    const Decimal d = shortest_digits<T>(negative ? -value : value);
    switch (form) {
        case Form::fixed: return put(first, last, fixed_text(negative, d, static_cast<double>(value)));
        case Form::scientific: return put(first, last, scientific_text(negative, d));
        case Form::shortest: break;
    }
    const std::string fixed = fixed_text(negative, d, static_cast<double>(value));
    const std::string scientific = scientific_text(negative, d);
    return put(first, last, fixed.size() <= scientific.size() ? fixed : scientific);
}

template <class T>
std::to_chars_result format_precise(char* first, char* last, T value, std::chars_format fmt, int precision) {
    std::string text;
    if (special(static_cast<double>(value), text)) return put(first, last, text);
    if (fmt != std::chars_format::fixed && fmt != std::chars_format::scientific)
        return {last, std::errc::invalid_argument};
    return put(first, last, c_format(fmt == std::chars_format::fixed ? "%.*f" : "%.*e", precision,
                                     static_cast<double>(value)));
}

Form form_of(std::chars_format fmt, bool& ok) {
    ok = fmt == std::chars_format::fixed || fmt == std::chars_format::scientific;
    return fmt == std::chars_format::fixed ? Form::fixed : Form::scientific;
}

bool starts_with_word(const char* p, const char* last, std::string_view word) {
    if (static_cast<std::size_t>(last - p) < word.size()) return false;
    for (char w : word) {
        char c = *p++;
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
        if (c != w) return false;
    }
    return true;
}

template <class T>
std::from_chars_result parse(const char* first, const char* last, T& value) {
    const char* p = first;
    const bool negative = p != last && *p == '-';
    if (negative) ++p;
    if (starts_with_word(p, last, "inf")) {
        p += 3;
        if (starts_with_word(p, last, "inity")) p += 5;
        value = negative ? -std::numeric_limits<T>::infinity() : std::numeric_limits<T>::infinity();
        return {p, std::errc()};
    }
    if (starts_with_word(p, last, "nan")) {
        p += 3;
        if (p != last && *p == '(') {
            const char* q = p + 1;
            while (q != last && (is_digit(*q) || (*q >= 'a' && *q <= 'z') || (*q >= 'A' && *q <= 'Z') || *q == '_')) ++q;
            if (q != last && *q == ')') p = q + 1;
        }
        value = negative ? -std::numeric_limits<T>::quiet_NaN() : std::numeric_limits<T>::quiet_NaN();
        return {p, std::errc()};
    }
    int digits = 0;
    while (p != last && is_digit(*p)) ++p, ++digits;
    if (p != last && *p == '.') {
        ++p;
        while (p != last && is_digit(*p)) ++p, ++digits;
    }
    if (digits == 0) return {first, std::errc::invalid_argument};
    if (p != last && (*p == 'e' || *p == 'E')) {
        const char* q = p + 1;
        if (q != last && (*q == '+' || *q == '-')) ++q;
        if (q != last && is_digit(*q)) {
            while (q != last && is_digit(*q)) ++q;
            p = q;
        }
    }
    // Only what was checked above reaches the C library, which would also take blanks, a '+',
    // hexadecimal and its own locale's point.
    std::string text(first, p);
    replace_first(text, ".", locale_point());
    errno = 0;
    char* end = nullptr;
    const T v = c_read(text.c_str(), &end, T{});
    if (errno == ERANGE && (std::isinf(v) || v == 0)) return {p, std::errc::result_out_of_range};
    value = v;
    return {p, std::errc()};
}

}  // namespace

std::to_chars_result format_float(char* first, char* last, double value) {
    return format_shortest(first, last, value, Form::shortest);
}
std::to_chars_result format_float(char* first, char* last, float value) {
    return format_shortest(first, last, value, Form::shortest);
}
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt) {
    bool ok = false;
    const Form form = form_of(fmt, ok);
    if (!ok) return {last, std::errc::invalid_argument};
    return format_shortest(first, last, value, form);
}
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt) {
    bool ok = false;
    const Form form = form_of(fmt, ok);
    if (!ok) return {last, std::errc::invalid_argument};
    return format_shortest(first, last, value, form);
}
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt, int precision) {
    return format_precise(first, last, value, fmt, precision);
}
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt, int precision) {
    return format_precise(first, last, value, fmt, precision);
}
std::from_chars_result parse_float(const char* first, const char* last, double& value) {
    return parse(first, last, value);
}
std::from_chars_result parse_float(const char* first, const char* last, float& value) {
    return parse(first, last, value);
}

}  // namespace float_chars_fallback

#if defined(__cpp_lib_to_chars)

const bool kStandardFloatChars = true;

namespace {
bool supported(std::chars_format fmt) { return fmt == std::chars_format::fixed || fmt == std::chars_format::scientific; }
}  // namespace

std::to_chars_result format_float(char* first, char* last, double value) { return std::to_chars(first, last, value); }
std::to_chars_result format_float(char* first, char* last, float value) { return std::to_chars(first, last, value); }
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt) {
    if (!supported(fmt)) return {last, std::errc::invalid_argument};
    return std::to_chars(first, last, value, fmt);
}
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt) {
    if (!supported(fmt)) return {last, std::errc::invalid_argument};
    return std::to_chars(first, last, value, fmt);
}
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt, int precision) {
    if (!supported(fmt) && std::isfinite(value)) return {last, std::errc::invalid_argument};
    return std::to_chars(first, last, value, fmt, precision);
}
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt, int precision) {
    if (!supported(fmt) && std::isfinite(value)) return {last, std::errc::invalid_argument};
    return std::to_chars(first, last, value, fmt, precision);
}
std::from_chars_result parse_float(const char* first, const char* last, double& value) {
    return std::from_chars(first, last, value);
}
std::from_chars_result parse_float(const char* first, const char* last, float& value) {
    return std::from_chars(first, last, value);
}

#else

const bool kStandardFloatChars = false;

std::to_chars_result format_float(char* first, char* last, double value) {
    return float_chars_fallback::format_float(first, last, value);
}
std::to_chars_result format_float(char* first, char* last, float value) {
    return float_chars_fallback::format_float(first, last, value);
}
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt) {
    return float_chars_fallback::format_float(first, last, value, fmt);
}
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt) {
    return float_chars_fallback::format_float(first, last, value, fmt);
}
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt, int precision) {
    return float_chars_fallback::format_float(first, last, value, fmt, precision);
}
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt, int precision) {
    return float_chars_fallback::format_float(first, last, value, fmt, precision);
}
std::from_chars_result parse_float(const char* first, const char* last, double& value) {
    return float_chars_fallback::parse_float(first, last, value);
}
std::from_chars_result parse_float(const char* first, const char* last, float& value) {
    return float_chars_fallback::parse_float(first, last, value);
}

#endif

}  // namespace kel

#include "keltext/host/date_recognizer.h"

#include <array>
#include <cstddef>

namespace kel {
namespace {

bool is_blank(char c) { return c == ' ' || c == '\t'; }
bool is_digit(char c) { return c >= '0' && c <= '9'; }
bool is_separator(char c) { return c == '/' || c == '-' || c == '.'; }

// One field's digits, with the blanks around them removed; nothing when the field holds
// anything but digits (a blank between digits included) or no digit at all.
struct Field {
    int value = 0;
    std::size_t digits = 0;
};

std::optional<Field> read_field(std::string_view s) {
    std::size_t b = 0, e = s.size();
    while (b < e && is_blank(s[b])) ++b;
    while (e > b && is_blank(s[e - 1])) --e;
    if (b == e || e - b > 4) return std::nullopt;
    Field f;
    for (std::size_t i = b; i < e; ++i) {
        if (!is_digit(s[i])) return std::nullopt;
        f.value = f.value * 10 + (s[i] - '0');
    }
    f.digits = e - b;
    return f;
}

}  // namespace

std::optional<Date> recognize_date_text(std::string_view text) {
    // Split at exactly two separators of one kind.
    std::array<std::size_t, 2> at{};
    std::size_t count = 0;
    char sep = 0;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (!is_separator(text[i])) continue;
        if (count == 2 || (sep != 0 && text[i] != sep)) return std::nullopt;
        sep = text[i];
        at[count++] = i;
    }
    if (count != 2) return std::nullopt;
    const auto first = read_field(text.substr(0, at[0]));
    const auto second = read_field(text.substr(at[0] + 1, at[1] - at[0] - 1));
    const auto third = read_field(text.substr(at[1] + 1));
    if (!first || !second || !third) return std::nullopt;
    if (second->digits > 2) return std::nullopt;

    if (first->digits == 4) {  // year first: yyyy-mm-dd
        if (third->digits > 2) return std::nullopt;
        return make_date(first->value, second->value, third->value);
    }
    if (first->digits > 2) return std::nullopt;
    if (third->digits != 4) return std::nullopt;
    return make_date(third->value, second->value, first->value);
}

std::optional<Date> recognize_date(const Variant& v) {
    if (const Date* d = v.get_if<Date>()) {
        const Ymd ymd = to_ymd(*d);
        if (ymd.year < 100 || ymd.year > 9999) return std::nullopt;
        return *d;
    }
    if (v.is_string()) return recognize_date_text(v.str());
    return std::nullopt;
}

}  // namespace kel

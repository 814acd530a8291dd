#include "keltext/datemask/date_rules.h"

#include <algorithm>
#include <cmath>
#include <optional>

#include "keltext/host/conversions.h"
#include "keltext/host/date.h"
#include "keltext/host/date_recognizer.h"
#include "keltext/host/mask.h"

namespace kel {
namespace {

// Characters `from`..`from + count - 1`, counting from 1; shorter (or empty) past the end.
std::string_view mid(std::string_view s, std::size_t from, std::size_t count) {
    if (from < 1 || from > s.size()) return {};
    return s.substr(from - 1, count);
}

std::string_view trim_blanks(std::string_view s) {
    std::size_t b = 0, e = s.size();
    while (b < e && s[b] == ' ') ++b;
    while (e > b && s[e - 1] == ' ') --e;
    return s.substr(b, e - b);
}

// The host's checked conversions of a text, as a value or nothing where the conversion would
// fail (a text that is not numeric, a blank one included, or a result out of range).
std::optional<double> double_of(std::string_view s) {
    if (!numeric_text(s)) return std::nullopt;
    // A numeric text reads the same from its start once its grouping commas are gone, and
    // reading it that way never fails: a value too large for a double simply is no value here.
    std::string plain(s);
    std::erase(plain, ',');
    const double d = leading_value(plain);
    if (!std::isfinite(d) || std::fabs(d) > 1e300) return std::nullopt;
    return d;
}

std::optional<int> whole_of(std::string_view s, int lo, int hi) {
    const auto d = double_of(s);
    if (!d) return std::nullopt;
    const double r = round_half_even(*d);
    if (r < lo || r > hi) return std::nullopt;
    return static_cast<int>(r);
}

std::optional<int> byte_of(std::string_view s) { return whole_of(s, 0, 255); }
std::optional<int> int16_of(std::string_view s) { return whole_of(s, -32768, 32767); }

std::string two_digits(int v) {
    std::string s = std::to_string(v);
    return v < 10 ? "0" + s : s;
}

// Day capped by the length of the month. February takes 29 days in every year whose whole
// part divides by 4 (no century rule), and also when the year is no number at all.
int cap_by_month(int day, int month, std::string_view year) {
    switch (month) {
        case 1: case 3: case 5: case 7: case 8: case 10: case 12:
            return std::min(day, 31);
        case 4: case 6: case 9: case 11:
            return std::min(day, 30);
        case 2: {
            if (day <= 28) return day;
            const auto y = double_of(year);
            const bool divisible = !y || std::fmod(std::trunc(*y), 4.0) == 0.0;
            return divisible ? 29 : 28;
        }
        default:
            return day;
    }
}

std::string format_part(std::string_view field, int highest) {
    int v = 0;
    if (!trim_blanks(field).empty()) v = byte_of(field).value_or(0);
    if (v == 0) v = 1;
    return v <= highest ? two_digits(v) : std::string();
}

}  // namespace

std::string NormalizeDateText(std::string_view text, bool zub_date, bool trigger_error) {
    if (trigger_error && !recognize_date_text(text)) return std::string(text);

    int day = 0, month = 0;
    std::size_t separators = 0, recorded = 0;
    std::string year;
    for (std::size_t i = 1; i <= text.size(); ++i) {
        const char c = text[i - 1];
        if (c == '/' || c == '-') ++separators;
        if (day == 0 && separators == 1) {
            // While the day stays 0 the recorded position keeps moving with i, so a blank or
            // zero day field makes the month below be read from the wrong place and fall
            // back to 1: such a text becomes the first of January.
            if (const auto d = byte_of(mid(text, 1, i - 1))) day = *d;
            recorded = i;
        }
        if (separators == 2) {
            year = std::string(text.substr(i));
            // recorded < i here, so the start stays at 2 or beyond.
            if (const auto m = byte_of(mid(text, i - recorded + 1, 2))) month = *m;
            if (month > 12) month = 12;
            if (month == 0) month = 1;
            break;
        }
    }

    if (const auto y = int16_of(year)) year = std::to_string(*y);

    bool widened = false;
    if (const auto t = trim_blanks(year); t.size() == 1) year = "0" + std::string(t);
    if (const auto t = trim_blanks(year); t.size() == 3) year = std::string(t.substr(1));
    if (const auto t = trim_blanks(year); t.size() == 2) {
        std::string y(t);
        if (const auto v = int16_of(y); v && *v > 40) {
            y = "19" + y;
            widened = true;
        }
        if (const auto v = int16_of(y); v && *v < 41) {
            y = "20" + y;
            widened = true;
        }
        if (widened) year = y;
    }

    if (day == 0) day = 1;
    if (!zub_date) {
        day = cap_by_month(day, month, year);
    } else if (day > 28 && !trigger_error) {
        day = 28;
    }

    if (text.find('/') != std::string_view::npos) return two_digits(day) + "/" + two_digits(month) + "/" + year;
    return widened ? year : std::string();
}

std::string PromptToBlank(std::string_view text, int32_t date_style) {
    // The field always holds exactly one character a mask position; the scan stops at the
    // text's end as well, so that a text of another length keeps every character it has.
    const std::size_t n = std::min<std::size_t>(date_style == ddMMyyyy ? 10 : 6, text.size());
    std::string s(text);
    std::replace(s.begin(), s.begin() + static_cast<std::ptrdiff_t>(n), '_', ' ');
    return s;
}

std::string FormatDayPart(std::string_view text) { return format_part(mid(text, 1, 2), 31); }

std::string FormatMonthPart(std::string_view text) { return format_part(mid(text, 4, 2), 12); }

DateField DateFieldAt(int32_t caret) {
    if (caret < 0) return DateField::none;
    if (caret <= 2) return DateField::day;
    if (caret <= 5) return DateField::month;
    return DateField::year;
}

std::string BlankFieldFromCaret(std::string_view text, int32_t caret) {
    std::string out(text);
    // Each field ends where its separator stands: the day at 2, the month at 5, the year at 10.
    int32_t end = 10;
    switch (DateFieldAt(caret)) {
    case DateField::day: end = 2; break;
    case DateField::month: end = 5; break;
    case DateField::year: end = 10; break;
    case DateField::none: return out;
    }
    for (int32_t i = caret; i < end && i < static_cast<int32_t>(out.size()); ++i) out[static_cast<std::size_t>(i)] = ' ';
    return out;
}

std::string BlankSelection(std::string_view text, std::string_view mask, int32_t start, int32_t length) {
    std::string out(text);
    const auto n = static_cast<int32_t>(std::min(out.size(), mask.size()));
    for (int32_t i = std::max(start, 0); i < n && i - start < length; ++i)
        if (mask_is_input(mask[static_cast<std::size_t>(i)])) out[static_cast<std::size_t>(i)] = kMaskPrompt;
    return out;
}

bool CheckMonthYear(std::string_view text) {
    const double month = round_half_even(leading_value(mid(text, 1, 2)));
    std::string year(mid(text, 4, 2));
    year.resize(2, ' ');
    // A month below 1 cannot come from the field's digits, but a month of -1 is no month either.
    if (month < 1 || month > 12) return false;
    return year.find(' ') == std::string::npos;
}

std::string ClampToDateRange(std::string_view text, const Variant& min_date, const Variant& max_date) {
    std::string result(text);
    auto date = recognize_date_text(text);
    if (!date) return result;
    if (const auto lo = recognize_date(min_date); lo && *lo > *date) {
        result = date_text(*lo);
        date = lo;
    }
    if (const auto hi = recognize_date(max_date); hi && *hi < *date) result = date_text(*hi);
    return result;
}

}  // namespace kel

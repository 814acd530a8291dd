#pragma once
// Date values of the host: a whole day count, no time of day.
#include <compare>
#include <cstdint>
#include <optional>
#include <string>

namespace kel {

struct Date {
    // Days since 30 December 1899 (day 0), as the host counts them; negative before it.
    int32_t serial = 0;
    auto operator<=>(const Date&) const = default;
};

struct Ymd {
    int year = 0, month = 0, day = 0;
    auto operator<=>(const Ymd&) const = default;
};

bool is_leap_year(int year);
int days_in_month(int year, int month);       // 0 for a month outside 1..12
bool is_valid_ymd(int year, int month, int day);  // Gregorian, years 100..9999
std::optional<Date> make_date(int year, int month, int day);
Ymd to_ymd(Date d);

// The text form of a date: "dd/mm/yyyy".
std::string date_text(Date d);

}  // namespace kel

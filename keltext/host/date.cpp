#include "keltext/host/date.h"

#include <cstdio>

namespace kel {
namespace {

// Days from 1 March of year 0 (proleptic Gregorian) to y-m-d; the usual civil-calendar arithmetic.
int64_t days_from_civil(int64_t y, int m, int d) {
    y -= m <= 2;
    const int64_t era = (y >= 0 ? y : y - 399) / 400;
    const int64_t yoe = y - era * 400;
    const int64_t doy = (153 * (m + (m > 2 ? -3 : 9)) + 2) / 5 + d - 1;
    const int64_t doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
    return era * 146097 + doe - 719468;  // days since 1970-01-01
}

constexpr int64_t kEpochOffset = 25569;  // 1899-12-30 to 1970-01-01

}  // namespace

bool is_leap_year(int year) { return (year % 4 == 0 && year % 100 != 0) || year % 400 == 0; }

int days_in_month(int year, int month) {
    static constexpr int kDays[] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    if (month < 1 || month > 12) return 0;
    return month == 2 && is_leap_year(year) ? 29 : kDays[month - 1];
}

bool is_valid_ymd(int year, int month, int day) {
    return year >= 100 && year <= 9999 && day >= 1 && day <= days_in_month(year, month);
}

std::optional<Date> make_date(int year, int month, int day) {
    if (!is_valid_ymd(year, month, day)) return std::nullopt;
    return Date{static_cast<int32_t>(days_from_civil(year, month, day) + kEpochOffset)};
}

Ymd to_ymd(Date d) {
    int64_t z = static_cast<int64_t>(d.serial) - kEpochOffset + 719468;
    const int64_t era = (z >= 0 ? z : z - 146096) / 146097;
    const int64_t doe = z - era * 146097;
    const int64_t yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
    const int64_t doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
    const int64_t mp = (5 * doy + 2) / 153;
    const int day = static_cast<int>(doy - (153 * mp + 2) / 5 + 1);
    const int month = static_cast<int>(mp < 10 ? mp + 3 : mp - 9);
    const int year = static_cast<int>(yoe + era * 400 + (month <= 2));
    return {year, month, day};
}

std::string date_text(Date d) {
    const Ymd v = to_ymd(d);
    char buf[32];
    std::snprintf(buf, sizeof buf, "%02d/%02d/%04d", v.day, v.month, v.year);
    return buf;
}

}  // namespace kel

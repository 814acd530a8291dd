#include "keltext/host/date.h"

#include <gtest/gtest.h>

namespace kel {
namespace {

TEST(Date, KnownSerials) {
    struct Case {
        int year, month, day;
        int32_t serial;
    };
    const Case cases[] = {
        {1899, 12, 30, 0},   {1899, 12, 31, 1},       {1900, 1, 1, 2},     {1900, 3, 1, 61},
        {2000, 1, 1, 36526}, {2003, 1, 31, 37652},    {1899, 12, 29, -1},  {100, 1, 1, -657434},
        {9999, 12, 31, 2958465},
    };
    for (const auto& c : cases) {
        const auto d = make_date(c.year, c.month, c.day);
        ASSERT_TRUE(d.has_value()) << c.serial;
        EXPECT_EQ(d->serial, c.serial);
        EXPECT_EQ(to_ymd(Date{c.serial}), (Ymd{c.year, c.month, c.day}));
    }
}

TEST(Date, RoundTripOverTheWholeRange) {
    // Consecutive days of years 100 to 9999 have consecutive serials and valid fields.
    auto first = make_date(100, 1, 1);
    ASSERT_TRUE(first.has_value());
    int32_t serial = first->serial;
    for (int y = 100; y <= 9999; ++y)
        for (int m = 1; m <= 12; ++m)
            for (int d = 1; d <= days_in_month(y, m); ++d, ++serial) {
                const auto made = make_date(y, m, d);
                ASSERT_TRUE(made.has_value());
                ASSERT_EQ(made->serial, serial) << y << '-' << m << '-' << d;
                ASSERT_EQ(to_ymd(*made), (Ymd{y, m, d}));
            }
}

TEST(Date, LeapYearsAndInvalidDates) {
    // The run over the whole range above proves the month lengths of valid dates.
    EXPECT_FALSE(is_leap_year(1900));
    EXPECT_EQ(days_in_month(2003, 0), 0);
    EXPECT_EQ(days_in_month(2003, 13), 0);
    EXPECT_FALSE(make_date(2003, 2, 29).has_value());
    EXPECT_FALSE(make_date(1900, 2, 29).has_value());
    EXPECT_TRUE(make_date(2000, 2, 29).has_value());
    EXPECT_FALSE(make_date(99, 12, 31).has_value());
    EXPECT_FALSE(make_date(10000, 1, 1).has_value());
    EXPECT_FALSE(make_date(2003, 4, 31).has_value());
    EXPECT_FALSE(make_date(2003, 1, 0).has_value());
}

TEST(Date, Text) {
    EXPECT_EQ(date_text(*make_date(2003, 1, 31)), "31/01/2003");
    EXPECT_EQ(date_text(*make_date(100, 2, 3)), "03/02/0100");
    EXPECT_EQ(date_text(Date{0}), "30/12/1899");
}

}  // namespace
}  // namespace kel

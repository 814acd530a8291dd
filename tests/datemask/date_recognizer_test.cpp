#include "keltext/host/date_recognizer.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <memory>
#include <optional>
#include <string>

#include "keltext/host/font.h"

namespace kel {
namespace {

std::string dmy(int d, int m, int y) {
    char buf[40];
    std::snprintf(buf, sizeof buf, "%02d/%02d/%04d", d, m, y);
    return buf;
}

// Every complete "dd/mm/yyyy" text of 1900..2100, including day 0 and days past the month's
// end, is recognized exactly when the standard calendar says the day exists.
TEST(DateRecognizer, AgreesWithTheCalendarOnEveryDayOf1900To2100) {
    namespace chr = std::chrono;
    int accepted = 0;
    for (int y = 1900; y <= 2100; ++y)
        for (unsigned m = 0; m <= 13; ++m)
            for (unsigned d = 0; d <= 32; ++d) {
                const chr::year_month_day ymd{chr::year{y}, chr::month{m}, chr::day{d}};
                const std::string text = dmy(static_cast<int>(d), static_cast<int>(m), y);
                const auto got = recognize_date_text(text);
                ASSERT_EQ(got.has_value(), ymd.ok()) << text;
                if (!got) continue;
                ++accepted;
                EXPECT_EQ(to_ymd(*got), (Ymd{y, static_cast<int>(m), static_cast<int>(d)})) << text;
                EXPECT_EQ(date_text(*got), text);
            }
    EXPECT_EQ(accepted, 73414);  // days from 1 Jan 1900 to 31 Dec 2100
}

struct TextCase {
    const char* text;
    std::optional<Ymd> expected;
};

TEST(DateRecognizer, WrittenForms) {
    const TextCase cases[] = {
        // Nothing, blanks and partial dates.
        {"", std::nullopt},
        {"  /  /    ", std::nullopt},
        {"01/01/    ", std::nullopt},
        {"  /05/2003", std::nullopt},
        {"05/  /2003", std::nullopt},
        {"12/05", std::nullopt},
        {"/05/2003", std::nullopt},
        // Blanks around fields and the text, never inside digits.
        {" 5/ 3/2003", Ymd{2003, 3, 5}},
        {"5 /3 /2003", Ymd{2003, 3, 5}},
        {"  12/05/2003  ", Ymd{2003, 5, 12}},
        {"12/05/20 3", std::nullopt},
        {"1 2/05/2003", std::nullopt},
        // Four-digit years only.
        {"12/05/03  ", std::nullopt},
        {"12/05/2", std::nullopt},
        {"12/05/203 ", std::nullopt},
        {"12/05/0045", std::nullopt},
        {"12/05/0100", Ymd{100, 5, 12}},
        {"31/12/9999", Ymd{9999, 12, 31}},
        {"12/05/12345", std::nullopt},
        // Other separators, one kind per text, and the year-first ISO form.
        {"12-05-2003", Ymd{2003, 5, 12}},
        {"12.05.2003", Ymd{2003, 5, 12}},
        {"12/05-2003", std::nullopt},
        {"2003-05-12", Ymd{2003, 5, 12}},
        {"2003-02-29", std::nullopt},
        {"12/05/2003/1", std::nullopt},
        // Not digits.
        {"aa/bb/cccc", std::nullopt},
        {"+1/05/2003", std::nullopt},
        {"12/05/2003x", std::nullopt},
        {"\xB2/05/2003", std::nullopt},
        {"001/05/2003", std::nullopt},
    };
    for (const auto& c : cases) {
        const auto got = recognize_date_text(c.text);
        ASSERT_EQ(got.has_value(), c.expected.has_value()) << '"' << c.text << '"';
        if (got) {
            EXPECT_EQ(to_ymd(*got), *c.expected) << c.text;
        }
    }
}

TEST(DateRecognizer, ValuesOfOtherKinds) {
    const Date d = *make_date(2003, 1, 31);
    EXPECT_EQ(recognize_date(Variant(d)), d);
    EXPECT_EQ(recognize_date(Variant("31/01/2003")), d);
    EXPECT_FALSE(is_date(Variant()));
    EXPECT_FALSE(is_date(Variant(int32_t{37652})));
    EXPECT_FALSE(is_date(Variant(37652.0)));
    EXPECT_FALSE(is_date(Variant(true)));
    EXPECT_FALSE(is_date(Variant(std::make_shared<Font>())));
    // A date value outside the host's years 100..9999 is no date.
    EXPECT_FALSE(is_date(Variant(Date{-700000})));
    EXPECT_FALSE(is_date(Variant(Date{3000000})));
}

}  // namespace
}  // namespace kel

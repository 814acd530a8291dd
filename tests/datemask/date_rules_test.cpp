#include "keltext/datemask/date_rules.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <string>

#include "keltext/host/date.h"

namespace kel {
namespace {

struct NormalizeCase {
    const char* text;
    bool zub_date;
    bool trigger_error;
    const char* expected;
};

TEST(NormalizeDateText, Table) {
    const NormalizeCase cases[] = {
        // Day capped by the month.
        {"32/01/2003", false, false, "31/01/2003"},
        {"31/04/2003", false, false, "30/04/2003"},
        {"99/12/2003", false, false, "31/12/2003"},
        {"45/13/2003", false, false, "31/12/2003"},
        // The last day of each month, and month 12, stand as typed.
        {"31/01/2003", false, false, "31/01/2003"},
        {"28/02/2003", false, false, "28/02/2003"},
        {"28/02/2004", false, false, "28/02/2004"},
        {"31/03/2003", false, false, "31/03/2003"},
        {"30/04/2003", false, false, "30/04/2003"},
        {"31/05/2003", false, false, "31/05/2003"},
        {"30/06/2003", false, false, "30/06/2003"},
        {"31/07/2003", false, false, "31/07/2003"},
        {"31/08/2003", false, false, "31/08/2003"},
        {"30/09/2003", false, false, "30/09/2003"},
        {"31/10/2003", false, false, "31/10/2003"},
        {"30/11/2003", false, false, "30/11/2003"},
        {"31/12/2003", false, false, "31/12/2003"},
        {"28/12/2003", true, false, "28/12/2003"},
        // February: the four-year rule alone, a blank year counts as divisible.
        {"29/02/2003", false, false, "28/02/2003"},
        {"30/02/2004", false, false, "29/02/2004"},
        {"29/02/2004", false, false, "29/02/2004"},
        {"29/02/1900", false, false, "29/02/1900"},
        {"31/02/2100", false, false, "29/02/2100"},
        {"30/02/    ", false, false, "29/02/    "},
        // Year widening.
        {"12/05/03  ", false, false, "12/05/2003"},
        {"12/05/45  ", false, false, "12/05/1945"},
        {"12/05/40  ", false, false, "12/05/2040"},
        {"12/05/41  ", false, false, "12/05/1941"},
        {"12/05/0   ", false, false, "12/05/2000"},
        {"12/05/203 ", false, false, "12/05/2003"},
        {"12/05/ 03 ", false, false, "12/05/2003"},
        {"12/05/0045", false, false, "12/05/1945"},
        {"12/05/ab  ", false, false, "12/05/ab  "},
        {"30/02/9e9999", false, false, "29/02/9e9999"},
        {"12/05/2,003", false, false, "12/05/2003"},
        {" 5/ 3/03  ", false, false, "05/03/2003"},
        // Blank and zero fields: a day that stays 0 sends the month reading astray, so the
        // date falls back to the first of January.
        {"  /  /    ", false, false, "01/01/    "},
        {"  /05/2003", false, false, "01/01/2003"},
        {"00/05/2003", false, false, "01/01/2003"},
        {"12/00/2003", false, false, "12/01/2003"},
        {"5 /  /    ", false, false, "05/01/    "},
        {"256/01/2003", false, false, "01/12/2003"},  // month read from "56"
        {"12/05", false, false, "12/00/"},
        {"", false, false, ""},
        // "-" separators: only the widened year comes back.
        {"12-05-03", false, false, "2003"},
        {"12-05-45", false, false, "1945"},
        {"12-05-2003", false, false, ""},
        {"12/05-03  ", false, false, "12/05/2003"},
        // 28-day months.
        {"30/01/2003", true, false, "28/01/2003"},
        {"45/13/2003", true, false, "28/12/2003"},
        {"29/02/2004", true, false, "28/02/2004"},
        // No-correction mode: a non-date is left alone, a date keeps its day.
        {"30/01/2003", true, true, "30/01/2003"},
        {"31/04/2003", true, true, "31/04/2003"},
        {"29/02/2003", true, true, "29/02/2003"},
        {"  /  /    ", true, true, "  /  /    "},
        {"12/05/03  ", true, true, "12/05/03  "},
        {" 5/ 3/2003", false, true, "05/03/2003"},
        {" 5/ 3/2003", true, true, "05/03/2003"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(NormalizeDateText(c.text, c.zub_date, c.trigger_error), c.expected)
            << '"' << c.text << "\" zub=" << c.zub_date << " trigger=" << c.trigger_error;
}

TEST(PromptToBlank, Table) {
    struct Case {
        const char* text;
        int32_t style;
        const char* expected;
    };
    const Case cases[] = {
        {"__/__/____", ddMMyyyy, "  /  /    "},
        {"12/0_/2003", ddMMyyyy, "12/0 /2003"},
        {"05/0_A", mmyyA, "05/0 A"},
        {"__/___", mmyyA, "  /   "},
        {"__/__/____", 7, "  /  /____"},
        // Other lengths keep every character they have.
        {"__/__/____", mmyyA, "  /  /____"},
        {"1_", ddMMyyyy, "1 "},
        {"", ddMMyyyy, ""},
        {"__/__/_____x", ddMMyyyy, "  /  /    _x"},
    };
    for (const auto& c : cases) EXPECT_EQ(PromptToBlank(c.text, c.style), c.expected) << c.text;
}

TEST(FormatParts, DayAndMonth) {
    struct Case {
        const char* text;
        const char* day;
        const char* month;
    };
    const Case cases[] = {
        {"5 /  /    ", "05", "01"},
        {" 5/ 5/    ", "05", "05"},
        {"  /  /    ", "01", "01"},
        {"00/00/    ", "01", "01"},
        {"31/12/    ", "31", "12"},  // the last day and month are kept, not wiped
        {"32/13/    ", "", ""},
        {"45/10/    ", "", "10"},
        {"09/1 /    ", "09", "01"},
        {"", "01", "01"},
        {"7", "07", "01"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(FormatDayPart(c.text), c.day) << c.text;
        EXPECT_EQ(FormatMonthPart(c.text), c.month) << c.text;
    }
}

TEST(SlashCompletion, TypedFieldCountsFromTheCaret) {
    // What "/" completes from when the person typed into the field the caret is in: the
    // rest of that field is left over from the old date.
    struct Case {
        const char* text;
        int32_t caret;
        const char* expected;
        const char* day;
        const char* month;
    };
    const Case cases[] = {
        {"56/12/2026", 1, "5 /12/2026", "05", "12"},
        {"05/82/2026", 4, "05/8 /2026", "05", "08"},
        {"05/12/2026", 3, "05/  /2026", "05", "01"},
        {"05/12/2026", 2, "05/12/2026", "05", "12"},  // on the separator: nothing of the day left
        {"05/12/2026", 5, "05/12/2026", "05", "12"},
        {"05/12/2026", 7, "05/12/2   ", "05", "12"},
        {"05/12/2026", -1, "05/12/2026", "05", "12"},
        {"5", 0, " ", "01", "01"},
    };
    for (const auto& c : cases) {
        const std::string t = BlankFieldFromCaret(c.text, c.caret);
        EXPECT_EQ(t, c.expected) << c.text << " caret " << c.caret;
        EXPECT_EQ(FormatDayPart(t), c.day) << c.text;
        EXPECT_EQ(FormatMonthPart(t), c.month) << c.text;
    }
    const std::pair<int32_t, DateField> fields[] = {{-1, DateField::none}, {0, DateField::day},
                                                     {2, DateField::day},   {3, DateField::month},
                                                     {5, DateField::month}, {6, DateField::year}};
    for (const auto& [caret, field] : fields) EXPECT_EQ(DateFieldAt(caret), field) << caret;
}

TEST(BlankSelection, InputPositionsOnly) {
    struct Case {
        const char* text;
        const char* mask;
        int32_t start, length;
        const char* expected;
    };
    const Case cases[] = {
        {"06/12/2026", "##/##/####", 0, 10, "__/__/____"},
        {"06/12/2026", "##/##/####", 1, 3, "0_/_2/2026"},
        {"06/12/2026", "##/##/####", 8, 5, "06/12/20__"},  // past the end: cut there
        {"05/26A", "##/##?", 0, 6, "__/___"},
        {"05/26", "##/##?", 0, 6, "__/__"},              // a text shorter than its mask
        {"06/12/2026", "", 0, 10, "06/12/2026"},         // no mask, no input positions
    };
    for (const auto& c : cases)
        EXPECT_EQ(BlankSelection(c.text, c.mask, c.start, c.length), c.expected) << c.text << " " << c.start;
}

TEST(CheckMonthYear, Table) {
    struct Case {
        const char* text;
        bool ok;
    };
    const Case cases[] = {
        {"05/03 ", true},   {"05/03A", true},  {"12/99Z", true}, {" 1/03A", true},
        {"1 /03A", true},   {"05/03", true},   {"00/03A", false}, {"13/03A", false},
        {"05/0 A", false},  {"05/ 3A", false}, {"  /03A", false}, {"05/0", false},
        {"", false},        {"-1/03A", false},
    };
    for (const auto& c : cases) EXPECT_EQ(CheckMonthYear(c.text), c.ok) << '"' << c.text << '"';
}

TEST(ClampToDateRange, Table) {
    const Variant none;
    const Variant y2000("01/01/2000");
    const Variant end1998("31/12/1998");
    const Variant end2004(*make_date(2004, 12, 31));
    struct Case {
        const char* text;
        Variant min, max;
        const char* expected;
    };
    const Case cases[] = {
        {"01/01/1999", y2000, none, "01/01/2000"},
        {"01/01/1999", y2000, end1998, "31/12/1998"},  // crossed bounds: the upper one wins
        {"15/06/2005", none, end2004, "31/12/2004"},
        {"15/06/2003", y2000, end2004, "15/06/2003"},
        {"15/06/2003", Variant("31/02/2003"), Variant("xx"), "15/06/2003"},
        {"15/06/1990", Variant("2000-01-01"), none, "01/01/2000"},
        {" 5/ 3/2003", none, none, " 5/ 3/2003"},
        {" 5/ 3/2003", none, Variant("01/01/2003"), "01/01/2003"},
        {"not a date", y2000, none, "not a date"},
    };
    for (const auto& c : cases) EXPECT_EQ(ClampToDateRange(c.text, c.min, c.max), c.expected) << c.text;
}

// Every short text over the characters that matter: no rule misbehaves, and the completed
// fields are always two digits in their range.
TEST(DateRules, AnyShortTextIsHandled) {
    const std::string alphabet = "039/- _x";
    std::string text;
    auto check = [](const std::string& t) {
        for (const std::string& part : {FormatDayPart(t), FormatMonthPart(t)}) {
            if (part.empty()) continue;
            ASSERT_EQ(part.size(), 2u) << t;
            ASSERT_TRUE(part >= "01" && part <= "31") << t;
        }
        EXPECT_EQ(FormatMonthPart(t).empty() || FormatMonthPart(t) <= "12", true) << t;
        const std::string normal = NormalizeDateText(t, false, false);
        // With both separators the month is at least 1, so the day is capped.
        const auto separators = std::count(t.begin(), t.end(), '/') + std::count(t.begin(), t.end(), '-');
        if (t.find('/') != std::string::npos && separators >= 2) {
            const std::string day = normal.substr(0, 2);
            ASSERT_TRUE(day >= "01" && day <= "31") << '"' << t << "\" -> \"" << normal << '"';
        }
        (void)NormalizeDateText(t, true, true);
        (void)CheckMonthYear(t);
        EXPECT_EQ(PromptToBlank(t, ddMMyyyy).size(), t.size());
    };
    std::function<void(std::size_t)> grow = [&](std::size_t left) {
        check(text);
        if (left == 0) return;
        for (char c : alphabet) {
            text.push_back(c);
            grow(left - 1);
            text.pop_back();
        }
    };
    grow(5);
}

}  // namespace
}  // namespace kel

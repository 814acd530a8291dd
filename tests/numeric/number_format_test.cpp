#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "keltext/host/variant.h"
#include "keltext/numeric/number_format.h"

namespace kel {
namespace {

struct TextCase {
    std::string in;
    std::string out;
};

TEST(GroupIndian, GroupsTheLastThreeThenPairs) {
    const std::vector<TextCase> cases = {
        {"", ""},
        {"0", "0"},
        {"999", "999"},
        {"1234", "1,234"},
        {"123456", "1,23,456"},
        {"100000", "1,00,000"},
        {"1000000", "10,00,000"},
        {"1234567", "12,34,567"},
        {"12345678", "1,23,45,678"},
        {"123456789012345", "12,34,56,78,90,12,345"},
        {"-123", "-123"},
        {"-1234567", "-12,34,567"},  // the sign stays in front of the grouped digits
        {"1E+15", "1E+15"},          // not plain digits: commas would change the number
    };
    for (const auto& c : cases) EXPECT_EQ(GroupIndian(c.in), c.out) << c.in;
}

TEST(FormatGrouped, GroupsOnlyBeforeThePoint) {
    const std::vector<TextCase> cases = {
        {"1234567.5", "12,34,567.5"},
        {"1234.5678", "1,234.5678"},
        {"123", "123"},
        {"1234567", "12,34,567"},
        {".5", ".5"},
        {"1234.", "1,234."},
        {"-1234567.25", "-12,34,567.25"},
        {"", ""},
    };
    for (const auto& c : cases) EXPECT_EQ(FormatGrouped(c.in), c.out) << c.in;
}

TEST(StripGrouping, RemovesEverySeparatorOnly) {
    const std::vector<TextCase> cases = {
        {"12,34,567.50", "1234567.50"},
        {",,1,", "1"},
        {"", ""},
        {"1.5", "1.5"},
    };
    for (const auto& c : cases) EXPECT_EQ(StripGrouping(c.in), c.out) << c.in;
}

TEST(PadDecimals, FillsButNeverCuts) {
    struct Case {
        std::string in;
        int n;
        std::string out;
    };
    const std::vector<Case> cases = {
        {"5", 2, "5.00"},         {"12.5", 2, "12.50"},   {"1,234.5", 2, "1,234.50"},
        {"", 2, "0.00"},          {"1.234", 2, "1.234"},  {"12.", 2, "12.00"},
        {".", 3, ".000"},         {"5", 0, "5"},          {"", 0, ""},
        {"7", -1, "7"},           {"1.2.3", 2, "1.2.3"},  {"0.5", 1, "0.5"},
    };
    for (const auto& c : cases) EXPECT_EQ(PadDecimals(c.in, c.n), c.out) << c.in << " n=" << c.n;
}

TEST(ShapeAssignedText, ShapesToTheLimits) {
    struct Case {
        Variant value;
        NumericLimits limits;
        std::string out;
    };
    const std::vector<Case> cases = {
        {1234.567, {2, 7, 0, 0}, "1234.56"},  // dropped, not rounded
        {int32_t{123456}, {2, 7, 0, 0}, "3456.00"},
        {int16_t{12}, {3, 7, 0, 0}, "12.00"},
        {int16_t{12}, {1, 7, 0, 0}, "12.0"},  // one decimal place, not two
        {"abc", {2, 7, 0, 0}, "0"},
        {"", {2, 7, 0, 0}, "0"},
        {int16_t{250}, {0, 7, 100, 0}, "100"},
        {int16_t{3}, {2, 7, 0, 10}, "10.00"},
        {12.5, {2, 7, 12.25, 0}, "12.25"},
        {int32_t{12345}, {0, 3, 0, 0}, "345"},
        {"12.5", {2, 7, 0, 0}, "12.5"},
        {"1,234.5", {2, 7, 0, 0}, "1234.5"},  // a grouped text counts as its number
        {-1234.5, {2, 7, 0, -100000}, "-1234.5"},
        {-123456.0, {2, 7, 0, -1e9}, "-3456.00"},  // cut to the room, sign kept
        {int16_t{-5}, {2, 7, 0, 0}, "0.00"},
        {true, {0, 7, 0, 0}, "0"},  // True is -1, below the lower bound 0
        {7.0, {0, 0, 0, 0}, "7"},
    };
    for (const auto& c : cases) EXPECT_EQ(ShapeAssignedText(c.value, c.limits), c.out) << c.out;
}

TEST(BoxNumberText, PlainDigitsWhereThePlainTextWouldTakeAnExponent) {
    const std::pair<double, std::string> cases[] = {
        {123.5, "123.5"},
        {999999999999999.0, "999999999999999"},
        {1e15, "1000000000000000"},
        {12345678901234567.0, "12345678901234600"},
        {-2.5e16, "-25000000000000000"},
        {1e-20, "0.00000000000000000001"},
        {1.7976931348623157e308, "17976931348623200" + std::string(292, '0')},
    };
    for (const auto& [value, text] : cases) EXPECT_EQ(BoxNumberText(value), text) << value;
    EXPECT_EQ(ShapeAssignedText(1e20, {0, 400, 0, 0}), "100000000000000000000");
}

TEST(NumericValueOf, ReadsNumbersTextsAndOthers) {
    EXPECT_EQ(numeric_value_of(Variant("12.5")), 12.5);
    EXPECT_EQ(numeric_value_of(Variant("1,234")), 1234);
    EXPECT_EQ(numeric_value_of(Variant(int16_t{-3})), -3);
    EXPECT_EQ(numeric_value_of(Variant()), 0);
    EXPECT_EQ(numeric_value_of(Variant(true)), -1);
}

}  // namespace
}  // namespace kel

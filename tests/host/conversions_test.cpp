#include "keltext/host/conversions.h"

#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>
#include <limits>

#include "keltext/host/errors.h"

namespace kel {
namespace {

// The error number a call raises, or 0 when it returns.
template <class F>
int error_of(F&& f) {
    try {
        f();
    } catch (const RuntimeError& e) {
        return e.number();
    }
    return 0;
}

TEST(LeadingValue, ReadsTheNumberAtTheStart) {
    struct Case {
        const char* text;
        double expected;
    };
    const Case cases[] = {
        {"", 0},           {"x7", 0},          {"7", 7},           {"1,234", 1},
        {"1 500", 1500},   {" \t\n42", 42},    {"4\t2", 42},       {"- 5", -5},
        {"+5", 5},         {"-5", -5},         {"--1", 0},         {"+-1", 0},
        {"1.2.3", 1.2},    {"12abc", 12},      {".5", 0.5},        {"-.5", -0.5},
        {"5.", 5},         {".", 0},           {"-", 0},           {"1D2", 100},
        {"1d2", 100},      {"1E2", 100},       {"1e-2", 0.01},     {"1E+3", 1000},
        {"1 E 2", 100},    {"1E", 1},          {"1E+", 1},         {"1Ex", 1},
        {"2D-1", 0.2},     {"1.5e1x", 15},     {"&H1F", 31},       {"&h1f", 31},
        {"&HFFFF", 65535}, {"&H10000", 65536}, {"&O17", 15},       {"&o18", 1},
        {"&H", 0},         {"&", 0},           {"&X1", 0},         {"&HG", 0},
        {"-&H1", 0},       {"0.1", 0.1},       {"123456789012345678", 123456789012345678.0},
        {"1e-400", 0},     {"-0", 0},          {"00012.50", 12.5}, {"1,5", 1},
    };
    for (const auto& c : cases) EXPECT_EQ(leading_value(c.text), c.expected) << '"' << c.text << '"';
}

TEST(LeadingValue, HugeNumbersStayFinite) {
    // A text beyond the double range reads as the largest double, never as infinity.
    EXPECT_EQ(leading_value("1e999"), DBL_MAX);
    EXPECT_EQ(leading_value("-1e999"), -DBL_MAX);
    EXPECT_EQ(leading_value("1.8e308"), DBL_MAX);
    EXPECT_EQ(leading_value("1e99999999999999999999"), DBL_MAX);
    EXPECT_EQ(leading_value("&H" + std::string(300, 'F')), DBL_MAX);
    EXPECT_EQ(leading_value("1" + std::string(400, '0')), DBL_MAX);
    EXPECT_EQ(leading_value("0." + std::string(1000, '0') + "1e1000"), 0.1);
    EXPECT_FALSE(std::signbit(leading_value("-0")));
}

TEST(NumericText, WholeTextMustBeANumber) {
    struct Case {
        const char* text;
        bool expected;
    };
    const Case cases[] = {
        {"0", true},          {"12", true},          {" 12 ", true},        {"\t12\n", true},
        {"-12", true},        {"+12", true},         {"1,234", true},       {"12,34,567.50", true},
        {"1.5", true},        {".5", true},          {"5.", true},          {"1e5", true},
        {"1E-5", true},       {"1D+2", true},        {"&H1F", true},        {"&o17", true},
        {"1e999", true},      {"", false},           {" ", false},          {".", false},
        {"abc", false},       {"1.2.3", false},      {"--1", false},        {"1 2", false},
        {"- 5", false},       {"5-", false},         {",5", false},         {"5,", false},
        {"1,,2", false},      {"1.2,3", false},      {"1e", false},         {"1e+", false},
        {"12abc", false},     {"&H", false},         {"&HG", false},        {"&O8", false},
        {"-&H1", false},      {"1,234.", true},      {"+", false},          {"-.", false},
    };
    for (const auto& c : cases) EXPECT_EQ(numeric_text(c.text), c.expected) << '"' << c.text << '"';
}

TEST(NumericText, AgreesWithLeadingValue) {
    // A numeric text without grouping commas reads the same through both readers; texts of
    // number-like characters never fail the leading reader nor give a non-finite value.
    const std::string alphabet = "0123456789+-.,eEdDhHoOfF& \tx";
    uint32_t seed = 12345;
    auto next = [&seed] {
        seed = seed * 1103515245u + 12345u;
        return (seed >> 16) & 0x7FFF;
    };
    int numeric = 0;
    for (int n = 0; n < 20000; ++n) {
        std::string t;
        const auto len = next() % 8;
        for (uint32_t k = 0; k < len; ++k) t += alphabet[next() % alphabet.size()];
        const double lead = leading_value(t);
        ASSERT_TRUE(std::isfinite(lead)) << t;
        if (!numeric_text(t) || t.find(',') != std::string::npos) continue;
        ++numeric;
        if (std::fabs(lead) == DBL_MAX) {
            EXPECT_EQ(error_of([&] { to_double(Variant(t)); }), kOverflow) << '"' << t << '"';
        } else {
            EXPECT_EQ(to_double(Variant(t)), lead) << '"' << t << '"';
        }
    }
    EXPECT_GT(numeric, 100);  // the alphabet does produce numbers
}

TEST(NumericTest, ByKind) {
    EXPECT_TRUE(numeric_test(Variant()));
    EXPECT_TRUE(numeric_test(Variant(int16_t{3})));
    EXPECT_TRUE(numeric_test(Variant(2.5)));
    EXPECT_TRUE(numeric_test(Variant(true)));
    EXPECT_TRUE(numeric_test(Variant(Date{100})));
    EXPECT_TRUE(numeric_test(Variant("1,234")));
    EXPECT_FALSE(numeric_test(Variant("")));
    EXPECT_FALSE(numeric_test(Variant(std::make_shared<Object>())));
}

TEST(PlainNumberText, Doubles) {
    struct Case {
        double value;
        const char* expected;
    };
    const Case cases[] = {
        {12.5, "12.5"}, {0.5, "0.5"}, {7, "7"}, {-3, "-3"}, {0, "0"}, {-0.0, "0"}, {-0.25, "-0.25"},
        {0.1 + 0.2, "0.3"}, {1.0 / 3, "0.333333333333333"}, {2.0 / 3, "0.666666666666667"},
        {999999999999999, "999999999999999"}, {1e15, "1E+15"}, {-1e15, "-1E+15"}, {1.5e16, "1.5E+16"},
        {9999999999999999.0, "1E+16"},  // rounds up to 16 digits
        {123456789012345678.0, "1.23456789012346E+17"}, {1e100, "1E+100"}, {DBL_MAX, "1.79769313486232E+308"},
        {0.00001, "0.00001"},
        {0.012345678901234, "0.012345678901234"},  // exactly 15 decimals
        {0.0123456789012345, "1.23456789012345E-02"},  // 16 decimals
        {0.0199999997764826, "1.99999997764826E-02"}, {1e-20, "1E-20"}, {-1.5e-20, "-1.5E-20"}, {1234.5, "1234.5"},
        {100, "100"}, {123456789012345.6, "123456789012346"}, {1e14 + 0.75, "100000000000001"},
        {4.94065645841247e-324, "4.94065645841247E-324"},
    };
    for (const auto& c : cases) EXPECT_EQ(plain_number_text(c.value), c.expected) << c.expected;
}

TEST(PlainNumberText, Singles) {
    struct Case {
        float value;
        const char* expected;
    };
    const Case cases[] = {
        {920.0f, "920"},       {2.5f, "2.5"},          {0.1f, "0.1"},        {-0.0f, "0"},
        {1234567.0f, "1234567"}, {1e7f, "1E+07"},      {12345678.0f, "1.234568E+07"},
        {0.00001f, "0.00001"}, {0.01234567f, "1.234567E-02"}, {1.0f / 3, "0.3333333"},
    };
    for (const auto& c : cases) EXPECT_EQ(plain_number_text(c.value), c.expected) << c.expected;
}

TEST(PlainNumberText, NonFiniteValuesDoNotCrash) {
    EXPECT_EQ(plain_number_text(std::numeric_limits<double>::infinity()), "Infinity");
    EXPECT_EQ(plain_number_text(-std::numeric_limits<double>::infinity()), "-Infinity");
    EXPECT_EQ(plain_number_text(std::numeric_limits<double>::quiet_NaN()), "NaN");
    EXPECT_EQ(plain_number_text(std::numeric_limits<float>::infinity()), "Infinity");
}

TEST(PlainNumberText, ReadsBackWithinFifteenDigits) {
    // The printed text read back gives the value to 15 significant digits, across magnitudes.
    for (int e = -30; e <= 30; ++e) {
        for (double m : {1.0, 1.234567890123456, 9.87654321, 5.5}) {
            const double v = m * std::pow(10.0, e);
            const double back = leading_value(plain_number_text(v));
            EXPECT_NEAR(back, v, std::fabs(v) * 1e-14) << plain_number_text(v);
        }
    }
}

TEST(TextOf, ByKind) {
    EXPECT_EQ(text_of(Variant()), "");
    EXPECT_EQ(text_of(Variant(uint8_t{200})), "200");
    EXPECT_EQ(text_of(Variant(int16_t{-7})), "-7");
    EXPECT_EQ(text_of(Variant(int32_t{100000})), "100000");
    EXPECT_EQ(text_of(Variant(2.5f)), "2.5");
    EXPECT_EQ(text_of(Variant(0.1f)), "0.1");  // single precision, not 0.100000001490116
    EXPECT_EQ(text_of(Variant(1234.5)), "1234.5");
    EXPECT_EQ(text_of(Variant(true)), "True");
    EXPECT_EQ(text_of(Variant(false)), "False");
    EXPECT_EQ(text_of(Variant(Date{0})), "30/12/1899");
    EXPECT_EQ(text_of(Variant("as is ")), "as is ");
    EXPECT_EQ(error_of([] { text_of(Variant(std::make_shared<Object>())); }), kTypeMismatch);
}

TEST(RoundHalfEven, HalvesGoToTheEvenNeighbour) {
    struct Case {
        double value, expected;
    };
    const Case cases[] = {
        {0.5, 0},   {1.5, 2},     {2.5, 2},     {3.5, 4},   {-0.5, 0},  {-1.5, -2},
        {-2.5, -2}, {2.4999, 2},  {2.5001, 3},  {-2.6, -3}, {7, 7},     {1e300, 1e300},
        {4503599627370495.5, 4503599627370496.0},
    };
    for (const auto& c : cases) EXPECT_EQ(round_half_even(c.value), c.expected) << c.value;
    EXPECT_FALSE(std::signbit(round_half_even(-0.4)));
}

TEST(WholeConversions, RangesAndRounding) {
    struct Case {
        double value;
        int byte, int16, int32;  // the result, or -(error number) - 100000
    };
    constexpr int kOv = -100006;
    const Case cases[] = {
        {0, 0, 0, 0}, {255, 255, 255, 255}, {255.5, kOv, 256, 256}, {256, kOv, 256, 256}, {-0.5, 0, 0, 0},
        {-0.6, kOv, -1, -1}, {2.5, 2, 2, 2}, {3.5, 4, 4, 4}, {32767, kOv, 32767, 32767}, {32767.5, kOv, kOv, 32768},
        {32768, kOv, kOv, 32768}, {-32768, kOv, -32768, -32768}, {-32768.5, kOv, -32768, -32768},
        {-32768.6, kOv, kOv, -32769}, {-32769, kOv, kOv, -32769}, {2147483647, kOv, kOv, 2147483647},
        {2147483647.5, kOv, kOv, kOv}, {2147483648.0, kOv, kOv, kOv}, {-2147483648.0, kOv, kOv, -2147483647 - 1},
        {-2147483648.5, kOv, kOv, -2147483647 - 1}, {-2147483649.0, kOv, kOv, kOv},
        {std::numeric_limits<double>::quiet_NaN(), kOv, kOv, kOv},
        {std::numeric_limits<double>::infinity(), kOv, kOv, kOv}, {1e300, kOv, kOv, kOv},
    };
    auto run = [](auto f) -> int {
        try {
            return static_cast<int>(f());
        } catch (const RuntimeError& e) {
            return -e.number() - 100000;
        }
    };
    for (const auto& c : cases) {
        EXPECT_EQ(run([&] { return to_byte(c.value); }), c.byte) << c.value;
        EXPECT_EQ(run([&] { return to_int16(c.value); }), c.int16) << c.value;
        EXPECT_EQ(run([&] { return to_int32(c.value); }), c.int32) << c.value;
        // The variant forms agree with the plain ones.
        EXPECT_EQ(run([&] { return to_int16(Variant(c.value)); }), c.int16) << c.value;
    }
}

TEST(WholeConversions, FromVariantKinds) {
    struct Case {
        Variant value;
        int expected;  // the 16-bit result, or the error number negated
    };
    const Case cases[] = {
        {Variant(), 0}, {Variant(true), -1}, {Variant(false), 0},
        {Variant(Date{36526}), -6},  // a date converts as its day count
        {Variant(Date{100}), 100}, {Variant(uint8_t{200}), 200}, {Variant(int32_t{40000}), -6}, {Variant(2.5f), 2},
        {Variant("12"), 12}, {Variant(" 12 "), 12}, {Variant("1,234"), 1234}, {Variant("2.5"), 2},
        {Variant("-3.5"), -4}, {Variant("&H1F"), 31},
        {Variant("&HFFFF"), -6},  // hexadecimal text is its unsigned value
        {Variant("1e3"), 1000}, {Variant("1e999"), -6}, {Variant("40000"), -6}, {Variant(""), -13},
        {Variant(" "), -13}, {Variant("abc"), -13}, {Variant("12abc"), -13}, {Variant("1.2.3"), -13},
        {Variant(std::make_shared<Object>()), -13}, {Variant(int16_t{-32768}), -32768}, {Variant(32767.4), 32767},
        {Variant(-32768.5), -32768}, {Variant(32767.5), -6}, {Variant(3.5), 4}, {Variant(1e300), -6},
    };
    // An event argument the form changed reads back by the same rule; where the conversion
    // would fail, the argument keeps the value it had.
    constexpr int16_t kKept = 777;
    for (const auto& c : cases) {
        int got = 0;
        const int error = error_of([&] { got = to_int16(c.value); });
        if (error) got = -error;
        const std::string shown = text_of(c.value.is_object() ? Variant("object") : c.value);
        EXPECT_EQ(got, c.expected) << shown;
        EXPECT_EQ(returned_int16(c.value, kKept), error ? kKept : c.expected) << shown;
    }
    EXPECT_EQ(returned_single(Variant("2.5"), 9.0f), 2.5f);
    EXPECT_EQ(returned_single(Variant(int16_t{-3}), 9.0f), -3.0f);
    EXPECT_EQ(returned_single(Variant("x"), 9.0f), 9.0f);
    EXPECT_EQ(returned_single(Variant(1e300), 9.0f), 9.0f);
}

TEST(CheckedConversions, DoubleAndSingle) {
    EXPECT_EQ(to_double(Variant("12,34,567.50")), 1234567.5);
    EXPECT_EQ(to_double(Variant(true)), -1);
    EXPECT_EQ(to_double(Variant(Date{36526})), 36526);
    EXPECT_EQ(to_double(Variant()), 0);
    EXPECT_FALSE(std::signbit(to_double(Variant("-0"))));
    EXPECT_EQ(error_of([] { to_double(Variant("x")); }), kTypeMismatch);
    EXPECT_EQ(error_of([] { to_double(Variant("-1e400")); }), kOverflow);
    EXPECT_EQ(to_single(Variant("2.5")), 2.5f);
    EXPECT_EQ(to_single(Variant(1e30)), 1e30f);
    EXPECT_EQ(error_of([] { to_single(Variant(1e39)); }), kOverflow);
    EXPECT_EQ(error_of([] { to_single(Variant(std::numeric_limits<double>::quiet_NaN())); }), kOverflow);
    EXPECT_EQ(error_of([] { to_single(Variant(std::make_shared<Object>())); }), kTypeMismatch);
}

TEST(ToBool, ByKindAndText) {
    struct Case {
        Variant value;
        int expected;  // 1 true, 0 false, or the error number negated
    };
    const Case cases[] = {
        {Variant(), 0},           {Variant(true), 1},        {Variant(false), 0},
        {Variant(int16_t{0}), 0}, {Variant(int16_t{2}), 1},  {Variant(-0.5), 1},
        {Variant("True"), 1},     {Variant("fALSE"), 0},     {Variant(" true "), 1},
        {Variant("0"), 0},        {Variant("-1"), 1},        {Variant("0.0"), 0},
        {Variant("yes"), -13},    {Variant(""), -13},        {Variant(std::make_shared<Object>()), -13},
    };
    for (const auto& c : cases) {
        int got = 0;
        if (const int error = error_of([&] { got = to_bool(c.value) ? 1 : 0; })) got = -error;
        EXPECT_EQ(got, c.expected) << c.value.str();
    }
}

TEST(SameName, AsciiCaseOnly) {
    EXPECT_TRUE(same_name("ForeColor", "Forecolor"));
    EXPECT_TRUE(same_name("", ""));
    EXPECT_FALSE(same_name("Text", "Text1"));
    EXPECT_FALSE(same_name("a_", "A-"));
    EXPECT_FALSE(same_name("\xE9", "\xC9"));  // accented letters are not folded in names
}

}  // namespace
}  // namespace kel

#include "keltext/host/float_chars.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <limits>
#include <random>
#include <string>

namespace kel {
namespace {

namespace fb = float_chars_fallback;

// Each call as a string, or "error" when it reports one.
template <class T, class... A>
std::string shown(std::to_chars_result (*f)(char*, char*, T, A...), T value, A... args) {
    char buf[1200];
    const auto r = f(buf, buf + sizeof buf, value, args...);
    if (r.ec != std::errc()) return "error";
    return std::string(buf, r.ptr);
}

using DoubleShortest = std::to_chars_result (*)(char*, char*, double);
using FloatShortest = std::to_chars_result (*)(char*, char*, float);
using DoubleForm = std::to_chars_result (*)(char*, char*, double, std::chars_format);
using DoublePrecise = std::to_chars_result (*)(char*, char*, double, std::chars_format, int);

// What both the public functions and the fallback must give, whatever the library.
TEST(FloatChars, FormatsAsToChars) {
    struct Case {
        double value;
        const char* shortest;
        const char* fixed;
        const char* scientific;
    };
    const Case cases[] = {
        {0.0, "0", "0", "0e+00"},
        {-0.0, "-0", "-0", "-0e+00"},
        {0.1, "0.1", "0.1", "1e-01"},
        {1234567.5, "1234567.5", "1234567.5", "1.2345675e+06"},
        {5000000, "5e+06", "5000000", "5e+06"},  // the shorter form wins
        {1234500, "1234500", "1234500", "1.2345e+06"},
        {1e22, "1e+22", "10000000000000000000000", "1e+22"},
        {1e23, "1e+23", "99999999999999991611392", "1e+23"},
        {123456789012345683968.0, "123456789012345683968", "123456789012345683968", "1.2345678901234568e+20"},
        {0.0001, "1e-04", "0.0001", "1e-04"},
        {0.00125, "0.00125", "0.00125", "1.25e-03"},
        {1e-05, "1e-05", "0.00001", "1e-05"},
        {5e-324, "5e-324", nullptr, "5e-324"},
        {1.7976931348623157e308, "1.7976931348623157e+308", nullptr, "1.7976931348623157e+308"},
        {9007199254740993.0, "9007199254740992", "9007199254740992", "9.007199254740992e+15"},
        {std::numeric_limits<double>::infinity(), "inf", "inf", "inf"},
        {-std::numeric_limits<double>::infinity(), "-inf", "-inf", "-inf"},
        {std::numeric_limits<double>::quiet_NaN(), "nan", "nan", "nan"},
    };
    for (DoubleShortest f : {DoubleShortest(&format_float), DoubleShortest(&fb::format_float)})
        for (const Case& c : cases) EXPECT_EQ(shown(f, c.value), c.shortest) << c.shortest;
    for (DoubleForm f : {DoubleForm(&format_float), DoubleForm(&fb::format_float)}) {
        for (const Case& c : cases) {
            if (c.fixed) {
                EXPECT_EQ(shown(f, c.value, std::chars_format::fixed), c.fixed) << c.shortest;
            }
            EXPECT_EQ(shown(f, c.value, std::chars_format::scientific), c.scientific) << c.shortest;
            EXPECT_EQ(shown(f, c.value, std::chars_format::hex), "error");
        }
        EXPECT_EQ(shown(f, 5e-324, std::chars_format::fixed), "0." + std::string(323, '0') + "5");
    }
    for (DoublePrecise f : {DoublePrecise(&format_float), DoublePrecise(&fb::format_float)}) {
        EXPECT_EQ(shown(f, 2.5, std::chars_format::fixed, 0), "2");
        EXPECT_EQ(shown(f, 0.125, std::chars_format::fixed, 2), "0.12");
        EXPECT_EQ(shown(f, 1234.5, std::chars_format::scientific, 14), "1.23450000000000e+03");
        EXPECT_EQ(shown(f, 0.019999999776482582, std::chars_format::scientific, 14), "1.99999997764826e-02");
    }
    for (FloatShortest f : {FloatShortest(&format_float), FloatShortest(&fb::format_float)}) {
        EXPECT_EQ(shown(f, 0.1f), "0.1");
        EXPECT_EQ(shown(f, 1900.0f), "1900");
        EXPECT_EQ(shown(f, 16777216.0f), "16777216");
        EXPECT_EQ(shown(f, 3.4028235e38f), "3.4028235e+38");
        EXPECT_EQ(shown(f, 1e-45f), "1e-45");
    }
}

TEST(FloatChars, TooSmallABufferIsReported) {
    char buf[4];
    EXPECT_EQ(fb::format_float(buf, buf + sizeof buf, 1234.5).ec, std::errc::value_too_large);
    EXPECT_EQ(format_float(buf, buf + sizeof buf, 1234.5).ec, std::errc::value_too_large);
}

struct Parsed {
    std::string value;  // the double's shortest text, or "unchanged"
    std::size_t used;
    std::errc ec;
    bool operator==(const Parsed&) const = default;
};

template <class T>
Parsed parsed(std::from_chars_result (*f)(const char*, const char*, T&), const std::string& text) {
    T value = T(-7.25);
    const auto r = f(text.data(), text.data() + text.size(), value);
    Parsed p{value == T(-7.25) ? "unchanged" : shown(fb::format_float, value), static_cast<std::size_t>(r.ptr - text.data()), r.ec};
    return p;
}

using DoubleParse = std::from_chars_result (*)(const char*, const char*, double&);
using FloatParse = std::from_chars_result (*)(const char*, const char*, float&);

TEST(FloatChars, ParsesAsFromChars) {
    struct Case {
        const char* text;
        const char* value;
        std::size_t used;
        std::errc ec;
    };
    const std::errc ok{}, bad = std::errc::invalid_argument, range = std::errc::result_out_of_range;
    const Case cases[] = {
        {"12.5", "12.5", 4, ok},
        {"-.5", "-0.5", 3, ok},
        {"5.", "5", 2, ok},
        {"1e3", "1000", 3, ok},
        {"1E-2x", "0.01", 4, ok},
        {"1e", "1", 1, ok},          // an exponent without digits is not read
        {"1e+", "1", 1, ok},
        {"0x10", "0", 1, ok},         // no hexadecimal
        {"1,5", "1", 1, ok},          // the point only
        {"+1", "unchanged", 0, bad},  // no '+' before the number
        {" 1", "unchanged", 0, bad},  // no blanks
        {".", "unchanged", 0, bad},
        {"-", "unchanged", 0, bad},
        {"", "unchanged", 0, bad},
        {"1e400", "unchanged", 5, range},
        {"-1e400", "unchanged", 6, range},
        {"1e-400", "unchanged", 6, range},
        {"4.9e-324", "5e-324", 8, ok},
        {"inf", "inf", 3, ok},
        {"-Infinity", "-inf", 9, ok},
        {"nan(123)", "nan", 8, ok},
        {"NaN(", "nan", 3, ok},
        {"0.1000000000000000055511151231257827021181583404541015625", "0.1", 57, ok},
    };
    for (DoubleParse f : {DoubleParse(&parse_float), DoubleParse(&fb::parse_float)})
        for (const Case& c : cases) EXPECT_EQ(parsed(f, c.text), (Parsed{c.value, c.used, c.ec})) << c.text;
    for (FloatParse f : {FloatParse(&parse_float), FloatParse(&fb::parse_float)}) {
        EXPECT_EQ(parsed(f, "1900"), (Parsed{"1900", 4, ok}));
        EXPECT_EQ(parsed(f, "1e39"), (Parsed{"unchanged", 4, range}));
        EXPECT_EQ(parsed(f, "16777217"), (Parsed{"16777216", 8, ok}));  // ties to even
    }
}

// The fallback against the standard library's own conversions, where the library has them:
// random bit patterns (every exponent), short decimals (the values forms hold) and the
// neighbours of powers of two, where the values that read back lie lopsided.
class FloatCharsSweep : public ::testing::Test {
protected:
    void SetUp() override {
        if (!kStandardFloatChars) GTEST_SKIP() << "no standard floating-point to_chars here to compare with";
    }
    std::mt19937_64 random_{20260412};
};

TEST_F(FloatCharsSweep, DoublesFormatAlike) {
    auto check = [](double v) {
        ASSERT_EQ(shown(DoubleShortest(&fb::format_float), v), shown(DoubleShortest(&format_float), v)) << v;
        for (auto fmt : {std::chars_format::fixed, std::chars_format::scientific}) {
            ASSERT_EQ(shown(DoubleForm(&fb::format_float), v, fmt), shown(DoubleForm(&format_float), v, fmt)) << v;
            for (int precision : {0, 2, 14, 17})
                ASSERT_EQ(shown(DoublePrecise(&fb::format_float), v, fmt, precision),
                          shown(DoublePrecise(&format_float), v, fmt, precision))
                    << v;
        }
    };
    for (int i = 0; i < 30000; ++i) check(std::bit_cast<double>(random_()));
    std::uniform_int_distribution<int64_t> digits(0, 99999999);
    std::uniform_int_distribution<int> scale(-12, 12);
    for (int i = 0; i < 30000; ++i) check(static_cast<double>(digits(random_)) * std::pow(10.0, scale(random_)));
    for (int e = -1074; e <= 1023; ++e) {
        const double p = std::ldexp(1.0, e);
        check(p);
        check(std::nextafter(p, 0.0));
        check(std::nextafter(p, HUGE_VAL));
    }
}

TEST_F(FloatCharsSweep, FloatsFormatAlike) {
    auto check = [](float v) {
        ASSERT_EQ(shown(FloatShortest(&fb::format_float), v), shown(FloatShortest(&format_float), v)) << v;
        ASSERT_EQ(shown(&fb::format_float, v, std::chars_format::fixed), shown(&format_float, v, std::chars_format::fixed)) << v;
    };
    for (int i = 0; i < 100000; ++i) check(std::bit_cast<float>(static_cast<uint32_t>(random_())));
    for (int e = -149; e <= 127; ++e) {
        const float p = std::ldexp(1.0f, e);
        check(p);
        check(std::nextafter(p, 0.0f));
        check(std::nextafter(p, HUGE_VALF));
    }
}

TEST_F(FloatCharsSweep, TextsParseAlike) {
    std::uniform_int_distribution<int> precision(0, 25);
    std::uniform_int_distribution<int> cut(0, 40);
    for (int i = 0; i < 60000; ++i) {
        const double v = std::bit_cast<double>(random_());
        std::string text = shown(&fb::format_float, v, i % 2 ? std::chars_format::scientific : std::chars_format::fixed,
                                 precision(random_));
        if (i % 5 == 0) text.resize(std::min<std::size_t>(text.size(), static_cast<std::size_t>(cut(random_))));
        ASSERT_EQ(parsed(DoubleParse(&fb::parse_float), text), parsed(DoubleParse(&parse_float), text)) << text;
        ASSERT_EQ(parsed(FloatParse(&fb::parse_float), text), parsed(FloatParse(&parse_float), text)) << text;
    }
    // Halfway cases: the exact midpoint between two doubles (held by an 80-bit long double)
    // must round to even.
    if constexpr (std::numeric_limits<long double>::digits >= 64) {
        for (int i = 0; i < 3000; ++i) {
            const double v = std::abs(std::bit_cast<double>(random_() >> 2));
            if (!std::isfinite(v) || v == 0) continue;
            const long double mid = (static_cast<long double>(v) + std::nextafter(v, HUGE_VAL)) / 2;
            char buf[1000];
            const int n = std::snprintf(buf, sizeof buf, "%.780Le", mid);
            const std::string text(buf, static_cast<std::size_t>(n));
            ASSERT_EQ(parsed(DoubleParse(&fb::parse_float), text), parsed(DoubleParse(&parse_float), text)) << text;
        }
    }
}

}  // namespace
}  // namespace kel

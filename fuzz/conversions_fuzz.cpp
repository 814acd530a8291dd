// The host conversions on any bytes: no crash, no undefined behaviour, and the rules that tie
// the conversions together hold (a checked conversion succeeds exactly when the rounded number
// lies in its range, and then gives that number; a generated plain decimal number reads back
// as exactly the double nearest to it; plain number text reads back as its number).
#include <fuzzer/FuzzedDataProvider.h>

#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>

#include "fuzz/fuzz_check.h"
#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/variant.h"

namespace {

using kel::Variant;

// The outcome of a checked conversion: its value, or the error number.
template <class F>
std::optional<double> attempt(F&& convert, int& error) {
    error = 0;
    try {
        return static_cast<double>(convert());
    } catch (const kel::RuntimeError& e) {
        KEL_FUZZ_CHECK(e.number() == kel::kOverflow || e.number() == kel::kTypeMismatch);
        error = e.number();
        return std::nullopt;
    }
}

// A whole-number conversion of `source` (whose checked double is `d`, or none) against its range.
template <class F>
void check_whole(F&& convert, std::optional<double> d, int d_error, double low, double high) {
    int error = 0;
    const std::optional<double> r = attempt(convert, error);
    if (!d) {
        // Not a number at all: the same error as the double conversion gives.
        KEL_FUZZ_CHECK(!r && error == d_error);
        return;
    }
    const double rounded = kel::round_half_even(*d);
    const bool in_range = rounded >= low && rounded <= high;
    if (in_range) {
        KEL_FUZZ_CHECK(r.has_value());
        KEL_FUZZ_CHECK(*r == rounded);
    } else {
        KEL_FUZZ_CHECK(!r && error == kel::kOverflow);
    }
}

void check_value(const Variant& v) {
    int d_error = 0;
    const std::optional<double> d = attempt([&] { return kel::to_double(v); }, d_error);
    // A text never reads as an infinity or NaN; a number converts to itself.
    if (d && v.is_string()) KEL_FUZZ_CHECK(std::isfinite(*d));
    if (v.is_number()) KEL_FUZZ_CHECK(d && (*d == v.number() || std::isnan(v.number())));
    // Not numeric is a type mismatch, and only that is.
    if (!kel::numeric_test(v)) KEL_FUZZ_CHECK(!d && d_error == kel::kTypeMismatch);
    else KEL_FUZZ_CHECK(d || d_error == kel::kOverflow);
    check_whole([&] { return kel::to_byte(v); }, d, d_error, 0, 255);
    check_whole([&] { return kel::to_int16(v); }, d, d_error, -32768, 32767);
    check_whole([&] { return kel::to_int32(v); }, d, d_error, -2147483648.0, 2147483647.0);
    int s_error = 0;
    const std::optional<double> s = attempt([&] { return kel::to_single(v); }, s_error);
    if (s) KEL_FUZZ_CHECK(std::isfinite(*s));
    if (!d) KEL_FUZZ_CHECK(!s && s_error == d_error);
    try {
        (void)kel::to_bool(v);
    } catch (const kel::RuntimeError& e) {
        // Not numeric, or numeric text beyond the double range.
        KEL_FUZZ_CHECK(e.number() == kel::kTypeMismatch || e.number() == kel::kOverflow);
    }
}

// Any text.
void any_text(const std::string& text) {
    const double lv = kel::leading_value(text);
    KEL_FUZZ_CHECK(std::isfinite(lv));
    const Variant v(text);
    KEL_FUZZ_CHECK(kel::numeric_text(text) == kel::numeric_test(v));
    KEL_FUZZ_CHECK(kel::text_of(v) == text);
    check_value(v);
    (void)kel::same_name(text, "Text");
}

// Any double (and single): its text reads back as the number to 15 (7) significant digits.
void any_number(double d, float f) {
    const std::string t = kel::plain_number_text(d);
    const Variant v(d);
    check_value(v);
    // The plain double overloads against the same ranges.
    int d_error = 0;
    const std::optional<double> dd =
        std::isfinite(d) ? std::optional<double>(d) : std::nullopt;
    if (!dd) {
        KEL_FUZZ_CHECK(attempt([&] { return kel::to_int32(d); }, d_error) == std::nullopt);
        KEL_FUZZ_CHECK(d_error == kel::kOverflow);
        KEL_FUZZ_CHECK(t == "NaN" || t == "Infinity" || t == "-Infinity");
    } else {
        check_whole([&] { return kel::to_byte(d); }, dd, 0, 0, 255);
        check_whole([&] { return kel::to_int16(d); }, dd, 0, -32768, 32767);
        check_whole([&] { return kel::to_int32(d); }, dd, 0, -2147483648.0, 2147483647.0);
        KEL_FUZZ_CHECK(kel::numeric_text(t));
        KEL_FUZZ_CHECK(kel::text_of(v) == t);
        const double back = kel::leading_value(t);
        if (std::fabs(d) >= 1e-300) KEL_FUZZ_CHECK(std::fabs(back - d) <= std::fabs(d) * 1e-14);
        else KEL_FUZZ_CHECK(std::fabs(back) <= 1e-299);
    }
    const std::string ft = kel::plain_number_text(f);
    if (std::isfinite(f)) {
        KEL_FUZZ_CHECK(kel::numeric_text(ft));
        const double back = kel::leading_value(ft);
        const double fd = static_cast<double>(f);
        if (std::fabs(fd) >= 1e-30) KEL_FUZZ_CHECK(std::fabs(back - fd) <= std::fabs(fd) * 1e-6);
    }
    check_value(Variant(f));
}

// A generated plain decimal number: sign, up to 15 significant digits, fixed form, in the
// canonical shape plain number text writes. leading_value gives the double nearest to it
// (the C library's strtod is correctly rounded too), also when junk follows; and plain number
// text gives the same text back, since any 15 significant digits survive a double.
void plain_decimal(FuzzedDataProvider& in) {
    const bool negative = in.ConsumeBool();
    const int int_digits = in.ConsumeIntegralInRange<int>(0, 15);
    const int max_frac = int_digits == 0 ? 15 : 15 - int_digits;
    const int frac_digits = in.ConsumeIntegralInRange<int>(0, max_frac);
    std::string s;
    bool nonzero = false;
    for (int i = 0; i < int_digits; ++i) {
        const int lo = i == 0 ? 1 : 0;
        const char c = static_cast<char>('0' + in.ConsumeIntegralInRange<int>(lo, 9));
        s += c;
        nonzero = true;
    }
    if (s.empty()) s.push_back('0');
    if (frac_digits > 0) {
        std::string frac;
        // After "0." leading zeros of the fraction are fine, its significant digits stay under 16.
        for (int i = 0; i < frac_digits; ++i)
            frac += static_cast<char>('0' + in.ConsumeIntegralInRange<int>(0, 9));
        while (!frac.empty() && frac.back() == '0') frac.pop_back();
        if (!frac.empty()) {
            s += '.';
            s += frac;
            nonzero = true;
        }
    }
    if (negative && nonzero) s.insert(s.begin(), '-');

    const double expected = std::strtod(s.c_str(), nullptr);
    KEL_FUZZ_CHECK(kel::leading_value(s) == expected);
    KEL_FUZZ_CHECK(kel::numeric_text(s));
    KEL_FUZZ_CHECK(kel::to_double(Variant(s)) == expected);
    KEL_FUZZ_CHECK(kel::plain_number_text(expected) == s);
    static constexpr const char* kJunk[] = {",5", "x7", " ", "-1", "..", "\tE", "%", "&H1"};
    const std::string junk = kJunk[in.ConsumeIntegralInRange<size_t>(0, std::size(kJunk) - 1)];
    const std::string with_junk = s + junk;
    // A blank or a sign after the number does not continue it; " " alone is skipped.
    if (junk[0] != '-' && junk[0] != ' ' && junk[0] != '\t')
        KEL_FUZZ_CHECK(kel::leading_value(with_junk) == expected);
    check_value(Variant(s));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider in(data, size);
    switch (in.ConsumeIntegralInRange<int>(0, 2)) {
        case 0:
            any_text(in.ConsumeRemainingBytesAsString());
            break;
        case 1: {
            const double d = in.ConsumeFloatingPoint<double>();
            const auto bits = in.ConsumeIntegral<uint32_t>();
            float f = 0;
            static_assert(sizeof f == sizeof bits);
            __builtin_memcpy(&f, &bits, sizeof f);
            any_number(d, f);
            // Raw bit patterns too: NaNs, subnormals and infinities the provider rarely makes.
            const auto raw = in.ConsumeIntegral<uint64_t>();
            double r = 0;
            __builtin_memcpy(&r, &raw, sizeof r);
            any_number(r, f);
            break;
        }
        default:
            plain_decimal(in);
            break;
    }
    return 0;
}

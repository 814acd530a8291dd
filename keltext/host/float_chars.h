#pragma once
// Doubles and floats to text and back, as std::to_chars and std::from_chars do it, for every
// standard library the library is built with. Some (libc++ 13, the one Emscripten brings) have
// no floating-point to_chars/from_chars; there the functions below use their own fallback,
// built on the C library's correctly rounded printf/strtod, and give the same text. Nothing
// here depends on the C locale's decimal point.
#include <charconv>
#include <system_error>

namespace kel {

// True where the standard library's floating-point to_chars/from_chars are used.
extern const bool kStandardFloatChars;

// The shortest text that reads back as the same value: fixed or exponent form, whichever is
// shorter (fixed on a tie), as std::to_chars(first, last, value) writes it.
std::to_chars_result format_float(char* first, char* last, double value);
std::to_chars_result format_float(char* first, char* last, float value);
// The shortest text in one form: `fmt` is chars_format::fixed or chars_format::scientific
// (any other form gives errc::invalid_argument).
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt);
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt);
// `precision` digits after the point, in one form (fixed or scientific, as printf's %f, %e).
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt, int precision);
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt, int precision);

// Reads a number in the general form of std::from_chars: [-]digits[.digits][(e|E)[+-]digits],
// or inf, infinity, nan, nan(...). `ptr` is just past what was read. errc::invalid_argument
// when nothing could be read, errc::result_out_of_range when the number is beyond the type's
// range (or so small that it reads as zero); in both cases `value` is left as it was.
std::from_chars_result parse_float(const char* first, const char* last, double& value);
std::from_chars_result parse_float(const char* first, const char* last, float& value);

// The fallback itself, always built, so that the native build tests it against the standard
// library's own conversions.
namespace float_chars_fallback {
std::to_chars_result format_float(char* first, char* last, double value);
std::to_chars_result format_float(char* first, char* last, float value);
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt);
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt);
std::to_chars_result format_float(char* first, char* last, double value, std::chars_format fmt, int precision);
std::to_chars_result format_float(char* first, char* last, float value, std::chars_format fmt, int precision);
std::from_chars_result parse_float(const char* first, const char* last, double& value);
std::from_chars_result parse_float(const char* first, const char* last, float& value);
}  // namespace float_chars_fallback

}  // namespace kel

#pragma once
// The host's value conversions. Every control reads and writes numbers through these,
// and only through these, so that one rule holds everywhere.
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "keltext/host/variant.h"

namespace kel {

// A double read from the start of the text: blanks (space, tab, line feed) skipped wherever
// they stand, optional sign, digits, at most one "." and an optional exponent (E or D);
// &H and &O prefixes honoured; stops at the first character that cannot continue the number.
// Never fails: "1,234" gives 1, "1 500" gives 1500, "x7" gives 0, "&H1F" gives 31.
// An &H or &O number is the value of its digits ("&HFFFF" is 65535, not a 16-bit pattern).
// A number beyond the double range gives the largest double of its sign, never infinity.
double leading_value(std::string_view text);

// True for empty, for a number (and a boolean or date), and for a text that reads as a number
// as a whole (blanks around it, a sign, grouping commas, one "."); false for "", ".", other text.
// A grouping comma stands between two digits of the integer part; an exponent (E or D) and the
// &H / &O forms are numbers too; a sign only leads, and blanks only surround the number.
bool numeric_test(const Variant& v);
bool numeric_text(std::string_view text);

// Shortest decimal text of at most 15 significant digits: "12.5", "0.5", "7", "-3";
// the exponent form ("1E+15", "1.99999997764826E-02") only where the host writes one.
// Fixed form unless the rounded value reaches 1E+15 or a fraction would need more than 15
// decimals; then mantissa and "E+NN"/"E-NN". Infinities and NaN print "Infinity",
// "-Infinity" and "NaN".
std::string plain_number_text(double value);
// A single prints with at most 7 significant digits, as the host prints singles, by the same
// rule with 7 in place of 15 (1E+07, 1.234568E-02).
std::string plain_number_text(float value);

// The value's text form: numbers as plain number text, booleans "True"/"False", dates
// "dd/mm/yyyy", empty "", strings as they are. An object is a type mismatch (13).
std::string text_of(const Variant& v);

// Rounds to the nearest whole number, halves to the even neighbour (2.5 -> 2, -2.5 -> -2).
double round_half_even(double value);

// Checked conversions: a number, a boolean, a date, empty (0) or a text that passes the
// numeric test. Not numeric: error 13. Out of range after rounding: error 6 (also for NaN and
// infinities, and for a text naming a number beyond the double range).
double to_double(const Variant& v);
float to_single(const Variant& v);
uint8_t to_byte(const Variant& v);
int16_t to_int16(const Variant& v);
int32_t to_int32(const Variant& v);
// The same for a plain double (error 6 only).
uint8_t to_byte(double value);
int16_t to_int16(double value);
int32_t to_int32(double value);

// Numbers: non-zero is true; text "True"/"False" (any case) or numeric text; else error 13.
bool to_bool(const Variant& v);

// A by-reference event argument the form's code changed, back in the kind the control gave
// it (`given`); a value that does not convert to that kind leaves the control's value.
Variant coerce_like(const Variant& value, const Variant& given);

// Values read from a property store, where a value that does not convert is skipped (the
// control keeps what it has) instead of failing the whole load: a whole number (halves to
// even) within the type's range, a boolean from a number or the text True/False (any case).
// Nothing for objects, non-numeric text and anything out of range.
std::optional<int16_t> stored_int16(const Variant& v);
std::optional<int32_t> stored_int32(const Variant& v);
std::optional<bool> stored_bool(const Variant& v);

// An event argument read back after the form's handler ran: the form may have left any kind
// there. A number of any kind (and a boolean, a date, empty or a numeric text, which the
// conversions read as numbers) becomes the argument's type by the rules above; a value that
// does not convert, or is out of the type's range, leaves the argument as it was.
int16_t returned_int16(const Variant& v, int16_t before);
float returned_single(const Variant& v, float before);

// Case-insensitive (ASCII) comparison of names: property keys, member names.
bool same_name(std::string_view a, std::string_view b);
// True when `s` begins with a same_name of `prefix`.
bool starts_with_name(std::string_view s, std::string_view prefix);
// The key under which a name is looked up in a map: two names are the same_name exactly when
// their keys are equal.
std::string name_key(std::string_view name);

}  // namespace kel

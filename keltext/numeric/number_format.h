#pragma once
// The text forms of the numeric box: plain while the user edits, grouped in the Indian style
// (12,34,567.50) and padded to the box's decimals once focus has left it. Plain functions of
// plain values, so that every rule can be checked without a window.
#include <cstdint>
#include <string>
#include <string_view>

#include "keltext/host/variant.h"

namespace kel {

// Groups the digits before the point: the last three together, then pairs (1234567 -> 12,34,567).
// A leading sign stays in front of the grouped digits; a text that is not plain digits (the
// exponent form 1E+15) is returned as it is, since commas inside it would make a different number.
std::string GroupIndian(std::string_view integer_part);

// GroupIndian of the part before the first "."; the point and what follows it unchanged.
std::string FormatGrouped(std::string_view text);

// The text without its "," separators.
std::string StripGrouping(std::string_view text);

// Fills the decimal part with zeros up to `decimals` places; never drops or changes a digit.
// The empty text becomes "0." and the zeros. Nothing happens when `decimals` is not above 0.
std::string PadDecimals(std::string_view text, int decimals);

// The significant digits a double keeps: the box takes no more integer digits and decimals
// together, so that what is typed is what it shows.
inline constexpr int kMaxSignificantDigits = 15;

// A number as the box shows it: its plain number text, except that a number the plain text
// would write with an exponent (from 1E+15, or a tiny fraction) is written in plain digits,
// rounded to 15 significant digits, the rest zeros.
std::string BoxNumberText(double value);

// The limits a value assigned through Text is shaped to.
struct NumericLimits {
    int decimals = 0;         // NoOfDecimals
    int max_length = 7;       // the stored MaxLength (integer digits, point and decimals)
    double max_value = 0;     // 0 or below: no upper bound
    double min_value = 0;
};

// The number a value stands for when the box compares or stores it: a number as it is, a
// boolean or date by its numeric value, a text by its leading value once its grouping
// separators are removed (so "1,234" counts as 1234, not 1), anything else 0.
double numeric_value_of(const Variant& value);

// What the Text setter puts into the edit box: "0" for a value that is not numeric, else the
// value kept within the bounds and cut to the box's room, with its excess decimals dropped
// (not rounded). Never grouped.
std::string ShapeAssignedText(const Variant& value, const NumericLimits& limits);

}  // namespace kel

#pragma once
// The host's date recognizer: says whether a value is a date and, when it is, which day.
//
// Accepted:
// - a date value whose year lies in 100..9999 (the host's date range);
// - a text of three numeric fields, day first: "dd/mm/yyyy". Blanks may stand around the whole
//   text and around each field ("5 / 3/2003", " 5/03/03  "), never inside a field's digits.
//   The two separators are the same one of "/", "-" or ".". Day and month take one or two
//   digits; the year takes four digits (100..9999), or one or two digits, read in the window
//   1941..2040 that the date box also uses to widen a short year (00..40 are 2000..2040,
//   41..99 are 1941..1999);
// - a text "yyyy-mm-dd" (four-digit year first, any of the three separators), so that form
//   code can write the unambiguous ISO form;
// and in every case only a day that exists in the Gregorian calendar.
//
// Rejected: everything else. In particular the empty text, the blank date text "  /  /    ",
// partial texts (a blank day, month or year, as in "01/01/    ": a date without a year is
// not a date, and a box the user only tabbed through stays blank rather than turning into a
// half date), two-part texts, three-digit years, numbers, booleans and objects. There is no
// "current year" fill-in: recognition never depends on the clock.
#include <optional>
#include <string_view>

#include "keltext/host/date.h"
#include "keltext/host/variant.h"

namespace kel {

std::optional<Date> recognize_date_text(std::string_view text);
std::optional<Date> recognize_date(const Variant& v);
inline bool is_date(const Variant& v) { return recognize_date(v).has_value(); }

}  // namespace kel

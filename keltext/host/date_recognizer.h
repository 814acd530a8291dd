#pragma once
// The host's date recognizer: says whether a value is a date and, when it is, which day.
//
// Accepted:
// - a date value whose year lies in 100..9999 (the host's date range);
// - a complete text of three numeric fields, day first: "dd/mm/yyyy". Blanks may stand around
//   the whole text and around each field ("5 / 3/2003", " 5/03/2003  "), never inside a
//   field's digits. The two separators are the same one of "/", "-" or ".". Day and month take
//   one or two digits, the year exactly four (0100..9999);
// - a text "yyyy-mm-dd" (four-digit year first, any of the three separators), so that form
//   code can write the unambiguous ISO form;
// and in every case only a day that exists in the Gregorian calendar.
//
// Rejected: everything else. In particular the empty text, the blank date text "  /  /    ",
// partial texts (a blank day, month or year, as in "01/01/    "), two-part texts, and years
// of fewer than four digits. A date is a date only once it is written in full: a box the
// user only tabbed through stays blank rather than turning into a half date, and in the date
// box's no-correction mode a short year is reported instead of being silently widened. In
// normal mode short years are still completed: the date box widens them itself
// (NormalizeDateText) before it asks here. Recognition never depends on the clock: there is
// no "current year" fill-in.
#include <optional>
#include <string_view>

#include "keltext/host/date.h"
#include "keltext/host/variant.h"

namespace kel {

std::optional<Date> recognize_date_text(std::string_view text);
std::optional<Date> recognize_date(const Variant& v);
inline bool is_date(const Variant& v) { return recognize_date(v).has_value(); }

}  // namespace kel

#pragma once
// The date box's text rules: plain functions of strings and flags, no widget involved.
// Positions in comments count from 1, as the date text is described: "dd/mm/yyyy" has the
// day at 1-2, "/" at 3, the month at 4-5, "/" at 6 and the year at 7-10; the month-year text
// of style mmyyA has the month at 1-2, "/" at 3, a two-digit year at 4-5 and a letter at 6.
// None of them fails: a conversion that does not work leaves its target as it was.
// Internal: installed only because kel_date_mask.h includes it; embedders use the control, not these.
#include <cstdint>
#include <string>
#include <string_view>

#include "keltext/host/variant.h"

namespace kel {

// Date styles (enum KelDtStyle).
enum KelDtStyle : int32_t {
    ddMMyyyy = 0,
    mmyyA = 1,
};

// The blank date text: what an empty "##/##/####" field holds once its prompts are blanks.
inline constexpr std::string_view kBlankDateText = "  /  /    ";

// Completes and corrects a typed date text: splits it at its "/" or "-" separators, widens a
// short year (00-40 -> 2000-2040, 41-99 -> 1941-1999), puts a missing day or month at 1,
// caps the day by the month (February by the four-year rule alone) or, with `zub_date`, at
// 28 unless `trigger_error` asks to keep it for the error report. With `trigger_error` a text
// that is not a date is returned untouched. A text without "/" gives only the widened year,
// or "" when the year was not widened.
std::string NormalizeDateText(std::string_view text, bool zub_date, bool trigger_error);

// The field's prompt characters "_" turned into blanks, over the first 10 characters for
// style ddMMyyyy (0) and the first 6 for any other style.
std::string PromptToBlank(std::string_view text, int32_t date_style);

// The day field (1-2) completed on "/": "01".."31", or "" for a day above 31. A blank or
// zero day gives "01".
std::string FormatDayPart(std::string_view text);
// The month field (4-5) likewise: "01".."12", or "" above 12.
std::string FormatMonthPart(std::string_view text);

// The field of style ddMMyyyy a caret position belongs to, as "/" reads it: the day up to
// and including its separator (0-2), the month likewise (3-5), the year after that.
enum class DateField : int8_t { none = -1, day = 0, month = 1, year = 2 };
DateField DateFieldAt(int32_t caret);

// The text "/" completes a field from when the person has typed into that field since the
// caret entered it: what stands from the caret to the field's end is left over from before
// (a pre-filled date typed over), so it counts as blank. Positions are 0-based here; the
// text is the field's text with its prompts already blanks.
std::string BlankFieldFromCaret(std::string_view text, int32_t caret);

// The field's text with the input positions of a selection turned into the prompt (literals
// stay), for typing a new value over a selected one.
std::string BlankSelection(std::string_view text, std::string_view mask, int32_t start, int32_t length);

// True when a month-year text (style mmyyA, prompts already blanks) has a month from 1 to 12
// and a year field of two non-blank characters. The letter at 6 plays no part.
bool CheckMonthYear(std::string_view text);

// Pulls a recognized date text into the range: a date before a recognized `min_date`
// becomes that bound, then one after a recognized `max_date` becomes that bound (so when the
// bounds cross, the upper one wins). A bound is written in the date text form "dd/mm/yyyy".
// An empty or unrecognized bound is no bound.
std::string ClampToDateRange(std::string_view text, const Variant& min_date, const Variant& max_date);

}  // namespace kel

#pragma once
// The list string: a whole combo list (each entry's text and 32-bit item data) held as one
// string, the value of KelCombo's FillList. Each entry is written as
//
//     text  <201>  item data in decimal  <200>
//
// with the single-byte codes 200 and 201 as the entry and data separators. The combo and its
// property page both go through these routines, written against the list part that the combo
// box and the list box share.
//
// Codes 200 and 201 are also the letters È and É of the character set, so a text may hold
// them. Such a character is written as <201><201> followed by the character itself: a data
// part never starts with <201> in a list string this library writes, so every list string
// written without such letters reads exactly as before.
#include <cstdint>
#include <string>
#include <string_view>

#include "keltext/host/widgets.h"

namespace kel {

// A list holds at most this many entries: its indexes and count are 16-bit numbers.
inline constexpr int32_t kMaxListEntries = 32767;

inline constexpr char kEntrySeparator = '\xC8';  // code 200
inline constexpr char kDataSeparator = '\xC9';   // code 201

// The list string of the whole list, entries in list order.
std::string EncodeFillList(const ListWidget& list);

// Replaces the list by the entries of the list string. Spaces at both ends of the string are
// ignored; empty entries and entries without a data separator are skipped; entries past the
// first kMaxListEntries are left out. With two or more entries the first one is selected; a
// single entry is left unselected.
void DecodeFillList(ListWidget& list, std::string_view list_string);

// Appends one entry written as text, data separator, item data (no entry separator). An
// entry without a data separator, or one more than a full list holds, adds nothing. The item data is the leading value of the data
// text rounded half to even; data that is no number, or does not fit 32 bits, gives 0.
void AddFillEntry(ListWidget& list, std::string_view entry);

}  // namespace kel

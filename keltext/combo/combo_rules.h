#pragma once
// The combo's keystroke rules as plain functions: the incremental search of the list and the
// character filter of the edit field. The control reads its widget into these structs, calls
// the rule and writes the decision back through the widget.
// Internal: installed only because kel_combo.h includes it; embedders use the control, not these.
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "keltext/host/typing.h"

namespace kel {

// The character class of a combo's edit field (its TextType).
enum KelCboType : int32_t {
    KelCboTitleCase = 0,
    KelCboUserKeys = 1,
    KelCboUpperCase = 2,
    KelCboUAlphaNumeric = 3,
    KelCboSentence = 4,
    KelCboDigits = 5,
};

// The characters that KelCboDigits lets through (KelCboUAlphaNumeric takes the host's
// kAlphaNumericSet).
inline constexpr std::string_view kComboDigitSet = "123456789 0.";

// --- Incremental search ------------------------------------------------------------------

// Key codes whose release never completes the text: control keys, navigation and editing
// keys (Page Up to Help, the arrows, Insert, Delete) and Num Lock. Space does complete.
bool search_ignores_key(int16_t key_code);

// The first entry (in list order) whose first characters equal the typed text, compared in
// upper case; -1 when there is none. In a sorted list the search stops at the first entry
// that sorts after the typed text. `entry(i)` gives the text of entry i; the view only has
// to stay valid until the next call. Allocates nothing.
template <class EntryText>
int32_t find_completion(std::string_view typed, int32_t count, bool sorted, EntryText&& entry);

// How an entry's first characters compare with the typed text, both upper-cased, by character
// code: below 0, 0 (the entry starts with the typed text) or above 0.
int prefix_order(std::string_view entry, std::string_view typed);

// A template, so that the search calls the list directly: it runs once per entry, over lists
// of a million entries.
template <class EntryText>
int32_t find_completion(std::string_view typed, int32_t count, bool sorted, EntryText&& entry) {
    for (int32_t i = 0; i < count; ++i) {
        const int order = prefix_order(entry(i), typed);
        if (order == 0) return i;
        if (sorted && order > 0) return -1;
    }
    return -1;
}

// --- Character filter ----------------------------------------------------------------------

// What FilterKey reads from the combo's edit field.
struct ComboEdit {
    std::string_view text;
    int32_t sel_start = 0;        // caret now
    int32_t sel_length = 0;
    int32_t saved_sel_start = 0;  // caret saved by the key-press handler
    bool overwrite = false;       // Insert key toggled on (key state exactly 1)
};

// What it writes back, in this order: select one character (overwrite), then the text, then
// the caret. `key` is the code the edit field is to insert (0: nothing).
struct ComboDecision {
    int16_t key = 0;
    bool select_one = false;
    std::optional<std::string> text;
    std::optional<int32_t> sel_start;
};

ComboDecision filter_combo_key(int32_t text_type, const ComboEdit& edit, int16_t key);

// Focus selection: the length of the text without its trailing spaces.
int32_t length_without_trailing_spaces(std::string_view text);

}  // namespace kel

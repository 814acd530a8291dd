#pragma once
// The keystroke rules of KelAlphaNumeric as plain functions: which characters each text type
// lets through, how it shapes their case, how overwrite mode is emulated, how the title-case
// type rebuilds the text, and where the caret goes after a change. The control's handlers read
// the edit box into these structs, call the rule and write the decision back.
// Internal: installed only because kel_alpha_numeric.h includes it; embedders use the control, not these.
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "keltext/host/typing.h"

namespace kel {

// The character class of the box. The property keeps any 32-bit value; values outside the
// list behave as KelANUserKeys.
enum KelANTxtType : int32_t {
    KelANTitleCase = 0,
    KelANUpperCase = 1,
    KelANCommStyle = 2,
    KelANUAlphaNumeric = 3,
    KelANDigits = 4,
    KelANUserKeys = 5,
    KelANSentence = 6,
};

// Border style of the control's surface.
enum KelANBorderStyle : int32_t {
    KelANPlain = 0,
    KelANFixedSingle = 1,
};

// The box's own character sets, matched by code with no case folding (the upper-case
// alphanumeric set is the host's kAlphaNumericSet, shared with the combo).
inline constexpr std::string_view kCommStyleSet =
    "() 1234567890@#*{}[]-_ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz";
inline constexpr std::string_view kDigitSet = "123456789 0";

// What the key-press handler reads from the edit box before filtering.
struct AlphaEdit {
    std::string_view text;
    int32_t caret = 0;       // SelStart
    int32_t sel_length = 0;  // SelLength
    int32_t limit = 0;       // MaxLength, 0 or less = no limit
    bool overwrite = false;  // the Insert key's state is exactly 1
};

// What it writes back, in this order: select the character after the caret (overwrite
// emulation), move the caret to `caret`, set the text to `text`, hand `key` to the edit box.
struct AlphaDecision {
    int16_t key = 0;  // 0 = the edit box inserts nothing
    bool select_next = false;
    std::optional<int32_t> caret;
    std::optional<std::string> text;
};

// The filter of one typed character for the box's text type.
AlphaDecision filter_alpha_key(const AlphaEdit& e, int32_t text_type, int16_t key);

// The title-case rebuild alone (also reached through filter_alpha_key).
AlphaDecision title_case_key(const AlphaEdit& e, int16_t key);

// What the key-press handler does with the code the form left.
enum class KeyPressAction { pass, drop, filter };
KeyPressAction key_press_action(int16_t key_ascii);

// What the key-down handler does after the form has seen the key.
struct KeyDownDecision {
    bool ctrl_down = false;
    std::string_view send_keys;  // "" or "+{TAB}" / "{TAB}"
    bool record = false;         // remember the key code and the caret
};
KeyDownDecision key_down_decision(int16_t key_code, int16_t shift);

// Where the change handler puts the caret, by the last key recorded at key-down: after
// Backspace one before the saved caret, after Delete where the edit box left it, after
// anything else one past the saved caret. Nothing when the caret is to stay put, or when
// the position would fall before the start of the text.
std::optional<int32_t> caret_after_change(int16_t last_key_code, int32_t saved_sel_start);

}  // namespace kel

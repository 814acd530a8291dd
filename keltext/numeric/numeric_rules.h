#pragma once
// The numeric box's decisions as plain functions: the keystroke filter, the typing over a
// selection, the exit formatting and the spin-button steps. Each takes the edit state and
// returns what the control is to do; the control's handlers read the edit box into the state,
// call the rule and apply the decision through the widget, so that every write raises the
// widget's notifications in the order the rule made them.
// Internal: installed only because kel_numeric.h includes it; embedders use the control, not these.
#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>

#include "keltext/host/keys.h"

namespace kel {

// What a handler reads from the edit box and the control before a decision.
struct NumericEdit {
    std::string text;
    int32_t caret = 0;       // SelStart
    int32_t sel_length = 0;  // SelLength
    int32_t limit = 0;       // the edit box's current length limit
    int decimals = 0;        // NoOfDecimals
    int max_length = 7;      // the stored MaxLength
    double max_value = 0;    // 0 or below: no upper bound
    double min_value = 0;
    bool overwrite = false;  // the Insert key's state is exactly 1
    bool trigger_error = false;
    bool txt_format = false;
};

// One write the control makes, in order. A text write goes through the edit box, which puts
// the caret at the start and raises Change when the text differs.
struct EditStep {
    enum class Kind : uint8_t { text, caret, sel_length, max_length, send_keys, control_error };
    Kind kind = Kind::text;
    int32_t value = 0;       // caret, sel_length, max_length
    std::string text;        // text
    std::string_view keys;   // send_keys: one of the host's literals (host/keys.h)
};

// The writes of one decision, in order, held in place: a keystroke allocates nothing beyond
// the text it produces. No rule makes more than kCapacity writes (a test runs every key over
// the boxes that make the most); one more is a fault in the rules, and fails loudly rather
// than being dropped.
class EditSteps {
public:
    static constexpr std::size_t kCapacity = 12;

    void push(EditStep step) {
        if (count_ == kCapacity) throw std::logic_error("a numeric decision makes more than 12 writes");
        steps_[count_++] = std::move(step);
    }
    std::span<const EditStep> view() const { return {steps_.data(), count_}; }

private:
    std::array<EditStep, kCapacity> steps_{};
    std::size_t count_ = 0;
};

struct NumericDecision {
    int16_t key = 0;                    // key code (key down) or character (key press) left to the edit box
    std::optional<bool> ctrl_down;      // key down: the new CtrlDown
    std::optional<bool> overwrite;      // key press: the new OverwriteMode, when the filter ran

    std::span<const EditStep> steps() const { return writes_.view(); }
    void push(EditStep step) { writes_.push(std::move(step)); }

private:
    EditSteps writes_;
};

// The integer digits allowed before the point: the box's limit less the decimals and the point.
int integer_room(int32_t limit, int decimals);

// Key down (after the first KeyDown event): "/" clears, Ctrl is remembered, Up and Down move
// focus, and Delete may not remove the point while decimals follow it. `key` of the result is
// the key code for the second KeyDown event; ctrl_down set and nothing else when Ctrl is held.
NumericDecision numeric_key_down(const NumericEdit& e, int16_t key_code, int16_t shift);

// Key press (after the KeyPress event): Tab and line feed pass, Enter and "/" are dropped,
// Ctrl passes; otherwise FilterNumericKey with the tail checks, or ReplaceSelection over a
// selection.
NumericDecision numeric_key_press(const NumericEdit& e, int16_t key_ascii, bool ctrl_down);

// A key typed with nothing selected: digits, one point placed by the rules, backspace.
NumericDecision FilterNumericKey(const NumericEdit& e, int16_t key_ascii);

// A key typed over a selection.
NumericDecision ReplaceSelection(const NumericEdit& e, int16_t key_ascii);

// Leaving the box: normalize, group (when txt_format), clamp to the bounds, pad the decimals.
NumericDecision format_on_exit(const NumericEdit& e);

// The spin buttons' new text, as plain number text. Grouping separators in the text are
// ignored, so a grouped 12,34,567 steps from 1234567 and not from 12.
struct SpinInput {
    std::string_view text;
    double max_value = 0;
    double min_value = 0;
    double increment = 0;
};
std::string step_down_text(const SpinInput& in);
std::string step_up_text(const SpinInput& in);

}  // namespace kel

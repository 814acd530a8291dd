#include "keltext/alphanumeric/alpha_rules.h"

#include <algorithm>
#include <limits>

#include "keltext/host/keys.h"
#include "keltext/host/typing.h"

namespace kel {

AlphaDecision title_case_key(const AlphaEdit& e, int16_t key) {
    AlphaDecision d;  // the code always comes out 0: the control writes the text itself
    // A code the edit box would not insert (0 because the form dropped the keystroke, Escape,
    // other control codes) is nothing typed: rebuilding with it would put an invisible
    // character into the text.
    if (!inserts_character(key)) return d;
    const char c = static_cast<char>(static_cast<uint8_t>(key));
    const std::string_view t = e.text;
    // When the text comes out the same the edit box raises no change, so the caret would not
    // move; stepping over an identical character keeps typing flowing over it.
    const auto p = static_cast<std::size_t>(std::clamp<int64_t>(e.caret, 0, static_cast<int64_t>(t.size())));
    if (!t.empty() && (p < t.size() ? t[p] : ' ') == c)
        d.caret = static_cast<int32_t>(std::min<std::size_t>(p + 1, std::numeric_limits<int32_t>::max()));
    d.text = title_case_typed(t, e.caret, e.sel_length, e.overwrite, c, e.limit);
    return d;
}

AlphaDecision filter_alpha_key(const AlphaEdit& e, int32_t text_type, int16_t key) {
    AlphaDecision d;
    d.key = key;
    // Overwrite mode selects the character after the caret so that the edit box replaces it;
    // only for a character the box will insert, so that a dropped key changes nothing.
    auto overwrite_step = [&] { d.select_next = e.sel_length == 0 && e.overwrite && inserts_character(d.key); };
    switch (text_type) {
        case KelANDigits:
            if (!in_set(kDigitSet, key)) d.key = 0;
            else overwrite_step();
            break;
        case KelANUAlphaNumeric:
            if (!in_set(kAlphaNumericSet, key)) {
                d.key = 0;
            } else {
                overwrite_step();
                d.key = upper_code(key);
            }
            break;
        case KelANUpperCase:
            overwrite_step();
            d.key = upper_code(key);
            break;
        case KelANCommStyle:
            if (!in_set(kCommStyleSet, key)) d.key = 0;
            else overwrite_step();
            break;
        case KelANSentence:
            overwrite_step();
            if (e.caret == 0) d.key = upper_code(key);
            break;
        case KelANTitleCase:
            return title_case_key(e, key);
        default:  // KelANUserKeys and any other value: the form's own KeyPress is the filter
            break;
    }
    return d;
}

KeyPressAction key_press_action(int16_t key_ascii) {
    switch (key_ascii) {
        case kCharBackspace:
        case kCharTab:
        case kCharLineFeed:
            return KeyPressAction::pass;
        case kCharEnter:
            return KeyPressAction::drop;
        default:
            return KeyPressAction::filter;
    }
}

KeyDownDecision key_down_decision(int16_t key_code, int16_t shift) {
    KeyDownDecision d;
    d.ctrl_down = (shift & kCtrlMask) != 0;
    if (d.ctrl_down) return d;
    if (key_code == kVkUp) d.send_keys = kKeysBackTab;
    else if (key_code == kVkDown) d.send_keys = kKeysTab;
    else d.record = true;
    return d;
}

std::optional<int32_t> caret_after_change(int16_t last_key_code, int32_t saved_sel_start) {
    if (last_key_code == kVkDelete) return std::nullopt;
    const int64_t caret = int64_t{saved_sel_start} + (last_key_code == kVkBackspace ? -1 : 1);
    // Backspace at the start of the text would ask for -1, which the edit box refuses.
    if (caret < 0) return std::nullopt;
    return static_cast<int32_t>(std::min<int64_t>(caret, std::numeric_limits<int32_t>::max()));
}

}  // namespace kel

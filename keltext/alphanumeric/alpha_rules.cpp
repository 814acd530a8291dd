#include "keltext/alphanumeric/alpha_rules.h"

#include <algorithm>
#include <limits>

#include "keltext/host/charset.h"

namespace kel {
namespace {

constexpr int16_t kBackspace = 8;
constexpr int16_t kTab = 9;
constexpr int16_t kLineFeed = 10;
constexpr int16_t kEnter = 13;
constexpr int16_t kDelete = 46;
constexpr int16_t kUp = 38;
constexpr int16_t kDown = 40;
constexpr int16_t kCtrlBit = 2;

// A code the edit box would put into its text: a character of the single-byte set from the
// space up. Control codes and 0 insert nothing there.
bool inserts_character(int16_t code) { return code >= 32 && code <= 255; }

char to_char(int16_t code) { return static_cast<char>(static_cast<uint8_t>(code)); }

char upper_char(char c) { return upper_case(c); }

std::string_view trim_trailing_spaces(std::string_view s) {
    const auto end = s.find_last_not_of(' ');
    return end == std::string_view::npos ? std::string_view{} : s.substr(0, end + 1);
}

// A substring that starts past the end is empty rather than an error.
std::string_view tail(std::string_view s, std::size_t from) { return from < s.size() ? s.substr(from) : std::string_view{}; }

}  // namespace

bool in_char_set(std::string_view set, int16_t code) {
    if (code <= 0 || code > 255) return false;
    return set.find(to_char(code)) != std::string_view::npos;
}

int16_t upper_code(int16_t code) {
    if (code < 0 || code > 255) return code;
    return static_cast<int16_t>(upper_case(static_cast<uint8_t>(code)));
}

AlphaDecision title_case_key(const AlphaEdit& e, int16_t key) {
    AlphaDecision d;  // the code always comes out 0: the control writes the text itself
    // A code the edit box would not insert (0 because the form dropped the keystroke, Escape,
    // other control codes) is nothing typed: rebuilding with it would put an invisible
    // character into the text.
    if (!inserts_character(key)) return d;
    const char c = to_char(key);
    const std::string_view t = e.text;
    const std::size_t n = t.size();

    if (n == 0) {
        d.text = std::string(1, upper_char(c));
        return d;
    }

    // Positions from the edit box are within the text; clamp anyway so that no value can
    // reach past it.
    const std::size_t p = static_cast<std::size_t>(std::clamp<int64_t>(e.caret, 0, static_cast<int64_t>(n)));
    const std::size_t sel = static_cast<std::size_t>(std::clamp<int64_t>(e.sel_length, 0, static_cast<int64_t>(n - p)));
    const char following = p < n ? t[p] : ' ';
    const std::string_view head = t.substr(0, p);

    std::string out;
    out.reserve(n + 1);
    bool full = false;
    if (c != ' ') {
        // Only the space starts a word; letters inside a word are never lowered.
        const char k = (p == 0 || t[p - 1] == ' ') ? upper_char(c) : c;
        if (sel > 0) {
            out.append(head).push_back(k);
            out.append(tail(t, p + sel));
        } else if (e.overwrite) {
            out.append(head).push_back(k);
            out.append(tail(t, p + 1));
        } else if (e.limit <= 0 || static_cast<std::size_t>(e.limit) > trim_trailing_spaces(t).size()) {
            out.append(head).push_back(k);
            out.append(tail(t, p));
        } else {
            full = true;
        }
    } else {
        // A space also capitalises the character that comes to stand after it.
        if (sel > 0) {
            out.append(head).push_back(' ');
            if (p + sel < n) out.push_back(upper_char(t[p + sel]));
            out.append(tail(t, p + sel + 1));
        } else if (p < n) {
            if (e.overwrite) {
                out.append(head).push_back(' ');
                if (p + 1 < n) out.push_back(upper_char(t[p + 1]));
                out.append(tail(t, p + 2));
            } else if (e.limit <= 0 || static_cast<std::size_t>(e.limit) > n) {
                out.append(head).push_back(' ');
                out.push_back(upper_char(t[p]));
                out.append(tail(t, p + 1));
            } else {
                full = true;
            }
        } else {
            out.append(t).push_back(' ');
        }
    }
    if (full) out.assign(t);

    // When the text comes out the same the edit box raises no change, so the caret would not
    // move; stepping over an identical character keeps typing flowing over it.
    if (following == c) d.caret = static_cast<int32_t>(std::min<std::size_t>(p + 1, std::numeric_limits<int32_t>::max()));

    if (!out.empty()) out[0] = upper_char(out[0]);
    d.text = std::move(out);
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
            if (!in_char_set(kDigitSet, key)) d.key = 0;
            else overwrite_step();
            break;
        case KelANUAlphaNumeric:
            if (!in_char_set(kAlphaNumericSet, key)) {
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
            if (!in_char_set(kCommStyleSet, key)) d.key = 0;
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
        case kBackspace:
        case kTab:
        case kLineFeed:
            return KeyPressAction::pass;
        case kEnter:
            return KeyPressAction::drop;
        default:
            return KeyPressAction::filter;
    }
}

KeyDownDecision key_down_decision(int16_t key_code, int16_t shift) {
    KeyDownDecision d;
    d.ctrl_down = (shift & kCtrlBit) != 0;
    if (d.ctrl_down) return d;
    if (key_code == kUp) d.send_keys = "+{TAB}";
    else if (key_code == kDown) d.send_keys = "{TAB}";
    else d.record = true;
    return d;
}

std::optional<int32_t> caret_after_change(int16_t last_key_code, int32_t saved_sel_start) {
    if (last_key_code == kDelete) return std::nullopt;
    const int64_t caret = int64_t{saved_sel_start} + (last_key_code == kBackspace ? -1 : 1);
    // Backspace at the start of the text would ask for -1, which the edit box refuses.
    if (caret < 0) return std::nullopt;
    return static_cast<int32_t>(std::min<int64_t>(caret, std::numeric_limits<int32_t>::max()));
}

}  // namespace kel

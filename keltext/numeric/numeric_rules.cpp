#include "keltext/numeric/numeric_rules.h"

#include <algorithm>

#include "keltext/host/conversions.h"
#include "keltext/host/typing.h"
#include "keltext/numeric/number_format.h"

namespace kel {
namespace {

constexpr std::string_view kDigits = "0123456789";
constexpr std::string_view kDigitsAndPoint = "0123456789.";
constexpr std::string_view kSelectionSet = "1234567890.";

constexpr int kBackspace = kCharBackspace;
constexpr int kPoint = kCharPoint;

// The edit box as the rule sees it while it decides: each write is recorded as a step and
// mirrored here the way the edit box applies it, so later steps read what the box would show.
class Work {
public:
    Work(const NumericEdit& e, NumericDecision& d) : edit_(e), d_(d) {
        int len = this->len();
        caret_ = std::clamp(e.caret, 0, len);
        sel_ = std::clamp(e.sel_length, 0, len - caret_);
    }

    // The text as the box would show it: the last text the rule wrote, or the one it began
    // with. Looked up each time rather than kept as a view, so nothing points into the steps.
    std::string_view text() const { return text_step_ ? d_.steps()[*text_step_].text : edit_.text; }
    int len() const { return static_cast<int>(text().size()); }
    int caret() const { return caret_; }
    int sel() const { return sel_; }
    // Position (from 1) of the first ".", 0 when there is none.
    int dot() const {
        std::size_t p = text().find('.');
        return p == std::string_view::npos ? 0 : static_cast<int>(p) + 1;
    }
    // The character at a position counted from 1; '\0' outside the text, where a read of the
    // character is a step that does not happen.
    char at(int pos) const { return pos >= 1 && pos <= len() ? text()[static_cast<std::size_t>(pos - 1)] : '\0'; }

    // A new text puts the caret at the start; the same text leaves everything as it is.
    void set_text(std::string t) {
        if (t == text()) return;
        EditStep s;
        s.kind = EditStep::Kind::text;
        s.text = std::move(t);
        d_.push(std::move(s));
        text_step_ = d_.steps().size() - 1;
        caret_ = 0;
        sel_ = 0;
    }
    void set_caret(int v) {
        if (v < 0) return;  // the box refuses it; the rule goes on
        caret_ = std::min(v, len());
        sel_ = 0;
        d_.push(step(EditStep::Kind::caret, v));
    }
    void set_sel_length(int v) {
        if (v < 0) return;
        sel_ = std::min(v, len() - caret_);
        d_.push(step(EditStep::Kind::sel_length, v));
    }
    void set_max_length(int v) { d_.push(step(EditStep::Kind::max_length, v)); }
    void send(std::string_view keys) {
        EditStep s;
        s.kind = EditStep::Kind::send_keys;
        s.keys = keys;
        d_.push(std::move(s));
    }
    void control_error() { d_.push(step(EditStep::Kind::control_error, 0)); }

private:
    static EditStep step(EditStep::Kind kind, int value) {
        EditStep s;
        s.kind = kind;
        s.value = value;
        return s;
    }

    const NumericEdit& edit_;
    std::optional<std::size_t> text_step_;  // index of the last text write, if any
    int caret_ = 0;
    int sel_ = 0;
    NumericDecision& d_;
};

std::string joined(std::string_view a, std::string_view b, std::string_view c = {}, std::string_view d = {}) {
    std::string out;
    out.reserve(a.size() + b.size() + c.size() + d.size());
    out.append(a).append(b).append(c).append(d);
    return out;
}

std::string_view ltrim_blanks(std::string_view t) {
    std::size_t p = t.find_first_not_of(' ');
    return p == std::string_view::npos ? std::string_view{} : t.substr(p);
}

// The filter proper, on the working state; returns the code left to the edit box.
int filter_key(Work& w, const NumericEdit& e, int key) {
    // The text before the key: what the range check puts back. It is the edit state's own
    // text or a step already written, neither of which moves while the rule runs.
    const std::string_view old_text = w.text();

    const int len = w.len();
    const int start_caret = w.caret();
    int caret = start_caret;
    const int dot = w.dot();
    const int room = integer_room(e.limit, e.decimals);
    const char ch = static_cast<char>(key);
    bool final_checks = true;

    if (e.decimals == 0) {
        if (e.overwrite) w.set_sel_length(1);
        if (!in_set(kDigits, key) && key != kBackspace) {
            key = 0;
            if (e.trigger_error) w.control_error();
        }
    } else if (!in_set(kDigitsAndPoint, key) && key != kBackspace) {
        key = 0;
        if (e.trigger_error) w.control_error();
    } else {
        const int int_len = dot > 0 ? dot - 1 : len;
        const int dec_len = dot > 0 ? len - dot : 0;
        const std::string_view text = w.text();
        if (dot == 0) {
            if (len == room && key != kPoint && key != kBackspace) {
                // The integer part is full: the point comes by itself before the digit.
                std::string t;
                if (text.empty()) t = joined(".", std::string_view(&ch, 1));
                else if (text == "0") t = std::string(1, ch);
                else t = joined(ltrim_blanks(text), ".", std::string_view(&ch, 1));
                w.set_text(std::move(t));
                key = 0;
                w.send(kKeysEnd);
            } else if (key == kPoint) {
                bool changed = false;
                if (text == "0" || text.empty()) {
                    w.set_text(e.max_length - e.decimals - 1 != 0 ? "0." : ".");
                    w.send(kKeysEnd);
                    changed = true;
                }
                if (!changed && len == room && len - caret > e.decimals) {
                    w.set_text(joined(text, "."));
                    key = 0;
                    w.set_caret(len + 1);
                }
            } else if (e.overwrite) {
                w.set_sel_length(1);
            }
        } else if (key == kPoint) {
            // A second point only moves the caret behind the first.
            w.set_caret(dot);
            key = 0;
        } else if (key == kBackspace) {
            // The point may go only when the joined digits fit before it.
            if (w.at(caret) == '.' && dec_len > 0 && int_len + dec_len > room) key = 0;
        } else {
            if (w.at(caret + 1) == '.') {
                if (int_len < room) {
                    std::string_view left = text.substr(0, static_cast<std::size_t>(caret));
                    bool drop_zero = left == "0";
                    w.set_text(joined(drop_zero ? std::string_view{} : left, std::string_view(&ch, 1),
                                      text.substr(static_cast<std::size_t>(caret))));
                    w.set_caret(drop_zero ? caret : caret + 1);
                    key = 0;
                    final_checks = false;
                } else if (int_len == room && e.overwrite) {
                    ++caret;
                    w.set_caret(caret);
                }
            }
            if (final_checks) {
                if (caret < dot) {
                    if (e.overwrite) w.set_sel_length(1);
                    else if (int_len == room) key = 0;
                } else if (dec_len >= e.decimals) {
                    if (!e.overwrite) key = 0;
                    else if (caret == len) key = 0;
                    else w.set_sel_length(1);
                } else {
                    if (e.overwrite) w.set_sel_length(1);
                    std::string_view now = w.text();
                    if (now == "." || now == "0.") {
                        w.set_text(joined(now, std::string_view(&ch, 1)));
                        w.set_caret(caret + 1);
                        key = 0;
                    }
                }
            }
        }
    }

    if (final_checks) {
        // Only the upper bound is checked while typing: a number being typed passes through
        // its smaller prefixes ("0", "0." on the way to "0.5"), so the lower bound waits for
        // the exit. The check sees the text before the edit box inserts the key; it undoes
        // what the filter wrote itself, and then the key goes too, with the caret back where
        // it was, so no half-reverted text is left for the key to land in.
        if (e.max_value > 0 && w.text() != old_text && leading_value(w.text()) > e.max_value) {
            w.set_text(std::string(old_text));
            w.set_caret(start_caret);
            key = 0;
        }
        if (key != kPoint && key != 0 && w.text() == "0" && dot == 0) w.set_text("");
    }
    return key;
}

int replace_selection(Work& w, const NumericEdit& e, int key) {
    if (!in_set(kSelectionSet, key) && key != kBackspace) return 0;

    const std::string_view text = w.text();
    const int caret = w.caret();
    const int sel = w.sel();
    const int start1 = caret + 1;
    const int room = e.limit - (e.decimals == 0 ? 0 : e.decimals + 1);
    const std::string_view left = text.substr(0, static_cast<std::size_t>(caret));
    const std::string_view right = text.substr(static_cast<std::size_t>(caret + sel));
    const std::string_view selected = text.substr(static_cast<std::size_t>(caret), static_cast<std::size_t>(sel));
    const char ch = static_cast<char>(key);
    const std::string_view typed(&ch, 1);
    const int left_len = static_cast<int>(left.size());
    const int right_len = static_cast<int>(right.size());

    if (selected.find('.') == std::string_view::npos) {
        if (key == kBackspace) {
            w.send(kKeysDel);
            return 0;
        }
        if (e.decimals > 0 && key == kPoint &&
            (left.find('.') != std::string_view::npos || right.find('.') != std::string_view::npos)) {
            std::string t = joined(left, right);
            int after_point = static_cast<int>(t.find('.')) + 1;
            w.set_text(std::move(t));
            w.set_caret(after_point);
            return 0;
        }
        if (e.decimals > 0) {
            if (left.empty() && !right.empty()) {
                if (key != kPoint) w.set_text(joined(typed, right));
                else if (right_len <= e.decimals) w.set_text(joined(".", right));
            } else if (left.empty()) {
                w.set_text(std::string(typed));
            } else {
                w.set_text(joined(left, typed, right));
            }
            w.set_caret(start1);
            return 0;
        }
        if (key == kPoint) {
            if (e.trigger_error) w.control_error();
            return 0;
        }
        return key;  // a digit: the edit box replaces the selection with it
    }

    if (key == kBackspace) {
        if (left_len + right_len <= room) w.send(kKeysDel);
        return 0;
    }
    if (left_len == room) {
        // The point stays; a digit goes behind it.
        w.set_text(key == kPoint ? joined(left, ".", right) : joined(left, ".", typed, right));
    } else if (left_len < room) {
        if (right.empty()) w.set_text(joined(left, typed));
        else if (key == kPoint) w.set_text(joined(left, ".", right));
        else w.set_text(joined(left, typed, ".", right));
    }
    w.set_caret(start1);
    return 0;
}

}  // namespace

int integer_room(int32_t limit, int decimals) { return limit - decimals - 1; }

NumericDecision numeric_key_down(const NumericEdit& e, int16_t key_code, int16_t shift) {
    NumericDecision d;
    Work w(e, d);
    int key = key_code;
    if (key == kVkSlash) w.set_text("");  // the "/?" key clears the box; the key itself goes on
    bool ctrl = (shift & kCtrlMask) != 0;
    d.ctrl_down = ctrl;
    if (ctrl) {
        d.key = key_code;
        return d;
    }
    if (key == kVkUp) {
        w.send(kKeysBackTab);
        key = 0;
    } else if (key == kVkDown) {
        w.send(kKeysTab);
        key = 0;
    }
    if (key == kVkDelete) {
        if (w.text() == ".") {
            w.set_text("");
        } else {
            const int len = w.len();
            const int dot = w.dot();
            const int int_len = dot > 0 ? dot - 1 : len;
            const int dec_len = dot > 0 ? len - dot : 0;
            // The point stays while decimals follow it, unless the digits would fit joined.
            if (w.at(w.caret() + 1) == '.' && dec_len > 0 && int_len <= integer_room(e.limit, e.decimals)) key = 0;
        }
    }
    d.key = static_cast<int16_t>(key);
    return d;
}

NumericDecision FilterNumericKey(const NumericEdit& e, int16_t key_ascii) {
    NumericDecision d;
    d.overwrite = e.overwrite;
    Work w(e, d);
    d.key = static_cast<int16_t>(filter_key(w, e, key_ascii));
    return d;
}

NumericDecision ReplaceSelection(const NumericEdit& e, int16_t key_ascii) {
    NumericDecision d;
    Work w(e, d);
    d.key = static_cast<int16_t>(replace_selection(w, e, key_ascii));
    return d;
}

namespace {

// Digits before the point, leading zeros not counted.
int significant_integer_digits(std::string_view t) {
    t = t.substr(0, std::min(t.find('.'), t.size()));
    int n = 0;
    bool leading = true;
    for (char c : t) {
        if (c < '0' || c > '9') continue;
        if (leading && c == '0') continue;
        leading = false;
        ++n;
    }
    return n;
}

// A double holds 15 significant digits: a digit typed beyond them would be shown changed (or in
// exponent form) when the box formats it, so it is refused as it is typed. `w` is the box as
// the decision leaves it, before the edit box inserts `key` over its selection.
bool digit_beyond_precision(const NumericEdit& e, const Work& w, int typed, int key) {
    if (typed < '0' || typed > '9') return false;
    const std::string_view text = w.text();
    const auto caret = static_cast<std::size_t>(w.caret());
    const char inserted = static_cast<char>(key);
    const int digits = significant_integer_digits(
        joined(text.substr(0, caret), inserts_character(key) ? std::string_view(&inserted, 1) : std::string_view{},
               text.substr(caret + static_cast<std::size_t>(w.sel()))));
    return digits > significant_integer_digits(e.text) && digits + std::max(e.decimals, 0) > kMaxSignificantDigits;
}

NumericDecision refused_digit(const NumericEdit& e, std::optional<bool> overwrite) {
    NumericDecision d;
    d.overwrite = overwrite;
    if (e.trigger_error) {
        EditStep s;
        s.kind = EditStep::Kind::control_error;
        d.push(std::move(s));
    }
    return d;
}

// The key press as the rules decide it, on the working state; the decision's key is set.
void decide_key_press(NumericDecision& d, Work& w, const NumericEdit& e, int16_t key_ascii, bool ctrl_down) {
    int key = key_ascii;
    if (key == kCharTab || key == kCharLineFeed) {
        d.key = key_ascii;
        return;
    }
    if (key == kCharEnter) return;
    if (key == kCharSlash) {
        w.set_text("");
        return;
    }
    if (ctrl_down) {  // keys typed with Ctrl are not filtered
        d.key = key_ascii;
        return;
    }
    if (w.sel() != 0) {
        d.key = static_cast<int16_t>(replace_selection(w, e, key));
        return;
    }
    d.overwrite = e.overwrite;
    key = filter_key(w, e, key);
    if (w.text() == ".") {
        if (key != kPoint) w.set_text("");
        else key = 0;
    }
    if (w.text() == "0.") {
        if (key != kPoint && w.caret() == 0) w.set_sel_length(1);  // the digit replaces the "0"
        else if (key == kPoint) key = 0;
    }
    d.key = static_cast<int16_t>(key);
}

}  // namespace

NumericDecision numeric_key_press(const NumericEdit& e, int16_t key_ascii, bool ctrl_down) {
    NumericDecision d;
    Work w(e, d);
    decide_key_press(d, w, e, key_ascii, ctrl_down);
    if (!ctrl_down && digit_beyond_precision(e, w, key_ascii, d.key)) return refused_digit(e, d.overwrite);
    return d;
}

NumericDecision format_on_exit(const NumericEdit& e) {
    NumericDecision d;
    Work w(e, d);
    if (numeric_text(w.text())) {
        // Read without separators: a text still grouped (TxtFormat turned off while the box
        // showed 12,34,567.50, or a pasted 1,234) is its whole number, not the part before
        // the first comma.
        w.set_text(BoxNumberText(leading_value(StripGrouping(w.text()))));
        if (e.txt_format) {
            w.set_text(FormatGrouped(w.text()));
            w.set_max_length(w.len());  // the separators must fit
        }
    }
    if (e.max_value > 0 && !w.text().empty() && leading_value(StripGrouping(w.text())) > e.max_value)
        w.set_text(BoxNumberText(e.max_value));
    if (!w.text().empty() && leading_value(StripGrouping(w.text())) < e.min_value)
        w.set_text(BoxNumberText(e.min_value));
    if (e.decimals > 0) w.set_text(PadDecimals(w.text(), e.decimals));
    return d;
}

std::string step_down_text(const SpinInput& in) {
    std::string plain = StripGrouping(in.text);
    double v = in.min_value;
    if (numeric_text(plain)) {
        double value = leading_value(plain);
        if (in.max_value > 0 && value > in.max_value) v = in.max_value;
        else if (value < in.min_value) v = in.min_value;
        else {
            v = value - in.increment;
            if (v <= in.min_value) v = in.min_value;
        }
    }
    return BoxNumberText(v);
}

std::string step_up_text(const SpinInput& in) {
    std::string plain = StripGrouping(in.text);
    bool numeric = numeric_text(plain);
    double value = leading_value(plain);
    double v = numeric ? value + in.increment : in.min_value;
    if (in.max_value > 0) {
        if (value >= in.max_value || v >= in.max_value) v = in.max_value;
    }
    return BoxNumberText(v);
}

}  // namespace kel

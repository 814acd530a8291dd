#include "apps/kelform/terminal_session.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

#include "apps/kelform/record.h"
#include "apps/kelform/script_syntax.h"
#include "keltext/host/charset.h"
#include "keltext/host/conversions.h"
#include "keltext/host/date_recognizer.h"
#include "keltext/host/errors.h"
#include "keltext/widgetmodel/keyboard.h"

namespace kel::kelform {

namespace {

using mini::HostedControl;
using model::Keystroke;
using model::Part;

constexpr int16_t kVkF2 = kVkF1 + 1;
constexpr int16_t kVkF4 = kVkF1 + 3;
constexpr int16_t kVkF10 = kVkF1 + 9;

constexpr float kTwipsPerCell = 120;  // a Fixedsys character cell, as the controls size themselves
constexpr std::size_t kMaxEvents = 500;
constexpr int kCalendarHeight = 10;
constexpr int kCalendarWidth = 22;
constexpr int kListRows = 8;
constexpr int kMinRows = 7;        // title, a few rows of the form, help and status lines
constexpr int kMinFieldCells = 10; // what of a field must show at least

constexpr const char* kMonthNames[] = {"January", "February", "March",     "April",   "May",      "June",
                                       "July",    "August",   "September", "October", "November", "December"};

int cells(double twips) { return static_cast<int>(std::lround(twips / kTwipsPerCell)); }

// Reads a member of a part, or nothing when the part lacks it or refuses the read. Every redraw
// reads a dozen members of each field on the screen: a part that lacks the member refuses the
// read, which costs less than listing its members first.
std::optional<Variant> peek(const Part* part, std::string_view member) {
    if (!part) return std::nullopt;
    try {
        return part->peek(member);
    } catch (const RuntimeError&) {
        return std::nullopt;
    }
}

double peek_number(const Part* part, std::string_view member, double fallback = 0) {
    const auto v = peek(part, member);
    return v ? v->number() : fallback;
}

bool peek_bool(const Part* part, std::string_view member, bool fallback) {
    const auto v = peek(part, member);
    if (!v) return fallback;
    if (const bool* b = v->get_if<bool>()) return *b;
    return v->number() != 0;
}

std::optional<Colour> peek_colour(const Part* part, std::string_view member) {
    const auto v = peek(part, member);
    if (!v || !v->is_number()) return std::nullopt;
    return static_cast<Colour>(static_cast<int64_t>(v->number()));
}

Part* part_of_type(HostedControl& control, std::string_view type) {
    for (auto& [name, part] : control.parts())
        if (part && part->widget_type() == type) return part;
    return nullptr;
}

std::optional<Variant> property(HostedControl& c, std::string_view name) { return control_property(c, name); }

int weekday(Date d) { return ((d.serial + 6) % 7 + 7) % 7; }  // 0 Sunday; day 0 was a Saturday

Date add_months(int year, int month, int day, int delta) {
    int m = month - 1 + delta;
    int y = year + (m >= 0 ? m / 12 : (m - 11) / 12);
    m = ((m % 12) + 12) % 12 + 1;
    y = std::clamp(y, 100, 9999);
    const int d = std::min(day, days_in_month(y, m));
    return make_date(y, m, d).value_or(Date{});
}

}  // namespace

TerminalSession::TerminalSession(mini::FormDriver& form, const SavedForm& saved, Date today)
    : form_(form), saved_(saved), today_(today), code_(saved) {
    for (std::size_t i = 0; i < saved_.controls.size(); ++i) {
        const SavedControl& c = saved_.controls[i];
        saved_index_.try_emplace(name_key(c.name), i);
        hosted_.push_back(form_.find(c.name));
        // A control stands on its field's row (its label before it, unless placed apart), and on
        // its label's row where that is placed apart.
        const bool label_apart = c.label_row && c.label_col;
        const auto stands_on = [&](int row, int left) {
            if (row < 1) return;
            const auto r = static_cast<std::size_t>(row);
            if (by_row_.size() <= r) by_row_.resize(r + 1);
            by_row_[r].push_back({left, i});
        };
        int left = label_apart ? c.col - 1 : c.col - 2 - static_cast<int>(c.label.size());
        if (label_apart && *c.label_row == c.row) left = std::min(left, *c.label_col - 1);
        stands_on(c.row, left);
        if (label_apart && *c.label_row != c.row) stands_on(*c.label_row, *c.label_col - 1);
    }
    for (auto& row : by_row_) std::sort(row.begin(), row.end());
    for (const SavedControl& c : saved_.controls) max_row_ = std::max({max_row_, c.row, c.label_row.value_or(c.row)});
    // Every field must show its first cells: where the furthest one starts, and a little more.
    for (const SavedControl& c : saved_.controls) min_cols_ = std::max(min_cols_, c.col - 1 + kMinFieldCells);
    form_.set_observer(this);
    for (HostedControl* c : form_.controls())
        if (c->can_take_focus()) {
            form_.focus(c);
            break;
        }
    saved_values_ = raw_values();
}

TerminalSession::~TerminalSession() { form_.set_observer(nullptr); }

// ---- the form's own code -------------------------------------------------------------------

std::string TerminalSession::label_of(const HostedControl& control) const { return code_.label_of(control); }

void TerminalSession::log(std::string line) {
    events_.push_back(std::move(line));
    while (events_.size() > kMaxEvents) events_.pop_front();
}

void TerminalSession::event_raised(HostedControl& control, int /*number*/, std::string_view event,
                                   std::span<EventArg> args) {
    std::string line = "event " + control.name() + "." + std::string(event);
    for (const EventArg& a : args) line += " " + std::string(a.name) + "=" + format_plain(a.value);
    log(std::move(line));

    if (const auto status = code_.event_status(control, event)) {
        say(*status);
    } else if (FormCode::opens_calendar(event)) {
        open_calendar(control);
    }
}

void TerminalSession::keys_sent(HostedControl& control, std::string_view keys) {
    log("sendkeys " + control.name() + " " + quote(keys));
}

void TerminalSession::handler_error(std::string_view where, int number) {
    log(std::string(where) + " -> " + format_error(number));
    say(FormCode::handler_error_status(where, number));
}

void TerminalSession::keep_failed_date(HostedControl* left) {
    if (!FormCode::keeps_focus(form_, left)) return;
    form_.focus(left);
    say(code_.kept_focus_status(*left, status_));
}

// ---- input ---------------------------------------------------------------------------------

void TerminalSession::set_record_file(std::string path, RecordWriter write) {
    record_path_ = std::move(path);
    write_record_ = std::move(write);
}

std::vector<std::string> TerminalSession::raw_values() const {
    std::vector<std::string> out;
    for (HostedControl* c : form_.controls()) {
        const model::Part* edit = c->keyboard_part();
        std::string text = edit ? edit->peek("Text").str() : std::string();
        if (is_class(*c, "KelNumeric")) {
            // The same amount grouped or not, padded or not, is no change.
            std::erase(text, ',');
            if (numeric_text(text)) text = plain_number_text(leading_value(text));
        }
        out.push_back(std::move(text));
    }
    return out;
}

bool TerminalSession::changed() const { return raw_values() != saved_values_; }

bool TerminalSession::complete_field(bool come_back, std::string_view not_done) {
    HostedControl* left = form_.focused();
    if (!left) return true;
    form_.focus(nullptr);
    left_field_ = true;
    const auto allow = is_class(*left, "KelDateMask") ? property(*left, "AllowLostFocus") : std::nullopt;
    if (allow && allow->number() == 0) {
        form_.focus(left);
        const std::string why = status_.empty() ? label_of(*left) + ": the date is not right" : status_;
        say(why + " - " + std::string(not_done));
        return false;
    }
    if (come_back) form_.focus(left);
    return true;
}

bool TerminalSession::save_record() {
    if (!record_path_) {
        say("No record file: start kelform with --record FILE to save what is typed");
        return false;
    }
    try {
        write_record_(*record_path_, record_json(form_));
    } catch (const std::exception& e) {
        say(std::string("Not saved: ") + e.what());
        return false;
    }
    saved_values_ = raw_values();
    say("Saved to " + *record_path_);
    return true;
}

TerminalSession::Outcome TerminalSession::handle(const Input& input) {
    HostedControl* editing = form_.focused();
    const std::string typed = editing ? FormCode::edit_text(*editing) : std::string();
    left_field_ = false;
    const Outcome outcome = handle_input(input);
    // The form tells the person when a box changed what they typed as they left it.
    if (editing && (left_field_ || form_.focused() != editing) && status_.empty()) {
        if (const auto changed = code_.left_status(*editing, typed)) say(*changed);
    }
    return outcome;
}

TerminalSession::Outcome TerminalSession::handle_input(const Input& input) {
    if (confirm_quit_) {
        confirm_quit_ = false;
        if (input.kind == Input::Kind::character && (input.ch == U'y' || input.ch == U'Y')) return Outcome::quit;
        say("Changes kept");
        return Outcome::going_on;
    }
    status_.clear();
    HostedControl* before = form_.focused();
    Outcome outcome = Outcome::going_on;
    try {
        switch (input.kind) {
            case Input::Kind::key: outcome = handle_key(input.key, input.shift); break;
            case Input::Kind::character: handle_character(input.ch); break;
            case Input::Kind::click: handle_click(input.row, input.col); break;
        }
    } catch (const RuntimeError& e) {
        // A run-time error that reached the form from one of its own calls: shown, not fatal.
        say(e.what());
    } catch (const mini::FormError& e) {
        say(e.what());
    }
    if (outcome == Outcome::going_on) keep_failed_date(before);
    return outcome;
}

void TerminalSession::deliver(const Keystroke& k) {
    if (!form_.focused()) return;
    form_.keystroke(k);
}

bool TerminalSession::finish_focus() {
    // Finishing is like pressing the form's OK button: focus leaves the field first, so the
    // field completes and checks its value as it does when focus moves on.
    return complete_field(false, "F10 again finishes as it is");
}

TerminalSession::Outcome TerminalSession::handle_key(int16_t key, int16_t shift) {
    const bool ctrl = (shift & kCtrlMask) != 0;
    const bool alt = (shift & kAltMask) != 0;
    if (calendar_) {
        if (calendar_key(key, shift)) return Outcome::going_on;
        calendar_.reset();
    }
    if (list_) {
        if (list_key(key, shift)) return Outcome::going_on;
        list_.reset();
    }
    if (key == kVkF10 && shift == 0) {
        // Without a record F10 only prints the values; with one it saves them first, and a
        // save that fails keeps the form open so that nothing typed is lost.
        HostedControl* editing = form_.focused();
        if (!finish_focus()) return Outcome::going_on;
        if (record_path_ && !save_record()) {
            if (editing) form_.focus(editing);
            return Outcome::going_on;
        }
        return Outcome::finished;
    }
    if (ctrl && !alt && key == 'S') {
        if (complete_field(true, "not saved")) save_record();
        return Outcome::going_on;
    }
    if ((key == kVkEscape && shift == 0) || (ctrl && !alt && key == 'Q')) {
        if (!changed()) return Outcome::quit;
        confirm_quit_ = true;
        say("Discard changes? y/n");
        return Outcome::going_on;
    }
    if (key == kVkF2) {
        events_shown_ = !events_shown_;
        return Outcome::going_on;
    }
    HostedControl* focused = form_.focused();
    if (key == kVkTab && !ctrl && !alt) {
        if (focused) form_.tab((shift & kShiftMask) == 0);
        else form_.tab(true);
        return Outcome::going_on;
    }
    if (!focused) return Outcome::going_on;
    const bool f4 = key == kVkF4 && shift == 0;
    if (f4 || (alt && (key == kVkDown || key == kVkUp))) {
        if (is_class(*focused, "KelCombo") && (f4 || key == kVkDown)) {
            open_list(*focused);
            return Outcome::going_on;
        }
        if (is_class(*focused, "KelDateMask") && (f4 || key == kVkDown)) {
            press_calendar_button(*focused);
            return Outcome::going_on;
        }
        if (is_class(*focused, "KelNumeric") && alt) {
            press_spin(*focused, key == kVkUp);
            return Outcome::going_on;
        }
    }
    Keystroke k{key, shift, std::nullopt};
    // Keys that make a character: Backspace, Enter, Escape and Ctrl with a letter.
    if (key == kVkBackspace || key == kVkEnter) k.char_code = key;
    else if (ctrl && !alt && key >= 'A' && key <= 'Z') k.char_code = static_cast<int16_t>(key - 64);
    deliver(k);
    // Enter moves on as Tab does, as clerks expect; the control (and the form's KeyPress)
    // has had it first.
    if (key == kVkEnter && shift == 0 && form_.focused() == focused) form_.tab(true);
    return Outcome::going_on;
}

void TerminalSession::handle_character(char32_t ch) {
    if (calendar_) {
        if (ch == U' ') {
            pick_calendar_day();
            return;
        }
        calendar_.reset();
    }
    list_.reset();
    const auto byte = from_unicode(ch);
    if (!byte || *byte < 0x20 || *byte == 0x7F) {
        // Outside the form's character set: refused, as a control refuses a key it cannot take.
        std::string shown_ch;
        append_utf8(shown_ch, ch);
        say("'" + shown_ch + "' cannot be typed here: the form holds Windows-1252 text");
        return;
    }
    deliver(model::keystroke_for_char(*byte));
}

void TerminalSession::press_calendar_button(HostedControl& control) {
    Part* image = part_of_type(control, "Image");
    if (!image || !peek_bool(image, "Visible", false)) return;
    form_.click(control, *image);
}

void TerminalSession::press_spin(HostedControl& control, bool up) {
    Part* spin = part_of_type(control, "SpinButton");
    if (!spin || !peek_bool(spin, "Visible", false)) return;
    form_.notify(control, *spin, up ? "UpClick" : "DownClick");
}

// ---- the combo's list ----------------------------------------------------------------------

void TerminalSession::open_list(HostedControl& control) {
    Part* combo = part_of_type(control, "ComboBox");
    if (!combo || !control.can_take_focus()) return;
    form_.notify(control, *combo, "DropDown");
    const int32_t count = static_cast<int32_t>(peek_number(combo, "ListCount"));
    if (count <= 0) {
        say(label_of(control) + ": the list is empty");
        return;
    }
    const int32_t index = static_cast<int32_t>(peek_number(combo, "ListIndex", -1));
    list_ = ListPopup{control.name(), std::clamp(index, 0, count - 1)};
}

void TerminalSession::pick_list_entry(int32_t index) {
    if (!list_) return;
    HostedControl* control = form_.find(list_->control);
    list_.reset();
    if (!control) return;
    Part* combo = part_of_type(*control, "ComboBox");
    if (!combo) return;
    if (form_.focused() != control) form_.focus(control);
    combo->poke("ListIndex", Variant(index));
    // The whole entry is selected, as after a pick from a drop-down list.
    const auto text = peek(combo, "Text");
    form_.select(*control, 0, text ? static_cast<int32_t>(text->str().size()) : 0);
}

bool TerminalSession::list_key(int16_t key, int16_t shift) {
    HostedControl* control = form_.find(list_->control);
    Part* combo = control ? part_of_type(*control, "ComboBox") : nullptr;
    const int32_t count = static_cast<int32_t>(peek_number(combo, "ListCount"));
    if (count <= 0) return false;
    const bool alt = (shift & kAltMask) != 0;
    int32_t& h = list_->highlight;
    switch (key) {
        case kVkUp:
            if (alt) break;
            h = std::max(h - 1, 0);
            return true;
        case kVkDown:
            if (alt) break;
            h = std::min(h + 1, count - 1);
            return true;
        case kVkPageUp: h = std::max(h - kListRows, 0); return true;
        case kVkPageDown: h = std::min(h + kListRows, count - 1); return true;
        case kVkHome: h = 0; return true;
        case kVkEnd: h = count - 1; return true;
        case kVkEnter: pick_list_entry(h); return true;
        case kVkEscape: list_.reset(); return true;
        case kVkTab: pick_list_entry(h); return false;  // picks, then Tab moves on
        default: break;
    }
    if (key == kVkF4 || (alt && (key == kVkUp || key == kVkDown))) {
        pick_list_entry(h);
        return true;
    }
    return false;
}

// ---- the calendar --------------------------------------------------------------------------

void TerminalSession::open_calendar(HostedControl& control) {
    const Ymd ymd = to_ymd(FormCode::calendar_start(control, today_));
    list_.reset();
    calendar_ = Calendar{control.name(), ymd.year, ymd.month, ymd.day};
}

void TerminalSession::pick_calendar_day() {
    if (!calendar_) return;
    HostedControl* control = form_.find(calendar_->control);
    const auto day = make_date(calendar_->year, calendar_->month, calendar_->day);
    if (!control || !day) {
        calendar_.reset();
        return;
    }
    if (const auto refused = code_.refuse_day(*control, *day)) {
        say(*refused);
        return;
    }
    calendar_.reset();
    FormCode::pick_day(form_, *control, *day);
}

bool TerminalSession::calendar_key(int16_t key, int16_t shift) {
    Calendar& c = *calendar_;
    const auto day = make_date(c.year, c.month, c.day).value_or(today_);
    const auto move_to = [&](Date d) {
        if (const Ymd y = to_ymd(d); y.year >= 100 && y.year <= 9999) c.year = y.year, c.month = y.month, c.day = y.day;
    };
    if (shift & (kCtrlMask | kAltMask)) {
        if ((shift & kAltMask) && key == kVkUp) {
            calendar_.reset();
            return true;
        }
        return false;
    }
    switch (key) {
        case kVkLeft: move_to(Date{day.serial - 1}); return true;
        case kVkRight: move_to(Date{day.serial + 1}); return true;
        case kVkUp: move_to(Date{day.serial - 7}); return true;
        case kVkDown: move_to(Date{day.serial + 7}); return true;
        case kVkPageUp: move_to(add_months(c.year, c.month, c.day, -1)); return true;
        case kVkPageDown: move_to(add_months(c.year, c.month, c.day, 1)); return true;
        case kVkHome: c.day = 1; return true;
        case kVkEnd: c.day = days_in_month(c.year, c.month); return true;
        case kVkEnter: pick_calendar_day(); return true;
        case kVkEscape: calendar_.reset(); return true;
        default: return false;
    }
}

// ---- clicks --------------------------------------------------------------------------------

void TerminalSession::handle_click(int row, int col) {
    if (last_layout_.empty()) last_layout_ = layout();
    if (calendar_) {
        for (const Layout& l : last_layout_)
            if (l.control->name() == calendar_->control) {
                if (const auto p = calendar_place(l, rows_, cols_); p && p->rect.contains(row, col))
                    return calendar_click(row, col);
                break;
            }
        calendar_.reset();
    }
    if (list_) {
        for (const Layout& l : last_layout_)
            if (l.control->name() == list_->control) {
                if (list_rect(l, rows_).contains(row, col)) return list_click(row, col);
                break;
            }
        list_.reset();
    }
    for (const Layout& l : last_layout_) {
        HostedControl& c = *l.control;
        const bool on_field = l.field.contains(row, col);
        if (!on_field && !l.label.contains(row, col)) continue;
        if (!c.surface_part().peek("Enabled").number()) return;  // a disabled control takes no clicks
        if (on_field && l.spin_col && (col == *l.spin_col || col == *l.spin_col + 1)) {
            press_spin(c, col == *l.spin_col);
            return;
        }
        if (on_field && l.image_col && col == *l.image_col) {
            press_calendar_button(c);
            return;
        }
        if (form_.focused() != &c) {
            if (!c.can_take_focus()) return;
            form_.focus(&c);
            if (form_.focused() != &c) return;
        }
        if (on_field && l.drop_col && col == *l.drop_col) {
            open_list(c);
            return;
        }
        if (on_field && l.edit.contains(row, col)) {
            Part* field = c.keyboard_part();
            const auto text = peek(field, "Text");
            const int length = text ? static_cast<int>(text->str().size()) : 0;
            const int pos = std::clamp(col - l.edit.col + scroll_[c.name()], 0, length);
            // A plain edit box reports the mouse and the click; the masked box and the combo's
            // edit field only move their caret.
            const bool reports = field && field->widget_type() == "EditBox";
            const float x = static_cast<float>((col - l.edit.col) * kTwipsPerCell);
            if (reports) form_.mouse(c, *field, true, 1, 0, x, 150);
            form_.select(c, pos, 0);
            if (reports) form_.mouse(c, *field, false, 1, 0, x, 150);
            if (reports && form_.focused() == &c) form_.click(c, *field);
        }
        return;
    }
}

void TerminalSession::list_click(int row, int col) {
    (void)col;
    for (const Layout& l : last_layout_) {
        if (l.control->name() != list_->control) continue;
        const Rect r = list_rect(l, rows_);
        Part* combo = part_of_type(*l.control, "ComboBox");
        const int32_t count = static_cast<int32_t>(peek_number(combo, "ListCount"));
        const int visible = r.height - 2;
        const int32_t first = list_->highlight < visible ? 0 : list_->highlight - visible + 1;
        const int32_t index = first + (row - r.row - 1);
        if (row > r.row && row < r.row + r.height - 1 && index >= 0 && index < count) pick_list_entry(index);
        return;
    }
}

void TerminalSession::calendar_click(int row, int col) {
    for (const Layout& l : last_layout_) {
        if (l.control->name() != calendar_->control) continue;
        const auto place = calendar_place(l, rows_, cols_);
        if (!place) return;
        const Rect r = place->rect;
        const int in = place->inset;
        Calendar& c = *calendar_;
        if (row == r.row + in) {  // the title row: the arrows change the month
            if (col <= r.col + in + 1) {
                const Ymd y = to_ymd(add_months(c.year, c.month, c.day, -1));
                c.year = y.year, c.month = y.month, c.day = y.day;
            } else if (col >= r.col + r.width - in - 2) {
                const Ymd y = to_ymd(add_months(c.year, c.month, c.day, 1));
                c.year = y.year, c.month = y.month, c.day = y.day;
            }
            return;
        }
        const int week = row - (r.row + in + 2);
        const int dow = (col - r.col - in) / 3;
        if (week < 0 || week > 5 || col < r.col + in || dow < 0 || dow > 6) return;
        const auto first = make_date(c.year, c.month, 1);
        if (!first) return;
        const int day = week * 7 + dow - weekday(*first) + 1;
        if (day < 1 || day > days_in_month(c.year, c.month)) return;
        c.day = day;
        pick_calendar_day();
        return;
    }
}

// ---- drawing -------------------------------------------------------------------------------

std::vector<std::size_t> TerminalSession::on_screen() const {
    std::vector<std::size_t> out;
    const int last = top_ + std::max(rows_ - 3, 1);
    for (int row = top_ + 1; row <= last && row < static_cast<int>(by_row_.size()); ++row)
        for (const OnRow& c : by_row_[static_cast<std::size_t>(row)]) {
            // The form does not scroll sideways: what starts past the right edge never shows.
            if (c.left >= cols_) break;
            out.push_back(c.index);
        }
    // The focused control, and the one whose list or calendar is open, are laid out wherever
    // they stand: the cursor and the pop-ups are placed from them.
    const auto add = [&](const std::string& name) {
        if (const auto it = saved_index_.find(name_key(name)); it != saved_index_.end()) out.push_back(it->second);
    };
    if (const HostedControl* c = form_.focused()) add(c->name());
    if (calendar_) add(calendar_->control);
    if (list_) add(list_->control);
    std::sort(out.begin(), out.end());
    out.erase(std::unique(out.begin(), out.end()), out.end());
    return out;
}

std::vector<TerminalSession::Layout> TerminalSession::layout() {
    std::vector<Layout> out;
    for (const std::size_t i : on_screen()) {
        const SavedControl& saved = saved_.controls[i];
        HostedControl* c = hosted_[i];
        if (!c) continue;
        Layout l;
        l.control = c;
        l.saved = &saved;
        Part& surface = c->surface_part();
        l.field = {saved.row - top_, saved.col - 1, 1, std::max(cells(peek_number(&surface, "Width")), 1)};
        Part* edit = c->keyboard_part();
        const int edit_left = edit ? cells(peek_number(edit, "Left")) : 0;
        int edit_width = edit ? cells(peek_number(edit, "Width")) : l.field.width;
        if (is_class(*c, "KelCombo")) {
            // The combo box draws its own drop-down button at its right end.
            edit_width = std::max(edit_width, 2);
            l.drop_col = l.field.col + edit_left + edit_width - 1;
            --edit_width;
        }
        l.edit = {l.field.row, l.field.col + edit_left, 1, std::max(edit_width, 1)};
        if (Part* spin = part_of_type(*c, "SpinButton"); spin && peek_bool(spin, "Visible", false))
            l.spin_col = l.field.col + cells(peek_number(spin, "Left"));
        if (Part* image = part_of_type(*c, "Image"); image && peek_bool(image, "Visible", false))
            l.image_col = l.field.col + cells(peek_number(image, "Left"));
        const int label_len = static_cast<int>(saved.label.size());
        if (saved.label_row && saved.label_col)
            l.label = {*saved.label_row - top_, *saved.label_col - 1, 1, label_len};
        else
            l.label = {l.field.row, std::max(l.field.col - label_len - 1, 0), 1, label_len};
        // The field may be wider than its parts: clicks count on what is drawn.
        int right = l.edit.col + l.edit.width;
        if (l.spin_col) right = std::max(right, *l.spin_col + 2);
        if (l.image_col) right = std::max(right, *l.image_col + 1);
        if (l.drop_col) right = std::max(right, *l.drop_col + 1);
        l.field.width = std::max(right - l.field.col, 1);
        out.push_back(l);
    }
    return out;
}

std::optional<TerminalSession::CalendarPlace> TerminalSession::calendar_place(const Layout& box, int rows,
                                                                               int cols) const {
    const int corner = FormCode::calendar_corner(*box.control);
    const bool top_first = corner == 0 || corner == 1;
    const bool right = corner == 1 || corner == 3;
    // The calendar may use every row below the title bar, the help and status lines too, but
    // never the field's own row: the person sees the date it is for.
    for (const int inset : {1, 0}) {
        const int height = kCalendarHeight - 2 * (1 - inset);
        const int width = kCalendarWidth - 2 * (1 - inset);
        int col = right ? box.field.col + box.field.width - width : box.field.col;
        col = std::clamp(col, 0, std::max(cols - width, 0));
        const int above = box.field.row - height, below = box.field.row + 1;
        const bool fits_above = above >= 1;
        const bool fits_below = below + height <= rows;
        for (const bool up : {top_first, !top_first}) {
            if (up && fits_above) return CalendarPlace{Rect{above, col, height, width}, inset};
            if (!up && fits_below) return CalendarPlace{Rect{below, col, height, width}, inset};
        }
        // Beside the field, on the rows around it.
        const int row = std::clamp(box.field.row - height / 2, 1, std::max(rows - height, 1));
        if (row + height <= rows) {
            if (box.field.col + box.field.width + width <= cols)
                return CalendarPlace{Rect{row, box.field.col + box.field.width, height, width}, inset};
            if (box.field.col - width >= 0) return CalendarPlace{Rect{row, box.field.col - width, height, width}, inset};
        }
    }
    return std::nullopt;
}

TerminalSession::Rect TerminalSession::list_rect(const Layout& box, int rows) const {
    Part* combo = part_of_type(*box.control, "ComboBox");
    const int count = std::max(static_cast<int>(peek_number(combo, "ListCount")), 1);
    const int height = std::min(count, kListRows) + 2;
    Rect r{box.field.row + 1, box.field.col, height, std::max(box.field.width, 8)};
    if (r.row + height > rows - 2 && box.field.row - height >= 1) r.row = box.field.row - height;
    return r;
}

void TerminalSession::draw_control(Canvas& canvas, const Layout& l, bool focused) {
    HostedControl& c = *l.control;
    Part* field = c.keyboard_part();
    const bool enabled = peek_bool(&c.surface_part(), "Enabled", true) && peek_bool(field, "Enabled", true);

    CellStyle label_style;
    label_style.bold = focused;
    label_style.dim = !enabled;
    canvas.put_text(l.label.row, l.label.col, l.saved->label, label_style);
    // A marker before the label shows which field has focus, also on a terminal without colour.
    if (focused && l.label.col >= 2) canvas.put(l.label.row, l.label.col - 2, U'▸', label_style);

    CellStyle style;
    style.fg = peek_colour(field, "ForeColor");
    style.bg = peek_colour(field, "BackColor");
    if (!enabled) {
        style.fg = kGreyText;
        style.dim = true;
    }
    style.underline = !style.bg.has_value();  // no colour: the field shows as a line

    const auto text_value = peek(field, "Text");
    const std::string text = text_value ? text_value->str() : std::string();
    const int length = static_cast<int>(text.size());
    const int sel_start = std::clamp(static_cast<int>(peek_number(field, "SelStart")), 0, length);
    const int sel_length = std::clamp(static_cast<int>(peek_number(field, "SelLength")), 0, length - sel_start);
    const int caret = sel_start + sel_length;

    // Scrolled so that the caret stays in view.
    int& offset = scroll_[c.name()];
    const int width = l.edit.width;
    if (length < width) offset = 0;
    offset = std::clamp(offset, 0, std::max(length - width + 1, 0));
    if (caret < offset) offset = caret;
    if (caret >= offset + width) offset = caret - width + 1;

    canvas.fill(l.edit.row, l.edit.col, 1, width, style);
    for (int i = 0; i < width && offset + i < length; ++i) {
        CellStyle s = style;
        const int pos = offset + i;
        if (focused && sel_length > 0 && pos >= sel_start && pos < sel_start + sel_length) s.reverse = true;
        canvas.put(l.edit.row, l.edit.col + i, to_unicode(static_cast<uint8_t>(text[static_cast<std::size_t>(pos)])), s);
    }
    if (focused && !calendar_ && !list_) canvas.set_cursor(l.edit.row, l.edit.col + caret - offset);

    CellStyle button;
    button.reverse = true;
    button.dim = !enabled;
    if (l.spin_col) {
        canvas.put(l.edit.row, *l.spin_col, U'▲', button);
        canvas.put(l.edit.row, *l.spin_col + 1, U'▼', button);
    }
    if (l.image_col) canvas.put(l.edit.row, *l.image_col, U'▦', button);
    if (l.drop_col) canvas.put(l.edit.row, *l.drop_col, U'▼', button);
}

void TerminalSession::draw_list(Canvas& canvas, const Rect& r) {
    HostedControl* control = form_.find(list_->control);
    Part* combo = control ? part_of_type(*control, "ComboBox") : nullptr;
    CellStyle frame;
    frame.fg = peek_colour(combo, "ForeColor");
    frame.bg = peek_colour(combo, "BackColor");
    canvas.box(r.row, r.col, r.height, r.width, frame);
    const int count = static_cast<int>(peek_number(combo, "ListCount"));
    const int visible = r.height - 2;
    const int first = list_->highlight < visible ? 0 : list_->highlight - visible + 1;
    for (int i = 0; i < visible && first + i < count; ++i) {
        std::string entry;
        try {
            entry = combo->peek("List", first + i).str();
        } catch (const RuntimeError&) {
            continue;
        }
        CellStyle s = frame;
        s.reverse = first + i == list_->highlight;
        canvas.fill(r.row + 1 + i, r.col + 1, 1, r.width - 2, s);
        canvas.put_text(r.row + 1 + i, r.col + 1, entry, s, r.width - 2);
    }
}

void TerminalSession::draw_calendar(Canvas& canvas, const CalendarPlace& place) {
    const Rect& r = place.rect;
    const int in = place.inset;
    const Calendar& c = *calendar_;
    HostedControl* control = form_.find(c.control);
    const auto lo = control ? property(*control, "MinDate") : std::nullopt;
    const auto hi = control ? property(*control, "MaxDate") : std::nullopt;
    const auto min = lo ? recognize_date(*lo) : std::nullopt;
    const auto max = hi ? recognize_date(*hi) : std::nullopt;

    CellStyle frame;
    frame.fg = rgb(0, 0, 128);
    frame.bg = rgb(255, 255, 255);
    if (in > 0) canvas.box(r.row, r.col, r.height, r.width, frame);
    else canvas.fill(r.row, r.col, r.height, r.width, frame);
    const std::string title = std::string(kMonthNames[c.month - 1]) + " " + std::to_string(c.year);
    CellStyle bold = frame;
    bold.bold = true;
    canvas.put_utf8(r.row + in, r.col + in, "◂", bold);
    canvas.put_utf8(r.row + in, r.col + r.width - 1 - in, "▸", bold);
    canvas.put_text(r.row + in, r.col + in + (r.width - 2 * in - static_cast<int>(title.size())) / 2, title, bold);
    canvas.put_text(r.row + in + 1, r.col + in, "Su Mo Tu We Th Fr Sa", frame);
    const auto first = make_date(c.year, c.month, 1);
    if (!first) return;
    const int lead = weekday(*first);
    const int days = days_in_month(c.year, c.month);
    for (int day = 1; day <= days; ++day) {
        const int slot = lead + day - 1;
        const int row = r.row + in + 2 + slot / 7;
        const int col = r.col + in + (slot % 7) * 3;
        const Date d{first->serial + day - 1};
        CellStyle s = frame;
        if ((min && d < *min) || (max && d > *max)) {
            s.dim = true;
            s.fg = kGreyText;
        }
        if (d == today_) s.underline = true;
        if (day == c.day) s.reverse = true;
        const std::string number = (day < 10 ? " " : "") + std::to_string(day);
        canvas.put_text(row, col, number, s);
        if (day == c.day) canvas.set_cursor(row, col + 1);
    }
}

void TerminalSession::render(Canvas& canvas) {
    rows_ = canvas.rows();
    cols_ = canvas.cols();
    HostedControl* focused = form_.focused();
    // A form taller than the screen scrolls so that the focused field stays in view, between
    // the title bar and the help line.
    const int pane_height = events_shown_ ? std::max((rows_ - 3) / 3, 4) : 0;
    const int last_row = std::max(rows_ - 3 - pane_height, 1);
    // When the screen grows, the form scrolls back as far as its rows allow.
    top_ = std::min(top_, std::max(max_row_ - last_row, 0));
    const SavedControl* focused_saved = nullptr;
    if (focused)
        if (const auto it = saved_index_.find(name_key(focused->name())); it != saved_index_.end()) {
            focused_saved = &saved_.controls[it->second];
            if (focused_saved->row - top_ > last_row) top_ = focused_saved->row - last_row;
            if (focused_saved->row - top_ < 1) top_ = focused_saved->row - 1;
        }
    top_ = std::max(top_, 0);
    last_layout_ = layout();

    if (rows_ < kMinRows || cols_ < min_cols_) {
        // A clipped form would hide fields or parts of them: say so instead.
        last_layout_.clear();
        calendar_.reset();
        list_.reset();
        canvas.fill(0, 0, rows_, cols_, CellStyle{});
        canvas.put_text(0, 0, "Terminal too small", CellStyle{}, cols_);
        canvas.put_text(std::min(1, rows_ - 1), 0,
                        "for this form: it needs " + std::to_string(min_cols_) + "x" + std::to_string(kMinRows) +
                            ", has " + std::to_string(cols_) + "x" + std::to_string(rows_),
                        CellStyle{}, cols_);
        return;
    }
    if (calendar_ && focused_saved && focused->name() == calendar_->control) {
        // No place for the calendar with the field where it is: the field goes to the top row.
        for (const Layout& l : last_layout_)
            if (l.control == focused && !calendar_place(l, rows_, cols_) && top_ != focused_saved->row - 1) {
                top_ = std::max(focused_saved->row - 1, 0);
                last_layout_ = layout();
                break;
            }
    }

    for (const Layout& l : last_layout_) draw_control(canvas, l, l.control == focused);

    // The bars are drawn over whatever of the form scrolled under them.
    CellStyle bar;
    bar.reverse = true;
    canvas.fill(0, 0, 1, cols_, bar);
    canvas.put_text(0, 1, saved_.title, bar, std::max(cols_ - 12, 0));
    canvas.put_text(0, std::max(cols_ - 8, 0), "kelform", bar);

    if (events_shown_) {
        const int top = std::max(rows_ - 2 - pane_height, 1);
        CellStyle pane;
        canvas.fill(top, 0, rows_ - 2 - top, cols_, pane);
        CellStyle rule;
        rule.dim = true;
        canvas.fill(top, 0, 1, cols_, rule, U'─');
        canvas.put_text(top, 2, " Events (F2 hides) ", rule);
        const int lines = rows_ - 2 - top - 1;
        const int n = static_cast<int>(events_.size());
        for (int i = 0; i < lines && i < n; ++i)
            canvas.put_text(top + 1 + i, 1, events_[static_cast<std::size_t>(std::max(n - lines, 0) + i)], pane,
                            cols_ - 2);
    }

    CellStyle help;
    help.dim = true;
    const char* keys = calendar_ ? " Arrows move  PgUp/PgDn month  Enter picks  Esc closes"
                       : list_   ? " Up/Down move  Enter picks  Esc closes"
                                 : " Tab next  F4 list/calendar  F2 events  Ctrl+S save  F10 finish  Esc quit";
    canvas.fill(rows_ - 2, 0, 1, cols_, help);
    canvas.put_text(rows_ - 2, 0, keys, help, cols_);

    CellStyle status;
    status.reverse = true;
    canvas.fill(rows_ - 1, 0, 1, cols_, status);
    const std::string mode = form_.insert_on() ? " OVR " : " INS ";
    canvas.put_utf8(rows_ - 1, 1, status_, status, std::max(cols_ - 7, 0));
    canvas.put_text(rows_ - 1, std::max(cols_ - 5, 0), mode, status);

    if (calendar_) {
        for (const Layout& l : last_layout_)
            if (l.control->name() == calendar_->control)
                if (const auto place = calendar_place(l, rows_, cols_)) draw_calendar(canvas, *place);
    }
    if (list_) {
        for (const Layout& l : last_layout_)
            if (l.control->name() == list_->control) draw_list(canvas, list_rect(l, rows_));
    }
}

std::string TerminalSession::values_json() { return record_json(form_); }

}  // namespace kel::kelform

#pragma once
// The terminal form without the terminal: takes a person's input (keys, typed characters,
// clicks on screen cells), drives the form's controls through the minimal host, runs the
// form's own code (status messages, the date box's focus rule, the calendar, the combo's
// list) and draws the whole screen into a Canvas. The curses side (tui.h) only turns terminal
// input into Input and copies the canvas to the screen.
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "apps/kelform/form_file.h"
#include "apps/kelform/terminal_canvas.h"
#include "keltext/host/date.h"
#include "keltext/minihost/form.h"

namespace kel::kelform {

// One piece of input from the person.
struct Input {
    enum class Kind { key, character, click };
    Kind kind = Kind::key;
    int16_t key = 0;    // key: virtual key code (kVk...)
    int16_t shift = 0;  // key: shift mask (1 Shift, 2 Ctrl, 4 Alt)
    char32_t ch = 0;    // character: the Unicode character typed
    int row = 0;        // click: the screen cell
    int col = 0;

    static Input key_of(int16_t key, int16_t shift = 0) { return {Kind::key, key, shift, 0, 0, 0}; }
    static Input char_of(char32_t ch) { return {Kind::character, 0, 0, ch, 0, 0}; }
    static Input click_at(int row, int col) { return {Kind::click, 0, 0, 0, row, col}; }
};

class TerminalSession : private mini::FormObserver {
public:
    enum class Outcome { going_on, finished, quit, signalled };

    // The form must already hold the saved form's controls (open_form); the session becomes its
    // observer and puts focus in the first control that can take it.
    TerminalSession(mini::FormDriver& form, const SavedForm& saved, Date today);
    ~TerminalSession() override;
    TerminalSession(const TerminalSession&) = delete;
    TerminalSession& operator=(const TerminalSession&) = delete;

    // Where Ctrl+S and F10 save the record of what was typed, and how (the writer throws a
    // std::runtime_error whose message says why a save failed). Without one, F10 only prints.
    using RecordWriter = std::function<void(const std::string& path, const std::string& json)>;
    void set_record_file(std::string path, RecordWriter write);
    // A message for the status line before anything is typed (a record that cannot be saved).
    void warn(std::string message) { say(std::move(message)); }
    // True when a value differs from the one the record was last saved (or opened) with.
    bool changed() const;

    Outcome handle(const Input& input);
    // Draws the whole screen; the canvas size is the terminal's.
    void render(Canvas& canvas);

    // The values as the form reads them through Text, one member per control: the record.
    std::string values_json();

    // For tests and the screen: the status line's message (UTF-8), the events pane's lines.
    const std::string& status() const { return status_; }
    const std::deque<std::string>& events() const { return events_; }
    bool events_shown() const { return events_shown_; }
    bool calendar_open() const { return calendar_.has_value(); }
    bool list_open() const { return list_.has_value(); }

private:
    struct Calendar {
        std::string control;
        int year = 0, month = 0, day = 0;  // the highlighted day
    };
    struct ListPopup {
        std::string control;
        int32_t highlight = 0;
    };
    struct Rect {
        int row = 0, col = 0, height = 0, width = 0;
        bool contains(int r, int c) const { return r >= row && r < row + height && c >= col && c < col + width; }
    };
    // Where one control stands on the screen, worked out from its surface and parts.
    struct Layout {
        mini::HostedControl* control = nullptr;
        const SavedControl* saved = nullptr;
        Rect field;                    // the whole control
        Rect edit;                     // its edit field
        std::optional<int> spin_col;   // spin buttons (two cells: up, down)
        std::optional<int> image_col;  // calendar button
        std::optional<int> drop_col;   // combo drop-down button
        Rect label;
    };

    // FormObserver: the form's own code.
    void event_raised(mini::HostedControl& control, int number, std::string_view event,
                      std::span<EventArg> args) override;
    void keys_sent(mini::HostedControl& control, std::string_view keys) override;
    void handler_error(std::string_view where, int number) override;

    Outcome handle_input(const Input& input);
    Outcome handle_key(int16_t key, int16_t shift);
    void handle_character(char32_t ch);
    void handle_click(int row, int col);
    bool calendar_key(int16_t key, int16_t shift);
    bool list_key(int16_t key, int16_t shift);
    void calendar_click(int row, int col);
    void list_click(int row, int col);

    void deliver(const model::Keystroke& k);
    void open_list(mini::HostedControl& control);
    void pick_list_entry(int32_t index);
    void open_calendar(mini::HostedControl& control);
    void pick_calendar_day();
    void press_calendar_button(mini::HostedControl& control);
    void press_spin(mini::HostedControl& control, bool up);
    // The date box's rule: a box whose check failed (AllowLostFocus false) gets focus back.
    void keep_failed_date(mini::HostedControl* left);
    bool finish_focus();
    // Completes the field being edited (focus leaves it and, with `come_back`, returns); false
    // with the reason on the status line when its check fails.
    bool complete_field(bool come_back, std::string_view not_done);
    // Saves the record; false with the reason on the status line.
    bool save_record();
    // What each control holds, read without side effects (no checks run), to tell changes.
    std::vector<std::string> raw_values() const;

    // The saved controls that may show on the screen as it is scrolled now, in file order.
    std::vector<std::size_t> on_screen() const;
    std::vector<Layout> layout();
    // Where the calendar stands: framed where there is room, else without its frame (8 rows),
    // never over its own field; nothing when no place on the screen keeps the field clear.
    struct CalendarPlace {
        Rect rect;
        int inset = 1;  // 1 inside the frame, 0 without one
    };
    std::optional<CalendarPlace> calendar_place(const Layout& box, int rows, int cols) const;
    Rect list_rect(const Layout& box, int rows) const;
    void draw_control(Canvas& canvas, const Layout& l, bool focused);
    void draw_calendar(Canvas& canvas, const CalendarPlace& place);
    void draw_list(Canvas& canvas, const Rect& r);

    std::string label_of(const mini::HostedControl& control) const;
    void log(std::string line);
    void say(std::string message) { status_ = std::move(message); }

    mini::FormDriver& form_;
    const SavedForm& saved_;
    Date today_;
    std::string status_;
    std::deque<std::string> events_;
    bool events_shown_ = false;
    std::optional<Calendar> calendar_;
    std::optional<ListPopup> list_;
    std::map<std::string, int> scroll_;  // first text position shown, per control
    int rows_ = 24, cols_ = 80;          // the size last drawn, for clicks
    int top_ = 0;                        // form rows scrolled off the top
    int max_row_ = 1;                    // the form's last row
    int min_cols_ = 20;                  // the narrowest screen that shows every field
    std::vector<Layout> last_layout_;
    std::optional<std::string> record_path_;
    RecordWriter write_record_;
    std::vector<std::string> saved_values_;  // raw_values() when last saved or opened
    bool confirm_quit_ = false;              // "Discard changes? y/n" is asked
    bool left_field_ = false;                // this input made focus leave the field (and maybe return)
    // Forms may hold thousands of controls: a redraw looks at the rows on the screen, and names
    // are found through a map, so that a keystroke costs the same however long the form is.
    std::unordered_map<std::string, std::size_t> saved_index_;  // name_key -> saved_.controls
    std::vector<mini::HostedControl*> hosted_;                  // saved_.controls[i] on the form
    struct OnRow {
        int left;           // the first screen column the control uses on that row
        std::size_t index;  // in saved_.controls
        bool operator<(const OnRow& o) const { return left < o.left || (left == o.left && index < o.index); }
    };
    std::vector<std::vector<OnRow>> by_row_;  // form row -> controls on it, from the left
};

}  // namespace kel::kelform

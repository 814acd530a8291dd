#pragma once
// The form code of kelform's forms (the voucher demo and any form file), the same on every
// screen that shows a form: the terminal form and the desktop form. What the status line says
// when a control raises an error event or a handler fails, the label a message names a control
// by, where a date box's calendar starts and which day it takes, and the date box's rule that a
// box left with a bad date gets focus back once.
//
// The screens own what is theirs: drawing, keys (Enter moves on as Tab, F4 opens a list or the
// calendar, Ctrl+S saves the record, F10 finishes) and the record file.
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>

#include "apps/kelform/form_file.h"
#include "keltext/host/date.h"
#include "keltext/widgetmodel/hosted.h"

namespace kel::kelform {

class FormCode {
public:
    explicit FormCode(const SavedForm& saved);

    // The control's label without its unit ("Amount (Rs)" is "Amount"), in UTF-8; its name
    // when the form gives it no label.
    std::string label_of(const model::HostedControl& control) const;

    // The status line's message for an event the form answers (ControlError, DateError).
    std::optional<std::string> event_status(model::HostedControl& control, std::string_view event) const;
    // What the control's edit field holds now.
    static std::string edit_text(model::HostedControl& control);
    // When leaving the control changed the value typed (`typed`: its text before the input that
    // made focus leave), not merely its form (grouping, padding, a two-digit year widened):
    // "Amount: 6000000 was changed to 5000000.00".
    std::optional<std::string> left_status(model::HostedControl& control, const std::string& typed) const;
    // True for the event that opens the date box's calendar (its button was pressed).
    static bool opens_calendar(std::string_view event);
    static std::string handler_error_status(std::string_view where, int number);

    // The day a calendar opens on: the box's own date, else today, brought into its range.
    static Date calendar_start(model::HostedControl& control, Date today);
    // The corner of the field the calendar stands at: 0 above left, 1 above right, 2 below
    // left (the default), 3 below right.
    static int calendar_corner(model::HostedControl& control);
    // Nothing when the box takes `day`; else why not, for the status line.
    std::optional<std::string> refuse_day(model::HostedControl& control, Date day) const;
    // Puts the picked day in the box, as typing it and leaving would.
    static void pick_day(model::FormDriver& form, model::HostedControl& control, Date day);

    // The date box's rule: `left` (focus just left it) is a date box whose check failed and
    // that does not allow focus to leave; the screen puts focus back and says why.
    static bool keeps_focus(model::FormDriver& form, model::HostedControl* left);
    std::string kept_focus_status(const model::HostedControl& left, const std::string& status) const;

private:
    const SavedForm& saved_;
    std::unordered_map<std::string, std::size_t> index_;  // name_key -> saved_.controls
};

// A late-bound read of a property; nothing when the control refuses it.
std::optional<Variant> control_property(model::HostedControl& control, std::string_view name);
bool is_class(const model::HostedControl& control, std::string_view name);

}  // namespace kel::kelform

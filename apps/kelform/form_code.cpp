#include "apps/kelform/form_code.h"

#include <algorithm>

#include "keltext/host/charset.h"
#include "keltext/host/conversions.h"
#include "keltext/host/date_recognizer.h"
#include "keltext/host/errors.h"
#include "keltext/host/members.h"

namespace kel::kelform {

std::optional<Variant> control_property(model::HostedControl& control, std::string_view name) {
    try {
        return control.dispatch().get(name);
    } catch (const RuntimeError&) {
        return std::nullopt;
    }
}

bool is_class(const model::HostedControl& control, std::string_view name) {
    return same_name(control.info().name, name);
}

namespace {


// The parts of a dd/mm/yyyy field as numbers, where they are typed in full.
std::optional<int> date_part(std::string_view text, std::size_t at, std::size_t len) {
    if (text.size() < at + len) return std::nullopt;
    int v = 0;
    for (char c : text.substr(at, len)) {
        if (c < '0' || c > '9') return std::nullopt;
        v = v * 10 + (c - '0');
    }
    return v;
}

// True when leaving the control changed the value typed (a number clamped, a date corrected),
// not merely its form (grouping, padding, a two-digit year widened).
bool value_changed(model::HostedControl& c, const std::string& before, const std::string& after) {
    if (before.empty() || before == after) return false;
    if (is_class(c, "KelNumeric")) {
        std::string b = before, a = after;
        std::erase(b, ',');
        std::erase(a, ',');
        return leading_value(b) != leading_value(a);
    }
    if (is_class(c, "KelDateMask")) {
        const auto style = control_property(c, "DateStyle");
        if (style && style->number() != 0) return false;
        for (const std::size_t at : {std::size_t{0}, std::size_t{3}}) {
            const auto b = date_part(before, at, 2), a = date_part(after, at, 2);
            if (b && a && *b != *a) return true;
        }
        if (const auto b = date_part(before, 6, 4), a = date_part(after, 6, 4); b && a) return *b != *a;
        if (const auto b = date_part(before, 6, 2), a = date_part(after, 6, 4); b && a) return *b != *a % 100;
        return false;
    }
    return is_class(c, "KelAlphaNumeric");
}

}  // namespace


FormCode::FormCode(const SavedForm& saved) : saved_(saved) {
    for (std::size_t i = 0; i < saved_.controls.size(); ++i) index_.try_emplace(name_key(saved_.controls[i].name), i);
}

std::string FormCode::label_of(const model::HostedControl& control) const {
    const auto it = index_.find(name_key(control.name()));
    if (it == index_.end()) return control.name();
    const std::string& label = saved_.controls[it->second].label;
    if (label.empty()) return control.name();
    const auto paren = label.find(" (");
    return to_utf8(paren == std::string::npos || paren == 0 ? label : label.substr(0, paren));
}

std::optional<std::string> FormCode::event_status(model::HostedControl& control, std::string_view event) const {
    if (same_name(event, "ControlError")) {
        const auto decimals = control_property(control, "NoOfDecimals");
        const auto length = control_property(control, "MaxLength");
        std::string rule = "digits and one decimal point";
        if (decimals && length) {
            const int d = static_cast<int>(decimals->number());
            const int n = static_cast<int>(length->number());
            rule = d > 0 ? "up to " + std::to_string(std::max(n - d - 1, 0)) + " digits, a point and " +
                               std::to_string(d) + " decimals"
                         : "up to " + std::to_string(n) + " digits";
        }
        return label_of(control) + ": key refused - " + rule;
    }
    if (same_name(event, "DateError")) {
        const auto style = control_property(control, "DateStyle");
        if (style && style->number() == 1) return label_of(control) + ": give a month 01-12 and a two-digit year (mm/yy)";
        return label_of(control) + ": not a real date (dd/mm/yyyy)";
    }
    return std::nullopt;
}

std::string FormCode::edit_text(model::HostedControl& control) {
    const model::Part* edit = control.keyboard_part();
    return edit ? edit->peek("Text").str() : std::string();
}

std::optional<std::string> FormCode::left_status(model::HostedControl& control, const std::string& typed) const {
    const std::string now = edit_text(control);
    if (!value_changed(control, typed, now)) return std::nullopt;
    return label_of(control) + ": " + to_utf8(typed) + " was changed to " + to_utf8(now);
}

bool FormCode::opens_calendar(std::string_view event) { return same_name(event, "ButtonClick"); }

std::string FormCode::handler_error_status(std::string_view where, int number) {
    return std::string(where) + ": error " + std::to_string(number) + " (" + error_description(number) + ")";
}

Date FormCode::calendar_start(model::HostedControl& control, Date today) {
    std::optional<Date> day;
    if (const model::Part* field = control.keyboard_part()) {
        try {
            day = recognize_date_text(field->peek("Text").str());
        } catch (const RuntimeError&) {
        }
    }
    Date d = day.value_or(today);
    const auto lo = control_property(control, "MinDate");
    const auto hi = control_property(control, "MaxDate");
    if (const auto min = lo ? recognize_date(*lo) : std::nullopt; min && d < *min) d = *min;
    if (const auto max = hi ? recognize_date(*hi) : std::nullopt; max && d > *max) d = *max;
    return d;
}

int FormCode::calendar_corner(model::HostedControl& control) {
    const auto pos = control_property(control, "CalendarPosition");
    return pos ? static_cast<int>(pos->number()) : 2;
}

std::optional<std::string> FormCode::refuse_day(model::HostedControl& control, Date day) const {
    const auto lo = control_property(control, "MinDate");
    const auto hi = control_property(control, "MaxDate");
    const auto min = lo ? recognize_date(*lo) : std::nullopt;
    const auto max = hi ? recognize_date(*hi) : std::nullopt;
    if ((!min || day >= *min) && (!max || day <= *max)) return std::nullopt;
    const std::string range = min && max ? date_text(*min) + " to " + date_text(*max)
                              : min      ? "from " + date_text(*min)
                                         : "up to " + date_text(*max);
    return label_of(control) + ": pick a day " + range;
}

void FormCode::pick_day(model::FormDriver& form, model::HostedControl& control, Date day) {
    if (form.focused() != &control) form.focus(&control);
    control.dispatch().set("Text", Variant(day));
}

bool FormCode::keeps_focus(model::FormDriver& form, model::HostedControl* left) {
    if (!left || left == form.focused() || !is_class(*left, "KelDateMask")) return false;
    const auto allow = control_property(*left, "AllowLostFocus");
    return allow && allow->number() == 0;
}

std::string FormCode::kept_focus_status(const model::HostedControl& left, const std::string& status) const {
    // Entering the box again clears the flag, so a second attempt to leave is let through:
    // the form insists once and explains, it never locks the person in.
    return (status.empty() ? label_of(left) + ": the date is not right" : status) +
           " - focus stays; leave again to keep it";
}

}  // namespace kel::kelform

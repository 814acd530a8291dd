#pragma once
// What a control tells the minimal form, recorded for the control tests; `on_event` plays the
// form's own code (it may change the by-reference arguments).
#include <functional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/minihost/form.h"

namespace kel::testing_support {

struct FormRecorder : mini::FormObserver {
    std::vector<std::string> events;   // "4 KeyDown KeyCode=65 Shift=0"
    std::vector<std::string> changed;  // property names as announced
    std::vector<std::string> errors;   // "NAME.part.Notification N"
    std::function<void(std::string_view, std::span<EventArg>)> on_event;

    void event_raised(mini::HostedControl&, int number, std::string_view event, std::span<EventArg> args) override {
        std::string line = std::to_string(number) + " " + std::string(event);
        for (const EventArg& a : args)
            line += " " + std::string(a.name) + "=" + std::to_string(static_cast<long long>(a.value.number()));
        events.push_back(line);
        if (on_event) on_event(event, args);
    }
    void property_changed(mini::HostedControl&, std::string_view p) override { changed.emplace_back(p); }
    void handler_error(std::string_view where, int number) override {
        errors.push_back(std::string(where) + " " + std::to_string(number));
    }
    // How many times the event named exactly `event` was raised.
    int count(std::string_view event) const {
        int n = 0;
        for (const auto& e : events) {
            const std::size_t from = e.find(' ') + 1;
            n += std::string_view(e).substr(from, e.find(' ', from) - from) == event;
        }
        return n;
    }
    bool saw(std::string_view event) const {
        for (const auto& e : events)
            if (e.find(event) != std::string::npos) return true;
        return false;
    }
};

}  // namespace kel::testing_support

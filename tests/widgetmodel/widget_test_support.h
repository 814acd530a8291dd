#pragma once
// Helpers for driving one widget directly, without a form.
#include <string>
#include <string_view>
#include <vector>

#include "keltext/widgetmodel/widget_base.h"

namespace kel::model::testing_support {

struct RecordingContext : WidgetContext {
    std::vector<std::string> errors;
    void handler_error(std::string_view part, std::string_view notification, int number) override {
        errors.push_back(std::string(part) + "." + std::string(notification) + " " + std::to_string(number));
    }
};

// Runs a small action text on an edit field: "type:ab" (key presses), "down:46" (key down),
// "press:8" (key press), "paste:xy", "sel:2,1".
inline void act(InputPart& w, std::string_view action) {
    auto colon = action.find(':');
    std::string_view verb = action.substr(0, colon);
    std::string arg(action.substr(colon + 1));
    if (verb == "type") {
        for (char c : arg) w.user_key_press(static_cast<int16_t>(static_cast<uint8_t>(c)));
    } else if (verb == "down") {
        w.user_key_down(static_cast<int16_t>(std::stoi(arg)), 0);
    } else if (verb == "press") {
        w.user_key_press(static_cast<int16_t>(std::stoi(arg)));
    } else if (verb == "paste") {
        w.user_paste(arg);
    } else if (verb == "sel") {
        auto comma = arg.find(',');
        w.user_select(std::stoi(arg.substr(0, comma)), std::stoi(arg.substr(comma + 1)));
    }
}

}  // namespace kel::model::testing_support

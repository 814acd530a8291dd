#pragma once
// The browser host's side in WebAssembly: a minimal form driven from JavaScript. Every call
// answers with one JSON reply: its value or error, and the queue of what changed since the last
// reply (texts, caret and selection, enabled, list entries, focus, the events raised), which
// the page's view (keltext/web/kelform_view.mjs) applies to the DOM. The view holds no rules:
// everything a person does goes through here, to the controls and their widgets.
//
// Text crosses as UTF-8 and is held as Windows-1252; a character the set lacks is refused
// (an error in the reply, nothing typed).
#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/host/container.h"
#include "keltext/host/members.h"
#include "keltext/host/variant.h"
#include "keltext/minihost/form.h"

namespace kel::web {

// JSON text of a value: numbers as numbers, booleans, text (UTF-8), dates as "yyyy-mm-dd",
// empty and objects as null.
std::string json_value(const Variant& v);
// A JSON string of Windows-1252 text, as UTF-8 with everything outside ASCII as \uXXXX.
std::string json_string(std::string_view cp1252);
// Text from the page (UTF-8) as the controls hold it; FormError naming the first character
// Windows-1252 lacks ("the character U+4E2D cannot be held: ...").
std::string to_cp1252(std::string_view utf8);

class WebForm final : private mini::FormObserver {
public:
    // The page's form code, run for each event a control raises, after the event has been
    // queued. It may change the by-reference arguments (KeyAscii = 0 drops the key).
    using EventHandler = std::function<void(const std::string& control, const std::string& event, std::span<EventArg> args)>;

    explicit WebForm(std::span<const ClassInfo> classes);
    ~WebForm() override;
    WebForm(const WebForm&) = delete;
    WebForm& operator=(const WebForm&) = delete;

    mini::Form& form() { return form_; }
    void set_event_handler(EventHandler handler) { handler_ = std::move(handler); }

    // Each call returns its reply: {"value":...,"error":...,"changes":[...]}.
    std::string create(std::string_view class_name, std::string_view name, float width, float height);
    std::string get(std::string_view name, std::string_view property, std::optional<int32_t> index = std::nullopt);
    std::string set(std::string_view name, std::string_view property, const Variant& value,
                    std::optional<int32_t> index = std::nullopt);
    std::string call(std::string_view name, std::string_view method, std::span<const Variant> args);
    std::string peek(std::string_view name, std::string_view part, std::string_view member,
                     std::optional<int32_t> index = std::nullopt);
    std::string poke(std::string_view name, std::string_view part, std::string_view member, const Variant& value,
                     std::optional<int32_t> index = std::nullopt);
    // Focus: "" moves it off every control. The value is "moved", "unchanged" or "refused".
    std::string focus(std::string_view name);
    std::string tab(bool forward);
    // Keystrokes to the focused control. char_code < 0: the key makes no character.
    std::string keystroke(int16_t key_code, int16_t shift, int32_t char_code);
    std::string key_down(int16_t key_code, int16_t shift);
    std::string key_press(int16_t char_code);
    std::string key_up(int16_t key_code, int16_t shift);
    std::string type(std::string_view utf8);
    std::string paste(std::string_view utf8);
    std::string select(std::string_view name, int32_t start, int32_t length);
    std::string set_insert(bool on);
    std::string click(std::string_view name, std::string_view part);
    std::string dbl_click(std::string_view name, std::string_view part);
    std::string notify(std::string_view name, std::string_view part, std::string_view notification);
    // The controls in tab order: name, class, parts (name and widget type), keyboard part.
    std::string describe();
    // What changed since the last reply; with `everything`, the whole state, as a first
    // drawing needs it.
    std::string changes(bool everything = false);

    // Runs `action` as a call: errors and changes go into the reply. For callers that drive
    // form() themselves (opening a form file).
    std::string run(const std::function<Variant()>& action);

private:
    void event_raised(mini::HostedControl& control, int number, std::string_view event,
                      std::span<EventArg> args) override;
    void keys_sent(mini::HostedControl& control, std::string_view keys) override;
    void property_changed(mini::HostedControl& control, std::string_view property) override;
    void handler_error(std::string_view where, int number) override;
    void focus_refused(mini::HostedControl& control) override;

    mini::HostedControl& control(std::string_view name);
    mini::Part& part(mini::HostedControl& control, std::string_view name);
    void watch_parts();
    void collect_state(std::string& out);

    // A member a view draws, with the JSON it was last sent as.
    struct Watched {
        mini::Part* part;
        std::string member;
        std::string head;  // the change's JSON up to its value
        bool list;         // the list's entries (List(0) .. List(ListCount - 1))
        std::optional<std::string> shown;
    };

    std::span<const ClassInfo> classes_;
    mini::Form form_;
    EventHandler handler_;
    std::vector<std::string> queue_;              // JSON objects of what happened, in order
    std::vector<Watched> watched_;
    std::size_t watched_controls_ = 0;
    std::optional<std::string> shown_focus_;
};

}  // namespace kel::web

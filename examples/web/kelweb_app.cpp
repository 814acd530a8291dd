// The pages' own functions beside the web form (keltext/web): opening a form file on it, the
// forms' code (apps/kelform/form_code.h: status messages, the date box's calendar and its rule
// on a bad date), the record F10 prints, and the script player for the page that runs the
// golden scripts. They are kelform's own code, so the browser shows the very form
// examples/voucher.kform defines, says what the terminal and desktop forms say, and prints the
// very JSON the terminal form prints.
#include <emscripten/bind.h>
#include <emscripten/val.h>

#include <nlohmann/json.hpp>

#include <cstdio>
#include <exception>
#include <functional>
#include <memory>
#include <optional>
#include <sstream>
#include <string>
#include <unordered_map>

#include "apps/kelform/demo_form.h"
#include "apps/kelform/form_code.h"
#include "apps/kelform/form_file.h"
#include "apps/kelform/record.h"
#include "apps/kelform/script_player.h"
#include "apps/kelform/text_file.h"
#include "keltext/host/charset.h"
#include "keltext/host/date.h"
#include "keltext/web/web_bindings.h"

namespace kel::web {
namespace {

using emscripten::val;

// "yyyy-mm-dd", or today on this machine's clock when it is empty or no date.
Date day_of(const std::string& iso) {
    int y = 0, m = 0, d = 0;
    if (std::sscanf(iso.c_str(), "%d-%d-%d", &y, &m, &d) == 3)
        if (const auto date = make_date(y, m, d)) return *date;
    return kelform::local_today();
}

// Runs `action` as a call of the web form, so that what it changes reaches the view; the JSON
// it returns (text in UTF-8, as the forms' code speaks it) rides in the reply's value.
std::string run_json(WebForm& web, const std::function<nlohmann::json()>& action) {
    nlohmann::json value;
    std::string reply = web.run([&]() -> Variant {
        value = action();
        return Variant();
    });
    const std::string prefix = "{\"value\":null";
    if (!value.is_null() && reply.rfind(prefix, 0) == 0)
        reply = "{\"value\":" + value.dump(-1, ' ', true) + reply.substr(prefix.size());
    return reply;
}

nlohmann::json text_or_null(const std::optional<std::string>& text) {
    return text ? nlohmann::json(*text) : nlohmann::json();
}

// A form opened from a form file and the forms' code on it. The code names controls by the
// file's labels, so the file is kept as long as the form may be asked.
struct OpenedForm {
    explicit OpenedForm(kelform::SavedForm file) : saved(std::move(file)), code(saved) {}
    kelform::SavedForm saved;
    kelform::FormCode code;
    // The control that had focus when the current input began, and its text then: leaving it
    // is judged against what was typed.
    std::string before;
    std::string typed;
};

std::unordered_map<const JsForm*, std::unique_ptr<OpenedForm>>& opened_forms() {
    static std::unordered_map<const JsForm*, std::unique_ptr<OpenedForm>> forms;
    return forms;
}

OpenedForm& opened(JsForm& js) {
    const auto it = opened_forms().find(&js);
    if (it == opened_forms().end()) throw mini::FormError("the form was not opened from a form file");
    return *it->second;
}

model::HostedControl& control(JsForm& js, const std::string& name) {
    model::HostedControl* c = js.web_form().form().find(name);
    if (!c) throw mini::FormError("no control named '" + name + "'");
    return *c;
}

// A day from the page, "yyyy-mm-dd".
Date day_from(const std::string& iso) {
    int y = 0, m = 0, d = 0;
    char rest = 0;
    if (std::sscanf(iso.c_str(), "%d-%d-%d%c", &y, &m, &d, &rest) == 3)
        if (const auto date = make_date(y, m, d)) return *date;
    throw mini::FormError("not a day (yyyy-mm-dd): '" + iso + "'");
}

// Opens the form file's text on the form. The reply's value is the layout, as JSON: title,
// and per control its name, class, label and place; or the error naming the file's line.
std::string open_form(JsForm& js, const std::string& text, const std::string& file, const std::string& today) {
    WebForm& web = js.web_form();
    return run_json(web, [&] {
        nlohmann::json layout;
        try {
            const auto& classes = js.catalogue().classes();
            kelform::SavedForm saved = kelform::parse_form(kelform::decode_text(text), file, classes);
            kelform::open_form(web.form(), saved, classes, file, day_of(today));
            layout["title"] = to_utf8(saved.title);
            layout["controls"] = nlohmann::json::array();
            for (const kelform::SavedControl& c : saved.controls) {
                nlohmann::json entry = {{"name", c.name},         {"class", c.class_name}, {"label", to_utf8(c.label)},
                                        {"row", c.row},           {"col", c.col},          {"width", c.width},
                                        {"height", c.height}};
                if (c.label_row) entry["labelRow"] = *c.label_row;
                if (c.label_col) entry["labelCol"] = *c.label_col;
                layout["controls"].push_back(entry);
            }
            opened_forms()[&js] = std::make_unique<OpenedForm>(std::move(saved));
        } catch (const kelform::FormFileError& e) {
            throw mini::FormError(e.what());
        } catch (const kelform::TextFileError& e) {
            throw mini::FormError(file + ':' + std::to_string(e.line()) + ": " + e.what());
        }
        return layout;
    });
}

// The status line's message for an event a control raised (null when the form says nothing).
std::string event_status(JsForm& js, const std::string& name, const std::string& event) {
    return run_json(js.web_form(), [&] { return text_or_null(opened(js).code.event_status(control(js, name), event)); });
}

bool opens_calendar(const std::string& event) { return kelform::FormCode::opens_calendar(event); }

std::string handler_error_status(const std::string& where, int number) {
    return kelform::FormCode::handler_error_status(where, number);
}

// The person's input begins (a key, a paste, a click): the field being edited and its text.
std::string input_start(JsForm& js) {
    return run_json(js.web_form(), [&] {
        OpenedForm& o = opened(js);
        model::HostedControl* focused = js.web_form().form().focused();
        o.before = focused ? focused->name() : std::string();
        o.typed = focused ? kelform::FormCode::edit_text(*focused) : std::string();
        return nlohmann::json();
    });
}

// The input has been delivered and `status` (UTF-8) is what the status line shows. When focus
// left a box that changed the value typed, the form says so; a date box left with a bad date
// gets focus back once. The value is the status line's new message, or null to keep it.
std::string input_end(JsForm& js, const std::string& status) {
    return run_json(js.web_form(), [&] {
        OpenedForm& o = opened(js);
        model::FormDriver& form = js.web_form().form();
        model::HostedControl* before = o.before.empty() ? nullptr : form.find(o.before);
        o.before.clear();
        if (!before) return nlohmann::json();
        std::optional<std::string> say;
        if (form.focused() != before && status.empty()) say = o.code.left_status(*before, o.typed);
        if (kelform::FormCode::keeps_focus(form, before)) {
            form.focus(before);
            say = o.code.kept_focus_status(*before, say.value_or(status));
        }
        return text_or_null(say);
    });
}

// The day the date box's calendar opens on, "yyyy-mm-dd"; `today` as open_form takes it.
std::string calendar_start(JsForm& js, const std::string& name, const std::string& today) {
    return js.web_form().run(
        [&] { return Variant(kelform::FormCode::calendar_start(control(js, name), day_of(today))); });
}

// Null when the box takes the day ("yyyy-mm-dd"); else why not.
std::string refuse_day(JsForm& js, const std::string& name, const std::string& day) {
    return run_json(js.web_form(), [&] { return text_or_null(opened(js).code.refuse_day(control(js, name), day_from(day))); });
}

std::string pick_day(JsForm& js, const std::string& name, const std::string& day) {
    WebForm& web = js.web_form();
    return web.run([&] {
        kelform::FormCode::pick_day(web.form(), control(js, name), day_from(day));
        web.form().run_pending();
        return Variant();
    });
}

std::string record_json(JsForm& js) { return kelform::record_json(js.web_form().form()); }

std::string demo_form_text() { return std::string(kelform::demo_form_text()); }

// Runs one script as `kelform play` does; {status, output}: the output is what the program
// prints on standard output and then standard error, as bytes (Windows-1252, not UTF-8).
val play(const std::string& name, const std::string& raw) {
    std::ostringstream out, err;
    int status = 0;
    try {
        const std::string text = kelform::decode_text(raw);
        Catalogue catalogue;
        kelform::Player player(catalogue.classes(), out);
        kelform::add_form_commands(player, catalogue.classes());
        status = player.run_script(text, name, err);
    } catch (const kelform::TextFileError& e) {
        err << name << ':' << e.line() << ": " << e.what() << '\n';
        status = 2;
    }
    const std::string all = out.str() + err.str();
    val result = val::object();
    result.set("status", status);
    result.set("output", val::global("Uint8Array").new_(emscripten::typed_memory_view(all.size(), reinterpret_cast<const unsigned char*>(all.data()))));
    return result;
}

}  // namespace
}  // namespace kel::web

EMSCRIPTEN_BINDINGS(kelweb_app) {
    emscripten::function("openForm", &kel::web::open_form);
    emscripten::function("eventStatus", &kel::web::event_status);
    emscripten::function("opensCalendar", &kel::web::opens_calendar);
    emscripten::function("handlerErrorStatus", &kel::web::handler_error_status);
    emscripten::function("inputStart", &kel::web::input_start);
    emscripten::function("inputEnd", &kel::web::input_end);
    emscripten::function("calendarStart", &kel::web::calendar_start);
    emscripten::function("refuseDay", &kel::web::refuse_day);
    emscripten::function("pickDay", &kel::web::pick_day);
    emscripten::function("recordJson", &kel::web::record_json);
    emscripten::function("demoFormText", &kel::web::demo_form_text);
    emscripten::function("play", &kel::web::play);
}

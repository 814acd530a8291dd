// The pages' own functions beside the web form (keltext/web): opening a form file on it, the
// record F10 prints, and the script player for the page that runs the golden scripts. They
// are kelform's own code (form files, records, scripts), so the browser shows the very form
// examples/voucher.kform defines and prints the very JSON the terminal form prints.
#include <emscripten/bind.h>
#include <emscripten/val.h>

#include <nlohmann/json.hpp>

#include <cstdio>
#include <exception>
#include <sstream>
#include <string>

#include "apps/kelform/demo_form.h"
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

// Opens the form file's text on the form. The reply's value is the layout, as JSON: title,
// and per control its name, class, label and place; or the error naming the file's line.
std::string open_form(JsForm& js, const std::string& text, const std::string& file, const std::string& today) {
    WebForm& web = js.web_form();
    nlohmann::json layout;
    std::string failure;
    std::string reply = web.run([&]() -> Variant {
        try {
            const auto& classes = js.catalogue().classes();
            const kelform::SavedForm saved = kelform::parse_form(kelform::decode_text(text), file, classes);
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
        } catch (const kelform::FormFileError& e) {
            throw mini::FormError(e.what());
        } catch (const kelform::TextFileError& e) {
            throw mini::FormError(file + ':' + std::to_string(e.line()) + ": " + e.what());
        }
        return Variant();
    });
    // The layout rides in the reply's value.
    const std::string prefix = "{\"value\":null";
    if (!layout.is_null() && reply.rfind(prefix, 0) == 0)
        reply = "{\"value\":" + layout.dump(-1, ' ', true) + reply.substr(prefix.size());
    return reply;
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
    emscripten::function("recordJson", &kel::web::record_json);
    emscripten::function("demoFormText", &kel::web::demo_form_text);
    emscripten::function("play", &kel::web::play);
}

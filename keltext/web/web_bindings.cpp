// The web form as JavaScript sees it (Embind): `new module.WebForm()` and its calls, each
// answering with the JSON reply of keltext/web/web_form.h.
#include <emscripten/bind.h>
#include <emscripten/val.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "keltext/library/catalogue.h"
#include "keltext/web/web_bindings.h"

namespace kel::web {
namespace {

using emscripten::val;

// A JavaScript value as a variant, the way a literal is typed: a whole number is 16-bit when
// it fits, else 32-bit, else a double; text must be Windows-1252 (FormError otherwise).
Variant from_js(const val& v) {
    const std::string type = v.typeOf().as<std::string>();
    if (type == "boolean") return v.as<bool>();
    if (type == "string") return to_cp1252(v.as<std::string>());
    if (type == "number") {
        const double d = v.as<double>();
        if (std::nearbyint(d) == d && d >= INT16_MIN && d <= INT16_MAX) return static_cast<int16_t>(d);
        if (std::nearbyint(d) == d && d >= INT32_MIN && d <= INT32_MAX) return static_cast<int32_t>(d);
        return d;
    }
    return Variant();
}

// The JavaScript value of an event argument, and the argument back with its own kind.
val to_js(const Variant& v) {
    if (v.kind() == VarKind::Boolean) return val(*v.get_if<bool>());
    if (v.is_number()) return val(v.number());
    return val(v.str());
}

void assign_from_js(EventArg& arg, const val& v) {
    if (!v.isNumber() && !v.isTrue() && !v.isFalse()) return;
    const double d = v.as<double>();
    if (std::isnan(d)) return;
    switch (arg.value.kind()) {
        case VarKind::Int16: arg.value = static_cast<int16_t>(std::clamp(d, -32768.0, 32767.0)); break;
        case VarKind::Int32: arg.value = static_cast<int32_t>(std::clamp(d, -2147483648.0, 2147483647.0)); break;
        case VarKind::Single: arg.value = static_cast<float>(d); break;
        case VarKind::Double: arg.value = d; break;
        case VarKind::Boolean: arg.value = v.as<bool>(); break;
        default: break;
    }
}

// An index from JavaScript; one no 32-bit number can hold becomes -1, which every list refuses
// (error 381) as it refuses any index out of range.
std::optional<int32_t> index_of(const val& index) {
    if (!index.isNumber()) return std::nullopt;
    const double d = index.as<double>();
    if (!(d >= INT32_MIN && d <= INT32_MAX)) return -1;
    return static_cast<int32_t>(d);
}

}  // namespace

JsForm::JsForm() : form_(catalogue_.classes()) {}

void JsForm::on_event(val handler) {
    if (handler.isNull() || handler.isUndefined()) {
        form_.set_event_handler({});
        return;
    }
    form_.set_event_handler([handler](const std::string& control, const std::string& event, std::span<EventArg> args) {
        val object = val::object();
        for (const EventArg& a : args) object.set(std::string(a.name), to_js(a.value));
        handler(control, event, object);
        for (EventArg& a : args) assign_from_js(a, object[std::string(a.name)]);
    });
}

std::string JsForm::create(const std::string& cls, const std::string& name, float width, float height) {
    return form_.create(cls, name, width, height);
}
std::string JsForm::get(const std::string& name, const std::string& property, val index) {
    return form_.get(name, property, index_of(index));
}
std::string JsForm::set(const std::string& name, const std::string& property, val value, val index) {
    Variant v;
    try {
        v = from_js(value);
    } catch (const mini::FormError& e) {
        const std::string message = e.what();
        return form_.run([&]() -> Variant { throw mini::FormError(message); });
    }
    return form_.set(name, property, v, index_of(index));
}
std::string JsForm::call(const std::string& name, const std::string& method, val args) {
    std::vector<Variant> values;
    try {
        const auto n = args["length"].as<unsigned>();
        for (unsigned i = 0; i < n; ++i) values.push_back(from_js(args[i]));
    } catch (const mini::FormError& e) {
        const std::string message = e.what();
        return form_.run([&]() -> Variant { throw mini::FormError(message); });
    }
    return form_.call(name, method, values);
}
std::string JsForm::peek(const std::string& name, const std::string& part, const std::string& member, val index) {
    return form_.peek(name, part, member, index_of(index));
}
std::string JsForm::poke(const std::string& name, const std::string& part, const std::string& member, val value) {
    Variant v;
    try {
        v = from_js(value);
    } catch (const mini::FormError& e) {
        const std::string message = e.what();
        return form_.run([&]() -> Variant { throw mini::FormError(message); });
    }
    return form_.poke(name, part, member, v);
}

}  // namespace kel::web

EMSCRIPTEN_BINDINGS(keltext_web) {
    using kel::web::JsForm;
    emscripten::class_<JsForm>("WebForm")
        .constructor<>()
        .function("onEvent", &JsForm::on_event)
        .function("create", &JsForm::create)
        .function("get", &JsForm::get)
        .function("set", &JsForm::set)
        .function("call", &JsForm::call)
        .function("peek", &JsForm::peek)
        .function("poke", &JsForm::poke)
        .function("focus", &JsForm::focus)
        .function("tab", &JsForm::tab)
        .function("keystroke", &JsForm::keystroke)
        .function("keyDown", &JsForm::key_down)
        .function("keyPress", &JsForm::key_press)
        .function("keyUp", &JsForm::key_up)
        .function("type", &JsForm::type)
        .function("paste", &JsForm::paste)
        .function("select", &JsForm::select)
        .function("setInsert", &JsForm::set_insert)
        .function("click", &JsForm::click)
        .function("dblClick", &JsForm::dbl_click)
        .function("notify", &JsForm::notify)
        .function("describe", &JsForm::describe)
        .function("changes", &JsForm::changes);
}

#include "keltext/web/web_form.h"

#include <cmath>
#include <cstdio>
#include <exception>

#include "keltext/host/charset.h"
#include "keltext/host/conversions.h"
#include "keltext/host/date.h"
#include "keltext/host/errors.h"
#include "keltext/widgetmodel/keyboard.h"
#include "keltext/widgetmodel/part.h"

namespace kel::web {
namespace {

// What a view draws of a part: the members read after each call and sent when they changed.
constexpr std::string_view kShownMembers[] = {"Text",    "SelStart", "SelLength", "Enabled",   "Visible",
                                              "Locked",  "MaxLength", "ListIndex", "Width",    "Height",
                                              "Left",    "Top",       "BackColor", "ForeColor", "Caption",
                                              "Value"};

bool equal_names(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        char x = a[i], y = b[i];
        if (x >= 'a' && x <= 'z') x = static_cast<char>(x - 'a' + 'A');
        if (y >= 'a' && y <= 'z') y = static_cast<char>(y - 'a' + 'A');
        if (x != y) return false;
    }
    return true;
}

}  // namespace

std::string to_cp1252(std::string_view utf8) {
    std::string out;
    for (std::size_t at = 0; at < utf8.size();) {
        const Utf8Unit u = next_utf8(utf8, at);
        const auto byte = u.code_point ? from_unicode(*u.code_point) : std::nullopt;
        if (!byte) {
            char hex[16];
            std::snprintf(hex, sizeof hex, "U+%04X", u.code_point ? static_cast<unsigned>(*u.code_point) : 0xFFFDu);
            throw mini::FormError(std::string("the character ") + hex + " cannot be held: the form's text is Windows-1252");
        }
        out += static_cast<char>(*byte);
        at += u.used;
    }
    return out;
}

namespace {

struct CallError {
    int number = 0;           // run-time error number, 0 for a misuse of the form
    std::string message;
};

}  // namespace

std::string json_string(std::string_view cp1252) {
    std::string out = "\"";
    for (unsigned char c : cp1252) {
        if (c == '"') out += "\\\"";
        else if (c == '\\') out += "\\\\";
        else if (c >= 0x20 && c < 0x7F) out += static_cast<char>(c);
        else {
            char buf[8];
            std::snprintf(buf, sizeof buf, "\\u%04X", static_cast<unsigned>(to_unicode(c)));
            out += buf;
        }
    }
    return out + "\"";
}

std::string json_value(const Variant& v) {
    switch (v.kind()) {
        case VarKind::Empty:
        case VarKind::Object: return "null";
        case VarKind::Boolean: return *v.get_if<bool>() ? "true" : "false";
        case VarKind::Byte:
        case VarKind::Int16:
        case VarKind::Int32:
        case VarKind::Single:
        case VarKind::Double: {
            const double d = v.number();
            if (!std::isfinite(d)) return "null";
            // Whole numbers (sizes, colours, carets: most of what a view reads after each call)
            // the short way; the host's number text is the costly part of a reply.
            if (d == std::trunc(d) && std::fabs(d) < 9007199254740992.0) return std::to_string(static_cast<int64_t>(d));
            return v.kind() == VarKind::Single ? plain_number_text(*v.get_if<float>()) : plain_number_text(d);
        }
        case VarKind::Date: {
            const Ymd d = to_ymd(*v.get_if<Date>());
            char buf[40];
            std::snprintf(buf, sizeof buf, "\"%04d-%02d-%02d\"", d.year, d.month, d.day);
            return buf;
        }
        case VarKind::String: return json_string(v.str());
    }
    return "null";
}

WebForm::WebForm(std::span<const ClassInfo> classes) : classes_(classes), form_(this) {}
WebForm::~WebForm() { form_.set_observer(nullptr); }

mini::HostedControl& WebForm::control(std::string_view name) {
    mini::HostedControl* c = form_.find(name);
    if (!c) throw mini::FormError("no control named '" + std::string(name) + "'");
    return *c;
}

mini::Part& WebForm::part(mini::HostedControl& c, std::string_view name) {
    mini::Part* p = c.part(name);
    if (!p) throw mini::FormError(c.name() + " has no part '" + std::string(name) + "'");
    return *p;
}

std::string WebForm::run(const std::function<Variant()>& action) {
    Variant value;
    std::optional<CallError> error;
    try {
        value = action();
    } catch (const RuntimeError& e) {
        error = CallError{e.number(), e.what()};
    } catch (const mini::FormError& e) {
        error = CallError{0, e.what()};
    } catch (const model::SendKeysError& e) {
        error = CallError{0, e.what()};
    }
    std::string reply = "{\"value\":" + json_value(value) + ",\"error\":";
    if (error) {
        reply += "{\"number\":" + std::to_string(error->number) + ",\"message\":" + json_string(error->message) + "}";
    } else {
        reply += "null";
    }
    reply += ",\"changes\":";
    collect_state(reply);
    return reply + "}";
}

std::string WebForm::changes(bool everything) {
    if (everything) {
        for (Watched& w : watched_) w.shown.reset();
        shown_focus_.reset();
    }
    return run([] { return Variant(); });
}

void WebForm::watch_parts() {
    const std::vector<mini::HostedControl*> controls = form_.controls();
    if (controls.size() == watched_controls_) return;
    // Controls are only ever added: the members already watched keep what they last sent.
    for (std::size_t i = watched_controls_; i < controls.size(); ++i) {
        mini::HostedControl* c = controls[i];
        std::vector<std::pair<std::string, mini::Part*>> parts = c->parts();
        parts.emplace_back("surface", &c->surface_part());
        for (const auto& [part_name, p] : parts) {
            const std::string head = "{\"t\":\"state\",\"c\":" + json_string(c->name()) + ",\"p\":" +
                                     json_string(part_name) + ",\"m\":";
            for (std::string_view wanted : kShownMembers)
                if (const auto member = model::find_member(*p, wanted))
                    watched_.push_back({p, *member, head + json_string(*member) + ",\"v\":", false, std::nullopt});
            if (model::find_member(*p, "ListCount"))
                watched_.push_back({p, "List", head + "\"List\",\"v\":", true, std::nullopt});
        }
    }
    watched_controls_ = controls.size();
}

void WebForm::collect_state(std::string& out) {
    out += '[';
    bool first = true;
    auto add = [&](std::string_view item) {
        if (!first) out += ',';
        first = false;
        out += item;
    };
    for (const std::string& item : queue_) add(item);
    queue_.clear();
    watch_parts();
    std::string value;
    for (Watched& w : watched_) {
        try {
            if (w.list) {
                value = "[";
                const auto count = static_cast<int32_t>(w.part->peek("ListCount").number());
                for (int32_t i = 0; i < count; ++i) {
                    if (i) value += ',';
                    value += json_value(w.part->peek("List", i));
                }
                value += ']';
            } else {
                value = json_value(w.part->peek(w.member));
            }
        } catch (const RuntimeError&) {
            continue;
        }
        if (w.shown == value) continue;
        w.shown = value;
        add(w.head + value + "}");
    }
    mini::HostedControl* focused = form_.focused();
    const std::string focus = focused ? focused->name() : std::string();
    if (shown_focus_ != focus) {
        shown_focus_ = focus;
        add("{\"t\":\"focus\",\"c\":" + (focused ? json_string(focus) : std::string("null")) + "}");
    }
    out += ']';
}

void WebForm::event_raised(mini::HostedControl& c, int /*number*/, std::string_view event, std::span<EventArg> args) {
    std::string item = "{\"t\":\"event\",\"c\":" + json_string(c.name()) + ",\"e\":" + json_string(event) + ",\"a\":{";
    for (std::size_t i = 0; i < args.size(); ++i) {
        if (i) item += ',';
        item += json_string(args[i].name) + ':' + json_value(args[i].value);
    }
    queue_.push_back(item + "}}");
    if (handler_) handler_(c.name(), std::string(event), args);
}

void WebForm::keys_sent(mini::HostedControl& c, std::string_view keys) {
    queue_.push_back("{\"t\":\"sendkeys\",\"c\":" + json_string(c.name()) + ",\"keys\":" + json_string(keys) + "}");
}

void WebForm::property_changed(mini::HostedControl& c, std::string_view property) {
    queue_.push_back("{\"t\":\"changed\",\"c\":" + json_string(c.name()) + ",\"p\":" + json_string(property) + "}");
}

void WebForm::handler_error(std::string_view where, int number) {
    queue_.push_back("{\"t\":\"error\",\"where\":" + json_string(where) + ",\"number\":" + std::to_string(number) + "}");
}

void WebForm::focus_refused(mini::HostedControl& c) {
    queue_.push_back("{\"t\":\"refused\",\"c\":" + json_string(c.name()) + "}");
}

std::string WebForm::create(std::string_view class_name, std::string_view name, float width, float height) {
    return run([&] {
        for (const ClassInfo& cls : classes_)
            if (equal_names(cls.name, class_name) && !cls.is_page) {
                form_.create(cls, std::string(name), width, height);
                return Variant();
            }
        throw mini::FormError("no control class '" + std::string(class_name) + "'");
    });
}

std::string WebForm::get(std::string_view name, std::string_view property, std::optional<int32_t> index) {
    return run([&] {
        const Variant i = index ? Variant(*index) : Variant();
        return control(name).dispatch().get(property, index ? &i : nullptr);
    });
}

std::string WebForm::set(std::string_view name, std::string_view property, const Variant& value,
                         std::optional<int32_t> index) {
    return run([&] {
        const Variant i = index ? Variant(*index) : Variant();
        control(name).dispatch().set(property, value, index ? &i : nullptr);
        form_.run_pending();
        return Variant();
    });
}

std::string WebForm::call(std::string_view name, std::string_view method, std::span<const Variant> args) {
    return run([&] {
        Variant v = control(name).dispatch().call(method, args);
        form_.run_pending();
        return v;
    });
}

std::string WebForm::peek(std::string_view name, std::string_view p, std::string_view member,
                          std::optional<int32_t> index) {
    return run([&] { return part(control(name), p).peek(member, index); });
}

std::string WebForm::poke(std::string_view name, std::string_view p, std::string_view member, const Variant& value,
                          std::optional<int32_t> index) {
    return run([&] {
        part(control(name), p).poke(member, value, index);
        form_.run_pending();
        return Variant();
    });
}

std::string WebForm::focus(std::string_view name) {
    return run([&] {
        switch (form_.focus(name.empty() ? nullptr : &control(name))) {
            case mini::Form::FocusResult::moved: return Variant("moved");
            case mini::Form::FocusResult::unchanged: return Variant("unchanged");
            case mini::Form::FocusResult::refused: break;
        }
        return Variant("refused");
    });
}

std::string WebForm::tab(bool forward) {
    return run([&] {
        form_.tab(forward);
        return Variant();
    });
}

std::string WebForm::keystroke(int16_t key_code, int16_t shift, int32_t char_code) {
    return run([&] {
        mini::Keystroke k{key_code, shift, std::nullopt};
        if (char_code >= 0 && char_code <= 255) k.char_code = static_cast<int16_t>(char_code);
        form_.keystroke(k);
        return Variant();
    });
}

std::string WebForm::key_down(int16_t key_code, int16_t shift) {
    return run([&] {
        form_.key_down(key_code, shift);
        form_.run_pending();
        return Variant();
    });
}

std::string WebForm::key_press(int16_t char_code) {
    return run([&] {
        form_.key_press(char_code);
        form_.run_pending();
        return Variant();
    });
}

std::string WebForm::key_up(int16_t key_code, int16_t shift) {
    return run([&] {
        form_.key_up(key_code, shift);
        form_.run_pending();
        return Variant();
    });
}

std::string WebForm::type(std::string_view utf8) {
    return run([&] {
        form_.type(to_cp1252(utf8));
        return Variant();
    });
}

std::string WebForm::paste(std::string_view utf8) {
    return run([&] {
        form_.paste(to_cp1252(utf8));
        return Variant();
    });
}

std::string WebForm::select(std::string_view name, int32_t start, int32_t length) {
    return run([&] {
        form_.select(control(name), start, length);
        return Variant();
    });
}

std::string WebForm::set_insert(bool on) {
    return run([&] {
        form_.set_insert(on);
        return Variant();
    });
}

std::string WebForm::click(std::string_view name, std::string_view p) {
    return run([&] {
        mini::HostedControl& c = control(name);
        form_.click(c, part(c, p));
        form_.run_pending();
        return Variant();
    });
}

std::string WebForm::dbl_click(std::string_view name, std::string_view p) {
    return run([&] {
        mini::HostedControl& c = control(name);
        form_.dbl_click(c, part(c, p));
        form_.run_pending();
        return Variant();
    });
}

std::string WebForm::notify(std::string_view name, std::string_view p, std::string_view notification) {
    return run([&] {
        mini::HostedControl& c = control(name);
        form_.notify(c, part(c, p), notification);
        form_.run_pending();
        return Variant();
    });
}

std::string WebForm::describe() {
    std::string out = "[";
    bool first = true;
    for (mini::HostedControl* c : form_.controls()) {
        if (!first) out += ',';
        first = false;
        out += "{\"name\":" + json_string(c->name()) + ",\"class\":" + json_string(c->info().name) + ",\"keyboard\":";
        std::string keyboard = "null";
        out += ",\"parts\":[";
        bool first_part = true;
        for (const auto& [part_name, p] : c->parts()) {
            if (p == c->keyboard_part()) keyboard = json_string(part_name);
            if (!first_part) out += ',';
            first_part = false;
            out += "{\"name\":" + json_string(part_name) + ",\"type\":" + json_string(p->widget_type()) + "}";
        }
        out += "]}";
        out.insert(out.rfind(",\"parts\":["), keyboard);
    }
    return out + "]";
}

}  // namespace kel::web

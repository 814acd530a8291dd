#include "apps/kelform/record.h"

#include <cmath>
#include <optional>
#include <set>

#include <nlohmann/json.hpp>

#include "keltext/host/charset.h"
#include "keltext/host/conversions.h"
#include "keltext/host/date_recognizer.h"
#include "keltext/host/errors.h"
#include "keltext/host/members.h"
#include "keltext/widgetmodel/part.h"

namespace kel::kelform {
namespace {

using Json = nlohmann::ordered_json;

// How a control's value is kept in a record.
enum class Field { text, number, date, month_year };

Field field_of(mini::HostedControl& c) {
    const std::string& cls = c.info().name;
    if (same_name(cls, "KelNumeric")) return Field::number;
    if (same_name(cls, "KelDateMask")) {
        try {
            return c.dispatch().get("DateStyle").number() == 1 ? Field::month_year : Field::date;
        } catch (const RuntimeError&) {
            return Field::date;
        }
    }
    return Field::text;
}

Variant text_of_control(mini::HostedControl& c) {
    try {
        return c.dispatch().get("Text");
    } catch (const RuntimeError&) {
        return Variant();
    }
}

// What the control holds, as a record value: null when the person left it blank.
Json value_of(mini::HostedControl& c) {
    const Field field = field_of(c);
    if (field == Field::number) {
        // The box's Text reads 0 when it is empty: the edit text tells blank from zero.
        const model::Part* edit = c.keyboard_part();
        if (edit && edit->peek("Text").str().empty()) return nullptr;
        const double v = text_of_control(c).number();
        if (!std::isfinite(v)) return nullptr;
        // Whole amounts are written as integers (2500, not 2500.0), as the box shows them.
        if (v == std::trunc(v) && std::fabs(v) < 9007199254740992.0) return static_cast<int64_t>(v);
        return v;
    }
    const Variant t = text_of_control(c);
    if (!t.is_string()) return nullptr;
    const std::string& s = t.str();
    if (field == Field::month_year) {
        // Every input position blank: the separator alone is no value.
        if (s.find_first_not_of(" /") == std::string::npos) return nullptr;
    } else if (s.empty()) {
        return nullptr;
    }
    return to_utf8(s);
}

std::string shown(const Json& v) { return v.dump(); }

[[noreturn]] void fail(const std::string& file, const std::string& control, const std::string& message) {
    throw RecordError(file + ": " + control + ": " + message);
}

// The record's text in the controls' character set, or an error naming what cannot be held.
std::string cp1252_of(const std::string& utf8, const std::string& file, const std::string& control) {
    std::string text = from_utf8(utf8);
    if (to_utf8(text) != utf8)
        fail(file, control, Json(utf8).dump() + " holds characters that Windows-1252 cannot hold");
    return text;
}

// True when the value read back is the value the record gave.
bool kept(Field field, const Json& given, const Json& read) {
    if (read.is_null()) return false;
    if (field == Field::number) return read.get<double>() == given.get<double>();
    const std::string a = given.get<std::string>();
    const std::string b = read.get<std::string>();
    if (field == Field::date) {
        // The box writes a date its own way (5/8/2026 comes back as 05/08/2026): same date.
        const auto da = recognize_date_text(from_utf8(a));
        const auto db = recognize_date_text(from_utf8(b));
        return da && db && *da == *db;
    }
    return a == b;
}

}  // namespace

std::string record_json(mini::FormDriver& form) {
    Json out = Json::object();
    for (mini::HostedControl* c : form.controls()) out[c->name()] = value_of(*c);
    return out.dump(2);
}

void load_record(mini::FormDriver& form, std::string_view json_text, const std::string& file) {
    // Keys are checked as they are parsed: a key twice is an error, not "the last one wins".
    std::set<std::string> seen;
    std::optional<std::string> twice;
    const Json::parser_callback_t check = [&](int depth, Json::parse_event_t event, Json& parsed) {
        if (event == Json::parse_event_t::key && depth == 1 && !seen.insert(upper_case(parsed.get<std::string>())).second)
            twice = parsed.get<std::string>();
        return true;
    };
    Json record;
    try {
        record = Json::parse(json_text.begin(), json_text.end(), check);
    } catch (const Json::parse_error& e) {
        // The library's message without its "[json.exception.parse_error.101] " tag.
        std::string what = e.what();
        if (const auto p = what.find("] "); p != std::string::npos) what.erase(0, p + 2);
        throw RecordError(file + ": " + what);
    }
    if (twice) fail(file, *twice, "given twice");
    if (!record.is_object()) throw RecordError(file + ": a record is a JSON object, one member per control");
    for (const auto& [name, value] : record.items())
        if (!form.find(name)) fail(file, name, "the form has no such control");

    for (mini::HostedControl* c : form.controls()) {
        const Json* given = nullptr;
        for (const auto& [name, value] : record.items())
            if (same_name(name, c->name())) given = &value;
        if (!given || given->is_null()) continue;
        const Field field = field_of(*c);
        Variant v;
        if (field == Field::number) {
            if (!given->is_number()) fail(file, c->name(), shown(*given) + " is not a number");
            v = Variant(given->get<double>());
        } else {
            if (!given->is_string()) fail(file, c->name(), shown(*given) + " is not a text");
            v = Variant(cp1252_of(given->get<std::string>(), file, c->name()));
        }
        try {
            c->dispatch().set("Text", v);
        } catch (const RuntimeError& e) {
            fail(file, c->name(), shown(*given) + " is refused (error " + std::to_string(e.number()) + ")");
        }
        // Entered and left, as after typing: the box formats, completes and clamps its value.
        if (c->can_take_focus()) {
            form.focus(c);
            form.focus(nullptr);
        }
        const Json read = value_of(*c);
        if (!kept(field, *given, read))
            fail(file, c->name(), shown(*given) + " is not kept: the control holds " + shown(read));
    }
}

}  // namespace kel::kelform

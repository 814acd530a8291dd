// The four controls (and the combo's property page) driven through the minimal host's form
// by a byte stream: keystrokes, raw key notifications, pastes, selections, the Insert toggle,
// focus moves and Tab, clicks, notifications (spin presses, drop-downs), mouse input,
// resizes, property sets and gets with values of every kind, method calls, member pokes,
// design and run mode, save and load. The form's own code answers events by changing their
// arguments, wrong kinds included.
//
// After every step: the caret and the selection of every edit field lie inside its text.
// Every save followed by a load of what was saved saves the same values again.
// The only exceptions that may reach the driver are the host's numbered run-time errors and
// the form's own FormError for a request it cannot deliver.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdint>
#include <limits>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "fuzz/fuzz_check.h"
#include "keltext/host/conversions.h"
#include "keltext/host/date.h"
#include "keltext/host/font.h"
#include "keltext/host/variant.h"
#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/keyboard.h"
#include "keltext/widgetmodel/part.h"

namespace {

using kel::Variant;
using kel::mini::Form;
using kel::mini::HostedControl;
using kel::model::Part;

constexpr const char* kControlClasses[] = {"KelAlphaNumeric", "KelNumeric", "KelDateMask", "KelCombo"};
constexpr size_t kMaxControls = 8;
constexpr int kMaxSteps = 300;

// Texts that mean something to one control or another.
constexpr const char* kTexts[] = {
    "", "0", "-1", "12", "1234.5", "12,34,567.50", "1E308", "-1E308", "1e-320", "&H7FFFFFFF", "&HFFFFFFFFFF",
    "31/12/2003", "29/02/2001", "00/00/0000", "  /  /    ", "__/__/____", "12/2003", "abc", "Title Case",
    "\xC8", "\xC9", "A\xC9" "1\xC8" "B\xC9" "2\xC8", "True", "false", " ", "9999999999999999999999", ".", "-",
    "{TAB}", "+{TAB}", "{DEL}", "##/##/####", "&&&", "\x01\x7F\xFF",
};

constexpr const char* kKeyNames[] = {
    "Backspace", "Tab", "Enter", "Escape", "Space", "PageUp", "PageDown", "End", "Home", "Left", "Up",
    "Right", "Down", "Insert", "Delete", "F1", "F4", "F12", "NumLock",
};
constexpr const char* kPrefixes[] = {"", "Shift+", "Ctrl+", "Alt+", "Ctrl+Shift+"};

double any_double(FuzzedDataProvider& in) {
    switch (in.ConsumeIntegralInRange<int>(0, 9)) {
        case 0: return std::numeric_limits<double>::quiet_NaN();
        case 1: return std::numeric_limits<double>::infinity();
        case 2: return -std::numeric_limits<double>::infinity();
        case 3: return -0.0;
        case 4: return 2.5;
        case 5: return 1e300;
        case 6: return static_cast<double>(in.ConsumeIntegral<int32_t>());
        case 7: return in.ConsumeIntegralInRange<int>(-100000, 100000) / 100.0;
        default: return in.ConsumeFloatingPoint<double>();
    }
}

std::string any_text(FuzzedDataProvider& in) {
    if (in.ConsumeBool()) return kTexts[in.ConsumeIntegralInRange<size_t>(0, std::size(kTexts) - 1)];
    return in.ConsumeRandomLengthString(24);
}

// A value of any kind the host knows.
Variant any_value(FuzzedDataProvider& in) {
    switch (in.ConsumeIntegralInRange<int>(0, 12)) {
        case 0: return Variant();
        case 1: return Variant(in.ConsumeBool());
        case 2: return Variant(in.ConsumeIntegral<uint8_t>());
        case 3: return Variant(in.ConsumeIntegral<int16_t>());
        case 4: return Variant(static_cast<int16_t>(in.ConsumeIntegralInRange<int>(-3, 12)));
        case 5: return Variant(in.ConsumeIntegral<int32_t>());
        case 6: return Variant(static_cast<float>(any_double(in)));
        case 7: return Variant(any_double(in));
        case 8: return Variant(kel::Date{in.ConsumeIntegralInRange<int32_t>(-700000, 3000000)});
        case 9: {
            auto font = std::make_shared<kel::Font>(in.ConsumeRandomLengthString(12), any_double(in), in.ConsumeBool(),
                                                    in.ConsumeBool());
            return Variant(font);
        }
        case 10: return Variant(std::make_shared<kel::Object>());
        default: return Variant(any_text(in));
    }
}

// Values compare as saved values: fonts by what they describe, NaN equal to NaN.
bool same_saved(const Variant& a, const Variant& b) {
    if (a.kind() != b.kind()) return false;
    if (a.is_object()) {
        const auto fa = kel::font_of(a), fb = kel::font_of(b);
        if (fa && fb) return fa->same_as(*fb) || (std::isnan(fa->size) && std::isnan(fb->size) &&
                                                   fa->name == fb->name && fa->bold == fb->bold &&
                                                   fa->italic == fb->italic);
        return fa == fb && a == b;
    }
    if (a.is_number() && std::isnan(a.number()) && std::isnan(b.number())) return true;
    return a == b;
}

bool same_store(const kel::mini::StoredValues& a, const kel::mini::StoredValues& b) {
    if (a.size() != b.size()) return false;
    for (size_t i = 0; i < a.size(); ++i)
        if (!kel::same_name(a[i].first, b[i].first) || !same_saved(a[i].second, b[i].second)) return false;
    return true;
}

// The form's code: answers some events by setting one of their arguments to any value.
class FormCode final : public kel::mini::FormObserver {
public:
    explicit FormCode(FuzzedDataProvider& in) : in_(in) {}
    void event_raised(HostedControl&, int, std::string_view, std::span<kel::EventArg> args) override {
        if (args.empty() || in_.remaining_bytes() == 0) return;
        const uint8_t choice = in_.ConsumeIntegral<uint8_t>();
        if (choice % 4 != 0) return;
        kel::EventArg& arg = args[choice / 4 % args.size()];
        // Mostly a value of the argument's own kind, sometimes anything.
        if (choice & 0x80) arg.value = any_value(in_);
        else if (arg.value.holds<int16_t>()) arg.value = Variant(in_.ConsumeIntegral<int16_t>());
        else if (arg.value.holds<float>()) arg.value = Variant(static_cast<float>(any_double(in_)));
        else arg.value = Variant();
    }

private:
    FuzzedDataProvider& in_;
};

struct Driver {
    Driver(FuzzedDataProvider& data, const kel::Catalogue& classes) : in(data), catalogue(classes) {}

    FuzzedDataProvider& in;
    const kel::Catalogue& catalogue;
    FormCode code{in};
    Form form{&code};
    std::vector<HostedControl*> controls;  // pages too
    int names = 0;

    HostedControl* pick() {
        if (controls.empty()) return nullptr;
        return controls[in.ConsumeIntegralInRange<size_t>(0, controls.size() - 1)];
    }
    HostedControl* pick_control() {  // not a page
        HostedControl* c = pick();
        return c && !c->info().is_page ? c : nullptr;
    }
    Part* pick_part(HostedControl& c) {
        auto parts = c.parts();
        const size_t i = in.ConsumeIntegralInRange<size_t>(0, parts.size());
        return i == parts.size() ? &c.surface_part() : parts[i].second;
    }
    std::string fresh_name() { return "c" + std::to_string(names++); }

    void create() {
        if (controls.size() >= kMaxControls) return;
        const char* cls = kControlClasses[in.ConsumeIntegralInRange<size_t>(0, std::size(kControlClasses) - 1)];
        const float w = static_cast<float>(in.ConsumeIntegralInRange<int>(0, 5000));
        controls.push_back(&form.create(*catalogue.find(cls), fresh_name(), w, 300));
    }

    // Load from any store: keys of the class's properties (and others), values of any kind.
    void load_any() {
        if (controls.size() >= kMaxControls) return;
        const kel::ClassInfo& cls =
            *catalogue.find(kControlClasses[in.ConsumeIntegralInRange<size_t>(0, std::size(kControlClasses) - 1)]);
        kel::mini::StoredValues store;
        const int n = in.ConsumeIntegralInRange<int>(0, 6);
        for (int i = 0; i < n; ++i) {
            std::string key = in.ConsumeBool() && !cls.properties.empty()
                                  ? cls.properties[in.ConsumeIntegralInRange<size_t>(0, cls.properties.size() - 1)].name
                                  : in.ConsumeRandomLengthString(10);
            store.emplace_back(std::move(key), any_value(in));
        }
        controls.push_back(&form.load(cls, fresh_name(), store));
    }

    // Save, load what was saved into a new control, save that: the same values.
    void save_load() {
        HostedControl* c = pick_control();
        if (!c || controls.size() >= kMaxControls) return;
        const kel::mini::StoredValues first = form.save(*c);
        HostedControl& copy = form.load(c->info(), fresh_name(), first);
        controls.push_back(&copy);
        const kel::mini::StoredValues again = form.save(copy);
        if (!same_store(first, again)) {
            for (const auto& [k, v] : first) std::fprintf(stderr, "  first  %s kind %d\n", k.c_str(), int(v.kind()));
            for (const auto& [k, v] : again) std::fprintf(stderr, "  again  %s kind %d\n", k.c_str(), int(v.kind()));
        }
        KEL_FUZZ_CHECK(same_store(first, again));
    }

    void open_page() {
        if (controls.size() >= kMaxControls) return;
        std::vector<HostedControl*> combos;
        for (HostedControl* c : controls)
            if (kel::same_name(c->info().name, "KelCombo")) combos.push_back(c);
        if (combos.empty()) return;
        const kel::ClassInfo* page = catalogue.find("pagCombo");
        if (!page) return;
        const size_t first = in.ConsumeIntegralInRange<size_t>(0, combos.size() - 1);
        std::rotate(combos.begin(), combos.begin() + static_cast<std::ptrdiff_t>(first), combos.end());
        controls.push_back(&form.open_page(*page, fresh_name(), combos));
    }

    void set_property(bool get_only) {
        HostedControl* c = pick();
        if (!c || c->info().properties.empty()) return;
        const auto& props = c->info().properties;
        const kel::PropertyInfo& p = props[in.ConsumeIntegralInRange<size_t>(0, props.size() - 1)];
        Variant index;
        const bool indexed = p.indexed || in.ConsumeIntegralInRange<int>(0, 15) == 0;
        if (indexed) index = in.ConsumeBool() ? Variant(static_cast<int16_t>(in.ConsumeIntegralInRange<int>(-2, 25)))
                                              : any_value(in);
        if (get_only) (void)c->dispatch().get(p.name, indexed ? &index : nullptr);
        else c->dispatch().set(p.name, any_value(in), indexed ? &index : nullptr);
    }

    void call_method() {
        HostedControl* c = pick();
        if (!c || c->info().methods.empty()) return;
        const auto& methods = c->info().methods;
        const kel::MethodInfo& m = methods[in.ConsumeIntegralInRange<size_t>(0, methods.size() - 1)];
        std::vector<Variant> args;
        const size_t n = in.ConsumeIntegralInRange<size_t>(0, m.args.size() + 1);
        for (size_t i = 0; i < n; ++i) args.push_back(any_value(in));
        (void)c->dispatch().call(m.name, args);
    }

    void poke_or_peek(bool peek_only) {
        HostedControl* c = pick();
        if (!c) return;
        Part* part = pick_part(*c);
        const auto members = part->members();
        if (members.empty()) return;
        const std::string& m = members[in.ConsumeIntegralInRange<size_t>(0, members.size() - 1)];
        std::optional<int32_t> index;
        if (in.ConsumeBool()) index = in.ConsumeIntegralInRange<int32_t>(-2, 25);
        if (peek_only) (void)part->peek(m, index);
        else part->poke(m, any_value(in), index);
    }

    void keystroke() {
        if (!form.focused()) return;
        switch (in.ConsumeIntegralInRange<int>(0, 5)) {
            case 0:
            case 1: {
                // Typed text: characters a person types, a few at a time.
                const std::string text = any_text(in);
                for (char ch : text) form.keystroke(kel::model::keystroke_for_char(static_cast<uint8_t>(ch)));
                break;
            }
            case 2: {
                const std::string name = std::string(kPrefixes[in.ConsumeIntegralInRange<size_t>(0, std::size(kPrefixes) - 1)]) +
                                         kKeyNames[in.ConsumeIntegralInRange<size_t>(0, std::size(kKeyNames) - 1)];
                if (auto k = kel::model::parse_key(name)) form.keystroke(*k);
                break;
            }
            case 3: form.key_down(in.ConsumeIntegral<int16_t>(), in.ConsumeIntegralInRange<int16_t>(0, 7)); break;
            case 4: form.key_press(in.ConsumeIntegral<int16_t>()); break;
            default: form.key_up(in.ConsumeIntegral<int16_t>(), in.ConsumeIntegralInRange<int16_t>(0, 7)); break;
        }
    }

    void step() {
        switch (in.ConsumeIntegralInRange<int>(0, 21)) {
            case 0: create(); break;
            case 1: load_any(); break;
            case 2: save_load(); break;
            case 3: open_page(); break;
            case 4:
                if (HostedControl* c = pick(); c && c->info().is_page) form.apply_page(*c);
                break;
            case 5: case 6: set_property(false); break;
            case 7: set_property(true); break;
            case 8: call_method(); break;
            case 9: poke_or_peek(false); break;
            case 10: poke_or_peek(true); break;
            case 11: case 12: case 13: keystroke(); break;
            case 14:
                if (form.focused()) form.paste(any_text(in));
                break;
            case 15:
                if (HostedControl* c = pick_control())
                    form.select(*c, in.ConsumeIntegralInRange<int32_t>(-2, 40), in.ConsumeIntegralInRange<int32_t>(-2, 40));
                break;
            case 16: form.set_insert(in.ConsumeBool()); break;
            case 17: {
                const auto how = in.ConsumeIntegralInRange<int>(0, 3);
                if (how == 0) form.focus(nullptr);
                else if (how == 1) form.tab(in.ConsumeBool());
                else form.focus(pick_control());
                break;
            }
            case 18: {
                HostedControl* c = pick();
                if (!c) break;
                Part* part = pick_part(*c);
                const auto what = in.ConsumeIntegralInRange<int>(0, 3);
                if (what == 0) form.click(*c, *part);
                else if (what == 1) form.dbl_click(*c, *part);
                else if (what == 2) {
                    const auto notes = part->notifications();
                    if (!notes.empty()) form.notify(*c, *part, notes[in.ConsumeIntegralInRange<size_t>(0, notes.size() - 1)]);
                } else {
                    form.mouse(*c, *part, in.ConsumeBool(), in.ConsumeIntegral<int16_t>(), in.ConsumeIntegral<int16_t>(),
                               static_cast<float>(any_double(in)), static_cast<float>(any_double(in)));
                }
                break;
            }
            case 19:
                if (HostedControl* c = pick_control())
                    form.resize(*c, static_cast<float>(any_double(in)), static_cast<float>(any_double(in)));
                break;
            case 20: form.set_user_mode(in.ConsumeBool()); break;
            default: form.run_pending(); break;
        }
    }

    // Caret and selection of an edit field inside its text.
    static void check_edit_field(const Part& part) {
        const auto type = part.widget_type();
        if (type != "EditBox" && type != "ComboBox" && type != "MaskedEdit") return;
        const Variant text = part.peek("Text");
        const Variant start = part.peek("SelStart");
        const Variant length = part.peek("SelLength");
        KEL_FUZZ_CHECK(text.is_string() && start.holds<int32_t>() && length.holds<int32_t>());
        const auto size = static_cast<double>(text.str().size());
        KEL_FUZZ_CHECK(start.number() >= 0 && start.number() <= size);
        KEL_FUZZ_CHECK(length.number() >= 0 && start.number() + length.number() <= size);
    }

    // The focused field after every step (that is where typing lands); every field of every
    // control and page now and then, and at the end.
    void check_edit_fields(bool all) {
        if (!all) {
            if (HostedControl* c = form.focused())
                if (Part* p = c->keyboard_part()) check_edit_field(*p);
            return;
        }
        for (HostedControl* c : controls)
            for (auto& [name, part] : c->parts()) check_edit_field(*part);
    }
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    // The class tables are constant: built once, not for every input.
    static const kel::Catalogue catalogue;
    FuzzedDataProvider in(data, size);
    Driver d(in, catalogue);
    // Start with one control of the class the first byte names, focused.
    d.create();
    d.form.focus(d.controls.front());
    for (int steps = 0; steps < kMaxSteps && in.remaining_bytes() > 0; ++steps) {
        try {
            d.step();
        } catch (const kel::RuntimeError& e) {
            KEL_FUZZ_CHECK(kel::fuzz::known_error(e));
        } catch (const kel::mini::FormError&) {
            // A request the form cannot deliver (a notification a part does not raise).
        }
        d.check_edit_fields(steps % 16 == 15);
    }
    d.check_edit_fields(true);
    return 0;
}

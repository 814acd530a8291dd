#pragma once
// A small control used only by the player's tests, so that they do not depend on the
// behaviour of the library's own controls: an edit box "txtTest" that raises its key,
// change and click notifications as events, a checked 16-bit property, a read-only one,
// an indexed list, methods, persistence and a send-keys rule.
#include <array>
#include <string>
#include <vector>

#include "keltext/host/container.h"
#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/members.h"

namespace kel::testing {

class TestBox : public Control {
public:
    explicit TestBox(Site& site) : site_(site), edit_(site.create_edit_box("txtTest")) {
        WidgetEvents ev;
        ev.key_down = [this](int16_t& k, int16_t& s) { raise_key(1, "KeyDown", k, s); };
        ev.key_up = [this](int16_t& k, int16_t& s) { raise_key(2, "KeyUp", k, s); };
        ev.key_press = [this](int16_t& a) {
            std::array<EventArg, 1> args{{{"KeyAscii", Variant(a)}}};
            site_.raise_event(3, "KeyPress", args);
            a = to_int16(args[0].value);
            if (a == '!') {
                a = 0;
                site_.keyboard().send_keys("{END}");
            }
        };
        ev.change = [this] { site_.raise_event(4, "Change", {}); };
        ev.click = [this] {
            if (number_ == 13) raise_error(kTypeMismatch);  // a handler that fails on purpose
            site_.raise_event(5, "Click", {});
        };
        edit_.set_events(std::move(ev));
    }

    void InitProperties() override { number_ = 1; }
    void ReadProperties(PropertyBag& bag) override {
        number_ = to_int16(bag.read("Number", Variant(int16_t{1})));
        edit_.Text(text_of(bag.read("Text", Variant(""))));
    }
    void WriteProperties(PropertyBag& bag) override {
        bag.write("Number", Variant(number_), Variant(int16_t{1}));
        bag.write("Text", Variant(edit_.Text()), Variant(""));
    }

    Variant Text() const { return Variant(edit_.Text()); }
    void Text(const Variant& v) {
        edit_.Text(text_of(v));
        site_.property_changed("Text");
    }
    int16_t Number() const { return number_; }
    void Number(const Variant& v) {
        int16_t n = to_int16(v);
        if (n < 0) raise_error(kInvalidPropertyValue);
        number_ = n;
        site_.property_changed("Number");
    }
    void Locked(bool v) { site_.surface().Enabled(!v); }
    bool Locked() const { return !site_.surface().Enabled(); }
    int32_t hWnd() const { return site_.surface().hWnd(); }
    std::string List(const Variant& i) const { return items_.at(index(i)); }
    void List(const Variant& i, const Variant& v) { items_.at(index(i)) = text_of(v); }
    void AddItem(const Variant& item) { items_.push_back(text_of(item)); }
    void Clear() { items_.clear(); }

private:
    std::size_t index(const Variant& i) const {
        int32_t n = to_int32(i);
        if (n < 0 || static_cast<std::size_t>(n) >= items_.size()) raise_error(kInvalidPropertyIndex);
        return static_cast<std::size_t>(n);
    }
    void raise_key(int number, const char* name, int16_t& k, int16_t& s) {
        std::array<EventArg, 2> args{{{"KeyCode", Variant(k)}, {"Shift", Variant(s)}}};
        site_.raise_event(number, name, args);
        k = to_int16(args[0].value);
        s = to_int16(args[1].value);
    }

    Site& site_;
    EditBox& edit_;
    int16_t number_ = 1;
    std::vector<std::string> items_;
};

inline std::vector<ClassInfo> test_classes() {
    using T = TestBox;
    std::vector<ClassInfo> classes;
    classes.push_back(
        ClassBuilder<T>("TestBox", "test control")
            .property("Text", "Variant", [](T& c) { return c.Text(); }, [](T& c, const Variant& v) { c.Text(v); }, "")
            .property("Number", "Integer", [](T& c) { return Variant(c.Number()); },
                      [](T& c, const Variant& v) { c.Number(v); }, "")
            .property("Locked", "Boolean", [](T& c) { return Variant(c.Locked()); },
                      [](T& c, const Variant& v) { c.Locked(to_bool(v)); }, "")
            .property("hWnd", "Long", [](T& c) { return Variant(c.hWnd()); }, {}, "")
            .indexed_property("List", "String", [](T& c, const Variant& i) { return Variant(c.List(i)); },
                              [](T& c, const Variant& i, const Variant& v) { c.List(i, v); }, "")
            .method("AddItem", {{"Item", "String"}, {"Index", "Variant", true}},
                    [](T& c, std::span<const Variant> a) {
                        c.AddItem(a[0]);
                        return Variant();
                    },
                    "")
            .method("Clear", {}, [](T& c, std::span<const Variant>) {
                c.Clear();
                return Variant();
            }, "")
            .event(1, "KeyDown", {{"KeyCode", "Integer"}, {"Shift", "Integer"}})
            .event(2, "KeyUp", {{"KeyCode", "Integer"}, {"Shift", "Integer"}})
            .event(3, "KeyPress", {{"KeyAscii", "Integer"}})
            .event(4, "Change")
            .event(5, "Click")
            .build());
    ClassInfo ghost;  // known by name, not creatable
    ghost.name = "Ghost";
    classes.push_back(std::move(ghost));
    return classes;
}

}  // namespace kel::testing

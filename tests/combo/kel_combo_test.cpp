// KelCombo on the minimal host: typing as a person types, properties as form code sets them,
// and the property store as a form is saved and loaded.
#include "keltext/combo/kel_combo.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "keltext/combo/class_info.h"
#include "keltext/host/errors.h"
#include "keltext/host/font.h"
#include "keltext/minihost/form.h"
#include "keltext/minihost/keyboard.h"

namespace kel {
namespace {

using mini::Form;
using mini::HostedControl;

struct Recorder : mini::FormObserver {
    std::vector<std::string> events;
    std::vector<std::string> changed;
    std::vector<std::string> errors;
    std::function<void(std::string_view, std::span<EventArg>)> on_event;

    void event_raised(HostedControl&, int number, std::string_view event, std::span<EventArg> args) override {
        std::string line = std::to_string(number) + " " + std::string(event);
        for (const EventArg& a : args) line += " " + std::to_string(static_cast<long long>(a.value.number()));
        events.push_back(line);
        if (on_event) on_event(event, args);
    }
    void property_changed(HostedControl&, std::string_view p) override { changed.emplace_back(p); }
    void handler_error(std::string_view where, int number) override {
        errors.push_back(std::string(where) + " " + std::to_string(number));
    }
};

std::string L(std::string s) {
    for (auto [mark, code] : {std::pair{"[200]", '\xC8'}, std::pair{"[201]", '\xC9'}})
        for (std::size_t p = s.find(mark); p != std::string::npos; p = s.find(mark, p + 1)) s.replace(p, 5, 1, code);
    return s;
}

class ComboTest : public ::testing::Test {
protected:
    ComboTest() : form(&rec), cls(kel_combo_class()) {}

    HostedControl& add(std::vector<std::string> items = {}, const std::string& name = "c") {
        HostedControl& h = form.create(cls, name);
        for (const auto& i : items) ctl(h).AddItem(i);
        return h;
    }
    HostedControl& focused(std::vector<std::string> items) {
        HostedControl& h = add(std::move(items));
        form.focus(&h);
        return h;
    }
    KelCombo& ctl(HostedControl& h) { return static_cast<KelCombo&>(h.control()); }
    Variant get(HostedControl& h, std::string_view prop) { return h.dispatch().get(prop); }
    Variant get(HostedControl& h, std::string_view prop, const Variant& index) { return h.dispatch().get(prop, &index); }
    void set(HostedControl& h, std::string_view prop, const Variant& v) { h.dispatch().set(prop, v); }
    Variant peek(HostedControl& h, std::string_view member) { return h.part("cboCustom")->peek(member); }
    void poke(HostedControl& h, std::string_view member, const Variant& v) { h.part("cboCustom")->poke(member, v); }
    void type(std::string_view text) {
        for (char c : text) form.keystroke(mini::keystroke_for_char(static_cast<uint8_t>(c)));
    }
    void key(std::string_view name) { form.keystroke(*mini::parse_key(name)); }
    std::string text(HostedControl& h) { return peek(h, "Text").str(); }
    int32_t sel_start(HostedControl& h) { return *peek(h, "SelStart").get_if<int32_t>(); }
    int32_t sel_length(HostedControl& h) { return *peek(h, "SelLength").get_if<int32_t>(); }
    int error_of(const std::function<void()>& f) {
        try {
            f();
        } catch (const RuntimeError& e) {
            return e.number();
        }
        return 0;
    }

    Recorder rec;
    Form form;
    ClassInfo cls;
};

// ---- a new control, saving and loading --------------------------------------------------------

TEST_F(ComboTest, LoadRebuildsTheListThenSetsTheText) {
    HostedControl& c = form.load(cls, "c", {{"FillList", Variant(L("A[201]1[200]B[201]2[200]"))}});
    EXPECT_EQ(get(c, "ListCount"), Variant(int16_t{2}));
    EXPECT_EQ(get(c, "ListIndex"), Variant(int16_t{0}));
    EXPECT_EQ(get(c, "ItemData", Variant(int16_t{1})), Variant(2.0));
    EXPECT_EQ(get(c, "AutoSearch"), Variant(false));
    EXPECT_EQ(peek(c, "BackColor"), Variant(int32_t{0xFFEFD0}));

    HostedControl& d = form.load(cls, "d", {{"FillList", Variant(L("A[201]1[200]B[201]2[200]"))}, {"Text", Variant("Zed")}});
    EXPECT_EQ(text(d), "Zed");
}

TEST_F(ComboTest, SaveWritesEveryKeyInOrder) {
    const mini::StoredValues store = {
        {"TextType", Variant(int32_t{5})}, {"Forecolor", Variant(int32_t{255})}, {"BackColor", Variant(int32_t{0})},
        {"MaxLength", Variant(int16_t{8})}, {"Text", Variant("Cash")}, {"AutoSearch", Variant(true)},
        {"Locked", Variant(true)}, {"Enabled", Variant(false)}, {"FillList", Variant(L("Cash[201]1[200]"))}};
    HostedControl& c = form.load(cls, "c", store);
    EXPECT_EQ(c.surface_part().peek("Enabled"), Variant(false));
    EXPECT_EQ(peek(c, "Enabled"), Variant(false));
    const mini::StoredValues saved = form.save(c);
    std::vector<std::string> keys;
    for (const auto& [k, v] : saved) keys.push_back(k);
    EXPECT_EQ(keys, (std::vector<std::string>{"TextType", "Forecolor", "Backcolor", "Font", "MaxLength", "Text",
                                              "AutoSearch", "Locked", "Enabled", "FillList"}));
    HostedControl& again = form.load(cls, "again", saved);
    const mini::StoredValues resaved = form.save(again);
    ASSERT_EQ(resaved.size(), saved.size());
    for (std::size_t i = 0; i < saved.size(); ++i)
        if (saved[i].first != "Font") {
            EXPECT_EQ(resaved[i], saved[i]) << saved[i].first;
        }
}

// ---- searching as the user types --------------------------------------------------------------

TEST_F(ComboTest, TypingCompletesFromTheList) {
    HostedControl& c = focused({"Apple", "Banana", "Cherry"});
    type("b");
    EXPECT_EQ(text(c), "Banana");
    EXPECT_EQ(sel_start(c), 1);
    EXPECT_EQ(sel_length(c), 5);
    type("A");
    EXPECT_EQ(text(c), "Banana");
    EXPECT_EQ(sel_start(c), 2);
    EXPECT_EQ(sel_length(c), 4);
}

TEST_F(ComboTest, KeysThatNeverComplete) {
    int n = 0;
    for (const char* k : {"Backspace", "Delete", "Left", "Home", "End", "Up", "Insert"}) {
        HostedControl& c = add({"Apple", "Banana"}, "c" + std::to_string(n++));
        form.focus(&c);
        poke(c, "Text", Variant("Ba"));
        form.select(c, 1, 0);
        key(k);
        EXPECT_NE(text(c), "Banana") << k;
    }
}

TEST_F(ComboTest, SpaceCompletesAndSortedListStopsEarly) {
    HostedControl& c = focused({"Cherry", "Apple", "Banana split"});
    poke(c, "Sorted", Variant(true));
    type("banana ");
    EXPECT_EQ(text(c), "Banana split");
    poke(c, "Text", Variant(""));
    type("x");
    EXPECT_EQ(text(c), "X");
}

TEST_F(ComboTest, SearchLeavesADropDownListAlone) {
    HostedControl& c = add({"Banana"});
    poke(c, "Style", Variant(int16_t{2}));
    ctl(c).Text(Variant("b"));
    int16_t k = 66;
    ctl(c).d_ComboSearch(k);
    EXPECT_EQ(text(c), "b");
}

TEST_F(ComboTest, UpAndDownWrapAround) {
    HostedControl& c = focused({"A", "B", "C"});
    set(c, "ListIndex", Variant(int16_t{0}));
    key("Up");
    EXPECT_EQ(get(c, "ListIndex"), Variant(int16_t{2}));
    key("Down");
    EXPECT_EQ(get(c, "ListIndex"), Variant(int16_t{0}));
    key("Down");
    EXPECT_EQ(get(c, "ListIndex"), Variant(int16_t{1}));
    key("Ctrl+Up");
    EXPECT_EQ(get(c, "ListIndex"), Variant(int16_t{0}));
    key("Ctrl+Up");  // left to the widget, which stops at the first entry
    EXPECT_EQ(get(c, "ListIndex"), Variant(int16_t{0}));
}

TEST_F(ComboTest, DownInAnEmptyListIsConsumed) {
    HostedControl& c = focused({});
    key("Down");
    EXPECT_TRUE(rec.errors.empty());
    EXPECT_EQ(get(c, "ListIndex"), Variant(int16_t{-1}));
}

// ---- the character filter ---------------------------------------------------------------------

TEST_F(ComboTest, MaxLengthRefusesKeysWithoutKeyPress) {
    HostedControl& c = focused({});
    set(c, "AutoSearch", Variant(false));
    set(c, "TextType", Variant(int32_t{KelCboUserKeys}));
    set(c, "MaxLength", Variant(int16_t{3}));
    type("abcd");
    EXPECT_EQ(text(c), "abc");
    rec.events.clear();
    type("e");
    for (const auto& e : rec.events) EXPECT_EQ(e.find("KeyPress"), std::string::npos) << e;
    key("Backspace");
    EXPECT_EQ(text(c), "ab");
    form.select(c, 0, 2);
    type("z");
    EXPECT_EQ(text(c), "z");
    form.paste("123456");
    EXPECT_EQ(text(c), "z12");
}

TEST_F(ComboTest, AKeyTheFormDropsStaysDropped) {
    HostedControl& c = focused({});
    rec.on_event = [](std::string_view e, std::span<EventArg> args) {
        if (e == "KeyPress") args[0].value = Variant(int16_t{0});
    };
    type("ab");
    EXPECT_EQ(text(c), "");
}

// ---- properties and methods -------------------------------------------------------------------

TEST_F(ComboTest, ListAndItemDataTakeA16BitIndexOnly) {
    HostedControl& c = add({"A", "B"});
    EXPECT_EQ(get(c, "List", Variant(int16_t{1})), Variant("B"));
    EXPECT_EQ(get(c, "List", Variant(int32_t{1})), Variant());
    EXPECT_EQ(get(c, "List", Variant("1")), Variant());
    const Variant i0(int16_t{0});
    c.dispatch().set("ItemData", Variant(2.5), &i0);
    EXPECT_EQ(get(c, "ItemData", i0), Variant(2.0));
    c.dispatch().set("ItemData", Variant("7x"), &i0);
    EXPECT_EQ(get(c, "ItemData", i0), Variant(7.0));
    const Variant i32(int32_t{0});
    c.dispatch().set("ItemData", Variant(9), &i32);
    c.dispatch().set("List", Variant("Z"), &i32);
    EXPECT_EQ(get(c, "ItemData", i0), Variant(7.0));
    EXPECT_EQ(get(c, "List", i0), Variant("A"));
    EXPECT_EQ(error_of([&] { get(c, "List", Variant(int16_t{5})); }), kInvalidPropertyIndex);
}

TEST_F(ComboTest, MaxLengthSetter) {
    HostedControl& c = add({});
    set(c, "MaxLength", Variant(int16_t{5}));
    set(c, "MaxLength", Variant("abc"));
    EXPECT_EQ(get(c, "MaxLength"), Variant(int16_t{5}));
    set(c, "MaxLength", Variant(40000));
    EXPECT_EQ(get(c, "MaxLength"), Variant(int16_t{5}));
    set(c, "MaxLength", Variant("7.5"));
    EXPECT_EQ(get(c, "MaxLength"), Variant(int16_t{8}));
    EXPECT_EQ(c.surface_part().peek("Width"), Variant(1200.0f));  // run time: width untouched

    form.set_user_mode(false);
    set(c, "MaxLength", Variant(int16_t{5}));
    EXPECT_EQ(c.surface_part().peek("Width"), Variant(870.0f));
    set(c, "MaxLength", Variant(int16_t{-5}));  // a negative width is never given
    EXPECT_EQ(c.surface_part().peek("Width"), Variant(870.0f));
}

TEST_F(ComboTest, AddItemCutsToMaxLength) {
    HostedControl& c = add({});
    set(c, "MaxLength", Variant(int16_t{3}));
    ctl(c).AddItem("abcdef");
    const Variant args[] = {Variant("xyz1"), Variant(int16_t{0})};
    c.dispatch().call("AddItem", args);
    EXPECT_EQ(get(c, "List", Variant(int16_t{0})), Variant("xyz"));
    EXPECT_EQ(get(c, "List", Variant(int16_t{1})), Variant("abc"));
    set(c, "MaxLength", Variant(int16_t{-1}));
    EXPECT_EQ(error_of([&] { ctl(c).AddItem("q"); }), kInvalidProcedureCall);
    const Variant bad[] = {Variant("q"), Variant("x")};
    set(c, "MaxLength", Variant(int16_t{0}));
    EXPECT_EQ(error_of([&] { c.dispatch().call("AddItem", bad); }), kTypeMismatch);
    const Variant remove[] = {Variant(int16_t{0})};
    c.dispatch().call("RemoveItem", remove);
    EXPECT_EQ(get(c, "ListCount"), Variant(int16_t{1}));
    c.dispatch().call("Clear", {});
    EXPECT_EQ(get(c, "ListCount"), Variant(int16_t{0}));
}

}  // namespace
}  // namespace kel

// KelNumeric on the minimal host: keystrokes as a person types them, focus moving in and out,
// the spin buttons, properties as form code sets them, and the property store.
#include "keltext/numeric/kel_numeric.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "keltext/host/errors.h"
#include "keltext/host/font.h"
#include "keltext/minihost/form.h"
#include "keltext/minihost/keyboard.h"
#include "keltext/numeric/class_info.h"

namespace kel {
namespace {

using mini::Form;
using mini::HostedControl;
using mini::Part;

struct Recorder : mini::FormObserver {
    std::vector<std::string> events;
    std::vector<std::string> keys;
    std::vector<std::string> changed;
    std::vector<std::string> errors;
    std::function<void(std::string_view, std::span<EventArg>)> on_event;

    void event_raised(HostedControl&, int number, std::string_view event, std::span<EventArg> args) override {
        std::string line = std::to_string(number) + " " + std::string(event);
        for (const EventArg& a : args)
            line += " " + std::string(a.name) + "=" + std::to_string(static_cast<long long>(a.value.number()));
        events.push_back(line);
        if (on_event) on_event(event, args);
    }
    void keys_sent(HostedControl&, std::string_view k) override { keys.emplace_back(k); }
    void property_changed(HostedControl&, std::string_view p) override { changed.emplace_back(p); }
    void handler_error(std::string_view where, int number) override {
        errors.push_back(std::string(where) + " " + std::to_string(number));
    }
    int count(std::string_view event) const {
        int n = 0;
        for (const auto& e : events) n += e.find(event) != std::string::npos;
        return n;
    }
};

class NumericTest : public ::testing::Test {
protected:
    NumericTest() : form(&rec), cls(kel_numeric_class()) {}

    HostedControl& add(const std::string& name = "n") { return form.create(cls, name); }
    Variant get(HostedControl& h, std::string_view prop) { return h.dispatch().get(prop); }
    void set(HostedControl& h, std::string_view prop, const Variant& v) { h.dispatch().set(prop, v); }
    Variant peek(HostedControl& h, std::string_view part, std::string_view member) {
        return h.part(part)->peek(member);
    }
    void poke(HostedControl& h, std::string_view part, std::string_view member, const Variant& v) {
        h.part(part)->poke(member, v);
    }
    void type(std::string_view text) {
        for (char c : text) form.keystroke(mini::keystroke_for_char(static_cast<uint8_t>(c)));
    }
    void key(std::string_view name) { form.keystroke(*mini::parse_key(name)); }
    std::string text(HostedControl& h) { return peek(h, "txtNumeric", "Text").str(); }
    float size(HostedControl& h, std::string_view part, std::string_view member) {
        return *peek(h, part, member).get_if<float>();
    }
    // A numeric box with two decimals in seven places, focused, and a neighbour to leave to.
    HostedControl& focused_box(int16_t decimals = 2) {
        HostedControl& n = add("n");
        set(n, "NoOfDecimals", Variant(decimals));
        add("other");
        form.focus(&n);
        return n;
    }

    Recorder rec;
    Form form;
    ClassInfo cls;
};

// ---- a new control ---------------------------------------------------------------------------

// ---- MaxLength, NoOfDecimals and the bounds ------------------------------------------------------

TEST_F(NumericTest, MaxLengthKeepsRoomForTheDecimals) {
    HostedControl& n = add();
    set(n, "NoOfDecimals", Variant(int16_t{2}));
    set(n, "MaxLength", Variant(int16_t{2}));
    EXPECT_EQ(get(n, "MaxLength"), Variant(int16_t{3}));
    EXPECT_EQ(peek(n, "txtNumeric", "MaxLength"), Variant(int32_t{3}));
    // A limit the text box refuses leaves the one it has.
    set(n, "MaxLength", Variant(int16_t{-4}));
    EXPECT_EQ(get(n, "MaxLength"), Variant(int16_t{3}));
    EXPECT_THROW(set(n, "MaxLength", Variant("abc")), RuntimeError);
}

// ---- Text and Mask -------------------------------------------------------------------------------

TEST_F(NumericTest, TextIsShapedAndReadAsADouble) {
    HostedControl& n = add();
    set(n, "NoOfDecimals", Variant(int16_t{2}));
    struct Case {
        Variant value;
        std::string shown;
        double read;
    } cases[] = {
        {Variant(1234.567), "1234.56", 1234.56},
        {Variant(int32_t{123456}), "3456.00", 3456},
        {Variant("abc"), "0", 0},
        {Variant(""), "0", 0},
    };
    for (const auto& c : cases) {
        set(n, "Text", c.value);
        EXPECT_EQ(text(n), c.shown);
        EXPECT_EQ(get(n, "Text"), Variant(c.read)) << c.shown;
    }
    set(n, "Mask", Variant("##/##"));
    EXPECT_EQ(get(n, "Mask"), Variant(""));
}

TEST_F(NumericTest, TextReadsThroughTheGrouping) {
    HostedControl& n = add();
    set(n, "TxtFormat", Variant(true));
    poke(n, "txtNumeric", "Text", Variant("12,34,567.50"));
    EXPECT_EQ(get(n, "Text"), Variant(1234567.5));
    // Turned off while the grouped text shows: the number is still read whole.
    set(n, "TxtFormat", Variant(false));
    EXPECT_EQ(get(n, "Text"), Variant(1234567.5));
}

// ---- typing --------------------------------------------------------------------------------------

TEST_F(NumericTest, RefusedCharactersRaiseControlErrorOnlyWhenAsked) {
    HostedControl& n = focused_box();
    type("1a");
    EXPECT_EQ(rec.count("ControlError"), 0);
    set(n, "TriggerError", Variant(true));
    type("ab2");
    EXPECT_EQ(rec.count("ControlError"), 2);
    EXPECT_EQ(text(n), "12");
}

TEST_F(NumericTest, FormDroppingTheKeyStillCountsAsRefused) {
    HostedControl& n = focused_box();
    set(n, "TriggerError", Variant(true));
    rec.on_event = [](std::string_view event, std::span<EventArg> args) {
        if (event == "KeyPress") args[0].value = Variant(int16_t{0});
    };
    type("7");
    EXPECT_EQ(text(n), "");
    EXPECT_EQ(rec.count("ControlError"), 1);
}

TEST_F(NumericTest, ArrowsMoveFocusAndSlashClears) {
    HostedControl& n = focused_box();
    type("12");
    key("Down");
    EXPECT_EQ(form.focused(), form.find("other"));
    form.focus(&n);
    key("Up");
    EXPECT_EQ(form.focused(), form.find("other"));
    form.focus(&n);
    type("/");
    EXPECT_EQ(text(n), "");
}

TEST_F(NumericTest, BackspaceOverASelectionComesBackAsDelete) {
    HostedControl& n = focused_box();
    type("12.5");
    form.select(n, 1, 3);
    key("Backspace");
    EXPECT_EQ(text(n), "1");
}

TEST_F(NumericTest, DeleteKeepsThePointWhileDecimalsFollow) {
    HostedControl& n = focused_box();
    type("12.5");
    form.select(n, 2, 0);
    key("Delete");
    EXPECT_EQ(text(n), "12.5");
    key("End");
    key("Backspace");
    form.select(n, 2, 0);
    key("Delete");
    EXPECT_EQ(text(n), "12");
}

TEST_F(NumericTest, OverwriteModeReplacesTheNextDigit) {
    HostedControl& n = focused_box();
    type("12.34");
    form.set_insert(true);
    form.select(n, 0, 0);
    type("9");
    EXPECT_EQ(text(n), "92.34");
}

TEST_F(NumericTest, CtrlKeysAreNotFiltered) {
    HostedControl& n = focused_box();
    type("1");
    rec.events.clear();
    key("Ctrl+a");
    // One KeyDown only: with Ctrl held the handler stops before raising it again.
    EXPECT_EQ(rec.count("KeyDown"), 1);
    EXPECT_EQ(rec.count("KeyPress KeyAscii=1"), 1);
    EXPECT_EQ(text(n), "1");
}

// ---- focus ---------------------------------------------------------------------------------------

TEST_F(NumericTest, EnteringSelectsEverything) {
    HostedControl& n = focused_box();
    type("12");
    form.focus(form.find("other"));
    form.focus(&n);
    EXPECT_EQ(peek(n, "txtNumeric", "SelStart"), Variant(int32_t{0}));
    EXPECT_EQ(peek(n, "txtNumeric", "SelLength"), Variant(int32_t{5}));  // 12.00
}

TEST_F(NumericTest, LeavingClampsSilently) {
    HostedControl& n = focused_box();
    set(n, "TriggerError", Variant(true));
    set(n, "MinValue", Variant(int16_t{10}));
    type("3");
    form.focus(form.find("other"));
    EXPECT_EQ(text(n), "10.00");
    EXPECT_EQ(form.focused(), form.find("other"));
    EXPECT_EQ(rec.count("ControlError"), 0);
    EXPECT_TRUE(rec.errors.empty());
}

// ---- spin buttons and layout ---------------------------------------------------------------------

TEST_F(NumericTest, PlainBorderHasNoButtons) {
    HostedControl& n = add();
    set(n, "UpDownScroll", Variant(true));
    set(n, "Borderstyle", Variant(int32_t{KelNPlain}));
    EXPECT_EQ(size(n, "surface", "Height"), 225.0f);
    EXPECT_EQ(size(n, "UpDownNumeric", "Height"), 225.0f);
    EXPECT_EQ(peek(n, "UpDownNumeric", "Visible"), Variant(false));
    EXPECT_EQ(get(n, "UpDownScroll"), Variant(true));  // hidden, not cleared
    set(n, "UpDownScroll", Variant(false));
    EXPECT_EQ(get(n, "UpDownScroll"), Variant(true));  // no effect at all
    form.resize(n, 2000, 900);
    EXPECT_EQ(size(n, "surface", "Height"), 225.0f);
    EXPECT_THROW(set(n, "Borderstyle", Variant(int32_t{5})), RuntimeError);
    form.resize(n, 100, 225);  // narrower than the gap: no error
    EXPECT_EQ(size(n, "txtNumeric", "Width"), 0.0f);
}

// ---- Enabled and Locked --------------------------------------------------------------------------

TEST_F(NumericTest, ClicksReachTheFormOnlyWhenEnabledAndNotLocked) {
    HostedControl& n = add();
    Part& box = *n.part("txtNumeric");
    form.click(n, box);
    form.dbl_click(n, box);
    EXPECT_EQ(rec.count("Click"), 2);
    set(n, "Locked", Variant(true));
    poke(n, "surface", "Enabled", Variant(true));  // reach the handler despite the lock
    form.click(n, box);
    EXPECT_EQ(rec.count("Click"), 2);
}

// ---- persistence ---------------------------------------------------------------------------------

TEST_F(NumericTest, SaveWritesTheKeysInOrder) {
    HostedControl& n = add();
    set(n, "Increment", Variant(int16_t{5}));
    set(n, "UpDownScroll", Variant(true));
    set(n, "MinValue", Variant(int16_t{1}));
    set(n, "MaxValue", Variant(int16_t{900}));
    set(n, "ForeColor", Variant(int32_t{255}));
    set(n, "BackColor", Variant(int32_t{0}));
    set(n, "MaxLength", Variant(int16_t{9}));
    set(n, "Locked", Variant(true));
    set(n, "Enabled", Variant(false));
    set(n, "TriggerError", Variant(true));
    set(n, "TxtFormat", Variant(true));
    set(n, "Text", Variant(int16_t{55}));
    std::vector<std::string> keys;
    for (const auto& [k, v] : form.save(n)) keys.push_back(k);
    EXPECT_EQ(keys, (std::vector<std::string>{"Increment", "UpDownScroll", "MinValue", "Maxvalue", "Forecolor",
                                              "Backcolor", "Font", "MaxLength", "Locked", "Enabled", "TriggerError",
                                              "TxtFormat"}));
}

TEST_F(NumericTest, RestoreReadsBothBackgroundKeysAndSkipsBadValues) {
    HostedControl& n = form.load(cls, "n",
                                 {{"BACKCOLOR", Variant(int32_t{0x123456})},
                                  {"MaxLength", Variant("abc")},
                                  {"NoOfDecimals", Variant(int16_t{2})}});
    EXPECT_EQ(get(n, "BackColor"), Variant(int32_t{0x123456}));
    EXPECT_EQ(peek(n, "surface", "BackColor"), Variant(int32_t{0x123456}));
    EXPECT_EQ(get(n, "MaxLength"), Variant(int16_t{7}));
    EXPECT_EQ(get(n, "NoOfDecimals"), Variant(int16_t{2}));
    EXPECT_EQ(size(n, "surface", "Height"), 300.0f);
}

}  // namespace
}  // namespace kel

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

TEST_F(NumericTest, NewControlStartsWithItsDesignedValues) {
    HostedControl& n = add();
    struct Case {
        const char* what;
        Variant actual, expected;
    } cases[] = {
        {"Borderstyle", get(n, "Borderstyle"), Variant(int32_t{KelNFixedSingle})},
        {"Width", peek(n, "surface", "Width"), Variant(920.0f)},
        {"Height", peek(n, "surface", "Height"), Variant(300.0f)},
        {"MaxLength", get(n, "MaxLength"), Variant(int16_t{7})},
        {"limit", peek(n, "txtNumeric", "MaxLength"), Variant(int32_t{7})},
        {"NoOfDecimals", get(n, "NoOfDecimals"), Variant(int16_t{0})},
        {"buttons", peek(n, "UpDownNumeric", "Visible"), Variant(false)},
        {"ForeColor", get(n, "ForeColor"), Variant(int32_t{0xC00000})},
        {"BackColor", get(n, "BackColor"), Variant(int32_t{0xFFECC8})},
        {"surface BackColor", peek(n, "surface", "BackColor"), Variant(int32_t{0xFFECC8})},
        {"MaxValue", get(n, "MaxValue"), Variant(int16_t{0})},
        {"MinValue", get(n, "MinValue"), Variant(int16_t{0})},
        {"Increment", get(n, "Increment"), Variant()},
        {"Text", get(n, "Text"), Variant(0.0)},
        {"Mask", get(n, "Mask"), Variant("")},
        {"text box width", peek(n, "txtNumeric", "Width"), Variant(860.0f)},
        {"Enabled", get(n, "Enabled"), Variant(true)},
        {"Locked", get(n, "Locked"), Variant(false)},
    };
    for (const auto& c : cases) EXPECT_EQ(c.actual, c.expected) << c.what;
    EXPECT_EQ(get(n, "hWnd"), peek(n, "surface", "hWnd"));
}

TEST_F(NumericTest, ClassTableDescribesTheInterface) {
    ASSERT_NE(cls.create, nullptr);
    const PropertyInfo* text = cls.find_property("text");
    ASSERT_NE(text, nullptr);
    EXPECT_TRUE(text->flags & kDefaultMember);
    EXPECT_TRUE(text->hidden());
    EXPECT_TRUE(cls.find_property("Mask")->hidden());
    EXPECT_FALSE(cls.find_property("MaxValue")->hidden());
    EXPECT_TRUE(cls.find_property("hWnd")->read_only());
    EXPECT_EQ(cls.find_property("TxtFormat")->description,
              "Output will be displayed as formatted  in Indian Currency Style");
    EXPECT_EQ(cls.find_property("BackColor")->description, "Returns/Sets  the Background color used to ");
    std::vector<std::string> events;
    for (const auto& e : cls.events) events.push_back(std::to_string(e.number) + e.name);
    EXPECT_EQ(events, (std::vector<std::string>{"1Click", "2DblClick", "3Change", "4KeyDown", "5KeyPress", "6KeyUp",
                                                "7MouseDown", "8MouseMove", "9MouseUp", "10ControlError"}));
    ASSERT_EQ(cls.enums.size(), 1u);
    EXPECT_EQ(cls.enums[0].name, "KelNBorderStyle");
}

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

TEST_F(NumericTest, DesignTimeWidthFollowsTheLimit) {
    form.set_user_mode(false);
    HostedControl& n = add();
    set(n, "MaxLength", Variant(int16_t{4}));
    EXPECT_EQ(size(n, "surface", "Width"), 560.0f);
    set(n, "NoOfDecimals", Variant(int16_t{4}));
    EXPECT_EQ(get(n, "MaxLength"), Variant(int16_t{5}));
    EXPECT_EQ(size(n, "surface", "Width"), 680.0f);
    // A large font: the width stays.
    set(n, "Font", Variant(std::make_shared<Font>("Arial", 12)));
    set(n, "MaxLength", Variant(int16_t{10}));
    EXPECT_EQ(size(n, "surface", "Width"), 680.0f);
}

TEST_F(NumericTest, RunTimeWidthIsLeftAlone) {
    HostedControl& n = add();
    set(n, "MaxLength", Variant(int16_t{4}));
    EXPECT_EQ(size(n, "surface", "Width"), 920.0f);
}

TEST_F(NumericTest, BoundsAndDecimals) {
    HostedControl& n = add();
    set(n, "MaxValue", Variant("12.5"));
    EXPECT_EQ(get(n, "MaxValue"), Variant(12.5));
    set(n, "MaxValue", Variant("abc"));
    EXPECT_EQ(get(n, "MaxValue").number(), 0);
    set(n, "MinValue", Variant("3"));
    EXPECT_EQ(get(n, "MinValue"), Variant("3"));  // kept as given
    set(n, "MaxValue", Variant(int16_t{500}));
    EXPECT_EQ(get(n, "MaxValue"), Variant(500.0));
    set(n, "NoOfDecimals", Variant(int16_t{2}));
    EXPECT_EQ(get(n, "MaxValue").number(), 0);
    EXPECT_EQ(get(n, "MinValue").number(), 0);
}

TEST_F(NumericTest, SettersAnnounceTheirNames) {
    HostedControl& n = add();
    rec.changed.clear();
    set(n, "Locked", Variant(false));
    set(n, "TriggerError", Variant(true));
    set(n, "TxtFormat", Variant(true));
    set(n, "Borderstyle", Variant(int32_t{1}));
    set(n, "Text", Variant("5"));
    set(n, "Mask", Variant("##"));
    set(n, "Increment", Variant(int16_t{2}));
    set(n, "BackColor", Variant(int32_t{0}));
    EXPECT_EQ(rec.changed,
              (std::vector<std::string>{"Locked", "TriggerError", "TxtFormat", "BorderStyle", "Increment", "BackColor"}));
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

TEST_F(NumericTest, RoadOfOneKeystroke) {
    HostedControl& n = focused_box();
    type("1234");
    rec.events.clear();
    rec.keys.clear();
    type("5");
    EXPECT_EQ(text(n), "1234.5");
    EXPECT_EQ(peek(n, "txtNumeric", "SelStart"), Variant(int32_t{6}));
    EXPECT_EQ(rec.keys, (std::vector<std::string>{"{END}"}));
    const std::vector<std::string> expected = {
        "4 KeyDown KeyCode=53 Shift=0", "4 KeyDown KeyCode=53 Shift=0", "5 KeyPress KeyAscii=53",
        "3 Change",                     "6 KeyUp KeyCode=53 Shift=0",   "4 KeyDown KeyCode=35 Shift=0",
        "4 KeyDown KeyCode=35 Shift=0", "6 KeyUp KeyCode=35 Shift=0",
    };
    EXPECT_EQ(rec.events, expected);
    form.focus(form.find("other"));
    EXPECT_EQ(text(n), "1234.50");
    EXPECT_EQ(get(n, "Text"), Variant(1234.5));
}

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

TEST_F(NumericTest, LeavingGroupsAndEnteringStrips) {
    HostedControl& n = focused_box();
    set(n, "TxtFormat", Variant(true));
    type("1234567");  // the integer room is 4: the rest becomes decimals
    EXPECT_EQ(text(n), "1234.56");
    set(n, "MaxLength", Variant(int16_t{10}));
    set(n, "Text", Variant(1234567.5));
    form.focus(form.find("other"));
    EXPECT_EQ(text(n), "12,34,567.50");
    EXPECT_EQ(peek(n, "txtNumeric", "MaxLength"), Variant(int32_t{11}));
    EXPECT_EQ(get(n, "Text"), Variant(1234567.5));
    form.focus(&n);
    EXPECT_EQ(text(n), "1234567.50");
    EXPECT_EQ(peek(n, "txtNumeric", "MaxLength"), Variant(int32_t{10}));
}

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

TEST_F(NumericTest, SpinButtonsStepWithinTheBounds) {
    HostedControl& n = add();
    set(n, "Increment", Variant(int16_t{5}));
    set(n, "MaxValue", Variant(int16_t{12}));
    poke(n, "txtNumeric", "Text", Variant("10"));
    Part& spin = *n.part("UpDownNumeric");
    form.notify(n, spin, "UpClick");
    EXPECT_EQ(text(n), "12");
    form.notify(n, spin, "DownClick");
    EXPECT_EQ(text(n), "7");
    set(n, "Increment", Variant("abc"));  // cannot step: nothing changes
    form.notify(n, spin, "DownClick");
    EXPECT_EQ(text(n), "7");
}

TEST_F(NumericTest, ButtonsWidenTheControl) {
    HostedControl& n = add();
    set(n, "UpDownScroll", Variant(true));
    EXPECT_EQ(size(n, "surface", "Width"), 1240.0f);
    EXPECT_EQ(size(n, "txtNumeric", "Width"), 920.0f);
    EXPECT_EQ(size(n, "UpDownNumeric", "Left"), 940.0f);
    EXPECT_EQ(size(n, "UpDownNumeric", "Height"), 250.0f);
    EXPECT_EQ(peek(n, "UpDownNumeric", "Visible"), Variant(true));
    form.resize(n, 1240, 300);
    form.resize(n, 1300, 300);
    EXPECT_EQ(size(n, "txtNumeric", "Width"), 990.0f);
    set(n, "UpDownScroll", Variant(false));
    EXPECT_EQ(size(n, "surface", "Width"), 1000.0f);
    EXPECT_EQ(size(n, "txtNumeric", "Width"), 940.0f);
    EXPECT_EQ(peek(n, "UpDownNumeric", "Visible"), Variant(false));
}

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

TEST_F(NumericTest, LockedAndEnabledInterplay) {
    HostedControl& n = add();
    add("other");
    set(n, "Enabled", Variant(false));
    EXPECT_EQ(peek(n, "txtNumeric", "Enabled"), Variant(false));
    EXPECT_EQ(peek(n, "surface", "Enabled"), Variant(false));
    set(n, "Locked", Variant(true));
    EXPECT_EQ(form.focus(&n), Form::FocusResult::refused);
    set(n, "Locked", Variant(false));
    EXPECT_EQ(peek(n, "surface", "Enabled"), Variant(true));
    EXPECT_EQ(peek(n, "UpDownNumeric", "Enabled"), Variant(true));
    EXPECT_EQ(peek(n, "txtNumeric", "Enabled"), Variant(false));
    EXPECT_EQ(form.focus(&n), Form::FocusResult::moved);
}

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

TEST_F(NumericTest, NewControlStoresOnlyItsFont) {
    HostedControl& n = add();
    const mini::StoredValues saved = form.save(n);
    ASSERT_EQ(saved.size(), 1u);
    EXPECT_EQ(saved[0].first, "Font");
}

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

TEST_F(NumericTest, SavedAndRestoredKeepsItsSettingsButNotItsText) {
    HostedControl& n = add();
    set(n, "MaxLength", Variant(int16_t{10}));
    set(n, "NoOfDecimals", Variant(int16_t{3}));
    set(n, "MaxValue", Variant(int16_t{900}));
    set(n, "MinValue", Variant(int16_t{2}));
    set(n, "Increment", Variant(2.5));
    set(n, "ForeColor", Variant(int32_t{255}));
    set(n, "BackColor", Variant(int32_t{0x00FF00}));
    set(n, "Font", Variant(std::make_shared<Font>("Arial", 8, true)));
    set(n, "UpDownScroll", Variant(true));
    set(n, "Locked", Variant(true));
    set(n, "TriggerError", Variant(true));
    set(n, "TxtFormat", Variant(true));
    set(n, "Text", Variant(int16_t{55}));
    const mini::StoredValues saved = form.save(n);

    HostedControl& m = form.load(cls, "m", saved);
    const char* props[] = {"MaxLength", "NoOfDecimals", "MaxValue", "MinValue", "Increment", "ForeColor",
                           "BackColor", "Borderstyle", "UpDownScroll", "Enabled", "Locked", "TriggerError",
                           "TxtFormat"};
    for (const char* p : props) EXPECT_EQ(get(m, p), get(n, p)) << p;
    auto font = font_of(get(m, "Font"));
    ASSERT_TRUE(font);
    EXPECT_TRUE(font->same_as(Font("Arial", 8, true)));
    EXPECT_EQ(peek(m, "surface", "BackColor"), Variant(int32_t{0x00FF00}));
    EXPECT_EQ(peek(m, "surface", "Enabled"), Variant(false));  // Locked came last
    EXPECT_EQ(peek(m, "txtNumeric", "Enabled"), Variant(true));
    EXPECT_EQ(peek(m, "UpDownNumeric", "Visible"), Variant(true));
    EXPECT_EQ(text(m), "");
    const mini::StoredValues again = form.save(m);
    ASSERT_EQ(again.size(), saved.size());
    for (std::size_t i = 0; i < saved.size(); ++i) {
        EXPECT_EQ(again[i].first, saved[i].first);
        if (!saved[i].second.is_object()) {
            EXPECT_EQ(again[i].second, saved[i].second) << saved[i].first;
        }
    }
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

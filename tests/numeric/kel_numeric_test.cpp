// KelNumeric on the minimal host where the form scripts numeric_*.kfs do not reach: reading
// Text back as a number, clicks against a lock forced open, and the property store's keys.
#include "keltext/numeric/kel_numeric.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "keltext/minihost/form.h"
#include "keltext/numeric/class_info.h"
#include "tests/support/form_recorder.h"

namespace kel {
namespace {

using mini::HostedControl;

using Recorder = testing_support::FormRecorder;

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
    std::string text(HostedControl& h) { return peek(h, "txtNumeric", "Text").str(); }

    Recorder rec;
    mini::Form form;
    ClassInfo cls;
};

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

// ---- Enabled and Locked --------------------------------------------------------------------------

TEST_F(NumericTest, ClicksReachTheFormOnlyWhenEnabledAndNotLocked) {
    HostedControl& n = add();
    model::Part& box = *n.part("txtNumeric");
    form.click(n, box);
    form.dbl_click(n, box);
    EXPECT_EQ(rec.count("Click") + rec.count("DblClick"), 2);
    set(n, "Locked", Variant(true));
    poke(n, "surface", "Enabled", Variant(true));  // reach the handler despite the lock
    form.click(n, box);
    EXPECT_EQ(rec.count("Click"), 1);
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
    EXPECT_EQ(peek(n, "surface", "Height"), Variant(300.0f));
}

}  // namespace
}  // namespace kel

// KelCombo on the minimal host: typing as a person types, properties as form code sets them,
// and the property store as a form is saved and loaded.
#include "keltext/combo/kel_combo.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "keltext/combo/class_info.h"
#include "keltext/host/errors.h"
#include "keltext/host/font.h"
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/keyboard.h"
#include "tests/combo/fake_list.h"
#include "tests/support/form_recorder.h"

namespace kel {
namespace {

using mini::Form;
using mini::HostedControl;

using Recorder = testing_support::FormRecorder;

using test::L;

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
    void set(HostedControl& h, std::string_view prop, const Variant& v) { h.dispatch().set(prop, v); }
    Variant peek(HostedControl& h, std::string_view member) { return h.part("cboCustom")->peek(member); }
    void poke(HostedControl& h, std::string_view member, const Variant& v) { h.part("cboCustom")->poke(member, v); }
    void type(std::string_view text) {
        for (char c : text) form.keystroke(model::keystroke_for_char(static_cast<uint8_t>(c)));
    }
    void key(std::string_view name) { form.keystroke(*model::parse_key(name)); }
    std::string text(HostedControl& h) { return peek(h, "Text").str(); }
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

// A list string of `n` entries "E0", "E1", ... with their numbers as item data.
std::string long_list(int n) {
    std::string s;
    for (int i = 0; i < n; ++i) s += "E" + std::to_string(i) + "\xC9" + std::to_string(i) + "\xC8";
    return s;
}

// A stored value that cannot be read skips its own step: the rest loads, and what could not
// be read keeps what the control had.
TEST_F(ComboTest, UnreadableStoredValuesSkipOnlyTheirStep) {
    int n = 0;
    for (const char* key : {"MaxLength", "Forecolor", "BackColor", "AutoSearch", "Enabled", "Locked", "TextType"}) {
        SCOPED_TRACE(key);
        for (const Variant& bad : {Variant("abc"), Variant(1e300), Variant(std::make_shared<Font>("Arial", 9))}) {
            HostedControl& c = form.load(cls, "c" + std::to_string(n++),
                                         {{key, bad}, {"Text", Variant("kept")},
                                          {"FillList", Variant(L("A[201]1[200]B[201]2[200]"))}});
            EXPECT_EQ(get(c, "ListCount"), Variant(int16_t{2}));
            EXPECT_EQ(get(c, "Text"), Variant("kept"));
            const mini::StoredValues saved = form.save(c);
            EXPECT_TRUE(std::any_of(saved.begin(), saved.end(), [](const auto& kv) { return kv.first == "FillList"; }));
        }
    }
    // An item data beyond 32 bits reads as 0 and the rest of the list still loads.
    HostedControl& d = form.load(cls, "d", {{"FillList", Variant(L("A[201]1[200]B[201]99999999999[200]C[201]3[200]"))}});
    EXPECT_EQ(get(d, "ListCount"), Variant(int16_t{3}));
    EXPECT_EQ(ctl(d).ItemData(Variant(int16_t{1})), Variant(0.0));
    EXPECT_EQ(ctl(d).ItemData(Variant(int16_t{2})), Variant(3.0));
}

// A list holds 32,767 entries: a longer saved list loads that many and saves whole again, and
// AddItem on a full list is refused.
TEST_F(ComboTest, AFullListLoadsTheFirstEntriesAndSavesThemAll) {
    const std::string whole = long_list(40000);
    HostedControl& c = form.load(cls, "c", {{"FillList", Variant(whole)}});
    EXPECT_EQ(get(c, "ListCount"), Variant(int16_t{32767}));
    EXPECT_EQ(ctl(c).List(Variant(int16_t{32766})), Variant("E32766"));
    const mini::StoredValues saved = form.save(c);
    EXPECT_TRUE(std::find(saved.begin(), saved.end(), std::pair<std::string, Variant>{"FillList", Variant(whole)}) !=
                saved.end());
    const Variant item[] = {Variant("more")};
    const Variant at_start[] = {Variant("more"), Variant(int16_t{0})};
    EXPECT_EQ(error_of([&] { c.dispatch().call("AddItem", item); }), kInvalidProcedureCall);
    EXPECT_EQ(error_of([&] { c.dispatch().call("AddItem", at_start); }), kInvalidProcedureCall);
    EXPECT_EQ(get(c, "ListCount"), Variant(int16_t{32767}));
    EXPECT_EQ(ctl(c).List(Variant(int16_t{0})), Variant("E0"));
    c.dispatch().call("RemoveItem", std::vector<Variant>{Variant(int16_t{0})});
    c.dispatch().call("AddItem", item);  // room again
    EXPECT_EQ(ctl(c).List(Variant(int16_t{32766})), Variant("more"));
}

// ---- focus -------------------------------------------------------------------------------------

TEST_F(ComboTest, FocusEntryKeepsASelectionMadeBeforeIt) {
    struct Case {
        int32_t start, length;          // the selection code makes before focus arrives
        int32_t sel_start, sel_length;  // what focus entry leaves
    } cases[] = {
        {3, 0, 0, 4},  // nothing selected: all of the text but its trailing spaces
        {1, 2, 1, 2},  // a selection already made stands
        {0, 6, 0, 6},
    };
    int n = 0;
    for (const Case& c : cases) {
        HostedControl& h = add({}, "f" + std::to_string(n++));
        set(h, "Text", Variant("Cash  "));
        set(h, "SelStart", Variant(c.start));
        set(h, "Sellength", Variant(c.length));
        form.focus(&h);
        EXPECT_EQ(peek(h, "SelStart"), Variant(c.sel_start)) << c.start << "+" << c.length;
        EXPECT_EQ(peek(h, "SelLength"), Variant(c.sel_length)) << c.start << "+" << c.length;
    }
}

// ---- searching as the user types --------------------------------------------------------------

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

TEST_F(ComboTest, DownInAnEmptyListIsConsumed) {
    HostedControl& c = focused({});
    key("Down");
    EXPECT_TRUE(rec.errors.empty());
    EXPECT_EQ(get(c, "ListIndex"), Variant(int16_t{-1}));
}

// combo_filter.kfs covers the character filter: MaxLength refusing keys before KeyPress, a
// selection typed over, a paste cut to the limit and a key the form drops.

// ---- properties and methods -------------------------------------------------------------------

// combo_properties.kfs covers List, ItemData, MaxLength and AddItem as form code uses them.
TEST_F(ComboTest, BadMaxLengthAndIndexAreRefused) {
    HostedControl& c = add({"A"});
    form.set_user_mode(false);
    set(c, "MaxLength", Variant(int16_t{5}));
    set(c, "MaxLength", Variant(int16_t{-5}));  // a negative width is never given
    EXPECT_EQ(c.surface_part().peek("Width"), Variant(870.0f));
    set(c, "MaxLength", Variant(int16_t{0}));
    const Variant bad[] = {Variant("q"), Variant("x")};
    EXPECT_EQ(error_of([&] { c.dispatch().call("AddItem", bad); }), kTypeMismatch);
    EXPECT_EQ(get(c, "ListCount"), Variant(int16_t{1}));
}

}  // namespace
}  // namespace kel

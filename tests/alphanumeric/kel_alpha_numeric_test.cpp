// KelAlphaNumeric on the minimal host: keystrokes as a person types them, properties as form
// code sets them, and the property store as a form is saved and loaded.
#include "keltext/alphanumeric/kel_alpha_numeric.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "keltext/alphanumeric/class_info.h"
#include "keltext/host/errors.h"
#include "keltext/host/font.h"
#include "keltext/minihost/form.h"
#include "keltext/widgetmodel/keyboard.h"
#include "tests/support/form_recorder.h"

namespace kel {
namespace {

using mini::Form;
using mini::HostedControl;

using Recorder = testing_support::FormRecorder;

class AlphaTest : public ::testing::Test {
protected:
    AlphaTest() : form(&rec), cls(kel_alpha_numeric_class()) {}

    HostedControl& add(const std::string& name = "a") { return form.create(cls, name); }
    KelAlphaNumeric& ctl(HostedControl& h) { return static_cast<KelAlphaNumeric&>(h.control()); }
    Variant get(HostedControl& h, std::string_view prop) { return h.dispatch().get(prop); }
    void set(HostedControl& h, std::string_view prop, const Variant& v) { h.dispatch().set(prop, v); }
    Variant peek(HostedControl& h, std::string_view part, std::string_view member) {
        return h.part(part)->peek(member);
    }
    void type(std::string_view text) {
        for (char c : text) form.keystroke(model::keystroke_for_char(static_cast<uint8_t>(c)));
    }
    void key(std::string_view name) { form.keystroke(*model::parse_key(name)); }
    std::string text(HostedControl& h) { return get(h, "Text").str(); }
    int32_t caret(HostedControl& h) { return *peek(h, "TxtCustom", "SelStart").get_if<int32_t>(); }

    Recorder rec;
    Form form;
    ClassInfo cls;
};

// ---- a new control ---------------------------------------------------------------------------

TEST_F(AlphaTest, HeightIsAlwaysThreeHundred) {
    HostedControl& a = add();
    form.resize(a, 2000, 900);
    EXPECT_EQ(peek(a, "surface", "Height"), Variant(300.0f));
    EXPECT_EQ(peek(a, "TxtCustom", "Width"), Variant(1990.0f));
    // Narrower than the margin: the layout still succeeds.
    form.resize(a, 4, 300);
    EXPECT_EQ(peek(a, "TxtCustom", "Width"), Variant(0.0f));
    EXPECT_TRUE(rec.errors.empty());
}

// ---- typing ---------------------------------------------------------------------------------------

TEST_F(AlphaTest, TypingFiltersAndShapes) {
    struct Case {
        int32_t type;
        const char* typed;
        const char* expected;
    } cases[] = {
        {KelANDigits, "0509", "0509"},  // the leading zero stays
        {99, "x.Y!", "x.Y!"},           // an unknown type takes anything
        {KelANTitleCase, "mary-ann o'neil", "Mary-ann O'neil"},  // only after a space
        {KelANTitleCase, " x", " X"},
        {KelANTitleCase, "a  b", "A  B"},
    };
    int n = 0;
    for (const Case& c : cases) {
        HostedControl& a = add("t" + std::to_string(n++));
        set(a, "TextType", Variant(c.type));
        form.focus(&a);
        type(c.typed);
        EXPECT_EQ(text(a), c.expected) << "type " << c.type << " typing '" << c.typed << "'";
        EXPECT_EQ(caret(a), static_cast<int32_t>(std::string(c.expected).size()));
    }
}

// Overwrite mode: alpha_typing.kfs types over a digits box; the rule for every type is
// OverwriteEmulation in alpha_rules_test.cpp.

// ---- caret after a change ---------------------------------------------------------------------------

TEST_F(AlphaTest, CaretAfterBackspaceAndDelete) {
    HostedControl& a = add();
    set(a, "TextType", Variant(int32_t{KelANUserKeys}));
    set(a, "Text", Variant("abcdefg"));
    form.focus(&a);

    form.select(a, 3, 2);  // Backspace over a selection that starts at 3
    key("Backspace");
    EXPECT_EQ(text(a), "abcfg");
    EXPECT_EQ(caret(a), 2);

    form.select(a, 4, 0);  // Backspace alone: the caret stays where the character was
    key("Backspace");
    EXPECT_EQ(text(a), "abcg");
    EXPECT_EQ(caret(a), 3);

    form.select(a, 1, 0);  // Delete: where the edit box leaves it
    key("Delete");
    EXPECT_EQ(text(a), "acg");
    EXPECT_EQ(caret(a), 1);

    form.select(a, 0, 0);  // Backspace at the start changes nothing and fails nothing
    key("Backspace");
    EXPECT_EQ(text(a), "acg");
    EXPECT_TRUE(rec.errors.empty());
}

TEST_F(AlphaTest, ChangeHandlerSeesTheCaretAlreadyPlaced) {
    // The form's Change handler reads SelStart: by then the caret stands where the keystroke
    // leaves it, whether the filter wrote the text (title case) or the edit box did.
    struct Case {
        int32_t type;
        const char* start;
        int32_t caret;
        const char* key;
        int32_t seen;
    } cases[] = {
        {KelANTitleCase, "ab", 1, "x", 2},
        {KelANUpperCase, "ab", 1, "x", 2},
        {KelANUserKeys, "abc", 2, "Backspace", 1},
        {KelANUserKeys, "abc", 1, "Delete", 1},
    };
    int n = 0;
    for (const Case& c : cases) {
        HostedControl& a = add("h" + std::to_string(n++));
        set(a, "TextType", Variant(c.type));
        set(a, "Text", Variant(c.start));
        form.focus(&a);
        form.select(a, c.caret, 0);
        std::vector<int32_t> seen;
        rec.on_event = [&](std::string_view event, std::span<EventArg>) {
            if (event == "Change") seen.push_back(caret(a));
        };
        key(c.key);
        rec.on_event = nullptr;
        EXPECT_EQ(seen, std::vector<int32_t>{c.seen}) << c.start << " " << c.key;
    }
}

TEST_F(AlphaTest, LongTextKeepsTheCaretRight) {
    HostedControl& a = add();
    set(a, "TextType", Variant(int32_t{KelANUpperCase}));
    set(a, "Text", Variant(std::string(40000, 'A')));
    form.focus(&a);
    form.select(a, 39000, 0);
    type("b");
    EXPECT_EQ(caret(a), 39001);
    EXPECT_EQ(text(a).substr(38999, 3), "ABA");
    key("Backspace");
    EXPECT_EQ(caret(a), 39000);
}

// ---- focus ---------------------------------------------------------------------------------------------

TEST_F(AlphaTest, EnterFocusSelectsTheText) {
    struct Case {
        bool text_select;
        const char* text;
        int32_t sel_length;
    } cases[] = {{true, "abc", 3}, {true, "", 0}, {false, "abc", 0}};
    int n = 0;
    for (const Case& c : cases) {
        HostedControl& a = add("f" + std::to_string(n++));
        set(a, "TextSelect", Variant(c.text_select));
        set(a, "Text", Variant(c.text));
        form.focus(nullptr);
        form.focus(&a);
        EXPECT_EQ(peek(a, "TxtCustom", "SelLength"), Variant(c.sel_length)) << c.text;
        EXPECT_EQ(caret(a), 0);
    }
}

TEST_F(AlphaTest, DigitsClampWhenFocusLeaves) {
    struct Case {
        int32_t type;
        Variant max, min;
        const char* text;
        const char* expected;
    } cases[] = {
        {KelANDigits, Variant(int16_t{0}), Variant(int16_t{0}), "750", "750"},  // no limits
        {KelANDigits, Variant(int16_t{500}), Variant(int16_t{10}), "250", "250"},
        {KelANDigits, Variant(int16_t{2000}), Variant(int16_t{0}), "1 500", "1 500"},
        {KelANDigits, Variant(int16_t{1000}), Variant(int16_t{0}), "1 500", "1000"},
        // Exactly on a bound is inside the range: the text stays as typed.
        {KelANDigits, Variant(int16_t{500}), Variant(int16_t{10}), "0500", "0500"},
        {KelANDigits, Variant(int16_t{500}), Variant(int16_t{10}), "010", "010"},
        // Limits given as text are compared by value and written back as given.
        {KelANDigits, Variant("1000"), Variant(int16_t{0}), "900", "900"},
        {KelANDigits, Variant(2.5), Variant(int16_t{0}), "3", "2.5"},
        {KelANDigits, Variant(int16_t{0}), Variant("50"), "9", "50"},
        {KelANDigits, Variant("abc"), Variant(int16_t{0}), "900", "900"},
        // Only a digits box is clamped.
        {KelANUpperCase, Variant(int16_t{5}), Variant(int16_t{0}), "99", "99"},
        {KelANTitleCase, Variant(int16_t{5}), Variant(int16_t{50}), "9", "9"},
    };
    int n = 0;
    for (const Case& c : cases) {
        HostedControl& a = add("c" + std::to_string(n++));
        set(a, "TextType", Variant(c.type));
        set(a, "MaxValue", c.max);
        set(a, "MinValue", c.min);
        set(a, "Text", Variant(c.text));
        form.focus(&a);
        form.focus(nullptr);
        EXPECT_EQ(text(a), c.expected) << c.text;
    }
}

// ---- properties ----------------------------------------------------------------------------------------

TEST_F(AlphaTest, MaxLengthSetter) {
    struct Case {
        Variant given;
        int32_t expected;
        bool announced;
    } cases[] = {
        {Variant("abc"), 7, false},  {Variant("3.5"), 4, true},   {Variant("2.5"), 2, true},
        {Variant(12.5), 12, true},   {Variant(13.5), 14, true},   {Variant(), 0, true},
        {Variant(""), 7, false},     {Variant("."), 7, false},    {Variant(int16_t{-3}), 7, true},
        {Variant(1e12), 7, true},    {Variant(" 9 "), 9, true},
    };
    for (const Case& c : cases) {
        HostedControl& a = form.create(cls, "m" + std::to_string(&c - cases));
        set(a, "MaxLength", Variant(int16_t{7}));
        rec.changed.clear();
        EXPECT_NO_THROW(set(a, "MaxLength", c.given));
        EXPECT_EQ(get(a, "MaxLength"), Variant(c.expected)) << &c - cases;
        EXPECT_EQ(!rec.changed.empty(), c.announced) << &c - cases;
    }
}

TEST_F(AlphaTest, DesignTimeWidthFollowsMaxLength) {
    struct Case {
        bool running;
        double font_size;
        Variant max_length;
        float width;
    } cases[] = {
        {false, 9, Variant(int16_t{60}), 7280},   {false, 9.5, Variant(int16_t{10}), 1280},
        {false, 10, Variant(int16_t{10}), 1200},  {false, 9, Variant("abc"), 1200},
        {false, 9, Variant(int16_t{-1}), 80},
    };
    int n = 0;
    for (const Case& c : cases) {
        form.set_user_mode(c.running);
        HostedControl& a = add("w" + std::to_string(n++));
        ctl(a).Font(std::make_shared<Font>("Fixedsys", c.font_size));
        set(a, "MaxLength", c.max_length);
        EXPECT_EQ(peek(a, "surface", "Width"), Variant(c.width)) << n - 1;
        EXPECT_EQ(peek(a, "surface", "Height"), Variant(300.0f));
    }
}

// ---- persistence ----------------------------------------------------------------------------------------

TEST_F(AlphaTest, SaveWritesInOrderWithItsOwnSpellings) {
    HostedControl& a = add();
    set(a, "TextType", Variant(int32_t{4}));
    set(a, "Borderstyle", Variant(int16_t{0}));
    set(a, "ForeColor", Variant(int32_t{0x123456}));
    set(a, "BackColor", Variant(int32_t{0x00FF00}));
    set(a, "MaxLength", Variant(int16_t{8}));
    set(a, "Text", Variant("4711"));
    set(a, "Enabled", Variant(false));
    set(a, "Locked", Variant(true));
    set(a, "TextSelect", Variant(false));
    const mini::StoredValues saved = form.save(a);
    std::vector<std::string> keys;
    for (const auto& [k, v] : saved) keys.push_back(k);
    const std::vector<std::string> expected = {"BorderStyle", "TextType", "Forecolor", "Backcolor", "Font",
                                               "MaxLength",   "Text",     "Locked",    "Enabled",   "TextSelect"};
    EXPECT_EQ(keys, expected);

    // alpha_properties.kfs loads such a store back and saves it again.
}

TEST_F(AlphaTest, LoadMatchesKeysWithoutRegardToCaseAndSkipsBadValues) {
    HostedControl& a = form.load(cls, "a",
                                 {{"FORECOLOR", Variant(int32_t{0xFF})},
                                  {"backcolor", Variant(int32_t{0x00FF00})},
                                  {"BorderStyle", Variant(int16_t{7})},
                                  {"TextType", Variant("abc")},
                                  {"MaxLength", Variant(int16_t{-4})},
                                  {"Font", Variant("not a font")},
                                  {"Text", Variant(int16_t{42})},
                                  {"Locked", Variant("True")}});
    EXPECT_EQ(get(a, "ForeColor"), Variant(int32_t{0xFF}));
    EXPECT_EQ(get(a, "BackColor"), Variant(int32_t{0x00FF00}));
    EXPECT_NE(get(a, "Borderstyle"), Variant(int32_t{7}));
    EXPECT_EQ(get(a, "TextType"), Variant(int32_t{0}));
    EXPECT_EQ(get(a, "MaxLength"), Variant(int32_t{0}));
    EXPECT_EQ(ctl(a).Font()->name, "Fixedsys");
    EXPECT_EQ(get(a, "Text"), Variant("42"));
    EXPECT_EQ(get(a, "Locked"), Variant(true));
    EXPECT_TRUE(rec.errors.empty());
}

TEST_F(AlphaTest, LoadedTextRunsTheChangePath) {
    rec.events.clear();
    HostedControl& a = form.load(cls, "a", {{"Text", Variant("hello")}});
    EXPECT_TRUE(rec.saw("3 Change"));
    EXPECT_EQ(text(a), "hello");
}

}  // namespace
}  // namespace kel

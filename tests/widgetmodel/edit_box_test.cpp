#include "keltext/widgetmodel/edit_box.h"

#include <gtest/gtest.h>

#include "tests/widgetmodel/widget_test_support.h"

namespace kel::model {
namespace {

using testing_support::act;
using testing_support::RecordingContext;

struct EditCase {
    const char* what;
    const char* text;
    int32_t sel_start, sel_length, max_length;
    std::vector<const char*> actions;
    const char* result;
    int32_t caret, selected;
    int changes;
};

TEST(EditBox, EditsByThePerson) {
    const EditCase cases[] = {
        {"typing inserts at the caret", "ac", 1, 0, 0, {"type:b"}, "abc", 2, 0, 1},
        {"typing replaces the selection", "abcd", 1, 2, 0, {"type:X"}, "aXd", 2, 0, 1},
        {"limit refuses a longer text", "abc", 3, 0, 3, {"type:d"}, "abc", 3, 0, 0},
        {"limit allows a replacing character", "abc", 0, 1, 3, {"type:X"}, "Xbc", 1, 0, 1},
        {"control codes insert nothing", "ab", 1, 0, 0, {"press:1", "press:13", "press:27"}, "ab", 1, 0, 0},
        {"code 0 does nothing", "ab", 1, 0, 0, {"press:0", "down:0"}, "ab", 1, 0, 0},
        {"high characters are typed", "", 0, 0, 0, {"press:201"}, "\xC9", 1, 0, 1},
        {"codes past a byte insert nothing", "", 0, 0, 0, {"press:300", "press:-5"}, "", 0, 0, 0},
        {"backspace deletes before the caret", "abc", 2, 0, 0, {"press:8"}, "ac", 1, 0, 1},
        {"backspace at the start does nothing", "abc", 0, 0, 0, {"press:8"}, "abc", 0, 0, 0},
        {"delete removes after the caret", "abc", 1, 0, 0, {"down:46"}, "ac", 1, 0, 1},
        {"delete removes the selection", "abcd", 0, 3, 0, {"down:46"}, "d", 0, 0, 1},
        {"delete at the end does nothing", "abc", 3, 0, 0, {"down:46"}, "abc", 3, 0, 0},
        {"left moves one back", "abc", 2, 0, 0, {"down:37"}, "abc", 1, 0, 0},
        {"left with a selection goes to its start", "abcd", 1, 2, 0, {"down:37"}, "abcd", 1, 0, 0},
        {"right with a selection goes to its end", "abcd", 1, 2, 0, {"down:39"}, "abcd", 3, 0, 0},
        {"right at the end stays", "ab", 2, 0, 0, {"down:39"}, "ab", 2, 0, 0},
        {"home", "abcd", 2, 1, 0, {"down:36"}, "abcd", 0, 0, 0},
        {"end", "abcd", 0, 2, 0, {"down:35"}, "abcd", 4, 0, 0},
        {"paste replaces the selection", "abcd", 1, 2, 0, {"paste:XYZ"}, "aXYZd", 4, 0, 1},
        {"paste is cut to the limit", "abc", 1, 0, 5, {"paste:WXYZ"}, "aWXbc", 3, 0, 1},
        {"paste with no room inserts nothing", "abc", 3, 0, 3, {"paste:Z"}, "abc", 3, 0, 0},
        {"paste is unfiltered", "", 0, 0, 0, {"paste:\t\x01"}, "\t\x01", 2, 0, 1},
        {"a text over the limit can still shrink", "abcdef", 6, 0, 3, {"press:8", "type:x"}, "abcde", 5, 0, 1},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        RecordingContext ctx;
        EditBoxModel box(ctx, "txt", 1, 1000, 300);
        box.Text(c.text);
        box.MaxLength(c.max_length);
        box.SelStart(c.sel_start);
        box.SelLength(c.sel_length);
        int changes = 0;
        WidgetEvents ev;
        ev.change = [&] { ++changes; };
        box.set_events(ev);
        for (const char* a : c.actions) act(box, a);
        EXPECT_EQ(box.Text(), c.result);
        EXPECT_EQ(box.SelStart(), c.caret);
        EXPECT_EQ(box.SelLength(), c.selected);
        EXPECT_EQ(changes, c.changes);
    }
}

TEST(EditBox, HandlerSeesTheKeyFirstAndMayChangeOrDropIt) {
    RecordingContext ctx;
    EditBoxModel box(ctx, "txt", 1, 1000, 300);
    std::vector<std::string> log;
    WidgetEvents ev;
    ev.key_press = [&](int16_t& k) {
        log.push_back("press " + box.Text());
        if (k == 'a') k = 'B';
        if (k == 'x') k = 0;
    };
    ev.key_down = [&](int16_t& k, int16_t&) {
        if (k == kVkDelete) k = 0;  // the owner takes Delete for itself
    };
    ev.change = [&] { log.push_back("change " + box.Text()); };
    box.set_events(ev);
    act(box, "type:axc");
    act(box, "down:37");
    act(box, "down:46");
    EXPECT_EQ(box.Text(), "Bc");
    EXPECT_EQ((std::vector<std::string>{"press ", "change B", "press B", "press B", "change Bc"}), log);
}

TEST(EditBox, ProgramSettersAndTheirErrors) {
    RecordingContext ctx;
    EditBoxModel box(ctx, "txt", 1, 1000, 300);
    int changes = 0;
    WidgetEvents ev;
    ev.change = [&] { ++changes; };
    box.set_events(ev);

    box.Text("hello");
    box.SelStart(3);
    box.Text("hello");  // the same text: nothing at all
    EXPECT_EQ(changes, 1);
    EXPECT_EQ(box.SelStart(), 3);
    box.Text("world");
    EXPECT_EQ(changes, 2);
    EXPECT_EQ(box.SelStart(), 0);

    box.SelStart(99);
    EXPECT_EQ(box.SelStart(), 5);
    box.SelStart(2);
    box.SelLength(99);
    EXPECT_EQ(box.SelLength(), 3);
    EXPECT_EQ(box.SelText(), "rld");
    box.SelStart(1);  // a new caret empties the selection
    EXPECT_EQ(box.SelLength(), 0);

    const struct {
        const char* member;
        Variant value;
        int error;
    } bad[] = {
        {"SelStart", int32_t{-1}, 380}, {"SelLength", int16_t{-2}, 380}, {"MaxLength", int32_t{-1}, 380},
        {"Width", -1.0, 380},          {"SelStart", "x", 13},           {"hWnd", int32_t{5}, 383},
        {"Nonsense", int32_t{1}, 438},
    };
    box.MaxLength(4);
    for (const auto& b : bad) {
        SCOPED_TRACE(b.member);
        try {
            box.poke(b.member, b.value);
            ADD_FAILURE() << "no error";
        } catch (const RuntimeError& e) {
            EXPECT_EQ(e.number(), b.error);
        }
    }
    EXPECT_EQ(box.MaxLength(), 4);  // the limit is kept
    EXPECT_EQ(box.SelStart(), 1);
    EXPECT_EQ(box.Width(), 1000.0f);
}

TEST(EditBox, MembersByNameAndTheirErrors) {
    RecordingContext ctx;
    EditBoxModel box(ctx, "txt", 77, 1000, 300);
    EXPECT_EQ(box.peek("hwnd"), Variant(int32_t{77}));
    EXPECT_EQ(font_of(box.peek("Font"))->name, "Fixedsys");
    EXPECT_EQ(*find_member(box, "selstart"), "SelStart");
    EXPECT_EQ(*find_notification(box, "keypress"), "KeyPress");
    EXPECT_FALSE(find_notification(box, "DropDown").has_value());

    // An unknown member is 438 before anything else; an index on a plain member is 381.
    const struct {
        const char* member;
        std::optional<int32_t> index;
        int error;
    } bad[] = {{"Text", 0, 381}, {"Bogus", 0, 438}, {"Bogus", std::nullopt, 438}, {"List", 0, 438}};
    for (const auto& b : bad) {
        SCOPED_TRACE(b.member);
        try {
            (void)box.peek(b.member, b.index);
            ADD_FAILURE() << "no error";
        } catch (const RuntimeError& e) {
            EXPECT_EQ(e.number(), b.error);
        }
    }
}

TEST(EditBox, HandlerErrorsAreReportedAndTheBoxGoesOn) {
    RecordingContext ctx;
    EditBoxModel box(ctx, "txt", 1, 1000, 300);
    WidgetEvents ev;
    ev.key_press = [](int16_t&) { raise_error(kTypeMismatch); };
    ev.change = [] { raise_error(kOverflow); };
    box.set_events(ev);
    act(box, "type:a");
    EXPECT_EQ(box.Text(), "a");
    EXPECT_EQ((std::vector<std::string>{"txt.KeyPress 13", "txt.Change 6"}), ctx.errors);
}

}  // namespace
}  // namespace kel::model

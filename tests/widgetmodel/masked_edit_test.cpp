#include "keltext/widgetmodel/masked_edit.h"

#include <gtest/gtest.h>

#include "tests/widgetmodel/widget_test_support.h"

namespace kel::model {
namespace {

using testing_support::act;
using testing_support::RecordingContext;

struct MaskCase {
    const char* what;
    const char* mask;
    const char* text;  // as shown, laid with the empty mask first
    int32_t sel_start, sel_length;
    std::vector<const char*> actions;
    const char* result;
    int32_t caret;
    int changes;
};

TEST(MaskedEdit, TypingAndDeleting) {
    const char* date = "##/##/####";
    const MaskCase cases[] = {
        {"digits fill and the caret passes the literal", date, "", 0, 0, {"type:05"}, "05/__/____", 3, 2},
        {"a character typed on a literal goes past it", date, "", 2, 0, {"type:1"}, "__/1_/____", 4, 1},
        {"a letter does not fit #", date, "", 0, 0, {"type:a"}, "__/__/____", 0, 0},
        {"typing overwrites", date, "05/12/2003", 0, 1, {"type:9"}, "95/12/2003", 1, 1},
        {"typing the same character changes nothing", date, "05/12/2003", 0, 0, {"type:0"}, "05/12/2003", 1, 0},
        {"nothing fits after the end", date, "05/12/2003", 10, 0, {"type:1"}, "05/12/2003", 10, 0},
        {"delete closes up the field", date, "05/12/2003", 0, 0, {"down:46"}, "5_/12/2003", 0, 1},
        {"delete twice empties the day", date, "05/12/2003", 0, 0, {"down:46", "down:46"}, "__/12/2003", 0, 2},
        {"delete on a literal takes the next field's first", date, "05/12/2003", 2, 0, {"down:46"}, "05/2_/2003", 3, 1},
        {"delete of a prompt at a field end changes nothing", date, "05/1_/2003", 4, 0, {"down:46"}, "05/1_/2003", 4, 0},
        {"delete at the end does nothing", date, "05/12/2003", 10, 0, {"down:46"}, "05/12/2003", 10, 0},
        {"delete of a selection closes each field", date, "05/12/2003", 0, 5, {"down:46"}, "__/__/2003", 0, 1},
        {"delete of part of a field", date, "05/12/2003", 6, 2, {"down:46"}, "05/12/03__", 6, 1},
        {"backspace behind a literal", date, "05/12/2003", 3, 0, {"press:8"}, "0_/12/2003", 1, 1},
        {"backspace inside a field", date, "05/12/2003", 8, 0, {"press:8"}, "05/12/203_", 7, 1},
        {"backspace at the start does nothing", date, "05/12/2003", 0, 0, {"press:8"}, "05/12/2003", 0, 0},
        {"home, two deletes and digits", date, "45/12/2003", 4, 0, {"down:36", "down:46", "down:46", "type:05"},
         "05/12/2003", 3, 4},
        {"? takes a letter, not a digit", "##/##?", "05/03_", 5, 0, {"type:7", "type:a"}, "05/03a", 6, 1},
        {"a takes letters and digits, not blanks", "##/##a", "05/03_", 5, 0, {"type: ", "type:7"}, "05/037", 6, 1},
        {"& takes a blank", "##/##&", "05/03_", 5, 0, {"type: "}, "05/03 ", 6, 1},
        {"delete moves a letter only where it fits", "##/##a", "05/03A", 3, 0, {"down:46"}, "05/3_A", 3, 1},
        {"backspace moves a letter only where it fits", "##/##a", "05/03A", 4, 0, {"press:8"}, "05/3_A", 3, 1},
        {"control codes insert nothing", date, "", 0, 0, {"press:9", "press:13"}, "__/__/____", 0, 0},
        {"paste types what fits", date, "", 0, 0, {"paste:1x2/2003"}, "12/20/03__", 8, 1},
        {"the empty mask is a plain box", "", "12/x", 4, 0, {"type:yz", "press:8"}, "12/xy", 5, 3},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        RecordingContext ctx;
        MaskedEditModel box(ctx, "msk", 1, 1200, 300);
        box.Mask("");
        box.Text(c.text);
        box.Mask(c.mask);
        box.SelStart(c.sel_start);
        box.SelLength(c.sel_length);
        int changes = 0;
        WidgetEvents ev;
        ev.change = [&] { ++changes; };
        box.set_events(ev);
        for (const char* a : c.actions) act(box, a);
        EXPECT_EQ(box.Text(), c.result);
        EXPECT_EQ(box.SelStart(), c.caret);
        EXPECT_EQ(box.SelLength(), 0);
        EXPECT_EQ(changes, c.changes);
    }
}

TEST(MaskedEdit, SettingTheMaskLaysTheTextIn) {
    struct Case {
        const char* text;
        const char* mask;
        const char* result;
    };
    const Case cases[] = {
        {"  /  /    ", "##/##/####", "__/__/____"}, {"01/01/    ", "##/##/####", "01/01/____"},
        {"05/03A", "##/##&", "05/03A"},
        {" 0503 ", "##/##&", "_0/03 "},  // position by position
        {"ab", "##/##", "__/__"}, {"1", "##/##", "1_/__"}, {"12/34/5678", "", "12/34/5678"},
        {"05/03A", "##/##a", "05/03A"}, {"05/03 ", "##/##a", "05/03_"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(testing::Message() << '"' << c.text << "\" into \"" << c.mask << '"');
        RecordingContext ctx;
        MaskedEditModel box(ctx, "msk", 1, 1200, 300);
        box.Text(c.text);
        int changes = 0;
        WidgetEvents ev;
        ev.change = [&] { ++changes; };
        box.set_events(ev);
        box.Mask(c.mask);
        EXPECT_EQ(box.Text(), c.result);
        EXPECT_EQ(box.Mask(), c.mask);
        EXPECT_EQ(changes, 0);
    }
}

TEST(MaskedEdit, TextUnderAMaskMustBeOneTheMaskShows) {
    RecordingContext ctx;
    MaskedEditModel box(ctx, "msk", 1, 1200, 300);
    box.Mask("##/##/####");
    box.Text("12/05/2003");
    EXPECT_EQ(box.Text(), "12/05/2003");
    box.Text("__/05/____");
    EXPECT_EQ(box.Text(), "__/05/____");
    for (const char* bad : {"1205", "12-05-2003", "ab/cd/efgh", "12/05/20031", ""}) {
        SCOPED_TRACE(bad);
        try {
            box.Text(bad);
            ADD_FAILURE() << "no error";
        } catch (const RuntimeError& e) {
            EXPECT_EQ(e.number(), 380);
        }
        EXPECT_EQ(box.Text(), "__/05/____");
    }
    EXPECT_EQ(box.peek("Mask"), Variant("##/##/####"));
    box.poke("Mask", "");
    box.poke("Text", "anything at all");
    EXPECT_EQ(box.Text(), "anything at all");
}

}  // namespace
}  // namespace kel::model

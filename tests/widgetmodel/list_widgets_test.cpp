#include "keltext/widgetmodel/list_widgets.h"

#include <gtest/gtest.h>

#include <functional>

#include "keltext/widgetmodel/buttons.h"
#include "tests/widgetmodel/widget_test_support.h"

namespace kel::model {
namespace {

using testing_support::act;
using testing_support::RecordingContext;

std::vector<std::string> entries(const ListWidget& w) {
    std::vector<std::string> out;
    for (int32_t i = 0; i < w.ListCount(); ++i) out.push_back(w.List(i));
    return out;
}

TEST(ComboBox, SortedInsertionByUpperCasedText) {
    RecordingContext ctx;
    ComboBoxModel c(ctx, "cbo", 1, 1200, 300);
    c.Sorted(true);
    struct Step {
        const char* item;
        int32_t new_index;
    };
    const Step steps[] = {{"banana", 0}, {"Cherry", 1}, {"apple", 0}, {"Apple", 1}, {"\xE9t\xE9", 4}, {"B", 2}};
    for (const auto& s : steps) {
        SCOPED_TRACE(s.item);
        c.AddItem(s.item);
        EXPECT_EQ(c.NewIndex(), s.new_index);
    }
    EXPECT_EQ(entries(c), (std::vector<std::string>{"apple", "Apple", "B", "banana", "Cherry", "\xE9t\xE9"}));
    c.AddItem("zz", 0);  // an index given is honoured, sorted or not
    EXPECT_EQ(c.List(0), "zz");
}

TEST(ComboBox, TurningSortedOnSortsAndKeepsTheSelection) {
    RecordingContext ctx;
    ComboBoxModel c(ctx, "cbo", 1, 1200, 300);
    for (const char* s : {"c", "a", "b"}) c.AddItem(s);
    c.ListIndex(0);
    c.poke("Sorted", true);
    EXPECT_EQ(entries(c), (std::vector<std::string>{"a", "b", "c"}));
    EXPECT_EQ(c.ListIndex(), 2);
}

TEST(ListWidgets, IndexesOutOfRangeAre381) {
    RecordingContext ctx;
    ComboBoxModel combo(ctx, "cbo", 1, 1200, 300);
    ListBoxModel list(ctx, "lst", 2, 1200, 300);
    for (ListWidget* w : std::initializer_list<ListWidget*>{&combo, &list}) {
        for (const char* s : {"a", "b", "c"}) w->AddItem(s);
        const std::function<void()> bad[] = {
            [&] { w->ListIndex(-2); },       [&] { w->ListIndex(3); },     [&] { w->RemoveItem(3); },
            [&] { w->RemoveItem(-1); },      [&] { (void)w->List(-1); },   [&] { (void)w->List(3); },
            [&] { w->List(3, "x"); },        [&] { (void)w->ItemData(5); }, [&] { w->ItemData(-1, 2); },
            [&] { w->AddItem("x", 4); },     [&] { w->AddItem("x", -1); },
        };
        for (std::size_t i = 0; i < std::size(bad); ++i) {
            SCOPED_TRACE(i);
            try {
                bad[i]();
                ADD_FAILURE() << "no error";
            } catch (const RuntimeError& e) {
                EXPECT_EQ(e.number(), 381);
            }
        }
        EXPECT_EQ(entries(*w), (std::vector<std::string>{"a", "b", "c"}));
        EXPECT_EQ(w->ListIndex(), -1);
        w->AddItem("end", 3);  // appending by index is allowed
        EXPECT_EQ(w->NewIndex(), 3);
    }
    EXPECT_THROW(list.peek("List"), RuntimeError);  // an indexed member needs its index
    EXPECT_THROW(list.poke("ListCount", int32_t{1}), RuntimeError);
}

TEST(ComboBox, ListIndexPutsTheEntryInWithoutChangeAndRaisesClick) {
    RecordingContext ctx;
    ComboBoxModel c(ctx, "cbo", 1, 1200, 300);
    std::vector<std::string> log;
    WidgetEvents ev;
    ev.change = [&] { log.push_back("change"); };
    ev.click = [&] { log.push_back("click " + c.Text()); };
    c.set_events(ev);
    for (const char* s : {"Apple", "Banana", "Cherry"}) c.AddItem(s);
    c.ItemData(1, 42);
    c.ListIndex(1);
    EXPECT_EQ(c.Text(), "Banana");
    EXPECT_EQ(c.SelLength(), 6);
    c.ListIndex(-1);
    EXPECT_EQ(c.Text(), "Banana");
    EXPECT_EQ(log, (std::vector<std::string>{"click Banana"}));

    // Up and Down step within the list, from -1 to the first entry.
    const struct {
        int16_t key;
        int32_t index;
    } keys[] = {{kVkDown, 0}, {kVkUp, 0}, {kVkDown, 1}, {kVkDown, 2}, {kVkDown, 2}, {kVkUp, 1}};
    for (const auto& k : keys) {
        c.user_key_down(k.key, 0);
        EXPECT_EQ(c.ListIndex(), k.index);
    }
    EXPECT_EQ(c.Text(), "Banana");
    EXPECT_EQ(c.ItemData(1), 42);
    c.ListIndex(1);
    EXPECT_EQ(log.back(), "click Banana");  // picked again: Click again
    EXPECT_EQ(log.size(), 6u);

    // List edits move the selection as a list box does and leave the text alone.
    c.AddItem("Avocado", 0);
    EXPECT_EQ(c.ListIndex(), 2);
    c.RemoveItem(2);
    EXPECT_EQ(c.ListIndex(), -1);
    EXPECT_EQ(c.Text(), "Banana");
    c.Clear();
    EXPECT_EQ(c.ListCount(), 0);
}

TEST(ComboBox, ListIndexFollowsTheEditText) {
    RecordingContext ctx;
    ComboBoxModel c(ctx, "cbo", 1, 1200, 300);
    std::vector<int32_t> seen_by_change;
    int clicks = 0;
    WidgetEvents ev;
    ev.change = [&] { seen_by_change.push_back(c.ListIndex()); };
    ev.click = [&] { ++clicks; };
    c.set_events(ev);
    for (const char* s : {"Cash", "", "Cheque", "cheque"}) c.AddItem(s);
    const struct {
        const char* what;
        int32_t index;
    } steps[] = {
        {"text:CHEQUE", 2},     // ignoring case, the first entry that equals it
        {"type:s", -1},         // no entry is "CHEQUEs"
        {"backspace", 2},
        {"text:", -1},          // an empty field is no choice, even beside an empty entry
        {"paste:cash", 0},
        {"text:cas", -1},
    };
    for (const auto& s : steps) {
        SCOPED_TRACE(s.what);
        const std::string_view w = s.what;
        if (w.starts_with("text:")) c.Text(std::string(w.substr(5)));
        else if (w == "backspace") act(c, "press:8");
        else {
            if (w.starts_with("paste:")) c.user_select(0, static_cast<int32_t>(c.Text().size()));
            act(c, s.what);
        }
        EXPECT_EQ(c.ListIndex(), s.index);
        EXPECT_EQ(seen_by_change.back(), s.index);  // already there when Change is raised
    }
    EXPECT_EQ(clicks, 0);
}

TEST(ComboBox, DropDownListStyleTakesNoTyping) {
    RecordingContext ctx;
    ComboBoxModel c(ctx, "cbo", 1, 1200, 300);
    c.poke("Style", int16_t{2});
    c.Text("x");
    act(c, "type:ab");
    act(c, "paste:cd");
    EXPECT_EQ(c.Text(), "x");
    EXPECT_EQ(c.peek("Style"), Variant(int16_t{2}));
    EXPECT_THROW(c.poke("Style", int16_t{3}), RuntimeError);
}

TEST(ListBox, ListIndexRaisesClick) {
    RecordingContext ctx;
    ListBoxModel l(ctx, "lst", 1, 1200, 300);
    int clicks = 0;
    WidgetEvents ev;
    ev.click = [&] { ++clicks; };
    l.set_events(ev);
    l.AddItem("a");
    l.AddItem("b");
    l.poke("ListIndex", int16_t{1});
    l.ListIndex(-1);
    EXPECT_EQ(clicks, 1);
}

TEST(CheckBox, ValueAndClicks) {
    RecordingContext ctx;
    CheckBoxModel b(ctx, "chk", 1, 1200, 300);
    int clicks = 0;
    WidgetEvents ev;
    ev.click = [&] { ++clicks; };
    b.set_events(ev);
    b.Value(1);
    b.Value(1);
    EXPECT_EQ(clicks, 1);
    b.user_click();
    EXPECT_EQ(b.Value(), 0);
    EXPECT_EQ(clicks, 2);
    EXPECT_THROW(b.Value(3), RuntimeError);
    EXPECT_EQ(b.peek("Value"), Variant(int16_t{0}));
}

}  // namespace
}  // namespace kel::model

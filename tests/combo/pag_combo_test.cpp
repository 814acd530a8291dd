// pagCombo on the minimal host: opened on combos, edited as the designer does, applied.
#include "keltext/combo/pag_combo.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

#include "keltext/combo/class_info.h"
#include "keltext/minihost/form.h"

namespace kel {
namespace {

using mini::Form;
using mini::HostedControl;
using Entries = std::vector<std::pair<std::string, int32_t>>;

std::string L(std::string s) {
    for (auto [mark, code] : {std::pair{"[200]", '\xC8'}, std::pair{"[201]", '\xC9'}})
        for (std::size_t p = s.find(mark); p != std::string::npos; p = s.find(mark, p + 1)) s.replace(p, 5, 1, code);
    return s;
}

struct Errors : mini::FormObserver {
    std::vector<std::string> seen;
    void handler_error(std::string_view where, int number) override {
        seen.push_back(std::string(where) + " " + std::to_string(number));
    }
};

class PageTest : public ::testing::Test {
protected:
    PageTest() : form(&errors), combo_class(kel_combo_class()), page_class(pag_combo_class()) {}

    HostedControl& combo(const std::string& name, const std::string& fill_list) {
        return form.load(combo_class, name, {{"FillList", Variant(L(fill_list))}});
    }
    HostedControl& open(std::vector<HostedControl*> selected) {
        return form.open_page(page_class, "pg" + std::to_string(pages++), std::move(selected));
    }
    Variant peek(HostedControl& pg, std::string_view part, std::string_view member) {
        return pg.part(part)->peek(member);
    }
    std::string text(HostedControl& pg, std::string_view part) { return peek(pg, part, "Text").str(); }
    void type_into(HostedControl& pg, std::string_view part, const std::string& t) {
        pg.part(part)->poke("Text", Variant(t));
    }
    void click(HostedControl& pg, std::string_view part) { form.click(pg, *pg.part(part)); }
    Entries entries(HostedControl& pg) {
        Entries out;
        mini::Part& lst = *pg.part("lstList");
        const int32_t n = *lst.peek("ListCount").get_if<int32_t>();
        for (int32_t i = 0; i < n; ++i)
            out.emplace_back(lst.peek("List", i).str(), *lst.peek("ItemData", i).get_if<int32_t>());
        return out;
    }
    int32_t selected(HostedControl& pg) { return *peek(pg, "lstList", "ListIndex").get_if<int32_t>(); }

    Errors errors;
    Form form;
    ClassInfo combo_class, page_class;
    int pages = 0;
};

TEST_F(PageTest, ControlsAsLaidOut) {
    HostedControl& pg = open({&combo("c", "")});
    const std::vector<std::string> order = {"fraList", "lblList", "txtList", "lblItemData", "txtItemData",
                                            "lstList", "cmdAdd", "cmdModify", "cmdRemove", "lblMaxLength",
                                            "txtMaxLength", "chkLocked"};
    std::vector<std::string> names;
    for (auto& [name, part] : pg.parts()) names.push_back(name);
    EXPECT_EQ(names, order);
    EXPECT_EQ(peek(pg, "cmdModify", "Caption"), Variant("&Modify"));
    EXPECT_EQ(peek(pg, "lblMaxLength", "Caption"), Variant("M&axLength:"));
    EXPECT_EQ(peek(pg, "chkLocked", "Caption"), Variant("L&ocked"));
    EXPECT_EQ(peek(pg, "fraList", "Caption"), Variant("AddItems"));
    EXPECT_EQ(peek(pg, "lstList", "Top"), Variant(1635.0f));
    EXPECT_EQ(peek(pg, "cmdModify", "Top"), Variant(742.0f));
    EXPECT_EQ(peek(pg, "txtMaxLength", "Height"), Variant(330.0f));
}

TEST_F(PageTest, OpeningShowsTheCombosValues) {
    HostedControl& c = combo("c", "A[201]1[200]B[201]2[200]");
    c.dispatch().set("MaxLength", Variant(int16_t{12}));
    c.dispatch().set("Locked", Variant(true));
    HostedControl& pg = open({&c});
    EXPECT_EQ(entries(pg), (Entries{{"A", 1}, {"B", 2}}));
    EXPECT_EQ(selected(pg), 0);
    EXPECT_EQ(text(pg, "txtList"), "A");
    EXPECT_EQ(text(pg, "txtItemData"), "1");
    EXPECT_EQ(text(pg, "txtMaxLength"), "12");
    EXPECT_EQ(peek(pg, "chkLocked", "Value"), Variant(int16_t{1}));
    EXPECT_EQ(peek(pg, "page", "Changed"), Variant(true));  // loading the fields marks it
}

TEST_F(PageTest, AddAppendsAndSelects) {
    HostedControl& pg = open({&combo("c", "A[201]1[200]B[201]2[200]")});
    type_into(pg, "txtList", "C");
    type_into(pg, "txtItemData", "3.6");
    click(pg, "cmdAdd");
    EXPECT_EQ(entries(pg), (Entries{{"A", 1}, {"B", 2}, {"C", 4}}));
    EXPECT_EQ(selected(pg), 2);
    EXPECT_EQ(text(pg, "txtItemData"), "4");

    type_into(pg, "txtList", "");
    type_into(pg, "txtItemData", "9");
    click(pg, "cmdAdd");
    EXPECT_EQ(entries(pg).size(), 3u);

    type_into(pg, "txtList", "D");
    type_into(pg, "txtItemData", "abc");
    click(pg, "cmdAdd");
    EXPECT_EQ(entries(pg).back(), (std::pair<std::string, int32_t>{"D", 0}));
}

TEST_F(PageTest, ModifyKeepsThePlace) {
    HostedControl& pg = open({&combo("c", "A[201]1[200]B[201]2[200]C[201]3[200]")});
    pg.part("lstList")->poke("ListIndex", Variant(int32_t{1}));
    EXPECT_EQ(text(pg, "txtList"), "B");
    type_into(pg, "txtList", "Beta");
    type_into(pg, "txtItemData", "-2.5");
    click(pg, "cmdModify");
    EXPECT_EQ(entries(pg), (Entries{{"A", 1}, {"Beta", -2}, {"C", 3}}));
    EXPECT_EQ(selected(pg), -1);
    EXPECT_TRUE(errors.seen.empty());

    // Nothing selected: nothing happens.
    type_into(pg, "txtList", "X");
    click(pg, "cmdModify");
    EXPECT_EQ(entries(pg), (Entries{{"A", 1}, {"Beta", -2}, {"C", 3}}));
}

TEST_F(PageTest, ModifyWithDataThatIsNoNumber) {
    HostedControl& pg = open({&combo("c", "A[201]1[200]B[201]2[200]")});
    type_into(pg, "txtList", "Alpha");
    type_into(pg, "txtItemData", "7x");
    click(pg, "cmdModify");
    EXPECT_EQ(entries(pg), (Entries{{"Alpha", 0}, {"B", 2}}));
    EXPECT_EQ(errors.seen, (std::vector<std::string>{pg.name() + ".cmdModify.Click 13"}));
}

TEST_F(PageTest, Remove) {
    HostedControl& pg = open({&combo("c", "A[201]1[200]B[201]2[200]C[201]3[200]")});
    click(pg, "cmdRemove");  // A was selected: B becomes the first and is selected
    EXPECT_EQ(entries(pg), (Entries{{"B", 2}, {"C", 3}}));
    EXPECT_EQ(selected(pg), 0);
    EXPECT_EQ(text(pg, "txtList"), "B");

    pg.part("lstList")->poke("ListIndex", Variant(int32_t{1}));
    click(pg, "cmdRemove");  // the entry above the removed one is selected
    EXPECT_EQ(entries(pg), (Entries{{"B", 2}}));
    EXPECT_EQ(selected(pg), 0);

    pg.part("lstList")->poke("ListIndex", Variant(int32_t{-1}));
    click(pg, "cmdRemove");  // nothing selected: nothing removed, the first entry selected
    EXPECT_EQ(entries(pg), (Entries{{"B", 2}}));
    EXPECT_EQ(selected(pg), 0);

    click(pg, "cmdRemove");
    EXPECT_TRUE(entries(pg).empty());
    EXPECT_EQ(text(pg, "txtList"), "");
    EXPECT_EQ(text(pg, "txtItemData"), "");
    click(pg, "cmdRemove");  // an empty list stays empty
    EXPECT_TRUE(errors.seen.empty());
}

TEST_F(PageTest, ApplyWritesTheFirstSelectedControlOnly) {
    HostedControl& c = combo("c", "A[201]1[200]B[201]2[200]");
    HostedControl& d = combo("d", "Q[201]1[200]");
    HostedControl& pg = open({&c, &d});
    type_into(pg, "txtList", "C");
    type_into(pg, "txtItemData", "3");
    click(pg, "cmdAdd");
    type_into(pg, "txtMaxLength", "9");
    pg.part("chkLocked")->poke("Value", Variant(int16_t{1}));
    form.apply_page(pg);
    EXPECT_EQ(c.dispatch().get("FillList"), Variant(L("A[201]1[200]B[201]2[200]C[201]3[200]")));
    EXPECT_EQ(c.dispatch().get("MaxLength"), Variant(int16_t{9}));
    EXPECT_EQ(c.dispatch().get("Locked"), Variant(true));
    EXPECT_EQ(c.dispatch().get("ListCount"), Variant(int16_t{2}));  // rebuilt only on the next load
    EXPECT_EQ(d.dispatch().get("FillList"), Variant(L("Q[201]1[200]")));
    EXPECT_EQ(d.dispatch().get("Locked"), Variant(false));
}

}  // namespace
}  // namespace kel

// pagCombo on the minimal host: opened on combos, edited as the designer does, applied.
#include "keltext/combo/pag_combo.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

#include "keltext/combo/class_info.h"
#include "keltext/minihost/form.h"
#include "tests/combo/fake_list.h"
#include "tests/support/form_recorder.h"

namespace kel {
namespace {

using mini::Form;
using mini::HostedControl;
using Entries = std::vector<std::pair<std::string, int32_t>>;

using test::L;

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
        model::Part& lst = *pg.part("lstList");
        const int32_t n = *lst.peek("ListCount").get_if<int32_t>();
        for (int32_t i = 0; i < n; ++i)
            out.emplace_back(lst.peek("List", i).str(), *lst.peek("ItemData", i).get_if<int32_t>());
        return out;
    }
    int32_t selected(HostedControl& pg) { return *peek(pg, "lstList", "ListIndex").get_if<int32_t>(); }

    testing_support::FormRecorder errors;
    Form form;
    ClassInfo combo_class, page_class;
    int pages = 0;
};

// The golden script page_combo.kfs walks Add, Modify, Remove and Apply with their captions and
// values; these cases cover what it leaves out.

TEST_F(PageTest, AddWithDataThatIsNoNumberStoresZero) {
    HostedControl& pg = open({&combo("c", "A[201]1[200]")});
    type_into(pg, "txtList", "D");
    type_into(pg, "txtItemData", "abc");
    click(pg, "cmdAdd");
    EXPECT_EQ(entries(pg), (Entries{{"A", 1}, {"D", 0}}));
}

TEST_F(PageTest, AddToAFullListIsRefused) {
    std::string whole;
    for (int i = 0; i < 32767; ++i) whole += "E[201]" + std::to_string(i) + "[200]";
    HostedControl& pg = open({&combo("c", whole)});
    type_into(pg, "txtList", "D");
    click(pg, "cmdAdd");
    EXPECT_EQ(errors.errors, (std::vector<std::string>{"pg0.cmdAdd.Click 5"}));
    EXPECT_EQ(*peek(pg, "lstList", "ListCount").get_if<int32_t>(), 32767);
}

TEST_F(PageTest, ModifyWithNothingSelectedDoesNothing) {
    HostedControl& pg = open({&combo("c", "A[201]1[200]B[201]2[200]")});
    pg.part("lstList")->poke("ListIndex", Variant(int32_t{-1}));
    type_into(pg, "txtList", "X");
    click(pg, "cmdModify");
    EXPECT_EQ(entries(pg), (Entries{{"A", 1}, {"B", 2}}));
    EXPECT_TRUE(errors.errors.empty());
}

TEST_F(PageTest, RemoveDownToAnEmptyList) {
    HostedControl& pg = open({&combo("c", "A[201]1[200]B[201]2[200]C[201]3[200]")});
    click(pg, "cmdRemove");  // A was selected: B becomes the first and is selected
    EXPECT_EQ(entries(pg), (Entries{{"B", 2}, {"C", 3}}));
    EXPECT_EQ(selected(pg), 0);
    EXPECT_EQ(text(pg, "txtList"), "B");
    click(pg, "cmdRemove");
    click(pg, "cmdRemove");
    EXPECT_TRUE(entries(pg).empty());
    click(pg, "cmdRemove");  // an empty list stays empty
    EXPECT_TRUE(errors.errors.empty());
}

}  // namespace
}  // namespace kel

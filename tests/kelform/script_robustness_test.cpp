// Scripts made of random pieces and random bytes: the player must report script errors and
// run-time errors, never crash, hang or throw anything else.
#include <gtest/gtest.h>

#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "apps/kelform/script_player.h"
#include "keltext/library/catalogue.h"
#include "tests/kelform/test_box.h"

namespace kel::kelform {
namespace {

const char* const kPieces[] = {
    "new", "load", "save", "set", "get", "call", "peek", "poke", "resize", "focus", "type", "key", "keydown",
    "keyup", "keypress", "insert", "paste", "select", "click", "dblclick", "notify", "mousedown", "mouseup",
    "on", "off", "trace", "echo", "expect", "page", "apply", "mode", "design", "run", "none", "on", "off",
    "events", "sendkeys", "changed", "KelAlphaNumeric", "KelNumeric", "KelDateMask", "KelCombo", "pagCombo",
    "TestBox", "Ghost", "a", "b", "c", "pg", "a.Text", "b.Text", "c.Text", "a.MaxLength", "b.NoOfDecimals",
    "c.List(0)", "c.ListIndex", "c.FillList", "a.TxtCustom.Text", "b.txtNumeric.SelStart", "c.cboCustom",
    "c.cboCustom.DropDown", "b.UpDownNumeric.UpClick", "pg.cmdAdd", "pg.txtList.Text", "pg.lstList.List(0)",
    "pg.page.Changed", "a.surface.Width", "a.KeyPress", "a.Change", "b.KeyDown", "set", "KeyAscii", "KeyCode",
    "0", "1", "-1", "5", "13", "65", "32767", "70000", "1e300", "0x80000011", "12.5", ".5", "empty", "true",
    "u8:5", "i16:-3", "i32:7", "f32:2.5", "f64:1e3", "date:2003-01-31", "font:\"Arial\":12:bold", "error:380",
    "\"\"", "\"abc\"", "\"12/03/2004\"", "\"\\xC9\\x00\\t\"", "\"x\\\"y\"", "FillList=\"A\\xC91\\xC8\"",
    "MaxLength=5", "Text=\"q\"", "Enter", "Tab", "Shift+Tab", "Up", "Down", "Ctrl+Up", "Delete", "Backspace",
    "Insert", "F4", "/", "#", "\"", "(", ")", ".", "=", "\\",
};

std::string random_line(std::mt19937& rng) {
    std::uniform_int_distribution<int> count(0, 6), piece(0, std::size(kPieces) - 1), kind(0, 9),
        byte(0, 255), len(1, 12);
    std::string line;
    int n = count(rng);
    for (int i = 0; i < n; ++i) {
        if (i) line += ' ';
        if (kind(rng) == 0) {
            int l = len(rng);
            for (int j = 0; j < l; ++j) line += static_cast<char>(byte(rng));
        } else {
            line += kPieces[piece(rng)];
        }
    }
    return line;
}

TEST(ScriptRobustness, RandomScriptsEndWithAStatus) {
    Catalogue catalogue;
    std::vector<ClassInfo> classes = catalogue.classes();
    for (ClassInfo& c : testing::test_classes()) classes.push_back(std::move(c));
    // Each script sets the stage first so that later random lines reach the controls.
    const std::string prologue =
        "new KelAlphaNumeric a\nnew KelNumeric b\nload KelCombo c FillList=\"Cash\\xC91\\xC8Bank\\xC92\\xC8\"\n"
        "page pg c\nfocus a\n";
    std::mt19937 rng(20031);
    for (int script = 0; script < 200; ++script) {
        std::string text = prologue;
        for (int line = 0; line < 10; ++line) text += random_line(rng) + '\n';
        std::ostringstream out, err;
        Player whole(classes, out);
        int status = -1;
        EXPECT_NO_THROW(status = whole.run_script(text, "r.kfs", err)) << text;
        EXPECT_TRUE(status >= 0 && status <= 2) << text;
        if (status == 2) {
            EXPECT_EQ(err.str().rfind("r.kfs:", 0), 0u) << err.str();
        }

        // Line by line on one form, going on past script errors, so that later lines meet
        // the state earlier ones left.
        Player player(classes, out);
        EXPECT_EQ(player.run_script(prologue, "p.kfs", err), 0);
        for (int line = 0; line < 60; ++line) {
            std::string l = random_line(rng);
            try {
                player.run_line(l);
            } catch (const ScriptError&) {
                // reported as a script error: what the line deserves
            }
        }
    }
}

TEST(ScriptRobustness, LongLinesAreLinear) {
    std::vector<ClassInfo> classes = testing::test_classes();
    std::ostringstream out, err;
    Player player(classes, out);
    std::string big(200000, '"');
    std::string text = "echo \"" + std::string(200000, 'x') + "\"\n" + "echo " + big + "\n";
    EXPECT_EQ(player.run_script(text, "l.kfs", err), 2);
    EXPECT_EQ(out.str().size(), 200001u);
}

}  // namespace
}  // namespace kel::kelform

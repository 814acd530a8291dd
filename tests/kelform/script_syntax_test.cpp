#include "apps/kelform/script_syntax.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>


namespace kel::kelform {
namespace {

struct ValueCase {
    std::string written;
    std::string printed;
};

TEST(ScriptValues, LiteralsAreTypedAndPrinted) {
    const ValueCase cases[] = {
        {"empty", "empty"}, {"EMPTY", "empty"}, {"true", "bool true"}, {"false", "bool false"},
        {"12", "i16 12"}, {"-7", "i16 -7"}, {"+7", "i16 7"}, {"0007", "i16 7"},
        {"32767", "i16 32767"}, {"-32768", "i16 -32768"}, {"32768", "i32 32768"}, {"-32769", "i32 -32769"},
        {"2147483647", "i32 2147483647"}, {"2147483648", "f64 2147483648"}, {"-2147483648", "i32 -2147483648"},
        {"123456789012345678901234", "f64 1.23456789012346E+23"}, {"0xC00000", "i32 12582912"},
        {"0x80000011", "i32 -2147483631"}, {"0XffFFffFF", "i32 -1"}, {"12.5", "f64 12.5"}, {"1E3", "f64 1000"},
        {".5", "f64 0.5"}, {"5.", "f64 5"}, {"-0.25", "f64 -0.25"}, {"2.5e-1", "f64 0.25"},
        {"\"text\"", "str \"text\""}, {"\"\"", "str \"\""}, {R"("a\"b\\c")", R"(str "a\"b\\c")"},
        {R"("\t\n\r")", R"(str "\x09\x0A\x0D")"}, {R"("\xC9\xc8\x7F\x7E")", R"(str "\xC9\xC8\x7F~")"},
        {R"("# not a comment")", R"(str "# not a comment")"}, {"u8:255", "u8 255"}, {"u8:0xFF", "u8 255"},
        {"i16:0xFFFF", "i16 -1"}, {"i16:-32768", "i16 -32768"}, {"I32:5", "i32 5"},
        {"i32:0x80000000", "i32 -2147483648"}, {"f32:920", "f32 920"}, {"f32:0.1", "f32 0.1"},
        {"f64:2.5", "f64 2.5"}, {"date:2004-02-29", "date 2004-02-29"}, {"date:1899-12-30", "date 1899-12-30"},
        {"date:100-1-1", "date 0100-01-01"}, {R"(font:"Arial":12)", R"(font "Arial" 12)"},
        {R"(font:"Arial":8.25:bold)", R"(font "Arial" 8.25 bold)"},
        {R"(font:"MS Sans Serif":12:italic:bold)", R"(font "MS Sans Serif" 12 bold italic)"},
        {R"(font:"A\"B":9:ITALIC)", R"(font "A\"B" 9 italic)"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.written);
        EXPECT_EQ(format_value(parse_value(c.written)), c.printed);
    }
}

TEST(ScriptValues, MalformedValuesAreScriptErrors) {
    const char* cases[] = {
        "",          "abc",         "1.2.3",          "1e",            "e5",           "-",
        ".",         "0x",          "0x123456789",    "0xG",           "-0x5",         "1e999",
        "12abc",     "u8:256",      "u8:-1",          "u8:1.5",        "u8:0x100",     "i16:32768",
        "i16:0x10000", "i32:2147483648", "i32:",      "f32:1e39",      "f32:abc",      "f64:",
        "date:2003-02-29", "date:2003-13-01", "date:2003/01/31", "date:20030-01-01", "date:2003-01",
        "date:2003-01-31-1", "date:99-01-01", "font:Arial:12", R"(font:"Arial")", R"(font:"Arial":)",
        R"(font:"Arial":0)", R"(font:"Arial":12:bold:bold)", R"(font:"Arial":12:heavy)",
        R"(font:"Arial)", R"("abc"def)", R"("abc)", R"("a\q")", R"("\x4")", R"("\xZZ")", R"("abc\)",
        "error:5", "truex", "nan", "inf", "1_000",
    };
    for (const char* c : cases) {
        SCOPED_TRACE(c);
        EXPECT_THROW(parse_value(c), ScriptError);
    }
}

TEST(ScriptValues, ExpectedErrors) {
    Expected e = parse_expected("error:380");
    ASSERT_TRUE(e.error);
    EXPECT_EQ(*e.error, 380);
    EXPECT_EQ(format_expected(e), "error 380");
    EXPECT_FALSE(parse_expected("i16:3").error);
    EXPECT_THROW(parse_expected("error:"), ScriptError);
    EXPECT_THROW(parse_expected("error:-1"), ScriptError);
    EXPECT_THROW(parse_expected("error:x"), ScriptError);
}

TEST(ScriptValues, PlainAndIndexForms) {
    EXPECT_EQ(format_plain(Variant(int16_t{38})), "38");
    EXPECT_EQ(format_plain(Variant(2.5f)), "2.5");
    EXPECT_EQ(format_plain(Variant(int32_t{-1})), "-1");
    EXPECT_EQ(format_plain(Variant(true)), "bool true");
    EXPECT_EQ(format_index(Variant(int16_t{3})), "3");
    EXPECT_EQ(format_index(Variant("k\x01")), "\"k\\x01\"");
    EXPECT_EQ(format_value(Variant(std::shared_ptr<Object>(std::make_shared<Object>()))), "object");
    EXPECT_EQ(quote(std::string("a\0b", 3)), "\"a\\x00b\"");
}

struct SplitCase {
    std::string line;
    std::vector<std::string> words;
};

TEST(ScriptLines, SplitIntoWords) {
    const SplitCase cases[] = {
        {"", {}},
        {"   \t ", {}},
        {"# only a comment", {}},
        {"echo \"a b\"", {"echo", "\"a b\""}},
        {"  set\tn.Text   5  ", {"set", "n.Text", "5"}},
        {"echo \"a # b\" # comment", {"echo", "\"a # b\""}},
        {"key a#comment", {"key", "a"}},
        {"load KelCombo c FillList=\"Cash \\xC91\\xC8\"", {"load", "KelCombo", "c", "FillList=\"Cash \\xC91\\xC8\""}},
        {"set f.Font font:\"MS Sans\":8", {"set", "f.Font", "font:\"MS Sans\":8"}},
        {"echo \"q\\\"uote\" x", {"echo", "\"q\\\"uote\"", "x"}},
        {"a \"b\"\"c d\"", {"a", "\"b\"\"c d\""}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.line);
        std::vector<std::string> got;
        for (auto w : split_words(c.line)) got.emplace_back(w);
        EXPECT_EQ(got, c.words);
    }
}

TEST(ScriptLines, UnterminatedStringsAreErrors) {
    for (const char* line : {"echo \"abc", "echo \"abc\\\"", "x=\"", "echo \"\\"}) {
        SCOPED_TRACE(line);
        EXPECT_THROW(split_words(line), ScriptError);
    }
}

TEST(ScriptLines, DecodeStringsNeedOneWholeString) {
    EXPECT_EQ(decode_string(R"("a\x41\\")"), "aA\\");
    EXPECT_THROW(decode_string("abc"), ScriptError);
    EXPECT_THROW(decode_string(R"("a"b)"), ScriptError);
}

struct TargetCase {
    std::string word;
    std::vector<std::string> names;
    std::string index;  // "" for none
};

TEST(ScriptLines, Targets) {
    const TargetCase cases[] = {
        {"n.Text", {"n", "Text"}, ""},
        {"c.List(0)", {"c", "List"}, "0"},
        {"pg.lstList.ItemData(i32:2)", {"pg", "lstList", "ItemData"}, "i32:2"},
        {"c.List(\"a)b\")", {"c", "List"}, "\"a)b\""},
        {"n", {"n"}, ""},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.word);
        Target t = parse_target(c.word);
        std::vector<std::string> names(t.names.begin(), t.names.end());
        EXPECT_EQ(names, c.names);
        EXPECT_EQ(t.index ? std::string(*t.index) : "", c.index);
    }
    for (const char* bad : {"n.", ".Text", "n..Text", "n.Te-xt", "c.List(", "c.List()", "c.List(1", "c.(1)", ""}) {
        SCOPED_TRACE(bad);
        EXPECT_THROW(parse_target(bad), ScriptError);
    }
}

TEST(ScriptLines, ShownWordsAreSafeAndShort) {
    EXPECT_EQ(shown("ab\x01\xFF"), "ab\\x01\\xFF");
    EXPECT_EQ(shown(std::string(200, 'x')), std::string(80, 'x') + "...");
}

}  // namespace
}  // namespace kel::kelform

// Form files: parsing, writing, value literals, opening a form and saving it again.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <limits>
#include <sstream>

#include "apps/kelform/demo_form.h"
#include "apps/kelform/form_file.h"
#include "apps/kelform/play.h"
#include "apps/kelform/script_syntax.h"
#include "keltext/host/font.h"
#include "keltext/library/catalogue.h"
#include "keltext/widgetmodel/keyboard.h"

namespace kel::kelform {
namespace {

const std::filesystem::path kSourceRoot = std::filesystem::path(__FILE__).parent_path().parent_path().parent_path();

Date day(int y, int m, int d) { return make_date(y, m, d).value(); }

std::string read_text(const std::filesystem::path& p) {
    std::ifstream in(p, std::ios::binary);
    std::ostringstream s;
    s << in.rdbuf();
    return s.str();
}

class TempDir {
public:
    TempDir() {
        path_ = std::filesystem::temp_directory_path() /
                ("kelform_form_file_" + std::to_string(reinterpret_cast<std::uintptr_t>(this)));
        std::filesystem::create_directories(path_);
    }
    ~TempDir() {
        std::error_code ec;
        std::filesystem::remove_all(path_, ec);
    }
    std::filesystem::path operator/(const std::string& name) const { return path_ / name; }

private:
    std::filesystem::path path_;
};

class FormFileTest : public ::testing::Test {
protected:
    Catalogue catalogue;
    std::span<const ClassInfo> classes() { return catalogue.classes(); }
    SavedForm parse(std::string_view text) { return parse_form(text, "t.kform", classes()); }
};

TEST_F(FormFileTest, DemoFormIsTheShippedExample) {
    EXPECT_EQ(read_text(kSourceRoot / "examples" / "voucher.kform"), std::string(demo_form_text()));
}

TEST_F(FormFileTest, DemoFormOpensAndSavesBackUnchanged) {
    const SavedForm saved = parse(demo_form_text());
    ASSERT_EQ(saved.controls.size(), 7u);
    EXPECT_EQ(saved.title, "Payment voucher");
    mini::Form form;
    open_form(form, saved, classes(), "voucher.kform", day(2026, 12, 6));
    // What the controls store after reading the file is exactly what the file holds.
    EXPECT_EQ(write_form(capture_form(form, saved)), std::string(demo_form_text()));
}

TEST_F(FormFileTest, SavedValuesComeBackAfterReopening) {
    const SavedForm loaded = parse(demo_form_text());
    mini::Form form;
    open_form(form, loaded, classes(), "voucher.kform", day(2026, 12, 6));
    // A person types into the payee box; the alphanumeric box stores its text.
    form.focus(form.find("Payee"));
    for (char c : std::string("jos\xE9 \"q\" \\ x")) form.keystroke(model::keystroke_for_char(static_cast<uint8_t>(c)));
    form.find("PayMode")->dispatch().set("FillList", Variant("A\xC9" "1\xC8" "B\xC9-7\xC8"));
    const Variant typed = form.find("Payee")->dispatch().get("Text");
    ASSERT_EQ(typed.str().size(), 12u);
    const SavedForm saved = capture_form(form, loaded);
    const std::string text = write_form(saved);

    const SavedForm again = parse(text);
    mini::Form reopened;
    open_form(reopened, again, classes(), "again.kform", day(2026, 12, 6));
    EXPECT_EQ(reopened.find("Payee")->dispatch().get("Text"), typed);
    EXPECT_EQ(reopened.find("PayMode")->dispatch().get("ListCount"), Variant(int16_t{2}));
    const SavedForm twice = capture_form(reopened, again);
    ASSERT_EQ(twice.controls.size(), saved.controls.size());
    for (std::size_t i = 0; i < saved.controls.size(); ++i) {
        EXPECT_EQ(twice.controls[i].stored.size(), saved.controls[i].stored.size()) << saved.controls[i].name;
    }
    EXPECT_EQ(write_form(twice), text);
}

TEST_F(FormFileTest, ValueLiteralsReadBackAsTheSameKindAndValue) {
    std::string all_bytes;
    for (int b = 0; b < 256; ++b) all_bytes += static_cast<char>(b);
    const Variant cases[] = {
        Variant(),          Variant(true),           Variant(false),
        Variant(uint8_t{0}), Variant(uint8_t{255}),  Variant(int16_t{-32768}),
        Variant(int16_t{7}), Variant(int32_t{7}),    Variant(int32_t{-40000}),
        Variant(std::numeric_limits<int32_t>::min()), Variant(0.1f), Variant(-2.5f),
        Variant(12.0),      Variant(0.1),            Variant(-1234567.891),
        Variant(5e-324),    Variant(1.7976931348623157e308), Variant(5000000.0),
        Variant(Date{0}),   Variant(day(2003, 1, 31)), Variant(""), Variant(all_bytes),
    };
    for (const Variant& v : cases) {
        const std::string literal = value_literal(v);
        EXPECT_EQ(parse_value(literal), v) << literal;
    }
    // Colours are written as their bit pattern and read back as 32-bit numbers.
    EXPECT_EQ(value_literal(Variant(int32_t{0xC00000}), "Forecolor"), "0xC00000");
    EXPECT_EQ(parse_value(value_literal(Variant(int32_t(0x80000011u)), "BackColor")), Variant(int32_t(0x80000011u)));
    EXPECT_EQ(value_literal(Variant(5000000.0)), "f64:5000000");

    const auto font = std::make_shared<Font>("Courier \"New\"", 10.5, true, true);
    const std::string literal = value_literal(Variant(font));
    const auto back = font_of(parse_value(literal));
    ASSERT_TRUE(back) << literal;
    EXPECT_TRUE(back->same_as(*font)) << literal;
}

TEST_F(FormFileTest, BadFilesNameTheLine) {
    struct Case {
        const char* text;
        const char* message;  // the whole "t.kform:LINE: message"
    };
    const Case cases[] = {
        {"control KelNumeric a\n", "t.kform:1: the file must begin with a 'form' line"},
        {"# nothing\n", "t.kform:2: the file has no 'form' line"},
        {"form \"F\"\nform \"G\"\n", "t.kform:2: a second 'form' line"},
        {"form F\n", "t.kform:1: the title must be a quoted string"},
        {"form \"F\"\nwibble 3\n", "t.kform:2: unknown statement 'wibble'"},
        {"form \"F\"\ncontrol KelFoo a\n", "t.kform:2: unknown class 'KelFoo'"},
        {"form \"F\"\ncontrol pagCombo a\n", "t.kform:2: 'pagCombo' is a property page, not a control"},
        {"form \"F\"\ncontrol KelNumeric 2-a\n", "t.kform:2: '2-a' is not a name (letters, digits and _)"},
        {"form \"F\"\ncontrol KelNumeric a\nat 1 1\nend\ncontrol KelCombo A\n",
         "t.kform:5: a control named 'a' is already on the form (line 2)"},
        {"form \"F\"\ncontrol KelNumeric a\nat 1 1\n", "t.kform:2: control 'a' has no 'end'"},
        {"form \"F\"\ncontrol KelNumeric a\nend\n", "t.kform:3: control 'a' has no 'at' line (its place on the form)"},
        {"form \"F\"\ncontrol KelNumeric a\nat 0 1\n", "t.kform:3: row and column are whole numbers from 1 to 999"},
        {"form \"F\"\ncontrol KelNumeric a\nat 1\n", "t.kform:3: 'at' takes a row and a column"},
        {"form \"F\"\ncontrol KelNumeric a\nsize 100 -3\n", "t.kform:3: width and height are numbers of twips above 0"},
        {"form \"F\"\nstore Text \"x\"\n", "t.kform:2: 'store' outside a control"},
        {"form \"F\"\ncontrol KelNumeric a\nstore Maxvalue 1\nstore MAXVALUE 2\n",
         "t.kform:4: 'MAXVALUE' is stored twice"},
        {"form \"F\"\ncontrol KelNumeric a\nstore Maxvalue 1x\n", "t.kform:3: malformed value '1x'"},
        {"form \"F\"\ncontrol KelNumeric a\nstore Text \"abc\n", "t.kform:3: malformed string '\"abc': no closing quote"},
        {"form \"F\"\ncontrol KelNumeric a\nset Colour 1\n", "t.kform:3: KelNumeric has no property 'Colour'"},
        {"form \"F\"\ncontrol KelNumeric a\nset hWnd 1\n", "t.kform:3: KelNumeric.hWnd is read-only"},
        {"form \"F\"\ncontrol KelCombo a\nset List 1\n", "t.kform:3: KelCombo.List takes an index"},
        {"form \"F\"\ncontrol KelDateMask a\nset MinDate fy-begin\n", "t.kform:3: malformed value 'fy-begin'"},
        {"form \"F\"\ncontrol KelNumeric a\nlabel Amount\n", "t.kform:3: the label must be a quoted string"},
        {"form \"F\"\nend\n", "t.kform:2: 'end' outside a control"},
    };
    for (const Case& c : cases) {
        try {
            parse(c.text);
            ADD_FAILURE() << "no error for:\n" << c.text;
        } catch (const FormFileError& e) {
            EXPECT_EQ(std::string(e.what()), c.message) << c.text;
        }
    }
}

TEST_F(FormFileTest, OpeningSettingsThatFailNameTheirLine) {
    const SavedForm saved = parse("form \"F\"\ncontrol KelDateMask d\n  at 1 1\n  set CalendarPosition 300\nend\n");
    mini::Form form;
    try {
        open_form(form, saved, classes(), "t.kform", day(2026, 1, 1));
        ADD_FAILURE() << "no error";
    } catch (const FormFileError& e) {
        EXPECT_EQ(e.line(), 4);
        EXPECT_NE(std::string(e.what()).find("d.CalendarPosition -> error 6"), std::string::npos) << e.what();
    }
}

TEST_F(FormFileTest, StoredValuesTheControlDoesNotTakeNameTheirLine) {
    // Each would open silently and vanish the next time the file is written.
    const struct {
        const char* store;
        const char* message;
    } cases[] = {
        {"store NoOfDecimal 2", "t.kform:4: n: KelNumeric stores no 'NoOfDecimal'"},
        {"store NoOfDecimals \"two\"", "t.kform:4: n: stored NoOfDecimals \"two\" is not taken (the control keeps 0)"},
        {"store NoOfDecimals 99999999", "t.kform:4: n: stored NoOfDecimals 99999999 is not taken (the control keeps 0)"},
    };
    for (const auto& c : cases) {
        const SavedForm saved = parse(std::string("form \"F\"\ncontrol KelNumeric n\n  at 1 1\n  ") + c.store + "\nend\n");
        mini::Form form;
        try {
            open_form(form, saved, classes(), "t.kform", day(2026, 1, 1));
            ADD_FAILURE() << "no error for " << c.store;
        } catch (const FormFileError& e) {
            EXPECT_EQ(std::string(e.what()), c.message);
        }
    }
    // Taken: a value equal to the key's default, a key spelt in another case, a value of another
    // kind that the control keeps as the same number.
    const SavedForm fine = parse(
        "form \"F\"\ncontrol KelNumeric n\n  at 1 1\n  store NoOfDecimals 0\n  store maxlength i32:9\n"
        "  store TxtFormat -1\nend\n");
    mini::Form form;
    EXPECT_NO_THROW(open_form(form, fine, classes(), "t.kform", day(2026, 1, 1)));
}

TEST_F(FormFileTest, FinancialYearRunsFromAprilToMarch) {
    struct Case {
        Date today, start, end;
    };
    const Case cases[] = {
        {day(2026, 12, 6), day(2026, 4, 1), day(2027, 3, 31)},
        {day(2027, 3, 31), day(2026, 4, 1), day(2027, 3, 31)},
        {day(2027, 4, 1), day(2027, 4, 1), day(2028, 3, 31)},
        {day(2024, 1, 1), day(2023, 4, 1), day(2024, 3, 31)},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(setting_value("fy-start", c.today), Variant(c.start)) << date_text(c.today);
        EXPECT_EQ(setting_value("fy-end", c.today), Variant(c.end)) << date_text(c.today);
        EXPECT_EQ(setting_value("today", c.today), Variant(c.today));
    }
}

TEST_F(FormFileTest, WrittenFilesKeepCommentsLabelsAndSettings) {
    const char* text =
        "# head\n"
        "form \"T \\xE9\"\n"
        "# about a\n"
        "control KelNumeric a\n"
        "    label \"Amount\" at 3 4\n"
        "    # inside\n"
        "    at 3 20\n"
        "    size 1900 300\n"
        "    store Increment 100\n"
        "    set MinValue 5\n"
        "end\n"
        "# tail\n";
    const SavedForm saved = parse(text);
    ASSERT_EQ(saved.controls.size(), 1u);
    EXPECT_EQ(saved.title, "T \xE9");
    EXPECT_EQ(saved.controls[0].label_row, 3);
    const std::string written = write_form(saved);
    EXPECT_EQ(written,
              "# head\n"
              "form \"T \\xE9\"\n"
              "\n"
              "# about a\n"
              "# inside\n"
              "control KelNumeric a\n"
              "    label \"Amount\" at 3 4\n"
              "    at 3 20\n"
              "    size 1900 300\n"
              "    store Increment 100\n"
              "    set MinValue 5\n"
              "end\n"
              "\n"
              "# tail\n");
    EXPECT_EQ(write_form(parse(written)), written);
}

TEST_F(FormFileTest, CarriageReturnLineEndsReadLikeLineFeeds) {
    // Files edited on another system: comments keep neither "\r" nor trailing blanks, so a
    // written file reads and writes back to the same text.
    const std::string written = write_form(parse("# head \r\r\nform \"T\"\r\n# about a\r\ncontrol KelNumeric a\r\n    at 3 20\r\nend\r\n"));
    EXPECT_EQ(written.find('\r'), std::string::npos);
    EXPECT_EQ(write_form(parse(written)), written);
}

TEST_F(FormFileTest, FilesAreWrittenWholeAndReadBack) {
    TempDir dir;
    const SavedForm saved = parse(demo_form_text());
    const std::string path = (dir / "v.kform").string();
    write_form_file(path, saved);
    EXPECT_EQ(read_text(path), std::string(demo_form_text()));
    EXPECT_FALSE(std::filesystem::exists(path + ".saving"));
    EXPECT_EQ(write_form(read_form_file(path, classes())), std::string(demo_form_text()));
    EXPECT_THROW(read_form_file((dir / "missing.kform").string(), classes()), FormFileError);
    EXPECT_THROW(read_form_file((dir / "").string(), classes()), FormFileError);
    EXPECT_THROW(write_form_file((dir / "no" / "such" / "dir.kform").string(), saved), FormFileError);

    // An editor's UTF-8 with its byte-order mark is read as UTF-8; a file past the limit is not read.
    const std::string marked = (dir / "m.kform").string();
    std::ofstream(marked, std::ios::binary) << "\xEF\xBB\xBF" "form \"Caf\xC3\xA9\"\n";
    EXPECT_EQ(read_form_file(marked, classes()).title, "Caf\xE9");
    EXPECT_THROW(read_form_file(marked, classes(), 10), FormFileError);
    std::ofstream(marked, std::ios::binary) << "\xEF\xBB\xBF" "form \"F\"\ncontrol KelNumeric \xE4\xB8\xAD\n";
    try {
        read_form_file(marked, classes());
        ADD_FAILURE() << "no error";
    } catch (const FormFileError& e) {
        EXPECT_EQ(std::string(e.what()),
                  marked + ":2: the character U+4E2D cannot be held: the form's text is Windows-1252");
    }
}

TEST_F(FormFileTest, ScriptsLoadAndSaveForms) {
    TempDir dir;
    const std::string source = (dir / "in.kform").string();
    const std::string target = (dir / "out.kform").string();
    write_form_file(source, parse(demo_form_text()));
    const std::string script = "trace events off\nloadform \"" + source +
                               "\"\n"
                               "focus Payee\ntype \"anil\"\n"
                               "expect Payee.Text \"Anil\"\n"
                               "new KelNumeric Extra\n"
                               "saveform \"" + target + "\"\n";
    std::istringstream in(script);
    std::ostringstream out, err;
    const std::string_view args[] = {"-"};
    EXPECT_EQ(play(args, classes(), in, out, err, [this](Player& p) { add_form_commands(p, classes()); }), 0)
        << err.str();
    const SavedForm saved = read_form_file(target, classes());
    ASSERT_EQ(saved.controls.size(), 8u);
    EXPECT_EQ(saved.title, "Payment voucher");
    EXPECT_EQ(saved.controls[7].name, "Extra");
    EXPECT_EQ(saved.controls[7].row, 16);
    const auto& payee = saved.controls[0].stored;
    EXPECT_NE(std::find_if(payee.begin(), payee.end(),
                           [](const auto& kv) { return kv.first == "Text" && kv.second == Variant("Anil"); }),
              payee.end());

    // A bad form file is a script error that names the form file's line.
    std::ofstream(dir / "bad.kform") << "form \"x\"\ncontrol KelNope n\n";
    std::istringstream bad_in("loadform \"" + (dir / "bad.kform").string() + "\"\n");
    std::ostringstream bad_out, bad_err;
    EXPECT_EQ(play(args, classes(), bad_in, bad_out, bad_err, [this](Player& p) { add_form_commands(p, classes()); }),
              2);
    EXPECT_NE(bad_err.str().find("bad.kform:2: unknown class 'KelNope'"), std::string::npos) << bad_err.str();
}

}  // namespace
}  // namespace kel::kelform

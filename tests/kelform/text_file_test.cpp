#include "apps/kelform/text_file.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "apps/kelform/play.h"
#include "tests/kelform/test_box.h"

namespace kel::kelform {
namespace {

TEST(TextFile, DecodesUtf8AfterTheMarkAndOnlyThen) {
    struct Case {
        const char* what;
        std::string in;
        std::string out;    // when it decodes
        int bad_line = 0;   // when it does not
    };
    const Case cases[] = {
        {"no mark: bytes as they are, UTF-8 or not", "caf\xC3\xA9\n\xFF\x80", "caf\xC3\xA9\n\xFF\x80"},
        {"a mark not at the start stays", "a\xEF\xBB\xBF", "a\xEF\xBB\xBF"},
        {"the mark alone", "\xEF\xBB\xBF", ""},
        {"accents and the euro sign", "\xEF\xBB\xBF" "caf\xC3\xA9 \xE2\x82\xAC\r\n\xC5\x93", "caf\xE9 \x80\r\n\x9C"},
        {"a character the set lacks names its line", "\xEF\xBB\xBF" "a\n\nb \xE4\xB8\xAD\n", "", 3},
        {"a character beyond the basic plane", "\xEF\xBB\xBF" "\xF0\x9F\x98\x80", "", 1},
        {"a sequence cut short at the end", "\xEF\xBB\xBF" "ok\n\xC3", "", 2},
        {"a stray continuation byte", "\xEF\xBB\xBF\x80", "", 1},
        {"an overlong form", "\xEF\xBB\xBF\xC0\xAF", "", 1},
    };
    for (const Case& c : cases) {
        try {
            EXPECT_EQ(decode_text(c.in), c.out) << c.what;
            EXPECT_EQ(c.bad_line, 0) << c.what << ": no error";
        } catch (const TextFileError& e) {
            EXPECT_EQ(e.fault(), TextFileError::Fault::bad_text) << c.what;
            EXPECT_EQ(e.line(), c.bad_line) << c.what << ": " << e.what();
        }
    }
}

TEST(TextFile, ReadsUpToTheLimitAndRefusesOneByteMore) {
    for (std::size_t size : {std::size_t{0}, std::size_t{1000}, std::size_t{70000}}) {
        std::istringstream in(std::string(size, 'x'));
        EXPECT_EQ(read_limited(in, 70000).size(), size);
    }
    std::istringstream over(std::string(70001, 'x'));
    EXPECT_THROW(read_limited(over, 70000), TextFileError);
    // A file that reports no size and never ends.
    try {
        read_limited("/dev/zero", 100000);
        ADD_FAILURE() << "no error";
    } catch (const TextFileError& e) {
        EXPECT_EQ(e.fault(), TextFileError::Fault::too_large);
    }
    EXPECT_THROW(read_limited("/nonexistent/x", 10), TextFileError);
}

TEST(TextFile, LimitSetting) {
    EXPECT_EQ(parse_max_file_bytes("4096"), std::optional<std::size_t>(4096));
    for (const char* bad : {"", "0", "-1", "12k", " 5", "99999999999999999999999"})
        EXPECT_EQ(parse_max_file_bytes(bad), std::nullopt) << bad;
    EXPECT_EQ(parse_max_file_bytes(nullptr), std::nullopt);
}

TEST(TextFile, PlayRefusesLargeAndUndecodableScripts) {
    static const std::vector<ClassInfo> classes = testing::test_classes();
    std::istringstream in(std::string(5000, '#'));
    std::ostringstream out, err;
    std::vector<std::string_view> stdin_script = {"-"};
    EXPECT_EQ(play(stdin_script, classes, in, out, err, {}, 4096), 2);
    EXPECT_EQ(err.str(), "<stdin>: larger than 4096 bytes, the most kelform reads (KELFORM_MAX_FILE_BYTES sets it)\n");

    std::istringstream marked("\xEF\xBB\xBF# caf\xC3\xA9\nnew TestBox \xE4\xB8\xAD\n");
    std::ostringstream out2, err2;
    EXPECT_EQ(play(stdin_script, classes, marked, out2, err2), 2);
    EXPECT_EQ(err2.str(), "<stdin>:2: the character U+4E2D cannot be held: the form's text is Windows-1252\n");
}

}  // namespace
}  // namespace kel::kelform

#include "keltext/host/charset.h"

#include <gtest/gtest.h>

namespace kel {
namespace {

TEST(Charset, UpperAndLowerCase) {
    struct Case {
        uint8_t lower, upper;
    };
    const Case pairs[] = {
        {'a', 'A'}, {'z', 'Z'}, {0xE0, 0xC0}, {0xE9, 0xC9}, {0xF6, 0xD6}, {0xF8, 0xD8},
        {0xFE, 0xDE}, {0x9A, 0x8A}, {0x9C, 0x8C}, {0x9E, 0x8E}, {0xFF, 0x9F},
    };
    for (const auto& p : pairs) {
        EXPECT_EQ(upper_case(p.lower), p.upper) << int(p.lower);
        EXPECT_EQ(lower_case(p.upper), p.lower) << int(p.upper);
    }
    // Characters without a one-byte partner, and non-letters, stay as they are.
    for (uint8_t c : {uint8_t{0xF7}, uint8_t{0xD7}, uint8_t{0xB5}, uint8_t{0xDF}, uint8_t{'1'}, uint8_t{'@'},
                      uint8_t{'['}, uint8_t{0x80}, uint8_t{0}}) {
        EXPECT_EQ(upper_case(c), c) << int(c);
        EXPECT_EQ(lower_case(c), c) << int(c);
    }
    EXPECT_EQ(upper_case("caf\xE9 \xFF!"), "CAF\xC9 \x9F!");
}

TEST(Charset, CaseMappingIsConsistent) {
    // Every byte: upper of upper is upper, and a changed byte comes back through lower_case.
    for (int i = 0; i < 256; ++i) {
        const auto c = static_cast<uint8_t>(i);
        const uint8_t u = upper_case(c);
        EXPECT_EQ(upper_case(u), u) << i;
        if (u != c) {
            EXPECT_EQ(lower_case(u), c) << i;
        }
    }
}

TEST(Charset, UnicodeTable) {
    struct Case {
        uint8_t byte;
        char32_t cp;
    };
    const Case cases[] = {
        {'A', U'A'},     {0x00, 0},         {0x7F, 0x7F},      {0x80, 0x20AC},   {0x81, 0x81},
        {0x85, 0x2026},  {0x8A, 0x0160},    {0x8D, 0x8D},      {0x8F, 0x8F},     {0x90, 0x90},
        {0x92, 0x2019},  {0x96, 0x2013},    {0x99, 0x2122},    {0x9D, 0x9D},     {0x9F, 0x0178},
        {0xA0, 0xA0},    {0xE9, 0xE9},      {0xFF, 0xFF},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(to_unicode(c.byte), c.cp) << int(c.byte);
        EXPECT_EQ(from_unicode(c.cp), c.byte) << int(c.byte);
    }
    // Every byte goes to a code point and back.
    for (int i = 0; i < 256; ++i) EXPECT_EQ(from_unicode(to_unicode(static_cast<uint8_t>(i))), i);
    // C1 controls the set replaced with its own characters, and characters it lacks.
    for (char32_t cp : {char32_t{0x80}, char32_t{0x92}, char32_t{0x100}, char32_t{0x20AD}, char32_t{0x1F600},
                        char32_t{0x110000}})
        EXPECT_FALSE(from_unicode(cp).has_value()) << int(cp);
}

TEST(Charset, Utf8RoundTrip) {
    std::string all;
    for (int i = 0; i < 256; ++i) all += static_cast<char>(i);
    EXPECT_EQ(from_utf8(to_utf8(all)), all);
    EXPECT_EQ(to_utf8("\x80 caf\xE9"), "\xE2\x82\xAC caf\xC3\xA9");
}

TEST(Charset, FromUtf8DropsOrReplacesWhatItCannotTake) {
    struct Case {
        std::string utf8;
        std::string dropped, replaced;
    };
    const Case cases[] = {
        {"abc", "abc", "abc"},
        {"a\xE2\x82\xAC" "b", "a\x80" "b", "a\x80" "b"},
        {"a\xF0\x9F\x98\x80" "b", "ab", "a?b"},       // outside the set
        {"a\xC4\x80" "b", "ab", "a?b"},               // U+0100
        {"a\xC2\x92" "b", "ab", "a?b"},               // the C1 control U+0092
        {"a\xC3" "b", "ab", "a?b"},                   // cut short
        {"a\xC3", "a", "a?"},                         // cut short at the end
        {"a\xE2\x82" "b", "ab", "a?b"},
        {"a\xC0\xAF" "b", "ab", "a??b"},              // overlong lead, then a stray continuation
        {"a\xE0\x80\xAF" "b", "ab", "a?b"},           // overlong
        {"a\xED\xA0\x80" "b", "ab", "a?b"},           // surrogate
        {"a\xF4\x90\x80\x80" "b", "ab", "a?b"},       // beyond U+10FFFF
        {"a\x80\xBF" "b", "ab", "a??b"},              // stray continuations
        {"\xFE\xFF", "", "??"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(from_utf8(c.utf8), c.dropped);
        EXPECT_EQ(from_utf8(c.utf8, '?'), c.replaced);
    }
}

}  // namespace
}  // namespace kel

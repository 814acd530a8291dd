#include "keltext/alphanumeric/alpha_rules.h"

#include <gtest/gtest.h>

#include <optional>
#include <string>

namespace kel {
namespace {

// ---- character filter by type -------------------------------------------------------------

constexpr int16_t ch(char c) { return static_cast<int16_t>(static_cast<unsigned char>(c)); }

TEST(FilterByType, KeyComesOutAsExpected) {
    struct Case {
        int32_t type;
        int16_t key, expected;
    } cases[] = {
        {KelANDigits, ch('5'), ch('5')},       {KelANDigits, ch(' '), ch(' ')},     {KelANDigits, ch('.'), 0},
        {KelANDigits, ch('a'), 0},             {KelANDigits, 0xB2, 0},              {KelANDigits, 300, 0},
        {KelANDigits, -49, 0},                 {KelANUAlphaNumeric, ch('z'), ch('Z')},
        {KelANUAlphaNumeric, ch('_'), 0},      {KelANUAlphaNumeric, 0xE9, 0},       {KelANCommStyle, ch('}'), ch('}')},
        {KelANCommStyle, ch('_'), ch('_')},    {KelANCommStyle, ch('&'), 0},        {KelANCommStyle, ch('\''), 0},
        {KelANCommStyle, ch('<'), 0},          {KelANUpperCase, 0xE9, 0xC9},        {KelANUpperCase, 0xFF, 0x9F},
        {KelANUpperCase, 300, 300},            {KelANUserKeys, 27, 27},
        // A type out of range acts as user keys.
        {-1, ch('x'), ch('x')},                {1000000, ch('!'), ch('!')},
    };
    for (const Case& c : cases) {
        const AlphaDecision d = filter_alpha_key({"abc", 1, 0, 0, false}, c.type, c.key);
        EXPECT_EQ(d.key, c.expected) << "type " << c.type << " key " << c.key;
        EXPECT_FALSE(d.select_next);
        EXPECT_FALSE(d.text.has_value());
    }
}

// Sentence case capitalises only at the very start of the text.
TEST(SentenceFilter, UpperCaseOnlyAtCaretZero) {
    struct Case {
        const char* text;
        int32_t caret;
        char key;
        char expected;
    } cases[] = {
        {"", 0, 'h', 'H'},           {"ello", 0, 'h', 'H'}, {"Hello", 5, 'h', 'h'},
        {"Done. ", 6, 'h', 'h'},     {"a", 1, 'b', 'b'},    {"", 0, '1', '1'},
        {"x", 0, '.', '.'},
    };
    for (const Case& c : cases) {
        const AlphaDecision d = filter_alpha_key({c.text, c.caret, 0, 0, false}, KelANSentence, ch(c.key));
        EXPECT_EQ(d.key, ch(c.expected)) << c.text << " @" << c.caret;
    }
}

// ---- overwrite emulation ---------------------------------------------------------------------

TEST(OverwriteEmulation, SelectsNextCharacterOnlyWhenSomethingIsInserted) {
    struct Case {
        int32_t type;
        int16_t key;
        bool overwrite;
        int32_t sel_length;
        bool select_next;
    } cases[] = {
        {KelANDigits, ch('9'), true, 0, true},        {KelANDigits, ch('9'), false, 0, false},
        {KelANDigits, ch('9'), true, 2, false},       {KelANDigits, ch('a'), true, 0, false},
        {KelANUAlphaNumeric, ch('a'), true, 0, true}, {KelANUAlphaNumeric, ch('.'), true, 0, false},
        {KelANCommStyle, ch('@'), true, 0, true},     {KelANCommStyle, ch('.'), true, 0, false},
        {KelANUpperCase, ch('x'), true, 0, true},     {KelANSentence, ch('x'), true, 0, true},
        // A key the form dropped (0) or one the edit box does not insert leaves the box alone.
        {KelANUpperCase, 0, true, 0, false},          {KelANSentence, 0, true, 0, false},
        {KelANUpperCase, 27, true, 0, false},
        // The form's own KeyPress is the only filter of these: no emulation.
        {KelANUserKeys, ch('x'), true, 0, false},     {42, ch('x'), true, 0, false},
    };
    for (const Case& c : cases) {
        const AlphaDecision d = filter_alpha_key({"123", 0, c.sel_length, 0, c.overwrite}, c.type, c.key);
        EXPECT_EQ(d.select_next, c.select_next) << "type " << c.type << " key " << c.key;
    }
}

// ---- title case ----------------------------------------------------------------------------

struct TitleCase {
    const char* name;
    const char* text;
    int32_t caret;
    int32_t sel_length;
    int32_t limit;
    bool overwrite;
    int16_t key;
    const char* expected;         // the text written back; nullptr: none
    std::optional<int32_t> caret_set;  // the caret moved before the text is written
};

class TitleCaseRebuild : public ::testing::TestWithParam<TitleCase> {};

TEST_P(TitleCaseRebuild, Rebuilds) {
    const TitleCase& c = GetParam();
    const AlphaDecision d = filter_alpha_key({c.text, c.caret, c.sel_length, c.limit, c.overwrite}, KelANTitleCase, c.key);
    EXPECT_EQ(d.key, 0);
    EXPECT_FALSE(d.select_next);
    if (c.expected) {
        ASSERT_TRUE(d.text.has_value());
        EXPECT_EQ(*d.text, c.expected);
    } else {
        EXPECT_FALSE(d.text.has_value());
    }
    EXPECT_EQ(d.caret, c.caret_set);
}

const TitleCase kTitleCases[] = {
    {"EmptyBoxIgnoresLimit", "", 0, 0, 0, true, ch('x'), "X", std::nullopt},
    {"SpaceAtEndCapitalisesFirstLetter", "john", 4, 0, 0, false, ch(' '), "John ", 5},
    {"LetterAfterSpace", "John ", 5, 0, 0, false, ch('s'), "John S", std::nullopt},
    {"UpperCaseInsideWordIsNotLowered", "Jo", 2, 0, 0, false, ch('H'), "JoH", std::nullopt},
    {"LetterAtStartOfText", "ohn", 0, 0, 0, false, ch('j'), "John", std::nullopt},
    {"TrailingSpacesCountForSpace", "Abc  ", 1, 0, 5, false, ch(' '), "Abc  ", std::nullopt},
    {"SpaceBeforeSpaceStepsOverIt", "john smith", 4, 0, 0, false, ch(' '), "John  smith", 5},
    {"LimitAboveLengthTakesSpace", "Abcd", 1, 0, 5, false, ch(' '), "A Bcd", std::nullopt},
    {"FullBoxTypingFollowingCharacterStepsOver", "Abcde", 2, 0, 5, false, ch('c'), "Abcde", 3},
    {"OneBelowTheLimitTakesALetter", "Abcd", 4, 0, 5, false, ch('e'), "Abcde", std::nullopt},
    {"AtTheLimitRefusesALetter", "Abcde", 5, 0, 5, false, ch('f'), "Abcde", std::nullopt},
    {"AtTheLimitRefusesASpace", "Abcde", 1, 0, 5, false, ch(' '), "Abcde", std::nullopt},
    {"NegativeLimitIsNoLimit", "Abcde", 5, 0, -1, false, ch('f'), "Abcdef", std::nullopt},
    {"OverwriteWithSameCharacterStepsOver", "Abc", 1, 0, 0, true, ch('b'), "Abc", 2},
    {"OverwriteSpaceOnLastCharacter", "Abc", 2, 0, 0, true, ch(' '), "Ab ", std::nullopt},
    {"OverwriteSpaceOverSpaceStepsOver", "Ab cd", 2, 0, 0, true, ch(' '), "Ab Cd", 3},
    {"OverwriteSpaceAtEndAppends", "Ab", 2, 0, 0, true, ch(' '), "Ab ", 3},
    {"SelectionReplacedByLetterAfterSpace", "Ab cd", 3, 2, 0, false, ch('x'), "Ab X", std::nullopt},
    {"SelectionToEndReplacedBySpace", "Abcd", 1, 3, 0, false, ch(' '), "A ", std::nullopt},
    {"SelectionReplacedIgnoresLimit", "Abcde", 0, 5, 5, false, ch('z'), "Z", std::nullopt},
    {"WholeTextSelectedReplacedBySpace", "Abc", 0, 3, 0, false, ch(' '), " ", std::nullopt},
    {"AccentedLetterUpperCased", "Ab ", 3, 0, 0, false, static_cast<int16_t>(0xE9), "Ab \xC9", std::nullopt},
    // Keys that insert nothing into an edit box insert nothing here either.
    {"DroppedKeyLeavesText", "abc", 1, 0, 0, false, 0, nullptr, std::nullopt},
    {"CodeOutsideTheSetInsertsNothing", "abc", 1, 0, 0, false, 400, nullptr, std::nullopt},
    // Out-of-range positions from a misbehaving caller are clamped to the text.
    {"CaretPastEndClamped", "ab", 9, 0, 0, false, ch('c'), "Abc", std::nullopt},
    {"NegativeCaretClamped", "ab", -3, 0, 0, false, ch('c'), "Cab", std::nullopt},
    {"SelectionPastEndClamped", "abcd", 2, 99, 0, false, ch('x'), "Abx", std::nullopt},
};

INSTANTIATE_TEST_SUITE_P(Cases, TitleCaseRebuild, ::testing::ValuesIn(kTitleCases),
                         [](const auto& info) { return std::string(info.param.name); });

TEST(TitleCaseRebuild, TextLongerThanSixteenBitCaret) {
    std::string text(70000, 'a');
    const AlphaDecision d = filter_alpha_key({text, 69000, 0, 0, false}, KelANTitleCase, ch(' '));
    ASSERT_TRUE(d.text.has_value());
    ASSERT_EQ(d.text->size(), 70001u);
    EXPECT_EQ((*d.text)[69000], ' ');
    EXPECT_EQ((*d.text)[69001], 'A');
    EXPECT_EQ((*d.text)[0], 'A');
}

// ---- key-press dispatch, key-down, change ----------------------------------------------------

TEST(KeyPressDispatch, PassesDropsAndFilters) {
    struct Case {
        int16_t code;
        KeyPressAction action;
    } cases[] = {
        {8, KeyPressAction::pass},    {9, KeyPressAction::pass},     {10, KeyPressAction::pass},
        {13, KeyPressAction::drop},   {0, KeyPressAction::filter},   {27, KeyPressAction::filter},
        {32, KeyPressAction::filter}, {ch('a'), KeyPressAction::filter}, {255, KeyPressAction::filter},
        {-8, KeyPressAction::filter},
    };
    for (const Case& c : cases) EXPECT_EQ(key_press_action(c.code), c.action) << c.code;
}

TEST(KeyDown, CtrlArrowsAndRecording) {
    struct Case {
        int16_t key_code, shift;
        bool ctrl_down;
        std::string_view send;
        bool record;
    } cases[] = {
        {38, 0, false, "+{TAB}", false}, {40, 0, false, "{TAB}", false}, {38, 1, false, "+{TAB}", false},
        {38, 2, true, "", false},        {40, 3, true, "", false},       {65, 2, true, "", false},
        {65, 0, false, "", true},        {8, 0, false, "", true},        {46, 4, false, "", true},
        {0, 0, false, "", true},         {37, 6, true, "", false},
    };
    for (const Case& c : cases) {
        const KeyDownDecision d = key_down_decision(c.key_code, c.shift);
        EXPECT_EQ(d.ctrl_down, c.ctrl_down) << c.key_code << "/" << c.shift;
        EXPECT_EQ(d.send_keys, c.send) << c.key_code << "/" << c.shift;
        EXPECT_EQ(d.record, c.record) << c.key_code << "/" << c.shift;
    }
}

TEST(ChangeCaret, ByLastKey) {
    struct Case {
        int16_t last_key;
        int32_t saved;
        std::optional<int32_t> caret;
    } cases[] = {
        {8, 3, 2},          {8, 1, 0},           {8, 0, std::nullopt}, {46, 4, std::nullopt},
        {46, 0, std::nullopt}, {65, 0, 1},       {65, 4, 5},           {0, 2, 3},
        {32, 40000, 40001}, {65, 2147483647, 2147483647},
    };
    for (const Case& c : cases) EXPECT_EQ(caret_after_change(c.last_key, c.saved), c.caret) << c.last_key << "/" << c.saved;
}

}  // namespace
}  // namespace kel

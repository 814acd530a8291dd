#include "keltext/widgetmodel/keyboard.h"

#include <gtest/gtest.h>

#include <optional>
#include <string>

namespace kel::model {
namespace {

struct KeyCase {
    const char* name;
    int16_t key_code;
    int16_t shift;
    int16_t char_code;  // -1: no key press
};

TEST(ParseKey, NamesCharactersAndPrefixes) {
    const KeyCase cases[] = {
        {"a", 'A', 0, 'a'}, {"A", 'A', kShiftMask, 'A'}, {"7", '7', 0, '7'}, {"/", 191, 0, '/'}, {".", 190, 0, '.'},
        {";", 186, 0, ';'}, {"'", 222, 0, '\''}, {"?", 191, kShiftMask, '?'}, {"!", '1', kShiftMask, '!'},
        {")", '0', kShiftMask, ')'}, {"~", 192, kShiftMask, '~'}, {"\"", 222, kShiftMask, '"'}, {" ", 32, 0, ' '},
        {"Space", 32, 0, 32}, {"Backspace", 8, 0, 8}, {"Enter", 13, 0, 13}, {"escape", 27, 0, 27}, {"Tab", 9, 0, -1},
        {"Shift+Tab", 9, kShiftMask, -1}, {"Delete", 46, 0, -1}, {"Insert", 45, 0, -1},
        {"Ctrl+Up", 38, kCtrlMask, -1}, {"ctrl+up", 38, kCtrlMask, -1},
        {"Shift+Ctrl+Down", 40, kShiftMask | kCtrlMask, -1}, {"PageDown", 34, 0, -1}, {"F1", 112, 0, -1},
        {"F12", 123, 0, -1}, {"NumLock", 144, 0, -1}, {"Ctrl+v", 'V', kCtrlMask, 22},
        {"Ctrl+V", 'V', kShiftMask | kCtrlMask, 22}, {"Shift+a", 'A', kShiftMask, 'A'},
        {"Shift+1", '1', kShiftMask, '!'}, {"Alt+a", 'A', kAltMask, -1}, {"Ctrl+1", '1', kCtrlMask, -1},
        {"+", 187, kShiftMask, '+'}, {"Shift++", 187, kShiftMask, '+'}, {"\xC9", 0, 0, 0xC9},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.name);
        auto k = parse_key(c.name);
        ASSERT_TRUE(k.has_value());
        EXPECT_EQ(k->key_code, c.key_code);
        EXPECT_EQ(k->shift, c.shift);
        if (c.char_code < 0)
            EXPECT_FALSE(k->char_code.has_value());
        else
            EXPECT_EQ(k->char_code, std::optional<int16_t>(c.char_code));
    }
}

TEST(ParseKey, RejectsWhatIsNoKey) {
    for (const char* name : {"", "Foo", "F0", "F13", "F01", "Ctrl+", "Shift+Bogus", "ab", "Ctrl+Shift+"}) {
        SCOPED_TRACE(name);
        EXPECT_FALSE(parse_key(name).has_value());
    }
}

TEST(KeystrokeForChar, CharactersWithoutKeysKeepTheirCode) {
    for (int c : {0x80, 0xC9, 0xFF, 1, 9, 10, 127}) {
        SCOPED_TRACE(c);
        Keystroke k = keystroke_for_char(static_cast<uint8_t>(c));
        EXPECT_EQ(k.key_code, 0);
        EXPECT_EQ(k.char_code, std::optional<int16_t>(static_cast<int16_t>(c)));
    }
    EXPECT_EQ(keystroke_for_char(0), Keystroke{});
}

struct SendCase {
    const char* keys;
    std::vector<SentKey> expected;
};

SentKey press(char c, int16_t code, int16_t shift = 0) {
    return SentKey{SentKey::keystroke, Keystroke{code, shift, static_cast<int16_t>(static_cast<uint8_t>(c))}};
}
SentKey bare(int16_t code, int16_t shift = 0) { return SentKey{SentKey::keystroke, Keystroke{code, shift, std::nullopt}}; }
SentKey tab(bool back) {
    return SentKey{back ? SentKey::back_tab : SentKey::tab, Keystroke{kVkTab, static_cast<int16_t>(back ? 1 : 0), std::nullopt}};
}

bool same(const SentKey& a, const SentKey& b) { return a.kind == b.kind && a.key == b.key; }

TEST(ParseSendKeys, TokensRunsAndCharacters) {
    const SendCase cases[] = {
        {"", {}}, {"{TAB}", {tab(false)}}, {"+{TAB}", {tab(true)}}, {"{tab}", {tab(false)}},
        {"{DEL}", {bare(kVkDelete)}}, {"{END}", {bare(kVkEnd)}},
        {"{HOME}{DEL}{DEL}", {bare(kVkHome), bare(kVkDelete), bare(kVkDelete)}},
        {"{DEL 2}", {bare(kVkDelete), bare(kVkDelete)}}, {"05", {press('0', '0'), press('5', '5')}},
        {"a/", {press('a', 'A'), press('/', 191)}}, {"+a", {press('A', 'A', kShiftMask)}},
        {"{+}", {press('+', 187, kShiftMask)}}, {"{}}", {press('}', 221, kShiftMask)}},
        {"~", {SentKey{SentKey::keystroke, Keystroke{kVkEnter, 0, int16_t{13}}}}},
        {"{BS}", {SentKey{SentKey::keystroke, Keystroke{kVkBackspace, 0, int16_t{8}}}}},
        {"^{END}", {bare(kVkEnd, kCtrlMask)}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.keys);
        auto got = parse_send_keys(c.keys);
        ASSERT_EQ(got.size(), c.expected.size());
        for (std::size_t i = 0; i < got.size(); ++i) EXPECT_TRUE(same(got[i], c.expected[i])) << "key " << i;
    }
}

TEST(ParseSendKeys, BadTextIsAClearError) {
    struct Bad {
        const char* keys;
        const char* message_part;
    };
    const Bad cases[] = {
        {"{FOO}", "unknown send-keys token {FOO}"}, {"{HOME}{BOGUS}", "unknown send-keys token {BOGUS}"},
        {"{TAB", "unclosed {"}, {"{}", "empty send-keys token"}, {"}", "unmatched }"}, {"+", "modifier with no key"},
        {"{DEL x}", "bad repeat count"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.keys);
        try {
            parse_send_keys(c.keys);
            ADD_FAILURE() << "no error";
        } catch (const SendKeysError& e) {
            EXPECT_NE(std::string(e.what()).find(c.message_part), std::string::npos) << e.what();
        }
    }
}

TEST(ClipboardKeys, ChordsAndWhatTheyDo) {
    struct Case {
        int16_t key, shift;
        ClipboardKey action;
        bool toggles;  // flips overwrite
    };
    const int16_t ctrl = kCtrlMask, shift = kShiftMask, alt = kAltMask;
    const Case cases[] = {
        {'C', ctrl, ClipboardKey::copy, false},         {kVkInsert, ctrl, ClipboardKey::copy, false},
        {'X', ctrl, ClipboardKey::cut, false},          {kVkDelete, shift, ClipboardKey::cut, false},
        {'V', ctrl, ClipboardKey::paste, false},        {kVkInsert, shift, ClipboardKey::paste, false},
        {kVkInsert, 0, ClipboardKey::none, true},       {kVkInsert, alt, ClipboardKey::none, true},
        {'C', 0, ClipboardKey::none, false},            {'C', static_cast<int16_t>(ctrl | shift), ClipboardKey::none, false},
        {'V', static_cast<int16_t>(ctrl | alt), ClipboardKey::none, false}, {kVkDelete, 0, ClipboardKey::none, false},
        {kVkInsert, static_cast<int16_t>(ctrl | shift), ClipboardKey::none, false},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(testing::Message() << c.key << " shift " << c.shift);
        EXPECT_EQ(clipboard_key(c.key, c.shift), c.action);
        EXPECT_EQ(toggles_insert(c.key, c.shift), c.toggles);
    }
}

}  // namespace
}  // namespace kel::model

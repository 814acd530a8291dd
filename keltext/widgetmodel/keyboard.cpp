#include "keltext/widgetmodel/keyboard.h"

#include <array>
#include <utility>

#include "keltext/host/conversions.h"

namespace kel::model {
namespace {

struct NamedKey {
    std::string_view name;
    int16_t code;
    int16_t char_code;  // 0: the key makes no character
};

constexpr std::array kNamedKeys = {
    NamedKey{"Backspace", kVkBackspace, 8}, NamedKey{"Tab", kVkTab, 0},
    NamedKey{"Enter", kVkEnter, 13},        NamedKey{"Escape", kVkEscape, 27},
    NamedKey{"Space", kVkSpace, 32},        NamedKey{"PageUp", kVkPageUp, 0},
    NamedKey{"PageDown", kVkPageDown, 0},   NamedKey{"End", kVkEnd, 0},
    NamedKey{"Home", kVkHome, 0},           NamedKey{"Left", kVkLeft, 0},
    NamedKey{"Up", kVkUp, 0},               NamedKey{"Right", kVkRight, 0},
    NamedKey{"Down", kVkDown, 0},           NamedKey{"Insert", kVkInsert, 0},
    NamedKey{"Delete", kVkDelete, 0},       NamedKey{"NumLock", kVkNumLock, 0},
};

// US layout: the unshifted symbol keys, and the shifted symbols on the key of their partner.
struct SymbolKey {
    char c;
    int16_t code;
    bool shift;
};

constexpr std::array kSymbols = {
    SymbolKey{';', 186, false}, SymbolKey{'=', 187, false}, SymbolKey{',', 188, false},
    SymbolKey{'-', 189, false}, SymbolKey{'.', 190, false}, SymbolKey{'/', 191, false},
    SymbolKey{'`', 192, false}, SymbolKey{'[', 219, false}, SymbolKey{'\\', 220, false},
    SymbolKey{']', 221, false}, SymbolKey{'\'', 222, false},
    SymbolKey{'!', '1', true},  SymbolKey{'@', '2', true},  SymbolKey{'#', '3', true},
    SymbolKey{'$', '4', true},  SymbolKey{'%', '5', true},  SymbolKey{'^', '6', true},
    SymbolKey{'&', '7', true},  SymbolKey{'*', '8', true},  SymbolKey{'(', '9', true},
    SymbolKey{')', '0', true},  SymbolKey{'_', 189, true},  SymbolKey{'+', 187, true},
    SymbolKey{'{', 219, true},  SymbolKey{'}', 221, true},  SymbolKey{'|', 220, true},
    SymbolKey{':', 186, true},  SymbolKey{'"', 222, true},  SymbolKey{'<', 188, true},
    SymbolKey{'>', 190, true},  SymbolKey{'?', 191, true},  SymbolKey{'~', 192, true},
};

char ascii_upper(char c) { return (c >= 'a' && c <= 'z') ? static_cast<char>(c - 'a' + 'A') : c; }

// The character the key of `c` makes with Shift held (US layout), or `c` itself.
char shifted(char c) {
    if (c >= 'a' && c <= 'z') return ascii_upper(c);
    Keystroke plain = keystroke_for_char(static_cast<uint8_t>(c));
    if (plain.shift != 0 || plain.key_code == 0) return c;
    for (const auto& s : kSymbols)
        if (s.shift && s.code == plain.key_code) return s.c;
    return c;
}

// Applies prefixes to the keystroke of one character: Shift turns it into its shifted
// character, Ctrl with a letter makes the control code, Ctrl and Alt otherwise make none.
Keystroke with_prefixes(uint8_t c, int16_t prefixes) {
    Keystroke k = keystroke_for_char(c);
    if (k.key_code == 0) {  // a character with no key: prefixes only add to the mask
        k.shift = static_cast<int16_t>(k.shift | prefixes);
        return k;
    }
    if ((prefixes & kShiftMask) != 0 && c >= 0x20 && c < 0x7F) {
        char s = shifted(static_cast<char>(c));
        k = keystroke_for_char(static_cast<uint8_t>(s));
        k.shift = static_cast<int16_t>(k.shift | kShiftMask);
    }
    k.shift = static_cast<int16_t>(k.shift | prefixes);
    if ((prefixes & kAltMask) != 0) {
        k.char_code.reset();
    } else if ((prefixes & kCtrlMask) != 0) {
        if (k.key_code >= 'A' && k.key_code <= 'Z')
            k.char_code = static_cast<int16_t>(k.key_code - 64);
        else
            k.char_code.reset();
    }
    return k;
}

}  // namespace

Keystroke keystroke_for_char(uint8_t c) {
    Keystroke k;
    if (c == 0) return k;  // nothing to type
    k.char_code = static_cast<int16_t>(c);
    if (c >= 'a' && c <= 'z') {
        k.key_code = static_cast<int16_t>(c - 'a' + 'A');
    } else if (c >= 'A' && c <= 'Z') {
        k.key_code = static_cast<int16_t>(c);
        k.shift = kShiftMask;
    } else if (c >= '0' && c <= '9') {
        k.key_code = static_cast<int16_t>(c);
    } else if (c == ' ') {
        k.key_code = kVkSpace;
    } else if (c == kVkBackspace || c == kVkEnter || c == kVkEscape) {
        // The control codes that have keys of their own: Backspace, Enter, Escape.
        k.key_code = static_cast<int16_t>(c);
    } else {
        for (const auto& s : kSymbols) {
            if (static_cast<uint8_t>(s.c) == c) {
                k.key_code = s.code;
                k.shift = s.shift ? kShiftMask : 0;
                break;
            }
        }
        // Codes 128 to 255 and the other control codes have no key: key code 0.
    }
    return k;
}

std::optional<Keystroke> parse_key(std::string_view name) {
    int16_t prefixes = 0;
    for (;;) {
        if (name.size() <= 1) break;
        if (starts_with_name(name, "Shift+")) {
            prefixes |= kShiftMask;
            name.remove_prefix(6);
        } else if (starts_with_name(name, "Ctrl+")) {
            prefixes |= kCtrlMask;
            name.remove_prefix(5);
        } else if (starts_with_name(name, "Alt+")) {
            prefixes |= kAltMask;
            name.remove_prefix(4);
        } else {
            break;
        }
    }
    if (name.empty()) return std::nullopt;
    if (name.size() == 1) return with_prefixes(static_cast<uint8_t>(name[0]), prefixes);

    Keystroke k;
    bool found = false;
    for (const auto& nk : kNamedKeys) {
        if (same_name(nk.name, name)) {
            k.key_code = nk.code;
            if (nk.char_code != 0) k.char_code = nk.char_code;
            found = true;
            break;
        }
    }
    if (!found && (name[0] == 'F' || name[0] == 'f') && name.size() <= 3) {
        int n = 0;
        for (char c : name.substr(1)) {
            if (c < '0' || c > '9') return std::nullopt;
            n = n * 10 + (c - '0');
        }
        if (n < 1 || n > 12 || name[1] == '0') return std::nullopt;
        k.key_code = static_cast<int16_t>(kVkF1 + n - 1);
        found = true;
    }
    if (!found) return std::nullopt;
    k.shift = prefixes;
    // Ctrl or Alt with a named key makes no character.
    if ((prefixes & (kCtrlMask | kAltMask)) != 0) k.char_code.reset();
    return k;
}

namespace {

struct SendToken {
    std::string_view name;
    int16_t code;
    int16_t char_code;  // 0: key down and key up only
};

constexpr std::array kSendTokens = {
    SendToken{"DEL", kVkDelete, 0},     SendToken{"DELETE", kVkDelete, 0}, SendToken{"END", kVkEnd, 0},
    SendToken{"HOME", kVkHome, 0},      SendToken{"LEFT", kVkLeft, 0},     SendToken{"RIGHT", kVkRight, 0},
    SendToken{"UP", kVkUp, 0},          SendToken{"DOWN", kVkDown, 0},     SendToken{"PGUP", kVkPageUp, 0},
    SendToken{"PGDN", kVkPageDown, 0},  SendToken{"INSERT", kVkInsert, 0}, SendToken{"INS", kVkInsert, 0},
    SendToken{"BACKSPACE", kVkBackspace, 8}, SendToken{"BS", kVkBackspace, 8},
    SendToken{"BKSP", kVkBackspace, 8}, SendToken{"ENTER", kVkEnter, 13},  SendToken{"ESC", kVkEscape, 27},
    SendToken{"ESCAPE", kVkEscape, 27},
};

// The keystroke a {TOKEN} names, or nothing.
std::optional<SentKey> send_token(std::string_view token, int16_t prefixes) {
    SentKey sk;
    if (same_name(token, "TAB")) {
        sk.kind = (prefixes & kShiftMask) != 0 ? SentKey::back_tab : SentKey::tab;
        sk.key.key_code = kVkTab;
        sk.key.shift = prefixes;
        return sk;
    }
    if (token.size() == 1) {  // {+} {^} {%} {~} {(} {)} {{} {}}: the character itself
        sk.key = with_prefixes(static_cast<uint8_t>(token[0]), prefixes);
        return sk;
    }
    for (const auto& t : kSendTokens) {
        if (same_name(t.name, token)) {
            sk.key.key_code = t.code;
            sk.key.shift = prefixes;
            if (t.char_code != 0 && (prefixes & (kCtrlMask | kAltMask)) == 0) sk.key.char_code = t.char_code;
            return sk;
        }
    }
    if (token.size() >= 2 && token.size() <= 3 && (token[0] == 'F' || token[0] == 'f')) {
        if (auto k = parse_key(token)) {
            sk.key = *k;
            sk.key.shift = prefixes;
            return sk;
        }
    }
    return std::nullopt;
}

}  // namespace

std::vector<SentKey> parse_send_keys(std::string_view keys) {
    std::vector<SentKey> out;
    int16_t prefixes = 0;
    std::size_t i = 0;
    while (i < keys.size()) {
        char c = keys[i];
        if (c == '+' || c == '^' || c == '%') {
            prefixes |= c == '+' ? kShiftMask : c == '^' ? kCtrlMask : kAltMask;
            ++i;
            continue;
        }
        if (c == '{') {
            // "{}}" names the closing brace itself.
            std::size_t close = (i + 2 < keys.size() && keys[i + 1] == '}' && keys[i + 2] == '}')
                                    ? i + 2
                                    : keys.find('}', i + 1);
            if (close == std::string_view::npos)
                throw SendKeysError("unclosed { in send-keys text \"" + std::string(keys) + "\"");
            std::string_view body = keys.substr(i + 1, close - i - 1);
            if (body.empty()) throw SendKeysError("empty send-keys token {}");
            // An optional repeat count: {DEL 2}.
            std::size_t repeat = 1;
            if (auto sp = body.find(' '); sp != std::string_view::npos && sp > 0) {
                std::string_view count = body.substr(sp + 1);
                if (count.empty() || count.size() > 4) throw SendKeysError("bad repeat count in send-keys token {" + std::string(body) + "}");
                repeat = 0;
                for (char d : count) {
                    if (d < '0' || d > '9') throw SendKeysError("bad repeat count in send-keys token {" + std::string(body) + "}");
                    repeat = repeat * 10 + static_cast<std::size_t>(d - '0');
                }
                body = body.substr(0, sp);
            }
            auto sk = send_token(body, prefixes);
            if (!sk) throw SendKeysError("unknown send-keys token {" + std::string(body) + "}");
            for (std::size_t r = 0; r < repeat; ++r) out.push_back(*sk);
            prefixes = 0;
            i = close + 1;
            continue;
        }
        if (c == '}') throw SendKeysError("unmatched } in send-keys text \"" + std::string(keys) + "\"");
        SentKey sk;
        if (c == '~') {
            sk.key.key_code = kVkEnter;
            sk.key.shift = prefixes;
            if ((prefixes & (kCtrlMask | kAltMask)) == 0) sk.key.char_code = 13;
        } else {
            sk.key = with_prefixes(static_cast<uint8_t>(c), prefixes);
        }
        out.push_back(sk);
        prefixes = 0;
        ++i;
    }
    if (prefixes != 0) throw SendKeysError("send-keys modifier with no key in \"" + std::string(keys) + "\"");
    return out;
}

ClipboardKey clipboard_key(int16_t key_code, int16_t shift) {
    const int16_t held = static_cast<int16_t>(shift & (kShiftMask | kCtrlMask | kAltMask));
    if (held == kCtrlMask) {
        switch (key_code) {
        case 'C': case kVkInsert: return ClipboardKey::copy;
        case 'X': return ClipboardKey::cut;
        case 'V': return ClipboardKey::paste;
        default: return ClipboardKey::none;
        }
    }
    if (held == kShiftMask) {
        if (key_code == kVkDelete) return ClipboardKey::cut;
        if (key_code == kVkInsert) return ClipboardKey::paste;
    }
    return ClipboardKey::none;
}

}  // namespace kel::model

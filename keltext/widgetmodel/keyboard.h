#pragma once
// Keys: virtual key codes, the keystroke a key name or character makes, and the send-keys
// notation the controls queue.
#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/host/keys.h"

namespace kel::model {

// One keystroke: key down and key up with key_code and shift, and a key press in between
// when the key makes a character.
struct Keystroke {
    int16_t key_code = 0;
    int16_t shift = 0;
    std::optional<int16_t> char_code;
    bool operator==(const Keystroke&) const = default;
};

// The keystroke that types one character of the single-byte set (US layout; characters with
// no key get key code 0).
Keystroke keystroke_for_char(uint8_t c);

// "Ctrl+Up", "Shift+Tab", "a", "/", "Enter", "F4": nothing when the name is not a key.
std::optional<Keystroke> parse_key(std::string_view name);

// What a key down does to the clipboard in an edit field: Ctrl+C and Ctrl+Insert copy,
// Ctrl+X and Shift+Delete cut, Ctrl+V and Shift+Insert paste.
enum class ClipboardKey { none, copy, cut, paste };
ClipboardKey clipboard_key(int16_t key_code, int16_t shift);

// Insert alone flips overwrite; with Shift or Ctrl it is a clipboard key and flips nothing.
inline bool toggles_insert(int16_t key_code, int16_t shift) {
    return key_code == kVkInsert && (shift & (kShiftMask | kCtrlMask)) == 0;
}

// One synthetic keystroke of the send-keys notation.
struct SentKey {
    enum Kind { tab, back_tab, keystroke } kind = keystroke;
    Keystroke key;  // for keystroke: {DEL} {END} {HOME} are key down/up only; characters typed
};

class SendKeysError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// Parses "{TAB}", "+{TAB}", "{DEL}", "{END}", "{HOME}", runs of them and plain characters.
// An unknown {TOKEN} is a SendKeysError naming it.
std::vector<SentKey> parse_send_keys(std::string_view keys);

}  // namespace kel::model

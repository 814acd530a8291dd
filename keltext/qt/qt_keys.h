#pragma once
// Qt key events as the controls' keystrokes: virtual key code, Shift state and the character
// a key press makes. One place for the translation, used by every view and by tests.
#include <QString>
#include <Qt>
#include <cstdint>
#include <optional>
#include <string>

#include "keltext/widgetmodel/keyboard.h"

namespace kel::qt {

// What a Qt key event delivers.
struct QtKeystroke {
    enum class Kind {
        keystroke,  // key down (and key press when `key.char_code`), or key up
        modifier,   // Shift, Ctrl, Alt, Meta alone: never delivered (the minimal host has no such keys)
        refused,    // a character outside Windows-1252 with no key of its own: nothing is delivered
    } kind = Kind::keystroke;
    model::Keystroke key;
};

// The Shift argument (kShiftMask, kCtrlMask, kAltMask) of Qt's modifiers.
int16_t shift_state(Qt::KeyboardModifiers modifiers);

// The keystroke of a Qt key event (`text` as QKeyEvent::text gives it). Virtual key codes as
// on a US layout; the character follows the rules of the script's key names: Alt makes none,
// Ctrl makes the control code of a letter and nothing else, Backspace/Enter/Escape/Space make
// their own code, any other key the Windows-1252 byte of its text.
QtKeystroke keystroke_from_qt(int qt_key, Qt::KeyboardModifiers modifiers, const QString& text);

// The Qt key of a virtual key code (Qt::Key_unknown when there is none), for a host that turns
// the controls' keystrokes back into Qt events.
int qt_key_of(int16_t key_code);

// Windows-1252 text from a QString: nothing when a character is outside the set.
std::optional<std::string> cp1252_of(const QString& text);
QString qstring_of(const std::string& cp1252);

}  // namespace kel::qt

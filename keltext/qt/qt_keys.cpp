#include "keltext/qt/qt_keys.h"

#include <QList>
#include <array>

#include "keltext/host/charset.h"
#include "keltext/host/keys.h"

namespace kel::qt {
namespace {

struct KeyPair {
    int qt;
    int16_t vk;
};

constexpr std::array kNamed = {
    KeyPair{Qt::Key_Backspace, kVkBackspace}, KeyPair{Qt::Key_Tab, kVkTab},
    KeyPair{Qt::Key_Backtab, kVkTab},         KeyPair{Qt::Key_Return, kVkEnter},
    KeyPair{Qt::Key_Enter, kVkEnter},         KeyPair{Qt::Key_Escape, kVkEscape},
    KeyPair{Qt::Key_Space, kVkSpace},         KeyPair{Qt::Key_PageUp, kVkPageUp},
    KeyPair{Qt::Key_PageDown, kVkPageDown},   KeyPair{Qt::Key_End, kVkEnd},
    KeyPair{Qt::Key_Home, kVkHome},           KeyPair{Qt::Key_Left, kVkLeft},
    KeyPair{Qt::Key_Up, kVkUp},               KeyPair{Qt::Key_Right, kVkRight},
    KeyPair{Qt::Key_Down, kVkDown},           KeyPair{Qt::Key_Insert, kVkInsert},
    KeyPair{Qt::Key_Delete, kVkDelete},       KeyPair{Qt::Key_Help, kVkHelp},
    KeyPair{Qt::Key_NumLock, kVkNumLock},
};

bool is_modifier_key(int k) {
    return k == Qt::Key_Shift || k == Qt::Key_Control || k == Qt::Key_Alt || k == Qt::Key_Meta ||
           k == Qt::Key_AltGr || k == Qt::Key_CapsLock || k == Qt::Key_Super_L || k == Qt::Key_Super_R;
}

// The virtual key of a Qt key; 0 for a key the US layout has no code for.
int16_t virtual_key(int k) {
    for (const auto& p : kNamed)
        if (p.qt == k) return p.vk;
    if (k >= Qt::Key_F1 && k <= Qt::Key_F12) return static_cast<int16_t>(kVkF1 + (k - Qt::Key_F1));
    // Printable ASCII keys: Qt names them by the character they make (the upper-case letter,
    // the symbol itself), so the key is that of the character on a US keyboard.
    if (k > 0x20 && k < 0x7F) return model::keystroke_for_char(static_cast<uint8_t>(k)).key_code;
    return 0;
}

}  // namespace

int16_t shift_state(Qt::KeyboardModifiers modifiers) {
    int16_t s = 0;
    if (modifiers & Qt::ShiftModifier) s |= kShiftMask;
    if (modifiers & Qt::ControlModifier) s |= kCtrlMask;
    if (modifiers & Qt::AltModifier) s |= kAltMask;
    return s;
}

QtKeystroke keystroke_from_qt(int qt_key, Qt::KeyboardModifiers modifiers, const QString& text) {
    QtKeystroke out;
    if (is_modifier_key(qt_key)) {
        out.kind = QtKeystroke::Kind::modifier;
        return out;
    }
    model::Keystroke& k = out.key;
    k.shift = shift_state(modifiers);
    k.key_code = virtual_key(qt_key);
    const bool ctrl = (k.shift & kCtrlMask) != 0;
    const bool alt = (k.shift & kAltMask) != 0;
    if (alt) return out;
    if (k.key_code == kVkBackspace || k.key_code == kVkEnter || k.key_code == kVkEscape || k.key_code == kVkSpace) {
        if (!ctrl) k.char_code = k.key_code;
        return out;
    }
    if (ctrl) {
        if (k.key_code >= 'A' && k.key_code <= 'Z') k.char_code = static_cast<int16_t>(k.key_code - 64);
        return out;
    }
    // A character key: its text decides the character (a layout or an input method may give
    // one the key name does not say).
    if (text.size() == 1 && text[0].unicode() >= 0x20) {
        if (const auto b = from_unicode(text[0].unicode()); b && *b >= 0x20) {
            k.char_code = static_cast<int16_t>(*b);
            if (k.key_code == 0) k.key_code = model::keystroke_for_char(*b).key_code;
        } else if (k.key_code == 0) {
            out.kind = QtKeystroke::Kind::refused;
        }
    } else if (text.size() > 1 && k.key_code == 0) {
        out.kind = QtKeystroke::Kind::refused;
    }
    return out;
}

int qt_key_of(int16_t key_code) {
    for (const auto& p : kNamed)
        if (p.vk == key_code && p.qt != Qt::Key_Backtab && p.qt != Qt::Key_Enter) return p.qt;
    if (key_code >= kVkF1 && key_code <= kVkF12) return Qt::Key_F1 + (key_code - kVkF1);
    if ((key_code >= '0' && key_code <= '9') || (key_code >= 'A' && key_code <= 'Z')) return key_code;
    for (int c = 0x21; c < 0x7F; ++c) {
        const model::Keystroke k = model::keystroke_for_char(static_cast<uint8_t>(c));
        if (k.key_code == key_code && k.shift == 0) return c;
    }
    return Qt::Key_unknown;
}

std::optional<std::string> cp1252_of(const QString& text) {
    std::string out;
    out.reserve(static_cast<std::size_t>(text.size()));
    for (const char32_t cp : text.toUcs4()) {
        const auto b = from_unicode(cp);
        if (!b) return std::nullopt;
        out += static_cast<char>(*b);
    }
    return out;
}

QString qstring_of(const std::string& cp1252) {
    QString out;
    out.reserve(static_cast<qsizetype>(cp1252.size()));
    for (const char c : cp1252) out += QChar(static_cast<char16_t>(to_unicode(static_cast<uint8_t>(c))));
    return out;
}

}  // namespace kel::qt

#pragma once
// Keys and characters by name. Key codes come with KeyDown and KeyUp (virtual key codes, US
// layout); character codes with KeyPress (Windows-1252). The two overlap: 46 is the Delete
// key in one and "." in the other, which is why every rule names the one it means.
#include <cstdint>
#include <string_view>

namespace kel {

// Bits of the Shift argument of the key and mouse events.
enum : int16_t {
    kShiftMask = 1,
    kCtrlMask = 2,
    kAltMask = 4,
};

// Virtual key codes.
enum VirtualKey : int16_t {
    kVkBackspace = 8, kVkTab = 9, kVkEnter = 13, kVkEscape = 27, kVkSpace = 32, kVkPageUp = 33,
    kVkPageDown = 34, kVkEnd = 35, kVkHome = 36, kVkLeft = 37, kVkUp = 38, kVkRight = 39, kVkDown = 40,
    kVkInsert = 45, kVkDelete = 46, kVkHelp = 47, kVkF1 = 112, kVkF12 = 123, kVkNumLock = 144,
    kVkSlash = 191,  // the "/?" key
};

// Character codes of KeyPress.
enum CharCode : int16_t {
    kCharBackspace = 8,
    kCharTab = 9,
    kCharLineFeed = 10,
    kCharEnter = 13,
    kCharSpace = ' ',
    kCharPoint = '.',
    kCharSlash = '/',
};

// The codes that put a character into a text: the space up to the last byte of the set.
// Control codes and 0 insert nothing.
inline constexpr bool inserts_character(int code) { return code >= kCharSpace && code <= 255; }

// Keystrokes a control queues for itself.
inline constexpr std::string_view kKeysEnd = "{END}";
inline constexpr std::string_view kKeysDel = "{DEL}";
inline constexpr std::string_view kKeysTab = "{TAB}";
inline constexpr std::string_view kKeysBackTab = "+{TAB}";

}  // namespace kel

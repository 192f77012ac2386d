// app/FrameRules.h - decisions of the main frame: keys and the keyboard table.
#pragma once

#include <cstdint>

struct Shortcut {
    int key;           // a letter in upper case, or the code of a control key
    int needsModifier; // 1: only with Alt or Ctrl
    int id;            // command for the panel
    const char *label; // for the log
};

// The key to look up when one is pressed; 0 when it is for the control with the focus. `key` is the
// toolkit's key code, 0 for letters other than Latin ones; `typed` is the character that the key
// types, 0 for none; `latin` is the Latin letter that is printed on the key, 0 for none.
int Frame_ShortcutKey(int key, int typed, int latin, bool alt, bool ctrl);

// The row for a key; null when the key is not for the frame. `key` is a character in either case,
// 0 for none.
const Shortcut *Frame_FindShortcut(int key, bool alt, bool ctrl);

// What stands for a character in the log: itself, or a blank for a control character, a surrogate
// or 0, which would end or spoil the line.
uint32_t Frame_LogCharacter(uint32_t character);

// app/FrameRules.h - decisions of the main frame: the keyboard table.
#pragma once

struct Shortcut {
    int key;           // a letter in upper case, or the code of a control key
    int needsModifier; // 1: only with Alt or Ctrl
    int id;            // command for the panel
    const char *label; // for the log
};

// The row for a key; null when the key is not for the frame. `key` is a character in either case,
// 0 for none.
const Shortcut *Frame_FindShortcut(int key, bool alt, bool ctrl);

// app/FrameRules.h - decisions of the main frame: place and size, tool icons, the keyboard table.
#pragma once

#include <cstdint>

enum {
    FRAME_MIN_WIDTH = 800, // of a window that opens; the user may make it smaller
    FRAME_MIN_HEIGHT = 600,
    TOOL_ICON_SIZE = 16,
    FRAME_KEY_F1 = 256 // stands for the function key, which is no character
};

// Outer edges of a window.
struct FrameGeometry {
    int x, y, width, height;
};

struct FrameSize {
    int width, height;
};

// Where a window opens that was left at `stored`: at least `smallest`, at most as large as the
// desktop, and wholly on it. One unit of length for all; the desktop begins at 0, 0.
FrameGeometry Frame_FitGeometry(FrameGeometry stored, FrameSize smallest, FrameSize desktop);

// The size of the tool icons for the setting TOOLSIZE of the environment (null: none).
int Frame_ToolIconSize(const char *setting);

// A row for one key has one command for each mode of the panel; 0 leaves the key to a later row,
// or to the control with the focus.
struct Shortcut {
    int key;           // a letter in upper case, or the code of a control key
    int needsModifier; // 1: only with Alt or Ctrl
    int listId;        // command for the panel
    int editId;        // the same while an entry is edited
    const char *label; // for the log
};

// The key to look up when one is pressed; 0 when it is for the control with the focus. `key` is the
// toolkit's key code, 0 for letters other than Latin ones; `typed` is the character that the key
// types, 0 for none; `latin` is the Latin letter that is printed on the key, 0 for none.
int Frame_ShortcutKey(int key, int typed, int latin, bool alt, bool ctrl);

// The row for a key, and its command in `id`; null when the key is not for the frame. `key` is a
// character in either case or FRAME_KEY_F1, 0 for none.
const Shortcut *Frame_FindShortcut(int key, bool alt, bool ctrl, bool editMode, int *id);

// What stands for a character in the log: itself, or a blank for a control character, a surrogate
// or 0, which would end or spoil the line.
uint32_t Log_Character(uint32_t character);

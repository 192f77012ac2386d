#include "app/FrameRules.h"

#include "app/Ids.h"

static const Shortcut Shortcuts[] = {
    {'B', 1, ID_SAVE, "Save BIB Files ..."},
    {'F', 1, ID_SEARCH, "Find ..."},
    {'M', 1, ID_MESSAGES, "Show Messages ..."},
};

const Shortcut *Frame_FindShortcut(int key, bool alt, bool ctrl)
{
    if (key <= 0 || key > 127)
        return nullptr; // AltGr shows as Alt and Ctrl, and what it types is for the control
    int folded = key >= 'a' && key <= 'z' ? key - ('a' - 'A') : key;
    for (const Shortcut &row : Shortcuts) {
        if (row.key == folded && (!row.needsModifier || alt || ctrl))
            return &row;
    }
    return nullptr;
}

#include "app/FrameRules.h"

#include "app/Ids.h"

static const Shortcut Shortcuts[] = {
    {'B', 1, ID_SAVE, "Save BIB Files ..."},
    {'F', 1, ID_SEARCH, "Find ..."},
    {'M', 1, ID_MESSAGES, "Show Messages ..."},
    {'O', 1, ID_OPEN, "Open BIB file ..."},
};

int Frame_ShortcutKey(int key, int typed, int latin, bool alt, bool ctrl)
{
    bool altGr = alt && ctrl; // so it shows
    if (altGr && typed > ' ' && typed != key)
        return 0; // a character that is to be typed
    return key == 0 && !altGr ? latin : key;
}

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

uint32_t Frame_LogCharacter(uint32_t character)
{
    bool isControl = character < ' ' || (character >= 0x7F && character < 0xA0);
    bool isSurrogate = character >= 0xD800 && character <= 0xDFFF;
    return isControl || isSurrogate ? ' ' : character;
}

#include "app/FrameRules.h"

#include <algorithm>
#include <cstdlib>

#include "ui/Ids.h"

FrameGeometry Frame_FitGeometry(FrameGeometry stored, FrameSize smallest, FrameSize desktop)
{
    int width = std::min(std::max(stored.width, smallest.width), desktop.width);
    int height = std::min(std::max(stored.height, smallest.height), desktop.height);
    return {std::max(std::min(stored.x, desktop.width - width), 0),
            std::max(std::min(stored.y, desktop.height - height), 0), width, height};
}

int Frame_ToolIconSize(const char *setting)
{
    const int LARGEST = 256; // beyond that, the tools would leave no room for the list
    long size = setting ? strtol(setting, nullptr, 10) : 0;
    if (size <= TOOL_ICON_SIZE)
        return TOOL_ICON_SIZE;
    return static_cast<int>(std::min<long>(size, LARGEST)) + 4;
}

enum { KEY_TAB = 9, KEY_ENTER = 13, KEY_ESCAPE = 27 };

// The first row that matches and has a command for the mode counts.
static const Shortcut Shortcuts[] = {
    {KEY_TAB, 0, ID_EDIT_ENTRY, 0, "Edit Entry ..."},
    {KEY_ENTER, 0, ID_CITE, ID_CITE, "Insert \\cite ..."},
    {'A', 1, ID_NEW_ENTRY, ID_NEW_FIELD, "Add New Entry ..."},
    {'D', 1, ID_REMOVE_ENTRY, ID_REMOVE_FIELD, "Delete Entry ..."},
    {'N', 1, ID_RENAME_ENTRY, ID_RENAME_FIELD, "Rename Entry ..."},
    {'E', 1, ID_EDIT_ENTRY, ID_EDIT_FIELD, "Edit Entry ..."},
    {KEY_ESCAPE, 0, ID_EDIT_ENTRY, ID_COMMIT_ENTRY, "Edit Entry ..."},
    {'S', 1, ID_STRINGS, ID_STRINGS, "Edit Strings ..."},
    {'P', 1, ID_PREAMBLE, ID_PREAMBLE, "Edit Preamble ..."},
    {'M', 1, ID_MESSAGES, ID_MESSAGES, "Show Messages ..."},
    {'B', 1, ID_SAVE, ID_SAVE, "Save BIB Files ..."},
    {'F', 1, ID_SEARCH, ID_SEARCH, "Find ..."},
    {FRAME_KEY_F1, 0, ID_HELP, ID_HELP, "Help ..."},
    {'O', 1, ID_OPEN, ID_OPEN, "Open BIB file ..."},
};

int Frame_ShortcutKey(int key, int typed, int latin, bool alt, bool ctrl)
{
    bool altGr = alt && ctrl; // so it shows
    if (altGr && typed > ' ' && typed != key)
        return 0; // a character that is to be typed
    return key == 0 && !altGr ? latin : key;
}

const Shortcut *Frame_FindShortcut(int key, bool alt, bool ctrl, bool editMode, int *id)
{
    if (key <= 0)
        return nullptr;
    int folded = key >= 'a' && key <= 'z' ? key - ('a' - 'A') : key;
    for (const Shortcut &row : Shortcuts) {
        *id = editMode ? row.editId : row.listId;
        if (row.key == folded && (!row.needsModifier || alt || ctrl) && *id != 0)
            return &row;
    }
    return nullptr;
}

uint32_t Log_Character(uint32_t character)
{
    bool isControl = character < ' ' || (character >= 0x7F && character < 0xA0);
    bool isSurrogate = character >= 0xD800 && character <= 0xDFFF;
    return isControl || isSurrogate ? ' ' : character;
}

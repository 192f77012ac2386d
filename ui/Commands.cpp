// ui/Commands.cpp - the table of commands, and what is looked up in it.
#include "ui/Commands.h"

#include <algorithm>
#include <vector>

#include "encoding/Encoding.h"
#include "session/Schema.h"
#include "ui/Ids.h"

enum { HELP_LENGTH = 1023 }; // bytes of the text while an entry is edited
enum { TAB = 9, ENTER = 13, ESC = 27 };

static constexpr int Alt(char letter)
{
    return COMMAND_WITH_ALT | letter;
}

// Id, window; label, icon and tip of the tool; keys in the list and while an entry is edited, and
// their label; lines of the two help texts. Misspelt or odd texts stand so: others rely on them.
const Command Commands[] = {
    {ID_SAVE,
     COMMAND_OF_PANEL,
     {"Save", "document-save", "Save All BIB files."},
     {Alt('B')},
     {Alt('B')},
     "Save BIB Files ...",
     {7, "Alt+B\tSave Modified BIB files"},
     {}},
    {ID_STRINGS,
     COMMAND_OF_PANEL,
     {"Strings", "script-edit", "Edit/Insert Strings [Abbreviations] (Alt+S)"},
     {Alt('S')},
     {Alt('S')},
     "Edit Strings ...",
     {5, "Alt+S\tEdit Strings"},
     {6, "Alt+S\tEdit Strings. It is useful to insert into a field reference on string."}},
    {ID_PREAMBLE,
     COMMAND_OF_PANEL,
     {"Preambles", "accessories-text-editor", "Edit Preamble (Alt+P)"},
     {Alt('P')},
     {Alt('P')},
     "Edit Preamble ...",
     {6, "Alt+P\tEdit Preamble"},
     {7, "Alt+P\tEdit Preamble."}},
    {ID_CITE,
     COMMAND_OF_PANEL,
     {"\\cite", "insert-tex-cite",
      "Inserts `\\cite' command into the currently edited (La)TeX file (ENTER)"},
     {ENTER},
     {ENTER},
     "Insert \\cite ...",
     {8, "Enter\tInsert proper \\cite command into your document."},
     {8, "Enter\tInsert proper \\cite command into your document."}},
    {ID_NEW_ENTRY,
     COMMAND_OF_PANEL,
     {"New", "list-add", "Add new Bibliography entry (Alt+A)"},
     {Alt('A')},
     {},
     "Add New Entry ...",
     {2, "Alt+A\tAdd New Entry"},
     {}},
    {ID_RENAME_ENTRY,
     COMMAND_OF_PANEL,
     {"Rename", "list-rename", "Rename currently selected entry (Alt+N)"},
     {Alt('N')},
     {},
     "Rename Entry ...",
     {4, "Alt+N\tRename an Entry"},
     {}},
    {ID_REMOVE_ENTRY,
     COMMAND_OF_PANEL,
     {"Delete", "list-remove", "Remove currently selected entry (Alt+D)"},
     {Alt('D')},
     {},
     "Delete Entry ...",
     {3, "Alt+D\tDelete an Entry"},
     {}},
    {ID_EDIT_ENTRY,
     COMMAND_OF_PANEL,
     {"Edit", "list-edit", "Edit currently selected entry (Alt+E,ESC,TAB)"},
     {Alt('E'), ESC, TAB},
     {},
     "Edit Entry ...",
     {1, "Alt+E\tEdit an Entry (also ESC) - comes to <Entry Editing> mode,"},
     {}},
    {ID_MESSAGES,
     COMMAND_OF_PANEL,
     {"Messages", "Warning", "Show error/warning messages of loading current BIB-file (Alt+M)"},
     {Alt('M')},
     {Alt('M')},
     "Show Messages ...",
     {},
     {}},
    {ID_SEARCH,
     COMMAND_OF_FRAME,
     {"Find", nullptr, "Enter string to find entries"},
     {Alt('F')},
     {Alt('F')},
     "Find ...",
     {},
     {}},
    {ID_HELP,
     COMMAND_OF_FRAME,
     {"Help", "help-contents", "Help on using Cartulo"},
     {COMMAND_KEY_F1},
     {COMMAND_KEY_F1},
     "Help ...",
     {},
     {}},
    {ID_ABOUT, COMMAND_OF_FRAME, {"About", "help-about", "About Cartulo"}, {}, {}, nullptr, {}, {}},
    {ID_OPEN, COMMAND_OF_PANEL, {}, {Alt('O')}, {Alt('O')}, "Open BIB file ...", {}, {}},
    {ID_COMMIT_ENTRY,
     COMMAND_OF_PANEL,
     {},
     {},
     {ESC},
     "Edit Entry ...",
     {},
     {1, "ESC\tReturn to <Entry List> mode."}},
    {ID_EDIT_FIELD,
     COMMAND_OF_PANEL,
     {},
     {},
     {Alt('E')},
     "Edit Entry ...",
     {},
     {2, "Alt+E\tEdits currently selected field in large window."}},
    {ID_NEW_FIELD,
     COMMAND_OF_PANEL,
     {},
     {},
     {Alt('A')},
     "Add New Entry ...",
     {},
     {3, "Alt+A\tAdd new Field with key name specified in bottom combo box."}},
    {ID_REMOVE_FIELD,
     COMMAND_OF_PANEL,
     {},
     {},
     {Alt('D')},
     "Delete Entry ...",
     {},
     {4, "Alt+D\tDelete currently selected field."}},
    {ID_RENAME_FIELD,
     COMMAND_OF_PANEL,
     {},
     {},
     {Alt('N')},
     "Rename Entry ...",
     {},
     {5, "Alt+N\tRename currently selected field (change field key)."}},
};
const int CommandCount = sizeof Commands / sizeof *Commands;

// --- The keyboard ---

int Command_Key(int key, int typed, int latin, bool alt, bool ctrl)
{
    bool altGr = alt && ctrl; // so it shows
    if (altGr && typed > ' ' && typed != key)
        return 0; // a character that is to be typed
    return key == 0 && !altGr ? latin : key;
}

static bool Starts(const int (&keys)[COMMAND_KEYS], int key, bool modified)
{
    return std::any_of(keys, keys + COMMAND_KEYS, [=](int wanted) {
        return wanted == key || (modified && wanted == (key | COMMAND_WITH_ALT));
    });
}

const Command *Command_Find(int key, bool alt, bool ctrl, bool editMode)
{
    if (key <= 0 || key > COMMAND_KEY_F1)
        return nullptr;
    int folded = key >= 'a' && key <= 'z' ? key - ('a' - 'A') : key;
    for (const Command &command : Commands)
        if (Starts(editMode ? command.editKeys : command.listKeys, folded, alt || ctrl))
            return &command;
    return nullptr;
}

// --- Help ---

static std::vector<CommandHelp> HelpLines(bool editMode)
{
    std::vector<CommandHelp> lines;
    for (const Command &command : Commands) {
        const CommandHelp &help = editMode ? command.editHelp : command.listHelp;
        if (help.place > 0)
            lines.push_back(help);
    }
    std::sort(lines.begin(), lines.end(),
              [](const CommandHelp &a, const CommandHelp &b) { return a.place < b.place; });
    return lines;
}

std::string Command_HelpText(const char *ini, const char *type, bool editMode)
{
    std::string text =
        editMode ? "<Entry Editing> mode Accelerators:" : "<Entry List> Mode Accelerators:";
    for (const CommandHelp &help : HelpLines(editMode))
        text.append("\n\t").append(help.line);
    if (!editMode)
        return text;
    text.append("\n`").append(type).append("' entry is for ");
    return Enc_CutTo(HELP_LENGTH, text + Schema_Description(ini, type));
}

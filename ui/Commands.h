// ui/Commands.h - the program's commands in one table, which feeds the tool bar, the keyboard and
// the help text.
//
// A command is an identifier. The window that carries it out has a handler for it in its event
// table; the others pass it on.
#pragma once

#include <string>

enum {
    COMMAND_KEYS = 3,         // at most, in one mode
    COMMAND_WITH_ALT = 0x400, // of a key: only with Alt or Ctrl
    COMMAND_KEY_F1 = 0x100    // stands for the function key, which is no character
};

enum CommandHandler { COMMAND_OF_PANEL, COMMAND_OF_FRAME };

// In the tool bar, where the tools stand in the order of the table.
struct CommandTool {
    const char *label; // null: there is none
    const char *icon;  // name of its picture; null: it is the search field
    const char *tip;
};

struct CommandHelp {
    int place;        // from 1 on, among the lines of the mode; 0: there is none
    const char *line; // its keys, a tab, what it does
};

struct Command {
    int id;                 // from ui/Ids.h
    CommandHandler handler; // whose event table has it; a test holds the two against each other
    CommandTool tool;

    // The keys that start it in the list, and while an entry is edited: letters in upper case,
    // codes of control keys, COMMAND_KEY_F1; 0 ends them early. No mode has a key twice.
    int listKeys[COMMAND_KEYS], editKeys[COMMAND_KEYS];
    const char *keyLabel; // for the log, when a key has started it; null without keys
    CommandHelp listHelp, editHelp;
};

extern const Command Commands[];
extern const int CommandCount;

// The key to look up when one is pressed; 0 when it is for the control with the focus. `key` is the
// toolkit's key code, 0 for letters other than Latin ones; `typed` is the character that the key
// types, 0 for none; `latin` is the Latin letter that is printed on the key, 0 for none.
int Command_Key(int key, int typed, int latin, bool alt, bool ctrl);

// The command of a key; null when the key is not for the frame. `key` is a character in either case
// or COMMAND_KEY_F1, 0 for none.
const Command *Command_Find(int key, bool alt, bool ctrl, bool editMode);

// The help text of the entry pane (store text): a line for each command with keys, and while an
// entry is edited, what its type is for.
std::string Command_HelpText(const char *ini, const char *type, bool editMode);

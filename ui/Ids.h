// ui/Ids.h - command identifiers, shared by the tool bar, the keyboard table and the panel.
#pragma once

enum { TOOL_ICON_SIZE = 16 }; // of the pictures of tools; device-independent pixels

enum {
    ID_COMMAND_FIRST = 4999, // the frame hands commands of this range on to the panel
    ID_OPEN = 5000,
    ID_CLOSE = 5001,
    ID_SAVE = 5003,
    ID_EXIT = 5006,
    ID_HELP = 5009,
    ID_ABOUT = 5014,
    ID_SPLITTER = 6000,
    ID_SEARCH, // as a command: puts the focus into the search field
    ID_INDEX,
    ID_TYPE = 6004,
    ID_STRINGS = 6006,
    ID_PREAMBLE,
    ID_MESSAGES,
    ID_CITE,
    ID_NEW_ENTRY,
    ID_REMOVE_ENTRY,
    ID_RENAME_ENTRY,
    ID_EDIT_ENTRY,
    ID_COMMIT_ENTRY,
    ID_NEW_FIELD = 6016,
    ID_NEW_FIELD_KEY,
    ID_RENAME_FIELD,
    ID_REMOVE_FIELD,
    ID_EDIT_FIELD,
    ID_CONTEXT_MENU,
    ID_REMOVE_ROW = 6023,     // the first row's; one each
    ID_REMOVE_ROW_END = 6039, // behind the last row's
    ID_COMMAND_LAST = 6040
};

// Other programs of the environment and the help pages know the numbers.
static_assert(ID_OPEN == 5000 && ID_CLOSE == 5001 && ID_SAVE == 5003 && ID_EXIT == 5006);
static_assert(ID_HELP == 5009 && ID_ABOUT == 5014);
static_assert(ID_SPLITTER == 6000 && ID_SEARCH == 6001 && ID_INDEX == 6002 && ID_TYPE == 6004);
static_assert(ID_STRINGS == 6006 && ID_PREAMBLE == 6007 && ID_MESSAGES == 6008 && ID_CITE == 6009);
static_assert(ID_NEW_ENTRY == 6010 && ID_REMOVE_ENTRY == 6011 && ID_RENAME_ENTRY == 6012);
static_assert(ID_EDIT_ENTRY == 6013 && ID_COMMIT_ENTRY == 6014 && ID_NEW_FIELD == 6016);
static_assert(ID_NEW_FIELD_KEY == 6017 && ID_RENAME_FIELD == 6018 && ID_REMOVE_FIELD == 6019);
static_assert(ID_EDIT_FIELD == 6020 && ID_CONTEXT_MENU == 6021 && ID_REMOVE_ROW == 6023);
static_assert(ID_REMOVE_ROW_END == 6039);

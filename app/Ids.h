// app/Ids.h - command identifiers, shared by the tool bar, the keyboard table and the panel.
#pragma once

enum {
    ID_COMMAND_FIRST = 4999, // the frame hands commands of this range on to the panel
    ID_OPEN = 5000,
    ID_CLOSE = 5001,
    ID_SAVE = 5003,
    ID_EXIT = 5006,
    ID_SPLITTER = 6000,
    ID_SEARCH, // as a command: puts the focus into the search field
    ID_INDEX,
    ID_MESSAGES = 6008,
    ID_COMMAND_LAST = 6040
};

// Other programs of the environment and the help pages know the numbers.
static_assert(ID_SPLITTER == 6000 && ID_SEARCH == 6001 && ID_INDEX == 6002);
static_assert(ID_OPEN == 5000 && ID_SAVE == 5003 && ID_MESSAGES == 6008);

// ui/PanelRules.h - decisions of the editor panel that need no window.
#pragma once

#include <string>

#include "session/FileSet.h"

// What the panel shows beside the list, or instead of it.
enum PanelPane {
    PANE_OPEN,  // no file is open: only the button that opens one
    PANE_ENTRY, // the list and the selected entry
    PANE_NEW    // the list has no row: the button that adds an entry
};
PanelPane Panel_Pane(int fileCount, int rowCount);

// Which commands on entries apply. `file` is the index of the current file; any other number when
// there is none.
struct PanelTools {
    bool add, change; // change: edit, rename, remove
};
PanelTools Panel_Tools(const BibFileSet *set, int file, bool editMode);

// The question before files are saved; bytes as the system spells names, not store text.
std::string Panel_SaveQuestion(const BibFileSet *set);

// The row whose field a command removes: of a row's button (ID_REMOVE_ROW and following), or, for
// ID_REMOVE_FIELD, the one with the focus; when none has it (-1), `storedRows`, which is no row.
// -1 for another command.
int Panel_RowToRemove(int id, int focusedRow, int storedRows);

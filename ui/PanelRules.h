// ui/PanelRules.h - decisions of the editor panel that need no window.
#pragma once

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

// The row whose field a command removes: of a row's button (ID_REMOVE_ROW and following), or, for
// ID_REMOVE_FIELD, the one with the focus; when none has it (-1), `storedRows`, which is no row.
// -1 for another command.
int Panel_RowToRemove(int id, int focusedRow, int storedRows);

struct Colour {
    unsigned char red, green, blue;
};

// How far two colours stand apart for the eye: 1 (equal) to 21 (black on white).
double Colour_Contrast(Colour a, Colour b);

// The colour of a text whose colour was chosen for light backgrounds: itself on those, and on a
// dark one the same hue, light enough for a contrast of 4.5 at least, of 7 where the colour was
// dark, so that dark and bright ones stay apart.
Colour Colour_ForText(Colour chosen, Colour background, bool darkTheme);

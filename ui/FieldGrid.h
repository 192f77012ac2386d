// ui/FieldGrid.h - the rows of the entry pane without their controls: what they show, what the user
// made of them, and the entry that a commit builds from them.
//
// A row belongs to the entry unless it is inherited: shown from the entry that `crossref` names,
// for reading only. A row whose text is still what its control held after filling keeps the bytes
// that are stored, whatever the code page can say of them.
#pragma once

#include <string>
#include <vector>

#include "store/BibStore.h"

enum { GRID_ROWS = 16 };

struct GridRow {
    std::string key;     // store text
    std::string stored;  // the value that the row was filled with; "" for a new row
    std::wstring filled; // how the control shows that
    std::wstring text;   // what the control holds now
    bool inherited;
    bool locked;      // the control cannot hold the whole value, so it is kept as stored
    int32_t reserved; // travels with the field (BibField)
};

struct FieldGrid {
    GridRow rows[GRID_ROWS];
    int count;              // rows that are shown
    const BibEntry *entry;  // whose fields these are; belongs to its file; null for none
    const BibEntry *target; // the entry that it inherits from; of the same file; null for none
    int hidden;             // own fields that found no row; a commit carries them over
};

// --- Showing ---

// The entry behind this one in its file whose key is the value of this one's field `crossref`,
// ignoring case; null for none.
const BibEntry *Grid_FindTarget(const BibEntry *entry);

// One row per field, then the inherited ones. `filled` and `text` are the values as the code page
// shows them; the window puts into both what its control really holds.
void Grid_Fill(FieldGrid *grid, const BibEntry *entry);
void Grid_Clear(FieldGrid *grid);

bool Grid_IsCrossref(const GridRow *row); // its value cannot be edited

// --- Editing ---

enum GridAdd { GRID_ADDED, GRID_OVERRIDDEN, GRID_FULL, GRID_EXISTS };

// A row for a key: a new one at the end, or the inherited one, which becomes the entry's own.
// `*row` is the row.
GridAdd Grid_Add(FieldGrid *grid, const char *key, int *row);

enum GridRemove { GRID_REMOVED, GRID_INHERITED, GRID_NO_ROW };

// Takes a row away; what follows moves up. Where the target has the field, the row turns back into
// an inherited one. Only the first rows, as many as the entry has stored fields, can be removed.
GridRemove Grid_Remove(FieldGrid *grid, int row);

// 1 when the name may take the place of the row's key: no shown value reads like it.
int Grid_MayRename(const FieldGrid *grid, const char *name);
void Grid_Rename(FieldGrid *grid, int row, const char *name);

// --- Committing ---

struct GridChanges {
    bool type;
    int added, modified, removed;
};

// What a commit would change. Adds no name to the tables.
GridChanges Grid_Compare(const FieldGrid *grid, int type);
bool Grid_HasChanges(const GridChanges *changes);

std::string Grid_Question(const GridChanges *changes); // "There are changes in this entry: ..."

// What a commit would lose, "" for nothing: for each changed row with such characters, its key and
// the characters that the code page cannot represent, or guillemets, which would become the marks
// of abbreviations where they do not stand for those.
std::wstring Grid_Losses(const FieldGrid *grid);

// Why a row's value cannot be written as BibTeX (static text); null when it can. Also null for an
// inherited row.
const char *Grid_CheckRow(const FieldGrid *grid, int row);

// 1 when the table of field names has room for the keys of all rows.
int Grid_HasRoom(const FieldGrid *grid);

// The entry as the rows have it now, with hidden fields at the end; not linked yet. Null when
// memory is out. Grid_HasRoom first.
BibEntry *Grid_Build(const FieldGrid *grid, int type);

// Puts a new entry in the place of an old one, which is freed. 0 when `old` is not of that file:
// nothing is changed then.
int Grid_Replace(BibFile *file, BibEntry *old, BibEntry *entry);

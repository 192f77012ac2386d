// ui/FieldGrid.h - the rows of the entry pane without their controls: what they show, what the user
// made of them, and the entry that a commit builds from them.
//
// A row belongs to the entry, unless it is inherited: shown, for reading only, from the parent,
// which `crossref` names. A row that the user did not change, or that is locked, keeps its stored
// bytes, even those that its encoding cannot show.
//
// The grid reads `entry` and `parent` as long as it shows them: clear or fill it before they go.
#pragma once

#include <string>
#include <vector>

#include "session/Names.h"
#include "store/BibStore.h"

struct EncodingRecord;
struct StringSources;

enum { GRID_ROWS = 16, GRID_NO_FIELD = -1 };

struct GridRow {
    std::string key;     // store text
    std::string stored;  // the value that the row was filled with; "" for a new row
    std::wstring filled; // how the control shows that
    std::wstring text;   // what the control holds now
    bool inherited;
    bool locked;       // the control cannot hold the whole value, so it is kept as stored
    bool crossref;     // filled with the entry's `crossref`, which cannot be edited; a row that the
                       // user adds can, as its value has to come from somewhere
    int field;         // slot of the entry's field that it was filled with, or GRID_NO_FIELD
    int32_t companion; // travels with the field (BibField)
};

struct FieldGrid {
    GridRow rows[GRID_ROWS];
    int count;                      // rows that are shown
    const EncodingRecord *encoding; // of the file
    const BibEntry *entry;          // whose fields these are; belongs to its file; null for none
    const BibEntry *parent; // the entry that it inherits from; of the same file; null for none
};

// --- Showing ---

// The entry behind this one in its file whose key is the value of this one's field `crossref`,
// ignoring case; null for none.
const BibEntry *Grid_FindParent(const BibEntry *entry);

// One row per field, then the inherited ones. `filled` and `text` are the values as the file's
// encoding shows them; the window puts into both what its control really holds.
void Grid_Fill(FieldGrid *grid, const BibEntry *entry, const EncodingRecord *encoding);
void Grid_Clear(FieldGrid *grid);

// How many of the entry's stored fields have a row when it is filled.
int Grid_StoredRows(const FieldGrid *grid);

// A field that found no row. A commit carries the entry's own over.
struct HiddenField {
    std::string key;
    bool inherited;
};
std::vector<HiddenField> Grid_HiddenFields(const FieldGrid *grid);

// How many there are, for the user; "" for none.
std::string Grid_HiddenText(const FieldGrid *grid);

// --- Editing ---

enum GridAdd { GRID_ADDED, GRID_OVERRIDDEN, GRID_FULL, GRID_EXISTS };

// Gives `key` a row: a new one at the end, or the inherited one, which becomes the entry's own.
// That is `*row`, which stays as it is for GRID_FULL and GRID_EXISTS. A hidden field exists.
GridAdd Grid_Add(FieldGrid *grid, const char *key, int *row);

enum GridRemove { GRID_REMOVED, GRID_INHERITED, GRID_NO_ROW };

// Takes a row away; what follows moves up. Where the parent has the field, the row turns back into
// an inherited one, unless another row shows it already: it is filled anew, and again the window
// puts into `filled` and `text` what its control holds. Only the first Grid_StoredRows can be
// removed.
GridRemove Grid_Remove(FieldGrid *grid, int row);

// False when a shown value equals the name, ignoring case. Other keys do not matter.
bool Grid_MayRename(const FieldGrid *grid, const char *name);
void Grid_Rename(FieldGrid *grid, int row, const char *name);

// For the new name of a field. It is taken when a shown value reads like it. Whether a name is
// taken for a new field is up to Grid_Add.
NameVerdict Grid_CheckNewName(const FieldGrid *grid, const TypedName &name);

// --- Committing: of a grid that shows an entry ---

struct GridChanges {
    bool type;
    int added, modified, removed;
};

// What a commit would change. Each row of the entry's own stands for one field: the one that it was
// filled with, or, under another key, the last one of that key that no other row stands for. Hidden
// fields do not count. Adds no name to the tables.
GridChanges Grid_Compare(const FieldGrid *grid, int type);
bool Grid_HasChanges(const GridChanges *changes);
bool Grid_ChangesOnlyType(const GridChanges *changes);

std::string Grid_Question(const GridChanges *changes); // "There are changes in this entry: ..."

// The question before a commit that may lose something; "" when it can't. It names each
// changed row with
// - characters that the encoding would not bring back;
// - guillemets, when some stored value of the entry or its parent has some that are text: those
//   would become the marks of abbreviations, and which of them the user typed cannot be told.
//   Without any there, guillemets are what the user types for an abbreviation;
// - abbreviations that the user typed and `sources` (null: all are known) do not have: text in
//   guillemets, perhaps.
std::wstring Grid_Losses(const FieldGrid *grid, const StringSources *sources);

// Why a row's value cannot be written as BibTeX, or not be read back (static text); null when all
// is well. Also null for an inherited row.
const char *Grid_CheckRow(const FieldGrid *grid, int row);

// True when the table of field names has room for the keys of all rows.
bool Grid_HasRoom(const FieldGrid *grid);

// The entry as the rows have it now, with hidden fields at the end; not linked yet. Null when
// memory is out. Grid_HasRoom first.
BibEntry *Grid_Build(const FieldGrid *grid, int type);

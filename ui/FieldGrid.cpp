// ui/FieldGrid.cpp - filling, editing, comparing and building the rows of an entry.
#include "ui/FieldGrid.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "base/Ascii.h"
#include "encoding/Encoding.h"
#include "session/Changes.h"
#include "session/FieldCheck.h"
#include "session/Values.h"

static bool SameName(const char *a, const char *b)
{
    return Ascii_Compare(a, b) == 0;
}

static const char *NameOf(const BibField *field)
{
    return BibFieldTable[field->name];
}

// Null when the entry has none of this name.
static const BibField *FindField(const BibEntry *entry, const char *name)
{
    int slot = Bib_FindField(entry, name);
    return slot >= 0 ? &entry->fields[slot] : nullptr;
}

static int CountShown(const BibEntry *entry) // fields that get a row
{
    return std::min<int>(entry->fieldCount, GRID_ROWS);
}

// --- Showing ---

const BibEntry *Grid_FindParent(const BibEntry *entry)
{
    const BibField *crossref = FindField(entry, "crossref");
    const BibEntry *parent = crossref ? entry->next : nullptr;
    while (parent && !SameName(parent->key, crossref->value))
        parent = parent->next;
    return parent;
}

static void FillRow(const FieldGrid *grid, GridRow *row, const char *key, const char *value)
{
    *row = {};
    row->key = key;
    row->stored = value;
    row->filled = row->text = Value_Show(value, grid->encoding);
    row->field = GRID_NO_FIELD;
}

static void FillOwnRow(const FieldGrid *grid, GridRow *row, int index)
{
    const BibField *field = &grid->entry->fields[index];
    FillRow(grid, row, NameOf(field), field->value);
    row->crossref = SameName(NameOf(field), "crossref");
    row->field = index;
    row->companion = field->companion;
}

static void FillInheritedRow(const FieldGrid *grid, GridRow *row, const BibField *field)
{
    FillRow(grid, row, NameOf(field), field->value);
    row->inherited = true;
}

static void FillInheritedRows(FieldGrid *grid)
{
    for (int i = 0; i < grid->parent->fieldCount && grid->count < GRID_ROWS; ++i) {
        const BibField *field = &grid->parent->fields[i];
        if (!FindField(grid->entry, NameOf(field)))
            FillInheritedRow(grid, &grid->rows[grid->count++], field);
    }
}

void Grid_Fill(FieldGrid *grid, const BibEntry *entry, const EncodingRecord *encoding)
{
    Grid_Clear(grid);
    grid->encoding = encoding;
    grid->entry = entry;
    grid->parent = Grid_FindParent(entry);
    grid->count = CountShown(entry);
    for (int i = 0; i < grid->count; ++i)
        FillOwnRow(grid, &grid->rows[i], i);
    if (grid->parent)
        FillInheritedRows(grid);
}

void Grid_Clear(FieldGrid *grid)
{
    *grid = {};
}

int Grid_StoredRows(const FieldGrid *grid)
{
    return grid->entry ? CountShown(grid->entry) : 0;
}

// The last one; -1 for none.
static int FindRow(const FieldGrid *grid, const char *key)
{
    int row = grid->count - 1;
    while (row >= 0 && !SameName(grid->rows[row].key.c_str(), key))
        --row;
    return row;
}

std::vector<HiddenField> Grid_HiddenFields(const FieldGrid *grid)
{
    std::vector<HiddenField> fields;
    for (int i = Grid_StoredRows(grid); grid->entry && i < grid->entry->fieldCount; ++i)
        fields.push_back({NameOf(&grid->entry->fields[i]), false});
    for (int i = 0; grid->parent && i < grid->parent->fieldCount; ++i) {
        const char *key = NameOf(&grid->parent->fields[i]);
        if (FindRow(grid, key) < 0 && !FindField(grid->entry, key))
            fields.push_back({key, true});
    }
    return fields;
}

static std::string CountText(long count, const char *what)
{
    if (count == 0)
        return "";
    return std::to_string(count) + " more " + what +
           (count == 1 ? "field is not shown." : "fields are not shown.");
}

std::string Grid_HiddenText(const FieldGrid *grid)
{
    std::vector<HiddenField> fields = Grid_HiddenFields(grid);
    long inherited = std::count_if(fields.begin(), fields.end(),
                                   [](const HiddenField &field) { return field.inherited; });
    std::string own = CountText(static_cast<long>(fields.size()) - inherited, "");
    std::string others = CountText(inherited, "inherited ");
    return own + (own.empty() || others.empty() ? "" : " ") + others;
}

// --- Editing ---

static bool IsHidden(const FieldGrid *grid, const char *key)
{
    std::vector<HiddenField> fields = Grid_HiddenFields(grid);
    return std::any_of(fields.begin(), fields.end(), [key](const HiddenField &field) {
        return !field.inherited && SameName(field.key.c_str(), key);
    });
}

static bool HasOwnRow(const FieldGrid *grid, const char *key)
{
    return std::any_of(grid->rows, grid->rows + grid->count, [key](const GridRow &row) {
        return !row.inherited && SameName(row.key.c_str(), key);
    });
}

GridAdd Grid_Add(FieldGrid *grid, const char *key, int *row)
{
    if (HasOwnRow(grid, key) || IsHidden(grid, key))
        return GRID_EXISTS;
    int found = FindRow(grid, key);
    if (found >= 0) {
        grid->rows[found].inherited = false;
        *row = found;
        return GRID_OVERRIDDEN;
    }
    if (grid->count == GRID_ROWS)
        return GRID_FULL;
    *row = grid->count++;
    FillRow(grid, &grid->rows[*row], key, "");
    return GRID_ADDED;
}

GridRemove Grid_Remove(FieldGrid *grid, int row)
{
    if (row < 0 || row >= grid->count || row >= Grid_StoredRows(grid))
        return GRID_NO_ROW;
    std::string key = grid->rows[row].key;
    const BibField *inherited = grid->parent ? FindField(grid->parent, key.c_str()) : nullptr;
    grid->rows[row].key.clear();
    if (inherited && FindRow(grid, key.c_str()) < 0) {
        FillInheritedRow(grid, &grid->rows[row], inherited);
        return GRID_INHERITED;
    }
    std::move(grid->rows + row + 1, grid->rows + grid->count, grid->rows + row);
    --grid->count;
    return GRID_REMOVED;
}

static bool SameLetter(wchar_t a, wchar_t b)
{
    auto lower = [](wchar_t c) { return c >= L'A' && c <= L'Z' ? c + (L'a' - L'A') : c; };
    return lower(a) == lower(b);
}

bool Grid_MayRename(const FieldGrid *grid, const char *name)
{
    std::wstring shown = Enc_Decode(name, grid->encoding);
    for (int i = 0; i < grid->count; ++i) {
        const std::wstring &text = grid->rows[i].text;
        if (std::equal(text.begin(), text.end(), shown.begin(), shown.end(), SameLetter))
            return false;
    }
    return true;
}

void Grid_Rename(FieldGrid *grid, int row, const char *name)
{
    grid->rows[row].key = name;
}

NameVerdict Grid_CheckNewName(const FieldGrid *grid, const TypedName &name)
{
    NameVerdict form = Name_Check(name);
    if (form != NAME_OK)
        return form;
    return Grid_MayRename(grid, name.text.c_str()) ? NAME_OK : NAME_TAKEN;
}

// --- What the rows amount to ---

static bool IsChanged(const GridRow *row)
{
    return !row->inherited && !row->locked && row->text != row->filled;
}

static std::string ValueOf(const FieldGrid *grid, const GridRow *row)
{
    return IsChanged(row) ? Value_Read(row->text, grid->encoding) : row->stored;
}

// A heap copy of that; null when memory is out.
static char *CopyValue(const FieldGrid *grid, const GridRow *row)
{
    if (!IsChanged(row))
        return Bib_CopyText(row->stored.data(), row->stored.size());
    char *buffer = static_cast<char *>(Bib_Alloc(row->text.size() * ENC_LONGEST + 1));
    if (!buffer)
        return nullptr;
    Enc_EncodeTo(buffer, row->text.c_str(), grid->encoding);
    Enc_LogConversion(row->text.c_str(), buffer);
    char *value = Bib_CopyText(buffer, strlen(buffer));
    free(buffer);
    return value;
}

static int CountOwnRows(const FieldGrid *grid)
{
    return static_cast<int>(std::count_if(grid->rows, grid->rows + grid->count,
                                          [](const GridRow &row) { return !row.inherited; }));
}

// --- Comparing ---

namespace
{

// Which field each row stands for, and which fields are taken.
struct Match {
    int fields[GRID_ROWS]; // by row; GRID_NO_FIELD for none
    bool taken[GRID_ROWS]; // by field
};

} // namespace

static void Take(Match *match, int row, int field)
{
    match->fields[row] = field;
    if (field != GRID_NO_FIELD)
        match->taken[field] = true;
}

static bool IsNamed(const BibEntry *entry, int field, const GridRow *row)
{
    return SameName(NameOf(&entry->fields[field]), row->key.c_str());
}

static int FindFreeField(const BibEntry *entry, const Match *match, const GridRow *row)
{
    int field = CountShown(entry) - 1;
    while (field >= 0 && (match->taken[field] || !IsNamed(entry, field, row)))
        --field;
    return field >= 0 ? field : GRID_NO_FIELD;
}

// Rows that still have their key come first: they keep their field when it has a namesake.
static Match MatchRows(const FieldGrid *grid)
{
    Match match = {};
    for (int i = 0; i < grid->count; ++i) {
        const GridRow *row = &grid->rows[i];
        bool keepsKey = row->field != GRID_NO_FIELD && IsNamed(grid->entry, row->field, row);
        Take(&match, i, keepsKey ? row->field : GRID_NO_FIELD);
    }
    for (int i = 0; i < grid->count; ++i)
        if (match.fields[i] == GRID_NO_FIELD && !grid->rows[i].inherited)
            Take(&match, i, FindFreeField(grid->entry, &match, &grid->rows[i]));
    return match;
}

GridChanges Grid_Compare(const FieldGrid *grid, int type)
{
    GridChanges changes = {};
    changes.type = type != grid->entry->type;
    Match match = MatchRows(grid);
    for (int i = 0; i < grid->count; ++i) {
        if (grid->rows[i].inherited)
            continue;
        int field = match.fields[i];
        if (field == GRID_NO_FIELD)
            ++changes.added;
        else if (ValueOf(grid, &grid->rows[i]) != grid->entry->fields[field].value)
            ++changes.modified;
    }
    changes.removed = CountShown(grid->entry) - CountOwnRows(grid) + changes.added;
    return changes;
}

bool Grid_HasChanges(const GridChanges *changes)
{
    return changes->type || changes->added || changes->modified || changes->removed;
}

bool Grid_ChangesOnlyType(const GridChanges *changes)
{
    return changes->type && !changes->added && !changes->modified && !changes->removed;
}

std::string Grid_Question(const GridChanges *changes)
{
    char text[256];
    snprintf(text, sizeof text,
             "There are changes in this entry:\n\n"
             "\tmodified type: \t%s\n"
             "\tadded fields: \t%d\n"
             "\tmodified fields: \t%d\n"
             "\tremoved fields: \t%d\n"
             "\nDo you want to accept these changes ?",
             changes->type ? "YES" : "NO", changes->added, changes->modified, changes->removed);
    return text;
}

// --- Losses ---

static bool HoldsGuillemets(const BibEntry *entry, const EncodingRecord *encoding)
{
    return std::any_of(
        entry->fields, entry->fields + entry->fieldCount,
        [encoding](const BibField &field) { return Value_HoldsGuillemets(field.value, encoding); });
}

static bool HasTextGuillemets(const FieldGrid *grid)
{
    return HoldsGuillemets(grid->entry, grid->encoding) ||
           (grid->parent && HoldsGuillemets(grid->parent, grid->encoding));
}

// --- Checking ---

// But for the value itself: reading that is logged.
static FieldFacts Facts(const FieldGrid *grid, const GridRow *row)
{
    FieldFacts field = {};
    field.name = row->key;
    field.isNew = row->field == GRID_NO_FIELD || !IsNamed(grid->entry, row->field, row);
    field.isChanged = IsChanged(row);
    field.label = Enc_Decode(row->key.c_str(), grid->encoding);
    field.text = row->text;
    field.filled = row->filled;
    field.stored = row->stored;
    field.encoding = grid->encoding;
    return field;
}

std::wstring Grid_Losses(const FieldGrid *grid, const StringSources *sources)
{
    bool textGuillemets = HasTextGuillemets(grid);
    std::wstring text;
    for (int i = 0; i < grid->count; ++i) {
        FieldFacts field = Facts(grid, &grid->rows[i]);
        field.textGuillemets = textGuillemets;
        field.sources = sources;
        text += FieldCheck_Warnings(field);
    }
    return text.empty() ? text : text + FieldCheck_Question;
}

const char *Grid_CheckRow(const FieldGrid *grid, int index)
{
    const GridRow *row = &grid->rows[index];
    if (row->inherited)
        return nullptr;
    FieldFacts field = Facts(grid, row);
    field.value = ValueOf(grid, row);
    return FieldCheck_Refusal(field);
}

// Whether the key of row i is neither in the table already nor brought there by an earlier row.
static bool IsNewName(const FieldGrid *grid, int i)
{
    const char *key = grid->rows[i].key.c_str();
    return !Bib_IsFieldKnown(key) &&
           std::none_of(grid->rows, grid->rows + i,
                        [key](const GridRow &row) { return SameName(row.key.c_str(), key); });
}

bool Grid_HasRoom(const FieldGrid *grid)
{
    int names = BibFieldCount;
    for (int i = 0; i < grid->count; ++i)
        names += IsNewName(grid, i);
    return names <= BIB_FIELD_LIMIT;
}

// --- Building ---

// With heap copies of the values; null where memory is out.
static std::vector<BibField> Fields(const FieldGrid *grid)
{
    std::vector<BibField> fields;
    for (int i = 0; i < grid->count; ++i) {
        const GridRow *row = &grid->rows[i];
        if (!row->inherited)
            fields.push_back(
                {Bib_FieldIndex(row->key.c_str()), row->companion, CopyValue(grid, row)});
    }
    for (int i = CountShown(grid->entry); i < grid->entry->fieldCount; ++i) {
        const BibField *hidden = &grid->entry->fields[i];
        fields.push_back(
            {hidden->name, hidden->companion, Bib_CopyText(hidden->value, strlen(hidden->value))});
    }
    return fields;
}

BibEntry *Grid_Build(const FieldGrid *grid, int type)
{
    std::vector<BibField> fields = Fields(grid);
    return Change_MakeEntry(grid->entry, type, fields.data(), static_cast<int>(fields.size()));
}

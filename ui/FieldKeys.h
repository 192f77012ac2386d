// ui/FieldKeys.h - which names the fields of an entry may get.
#pragma once

#include <string>

#include "ui/FieldGrid.h"

enum FieldKeyVerdict {
    FIELD_KEY_OK,
    FIELD_KEY_EMPTY,
    FIELD_KEY_BAD_CHARS,  // holds characters that no key may hold; Bib_StripKeyChars removes them
    FIELD_KEY_UNWRITABLE, // the parser would not read it back
    FIELD_KEY_TAKEN
};

extern const char FieldKey_BadCharsText[];
extern const char FieldKey_UnwritableText[];
extern const char FieldKey_TakenText[];

// What was typed, as store text, without characters of code 32 and below.
std::string FieldKey_Typed(const wchar_t *typed);

// For a new field; whether the entry has it already is up to Grid_Add.
FieldKeyVerdict FieldKey_CheckNew(const char *key);

// For the new name of a field. It is taken when a shown value reads like it.
FieldKeyVerdict FieldKey_CheckNewName(const FieldGrid *grid, const char *name);

// The row that a delete command means: of a row's button (ID_REMOVE_ROW and following), or, for
// ID_REMOVE_FIELD, the one with the focus. -1 for another command.
int FieldKey_RowToRemove(int id, int focusedRow, int storedFields);

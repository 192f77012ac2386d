// ui/FieldKeys.h - which names the fields of an entry may get.
#pragma once

#include "ui/FieldGrid.h"
#include "ui/Keys.h"

enum FieldKeyVerdict {
    FIELD_KEY_OK,
    FIELD_KEY_EMPTY,
    FIELD_KEY_MISFIT,    // see Key_MisfitText; first, as a stripped key takes the typed one's place
    FIELD_KEY_BAD_CHARS, // holds characters that no key may hold; Bib_StripKeyChars removes them
    FIELD_KEY_UNWRITABLE, // the parser would not read it back
    FIELD_KEY_TAKEN
};

extern const char FieldKey_BadCharsText[];
extern const char FieldKey_UnwritableText[];
extern const char FieldKey_TakenText[];

// For a new field; whether the entry has it already is up to Grid_Add.
FieldKeyVerdict FieldKey_CheckNew(const TypedKey &key);

// For the new name of a field. It is taken when a shown value reads like it.
FieldKeyVerdict FieldKey_CheckNewName(const FieldGrid *grid, const TypedKey &name);

// ui/FieldKeys.h - which names the fields of an entry may get.
#pragma once

#include "session/Names.h"
#include "ui/FieldGrid.h"

extern const char FieldKey_BadCharsText[];
extern const char FieldKey_UnwritableText[];
extern const char FieldKey_TakenText[];

// For the new name of a field. It is taken when a shown value reads like it. Whether a name is
// taken for a new field is up to Grid_Add.
NameVerdict FieldKey_CheckNewName(const FieldGrid *grid, const TypedName &name);

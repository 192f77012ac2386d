// session/Changes.h - every change of the records of an open file.
//
// The one door: nobody else writes to records that are loaded, hands on the text between them, or
// counts changes in BibFile::modified. Each function is one action of the user on one file. It
// returns 1 (or the new record) when the file is changed: then the change is counted, and `set`
// (null: nobody) is told. Otherwise it returns 0 (or null) and nothing is changed: memory is out,
// or the record is not of that file, which is logged.
//
// Whether an action is allowed is decided before. Its arguments and what leaves the file are all
// that it takes to undo it.
#pragma once

#include "session/FileSet.h"

// One change more, by other code that works on the records (Cartulo::SetModified).
void Change_Count(const BibFileSet *set, BibFile *file);

// --- Entries ---

// A new entry at the head of the file, with the fields of `specs` (Bib_NewEntry). When the first
// one is `crossref`, it names `parent` (null: none).
BibEntry *Change_AddEntry(const BibFileSet *set, BibFile *file, const char *key,
                          const char *typeName, const char *specs, const BibEntry *parent);

// An entry that is no file's yet, with the key of `like`. Takes over the values of the fields, also
// when it fails: null when memory is out, or one of them is null.
BibEntry *Change_MakeEntry(const BibEntry *like, int type, const BibField *fields, int count);

// Puts such an entry in the place of an old one, which is freed.
int Change_ReplaceEntry(const BibFileSet *set, BibFile *file, BibEntry *old, BibEntry *entry);

int Change_SetType(const BibFileSet *set, BibFile *file, BibEntry *entry, int type);

// Renames the entry and the `crossref` fields of the entries before it in its file.
int Change_RenameEntry(const BibFileSet *set, BibFile *file, BibEntry *entry, const char *key);

int Change_RemoveEntry(const BibFileSet *set, BibFile *file, BibEntry *entry); // frees it

// --- Abbreviations ---

int Change_AddString(const BibFileSet *set, BibFile *file, const char *name,
                     const char *value); // at the end of the list
int Change_SetString(const BibFileSet *set, BibFile *file, BibString *string, const char *value);

// Frees it; entries may refer to it still.
int Change_RemoveString(const BibFileSet *set, BibFile *file, BibString *string);

// --- The preamble ---

// `text` has at most BIB_PREAMBLE_SIZE - 1 bytes. `places` has for each piece of the old one the
// index that it has in the new one, -1 for none.
int Change_SetPreamble(const BibFileSet *set, BibFile *file, const char *text, const int *places,
                       int count);

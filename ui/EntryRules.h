// ui/EntryRules.h - what may be added, renamed and removed, and what that changes in the store.
#pragma once

#include <string>

#include "store/BibFileSet.h"

enum KeyVerdict {
    KEY_OK,
    KEY_EMPTY,
    KEY_BAD_CHARS,      // holds characters that no key may hold; Bib_StripKeyChars removes them
    KEY_UNWRITABLE,     // the parser would not read it back
    KEY_SAME,           // the entry has it already
    KEY_TAKEN,          // by another entry of the file
    KEY_TAKEN_ELSEWHERE // by an entry of another file: the user may want that
};

// A key as it was typed, without characters of code 32 and below.
std::string Entry_TypedKey(const char *typed);

KeyVerdict Entry_CheckNewKey(const BibFileSet *set, const BibFile *target, const char *key);
KeyVerdict Entry_CheckRename(const BibFileSet *set, int file, const BibEntry *entry,
                             const char *key);

// The first file of that base name, ignoring case; null for none.
BibFile *Entry_FindFile(const BibFileSet *set, const char *baseName);

// A new entry at the head of the file; `crossref` (null: none) is the key of its parent.
BibEntry *Entry_Create(BibFile *file, const char *key, const char *typeName, const char *specs,
                       const char *crossref);

// Renames the entry and the `crossref` fields of the entries before it in its file.
void Entry_Rename(BibFile *file, BibEntry *entry, const char *key);

// The keys of the entries before this one in the file whose `crossref` names it, as "`a', `b'"; ""
// for none.
std::string Entry_Referrers(const BibFile *file, const BibEntry *entry);

// Unlinks and frees. 0 when the entry is not of that file.
int Entry_Remove(BibFile *file, BibEntry *entry);

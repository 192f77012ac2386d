// session/EntryRules.h - what may be added, renamed and removed; Changes.h does it.
#pragma once

#include <string>
#include <vector>

#include "session/FileSet.h"
#include "session/Names.h"

// --- Where a new entry may go ---

// The indices of the files that may be written, in order; a record that is listed twice counts
// once.
std::vector<int> Entry_WritableFiles(const BibFileSet *set);

// The base name, followed by the path where another file of `files` has the same one. Bytes as the
// system spells names, not store text.
std::string Entry_FileLabel(const BibFileSet *set, const std::vector<int> &files, int file);

// True when it may become the parent of a new entry of its file: there is one (null: none), it has
// no parent itself, and the file may be written.
bool Entry_MayBeParent(const BibFile *file, const BibEntry *entry);

// --- Keys ---

enum KeyVerdict {
    KEY_OK,
    KEY_EMPTY,
    KEY_MISFIT,         // see Name_MisfitText; first, as a stripped key takes the typed one's place
    KEY_BAD_CHARS,      // holds characters that no key may hold; Bib_StripKeyChars removes them
    KEY_UNWRITABLE,     // the parser would not read it back
    KEY_NO_FILE,        // nowhere to put it
    KEY_SAME,           // the entry has it already
    KEY_TAKEN,          // by an entry of the file; also by the renamed one, in other letter case
    KEY_TAKEN_ELSEWHERE // by an entry of another file: the user may want that
};

KeyVerdict Entry_CheckNewKey(const BibFileSet *set, const BibFile *target, const TypedName &key);
KeyVerdict Entry_CheckRename(const BibFileSet *set, const BibFile *file, const BibEntry *entry,
                             const TypedName &key);

// --- Types ---

// Why an entry can't be of this type ("" for none) with the mandatory fields of `specs`; "" when it
// can. Without this check, Change_AddEntry may end the process, and a save write what can't be
// read.
std::string Entry_CheckType(const char *typeName, const char *specs);

// A type and the lines of its section (Schema_FieldSpecs) as text of one file.
struct EntryType {
    std::string name, specs;
    std::string reason; // why an entry of it can't be made there, text of the file; "" when it can
};
EntryType Entry_TypeFor(const BibFile *file, const char *typeName, const char *specs);

// The type of this name in the encoding of the file; -1 when an entry can't have it there, and why.
int Entry_TypeIn(const BibFile *file, int type, std::string *reason);

// --- New entries ---

// The fields of an entry that refers to another one, as Bib_NewEntry wants them.
extern const char Entry_ChildSpecs[];

// --- References ---

// The slot of the `crossref` that names `key`; -1 when the entry does not refer to it. Logs each
// value that it looks at: the log tells why a removal was refused.
int Entry_FindReference(const BibEntry *entry, const char *key);

// The keys of the entries before this one in the file whose `crossref` names it, as "`a', `b'"; ""
// for none.
std::string Entry_Referrers(const BibFile *file, const BibEntry *entry);

// ui/StringSources.h - the abbreviations that the strings window shows and changes.
//
// A source tells whose they are: the index of a file, STRINGS_OF_ALL_FILES, or, below that, a list
// of the INI file (-2 is the last list). So the lists, all files and each file stand in this order
// in a choice, and a source becomes a position there when the position of the first file is added.
//
// Names and values are store text, each in the encoding of its source.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "encoding/Encoding.h"
#include "session/FileSet.h"
#include "session/Names.h"

enum { STRINGS_OF_ALL_FILES = -1 };

// Identifiers in the window of the list, and in that of one abbreviation.
enum { ID_STRING_SOURCE = 6001, ID_STRING_ADD = 6003, ID_STRING_REMOVE, ID_STRING_EDIT };
enum { ID_STRING_KEY = 6001, ID_STRING_VALUE };
static_assert(ID_STRING_REMOVE == 6004 && ID_STRING_EDIT == 6005 && ID_STRING_VALUE == 6002);

extern int CurrentStringSource; // what the window showed last; of all files at first

struct StringSources {
    const BibFileSet *set;          // outlives the record
    std::string ini;                // path of the INI file
    std::vector<std::string> lists; // the names of its lists, as [String] has them
};
StringSources Strings_Sources(const BibFileSet *set, const std::string &ini);

// Position of the first file in the choice.
int Strings_FirstFile(const StringSources *sources);

// The source to begin with: of the only file, of the remembered source, or of all files when that
// is gone.
int Strings_FitSource(const StringSources *sources, int source);

// A line for each abbreviation, like "jan = January"; those of a file in the order of its list.
struct StringLine {
    std::string text;
    const EncodingRecord *encoding;
    bool operator==(const StringLine &other) const;
};
std::vector<StringLine> Strings_Lines(const StringSources *sources, int source);

// How lines came to be others: from `first` on, `removed` of the old ones made way for `added` new
// ones.
struct LineChange {
    size_t first, removed, added;
};
LineChange Strings_Compare(const std::vector<StringLine> &before,
                           const std::vector<StringLine> &after);

std::string Strings_KeyOf(const StringLine &line); // its text up to the first blank

// A line for a question (Value_LossesQuestion) about the abbreviations that were typed for `name`:
// those in the text that were not in the text `before`, and of which nobody knows: no open file, no
// list, and not BibTeX's styles, which define the months. "" for none.
std::wstring Strings_UnknownIn(const StringSources *sources, const std::wstring &name,
                               const std::wstring &text, const std::wstring &before);

// The file whose abbreviations may be changed now; null when the source is no file or read-only.
BibFile *Strings_WritableFile(const StringSources *sources, int source);

// The key that stands for a command in the window; null for none. `key` is an upper-case letter.
struct StringCommand {
    int key;
    int id;
    const char *label; // for the log
};
const StringCommand *Strings_FindCommand(int key);

// True when a press of the key that deletes comes from holding it down: it would delete one after
// the other. `last` is the time of the press before, 0 when the key was released since; it becomes
// `now` (both in milliseconds).
bool Strings_IsHeld(int32_t *last, int32_t now);

// --- One file's abbreviations ---

// For a new one: taken when the file has it already, ignoring case; other files do not matter.
NameVerdict String_CheckNewKey(const BibFile *file, const TypedName &key);

// The abbreviation in a row of the file's lines if it goes by `key`, ignoring case, else the first
// that does (a file may define one name more than once); null for none.
BibString *String_Find(const BibFile *file, int row, const char *key);

// These return 0, with nothing changed, when memory is out.
int String_Add(BibFile *file, const char *key, const char *value); // at the end of its list
int String_SetValue(BibString *string, const char *value);

// Unlinks and frees it; entries may refer to it still. It is one of that file.
void String_Remove(BibFile *file, BibString *string);

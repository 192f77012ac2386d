// session/KnownStrings.h - the abbreviations that are known: of open files, and of lists in the INI
// file.
//
// A source tells whose they are: the index of a file, STRINGS_OF_ALL_FILES, or, below that, a list
// of the INI file (-2 is the last list). So the lists, all files and each file stand in this order
// in a choice, and a source becomes a position there when the position of the first file is added.
//
// Names and values are store text, each in the encoding of its source.
#pragma once

#include <string>
#include <vector>

#include "encoding/Encoding.h"
#include "session/FileSet.h"
#include "session/Names.h"

enum { STRINGS_OF_ALL_FILES = -1 };

struct StringSources {
    const BibFileSet *set;          // outlives the record
    std::string ini;                // path of the INI file
    std::vector<std::string> lists; // the names of its lists, as [String] has them
};
StringSources Strings_Sources(const BibFileSet *set, const std::string &ini);

// Position of the first file in the choice.
int Strings_FirstFile(const StringSources *sources);

// A line for each abbreviation, like "jan = January"; those of a file in the order of its list.
struct StringLine {
    std::string text;
    const EncodingRecord *encoding;
    bool operator==(const StringLine &other) const;
};
std::vector<StringLine> Strings_Lines(const StringSources *sources, int source);

std::string Strings_KeyOf(const StringLine &line); // its text up to the first blank

// A line for a question (FieldCheck_Question) about the abbreviations that were typed for `name`:
// those in the text that were not in the text `before`, and of which nobody knows: no open file, no
// list, and not BibTeX's styles, which define the months. "" for none.
std::wstring Strings_UnknownIn(const StringSources *sources, const std::wstring &name,
                               const std::wstring &text, const std::wstring &before);

// --- One file's abbreviations ---

// For a new one: taken when the file has it already, ignoring case; other files do not matter.
NameVerdict String_CheckNewKey(const BibFile *file, const TypedName &key);

// The abbreviation in a row of the file's lines if it goes by `key`, ignoring case, else the first
// that does (a file may define one name more than once); null for none.
BibString *String_Find(const BibFile *file, int row, const char *key);

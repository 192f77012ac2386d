// ui/StringRules.h - decisions of the window for abbreviations that need no window.
#pragma once

#include <cstdint>
#include <vector>

#include "session/KnownStrings.h"

// Identifiers in the window of the list, and in that of one abbreviation.
enum { ID_STRING_SOURCE = 6001, ID_STRING_ADD = 6003, ID_STRING_REMOVE, ID_STRING_EDIT };
enum { ID_STRING_KEY = 6001, ID_STRING_VALUE };
static_assert(ID_STRING_REMOVE == 6004 && ID_STRING_EDIT == 6005 && ID_STRING_VALUE == 6002);

extern int CurrentStringSource; // what the window showed last; of all files at first

// The source to begin with: of the only file, of the remembered source, or of all files when that
// is gone.
int Strings_FitSource(const StringSources *sources, int source);

// The file whose abbreviations may be changed now; null when the source is no file or read-only.
BibFile *Strings_WritableFile(const StringSources *sources, int source);

// How lines came to be others: from `first` on, `removed` of the old ones made way for `added` new
// ones.
struct LineChange {
    size_t first, removed, added;
};
LineChange Strings_Compare(const std::vector<StringLine> &before,
                           const std::vector<StringLine> &after);

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

// ui/EntryIndex.h - the rows of the entry list: filter, order, row text, type-ahead.
#pragma once

#include <cstdint>
#include <string>

#include "store/BibStore.h"

struct IndexItem {
    BibEntry *entry; // owned by its file
    int file;        // index of the file that holds it
};
static_assert(sizeof(IndexItem) == 16);

// The rows of all entries that pass `filter` ("" or null: all), sorted by key. Returns their count;
// *index gets a malloc'd array, which has room for every entry and is never null.
int EntryIndex_Build(IndexItem **index, BibFile *const *files, int fileCount, const char *filter);

// The order of two keys: case ignored, one leading backslash or opening brace skipped.
int EntryIndex_CompareKeys(const char *a, const char *b);

// The first row of `entry`; -1 for none.
int EntryIndex_Find(const IndexItem *index, int count, const BibEntry *entry);

// "key (file)" as store text. Without files: "key (number)".
std::string EntryIndex_RowText(const IndexItem *item, BibFile *const *files, int fileCount);

enum { TYPE_AHEAD_PAUSE = 1000, TYPE_AHEAD_LIMIT = 30 }; // milliseconds; characters

// What was typed so far to find a key.
struct TypeAhead {
    int32_t lastKeyTime = 0;
    int lastFound = -1; // row selected by the last letter that matched
    char prefix[32] = "";
};

enum TypeAheadVerdict {
    TYPE_AHEAD_SKIP,   // not for the search: let the key through
    TYPE_AHEAD_NO_ROW, // no key begins so; the letter was taken off again
    TYPE_AHEAD_ROW     // select `lastFound`
};

// One key of the keyboard. `key` is its character (0 for none), `now` its time in milliseconds,
// `selection` the row that is selected now.
TypeAheadVerdict TypeAhead_Key(TypeAhead *state, uint32_t key, bool modified, int32_t now,
                               int selection, const IndexItem *index, int count,
                               BibFile *const *files, int fileCount);

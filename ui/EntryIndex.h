// ui/EntryIndex.h - the rows of the entry list: filter, order, row text, type-ahead.
//
// Rows point into the entry lists of the files: build anew after every change of them.
#pragma once

#include <cstdint>
#include <string>

#include "store/BibStore.h"

struct IndexItem {
    BibEntry *entry; // owned by its file
    int file;        // index of the file that holds it
};
static_assert(sizeof(IndexItem) == 16);

// The rows of all entries that pass `filter` (see SearchText.h), sorted by key. Returns their
// count; *index gets a malloc'd array with room for every entry, never null unless memory is out.
// The filter looks at field values, not at keys. Rows with equal keys come in no particular order.
int EntryIndex_Build(IndexItem **index, BibFile *const *files, int fileCount, const char *filter);

// The order of two keys: case ignored, one leading backslash or opening brace skipped.
int EntryIndex_CompareKeys(const char *a, const char *b);

// The first row of `entry`; -1 for none.
int EntryIndex_Find(const IndexItem *index, int count, const BibEntry *entry);

// The row to select after a build: that of `select` when it passed the filter, else the first.
// -1 when there are no rows.
int EntryIndex_RowToSelect(const IndexItem *index, int count, const BibEntry *select);

// The entry to select when that of `row` is gone: the one after it in the list, else the one
// before it; null for none.
BibEntry *EntryIndex_Next(const IndexItem *index, int count, int row);

// "key (file)", the key as store text. "key (number)" when `files` is null or has no such file.
std::string EntryIndex_RowText(const IndexItem *item, BibFile *const *files, int fileCount);

enum { TYPE_AHEAD_PAUSE = 1000, TYPE_AHEAD_LIMIT = 30 }; // milliseconds; characters

// What was typed so far to find a key.
struct TypeAhead {
    int32_t lastKeyTime = 0;
    int lastFound = -1; // row selected by the last letter that matched
    std::wstring prefix;
};

enum TypeAheadVerdict {
    TYPE_AHEAD_SKIP,   // not for the search: let the key through
    TYPE_AHEAD_NO_ROW, // no row begins so; the letter was taken off again
    TYPE_AHEAD_ROW     // select `lastFound`
};

// One key of the keyboard. `key` is its Unicode character (0 for none), `now` its time in
// milliseconds, which may wrap around, `selection` the row that is selected now.
//
// Row texts are compared as store text, each in the encoding of its file. A character that this
// lacks matches nothing. Case is ignored: of all letters in UTF-8 (ASCII text finds ASCII letters
// only), else of the ASCII letters. The whole row text is searched: unlike the order of the rows,
// the search does not skip a leading backslash or brace.
TypeAheadVerdict TypeAhead_Key(TypeAhead *state, uint32_t key, bool modified, int32_t now,
                               int selection, const IndexItem *index, int count,
                               BibFile *const *files, int fileCount);

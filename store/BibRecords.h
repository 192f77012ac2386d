// store/BibRecords.h - builds the records of a file out of items.
//
// But for the last two functions private to the loader and its tests. Records go to the head of the file's lists; text between the
// items waits in the file's origin for the item that follows it (BibOutside.h). What is refused
// leaves the file as it was, but for BIB_NO_MEMORY.
#pragma once

#include "store/BibStore.h"

enum BibStored {
    BIB_STORED,
    BIB_SKIPPED,  // an entry without a key
    BIB_NO_TYPE,  // the table of entry types is full; nothing was stored
    BIB_NO_FIELD, // the table of field names is full; nothing was stored
    BIB_NO_MEMORY // the rest of the item was not stored
};

// Builds the records of one whole item and pushes them at the head of the file's lists.
BibStored BibItem_Store(BibFile *file, const char *item);

// Comment lines inside items are counted and the first ones reported; at the end, how many more
// there were. `line` is that of the report.
void Bib_ReportMoreDropped(BibFile *file, int line);

// Free one record. Unlink it first.
void Bib_FreeString(BibString *string);
void Bib_FreeComment(BibComment *comment);

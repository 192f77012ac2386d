// store/BibOutside.h - keeps the text that stood between the items of a file with its items.
//
// The records are BibFile::origin->outside; the file owns them. Whoever takes an item away, or puts
// another one in its place, says so here before.
#pragma once

#include "store/BibStore.h"

// The first one; null for none. The list is in the order in which a save comes to the places.
BibOutside *Outside_First(const BibFile *file);

void Outside_Free(BibFile *file);

// --- While a file is loaded ---

// Text that no item follows yet. 0 when memory is out.
int Outside_Add(BibFile *file, const char *text, size_t length);

// Gives it to an item: a record, or a piece of the preamble.
void Outside_GiveTo(BibFile *file, BibPlace place, const void *item);
void Outside_GiveToPiece(BibFile *file, int piece);

// Puts the list in order; what no item has followed stands at the end of the file. Call once.
void Outside_Finish(BibFile *file);

// --- While it is edited ---

// The item is about to leave its list. Its text goes to the one that a save writes next, or to the
// end of the file.
void Outside_HandOnEntry(BibFile *file, const BibEntry *entry);
void Outside_HandOnString(BibFile *file, const BibString *string);

// Another entry is about to take the place of this one, and its text.
void Outside_MoveEntry(BibFile *file, const BibEntry *from, const BibEntry *to);

// The preamble is about to change. `places` has for each old piece the index that it will have, or
// -1 when it goes: its text is handed on then.
void Outside_MovePieces(BibFile *file, const int *places, int count);

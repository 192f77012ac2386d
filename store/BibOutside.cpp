// store/BibOutside.cpp - text between the items of a file.

#include "store/BibOutside.h"

#include <algorithm>
#include <cstdlib>
#include <vector>

BibOutside *Outside_First(const BibFile *file)
{
    return file->origin ? file->origin->outside : nullptr;
}

void Outside_Free(BibFile *file)
{
    while (BibOutside *outside = Outside_First(file)) {
        file->origin->outside = outside->next;
        free(outside->text);
        free(outside);
    }
}

static void PlaceAt(BibOutside *outside, BibPlace place, const void *item, int piece)
{
    outside->place = place;
    outside->item = item;
    outside->piece = piece;
}

// --- While a file is loaded: the last text is at the head of the list ---

int Outside_Add(BibFile *file, const char *text, size_t length)
{
    BibOrigin *origin = Bib_Origin(file);
    BibOutside *outside = static_cast<BibOutside *>(Bib_Alloc(sizeof(BibOutside)));
    char *copy = Bib_CopyText(text, length);
    if (!origin || !outside || !copy) {
        free(outside);
        free(copy);
        return 0;
    }
    *outside = {origin->outside, BIB_NO_PLACE, nullptr, 0, copy};
    origin->outside = outside;
    return 1;
}

static void GiveTo(BibFile *file, BibPlace place, const void *item, int piece)
{
    for (BibOutside *at = Outside_First(file); at && at->place == BIB_NO_PLACE; at = at->next)
        PlaceAt(at, place, item, piece);
}

void Outside_GiveTo(BibFile *file, BibPlace place, const void *item)
{
    GiveTo(file, place, item, 0);
}

void Outside_GiveToPiece(BibFile *file, int piece)
{
    GiveTo(file, BIB_BEFORE_PIECE, nullptr, piece);
}

void Outside_Finish(BibFile *file)
{
    GiveTo(file, BIB_AT_END, nullptr, 0);
    BibOutside *lists[BIB_PLACES] = {};
    while (BibOutside *outside = Outside_First(file)) {
        file->origin->outside = outside->next;
        outside->next = lists[outside->place];
        lists[outside->place] = outside;
    }
    for (int place = BIB_AT_END; place >= 0; --place) {
        BibOutside **end = &lists[place];
        while (*end)
            end = &(*end)->next;
        *end = Outside_First(file);
        if (file->origin)
            file->origin->outside = lists[place];
    }
}

// --- While it is edited ---
//
// What follows an item's text in the list is that of the next one already, so that nothing has to
// be moved when it is handed on.

static void Relabel(const BibFile *file, BibPlace fromPlace, const void *from, BibPlace place,
                    const void *item)
{
    for (BibOutside *at = Outside_First(file); at; at = at->next)
        if (at->place == fromPlace && at->item == from)
            PlaceAt(at, place, item, 0);
}

static BibPlace PlaceOf(const BibEntry *entry) // null: all entries are over
{
    return entry ? BIB_BEFORE_ENTRY : BIB_AT_END;
}

void Outside_HandOnEntry(BibFile *file, const BibEntry *entry)
{
    Relabel(file, BIB_BEFORE_ENTRY, entry, PlaceOf(entry->next), entry->next);
}

void Outside_HandOnString(BibFile *file, const BibString *string)
{
    if (string->next)
        Relabel(file, BIB_BEFORE_STRING, string, BIB_BEFORE_STRING, string->next);
    else
        Relabel(file, BIB_BEFORE_STRING, string, PlaceOf(file->entries), file->entries);
}

void Outside_MoveEntry(BibFile *file, const BibEntry *from, const BibEntry *to)
{
    Relabel(file, BIB_BEFORE_ENTRY, from, BIB_BEFORE_ENTRY, to);
}

// The text of a piece that no other one follows any more.
static void HandOnPiece(const BibFile *file, BibOutside *outside)
{
    if (file->strings)
        PlaceAt(outside, BIB_BEFORE_STRING, file->strings, 0);
    else
        PlaceAt(outside, PlaceOf(file->entries), file->entries, 0);
}

static void Sort(BibFile *file)
{
    std::vector<BibOutside *> all;
    for (BibOutside *at = Outside_First(file); at; at = at->next)
        all.push_back(at);
    std::stable_sort(all.begin(), all.end(), [](const BibOutside *a, const BibOutside *b) {
        return a->place != b->place ? a->place < b->place : a->piece < b->piece;
    });
    BibOutside **end = &file->origin->outside;
    for (BibOutside *outside : all) {
        *end = outside;
        end = &outside->next;
    }
    *end = nullptr;
}

// The pieces may have changed their order, too.
void Outside_MovePieces(BibFile *file, const int *places, int count)
{
    if (!Outside_First(file))
        return;
    for (BibOutside *at = Outside_First(file); at; at = at->next) {
        if (at->place != BIB_BEFORE_PIECE)
            continue;
        int piece = at->piece;
        while (piece < count && places[piece] < 0)
            ++piece;
        if (piece < count)
            PlaceAt(at, BIB_BEFORE_PIECE, nullptr, places[piece]);
        else
            HandOnPiece(file, at);
    }
    Sort(file);
}

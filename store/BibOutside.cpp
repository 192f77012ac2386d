// store/BibOutside.cpp - text between the items of a file.

#include "store/BibOutside.h"

#include <algorithm>
#include <cstdlib>
#include <vector>

BibOrigin *Bib_Origin(BibFile *file)
{
    if (file->origin)
        return file->origin;
    file->origin = static_cast<BibOrigin *>(Bib_Alloc(sizeof(BibOrigin)));
    if (file->origin)
        *file->origin = {};
    return file->origin;
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
    *outside = {origin->outside, BIB_END, nullptr, 0, copy};
    origin->outside = outside;
    return 1;
}

static BibOutside *First(const BibFile *file)
{
    return file->origin ? file->origin->outside : nullptr;
}

static void PlaceAt(BibOutside *outside, BibKind kind, const void *item, int piece)
{
    outside->kind = kind;
    outside->item = item;
    outside->piece = piece;
}

static void GiveTo(BibFile *file, BibKind kind, const void *item, int piece)
{
    for (BibOutside *at = First(file); at && at->kind == BIB_END; at = at->next)
        PlaceAt(at, kind, item, piece);
}

void Outside_GiveTo(BibFile *file, BibKind kind, const void *item)
{
    GiveTo(file, kind, item, 0);
}

void Outside_GiveToPiece(BibFile *file, int piece)
{
    GiveTo(file, BIB_PIECES, nullptr, piece);
}

// Sorts by kind, in the order of the file.
void Outside_Finish(BibFile *file)
{
    BibOutside *lists[BIB_KINDS] = {};
    while (BibOutside *outside = First(file)) {
        file->origin->outside = outside->next;
        outside->next = lists[outside->kind];
        lists[outside->kind] = outside;
    }
    for (int kind = BIB_END; kind >= 0; --kind) {
        BibOutside **end = &lists[kind];
        while (*end)
            end = &(*end)->next;
        *end = First(file);
        if (file->origin)
            file->origin->outside = lists[kind];
    }
}

void Outside_Free(BibFile *file)
{
    while (BibOutside *outside = First(file)) {
        file->origin->outside = outside->next;
        free(outside->text);
        free(outside);
    }
    free(file->origin);
    file->origin = nullptr;
}

// --- While it is edited ---
//
// What follows an item in the list is the text of the next one already, so that nothing has to be
// moved there.

static void Relabel(const BibFile *file, BibKind fromKind, const void *from, BibKind kind,
                    const void *item)
{
    for (BibOutside *at = First(file); at; at = at->next)
        if (at->kind == fromKind && at->item == from)
            PlaceAt(at, kind, item, 0);
}

static BibKind KindOfEntry(const BibEntry *entry) // what stands where there is none
{
    return entry ? BIB_ENTRIES : BIB_END;
}

void Outside_HandOnEntry(BibFile *file, const BibEntry *entry)
{
    Relabel(file, BIB_ENTRIES, entry, KindOfEntry(entry->next), entry->next);
}

void Outside_HandOnString(BibFile *file, const BibString *string)
{
    if (string->next)
        Relabel(file, BIB_STRINGS, string, BIB_STRINGS, string->next);
    else
        Relabel(file, BIB_STRINGS, string, KindOfEntry(file->entries), file->entries);
}

void Outside_MoveEntry(BibFile *file, const BibEntry *from, const BibEntry *to)
{
    Relabel(file, BIB_ENTRIES, from, BIB_ENTRIES, to);
}

// The text of a piece for which no place is left.
static void HandOnPiece(const BibFile *file, BibOutside *outside)
{
    if (file->strings)
        PlaceAt(outside, BIB_STRINGS, file->strings, 0);
    else
        PlaceAt(outside, KindOfEntry(file->entries), file->entries, 0);
}

static void Sort(BibFile *file)
{
    std::vector<BibOutside *> all;
    for (BibOutside *at = First(file); at; at = at->next)
        all.push_back(at);
    std::stable_sort(all.begin(), all.end(), [](const BibOutside *a, const BibOutside *b) {
        return a->kind != b->kind ? a->kind < b->kind : a->piece < b->piece;
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
    if (!First(file))
        return;
    for (BibOutside *at = First(file); at; at = at->next) {
        if (at->kind != BIB_PIECES)
            continue;
        int piece = at->piece;
        while (piece < count && places[piece] < 0)
            ++piece;
        if (piece < count)
            PlaceAt(at, BIB_PIECES, nullptr, places[piece]);
        else
            HandOnPiece(file, at);
    }
    Sort(file);
}

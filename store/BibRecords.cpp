// store/BibRecords.cpp - the records of a BIB file, out of the items that were parsed.

#include "store/BibRecords.h"

#include <cstdlib>
#include <cstring>
#include <string>

#include <btparse.h>

#include "base/Log.h"
#include "store/BibChild.h"
#include "store/BibItem.h"
#include "store/BibOutside.h"

enum { DROPPED_LISTED = 50 }; // comment lines inside items, of a file

// The last `crossref` moves to the front, so that an editor finds it there.
static void MoveCrossrefToFront(BibEntry *entry, int crossref)
{
    int k = entry->fieldCount - 1;
    while (k > 0 && entry->fields[k].name != crossref)
        --k;
    if (k <= 0)
        return;
    BibField moved = entry->fields[k];
    memmove(entry->fields + 1, entry->fields, static_cast<size_t>(k) * sizeof moved);
    entry->fields[0] = moved;
}

// 1 when every field name of the entry, whose type and key are read, fits in the table.
static int HasFieldRoom(BibItemReader reader)
{
    if (BibFieldCount + reader.header.number <= BIB_FIELD_LIMIT)
        return 1;
    for (int i = 0; i < reader.header.number; ++i) {
        const char *name = BibItem_NextText(&reader);
        BibItem_NextText(&reader);
        if (!Bib_HasFieldRoom(name))
            return 0;
        Bib_FieldIndex(name);
    }
    return 1;
}

static BibStored StoreEntry(BibFile *file, BibItemReader reader)
{
    if (!Bib_HasFieldRoom("crossref"))
        return BIB_NO_FIELD;
    int crossref = Bib_FieldIndex("crossref");
    const char *typeName = BibItem_NextText(&reader);
    uint32_t keyLength;
    const char *key = BibItem_NextText(&reader, &keyLength);
    if (keyLength == 0) {
        AppLog("ERROR: ", "invalid entry will be just skipped.");
        return BIB_SKIPPED;
    }
    if (!Bib_HasTypeRoom(typeName))
        return BIB_NO_TYPE;
    if (!HasFieldRoom(reader))
        return BIB_NO_FIELD;

    BibEntry *entry = Bib_AllocEntry(reader.header.number);
    if (!entry)
        return BIB_NO_MEMORY;
    entry->type = Bib_TypeIndex(typeName);
    entry->key = Bib_CopyText(key, keyLength);
    int complete = entry->key != nullptr;
    for (int i = 0; i < entry->fieldCount; ++i) {
        entry->fields[i].name = Bib_FieldIndex(BibItem_NextText(&reader));
        entry->fields[i].value = BibItem_CopyText(&reader);
        complete = complete && entry->fields[i].value;
    }
    if (!complete) {
        Bib_FreeEntry(entry);
        return BIB_NO_MEMORY;
    }
    MoveCrossrefToFront(entry, crossref);
    entry->next = file->entries;
    file->entries = entry;
    Outside_GiveTo(file, BIB_BEFORE_ENTRY, entry);
    return BIB_STORED;
}

void Bib_FreeString(BibString *string)
{
    free(string->value);
    free(string->name);
    free(string);
}

static BibStored StoreStrings(BibFile *file, BibItemReader reader)
{
    for (int i = 0; i < reader.header.number; ++i) {
        BibString *string = static_cast<BibString *>(Bib_Alloc(sizeof *string));
        if (!string)
            return BIB_NO_MEMORY;
        string->name = BibItem_CopyText(&reader);
        string->value = BibItem_CopyText(&reader);
        if (!string->name || !string->value) {
            Bib_FreeString(string);
            return BIB_NO_MEMORY;
        }
        string->next = file->strings;
        file->strings = string;
        Outside_GiveTo(file, BIB_BEFORE_STRING, string);
    }
    return BIB_STORED;
}

// An error, so that the file becomes read-only: a save would lose the pieces.
static void ReportLostPieces(const BibFile *file, int line)
{
    Bib_ReportMessage(nullptr, BTERR_LEXERR, file->path, line, nullptr, -1,
                      "the preamble is too long, a part of it was not loaded");
}

static int CountPieces(const char *preamble)
{
    int count = 0;
    for (const char *end = strchr(preamble, '\r'); end; end = strchr(end + 1, '\r'))
        ++count;
    return count;
}

static void StorePreamble(BibFile *file, BibItemReader reader)
{
    AppLog("Preamble: ", BibItem_NextText(&reader));
    int lost = 0;
    for (int i = 0; i < reader.header.number; ++i) {
        uint32_t length;
        const char *piece = BibItem_NextText(&reader, &length);
        size_t used = strlen(file->preamble);
        if (used + length + 2 >= BIB_PREAMBLE_SIZE) {
            AppLog("ERROR: Preamble too long in ", file->path);
            AppLog("ERROR: call Quarlo Technical support to solve the problem");
            ++lost;
            continue;
        }
        Outside_GiveToPiece(file, CountPieces(file->preamble));
        memcpy(file->preamble + used, piece, length);
        memcpy(file->preamble + used + length, "\r\n", 3);
    }
    if (lost > 0)
        ReportLostPieces(file, reader.header.line);
}

void Bib_FreeComment(BibComment *comment)
{
    free(comment->text);
    free(comment);
}

static BibStored StoreComments(BibFile *file, BibItemReader reader)
{
    for (int i = 0; i < reader.header.number; ++i) {
        BibComment *comment = static_cast<BibComment *>(Bib_Alloc(sizeof *comment));
        if (!comment)
            return BIB_NO_MEMORY;
        comment->text = BibItem_CopyText(&reader);
        if (!comment->text) {
            Bib_FreeComment(comment);
            return BIB_NO_MEMORY;
        }
        AppLog("Comment: ", comment->text);
        comment->next = file->comments;
        file->comments = comment;
        Outside_GiveTo(file, BIB_BEFORE_COMMENT, comment);
    }
    return BIB_STORED;
}

// All are counted, but only the first ones are listed: there has to be room for other messages.
static void ReportDropped(BibFile *file, int line)
{
    if (!Bib_Origin(file) || ++file->origin->dropped > DROPPED_LISTED)
        ++file->warningCount;
    else
        Bib_ReportMessage(nullptr, BTERR_CONTENT, file->path, line, nullptr, -1,
                          "a comment inside an entry is not kept when the file is saved");
}

void Bib_ReportMoreDropped(BibFile *file, int line)
{
    int more = file->origin ? file->origin->dropped - DROPPED_LISTED : 0;
    if (more <= 0)
        return;
    std::string message = std::to_string(more) + " more comments inside entries are not kept";
    Bib_ReportMessage(nullptr, BTERR_NOTIFY, file->path, line, nullptr, -1, message.c_str());
}

static BibStored StoreOutside(BibFile *file, BibItemReader reader)
{
    uint32_t length;
    const char *text = BibItem_NextText(&reader, &length);
    return Outside_Add(file, text, length) ? BIB_STORED : BIB_NO_MEMORY;
}

BibStored BibItem_Store(BibFile *file, const char *item)
{
    BibItemReader reader = BibItem_Open(item);
    switch (reader.header.kind) {
    case BIB_ITEM_ENTRY:
        return StoreEntry(file, reader);
    case BIB_ITEM_STRINGS:
        return StoreStrings(file, reader);
    case BIB_ITEM_PREAMBLE:
        StorePreamble(file, reader);
        break;
    case BIB_ITEM_COMMENT:
        return StoreComments(file, reader);
    case BIB_ITEM_OUTSIDE:
        return StoreOutside(file, reader);
    case BIB_ITEM_DROPPED:
        ReportDropped(file, reader.header.line);
        break;
    case BIB_ITEM_FORM:
        file->form = reader.header.number & BIB_FORM_ALL;
        break;
    case BIB_ITEM_STRANGE:
        AppLog("ERROR: ", reader.header.number == BTE_UNKNOWN
                              ? "There is unknown entry in BIB-file"
                              : "There is strange entry in BIB-file");
        break;
    case BIB_ITEM_MESSAGE:
        Bib_ReportMessage(nullptr, reader.header.number, file->path, reader.header.line, nullptr,
                          -1, BibItem_NextText(&reader));
        break;
    }
    return BIB_STORED;
}

// --- In this process ---

static int StoreAst(BibFile *file, AST *ast)
{
    BibItems items = {};
    BibItems_PackAst(&items, ast);
    BibStored stored = BibItem_Store(file, items.bytes);
    BibItems_Free(&items);
    if (stored == BIB_NO_TYPE || stored == BIB_NO_FIELD)
        AppLog("ERROR: ", "no room for the names of an entry, which is skipped.");
    return stored == BIB_STORED;
}

int Bib_AddEntryFromAst(BibFile *file, AST *ast)
{
    return StoreAst(file, ast);
}

int Bib_AddStringsFromAst(BibFile *file, AST *ast)
{
    return StoreAst(file, ast);
}

int Bib_AddPreambleFromAst(BibFile *file, AST *ast)
{
    return StoreAst(file, ast);
}

int Bib_AddCommentFromAst(BibFile *file, AST *ast)
{
    return StoreAst(file, ast);
}

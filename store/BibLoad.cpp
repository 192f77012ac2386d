// store/BibLoad.cpp - loading a BIB file: records from the items that the child sends.

#include "store/BibItem.h"
#include "store/BibStore.h"

#include <cstdlib>
#include <cstring>
#include <initializer_list>
#include <string>

#include <btparse.h>

#include "base/Ascii.h"
#include "base/Log.h"
#include "base/Sys.h"
#include "store/BibOutside.h"

int BibLoadSeconds = 10;

enum { DROPPED_LISTED = 50 }; // comment lines inside items, of a file

// --- Items to records ---

BibItemReader BibItem_Open(const char *item)
{
    BibItemReader reader;
    memcpy(&reader.header, item, sizeof reader.header);
    reader.next = item + sizeof reader.header;
    return reader;
}

const char *BibItem_NextText(BibItemReader *reader, uint32_t *length)
{
    memcpy(length, reader->next, sizeof *length);
    const char *text = reader->next + sizeof *length;
    reader->next = text + *length + 1;
    return text;
}

const char *BibItem_NextText(BibItemReader *reader)
{
    uint32_t length;
    return BibItem_NextText(reader, &length);
}

char *BibItem_CopyText(BibItemReader *reader)
{
    uint32_t length;
    const char *text = BibItem_NextText(reader, &length);
    return Bib_CopyText(text, length);
}

// How many texts an item of this kind consists of; -1 when there is no such item.
static int64_t TextCount(const BibItemHeader *header)
{
    int64_t number = header->number;
    switch (header->kind) {
    case BIB_ITEM_MESSAGE:
    case BIB_ITEM_OUTSIDE:
        return 1;
    case BIB_ITEM_ENTRY:
        return number < 0 ? -1 : 2 + 2 * number;
    case BIB_ITEM_STRINGS:
        return number < 0 ? -1 : 2 * number;
    case BIB_ITEM_PREAMBLE:
        return number < 0 ? -1 : 1 + number;
    case BIB_ITEM_COMMENT:
        return number < 0 ? -1 : number;
    case BIB_ITEM_DROPPED:
    case BIB_ITEM_FORM:
    case BIB_ITEM_STRANGE:
    case BIB_ITEM_END:
        return 0;
    }
    return -1;
}

// Steps over a text with its length and its NUL. 0 when no whole one is there.
static int SkipText(const char **at, const char *end)
{
    uint32_t length;
    if (static_cast<size_t>(end - *at) < sizeof length + 1)
        return 0;
    memcpy(&length, *at, sizeof length);
    *at += sizeof length;
    if (length >= static_cast<size_t>(end - *at) || (*at)[length] != 0)
        return 0;
    *at += length + 1;
    return 1;
}

// 1 when the item consists of just the texts that it should.
static int IsSound(const char *item, const BibItemHeader *header)
{
    const char *at = item + sizeof *header;
    const char *end = item + header->size;
    int64_t left = TextCount(header);
    while (left > 0 && SkipText(&at, end))
        --left;
    return left == 0 && at == end;
}

long BibItem_Size(const char *bytes, size_t length)
{
    BibItemHeader header;
    if (length < sizeof header)
        return 0;
    memcpy(&header, bytes, sizeof header);
    if (header.size < sizeof header)
        return -1;
    if (header.size > length)
        return 0;
    return IsSound(bytes, &header) ? static_cast<long>(header.size) : -1;
}

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

// --- Items from the child ---

// How far a load has come, and what ended it.
struct Load {
    BibFile *file;
    int line;          // of the last item or message
    int messages;      // of the parser
    int fatal;         // the parser reported the reason for its end itself
    int end;           // BibEnd, or -1 as long as the child has said nothing
    BibStored refused; // a full name table, or lack of memory, ended the load
};

// A file that is no BIB file at all may give a message for every byte. They must not fill the disk
// that takes the log.
enum { MESSAGE_LIMIT = 100000 };

static void CountMessage(Load *load, const BibItemHeader *header)
{
    if (header->kind != BIB_ITEM_MESSAGE)
        return;
    ++load->messages;
    load->fatal |= header->number >= BTERR_USAGEERR;
}

// 1 to go on, 0 when the load ends here.
static int TakeItem(Load *load, const char *item)
{
    BibItemHeader header;
    memcpy(&header, item, sizeof header);
    if (header.line > 0)
        load->line = header.line;
    if (header.kind == BIB_ITEM_END) {
        load->end = header.number;
        return 1; // nothing follows, but how the child ends is still to be seen
    }
    CountMessage(load, &header);
    BibCurrentFile = load->file;
    load->refused = BibItem_Store(load->file, item);
    int stored = load->refused == BIB_STORED || load->refused == BIB_SKIPPED;
    return stored && load->messages < MESSAGE_LIMIT;
}

// Takes the whole items in `buffer` and returns how many bytes they were; -1 when the load ends.
static long TakeItems(Load *load, const char *buffer, size_t length)
{
    size_t taken = 0;
    while (long size = BibItem_Size(buffer + taken, length - taken)) {
        if (size < 0 || !TakeItem(load, buffer + taken))
            return -1;
        taken += static_cast<size_t>(size);
    }
    return static_cast<long>(taken);
}

static int MakeRoom(BibItems *buffer)
{
    if (buffer->length < buffer->room)
        return 1;
    size_t room = buffer->room > 0 ? 2 * buffer->room : 256 * 1024;
    char *bytes = static_cast<char *>(realloc(buffer->bytes, room));
    if (!bytes)
        return 0;
    buffer->bytes = bytes;
    buffer->room = room;
    return 1;
}

// 1 to go on, 0 when the load ends here.
static int TakeBuffer(Load *load, BibItems *buffer)
{
    long taken = TakeItems(load, buffer->bytes, buffer->length);
    if (taken < 0)
        return 0;
    buffer->length -= static_cast<size_t>(taken);
    memmove(buffer->bytes, buffer->bytes + taken, buffer->length);
    return 1;
}

// 1 when all went well up to the child's end, 0 when it went silent.
static int ReceiveItems(Load *load, SysChild *child, int seconds)
{
    BibItems buffer = {};
    long got = 1;
    while (got > 0) {
        if (!MakeRoom(&buffer)) {
            load->refused = BIB_NO_MEMORY;
            break;
        }
        got = Sys_ReadChild(child, buffer.bytes + buffer.length, buffer.room - buffer.length,
                            seconds);
        buffer.length += got > 0 ? static_cast<size_t>(got) : 0;
        if (got > 0 && !TakeBuffer(load, &buffer))
            break;
    }
    BibItems_Free(&buffer);
    return got >= 0;
}

// Why the file did not load to its end, in plain words; null when it did or the parser said so.
static const char *ReasonOfEnd(const Load *load, SysChildEnd end, int answered)
{
    if (load->refused == BIB_NO_TYPE)
        return "the table of entry types is full (128 types in all open files); this entry and "
               "what follows it were not loaded";
    if (load->refused == BIB_NO_FIELD)
        return "the table of field names is full (512 names in all open files); this entry and "
               "what follows it were not loaded";
    if (load->refused == BIB_NO_MEMORY)
        return "there is not enough memory; this item and what follows it were not loaded";
    if (load->messages >= MESSAGE_LIMIT)
        return "too many errors and warnings; what follows this line was not loaded";
    if (load->fatal || load->end == BIB_END_OF_FILE)
        return nullptr;
    if (end == SYS_CHILD_TIME_LIMIT || !answered)
        return "reading the file took too long and was stopped; what follows this line was not "
               "loaded";
    if (load->end == BIB_END_UNREADABLE)
        return "the file could not be read";
    if (load->end == BIB_END_GAVE_UP)
        return "the parser gave up, most likely because an item has too many fields (98 or more); "
               "this item and what follows it were not loaded";
    if (load->end == BIB_END_EARLY && load->file->errorCount > 0)
        return nullptr;
    return "the parser failed; this item and what follows it were not loaded";
}

// A file with a hole may claim any size.
static int SecondsFor(FILE *stream)
{
    static const long step = 64 * 1024 * 1024;
    static const long most = 1000;
    fseek(stream, 0, SEEK_END);
    long steps = 1 + ftell(stream) / step;
    rewind(stream);
    return BibLoadSeconds * static_cast<int>(steps < most ? steps : most);
}

static void Report(BibFile *file, int line, const char *message)
{
    BibCurrentFile = file;
    Bib_ReportMessage(nullptr, BTERR_INTERNAL, file->path, line, nullptr, -1, message);
}

// The child may be silent for longer than it computes, on a slow disk.
static void LoadItems(BibFile *file)
{
    int seconds = SecondsFor(file->stream);
    BibParseJob job = {file->stream, nullptr, file->path};
    SysChild child;
    if (!Sys_StartChild(&child, BibChild_Parse, &job, seconds)) {
        Report(file, 0, Sys_LastErrorText());
        return;
    }
    Load load = {};
    load.file = file;
    load.end = -1;
    int answered = ReceiveItems(&load, &child, 2 * seconds + 30);
    SysChildEnd end = Sys_EndChild(&child);
    BibCurrentFile = file;
    Bib_ReportMoreDropped(file, load.line);
    const char *reason = ReasonOfEnd(&load, end, answered);
    if (reason)
        Report(file, load.line, reason);
}

// --- Files ---

static char *BaseName(const char *path)
{
    const char *name = path;
    for (char separator : {'\\', '/'}) {
        const char *last = strrchr(name, separator);
        if (last)
            name = last + 1;
    }
    return Bib_CopyText(name, strcspn(name, "."));
}

static BibFile *NewFile(const char *path, FILE *stream)
{
    BibFile *file = static_cast<BibFile *>(Bib_Alloc(sizeof *file));
    if (!file)
        return nullptr;
    memset(static_cast<void *>(file), 0, sizeof *file);
    file->stream = stream;
    file->path = Bib_CopyText(path, strlen(path));
    file->baseName = BaseName(path);
    file->readOnly = Sys_IsWritable(path) ? 0 : -1;
    if (Bib_Origin(file))
        file->origin->stamp = Sys_StreamStamp(stream);
    return file;
}

template <class Record> static void Reverse(Record **list)
{
    Record *reversed = nullptr;
    while (Record *record = *list) {
        *list = record->next;
        record->next = reversed;
        reversed = record;
    }
    *list = reversed;
}

BibFile *Bib_LoadFile(const char *path)
{
    FILE *stream = Sys_OpenRegular(path);
    if (!stream) {
        AppLog("ERROR: Can't open file: ", path);
        return nullptr;
    }
    BibFile *file = NewFile(path, stream);
    if (!file) {
        fclose(stream);
        return nullptr;
    }
    BibCurrentFile = file;
    LoadItems(file);
    BibCurrentFile = file;
    fclose(file->stream);
    file->stream = nullptr;
    Reverse(&file->strings);
    Reverse(&file->entries);
    Reverse(&file->comments);
    Outside_Finish(file);
    return file;
}

void Bib_FreeFile(BibFile *file)
{
    if (BibCurrentFile == file)
        BibCurrentFile = nullptr;
    free(file->messages);
    Outside_Free(file);
    free(file->origin);
    while (BibEntry *entry = file->entries) {
        file->entries = entry->next;
        Bib_FreeEntry(entry);
    }
    while (BibString *string = file->strings) {
        file->strings = string->next;
        Bib_FreeString(string);
    }
    while (BibComment *comment = file->comments) {
        file->comments = comment->next;
        Bib_FreeComment(comment);
    }
    free(file->baseName);
    free(file->path);
    free(file);
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

static int HasItem(const char *bytes, size_t length, BibItemKind kind)
{
    while (long size = BibItem_Size(bytes, length)) {
        BibItemHeader header = {};
        if (size > 0)
            memcpy(&header, bytes, sizeof header);
        if (size < 0 || header.kind == kind)
            return size > 0;
        bytes += size;
        length -= static_cast<size_t>(size);
    }
    return 0;
}

// The child parses a text that must give a message and a comment line, in the way it parses files.
int Bib_SelfTest()
{
    BibParseJob job = {nullptr, "% comment\n@misc{key, field = }\n", "self-test"};
    SysChild child;
    if (!Sys_StartChild(&child, BibChild_Parse, &job, BibLoadSeconds))
        return 0;
    char bytes[4096]; // more than it sends
    size_t length = 0;
    long got = 1;
    while (got > 0 && length < sizeof bytes) {
        got = Sys_ReadChild(&child, bytes + length, sizeof bytes - length, BibLoadSeconds);
        length += got > 0 ? static_cast<size_t>(got) : 0;
    }
    Sys_EndChild(&child);
    return HasItem(bytes, length, BIB_ITEM_MESSAGE) && HasItem(bytes, length, BIB_ITEM_OUTSIDE);
}

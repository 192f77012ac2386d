// store/BibLoad.cpp - loading a BIB file: records from the items that the child sends.

#include "store/BibStore.h"

#include <cstdlib>
#include <cstring>
#include <initializer_list>

#include <btparse.h>

#include "base/Log.h"
#include "base/Sys.h"
#include "encoding/Encoding.h"
#include "store/BibChild.h"
#include "store/BibItem.h"
#include "store/BibOutside.h"
#include "store/BibRecords.h"

int BibLoadSeconds = 10;

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

// The parser's child, which reads the stream, or `text` when that is null.
static int StartParser(SysChild *child, FILE *stream, const char *text, const char *path,
                       int seconds, SysReason *why)
{
    const BibParseJob job = {Enc_Current()->name, path, text, BibStringOptions};
    BibItems block = BibJob_Pack(&job);
    if (!block.bytes) {
        *why = {"there is not enough memory", 0};
        return 0;
    }
    const SysInput input = {block.bytes, block.length, stream};
    int started = Sys_StartChild(child, &BibTasks[BIB_TASK_PARSE], &input, seconds, why);
    BibItems_Free(&block);
    return started;
}

// The child may be silent for longer than it computes, on a slow disk.
static void LoadItems(BibFile *file)
{
    int seconds = SecondsFor(file->stream);
    SysChild child;
    SysReason why;
    if (!StartParser(&child, file->stream, nullptr, file->path, seconds, &why)) {
        Report(file, 0, why.text);
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

// --- Self-test ---

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
    static const char text[] = "% comment\n@misc{key, field = }\n";
    SysChild child;
    SysReason why;
    if (!StartParser(&child, nullptr, text, "self-test", BibLoadSeconds, &why))
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

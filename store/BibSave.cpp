// store/BibSave.cpp - writing a BIB file back, with a backup of what it held before.

#include "store/BibStore.h"

#include <cstdlib>
#include <cstring>
#include <ctime>

#include "base/Log.h"
#include "base/Sys.h"
#include "store/BibOutside.h"

// --- Values ---

// Gathers small pieces, since a call of the stream for each would take most of a save's time.
struct Output {
    FILE *stream;
    int crlf;       // lines end with CR LF
    int failed;     // something is lost, and nothing more is written
    SysReason *why; // of that; may be null
    size_t used;
    char block[1024 * 1024];
};

// Too large for the stack; one serves all, as nothing here runs twice at a time.
static Output *StartOutput(FILE *stream, int crlf, SysReason *why)
{
    static Output output;
    output.stream = stream;
    output.crlf = crlf;
    output.failed = 0;
    output.why = why;
    output.used = 0;
    return &output;
}

static void Write(Output *out, const char *text, size_t length)
{
    if (!out->failed)
        out->failed = !Sys_WriteStream(out->stream, text, length, out->why);
}

static void Flush(Output *out)
{
    Write(out, out->block, out->used);
    out->used = 0;
}

static void PutBytes(Output *out, const char *text, size_t length)
{
    if (length > sizeof out->block - out->used)
        Flush(out);
    if (length > sizeof out->block) {
        Write(out, text, length);
        return;
    }
    memcpy(out->block + out->used, text, length);
    out->used += length;
}

static void PutLines(Output *out, const char *text, size_t length)
{
    const char *end = text + length;
    while (const void *found = memchr(text, '\n', static_cast<size_t>(end - text))) {
        const char *lineEnd = static_cast<const char *>(found);
        const char *textEnd = lineEnd > text && lineEnd[-1] == '\r' ? lineEnd - 1 : lineEnd;
        PutBytes(out, text, static_cast<size_t>(textEnd - text));
        PutBytes(out, "\r\n", 2);
        text = lineEnd + 1;
    }
    PutBytes(out, text, static_cast<size_t>(end - text));
}

static void Put(Output *out, const char *text, size_t length)
{
    if (out->crlf)
        PutLines(out, text, length);
    else
        PutBytes(out, text, length);
}

static void Put(Output *out, const char *text)
{
    Put(out, text, strlen(text));
}

struct ValueState {
    int inRun;       // between the braces that we put around text
    long depth;      // braces of the text that are open in the run
    long macroDepth; // below 0 after a closing mark too many: what follows is written bare
    int notFirst;
};

static void CloseRun(Output *out, ValueState *state)
{
    if (!state->inRun)
        return;
    if (state->depth > 0)
        AppLog("WARNING: ", "unclosed braces in saved string, close them");
    for (; state->depth > 0; --state->depth)
        Put(out, "}", 1);
    Put(out, "}", 1);
    state->inRun = 0;
}

static void JoinPiece(Output *out, ValueState *state)
{
    if (state->notFirst)
        Put(out, " # ", 3);
    state->notFirst = 1;
}

static void OpenMacro(Output *out, ValueState *state, const char *value)
{
    if (state->macroDepth > 0)
        AppLog("ERROR: Recursive Abbreviation: ", value);
    ++state->macroDepth;
    CloseRun(out, state);
    JoinPiece(out, state);
}

// The bytes of a run that can be copied as they are: up to a mark or to a brace that closes
// nothing. Counts the braces in them.
static size_t PlainLength(const char *text, long *depth)
{
    for (const char *at = text;; ++at) {
        at += strcspn(at, "\2\5{}");
        if (*at == '{')
            ++*depth;
        else if (*at == '}' && *depth > 0)
            --*depth;
        else
            return static_cast<size_t>(at - text);
    }
}

// Writes what follows up to the next mark, or a part of it; returns what follows that.
static const char *PutText(Output *out, ValueState *state, const char *text)
{
    if (state->macroDepth == 0 && !state->inRun) {
        JoinPiece(out, state);
        Put(out, "{", 1);
        state->inRun = 1;
    }
    state->notFirst = 1;
    size_t length = state->inRun ? PlainLength(text, &state->depth) : strcspn(text, "\2\5");
    Put(out, text, length);
    if (text[length] != '}')
        return text + length;
    AppLog("WARNING: ", "not opened extra braces, prepended by brace.");
    Put(out, "{}", 2);
    return text + length + 1;
}

static int IsNumber(const char *value)
{
    const char *at = value;
    while (*at >= '0' && *at <= '9')
        ++at;
    return at != value && *at == 0;
}

static void PutValue(Output *out, const char *value)
{
    if (*value == 0 || IsNumber(value)) {
        Put(out, *value ? value : "{}");
        return;
    }
    ValueState state = {};
    for (const char *at = value; *at;) {
        if (*at == BIB_OPEN_ABBREVIATION) {
            OpenMacro(out, &state, value);
            ++at;
        } else if (*at == BIB_CLOSE_ABBREVIATION) {
            --state.macroDepth;
            ++at;
        } else {
            at = PutText(out, &state, at);
        }
    }
    CloseRun(out, &state);
}

void Bib_WriteValue(const char *value, FILE *stream)
{
    Output *out = StartOutput(stream, 0, nullptr);
    PutValue(out, value);
    Flush(out);
}

// --- The file's text ---

// What stood between the items is written as they come.
struct OutsideWriter {
    Output *out;
    const BibOutside *next;
};

static int IsNext(const OutsideWriter *outside, BibPlace place, const void *item, int piece)
{
    const BibOutside *next = outside->next;
    return next && next->place == place && next->item == item && next->piece == piece;
}

static void PutNext(OutsideWriter *outside)
{
    Put(outside->out, outside->next->text);
    Put(outside->out, "\n");
    outside->next = outside->next->next;
}

static void PutOutside(OutsideWriter *outside, BibPlace place, const void *item)
{
    while (IsNext(outside, place, item, 0))
        PutNext(outside);
}

// What is left up to a place when its items are written: at the end of the file the text there;
// before, nothing, unless an item was taken away without a word.
static void PutRest(OutsideWriter *outside, BibPlace place)
{
    while (outside->next && outside->next->place <= place)
        PutNext(outside);
}

static void PutComments(OutsideWriter *outside, const BibComment *comment)
{
    Output *out = outside->out;
    int any = comment != nullptr;
    for (; comment; comment = comment->next) {
        PutOutside(outside, BIB_BEFORE_COMMENT, comment);
        Put(out, "@COMMENT{");
        Put(out, comment->text);
        Put(out, "}\n");
    }
    if (any)
        Put(out, "\n");
    PutRest(outside, BIB_BEFORE_COMMENT);
}

// Starts another item where text stands between two pieces: inside of one it would be lost.
static void JoinPieces(OutsideWriter *outside, int piece)
{
    Output *out = outside->out;
    int isNew = IsNext(outside, BIB_BEFORE_PIECE, nullptr, piece);
    if (piece > 0)
        Put(out, isNew ? " }\n\n" : "\n\t# ");
    while (IsNext(outside, BIB_BEFORE_PIECE, nullptr, piece))
        PutNext(outside);
    if (piece == 0 || isNew)
        Put(out, "@PREAMBLE{");
}

// A piece per line. The last one has no line end when it was edited by hand.
static void PutPreamble(OutsideWriter *outside, const char *preamble)
{
    Output *out = outside->out;
    int piece = 0;
    for (const char *at = preamble; *at;) {
        char line[BIB_PREAMBLE_SIZE];
        size_t length = strcspn(at, "\r");
        memcpy(line, at, length);
        line[length] = 0;
        JoinPieces(outside, piece++);
        PutValue(out, line);
        at += length;
        if (*at == '\r')
            at += at[1] == '\n' ? 2 : 1;
    }
    if (piece > 0)
        Put(out, " }\n\n");
    PutRest(outside, BIB_BEFORE_PIECE);
}

static void PutStrings(OutsideWriter *outside, const BibString *string)
{
    Output *out = outside->out;
    int any = string != nullptr;
    for (; string; string = string->next) {
        PutOutside(outside, BIB_BEFORE_STRING, string);
        Put(out, "@STRING{");
        Put(out, string->name);
        Put(out, " = ");
        PutValue(out, string->value);
        Put(out, "}\n");
    }
    if (any)
        Put(out, "\n");
    PutRest(outside, BIB_BEFORE_STRING);
}

// A key without the comma after it is a syntax error to the parser: the file would be read-only
// the next time.
static void PutEntry(Output *out, const BibEntry *entry)
{
    Put(out, "@");
    Put(out, BibTypeTable[entry->type]);
    Put(out, "{");
    Put(out, entry->key);
    for (int i = 0; i < entry->fieldCount; ++i) {
        Put(out, ",\n\t");
        Put(out, BibFieldTable[entry->fields[i].name]);
        Put(out, " = ");
        PutValue(out, entry->fields[i].value);
    }
    Put(out, entry->fieldCount > 0 ? "\n}\n" : ",\n}\n");
}

// 1, or 0 when something is lost.
static int WriteContents(const BibFile *file, FILE *stream, SysReason *why)
{
    Output *out = StartOutput(stream, file->form & BIB_FORM_CRLF, why);
    OutsideWriter outside = {out, Outside_First(file)};
    if (file->form & BIB_FORM_MARK)
        Put(out, BIB_BYTE_ORDER_MARK);
    PutComments(&outside, file->comments);
    PutPreamble(&outside, file->preamble);
    PutStrings(&outside, file->strings);
    for (const BibEntry *entry = file->entries; entry; entry = entry->next) {
        PutOutside(&outside, BIB_BEFORE_ENTRY, entry);
        PutEntry(out, entry);
    }
    PutRest(&outside, BIB_AT_END);
    Flush(out);
    return !out->failed;
}

// --- Refusals ---

static char Reason[256];

const char *Bib_SaveReason()
{
    return Reason;
}

static void Refuse(const char *message, const char *path, const SysReason *why)
{
    snprintf(Reason, sizeof Reason, "%s", why->text);
    AppLog(message, path);
}

// --- The backup ---
//
// It is made before the new contents are written, so that a folder that takes no backup is reported
// as such, and it is undone when the save fails. It leaves the path as it is: the old contents only
// get a second name.

// What a save did to keep the old contents.
struct Backup {
    char *name;  // heap; null when no backup is wanted
    int made;    // `name` holds the old contents
    char *older; // heap: where an earlier file of that name waits until the save is done, or null
};

const char *Bib_BackupName(const BibFile *file, int n)
{
    static char *name = nullptr;
    const size_t suffixSize = 80; // enough for any numbers in the date
    size_t size = strlen(file->path) + suffixSize;
    char *larger = static_cast<char *>(realloc(name, size));
    if (!larger)
        return "";
    name = larger;
    if (n < 0) {
        snprintf(name, size, "%s.Backup", file->path);
        return name;
    }
    const char letter[] = {n > 0 ? static_cast<char>('A' + n % 26) : '\0', '\0'};
    time_t now = time(nullptr);
    const struct tm *local = localtime(&now);
    snprintf(name, size, "%s.Backup-%4d%02d%02d-%02d%02d%02d%s", file->path, local->tm_year + 1900,
             local->tm_mon + 1, local->tm_mday, local->tm_hour, local->tm_min, local->tm_sec,
             letter);
    return name;
}

static char *CopyName(const char *name)
{
    return Bib_CopyText(name, strlen(name));
}

// The first dated name that is free. When none is, the last one: keeping a copy there fails.
static char *FreeDatedName(const BibFile *file)
{
    const char *name = Bib_BackupName(file, 0);
    for (int n = 1; n < BIB_BACKUP_ATTEMPTS && Sys_FileExists(name); ++n)
        name = Bib_BackupName(file, n);
    return CopyName(name);
}

// Frees the name ".Backup". What it held gets a dated name for the time being, where there is one
// to have, so that a save that fails later does not cost the user the earlier backup.
static int MakeRoom(const BibFile *file, Backup *backup)
{
    if (!Sys_FileExists(backup->name))
        return 1;
    char *older = FreeDatedName(file);
    if (Sys_KeepCopy(backup->name, older))
        backup->older = older;
    else
        free(older);
    SysReason why = {};
    if (Sys_RemoveFile(backup->name, &why))
        return 1;
    Refuse("ERROR: Can't remove backup file: ", backup->name, &why);
    return 0;
}

// Another program has written the file since this one loaded or saved it. Such contents exist
// nowhere else, so they are kept like those that were there at the start.
static int ChangedOutside(const BibFile *file)
{
    uint64_t stamp = Sys_FileStamp(file->path);
    if (stamp == 0 || (file->origin && stamp == file->origin->stamp))
        return 0;
    AppLog("WARNING: Another program has changed the Bib-file: ", file->path);
    return 1;
}

static int WantsBackup(const BibFile *file)
{
    if (BibBackupMode < 0 || !Sys_FileExists(file->path))
        return 0;
    return !file->backupDone || ChangedOutside(file);
}

// 1 when the path may be replaced.
static int MakeBackup(const BibFile *file, Backup *backup)
{
    if (!WantsBackup(file))
        return 1;
    bool dated = BibBackupMode >= 2;
    backup->name = dated ? FreeDatedName(file) : CopyName(Bib_BackupName(file, -1));
    if (!dated && !MakeRoom(file, backup))
        return 0;
    SysReason why = {};
    backup->made = Sys_KeepCopy(file->path, backup->name, &why);
    if (!backup->made)
        Refuse("ERROR: Can't rename to BAK-file the Bib-file: ", file->path, &why);
    return backup->made;
}

static void UndoBackup(const Backup *backup)
{
    if (backup->made)
        Sys_RemoveFile(backup->name);
    if (!backup->older)
        return;
    if (Sys_FileExists(backup->name) || Sys_KeepCopy(backup->older, backup->name))
        Sys_RemoveFile(backup->older);
}

static void SettleBackup(Backup *backup, int saved)
{
    if (!saved)
        UndoBackup(backup);
    else if (backup->older)
        Sys_RemoveFile(backup->older);
    free(backup->name);
    free(backup->older);
}

// --- Saving ---

static int TryToReplace(const BibFile *file, SysReason *why)
{
    SysReplace replace;
    if (!Sys_StartReplace(&replace, file->path, why))
        return 0;
    if (WriteContents(file, replace.stream, why))
        return Sys_CommitReplace(&replace, why);
    Sys_CancelReplace(&replace);
    return 0;
}

static int ReplaceContents(const BibFile *file)
{
    SysReason why = {};
    if (TryToReplace(file, &why))
        return 1;
    Refuse("ERROR: Can't open file: ", file->path, &why);
    return 0;
}

int Bib_SaveFile(BibFile *file)
{
    if (file->readOnly) {
        AppLog("ERROR: ReadOnly Bib-file: ", file->path);
        snprintf(Reason, sizeof Reason, "The file is read-only");
        return 0;
    }
    Backup backup = {};
    int saved = MakeBackup(file, &backup) && ReplaceContents(file);
    SettleBackup(&backup, saved);
    if (!saved)
        return 0;
    file->backupDone = 1;
    file->modified = 0;
    if (Bib_Origin(file))
        file->origin->stamp = Sys_FileStamp(file->path);
    return 1;
}

// store/BibStore.h - BIB files in memory: records, name tables, loading, saving.
//
// A BibFile owns its lists, every record in them and every string they point to;
// records are malloc'd and freed one by one. All text is 8-bit, NUL-terminated, in
// the encoding of its file (Bib_Encoding); the name tables hold names of all files.
//
// A value is the concatenation of the pieces of a BibTeX value: a quoted or braced
// string stands as its inner text, a number as its digits, and an abbreviation as
// byte 0x02, its name, byte 0x05. So `{A} # jan # "B"` is A 02 j a n 05 B.
//
// Functions return 1 for success and 0 (or null) for failure, and log the reason
// where it happens. Case is ignored for the ASCII letters only, under any locale.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>

#include "base/Sys.h" // Sys_LastErrorText, Sys_ToBackslashes, Sys_ModulePath

struct EncodingRecord; // encoding/Encoding.h
struct _ast;           // one parsed item of the parser library

enum {
    BIB_TYPE_LIMIT = 128,      // slots of BibTypeTable
    BIB_FIELD_LIMIT = 512,     // slots of BibFieldTable
    BIB_FIXED_TYPES = 4,       // slots 0 to 3 of BibTypeTable never change
    BIB_MESSAGES_SIZE = 8192,  // bytes of BibFile::messages
    BIB_PREAMBLE_SIZE = 8192,  // bytes of BibFile::preamble
    BIB_BACKUP_ATTEMPTS = 26,  // dated backup names tried per save
    BIB_OPEN_ABBREVIATION = 2, // opens an abbreviation's name in a value
    BIB_CLOSE_ABBREVIATION = 5 // closes it
};

struct BibField {
    int32_t name;      // index into BibFieldTable
    int32_t companion; // travels with the field; the store only copies it. Not of base/Companion.h
    char *value;       // heap, never null
};

struct BibEntry {
    BibEntry *next;
    int32_t type; // index into BibTypeTable
    char *key;    // heap: the citation key
    int32_t reserved;
    int32_t fieldCount;
    BibField fields[1]; // fieldCount slots, `crossref` first if there is one; a change of size
                        // means a new block
};

struct BibString { // one abbreviation of an @STRING
    BibString *next;
    char *name;  // heap, as written in the file
    char *value; // heap
};

struct BibComment { // one @COMMENT
    BibComment *next;
    char *text; // heap, without its delimiters
};

// How a file was written. A new one of plain lines has none of these.
enum {
    BIB_FORM_CODE_PAGE = 1, // it is no valid UTF-8
    BIB_FORM_CRLF = 2,      // every line ends with CR LF
    BIB_FORM_MARK = 4,      // it begins with a byte order mark
    BIB_FORM_ALL = 7
};

constexpr char BIB_BYTE_ORDER_MARK[] = "\xEF\xBB\xBF";

struct BibFile {
    FILE *stream;             // null: no stream is kept open
    int32_t lockHandle;       // Sys_LockFile's handle, 0 when the file is not locked
    int32_t inUse;            // the current command line names the file
    char *path;               // heap, as passed to Bib_LoadFile
    int32_t form;             // BIB_FORM_ bits
    int32_t readOnly;         // 0 when the file may be written
    int32_t readOnlyByErrors; // 1 when it is read-only because it loaded with errors
    int32_t modified;         // changes since the last save
    int32_t backupDone;       // 1 once a save of this run has dealt with the backup
    char *baseName;           // heap: no folder, nothing from the first '.' on
    BibString *strings;       // the lists are in file order; new entries go to the head
    BibEntry *entries;
    BibComment *comments;
    int32_t errorCount;
    int32_t warningCount;
    char *messages;                   // heap, BIB_MESSAGES_SIZE bytes; null without a message
    char preamble[BIB_PREAMBLE_SIZE]; // each piece is followed by CR LF
    struct BibOrigin *origin;         // heap; null when nothing is known
};

// Where a text between the items stands, in the order in which a save writes them.
enum BibPlace {
    BIB_BEFORE_COMMENT,
    BIB_BEFORE_PIECE, // of the preamble
    BIB_BEFORE_STRING,
    BIB_BEFORE_ENTRY,
    BIB_AT_END,
    BIB_PLACES,
    BIB_NO_PLACE = BIB_PLACES // the item that follows is not loaded yet
};

// Text that stood between the items of a file: comment lines, and whatever else is no item. It
// belongs to the item that followed it.
struct BibOutside {
    BibOutside *next;
    BibPlace place;
    const void *item; // the BibComment, BibString or BibEntry; else null
    int piece;        // index of the piece of the preamble; else 0
    char *text;       // heap: lines, the last one without its end
};

// What a save needs to know of the file on the disk, besides its records. A block of its own, as
// other code relies on the size of BibFile.
struct BibOrigin {
    uint64_t stamp;      // Sys_FileStamp of what was loaded or saved last
    BibOutside *outside; // see BibOutside.h
    int32_t dropped;     // comment lines inside items, which are not kept
};

// Process-wide name tables: shared by all files, they only grow.
extern char *BibTypeTable[BIB_TYPE_LIMIT];
extern int BibTypeCount;
extern char *BibFieldTable[BIB_FIELD_LIMIT];
extern int BibFieldCount;

extern BibFile *BibCurrentFile; // receives the parser's messages

// Settings.
extern int BibBackupMode;      // below 0: none; 0, 1: "name.Backup"; 2 and more: dated (default 2)
extern const int BibLockFiles; // 0: streams are not kept open
extern const int BibStringOptions; // 0: the parser leaves strings as they are
extern int BibLoadSeconds; // CPU time that a load may take, for each begun 64 MB (default 10)

// --- Tables and records (BibStore.cpp) ---

// Sets up the parser library and the fixed types. Call once, before anything else.
void Bib_Initialize();

// The index of `name`, which is added when it is new; the first spelling stays.
// Ends the process when the table is full: ask Bib_HasTypeRoom or Bib_HasFieldRoom first.
int Bib_TypeIndex(const char *name); // null or "" gives 0, "** UNKNOWN **"
int Bib_FieldIndex(const char *name);
int Bib_HasTypeRoom(const char *name); // 1 when Bib_TypeIndex(name) will return
int Bib_HasFieldRoom(const char *name);
int Bib_IsFieldKnown(const char *name); // 1 when it has an index already

// A block with room for `fieldCount` fields, all zero but fieldCount. Null when memory is out.
BibEntry *Bib_AllocEntry(int fieldCount);

// A new entry at the head of `file`'s list. `fieldSpecs` is a list of NUL-terminated items, ended
// by an empty one: "name=*..." names a mandatory field, "name=..." an optional one that is taken
// when `allFields` is set; items that begin with '*' or have no '=' are skipped.
BibEntry *Bib_NewEntry(BibFile *file, const char *key, const char *typeName, const char *fieldSpecs,
                       int allFields);

// Frees the field values, the key and the block. Unlink the entry first. Before that, text that
// belongs to it has to be handed on or moved (BibOutside.h).
void Bib_FreeEntry(BibEntry *entry);

// The slot of the entry's first field of this name, ignoring case; -1 for none.
int Bib_FindField(const BibEntry *entry, const char *name);

// The pointer of the file's list that leads to the entry; null when the entry is not of that file.
BibEntry **Bib_FindLink(BibFile *file, const BibEntry *entry);

// 1 when a field value of the entry contains `text`, ignoring case.
int Bib_EntryContains(const BibEntry *entry, const char *text);

// Heap memory that is never checked by callers of small pieces: on failure "Can't allocate N
// bytes" goes to standard error and null comes back.
void *Bib_Alloc(size_t size);
char *Bib_CopyText(const char *text, size_t length); // adds the NUL

// --- Loading (BibLoad.cpp, BibRecords.cpp) ---

// Reads one file. The parser runs in a child process, so that no input can harm this one: when the
// child fails, what it had read is kept and the file counts an error. Logs and returns null when
// the path cannot be opened or is no regular file. Takes no lock.
BibFile *Bib_LoadFile(const char *path);

// The encoding of a file's texts: the selected one; while that is UTF-8, what the file was found to
// be.
const EncodingRecord *Bib_Encoding(const BibFile *file);

// Looks at the texts once more that can be edited: in a code page, the file may have got some that
// are no UTF-8. Never takes a file for UTF-8 that was not: comments and text between the items are
// not looked at.
void Bib_UpdateForm(BibFile *file);

// The file's origin, which is made when there is none. Null when memory is out.
BibOrigin *Bib_Origin(BibFile *file);

// Frees the record with all it owns. Close `stream` and release `lockHandle` first.
void Bib_FreeFile(BibFile *file);

// One parsed item into `file`, in this process; they push at the head of the lists.
// Return 1; Bib_AddEntryFromAst 0 for an entry without a key, which is skipped.
int Bib_AddEntryFromAst(BibFile *file, struct _ast *ast);
int Bib_AddStringsFromAst(BibFile *file, struct _ast *ast);
int Bib_AddPreambleFromAst(BibFile *file, struct _ast *ast);
int Bib_AddCommentFromAst(BibFile *file, struct _ast *ast);

// 1 when the parser's messages reach this program instead of standard error. Without it broken
// files would look clean and be overwritten, so the program must not go on after a 0.
int Bib_SelfTest();

// --- Messages (BibMessages.cpp) ---

// Counts a message of the parser against BibCurrentFile, logs it and appends it to the file's
// messages. Only `errorClass` (0 to 7), `line` and `message` are used.
void Bib_ReportMessage(const char *className, int errorClass, const char *fileName, int line,
                       const char *itemDescription, int itemNumber, const char *message);

// --- Saving (BibSave.cpp) ---

// Writes the file back; the first save of a run keeps the old contents under a backup name, and so
// does a later one that finds contents which another program has written.
// The path holds the complete old or the complete new contents at any time. Returns 1 and clears
// `modified`, or logs the reason and returns 0 with the records unchanged. Release the lock
// before, take it again after: the path is another file then.
int Bib_SaveFile(BibFile *file);

// Why the last Bib_SaveFile returned 0, in the system's words. Static text.
const char *Bib_SaveReason();

// Writes one value in BibTeX syntax; repairs unbalanced braces, with a warning in the log.
void Bib_WriteValue(const char *value, FILE *stream);

// The backup name for attempt n: the path and ".Backup" for n < 0, else with the local time and,
// from n = 1 on, a letter from B to Z. The text stays until the next call.
const char *Bib_BackupName(const BibFile *file, int n);

// --- Checks (BibCheck.cpp) ---

// Null when the value can be written as BibTeX, else a message (static text) that says why not.
const char *Bib_CheckValue(const char *value);

// Removes the characters that no key may hold, "\"#%'(),={} " , in place. Returns 1.
int Bib_StripKeyChars(char *key);
int Bib_HasBadKeyChars(const char *key); // 1 when there are some

// 1 when the parser reads it back unchanged: Bib_IsKey for citation keys, Bib_IsName for fields and
// abbreviations, which must not begin with a digit. Empty texts, control characters, backslashes
// and the characters above are refused.
int Bib_IsKey(const char *key);
int Bib_IsName(const char *name);

// --- The layout that other code may rely on ---

static_assert(sizeof(BibField) == 16 && offsetof(BibField, value) == 8);
static_assert(offsetof(BibEntry, next) == 0 && offsetof(BibEntry, type) == 8 &&
              offsetof(BibEntry, key) == 16 && offsetof(BibEntry, reserved) == 24 &&
              offsetof(BibEntry, fieldCount) == 28 && offsetof(BibEntry, fields) == 32);
static_assert(sizeof(BibEntry) == (1 + 2) * 16);
static_assert(offsetof(BibString, next) < offsetof(BibString, name) &&
              offsetof(BibString, name) < offsetof(BibString, value));
static_assert(offsetof(BibComment, next) < offsetof(BibComment, text));
static_assert(offsetof(BibFile, stream) == 0 && offsetof(BibFile, lockHandle) == 8 &&
              offsetof(BibFile, inUse) == 12 && offsetof(BibFile, path) == 16 &&
              offsetof(BibFile, form) == 24 && offsetof(BibFile, readOnly) == 28 &&
              offsetof(BibFile, readOnlyByErrors) == 32 && offsetof(BibFile, modified) == 36 &&
              offsetof(BibFile, backupDone) == 40 && offsetof(BibFile, baseName) == 48 &&
              offsetof(BibFile, strings) == 56 && offsetof(BibFile, entries) == 64 &&
              offsetof(BibFile, comments) == 72 && offsetof(BibFile, errorCount) == 80 &&
              offsetof(BibFile, warningCount) == 84 && offsetof(BibFile, messages) == 88 &&
              offsetof(BibFile, preamble) == 96);

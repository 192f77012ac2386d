// store/BibChild.cpp - the parser's side of loading: items from the parser, packed as bytes.
//
// The parser library ends or breaks its process on input that people really have, so it runs in a
// child of the editor.

#include "store/BibChild.h"

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <vector>

#include <btparse.h>

#include "base/Sys.h"
#include "encoding/Encoding.h"
#include "store/BibHooks.h"
#include "store/BibStore.h"
#include "store/BibText.h"

extern "C" {
// The lexer's state, exported by the library.
extern int zzline;
extern int zzendcol; // how many bytes of the text are read

void dump_ast(char *heading, AST *ast); // prints to standard output
}

enum {
    FLUSH_SIZE = 64 * 1024,  // what a pipe holds
    LEAVE_TREE_SIZE = 100000 // pieces; the library frees a tree by recursion along them
};

// --- The parser's trees ---

static void PackMessage(BibItems *items, int errorClass, int line, const char *message)
{
    BibItems_Begin(items, BIB_ITEM_MESSAGE, line, errorClass);
    BibItems_PackText(items, message);
    BibItems_End(items);
}

static size_t PackValue(BibItems *items, AST *field)
{
    size_t pieces = 0;
    size_t start = BibItems_BeginText(items);
    bt_nodetype kind;
    char *text;
    for (AST *piece = bt_next_value(field, nullptr, &kind, &text); piece;
         piece = bt_next_value(field, piece, &kind, &text)) {
        ++pieces;
        if (!text)
            continue;
        static const char open = BIB_OPEN_ABBREVIATION, close = BIB_CLOSE_ABBREVIATION;
        if (kind == BTAST_MACRO)
            BibItems_Append(items, &open, 1);
        BibItems_Append(items, text, strlen(text));
        if (kind == BTAST_MACRO)
            BibItems_Append(items, &close, 1);
    }
    BibItems_EndText(items, start);
    return pieces;
}

static size_t PackFields(BibItems *items, AST *ast)
{
    size_t pieces = 0;
    int count = 0;
    char *name;
    for (AST *field = bt_next_field(ast, nullptr, &name); field;
         field = bt_next_field(ast, field, &name)) {
        BibItems_PackText(items, name);
        pieces += PackValue(items, field) + 1;
        ++count;
    }
    BibItems_SetNumber(items, count);
    return pieces;
}

// The library's own way to a preamble's pieces aborts on everything but a string.
static size_t PackPieces(BibItems *items, AST *ast)
{
    int count = 0;
    for (AST *piece = ast->down; piece; piece = piece->right) {
        if (!piece->text)
            continue;
        BibItems_PackText(items, piece->text);
        ++count;
    }
    BibItems_SetNumber(items, count);
    return static_cast<size_t>(count);
}

size_t BibItems_PackAst(BibItems *items, AST *ast)
{
    size_t pieces = 0;
    switch (bt_entry_metatype(ast)) {
    case BTE_REGULAR:
        BibItems_Begin(items, BIB_ITEM_ENTRY, ast->line, 0);
        BibItems_PackText(items, bt_entry_type(ast));
        BibItems_PackText(items, bt_entry_key(ast));
        pieces = PackFields(items, ast);
        break;
    case BTE_MACRODEF:
        BibItems_Begin(items, BIB_ITEM_STRINGS, ast->line, 0);
        pieces = PackFields(items, ast);
        break;
    case BTE_PREAMBLE:
        BibItems_Begin(items, BIB_ITEM_PREAMBLE, ast->line, 0);
        BibItems_PackText(items, bt_entry_type(ast));
        pieces = PackPieces(items, ast);
        break;
    case BTE_COMMENT:
        BibItems_Begin(items, BIB_ITEM_COMMENT, ast->line, 0);
        pieces = PackPieces(items, ast);
        break;
    default:
        BibItems_Begin(items, BIB_ITEM_STRANGE, ast->line, bt_entry_metatype(ast));
        break;
    }
    BibItems_End(items);
    return pieces;
}

// --- The child ---

static BibItems *Sending; // what the child has not sent yet
static int EndWasSent = 0;

static void Send(BibItems *items)
{
    if (!Sys_WriteParent(items->bytes, items->whole))
        Sys_LeaveChild(1); // nobody reads any more
    items->length = items->whole = 0;
}

// Also called from the handler of a crash: no allocation, and only whole items.
static void SendEnd(BibEnd end)
{
    BibItemHeader header = {sizeof header, BIB_ITEM_END, zzline, end};
    EndWasSent = 1;
    Sys_WriteParent(Sending->bytes, Sending->whole);
    Sys_WriteParent(&header, sizeof header);
}

static void OnCrash()
{
    if (!EndWasSent)
        SendEnd(BIB_END_CRASHED);
}

// The library ends the process by exit() when it gives up.
static void OnExit()
{
    SendEnd(BIB_END_GAVE_UP);
    Sys_LeaveChild(1);
}

[[noreturn]] static void Leave(BibEnd end)
{
    SendEnd(end);
    Sys_LeaveChild(0);
}

// --- Text between the items ---
//
// The parser drops it, or counts it as junk. Where it stands is known from the modes of the lexer,
// which runs one token ahead of the parser: with an item the text that follows it is known.

enum { LEXER_TOP = 0 }; // the mode between items

static struct {
    const char *text; // what is parsed
    size_t length;
    int mode;                  // of the lexer; -1 before the first
    size_t start;              // of the text behind the last item
    int inBrackets;            // that item is @article(...), not @article{...}
    std::vector<BibSpan> kept; // of which nothing was sent yet
    size_t counted;            // lines are counted up to here
    int line;
} Source = {nullptr, 0, -1, 0, 0, {}, 0, 1};

// The offsets must not fall.
static int LineAt(size_t at)
{
    Source.line += BibText_CountLines(Source.text, {Source.counted, at});
    Source.counted = at;
    return Source.line;
}

static void ReportLostFields(BibSpan span)
{
    size_t lost = BibText_FindLostFields(Source.text, span, Source.inBrackets);
    if (lost < span.end)
        PackMessage(Sending, BTERR_LEXERR, LineAt(lost),
                    "fields stand outside an entry: there is a closing brace too many before them");
}

// The lexer has come to the end of the text between two items.
static void EndOutside(size_t end)
{
    BibSpan span = BibText_TrimLines(Source.text, {Source.start, std::max(Source.start, end)});
    if (span.start == span.end)
        return;
    ReportLostFields(span);
    Source.kept.push_back(span);
}

// How the item was opened of which the @ stands there.
static int IsInBrackets(size_t at)
{
    const char *end = Source.text + Source.length;
    const char *open =
        std::find_if(Source.text + at + 1, end, [](char c) { return strchr("{(@", c); });
    return open < end && *open == '(';
}

static void OnMode(int mode)
{
    // It counts the end of the file as well. At the start it still has the count of another text,
    // when this process has parsed one.
    size_t read = std::min(static_cast<size_t>(zzendcol), Source.length);
    if (mode == LEXER_TOP && Source.mode > LEXER_TOP)
        Source.start = read;
    if (mode != LEXER_TOP && Source.mode == LEXER_TOP) { // an @ was read
        EndOutside(read - 1);
        Source.inBrackets = IsInBrackets(read - 1);
    }
    Source.mode = mode;
}

// What stands before an offset.
static void PackOutside(BibItems *items, size_t offset)
{
    auto next = Source.kept.begin();
    for (; next != Source.kept.end() && next->end <= offset; ++next) {
        BibItems_Begin(items, BIB_ITEM_OUTSIDE, 0, 0);
        size_t start = BibItems_BeginText(items);
        BibItems_Append(items, Source.text + next->start, next->end - next->start);
        BibItems_EndText(items, start);
        BibItems_End(items);
    }
    Source.kept.erase(Source.kept.begin(), next);
}

// The parser would miss an item in such a file. `words` is where anything but comments stands.
static void KeepAll(size_t words)
{
    if (words < Source.length)
        PackMessage(Sending, BTERR_LEXWARN, LineAt(words),
                    "there is text in the file, but no item");
    EndOutside(Source.length);
    PackOutside(Sending, Source.length);
}

// --- Parsing ---

// The library reports while an item is still being parsed, never while one is being packed.
static void OnMessage(int errorClass, int line, const char *message)
{
    PackMessage(Sending, errorClass, line, message);
    if (errorClass >= BTERR_USAGEERR)
        Send(Sending);
}

static void OnComment(int line)
{
    if (Source.mode == LEXER_TOP)
        return;
    BibItems_Begin(Sending, BIB_ITEM_DROPPED, line, 0);
    BibItems_End(Sending);
}

static const BibListener Listening = {OnMessage, OnMode, OnComment};

// Frees an item's tree, unless the library's recursion would use up the stack.
static void FreeTree(AST *ast, size_t pieces)
{
    if (pieces < LEAVE_TREE_SIZE)
        bt_free_ast(ast);
}

// Such bytes in a file can't be told from our own marks: a save would turn text into names of
// abbreviations. An error keeps the file from being written.
static void ReportMarks(const char *text, size_t length)
{
    const void *mark = memchr(text, BIB_OPEN_ABBREVIATION, length);
    if (!mark)
        mark = memchr(text, BIB_CLOSE_ABBREVIATION, length);
    if (!mark)
        return;
    PackMessage(Sending, BTERR_LEXERR, BibText_LineAt(text, static_cast<const char *>(mark) - text),
                "control character 0x02 or 0x05, which marks abbreviations in this program");
}

static void PrintTree(AST *ast)
{
    static char heading[] = "AST for whole entry:\n";
    dump_ast(heading, ast);
    fflush(stdout);
}

// A lone @ in front of an entry hides in the name of its type.
static void ReportSignInType(AST *ast)
{
    const char *type = bt_entry_type(ast);
    if (type && *type == '@')
        PackMessage(Sending, BTERR_LEXWARN, ast->line,
                    "an @ stands before that of this entry, it becomes a part of the type");
}

static BibEnd ParseAll(FILE *stream, const char *path)
{
    boolean status;
    while (AST *ast = bt_parse_entry(stream, const_cast<char *>(path), BTO_NOSTORE, &status)) {
        PackOutside(Sending, static_cast<size_t>(ast->offset));
        ReportSignInType(ast);
        size_t pieces = BibItems_PackAst(Sending, ast);
        bt_metatype metatype = bt_entry_metatype(ast);
        if (metatype < BTE_REGULAR || metatype > BTE_MACRODEF)
            PrintTree(ast);
        FreeTree(ast, pieces);
        if (Sending->whole >= FLUSH_SIZE)
            Send(Sending);
    }
    if (Source.mode == LEXER_TOP)
        EndOutside(Source.length);
    PackOutside(Sending, Source.length);
    return feof(stream) ? BIB_END_OF_FILE : BIB_END_EARLY;
}

static void SendForm(int form)
{
    BibItems_Begin(Sending, BIB_ITEM_FORM, 0, form);
    BibItems_End(Sending);
}

// A file that only begins as UTF-8 would be hard to read without a word on why.
static void ReportBadByte(const char *text, size_t length, int form)
{
    if (!(form & BIB_FORM_CODE_PAGE))
        return;
    size_t valid = Enc_Utf8Length(text, length);
    if (form & BIB_FORM_MARK || !BibText_IsAscii(text, valid))
        PackMessage(Sending, BTERR_LEXWARN, BibText_LineAt(text, valid),
                    "this is no UTF-8 any more, so the whole file is taken for CP1252");
}

// True when there is one. Of the text as it is in the file.
static bool ReportNul(const char *text, size_t length)
{
    const void *nul = memchr(text, 0, length);
    if (nul)
        PackMessage(Sending, BTERR_LEXWARN,
                    BibText_LineAt(text, static_cast<const char *>(nul) - text),
                    "a NUL character is not kept, a blank takes its place (more may follow)");
    return nul != nullptr;
}

// --- The task ---

// All room is made first: in the editor, lack of memory must not end the process.
BibItems BibJob_Pack(const BibParseJob *job)
{
    const int32_t options = job->stringOptions;
    const char *const texts[] = {job->encoding, job->path, job->text};
    BibItems block = {};
    block.room = sizeof options;
    for (const char *text : texts)
        block.room += BIB_ITEM_TEXT_FRAME + (text ? strlen(text) : 0);
    block.bytes = static_cast<char *>(Bib_Alloc(block.room));
    if (!block.bytes)
        return {};
    BibItems_Append(&block, &options, sizeof options);
    for (const char *text : texts)
        BibItems_PackText(&block, text);
    return block;
}

// The texts stay in the block.
static BibParseJob Unpack(const void *bytes)
{
    int32_t options;
    memcpy(&options, bytes, sizeof options);
    BibItemReader reader = {{}, static_cast<const char *>(bytes) + sizeof options};
    BibParseJob job = {};
    job.encoding = BibItem_NextText(&reader);
    job.path = BibItem_NextText(&reader);
    job.text = BibItem_NextText(&reader);
    job.stringOptions = options;
    return job;
}

// malloc'd, with a spare byte; null when it can't be read.
static char *ReadText(FILE *stream, const BibParseJob *job, size_t *length)
{
    if (stream)
        return Sys_ReadAll(stream, length);
    *length = strlen(job->text);
    return Bib_CopyText(job->text, *length);
}

// A program that was started again has not set up the library.
static void SetUpLibrary(int stringOptions)
{
    Sys_UsePlainLocale();
    bt_initialize();
    for (bt_metatype kind : {BTE_MACRODEF, BTE_REGULAR, BTE_COMMENT, BTE_PREAMBLE})
        bt_set_stringopts(kind, static_cast<btshort>(stringOptions));
}

static void Parse(const SysInput *input) noexcept
{
    static BibItems items;
    const BibParseJob job = Unpack(input->bytes);
    Sending = &items;
    BibHooks_Listen(&Listening);
    Sys_OnChildCrash(OnCrash);
    atexit(OnExit);

    size_t length = 0;
    char *text = ReadText(input->stream, &job, &length);
    if (!text || length >= INT_MAX) // the lexer counts with int
        Leave(BIB_END_UNREADABLE);
    const int form = BibText_Form(text, length);
    SendForm(form);
    const bool isBinary = ReportNul(text, length);
    length = BibText_Normalise(text, length);
    if (strcmp(job.encoding, EncodingUtf8.name) == 0)
        ReportBadByte(text, length, form);
    ReportMarks(text, length);
    Source.text = text;
    Source.length = length;
    const size_t words = BibText_FindWords(text, {0, length});
    if (BibText_HasNoItem(text, length) && (!isBinary || words == length)) {
        KeepAll(words);
        Leave(BIB_END_OF_FILE);
    }
    FILE *stream = Sys_OpenText(text, length);
    if (!stream)
        Leave(BIB_END_UNREADABLE);
    SetUpLibrary(job.stringOptions);
    Leave(ParseAll(stream, job.path));
}

const SysTask BibTasks[] = {{"parse", Parse}, {nullptr, nullptr}};

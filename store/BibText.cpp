// store/BibText.cpp - line ends, encoding, and what stands outside the items of a file.

#include "store/BibText.h"

#include <algorithm>
#include <cstring>
#include <string>

#include "encoding/Encoding.h"
#include "store/BibStore.h"

// --- The form ---

static const size_t MARK_SIZE = sizeof BIB_BYTE_ORDER_MARK - 1;

static int HasMark(const char *text, size_t length)
{
    return length >= MARK_SIZE && memcmp(text, BIB_BYTE_ORDER_MARK, MARK_SIZE) == 0;
}

// 1 when there are lines, and each but an unfinished last one ends with CR LF.
static int EndsWithCrLf(const char *text, size_t length)
{
    const char *end = text + length, *at = text;
    while (const void *lineEnd = memchr(at, '\n', static_cast<size_t>(end - at))) {
        const char *line = at;
        at = static_cast<const char *>(lineEnd) + 1;
        if (memchr(line, '\r', static_cast<size_t>(at - line)) != at - 2)
            return 0;
    }
    return at > text && !memchr(at, '\r', static_cast<size_t>(end - at));
}

int BibText_Form(const char *text, size_t length)
{
    int form = 0;
    if (!Enc_IsUtf8(text, length))
        form |= BIB_FORM_CODE_PAGE;
    if (EndsWithCrLf(text, length))
        form |= BIB_FORM_CRLF;
    if (HasMark(text, length))
        form |= BIB_FORM_MARK;
    return form;
}

// --- Plain lines ---

static size_t RemoveMark(char *text, size_t length)
{
    if (!HasMark(text, length))
        return length;
    memmove(text, text + MARK_SIZE, length - MARK_SIZE);
    return length - MARK_SIZE;
}

static size_t PlainLines(char *text, size_t length)
{
    if (!memchr(text, '\r', length) && !memchr(text, 0, length))
        return length;
    size_t written = 0;
    for (size_t read = 0; read < length; ++read) {
        char c = text[read];
        if (c == '\r' && read + 1 < length && text[read + 1] == '\n')
            continue;
        text[written++] = c == '\r' ? '\n' : c ? c : ' ';
    }
    return written;
}

size_t BibText_Normalise(char *text, size_t length)
{
    length = PlainLines(text, RemoveMark(text, length));
    if (length > 0 && text[length - 1] != '\n')
        text[length++] = '\n';
    return length;
}

int BibText_LineAt(const char *text, size_t at)
{
    int line = 1;
    for (size_t i = 0; i < at; ++i)
        line += text[i] == '\n' || (text[i] == '\r' && text[i + 1] != '\n');
    return line;
}

// --- Lines ---

static const char Blanks[] = " \t\n\v\f";

static int IsBlank(char c)
{
    return memchr(Blanks, c, sizeof Blanks - 1) != nullptr;
}

// What empty lines hold. A form feed may stand for a new page, so its line is none.
static int IsEmpty(char c)
{
    return c == ' ' || c == '\t' || c == '\n';
}

int BibText_CountLines(const char *text, BibSpan span)
{
    return static_cast<int>(std::count(text + span.start, text + span.end, '\n'));
}

int BibText_IsAscii(const char *text, size_t length)
{
    return std::all_of(text, text + length, [](char c) { return (c & 0x80) == 0; });
}

// Behind blanks and byte order marks: those stand in the middle of files that were put together.
static size_t SkipStart(const char *text, BibSpan span)
{
    size_t at = span.start;
    for (size_t before = span.end; at != before;) {
        before = at;
        while (at < span.end && IsEmpty(text[at]))
            ++at;
        if (HasMark(text + at, span.end - at))
            at += MARK_SIZE;
    }
    return at;
}

BibSpan BibText_TrimLines(const char *text, BibSpan span)
{
    size_t first = SkipStart(text, span), last = span.end;
    while (last > first && IsEmpty(text[last - 1]))
        --last;
    if (first == last)
        return {first, first};
    while (first > span.start && IsEmpty(text[first - 1]) && text[first - 1] != '\n')
        --first;
    while (last < span.end && text[last] != '\n')
        ++last;
    return {first, last};
}

// --- Comments ---

// The end of the comment line that starts here; `at` when none does. The parser takes a % for the
// start of one only where a word could start.
static size_t CommentEnd(const char *text, BibSpan span, size_t at)
{
    bool starts = text[at] == '%' && (at == span.start || memchr(" \t\n", text[at - 1], 3));
    return starts ? std::find(text + at, text + span.end, '\n') - text : at;
}

int BibText_HasNoItem(const char *text, size_t length)
{
    for (size_t at = 0; at < length; ++at) {
        at = CommentEnd(text, {0, length}, at);
        if (at < length && text[at] == '@')
            return 0;
    }
    return 1;
}

size_t BibText_FindWords(const char *text, BibSpan span)
{
    for (size_t at = span.start; at < span.end; ++at) {
        at = CommentEnd(text, span, at);
        if (at < span.end && !IsBlank(text[at]))
            return at;
    }
    return span.end;
}

// --- Lost fields ---

// With blanks for comments. One with an @ leaves its braces: most likely it is the first or the
// last line of an item that is commented out.
static std::string WithoutComments(const char *text, BibSpan span)
{
    std::string plain(text + span.start, text + span.end);
    for (size_t at = span.start; at < span.end; ++at) {
        size_t end = CommentEnd(text, span, at);
        bool isItem = std::find(text + at, text + end, '@') != text + end;
        for (; at < end; ++at)
            if (!isItem || !strchr("{}()", text[at]))
                plain[at - span.start] = ' ';
    }
    return plain;
}

// Of the name of a field. Those of addresses in the web are none.
static bool IsNameCharacter(char c)
{
    return static_cast<unsigned char>(c) > ' ' && !strchr("\"#%'(),={}/?", c);
}

static size_t Skip(const std::string &text, size_t at, const char *characters)
{
    return std::min(text.find_first_not_of(characters, at), text.size());
}

// Whether the name of a field and its = stand here.
static bool IsField(const std::string &text, size_t at)
{
    size_t end = at;
    while (end < text.size() && IsNameCharacter(text[end]))
        ++end;
    size_t equals = Skip(text, end, Blanks);
    return end > at && equals < text.size() && text[equals] == '=';
}

// Nothing but blanks follows on the line.
static bool EndsLine(const std::string &text, size_t at)
{
    size_t next = Skip(text, at + 1, " \t");
    return next == text.size() || text[next] == '\n';
}

// Where the first brace stands that nothing has opened, from `at` on, or such a bracket at the end
// of a line (else it is a list: 1) a 2) b); the size when there is none.
static size_t FindEnd(const std::string &text, size_t at, int inBrackets)
{
    int braces = 0, brackets = 0;
    for (; at < text.size(); ++at) {
        bool isBrace = text[at] == '}' && braces == 0;
        bool isBracket = text[at] == ')' && brackets == 0 && inBrackets;
        if (isBrace || (isBracket && EndsLine(text, at)))
            break;
        braces += (text[at] == '{') - (text[at] == '}');
        brackets += (text[at] == '(') - (text[at] == ')' && brackets > 0);
    }
    return at;
}

// The first field that stands at `at` or behind a comma, outside of braces; the size for none.
static size_t FindField(const std::string &text, size_t at)
{
    int braces = 0;
    for (at = Skip(text, at, Blanks); at < text.size() && !IsField(text, at);) {
        do {
            braces += (text[at] == '{') - (text[at] == '}' && braces > 0);
            ++at;
        } while (at < text.size() && (text[at - 1] != ',' || braces > 0));
        at = Skip(text, at, Blanks);
    }
    return at;
}

// A comma behind the end of the entry, and a field right behind that, tell; or else the brace that
// was to end the entry, behind a field.
size_t BibText_FindLostFields(const char *text, BibSpan span, int inBrackets)
{
    const std::string plain = WithoutComments(text, span);
    const std::string blanks = Blanks;
    size_t begin = Skip(plain, 0, (blanks + "}").c_str());
    size_t field = Skip(plain, begin, (blanks + ",").c_str());
    bool isBehindComma = begin < plain.size() && plain[begin] == ',' && IsField(plain, field);
    if (!isBehindComma) {
        field = FindField(plain, begin);
        if (FindEnd(plain, field, inBrackets) == plain.size())
            return span.end;
    }
    return span.start + field;
}

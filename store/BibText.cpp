// store/BibText.cpp - line ends, encoding, and what stands outside the items of a file.

#include "store/BibText.h"

#include <algorithm>
#include <cstring>

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

// --- Lines ---

static int IsBlank(char c)
{
    return memchr(" \t\n\v\f", c, 5) != nullptr;
}

int BibText_LineAt(const char *text, size_t at)
{
    return 1 + static_cast<int>(std::count(text, text + at, '\n'));
}

BibSpan BibText_TrimLines(const char *text, BibSpan span)
{
    size_t first = span.start, last = span.end;
    while (first < span.end && IsBlank(text[first]))
        ++first;
    while (last > first && IsBlank(text[last - 1]))
        --last;
    if (first == last)
        return {first, first};
    while (first > span.start && text[first - 1] != '\n')
        --first;
    while (last < span.end && text[last] != '\n')
        ++last;
    return {first, last};
}

// --- Comments and lost fields ---

// The parser takes a % for the start of a comment only where a word could start.
static int StartsComment(const char *text, BibSpan span, size_t at)
{
    return text[at] == '%' && (at == span.start || memchr(" \t\n", text[at - 1], 3));
}

int BibText_HasNoItem(const char *text, size_t length)
{
    int inComment = 0;
    for (size_t at = 0; at < length; ++at) {
        inComment = text[at] != '\n' && (inComment || StartsComment(text, {0, length}, at));
        if (!inComment && !IsBlank(text[at]))
            return 0;
    }
    return 1;
}

static int FollowsName(const char *text, BibSpan span, size_t at)
{
    while (at > span.start && IsBlank(text[at - 1]))
        --at;
    if (at == span.start)
        return 0;
    const char last[] = {text[at - 1], 0};
    return Bib_IsKey(last);
}

// With either braces or brackets. What is commented out counts for them, but nothing else: it may
// be the first line of an entry.
static size_t FindFieldsBefore(char close, char open, const char *text, BibSpan span)
{
    size_t found = span.end;
    int depth = 0, inComment = 0;
    for (size_t at = span.start; at < span.end; ++at) {
        inComment = text[at] != '\n' && (inComment || StartsComment(text, span, at));
        if (text[at] == open)
            ++depth;
        else if (text[at] == close && depth > 0)
            --depth;
        else if (text[at] == close && !inComment && found < span.end)
            return found;
        else if (text[at] == '=' && depth == 0 && !inComment && FollowsName(text, span, at))
            found = std::min(found, at);
    }
    return span.end;
}

size_t BibText_FindLostFields(const char *text, BibSpan span, int inBrackets)
{
    size_t found = FindFieldsBefore('}', '{', text, span);
    return inBrackets ? std::min(found, FindFieldsBefore(')', '(', text, span)) : found;
}

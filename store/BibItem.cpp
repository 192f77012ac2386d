// store/BibItem.cpp - parsed items as bytes: writing and reading them.

#include "store/BibItem.h"

#include <cstdlib>
#include <cstring>

#include "store/BibStore.h"

// --- Writing ---

static void Reserve(BibItems *items, size_t size)
{
    if (items->length + size <= items->room)
        return;
    size_t room = 2 * (items->length + size);
    char *bytes = static_cast<char *>(realloc(items->bytes, room));
    if (!bytes)
        abort(); // only the child works with large items; the parent reports its end
    items->bytes = bytes;
    items->room = room;
}

void BibItems_Append(BibItems *items, const void *bytes, size_t size)
{
    Reserve(items, size);
    memcpy(items->bytes + items->length, bytes, size);
    items->length += size;
}

void BibItems_Begin(BibItems *items, BibItemKind kind, int line, int number)
{
    BibItemHeader header = {0, kind, line, number};
    BibItems_Append(items, &header, sizeof header);
}

void BibItems_SetNumber(BibItems *items, int number)
{
    BibItemHeader header;
    memcpy(&header, items->bytes + items->whole, sizeof header);
    header.number = number;
    memcpy(items->bytes + items->whole, &header, sizeof header);
}

void BibItems_End(BibItems *items)
{
    if (items->length - items->whole > UINT32_MAX)
        abort(); // as for lack of memory
    uint32_t size = static_cast<uint32_t>(items->length - items->whole);
    memcpy(items->bytes + items->whole, &size, sizeof size);
    items->whole = items->length;
}

size_t BibItems_BeginText(BibItems *items)
{
    uint32_t length = 0;
    BibItems_Append(items, &length, sizeof length);
    return items->length;
}

void BibItems_EndText(BibItems *items, size_t start)
{
    uint32_t length = static_cast<uint32_t>(items->length - start);
    memcpy(items->bytes + start - sizeof length, &length, sizeof length);
    BibItems_Append(items, "", 1);
}

void BibItems_PackText(BibItems *items, const char *text)
{
    size_t start = BibItems_BeginText(items);
    if (text)
        BibItems_Append(items, text, strlen(text));
    BibItems_EndText(items, start);
}

void BibItems_Free(BibItems *items)
{
    free(items->bytes);
    *items = {};
}

// --- Reading ---

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

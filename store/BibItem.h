// store/BibItem.h - parsed items as bytes: what the loading child sends to the editor's process.
//
// A stream of items, each a BibItemHeader and its texts one after the other. A text is its length
// (32 bits), its bytes, and a NUL. Private to the loader.
#pragma once

#include <cstddef>
#include <cstdint>

enum BibItemKind {
    BIB_ITEM_MESSAGE,  // number: the error class; the message
    BIB_ITEM_ENTRY,    // number: the fields; type, key, then a name and a value for each
    BIB_ITEM_STRINGS,  // number: the abbreviations; a name and a value for each
    BIB_ITEM_PREAMBLE, // number: the pieces; the type, then each piece
    BIB_ITEM_COMMENT,  // number: the pieces; each piece
    BIB_ITEM_OUTSIDE,  // number: 0; text that stands before the next item, or at the end
    BIB_ITEM_DROPPED,  // number: 0; a comment line inside an item; no text
    BIB_ITEM_FORM,     // number: BIB_FORM_ bits; no text
    BIB_ITEM_STRANGE,  // number: 0 when the parser did not know the kind; no text
    BIB_ITEM_END       // number: a BibEnd; no text
};

enum BibEnd {
    BIB_END_OF_FILE,
    BIB_END_EARLY,     // the parser found no further item before the end of the file
    BIB_END_GAVE_UP,   // the parser ended its process
    BIB_END_CRASHED,   // by a signal
    BIB_END_UNREADABLE // the file could not be read
};

struct BibItemHeader {
    uint32_t size; // of the whole item
    int32_t kind;
    int32_t line; // where the item begins, or the parser's line of a message
    int32_t number;
};

enum { BIB_ITEM_TEXT_FRAME = sizeof(uint32_t) + 1 }; // what a text takes besides its bytes

// --- Writing: the child ---

// A growing heap buffer of items. When it can't grow for lack of memory, the process ends: only the
// child fills large ones, and the parent reports its end.
struct BibItems {
    char *bytes;
    size_t length; // all of it
    size_t whole;  // up to the end of the last finished item
    size_t room;
};

// An item is begun, gets its texts, and is ended. Its number may be set once more before that.
void BibItems_Begin(BibItems *items, BibItemKind kind, int line, int number);
void BibItems_SetNumber(BibItems *items, int number);
void BibItems_End(BibItems *items);

// A whole text; null counts as an empty one.
void BibItems_PackText(BibItems *items, const char *text);

// A text in parts: what is appended up to its end. BeginText returns what EndText asks for.
size_t BibItems_BeginText(BibItems *items);
void BibItems_Append(BibItems *items, const void *bytes, size_t size);
void BibItems_EndText(BibItems *items, size_t start);

void BibItems_Free(BibItems *items);

// --- Reading: the editor's process ---

// The size of the item at the start of `bytes`, 0 when the bytes end before it does, -1 when it is
// none: a child whose memory a broken file has damaged may send anything. An item with a size has
// just the texts that its kind and number ask for.
long BibItem_Size(const char *bytes, size_t length);

// Reads the texts of one whole item, one after the other; more than there are must not be asked
// for. The texts stay where they are, with their NUL; CopyText returns them malloc'd, or null.
struct BibItemReader {
    BibItemHeader header;
    const char *next;
};
BibItemReader BibItem_Open(const char *item);
const char *BibItem_NextText(BibItemReader *reader, uint32_t *length);
const char *BibItem_NextText(BibItemReader *reader);
char *BibItem_CopyText(BibItemReader *reader);

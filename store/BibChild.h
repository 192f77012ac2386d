// store/BibChild.h - the process that the parser runs in: it sends what it finds as items.
//
// Private to the loader.
#pragma once

#include <cstdio>

#include "store/BibItem.h"

// One parsed item at the end of `items`. Returns the number of value pieces in it.
size_t BibItems_PackAst(BibItems *items, struct _ast *ast);

// The body of the loading child. Parses `text`, or the stream when there is none.
struct BibParseJob {
    FILE *stream;
    const char *text;
    const char *path; // for the parser's own use
};
void BibChild_Parse(void *job) noexcept; // lack of memory ends the child

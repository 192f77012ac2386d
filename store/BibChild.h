// store/BibChild.h - the process that the parser runs in: it sends what it finds as items.
//
// Private to the loader, but for the table of tasks.
#pragma once

#include <cstddef>

#include "base/Sys.h"
#include "store/BibItem.h"

// One parsed item at the end of `items`. Returns the number of value pieces in it.
size_t BibItems_PackAst(BibItems *items, struct _ast *ast);

// What the loading child is told, besides the file that it reads. It uses nothing that is selected
// or set in the editor's process.
struct BibParseJob {
    const char *encoding; // EncodingRecord::name of the selected one
    const char *path;     // for the parser's own use
    const char *text;     // to be parsed when there is no stream; else null
    int stringOptions;    // of the parser library: BibStringOptions
};

// As a block of bytes; without any when memory is out. Free it with BibItems_Free.
BibItems BibJob_Pack(const BibParseJob *job);

// The tasks of the children of this program, up to a row without a name.
enum { BIB_TASK_PARSE }; // takes a packed job; lack of memory ends the child
extern const SysTask BibTasks[];

// store/BibHooks.h - what the parser library tells while it parses.
//
// Some functions of the library are replaced by ours of the same name; they tell the listener, and
// then do what the library's own would have done. Whoever parses calls BibHooks_Listen, also for
// the linker's sake: see BibHooks.cpp.
#pragma once

// Called in the middle of the parse, so none of them may start another one. None is null.
struct BibListener {
    // A message, with the line as the parser counts it. A fatal one ends the process after that.
    void (*message)(int errorClass, int line, const char *message);
    void (*mode)(int mode);    // the lexer is about to change to this mode
    void (*comment)(int line); // the lexer is about to drop a comment line
};

// From now on; the record stays the caller's and has to last. Null: nobody listens, and messages
// count against the current file (Bib_ReportMessage), as they do from the start.
void BibHooks_Listen(const BibListener *listener);

// store/BibText.h - a BIB file as plain text, before the parser sees it and beside the parser.
#pragma once

#include <cstddef>

// A part of a text.
struct BibSpan {
    size_t start, end;
};

// How the file was written, as BIB_FORM_ bits. Of the text as it is in the file.
int BibText_Form(const char *text, size_t length);

// Prepares the text for the parser, in place: no byte order mark, LF for CR LF and lone CR, blanks
// for NUL, and an end on the last line, too. `text` has a spare byte behind it. Returns the length.
size_t BibText_Normalise(char *text, size_t length);

// --- Of normalised text ---

int BibText_LineAt(const char *text, size_t at); // from 1 on

// The lines from the first to the last that holds more than blanks; the last one without its end.
// Empty when none does.
BibSpan BibText_TrimLines(const char *text, BibSpan span);

// Blanks and comment lines are all there is: the parser would miss an item.
int BibText_HasNoItem(const char *text, size_t length);

// Where the fields begin that an entry lost to a closing brace too many, in the text behind its
// end: they stand before the brace that was to end it. The end of the span for none. With
// `inBrackets` that may be a bracket, as in @article(...).
size_t BibText_FindLostFields(const char *text, BibSpan span, int inBrackets);

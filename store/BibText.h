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

// The number of the line, from 1, where a byte stands. Of text as it is in the file, or normalised.
int BibText_LineAt(const char *text, size_t at);

// --- Of normalised text ---

int BibText_CountLines(const char *text, BibSpan span); // line ends
int BibText_IsAscii(const char *text, size_t length);

// The lines from the first to the last that holds more than blanks, without a byte order mark
// before them; the last one without its end. Empty when none does.
BibSpan BibText_TrimLines(const char *text, BibSpan span);

// There is no @ outside of comment lines: the parser would miss an item.
int BibText_HasNoItem(const char *text, size_t length);

// Text outside the items that is no comment; the end of the span for none.
size_t BibText_FindWords(const char *text, BibSpan span);

// Where the fields stand that an entry lost to a closing brace too many, in the text behind it.
// They are known by a comma right behind the entry, or by the brace that was to end it; with
// `inBrackets` that may be a bracket, as in @article(...). The end of the span for none.
size_t BibText_FindLostFields(const char *text, BibSpan span, int inBrackets);

// session/Values.h - what users type for a value: of a field, an abbreviation, a preamble, a
// search.
#pragma once

#include <string>

struct EncodingRecord;

std::string Value_Read(const std::wstring &typed, const EncodingRecord *encoding); // to store text

// Store text for a control: Enc_Decode, with U+FFFD for U+0000, behind which controls see nothing.
std::wstring Value_Show(const char *value, const EncodingRecord *encoding);

// Why the value (store text) cannot be written as BibTeX, or not be read back (static text); null
// when all is well.
const char *Value_Check(const char *value);

// True when its marks of abbreviations would be written as what the parser does not read: a file
// could not be opened for writing again. Wrong braces are mended when they are written.
bool Value_HasBadMarks(const std::string &value);

// True when a stored value has guillemets that are text, not marks of abbreviations. Those that a
// user types are always such marks, so that the two can't be told apart in a control.
bool Value_HoldsGuillemets(const char *value, const EncodingRecord *encoding);

// What would be lost when the text that was typed for `name` takes the place of `stored`, a line
// for each kind, with the characters: those that the encoding would not bring back, those that it
// shows for other bytes of `stored`, and, with `textGuillemets`, guillemets. "" for nothing.
std::wstring Value_Losses(const std::wstring &name, const std::wstring &text,
                          const std::string &stored, bool textGuillemets,
                          const EncodingRecord *encoding);

extern const wchar_t Value_LossesQuestion[]; // to put behind such lines

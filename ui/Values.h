// ui/Values.h - what users type for a value: of a field, an abbreviation, a preamble, a search.
#pragma once

#include <string>

std::string Value_Read(const std::wstring &typed); // to store text

// Why the value (store text) cannot be written as BibTeX, or not be read back (static text); null
// when all is well.
const char *Value_Check(const char *value);

// True when a stored value has guillemets that are text, not marks of abbreviations. Those that a
// user types are always such marks, so that the two can't be told apart in a control.
bool Value_HoldsGuillemets(const char *value);

// What would be lost of the text that was typed for `name`, a line for each kind: characters that
// the code page would not bring back, and, with `textGuillemets`, guillemets. "" for nothing.
std::wstring Value_Losses(const std::wstring &name, const std::wstring &text, bool textGuillemets);

extern const wchar_t Value_LossesQuestion[]; // to put behind such lines

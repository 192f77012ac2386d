// session/Values.h - what users type for a value: of a field, an abbreviation, a preamble, a
// search.
#pragma once

#include <string>

struct EncodingRecord;

std::string Value_Read(const std::wstring &typed, const EncodingRecord *encoding); // to store text

// Store text for a control: Enc_Decode, with U+FFFD for U+0000, behind which controls see nothing.
std::wstring Value_Show(const char *value, const EncodingRecord *encoding);

// True when the value's marks of abbreviations would be written as what the parser does not read: a
// file could not be opened for writing again. Wrong braces are mended when they are written.
bool Value_HasBadMarks(const std::string &value);

// True when a stored value has guillemets that are text, not marks of abbreviations. Those that a
// user types are always such marks, so that the two can't be told apart in a control.
bool Value_HoldsGuillemets(const char *value, const EncodingRecord *encoding);

// --- Lines for the user on what would be lost, with the characters; "" for nothing ---

// When the text that was typed for `name` is stored: characters that the encoding would not bring
// back.
std::wstring Value_LostText(const std::wstring &name, const std::wstring &text,
                            const EncodingRecord *encoding);

// When it takes the place of `stored`: characters that the encoding shows for other bytes of that.
std::wstring Value_ReplacedText(const std::wstring &name, const std::wstring &text,
                                const std::string &stored, const EncodingRecord *encoding);

// Where guillemets may be meant as text: that they will not be.
std::wstring Value_GuillemetText(const std::wstring &name, const std::wstring &text);

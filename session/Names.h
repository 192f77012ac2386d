// session/Names.h - what users type for the key of an entry, or the name of a field or an
// abbreviation.
#pragma once

#include <string>

struct EncodingRecord;

struct TypedName {
    std::string text; // store text, without characters of code 32 and below
    bool fits;        // false: `text` lacks guillemets, which mark abbreviations, or has other
                      // characters for those that the encoding lacks
    const EncodingRecord *encoding = nullptr; // of `text`
};
TypedName Name_Read(const wchar_t *typed, const EncodingRecord *encoding);

std::string Name_MisfitText(const TypedName &key); // what to say of a key that does not fit

// --- Names of fields and abbreviations ---

enum NameVerdict {
    NAME_OK,
    NAME_EMPTY,
    NAME_MISFIT,     // see Name_MisfitText; first, as a stripped name takes the typed one's place
    NAME_BAD_CHARS,  // holds characters that no key may hold; Bib_StripKeyChars removes them
    NAME_UNWRITABLE, // the parser would not read it back
    NAME_TAKEN
};

// All but NAME_TAKEN.
NameVerdict Name_Check(const TypedName &name);

// session/Names.cpp - what users type for the key of an entry, or the name of a field or an
// abbreviation.
#include "session/Names.h"

#include <algorithm>

#include "encoding/Encoding.h"
#include "session/Values.h"
#include "store/BibStore.h"

static bool Fits(uint32_t c, const EncodingRecord *encoding)
{
    bool isMark = c == ENC_SHOWN_OPEN || c == ENC_SHOWN_CLOSE;
    return c <= 32 || (Enc_Holds(c, encoding) && !isMark);
}

TypedName Name_Read(const wchar_t *typed, const EncodingRecord *encoding)
{
    std::string text = Value_Read(typed, encoding);
    text.erase(std::remove_if(text.begin(), text.end(), [](unsigned char c) { return c <= 32; }),
               text.end());
    bool fits = true;
    while (*typed)
        fits = Fits(Enc_NextWide(&typed), encoding) && fits;
    return {text, fits, encoding};
}

std::string Name_MisfitText(const TypedName &key)
{
    if (key.encoding == &EncodingUtf8)
        return "The key includes guillemets, which mark abbreviations.";
    return std::string("The key includes characters that can't be stored in ") +
           Enc_Label(key.encoding) + ".";
}

NameVerdict Name_Check(const TypedName &name)
{
    if (name.text.empty())
        return NAME_EMPTY;
    if (!name.fits)
        return NAME_MISFIT;
    if (Bib_HasBadKeyChars(name.text.c_str()))
        return NAME_BAD_CHARS;
    return Bib_IsName(name.text.c_str()) ? NAME_OK : NAME_UNWRITABLE;
}

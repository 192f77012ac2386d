#include "ui/Keys.h"

#include <algorithm>
#include <cwchar>
#include <vector>

#include "encoding/Encoding.h"
#include "store/BibStore.h"

static bool Fits(wchar_t c)
{
    bool isMark = c == L'\xAB' || c == L'\xBB';
    return c <= 32 || (Enc_Holds(c) && !isMark);
}

TypedKey Key_Read(const wchar_t *typed)
{
    std::vector<char> narrow(wcslen(typed) + 1);
    std::string text = Enc_FromUnicode(narrow.data(), typed);
    text.erase(std::remove_if(text.begin(), text.end(), [](unsigned char c) { return c <= 32; }),
               text.end());
    return {text, std::all_of(typed, typed + wcslen(typed), Fits)};
}

std::string Key_MisfitText()
{
    return std::string("The key includes characters that can't be stored in ") +
           Enc_Current()->name + ".";
}

NameVerdict Name_Check(const TypedKey &name)
{
    if (name.text.empty())
        return NAME_EMPTY;
    if (!name.fits)
        return NAME_MISFIT;
    if (Bib_HasBadKeyChars(name.text.c_str()))
        return NAME_BAD_CHARS;
    return Bib_IsName(name.text.c_str()) ? NAME_OK : NAME_UNWRITABLE;
}

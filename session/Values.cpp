// session/Values.cpp - what users type for a value: of a field, an abbreviation, a preamble, a
// search.
#include "session/Values.h"

#include <algorithm>
#include <cstdio>

#include "encoding/Encoding.h"
#include "store/BibStore.h"

std::string Value_Read(const std::wstring &typed, const EncodingRecord *encoding)
{
    std::string value = Enc_Encode(typed.c_str(), encoding);
    Enc_LogConversion(typed.c_str(), value.c_str());
    return value;
}

std::wstring Value_Show(const char *value, const EncodingRecord *encoding)
{
    std::wstring shown = Enc_Decode(value, encoding);
    std::replace(shown.begin(), shown.end(), L'\0', L'\xFFFD');
    return shown;
}

// --- Checking ---

static size_t FindMark(const std::string &value, size_t at)
{
    static const char marks[] = {BIB_OPEN_ABBREVIATION, BIB_CLOSE_ABBREVIATION, 0};
    return value.find_first_of(marks, at);
}

bool Value_HasBadMarks(const std::string &value)
{
    for (size_t open = FindMark(value, 0); open != value.npos;) {
        size_t close = FindMark(value, open + 1);
        bool isPair = close != value.npos && value[open] == BIB_OPEN_ABBREVIATION &&
                      value[close] == BIB_CLOSE_ABBREVIATION;
        if (!isPair || !Bib_IsName(value.substr(open + 1, close - open - 1).c_str()))
            return true;
        open = FindMark(value, close + 1);
    }
    return false;
}

// --- Losses ---

static bool IsMark(char c)
{
    return c == BIB_OPEN_ABBREVIATION || c == BIB_CLOSE_ABBREVIATION;
}

static bool IsGuillemet(wchar_t c)
{
    return c == ENC_SHOWN_OPEN || c == ENC_SHOWN_CLOSE;
}

static bool HoldsGuillemets(const std::wstring &text)
{
    return std::any_of(text.begin(), text.end(), IsGuillemet);
}

// A mark is not in the encoding, only shown as one.
bool Value_HoldsGuillemets(const char *value, const EncodingRecord *encoding)
{
    std::string text = value;
    text.erase(std::remove_if(text.begin(), text.end(), IsMark), text.end());
    return HoldsGuillemets(Enc_Decode(text.c_str(), encoding));
}

// The characters that would not come back, each once, in their order.
static std::u32string LostCharacters(const std::wstring &text, const EncodingRecord *encoding)
{
    std::u32string lost;
    for (const wchar_t *at = text.data(), *end = at + text.size(); at < end;) {
        char32_t c = Enc_NextWide(&at);
        if (!Enc_Holds(c, encoding) && lost.find(c) == lost.npos)
            lost += c;
    }
    return lost;
}

static std::wstring Text(char32_t c)
{
    std::wstring text;
    Enc_AppendWide(&text, c);
    return text;
}

static std::wstring Visible(char32_t c)
{
    bool isControl = c < 32 || (c >= 127 && c < 160);
    if (!isControl)
        return Text(c);
    char name[16];
    int length = snprintf(name, sizeof name, "U+%04X", static_cast<unsigned>(c));
    return std::wstring(name, name + length);
}

// The first twenty, with blanks between.
static std::wstring ListCharacters(const std::u32string &characters)
{
    static const size_t most = 20;
    std::wstring list;
    for (size_t i = 0; i < characters.size() && i < most; ++i)
        list += (i > 0 ? L" " : L"") + Visible(characters[i]);
    return characters.size() > most ? list + L" ..." : list;
}

// What the store makes of it.
static std::wstring Stored(char32_t c, const EncodingRecord *encoding)
{
    return Enc_Decode(Enc_Encode(Text(c).c_str(), encoding).c_str(), encoding);
}

// The characters of the text that stand for other bytes of the stored value than they will become.
// Guillemets are a case of their own: the only one in UTF-8.
static std::u32string ReplacedCharacters(const std::wstring &text, const std::string &stored,
                                         const EncodingRecord *encoding)
{
    std::u32string replaced;
    if (encoding == &EncodingUtf8)
        return replaced;
    std::wstring shown = Enc_Decode(stored.c_str(), encoding);
    std::string back = Enc_Encode(shown.c_str(), encoding);
    for (size_t i = 0; i < stored.size() && i < back.size(); ++i) {
        wchar_t c = shown[i];
        if (back[i] != stored[i] && !IsGuillemet(c) && text.find(c) != text.npos &&
            replaced.find(c) == replaced.npos)
            replaced += c;
    }
    return replaced;
}

static std::wstring Label(const EncodingRecord *encoding)
{
    return Enc_Decode(Enc_Label(encoding), encoding);
}

std::wstring Value_LostText(const std::wstring &name, const std::wstring &text,
                            const EncodingRecord *encoding)
{
    std::u32string lost = LostCharacters(text, encoding);
    if (lost.empty())
        return L"";
    return L"`" + name + L"': " + ListCharacters(lost) + L" can't be stored in " + Label(encoding) +
           L" and would become " + Stored(lost[0], encoding) + L".\n";
}

std::wstring Value_ReplacedText(const std::wstring &name, const std::wstring &text,
                                const std::string &stored, const EncodingRecord *encoding)
{
    std::u32string replaced = ReplacedCharacters(text, stored, encoding);
    if (replaced.empty())
        return L"";
    return L"`" + name + L"': " + Label(encoding) + L" shows bytes of the old value as " +
           ListCharacters(replaced) + L", and they would become just that.\n";
}

std::wstring Value_GuillemetText(const std::wstring &name, const std::wstring &text)
{
    if (!HoldsGuillemets(text))
        return L"";
    return L"`" + name + L"': \xAB and \xBB will mark an abbreviation, not stand as text.\n";
}

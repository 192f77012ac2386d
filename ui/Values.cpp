#include "ui/Values.h"

#include <algorithm>
#include <cstring>
#include <cwchar>

#include "encoding/Encoding.h"
#include "store/BibStore.h"

const wchar_t Value_LossesQuestion[] = L"\nDo you want to accept these changes anyway ?";

std::string Value_Read(const std::wstring &typed)
{
    std::string value(typed.size() + 1, 0);
    value.resize(strlen(Enc_FromUnicode(value.data(), typed.c_str())));
    return value;
}

// --- Checking ---

static bool HasReadableNames(const std::string &value)
{
    for (size_t open = value.find(BIB_OPEN_ABBREVIATION); open != value.npos;
         open = value.find(BIB_OPEN_ABBREVIATION, open + 1)) {
        size_t close = value.find(BIB_CLOSE_ABBREVIATION, open);
        if (!Bib_IsName(value.substr(open + 1, close - open - 1).c_str()))
            return false;
    }
    return true;
}

const char *Value_Check(const char *value)
{
    const char *reason = Bib_CheckValue(value);
    if (!reason && !HasReadableNames(value))
        reason = "The name of an abbreviation is missing, begins with a digit, or holds a "
                 "backslash or a control character";
    return reason;
}

// --- Losses ---

static bool IsGuillemet(uint32_t c)
{
    return c == 0xAB || c == 0xBB;
}

static bool HoldsGuillemets(const std::wstring &text)
{
    return std::any_of(text.begin(), text.end(),
                       [](wchar_t c) { return IsGuillemet(static_cast<uint32_t>(c)); });
}

// A mark is not in the code page, only shown as one.
bool Value_HoldsGuillemets(const char *value)
{
    const uint32_t *map = Enc_Current()->map;
    return std::any_of(value, value + strlen(value),
                       [map](char c) { return IsGuillemet(map[static_cast<unsigned char>(c)]); });
}

// The characters that would not come back, each once, in their order.
static std::wstring LostCharacters(const std::wstring &text)
{
    std::wstring lost;
    for (wchar_t c : text)
        if (!Enc_Holds(c) && lost.find(c) == lost.npos)
            lost += c;
    return lost;
}

static std::wstring Visible(wchar_t c)
{
    bool isControl = c < 32 || (c >= 127 && c < 160);
    if (!isControl)
        return std::wstring(1, c);
    wchar_t name[16];
    swprintf(name, sizeof name / sizeof *name, L"U+%04X", static_cast<unsigned>(c));
    return name;
}

// The first twenty, with blanks between.
static std::wstring ListCharacters(const std::wstring &characters)
{
    static const size_t most = 20;
    std::wstring list;
    for (size_t i = 0; i < characters.size() && i < most; ++i)
        list += (i > 0 ? L" " : L"") + Visible(characters[i]);
    return characters.size() > most ? list + L" ..." : list;
}

// What the store makes of it.
static std::wstring Stored(wchar_t c)
{
    const wchar_t character[] = {c, 0};
    char byte[2];
    std::wstring stored;
    return Enc_ToUnicode(stored, Enc_FromUnicode(byte, character));
}

std::wstring Value_Losses(const std::wstring &name, const std::wstring &text, bool textGuillemets)
{
    std::wstring page, losses;
    Enc_ToUnicode(page, Enc_Current()->name);
    std::wstring lost = LostCharacters(text);
    if (!lost.empty())
        losses += L"`" + name + L"': " + ListCharacters(lost) + L" can't be stored in " + page +
                  L" and would become " + Stored(lost[0]) + L".\n";
    if (textGuillemets && HoldsGuillemets(text))
        losses += L"`" + name + L"': \xAB and \xBB will mark an abbreviation, not stand as text.\n";
    return losses;
}

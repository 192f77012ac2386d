#include "ui/Keys.h"

#include <algorithm>
#include <cwchar>
#include <vector>

#include "encoding/Encoding.h"

std::string Key_Typed(const wchar_t *typed)
{
    std::vector<char> narrow(wcslen(typed) + 1);
    std::string key = Enc_FromUnicode(narrow.data(), typed);
    key.erase(std::remove_if(key.begin(), key.end(), [](unsigned char c) { return c <= 32; }),
              key.end());
    return key;
}

std::string Key_Misfit(const wchar_t *typed)
{
    auto fits = [](wchar_t c) { return c <= 32 || (Enc_Holds(c) && c != L'\xAB' && c != L'\xBB'); };
    if (std::all_of(typed, typed + wcslen(typed), fits))
        return "";
    return std::string("The key includes characters that can't be stored in ") +
           Enc_Current()->name + ".";
}

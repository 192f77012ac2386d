// store/BibCheck.cpp - what a value and a key may hold.

#include "store/BibStore.h"

#include <cstring>

static int IsKeyChar(char c) // of those that no key may hold
{
    return c != 0 && strchr("\"#%'(),={} ", c) != nullptr;
}

const char *Bib_CheckValue(const char *value)
{
    int abbreviations = 0;
    int braces = 0;
    for (; *value; ++value) {
        if (*value == BIB_OPEN_ABBREVIATION) {
            if (abbreviations > 0)
                return "Recursive Abbreviation is imposible";
            if (braces > 0)
                return "Abbreviation can't be appeared inside braces";
            abbreviations = 1;
        } else if (*value == BIB_CLOSE_ABBREVIATION) {
            if (abbreviations == 0)
                return "Closing Abbreviation without an opening";
            --abbreviations;
        } else if (abbreviations > 0) {
            if (IsKeyChar(*value))
                return "Invalid char in abbreviation";
        } else if (*value == '{') {
            ++braces;
        } else if (*value == '}') {
            if (braces == 0)
                return "Unbalanced braces (extra `}')";
            --braces;
        }
    }
    if (abbreviations > 0)
        return "Unclosed abbreviation";
    if (braces > 0)
        return "Unbalanced braces (too few closing braces)";
    if (braces < 0)
        return "Unbalanced braces (extra closing braces)";
    return nullptr;
}

int Bib_StripKeyChars(char *key)
{
    char *out = key;
    for (; *key; ++key)
        if (!IsKeyChar(*key))
            *out++ = *key;
    *out = 0;
    return 1;
}

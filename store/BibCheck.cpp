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
                return "Recursive Abbreviation is imposible"; // misspelt, stands so
            if (braces > 0)
                return "Abbreviation can't be appeared inside braces"; // stands so
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

int Bib_HasBadKeyChars(const char *key)
{
    while (*key && !IsKeyChar(*key))
        ++key;
    return *key != 0;
}

static int IsReadable(char c) // as a part of a key
{
    int isControl = (c >= 0 && c < 32) || c == 127;
    return !isControl && c != '\\' && !IsKeyChar(c);
}

int Bib_IsKey(const char *key)
{
    if (!*key)
        return 0;
    while (*key && IsReadable(*key))
        ++key;
    return *key == 0;
}

int Bib_IsName(const char *name)
{
    int startsWithDigit = *name >= '0' && *name <= '9';
    return !startsWithDigit && Bib_IsKey(name);
}

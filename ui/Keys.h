// ui/Keys.h - what users type for the key of an entry or the name of a field.
#pragma once

#include <string>

struct TypedKey {
    std::string text; // store text, without characters of code 32 and below
    bool fits;        // false: `text` lacks guillemets, which mark abbreviations, or has other
                      // characters for those that the code page lacks
};
TypedKey Key_Read(const wchar_t *typed);

std::string Key_MisfitText(); // what to say of a key that does not fit; store text

// ui/Keys.h - what users type for the key of an entry or the name of a field.
#pragma once

#include <string>

// As store text, without characters of code 32 and below.
std::string Key_Typed(const wchar_t *typed);

// What to say of characters that a key can't have in the code page (store text): Key_Typed would
// drop guillemets, which mark abbreviations, and have other characters for those that the page
// lacks.
// "" when there are none.
std::string Key_Misfit(const wchar_t *typed);

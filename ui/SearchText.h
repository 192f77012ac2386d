// ui/SearchText.h - the text of the search field, as the entries of one file are searched for it.
#pragma once

#include <string>

#include "store/BibStore.h"

struct SearchText {
    bool isEmpty;          // every entry is found
    bool isForeign;        // none is: the file's encoding lacks a character
    std::string bytes;     // in the file's encoding
    std::u32string folded; // the same for Enc_Utf8Contains; empty when bytes will do
};

// `text` is in the selected encoding (Enc_Current); null counts as "".
SearchText Search_For(const char *text, const BibFile *file);

// True when a value of the entry contains the text, ignoring case: of all letters in UTF-8 (an
// ASCII text finds ASCII letters only), else of the ASCII letters. In UTF-8, guillemets in the text
// find marks of abbreviations and such that are text.
bool Search_Finds(const SearchText *search, const BibEntry *entry);

// ui/SearchText.cpp - the text of the search field, as the entries of one file are searched for it.
#include "ui/SearchText.h"

#include <algorithm>

#include "encoding/Encoding.h"

SearchText Search_For(const char *text, const BibFile *file)
{
    SearchText search = {};
    search.isEmpty = !text || !*text;
    if (search.isEmpty)
        return search;
    const EncodingRecord *from = Enc_Current(), *to = Bib_Encoding(file);
    search.isForeign = !Enc_TryRecode(text, from, to, &search.bytes);
    if (Enc_NeedsFolding(search.bytes.c_str(), to))
        search.folded = Enc_FoldUtf8(search.bytes.c_str());
    return search;
}

static bool Contains(const BibEntry *entry, const std::u32string &folded)
{
    return std::any_of(
        entry->fields, entry->fields + entry->fieldCount,
        [&folded](const BibField &field) { return Enc_Utf8Contains(field.value, folded) != 0; });
}

bool Search_Finds(const SearchText *search, const BibEntry *entry)
{
    if (search->isEmpty || search->isForeign)
        return search->isEmpty;
    if (!search->folded.empty())
        return Contains(entry, search->folded);
    return Bib_EntryContains(entry, search->bytes.c_str()) != 0;
}

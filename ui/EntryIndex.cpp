// ui/EntryIndex.cpp - the rows of the entry list and the search while typing.
#include "ui/EntryIndex.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include "base/Ascii.h"
#include "encoding/Encoding.h"
#include "ui/SearchText.h"

// --- Rows ---

static size_t CountEntries(BibFile *const *files, int fileCount)
{
    size_t count = 0;
    for (int i = 0; i < fileCount; ++i)
        for (const BibEntry *entry = files[i]->entries; entry != nullptr; entry = entry->next)
            ++count;
    return count;
}

static const char *SortKey(const char *key)
{
    return *key == '\\' || *key == '{' ? key + 1 : key;
}

int EntryIndex_CompareKeys(const char *a, const char *b)
{
    return Ascii_Compare(SortKey(a), SortKey(b));
}

static int CompareItems(const void *a, const void *b)
{
    return EntryIndex_CompareKeys(static_cast<const IndexItem *>(a)->entry->key,
                                  static_cast<const IndexItem *>(b)->entry->key);
}

int EntryIndex_Build(IndexItem **index, BibFile *const *files, int fileCount, const char *filter)
{
    size_t room = CountEntries(files, fileCount);
    *index = static_cast<IndexItem *>(Bib_Alloc((room > 0 ? room : 1) * sizeof(IndexItem)));
    if (*index == nullptr)
        return 0;
    int count = 0;
    for (int i = 0; i < fileCount; ++i) {
        SearchText search = Search_For(filter, files[i]);
        for (BibEntry *entry = files[i]->entries; entry != nullptr; entry = entry->next)
            if (Search_Finds(&search, entry))
                (*index)[count++] = {entry, i};
    }
    qsort(*index, count, sizeof(IndexItem), CompareItems);
    return count;
}

int EntryIndex_Find(const IndexItem *index, int count, const BibEntry *entry)
{
    for (int row = 0; row < count; ++row)
        if (index[row].entry == entry)
            return row;
    return -1;
}

int EntryIndex_RowToSelect(const IndexItem *index, int count, const BibEntry *select)
{
    if (count <= 0)
        return -1;
    int row = select == nullptr ? -1 : EntryIndex_Find(index, count, select);
    return row < 0 ? 0 : row;
}

// A file that is listed twice has two rows for each entry.
BibEntry *EntryIndex_Next(const IndexItem *index, int count, int row)
{
    for (int i = row + 1; i < count; ++i)
        if (index[i].entry != index[row].entry)
            return index[i].entry;
    for (int i = row - 1; i >= 0; --i)
        if (index[i].entry != index[row].entry)
            return index[i].entry;
    return nullptr;
}

// --- Row texts ---

// What stands in the parentheses: the file's name, or its number, which is written to `number`.
static const char *FileLabel(const IndexItem *item, BibFile *const *files, int fileCount,
                             char (&number)[16])
{
    if (files != nullptr && item->file >= 0 && item->file < fileCount)
        return files[item->file]->baseName;
    snprintf(number, sizeof number, "%d", item->file);
    return number;
}

std::string EntryIndex_RowText(const IndexItem *item, BibFile *const *files, int fileCount)
{
    char number[16];
    std::string text = item->entry->key;
    text += " (";
    text += FileLabel(item, files, fileCount, number);
    text += ")";
    return text;
}

// Steps `*rest` over what it has in common with `piece`. False when they differ before either ends.
static bool Accept(const char **rest, const char *piece)
{
    for (; **rest != 0 && *piece != 0; ++*rest, ++piece)
        if (Ascii_Lower(**rest) != Ascii_Lower(*piece))
            return false;
    return true;
}

// Whether the row's text begins with `prefix`. Works on the pieces of the text, because one key
// stroke may ask this of every row.
static bool RowBeginsWith(const IndexItem *item, BibFile *const *files, int fileCount,
                          const char *prefix)
{
    const char *rest = prefix;
    if (!Accept(&rest, item->entry->key))
        return false;
    if (*rest == 0)
        return true;
    char number[16];
    return Accept(&rest, " (") && Accept(&rest, FileLabel(item, files, fileCount, number)) &&
           Accept(&rest, ")") && *rest == 0;
}

// --- Type-ahead ---

static void StartOver(TypeAhead *state)
{
    state->prefix.clear();
    state->lastFound = -1;
}

// Whether a key carries on the search that the prefix stands for.
static bool Continues(const TypeAhead *state, uint32_t key, bool modified, int32_t now,
                      int selection)
{
    uint32_t passed = static_cast<uint32_t>(now) - static_cast<uint32_t>(state->lastKeyTime);
    return key != 0 && !modified && static_cast<int32_t>(passed) <= TYPE_AHEAD_PAUSE &&
           selection == state->lastFound;
}

static const EncodingRecord *EncodingOf(const IndexItem *item, BibFile *const *files, int fileCount)
{
    bool hasFile = files != nullptr && item->file >= 0 && item->file < fileCount;
    return hasFile ? Bib_Encoding(files[item->file]) : Enc_Current();
}

// The typed text in one encoding.
struct Prefix {
    const EncodingRecord *encoding;
    bool isForeign; // the encoding lacks a character
    std::string bytes;
    std::u32string folded; // of UTF-8, where bytes will not do
};

static Prefix PrefixIn(const wchar_t *text, const EncodingRecord *encoding)
{
    Prefix prefix = {encoding, false, Enc_Encode(text, encoding), {}};
    while (*text)
        prefix.isForeign |= !Enc_Holds(Enc_NextWide(&text), encoding);
    if (Enc_NeedsFolding(prefix.bytes.c_str(), encoding))
        prefix.folded = Enc_FoldUtf8(prefix.bytes.c_str());
    return prefix;
}

static bool RowBeginsWith(const IndexItem *item, BibFile *const *files, int fileCount,
                          const Prefix &prefix)
{
    if (prefix.isForeign)
        return false;
    if (prefix.folded.empty())
        return RowBeginsWith(item, files, fileCount, prefix.bytes.c_str());
    return Enc_Utf8BeginsWith(EntryIndex_RowText(item, files, fileCount).c_str(), prefix.folded);
}

static int FindByPrefix(const wchar_t *prefix, const IndexItem *index, int count,
                        BibFile *const *files, int fileCount)
{
    Prefix known = {};
    for (int row = 0; row < count; ++row) {
        const EncodingRecord *encoding = EncodingOf(&index[row], files, fileCount);
        if (encoding != known.encoding)
            known = PrefixIn(prefix, encoding);
        if (RowBeginsWith(&index[row], files, fileCount, known))
            return row;
    }
    return -1;
}

static int CountCharacters(const wchar_t *text)
{
    int count = 0;
    for (; *text; Enc_NextWide(&text))
        ++count;
    return count;
}

TypeAheadVerdict TypeAhead_Key(TypeAhead *state, uint32_t key, bool modified, int32_t now,
                               int selection, const IndexItem *index, int count,
                               BibFile *const *files, int fileCount)
{
    if (!state->prefix.empty() && !Continues(state, key, modified, now, selection))
        StartOver(state);
    if (key == 0 || modified)
        return TYPE_AHEAD_SKIP;
    if (CountCharacters(state->prefix.c_str()) >= TYPE_AHEAD_LIMIT)
        StartOver(state);
    state->lastKeyTime = now;

    size_t length = state->prefix.size();
    Enc_AppendWide(&state->prefix, key);
    int row = FindByPrefix(state->prefix.c_str(), index, count, files, fileCount);
    if (row < 0) {
        state->prefix.resize(length);
        return TYPE_AHEAD_NO_ROW;
    }
    state->lastFound = row;
    return TYPE_AHEAD_ROW;
}

// tests/entry_index_test.cpp - rows of the entry list and the search while typing.
#include "ui/EntryIndex.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "encoding/Encoding.h"

namespace
{

char *Copy(const char *text)
{
    return Bib_CopyText(text, strlen(text));
}

class EntryIndex : public ::testing::Test
{
protected:
    ~EntryIndex() override
    {
        free(index);
        for (BibFile *file : files)
            Bib_FreeFile(file);
    }

    int AddFile(const char *baseName)
    {
        BibFile *file = static_cast<BibFile *>(calloc(1, sizeof(BibFile)));
        file->path = Copy(baseName);
        file->baseName = Copy(baseName);
        files.push_back(file);
        return static_cast<int>(files.size()) - 1;
    }

    // At the end of the file's list; with one field when there is a value.
    BibEntry *Add(int file, const char *key, const char *value = nullptr)
    {
        BibEntry *entry = Bib_AllocEntry(value ? 1 : 0);
        entry->key = Copy(key);
        if (value)
            entry->fields[0].value = Copy(value);
        BibEntry **end = &files[file]->entries;
        while (*end)
            end = &(*end)->next;
        *end = entry;
        return entry;
    }

    int FileCount() const { return static_cast<int>(files.size()); }

    void Build(const char *filter = nullptr)
    {
        free(index);
        count = EntryIndex_Build(&index, files.data(), FileCount(), filter);
    }

    std::string Text(int row) const
    {
        return EntryIndex_RowText(&index[row], files.data(), FileCount());
    }

    std::vector<std::string> Texts() const
    {
        std::vector<std::string> texts;
        for (int row = 0; row < count; ++row)
            texts.push_back(Text(row));
        return texts;
    }

    std::vector<BibFile *> files;
    IndexItem *index = nullptr;
    int count = 0;
};

using Rows = std::vector<std::string>;

} // namespace

// --- Rows ---

TEST_F(EntryIndex, HasOneRowPerEntryOfAllFilesSortedByKey)
{
    int refs = AddFile("refs");
    int more = AddFile("more");
    Add(refs, "knuth84");
    Add(refs, "adams79");
    Add(more, "griske84");
    Build();
    EXPECT_EQ((Rows{"adams79 (refs)", "griske84 (more)", "knuth84 (refs)"}), Texts());
    EXPECT_EQ(more, index[1].file);
}

TEST_F(EntryIndex, IsAnEmptyArrayWithoutFiles)
{
    EXPECT_EQ(0, EntryIndex_Build(&index, nullptr, 0, ""));
    EXPECT_NE(nullptr, index);
}

TEST_F(EntryIndex, IsEmptyWhenTheFilterMatchesNothing)
{
    Add(AddFile("refs"), "knuth84", "The TeXbook");
    Build("lisp");
    EXPECT_EQ(0, count);
    EXPECT_NE(nullptr, index);
    EXPECT_EQ(-1, EntryIndex_RowToSelect(index, count, files[0]->entries));
}

TEST_F(EntryIndex, KeepsTheEntriesWithAValueThatContainsTheFilterInAnyCase)
{
    int refs = AddFile("refs");
    Add(refs, "a", "The TeXbook");
    Add(refs, "b", "Common Lisp");
    Add(refs, "c", "More on TEXTS");
    Build("tEx");
    EXPECT_EQ((Rows{"a (refs)", "c (refs)"}), Texts());
}

TEST_F(EntryIndex, FiltersByValuesAndNotByKeys)
{
    Add(AddFile("refs"), "texbook", "A title");
    Build("texbook");
    EXPECT_EQ(0, count);
}

TEST_F(EntryIndex, DropsEntriesWithoutFieldsWhenFiltered)
{
    Add(AddFile("refs"), "bare");
    Build("");
    EXPECT_EQ(1, count);
    Build("b");
    EXPECT_EQ(0, count);
}

TEST_F(EntryIndex, SortsKeysWithALeadingBackslashOrBraceNextToTheirLetters)
{
    int refs = AddFile("refs");
    Add(refs, "abd");
    Add(refs, "{abc}");
    Add(refs, "aba");
    Add(refs, "\\Abc");
    Build();
    // "abc" comes before "abc}", "Abc" is as good as "abc".
    EXPECT_EQ((Rows{"aba (refs)", "\\Abc (refs)", "{abc} (refs)", "abd (refs)"}), Texts());
}

TEST_F(EntryIndex, ShowsEqualKeysOfTwoFilesAsTwoRows)
{
    Add(AddFile("refs"), "knuth84");
    Add(AddFile("more"), "Knuth84");
    Build();
    ASSERT_EQ(2, count);
    EXPECT_NE(index[0].entry, index[1].entry);
    EXPECT_EQ(1, index[0].file + index[1].file);
}

TEST_F(EntryIndex, NumbersTheFileInARowWhenThereAreNoFiles)
{
    AddFile("refs");
    Add(AddFile("more"), "knuth84");
    Build();
    EXPECT_EQ("knuth84 (1)", EntryIndex_RowText(&index[0], nullptr, 0));
    EXPECT_EQ("knuth84 (1)", EntryIndex_RowText(&index[0], files.data(), 1));
}

TEST(EntryIndexCompareKeys, IgnoresTheCaseOfAsciiLettersOnly)
{
    EXPECT_EQ(0, EntryIndex_CompareKeys("Knuth84", "kNUTH84"));
    EXPECT_NE(0, EntryIndex_CompareKeys("\xC4", "\xE4"));
    EXPECT_LT(EntryIndex_CompareKeys("z", "\xE4"), 0); // bytes are unsigned
}

TEST(EntryIndexCompareKeys, FoldsToLowerCase)
{
    EXPECT_LT(EntryIndex_CompareKeys("_", "A"), 0);
}

TEST(EntryIndexCompareKeys, SkipsOneLeadingCharacterOnly)
{
    EXPECT_EQ(0, EntryIndex_CompareKeys("{abc", "\\ABC"));
    EXPECT_NE(0, EntryIndex_CompareKeys("{{abc", "abc"));
    EXPECT_GT(EntryIndex_CompareKeys("{{abc", "{abc"), 0);
    EXPECT_EQ(0, EntryIndex_CompareKeys("{", ""));
}

TEST_F(EntryIndex, FindsTheFirstRowOfAnEntry)
{
    int refs = AddFile("refs");
    Add(refs, "b");
    BibEntry *second = Add(refs, "a");
    Build();
    EXPECT_EQ(0, EntryIndex_Find(index, count, second));
    EXPECT_EQ(-1, EntryIndex_Find(index, count, nullptr));
    files.push_back(files[0]); // one record listed twice
    Build();
    EXPECT_EQ(4, count);
    EXPECT_EQ(0, EntryIndex_Find(index, count, second));
    files.pop_back();
}

TEST_F(EntryIndex, SelectsANewEntryThatPassesTheFilter)
{
    int refs = AddFile("refs");
    Add(refs, "a", "TeX");
    BibEntry *added = Add(refs, "b", "tex too");
    Build("tex");
    EXPECT_EQ(1, EntryIndex_RowToSelect(index, count, added));
}

TEST_F(EntryIndex, SelectsTheFirstRowWhenTheNewEntryIsFilteredOut)
{
    int refs = AddFile("refs");
    Add(refs, "b", "TeX");
    BibEntry *added = Add(refs, "a", "Lisp");
    Build("tex");
    EXPECT_EQ(0, EntryIndex_RowToSelect(index, count, added));
    EXPECT_EQ(0, EntryIndex_RowToSelect(index, count, nullptr));
}

TEST_F(EntryIndex, SortsAHundredThousandEntries)
{
    int refs = AddFile("refs");
    for (int i = 0; i < 100000; ++i) {
        BibEntry *entry = Bib_AllocEntry(0);
        char key[32];
        snprintf(key, sizeof key, "%ckey%05d", i % 3 ? 'K' : '{', (i * 7919) % 100000);
        entry->key = Copy(key);
        entry->next = files[refs]->entries;
        files[refs]->entries = entry;
    }
    Build();
    ASSERT_EQ(100000, count);
    for (int row = 1; row < count; ++row)
        ASSERT_LE(EntryIndex_CompareKeys(index[row - 1].entry->key, index[row].entry->key), 0);
}

// --- Type-ahead ---

namespace
{

// Types as a window would: a found row becomes the selection.
class TypeAheadKey : public EntryIndex
{
protected:
    void SetUp() override
    {
        int refs = AddFile("refs");
        for (const char *key : {"adams79", "Knuth84", "knox90", "kant", "zeta"})
            Add(refs, key);
        Build(); // adams79, kant, knox90, Knuth84, zeta
    }

    // Adds a key to the file in UTF-8, and one in a file that is in a code page.
    void BuildInTwoEncodings(const char *utf8, const char *page)
    {
        Enc_Select("CP65001");
        int other = AddFile("other");
        files[other]->form = BIB_FORM_CODE_PAGE;
        Add(0, utf8);
        Add(other, page);
        Build();
    }

    TypeAheadVerdict Press(uint32_t key, int32_t passed = 10, bool modified = false)
    {
        now = static_cast<int32_t>(static_cast<uint32_t>(now) + static_cast<uint32_t>(passed));
        TypeAheadVerdict verdict = TypeAhead_Key(&state, key, modified, now, selection, index,
                                                 count, files.data(), FileCount());
        if (verdict == TYPE_AHEAD_ROW)
            selection = state.lastFound;
        return verdict;
    }

    TypeAheadVerdict Type(const char *text)
    {
        TypeAheadVerdict verdict = TYPE_AHEAD_SKIP;
        for (; *text; ++text)
            verdict = Press(static_cast<unsigned char>(*text));
        return verdict;
    }

    std::string Selected() const { return selection < 0 ? "" : index[selection].entry->key; }

    TypeAhead state;
    int32_t now = 5000;
    int selection = 0;
};

} // namespace

TEST_F(TypeAheadKey, SelectsTheFirstRowThatBeginsWithTheLetters)
{
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("k"));
    EXPECT_EQ("kant", Selected());
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("n"));
    EXPECT_EQ("knox90", Selected());
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("u"));
    EXPECT_EQ("Knuth84", Selected());
    EXPECT_EQ(L"knu", state.prefix);
}

TEST_F(TypeAheadKey, IgnoresLetterCase)
{
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("KNU"));
    EXPECT_EQ("Knuth84", Selected());
}

TEST_F(TypeAheadKey, StartsOverAfterMoreThanASecond)
{
    Type("k");
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('z', 1001));
    EXPECT_EQ(L"z", state.prefix);
    EXPECT_EQ("zeta", Selected());
}

TEST_F(TypeAheadKey, GoesOnAfterExactlyASecond)
{
    Type("k");
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('n', 1000));
    EXPECT_EQ(L"kn", state.prefix);
}

TEST_F(TypeAheadKey, GoesOnWhenTheClockWrapsAround)
{
    now = INT32_MAX - 15;
    Type("k");
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('n', 100));
    EXPECT_LT(now, 0);
    EXPECT_EQ(L"kn", state.prefix);
}

TEST_F(TypeAheadKey, GoesOnWhenTheClockStepsBack)
{
    Type("k");
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('n', -3000));
    EXPECT_EQ(L"kn", state.prefix);
}

TEST_F(TypeAheadKey, LeavesSelectionAndPrefixWhenNothingMatches)
{
    Type("kn");
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Type("x"));
    EXPECT_EQ("knox90", Selected());
    EXPECT_EQ(L"kn", state.prefix);
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("u"));
    EXPECT_EQ("Knuth84", Selected());
}

TEST_F(TypeAheadKey, CountsTheLetterThatMatchedNothingAsTheLastOne)
{
    Type("k");
    Press('x', 900);
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('n', 900));
    EXPECT_EQ(L"kn", state.prefix);
}

TEST_F(TypeAheadKey, HasNoRowForAFirstLetterThatMatchesNothing)
{
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Type("x"));
    EXPECT_EQ(L"", state.prefix);
    EXPECT_EQ(-1, state.lastFound);
    EXPECT_EQ(0, selection);
}

TEST_F(TypeAheadKey, StartsOverWhenAnotherRowWasClicked)
{
    Type("k");
    selection = 0;
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("z"));
    EXPECT_EQ(L"z", state.prefix);
}

TEST_F(TypeAheadKey, SkipsAKeyWithoutACharacterAndStartsOver)
{
    Type("k");
    EXPECT_EQ(TYPE_AHEAD_SKIP, Press(0));
    EXPECT_EQ(L"", state.prefix);
    EXPECT_EQ(-1, state.lastFound);
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("z"));
}

TEST_F(TypeAheadKey, SkipsAModifiedKeyAndStartsOver)
{
    Type("k");
    int32_t time = state.lastKeyTime;
    EXPECT_EQ(TYPE_AHEAD_SKIP, Press('n', 10, true));
    EXPECT_EQ(L"", state.prefix);
    EXPECT_EQ(-1, state.lastFound);
    EXPECT_EQ(time, state.lastKeyTime);
}

TEST_F(TypeAheadKey, TakesBackspaceAsACharacterThatMatchesNothing)
{
    Type("kn");
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(8));
    EXPECT_EQ(L"kn", state.prefix);
}

TEST_F(TypeAheadKey, RunsOnIntoTheFileName)
{
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("kant (RE"));
    EXPECT_EQ("kant", Selected());
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("fs)"));
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Type("x"));
    EXPECT_EQ(L"kant (REfs)", state.prefix);
}

TEST_F(TypeAheadKey, TellsRowsApartByTheFileName)
{
    Add(AddFile("more"), "kant");
    Build();
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("kant (m"));
    EXPECT_EQ("kant (more)", Text(selection));
}

TEST_F(TypeAheadKey, RunsOnIntoTheNumberWithoutFiles)
{
    TypeAheadVerdict verdict = TYPE_AHEAD_SKIP;
    for (const char *c = "kant (0)"; *c; ++c) {
        verdict = TypeAhead_Key(&state, *c, false, now, selection, index, count, nullptr, 0);
        selection = state.lastFound;
    }
    EXPECT_EQ(TYPE_AHEAD_ROW, verdict);
    EXPECT_EQ(L"kant (0)", state.prefix);
}

TEST_F(TypeAheadKey, DoesNotSkipTheBackslashThatTheOrderSkips)
{
    Add(0, "\\Mbc");
    Build();
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Type("m"));
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("\\mb"));
    EXPECT_EQ("\\Mbc", Selected());
}

TEST_F(TypeAheadKey, RestartsThePrefixWithTheThirtyFirstLetter)
{
    Add(0, "mmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmm");
    Build();
    for (int i = 0; i < 30; ++i)
        ASSERT_EQ(TYPE_AHEAD_ROW, Press('m'));
    EXPECT_EQ(30u, state.prefix.size());
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('m'));
    EXPECT_EQ(L"m", state.prefix);
}

TEST_F(TypeAheadKey, ForgetsTheRowWhenTheThirtyFirstLetterMatchesNothing)
{
    Add(0, "mmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmmm");
    Build();
    for (int i = 0; i < 30; ++i)
        Press('m');
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press('x'));
    EXPECT_EQ(L"", state.prefix);
    EXPECT_EQ(-1, state.lastFound);
}

TEST_F(TypeAheadKey, HasNoRowInAnEmptyList)
{
    Build("nothing has values");
    selection = -1;
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Type("k"));
    EXPECT_EQ(-1, state.lastFound);
}

TEST_F(TypeAheadKey, ComparesTypedLettersInTheSelectedCodePage)
{
    Enc_Select("CP1251");
    Add(0, "\xE6\xF3\xEA"); // zhuk, in small letters
    Build();
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(0x0436));
    EXPECT_EQ("\xE6\xF3\xEA", Selected());
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(0x0443));
    EXPECT_EQ(L"\u0436\u0443", state.prefix);
}

TEST_F(TypeAheadKey, MatchesNothingForACharacterThatTheCodePageLacks)
{
    Enc_Select("CP1252");
    Add(0, "\xFF");
    Add(0, "6"); // the low byte of U+0436
    Build();
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(0x0436));
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(0x1F600));
    EXPECT_EQ(L"", state.prefix);
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(0xFF)); // y with diaeresis is byte 0xFF
    EXPECT_EQ("\xFF", Selected());
}

TEST_F(TypeAheadKey, ComparesTypedLettersInTheEncodingOfEachFile)
{
    BuildInTwoEncodings("\xC3\xBC"
                        "ber",
                        "\xFC"
                        "bel");
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(0xFC));
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('b'));
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('e'));
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('l'));
    EXPECT_EQ("\xFC"
              "bel",
              Selected());
    EXPECT_EQ(L"\u00FCbel", state.prefix);
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(0x0436));
    state = {};
    for (uint32_t c : {0xFCu, uint32_t('b'), uint32_t('e'), uint32_t('R')})
        EXPECT_EQ(TYPE_AHEAD_ROW, Press(c));
    EXPECT_EQ("\xC3\xBC"
              "ber",
              Selected());
}

TEST_F(TypeAheadKey, IgnoresTheCaseOfAllLettersInUtf8)
{
    BuildInTwoEncodings("\xD0\x98"
                        "van2001",
                        "\xD6"
                        "rtel");
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(0x0438)); // in small letters
    EXPECT_EQ(TYPE_AHEAD_ROW, Type("VAN2001 (refs)"));
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Type("x"));
    state = {};
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(0xF6)); // the other file is in a code page
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(0xD6));
}

TEST(EntryIndexNext, IsTheOneBehindOrElseTheOneBefore)
{
    BibEntry a = {}, b = {}, c = {};
    const IndexItem index[] = {{&a, 0}, {&b, 0}, {&c, 0}};
    EXPECT_EQ(&b, EntryIndex_Next(index, 3, 0));
    EXPECT_EQ(&c, EntryIndex_Next(index, 3, 1));
    EXPECT_EQ(&b, EntryIndex_Next(index, 3, 2));
    EXPECT_EQ(nullptr, EntryIndex_Next(index, 1, 0));
}

TEST(EntryIndexNext, IsNotTheSameEntryInItsOtherRow)
{
    BibEntry a = {}, b = {};
    const IndexItem index[] = {{&a, 0}, {&a, 1}, {&b, 0}, {&b, 1}};
    EXPECT_EQ(&b, EntryIndex_Next(index, 4, 0));
    EXPECT_EQ(&a, EntryIndex_Next(index, 4, 2));
    EXPECT_EQ(nullptr, EntryIndex_Next(index, 2, 0));
}

// tests/known_strings_test.cpp - the abbreviations of files and lists.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tests/support/LoadedStrings.h"

using Lines = std::vector<std::string>;
using testing::ElementsAre;

class StringSourcesTest : public LoadedStrings
{
protected:
    // The source at a position of the choice.
    static int At(const StringSources &sources, int position)
    {
        return position - Strings_FirstFile(&sources);
    }

    Lines LinesAt(const StringSources &sources, int position)
    {
        Lines texts;
        for (const StringLine &line : Strings_Lines(&sources, At(sources, position)))
            texts.push_back(line.text);
        return texts;
    }

    Lines NamesIn(const BibFile *file)
    {
        Lines names;
        for (const BibString *string = file->strings; string; string = string->next)
            names.push_back(string->name);
        return names;
    }
};

static const char TwoLists[] = "[String]\nMonths = *Months\nno list\nOther = *Other\n"
                               "[*Months]\njan = January\nfeb=February\nstray line\n; note\n"
                               "[*Other]\nx = \"quoted\"\n";

// --- Sources ---

using StringsSources = StringSourcesTest;

TEST_F(StringsSources, AreTheListsOfTheIniFileThenAllFilesThenEachFile)
{
    Load("@string{a = {A}}\n");
    Load("@string{b = {B} # a}\n@string{c = 12}\n");
    StringSources sources = Read(TwoLists);
    EXPECT_THAT(sources.lists, ElementsAre("Months", "Other"));
    EXPECT_EQ(3, Strings_FirstFile(&sources));
    EXPECT_THAT(LinesAt(sources, 0), ElementsAre("jan = January", "feb = February", "stray line"));
    EXPECT_THAT(LinesAt(sources, 1), ElementsAre("x = \"quoted\""));
    EXPECT_THAT(LinesAt(sources, 2), ElementsAre("a = A", "b = B\2a\5", "c = 12"));
    EXPECT_THAT(LinesAt(sources, 3), ElementsAre("a = A"));
    EXPECT_THAT(LinesAt(sources, 4), ElementsAre("b = B\2a\5", "c = 12"));
}

TEST_F(StringsSources, HaveTheEncodingOfTheirFile)
{
    Enc_Select("CP65001");
    Load("@string{a = {\xC3\xBC}}\n");
    Load("@string{b = {\xFC}}\n@string{c = {C}}\n");
    StringSources sources = Read("[String]\nMonths = *Months\n[*Months]\nmar = M\xC3\xA4rz\n"
                                 "old = \xE4\n");
    auto encodings = [&](int position) {
        std::string list;
        for (const StringLine &line : Strings_Lines(&sources, At(sources, position)))
            list += std::string(Enc_Label(line.encoding)) + " ";
        return list;
    };
    EXPECT_EQ("UTF-8 CP1252 ", encodings(0));
    EXPECT_EQ("UTF-8 CP1252 CP1252 ", encodings(1));
    EXPECT_EQ("CP1252 CP1252 ", encodings(3));
}

TEST_F(StringsSources, NeedNoIniFile)
{
    StringSources sources = Strings_Sources(&set, "/no/such/file");
    EXPECT_TRUE(sources.lists.empty());
    EXPECT_EQ(1, Strings_FirstFile(&sources));
    EXPECT_THAT(Strings_Lines(&sources, STRINGS_OF_ALL_FILES), ElementsAre());
}

TEST_F(StringsSources, ReadNoMoreThanTheirBuffersTake)
{
    std::string ini = "[String]\nA = *A\n[*A]\n";
    for (int i = 0; i < 1000; ++i)
        ini += "k" + std::to_string(1000 + i) + "=v\n"; // 8 bytes with the end of each
    StringSources sources = Read(ini);
    EXPECT_EQ(512u, LinesAt(sources, 0).size()); // the last one is cut
    ini = "[String]\n";
    for (int i = 0; i < 1000; ++i)
        ini += "k" + std::to_string(1000 + i) + "=v\n";
    EXPECT_EQ(128u, Read(ini).lists.size());
    EXPECT_THAT(LinesAt(Read("[String]\nA = *" + std::string(63, 'x') + "\n[*" +
                             std::string(62, 'x') + "]\nk = v\n"),
                        0),
                ElementsAre("k = v"));
}

TEST_F(StringsSources, KnowTheNamesInAText)
{
    Enc_Select("CP65001");
    Load("@string{\xC3\xBC" // in UTF-8
         "x = {A}}\n");
    Load("@string{\xF6 = {B}}\n@string{Acm = {C}}\n");
    StringSources sources = Read("[String]\nOther = *Other\n[*Other]\njcp = J\n");
    auto unknown = [&](const wchar_t *text, const wchar_t *before) {
        std::wstring line = Strings_UnknownIn(&sources, L"a", text, before);
        size_t start = line.find(L'\xAB');
        return start == line.npos ? line : line.substr(start, line.find(L" is known") - start);
    };
    EXPECT_EQ(L"", unknown(L"", L""));
    EXPECT_EQ(L"",
              unknown(L"\u00AB\u00FCX\u00BB \u00AB\u00F6\u00BB \u00ABACM\u00BB \u00ABjcp\u00BB "
                      L"\u00ABDec\u00BB",
                      L""));
    EXPECT_EQ(L"\u00ABa\u00BB, \u00AB\u0416\u00BB",
              unknown(L"\u00ABa\u00BB\u00AB\u0416\u00BB \u00ABA\u00BB \u00ABd", L""));
    EXPECT_EQ(
        L"", unknown(L"\u00ABb c\u00BB \u00AB\u00BB \u00AB1\u00BB \u00AB\\\u00BB", L"")); // refused
    EXPECT_EQ(L"\u00ABb\u00BB", unknown(L"\u00ABa\u00BB\u00ABb\u00BB", L"x\u00ABa\u00BB"));
    EXPECT_EQ(L"\u00ABb\u00BB", unknown(L"\u00ABa \u00ABb\u00BB c\u00BB", L""));
    std::wstring many;
    for (wchar_t c = L'a'; c <= L'z'; ++c)
        many += L'\xAB' + std::wstring(100, c) + L'\xBB';
    EXPECT_LT(unknown(many.c_str(), L"").size(), 250u);
    EXPECT_EQ(L"", unknown(std::wstring(100000, L'\xAB').c_str(), L""));
}

TEST(StringsKeyOf, EndsAtTheFirstBlank)
{
    EXPECT_EQ("jan", Strings_KeyOf({"jan = January", Enc_Current()}));
    EXPECT_EQ("stray", Strings_KeyOf({"stray line", Enc_Current()}));
    EXPECT_EQ("alone", Strings_KeyOf({"alone", Enc_Current()}));
}

// --- One file's abbreviations ---

using StringKeys = StringSourcesTest;

TEST_F(StringKeys, AreTakenInTheSameFileInAnyCase)
{
    BibFile *file = Load("@string{Acm = {A}}\n");
    BibFile *other = Load("@string{other = {O}}\n");
    EXPECT_EQ(NAME_TAKEN, String_CheckNewKey(file, {"ACM", true}));
    EXPECT_EQ(NAME_OK, String_CheckNewKey(other, {"ACM", true}));
    EXPECT_EQ(NAME_OK, String_CheckNewKey(file, {"ac", true}));
}

TEST_F(StringKeys, HaveToBeReadable)
{
    BibFile *file = Load("");
    EXPECT_EQ(NAME_EMPTY, String_CheckNewKey(file, {"", true}));
    EXPECT_EQ(NAME_BAD_CHARS, String_CheckNewKey(file, {"a#b", true}));
    EXPECT_EQ(NAME_UNWRITABLE, String_CheckNewKey(file, {"1st", true}));
    EXPECT_EQ(NAME_MISFIT, String_CheckNewKey(file, {"\xFF", false}));
}

using StringList = StringSourcesTest;

TEST_F(StringList, FindsTheOneInARowAmongNamesakes)
{
    BibFile *file = Load("@string{a = {1}}\n@string{b = {2}}\n@string{A = {3}}\n");
    EXPECT_STREQ("1", String_Find(file, 0, "a")->value);
    EXPECT_STREQ("3", String_Find(file, 2, "a")->value);
    EXPECT_STREQ("1", String_Find(file, 1, "a")->value); // that row has another name
    EXPECT_STREQ("1", String_Find(file, 9, "a")->value);
    EXPECT_EQ(nullptr, String_Find(file, 0, "c"));
}

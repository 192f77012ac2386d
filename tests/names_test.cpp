// tests/names_test.cpp - typed keys and names.
#include <gtest/gtest.h>

#include "encoding/Encoding.h"
#include "session/Names.h"

static TypedName Read(const wchar_t *typed)
{
    return Name_Read(typed, Enc_Current());
}

TEST(KeyRead, LosesBlanksAndControlCharacters)
{
    EXPECT_EQ("mykey", Read(L" my key\t\n\x01").text);
    EXPECT_EQ("", Read(L" \t ").text);
    EXPECT_EQ("", Read(L"").text);
    EXPECT_EQ("a{b}", Read(L"a{b}").text);
    EXPECT_EQ("mark", Read(L"\u00ABmark\u00BB").text); // marks of abbreviations
}

TEST(KeyRead, IsTextOfTheCodePage)
{
    EXPECT_EQ("M\xFCller", Read(L"M\u00FCller").text);
    Enc_Select("CP1251");
    EXPECT_EQ("\xE4", Read(L"\u0434").text);
}

TEST(KeyRead, TellsWhatTheCodePageLacks)
{
    EXPECT_TRUE(Read(L"M\u00FCller \u00FF").fits);
    EXPECT_FALSE(Read(L"\u0141ukasz").fits);
    EXPECT_FALSE(Read(L"a\U0001F600").fits);
    EXPECT_EQ("The key includes characters that can't be stored in CP1252.",
              Name_MisfitText(Read(L"")));
    Enc_Select("CP1250");
    EXPECT_TRUE(Read(L"\u0141ukasz").fits);
    EXPECT_FALSE(Read(L"\u00FF").fits);
    EXPECT_EQ("The key includes characters that can't be stored in CP1250.",
              Name_MisfitText(Read(L"")));
}

TEST(KeyRead, FitsInUtf8WhateverItIs)
{
    TypedName key = Name_Read(L"\u0141ukasz \U0001F600", &EncodingUtf8);
    EXPECT_EQ("\xC5\x81ukasz\xF0\x9F\x98\x80", key.text);
    EXPECT_TRUE(key.fits);
    EXPECT_EQ(&EncodingUtf8, key.encoding);
    EXPECT_FALSE(Name_Read(L"a\u00AB", &EncodingUtf8).fits);
    EXPECT_EQ("The key includes guillemets, which mark abbreviations.", Name_MisfitText(key));
}

TEST(KeyRead, TellsOfGuillemets)
{
    EXPECT_FALSE(Read(L"my\u00AB1").fits);
    EXPECT_FALSE(Read(L"\u00BB").fits);
}

TEST(KeyRead, PassesOverWhatIsDroppedAnyway)
{
    EXPECT_TRUE(Read(L"a\t\x02 b").fits);
}

TEST(NameCheck, TellsWhatIsWrong)
{
    const struct {
        const char *key;
        NameVerdict verdict;
    } rows[] = {{"author", NAME_OK},     {"date-added", NAME_OK},  {"x_1", NAME_OK},
                {"", NAME_EMPTY},        {"1st", NAME_UNWRITABLE}, {"a\\b", NAME_UNWRITABLE},
                {"1{st", NAME_BAD_CHARS}};
    for (const auto &row : rows)
        EXPECT_EQ(row.verdict, Name_Check({row.key, true})) << row.key;
}

TEST(NameCheck, RefusesEveryForbiddenCharacter)
{
    for (char c : std::string("\"#%'(),={} "))
        EXPECT_EQ(NAME_BAD_CHARS, Name_Check({std::string("a") + c, true})) << c;
}

TEST(NameCheck, TellsOfCharactersThatTheCodePageLacksBeforeBadOnes)
{
    EXPECT_EQ(NAME_MISFIT, Name_Check({"\xFF"
                                       "anr",
                                       false}));
    EXPECT_EQ(NAME_EMPTY, Name_Check({"", false}));
    EXPECT_EQ(NAME_MISFIT, Name_Check({"\xFF{", false}));
}

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "encoding/Encoding.h"
#include "ui/Values.h"

TEST(ValueRead, MakesStoreTextOfWhatWasTyped)
{
    EXPECT_EQ("", Value_Read(L""));
    EXPECT_EQ("M\374ller \2jan\5", Value_Read(L"M\u00FCller \u00ABjan\u00BB"));
    EXPECT_EQ("a\r\nb", Value_Read(L"a\r\nb"));
    Enc_Select("CP1251");
    EXPECT_EQ("\344", Value_Read(L"\u0434"));
}

TEST(ValueCheck, AcceptsWhatCanBeReadBack)
{
    for (const char *value : {"", "1999", "{a}b", "\2jan\5", "a \2x_1\5\2y\5"})
        EXPECT_EQ(nullptr, Value_Check(value)) << value;
}

TEST(ValueCheck, RefusesNamesThatTheParserDoesNotRead)
{
    EXPECT_STREQ("Unclosed abbreviation", Value_Check("\2jan"));
    for (const char *value : {"\2\5", "\0021st\5", "a\2b\\c\5", "\2ok\5\2\001\5"})
        EXPECT_THAT(Value_Check(value), testing::StartsWith("The name of an abbreviation"))
            << value;
}

TEST(ValueHoldsGuillemets, TellsTextFromMarks)
{
    EXPECT_FALSE(Value_HoldsGuillemets("\2jan\5 text"));
    EXPECT_TRUE(Value_HoldsGuillemets("\253text"));
    EXPECT_TRUE(Value_HoldsGuillemets("text\273"));
    Enc_Select("CP437"); // it has them elsewhere
    EXPECT_FALSE(Value_HoldsGuillemets("\253\273"));
    EXPECT_TRUE(Value_HoldsGuillemets("\256"));
}

TEST(ValueLosses, NamesEachCharacterOnce)
{
    EXPECT_EQ(L"", Value_Losses(L"a", L"M\u00FCller \u00ABjan\u00BB", "", false));
    EXPECT_EQ(L"`a': \u0142 \u0416 U+0085 can't be stored in CP1252 and would become \u00FF.\n",
              Value_Losses(L"a", L"\u0142\u0416\u0142\u0085", "", false));
}

TEST(ValueLosses, TellsOfGuillemetsWhereTextHadThem)
{
    EXPECT_EQ(L"`a': \u00AB and \u00BB will mark an abbreviation, not stand as text.\n",
              Value_Losses(L"a", L"\u00ABjan\u00BB", "", true));
    EXPECT_EQ(L"", Value_Losses(L"a", L"jan", "", true));
}

TEST(ValueLosses, TellsOfCharactersThatStandForOtherBytes)
{
    EXPECT_EQ(L"", Value_Losses(L"a", L"M\u00FCller", "\253M\374ller\273 \2jan\5", false));
    Enc_Select("CP20127");
    EXPECT_EQ(L"`a': CP20127 shows bytes of the old value as C <, and they would become just "
              L"that.\n",
              Value_Losses(L"a", L"MC<llerQ", "M\303\274ller", false));
    EXPECT_EQ(L"", Value_Losses(L"a", L"clean", "M\303\274ller", false));
    EXPECT_EQ(L"", Value_Losses(L"a", L"MC<ller", "plain", false));
}

TEST(ValueShow, HasNoCharacterThatEndsATextInAControl)
{
    EXPECT_EQ(L"M\u00FCller", Value_Show("M\374ller"));
    Enc_Select("CP20127");
    EXPECT_EQ(L"a\uFFFDb", Value_Show("a\200b"));
}

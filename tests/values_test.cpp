#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "encoding/Encoding.h"
#include "session/Values.h"

TEST(ValueRead, MakesStoreTextOfWhatWasTyped)
{
    EXPECT_EQ("", Value_Read(L"", Enc_Current()));
    EXPECT_EQ("M\374ller \2jan\5", Value_Read(L"M\u00FCller \u00ABjan\u00BB", Enc_Current()));
    EXPECT_EQ("a\r\nb", Value_Read(L"a\r\nb", Enc_Current()));
    Enc_Select("CP1251");
    EXPECT_EQ("\344", Value_Read(L"\u0434", Enc_Current()));
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
    EXPECT_FALSE(Value_HoldsGuillemets("\2jan\5 text", Enc_Current()));
    EXPECT_TRUE(Value_HoldsGuillemets("\253text", Enc_Current()));
    EXPECT_TRUE(Value_HoldsGuillemets("text\273", Enc_Current()));
    Enc_Select("CP437"); // it has them elsewhere
    EXPECT_FALSE(Value_HoldsGuillemets("\253\273", Enc_Current()));
    EXPECT_TRUE(Value_HoldsGuillemets("\256", Enc_Current()));
}

TEST(ValueLosses, NamesEachCharacterOnce)
{
    EXPECT_EQ(L"", Value_Losses(L"a", L"M\u00FCller \u00ABjan\u00BB", "", false, Enc_Current()));
    EXPECT_EQ(L"`a': \u0142 \u0416 U+0085 can't be stored in CP1252 and would become \u00FF.\n",
              Value_Losses(L"a", L"\u0142\u0416\u0142\u0085", "", false, Enc_Current()));
}

TEST(ValueLosses, TellsOfGuillemetsWhereTextHadThem)
{
    EXPECT_EQ(L"`a': \u00AB and \u00BB will mark an abbreviation, not stand as text.\n",
              Value_Losses(L"a", L"\u00ABjan\u00BB", "", true, Enc_Current()));
    EXPECT_EQ(L"", Value_Losses(L"a", L"jan", "", true, Enc_Current()));
}

TEST(ValueLosses, TellsOfCharactersThatStandForOtherBytes)
{
    EXPECT_EQ(
        L"", Value_Losses(L"a", L"M\u00FCller", "\253M\374ller\273 \2jan\5", false, Enc_Current()));
    Enc_Select("CP20127");
    EXPECT_EQ(L"`a': CP20127 shows bytes of the old value as C <, and they would become just "
              L"that.\n",
              Value_Losses(L"a", L"MC<llerQ", "M\303\274ller", false, Enc_Current()));
    EXPECT_EQ(L"", Value_Losses(L"a", L"clean", "M\303\274ller", false, Enc_Current()));
    EXPECT_EQ(L"", Value_Losses(L"a", L"MC<ller", "plain", false, Enc_Current()));
}

TEST(ValueShow, HasNoCharacterThatEndsATextInAControl)
{
    EXPECT_EQ(L"M\u00FCller", Value_Show("M\374ller", Enc_Current()));
    Enc_Select("CP20127");
    EXPECT_EQ(L"a\uFFFDb", Value_Show("a\200b", Enc_Current()));
}

// --- In UTF-8 ---

TEST(ValueInUtf8, IsReadAndShown)
{
    Enc_Select("CP65001");
    EXPECT_EQ("\xD0\x96 \2jan\5", Value_Read(L"\u0416 \u00ABjan\u00BB", &EncodingUtf8));
    EXPECT_EQ(L"\u0416 \u00ABjan\u00BB", Value_Show("\xD0\x96 \2jan\5", &EncodingUtf8));
}

TEST(ValueInUtf8, TellsTextFromMarks)
{
    EXPECT_FALSE(Value_HoldsGuillemets("\2jan\5 \xC2\xAA \xD0\xAB", &EncodingUtf8));
    EXPECT_TRUE(Value_HoldsGuillemets("\xC2\xAB", &EncodingUtf8));
    EXPECT_TRUE(Value_HoldsGuillemets("a\xC2\xBB", &EncodingUtf8));
}

TEST(ValueInUtf8, LosesOnlyWhatIsNoCharacter)
{
    EXPECT_EQ(L"", Value_Losses(L"a", L"xyz", "\xC2\xABxy", false, &EncodingUtf8));
    EXPECT_EQ(L"", Value_Losses(L"a", L"\u0142\u0416\U0001F600 \u0301", "M\xC3\xBCller \xC2\xAB",
                                false, &EncodingUtf8));
    EXPECT_EQ(L"`a': U+0002 can't be stored in UTF-8 and would become \u00AB.\n",
              Value_Losses(L"a", L"x\x02", "", false, &EncodingUtf8));
    EXPECT_EQ(L"`a': \u00AB and \u00BB will mark an abbreviation, not stand as text.\n",
              Value_Losses(L"a", L"\u00ABtext\u00BB", "", true, &EncodingUtf8));
}

// tests/values_test.cpp - typed values, and how stored ones are shown.
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

TEST(ValueHoldsGuillemets, TellsTextFromMarks)
{
    EXPECT_FALSE(Value_HoldsGuillemets("\2jan\5 text", Enc_Current()));
    EXPECT_TRUE(Value_HoldsGuillemets("\253text", Enc_Current()));
    EXPECT_TRUE(Value_HoldsGuillemets("text\273", Enc_Current()));
    Enc_Select("CP437"); // it has them elsewhere
    EXPECT_FALSE(Value_HoldsGuillemets("\253\273", Enc_Current()));
    EXPECT_TRUE(Value_HoldsGuillemets("\256", Enc_Current()));
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

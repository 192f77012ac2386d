#include <gtest/gtest.h>

#include "encoding/Encoding.h"
#include "ui/Keys.h"

TEST(KeyTyped, LosesBlanksAndControlCharacters)
{
    EXPECT_EQ("mykey", Key_Typed(L" my key\t\n\x01"));
    EXPECT_EQ("", Key_Typed(L" \t "));
    EXPECT_EQ("", Key_Typed(L""));
    EXPECT_EQ("a{b}", Key_Typed(L"a{b}"));
    EXPECT_EQ("mark", Key_Typed(L"\u00ABmark\u00BB")); // marks of abbreviations
}

TEST(KeyTyped, IsTextOfTheCodePage)
{
    EXPECT_EQ("M\xFCller", Key_Typed(L"M\u00FCller"));
    Enc_Select("CP1251");
    EXPECT_EQ("\xE4", Key_Typed(L"\u0434"));
}

TEST(KeyMisfit, TellsOfCharactersThatTheCodePageLacks)
{
    EXPECT_EQ("", Key_Misfit(L"M\u00FCller \u00FF"));
    const char *text = "The key includes characters that can't be stored in CP1252.";
    EXPECT_EQ(text, Key_Misfit(L"\u0141ukasz"));
    EXPECT_EQ(text, Key_Misfit(L"a\U0001F600"));
    Enc_Select("CP1250");
    EXPECT_EQ("", Key_Misfit(L"\u0141ukasz"));
    EXPECT_NE("", Key_Misfit(L"\u00FF"));
}

TEST(KeyMisfit, TellsOfGuillemets)
{
    EXPECT_NE("", Key_Misfit(L"my\u00AB1"));
    EXPECT_NE("", Key_Misfit(L"\u00BB"));
}

TEST(KeyMisfit, PassesOverWhatIsDroppedAnyway)
{
    EXPECT_EQ("", Key_Misfit(L"a\t\x02 b"));
}

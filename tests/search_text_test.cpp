// tests/search_text_test.cpp - which entries a search finds.
#include "ui/SearchText.h"

#include <gtest/gtest.h>

#include <string>

#include "encoding/Encoding.h"
#include "session/Values.h"
#include "tests/support/LoadText.h"

namespace
{

class SearchTextTest : public testing::Test
{
protected:
    SearchTextTest() { Bib_Initialize(); }

    // Whether an entry with this value is found, in a file that has nothing else.
    static bool Finds(const std::string &text, const std::string &value)
    {
        BibFile *file = LoadText("@misc{k, x = {" + value + "}}\n");
        SearchText search = Search_For(text.c_str(), file);
        bool found = Search_Finds(&search, file->entries);
        Bib_FreeFile(file);
        return found;
    }
};

} // namespace

TEST_F(SearchTextTest, FindsEverythingWhenItIsEmpty)
{
    BibFile *file = LoadText("@misc{k,}\n");
    for (const char *text : {"", static_cast<const char *>(nullptr)}) {
        SearchText search = Search_For(text, file);
        EXPECT_TRUE(Search_Finds(&search, file->entries));
    }
    SearchText search = Search_For("k", file);
    EXPECT_FALSE(Search_Finds(&search, file->entries)); // keys are not searched
    Bib_FreeFile(file);
}

TEST_F(SearchTextTest, IgnoresTheCaseOfAsciiLettersInACodePage)
{
    Enc_Select("CP1252");
    EXPECT_TRUE(Finds("M\xFCLLER", "m\xFCller"));
    EXPECT_FALSE(Finds("M\xDCLLER", "m\xFCller"));
    EXPECT_TRUE(Finds("\xC3\xBC", "M\xC3\xBCller")); // bytes
}

TEST_F(SearchTextTest, IgnoresTheCaseOfAllLettersInUtf8)
{
    Enc_Select("CP65001");
    EXPECT_TRUE(Finds("m\xC3\x9Cll", "M\xC3\xBCLLER"));
    EXPECT_TRUE(Finds("MUL", "muller"));
    EXPECT_FALSE(Finds("m\xC3\xBC", "Muller"));
    EXPECT_TRUE(Finds("\xE2\x84\xAA" // the sign for kelvin
                      "1",
                      "k1"));
    EXPECT_TRUE(Finds("Ge\xC5\xBF", "Die Ge\xC5\xBF" // long s, which folds to a letter of ASCII
                                    "chichte"));
    EXPECT_FALSE(Finds("Ges", "Ge\xC5\xBF"));
    EXPECT_TRUE(Finds("\x02JAN\x05 \xC3\x9C", "a} # jan # { \xC3\xBC"));
}

TEST_F(SearchTextTest, FindsGuillemetsThatAreText)
{
    Enc_Select("CP65001");
    const std::string typed = Value_Read(L"\u00ABm", Enc_Current());
    EXPECT_TRUE(Finds(typed, "x \xC2\xABM\xC2\xBB"));
    EXPECT_TRUE(Finds(typed, "x} # may # {"));
    EXPECT_FALSE(Finds(typed, "may"));
    Enc_Select("CP1252");
    EXPECT_FALSE(Finds(typed, "x \xABM\xBB"));
}

TEST_F(SearchTextTest, SearchesEachFileInItsOwnEncoding)
{
    Enc_Select("CP65001");
    EXPECT_TRUE(Finds("m\xC3\xBCller", "M\xFCller"));
    EXPECT_FALSE(Finds("m\xC3\x9Cller", "M\xFCller")); // only the case of ASCII letters
    EXPECT_FALSE(Finds("\xC3\xBC", "\xFF \xC3"));
    EXPECT_TRUE(Finds("ller", "M\xFCller"));
}

TEST_F(SearchTextTest, FindsNothingByACharacterThatTheFileCannotHold)
{
    Enc_Select("CP65001");
    EXPECT_FALSE(Finds("\xD0\x96", "\xFF\xFC"));
    EXPECT_TRUE(Finds("\xD0\x96", "\xD0\xB6"));
}

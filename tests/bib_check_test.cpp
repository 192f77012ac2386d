#include "store/BibStore.h"

#include <gtest/gtest.h>

#include <string>

static std::string Verdict(const char *value)
{
    const char *message = Bib_CheckValue(value);
    return message ? message : "fine";
}

static std::string Stripped(std::string key)
{
    EXPECT_EQ(1, Bib_StripKeyChars(key.data()));
    return key.c_str();
}

TEST(BibCheckValue, AcceptsNothing)
{
    EXPECT_EQ("fine", Verdict(""));
}

TEST(BibCheckValue, AcceptsBalancedBraces)
{
    EXPECT_EQ("fine", Verdict("{a}b{c}"));
    EXPECT_EQ("fine", Verdict("{{}{{a}}}"));
}

TEST(BibCheckValue, RefusesAnExtraBrace)
{
    EXPECT_EQ("Unbalanced braces (extra `}')", Verdict("a}"));
    EXPECT_EQ("Unbalanced braces (extra `}')", Verdict("}{"));
    EXPECT_EQ("Unbalanced braces (extra `}')", Verdict("{a}}{"));
}

TEST(BibCheckValue, RefusesAnOpenBrace)
{
    EXPECT_EQ("Unbalanced braces (too few closing braces)", Verdict("{{a}"));
    EXPECT_EQ("Unbalanced braces (too few closing braces)", Verdict("\2jan\5{"));
}

TEST(BibCheckValue, AcceptsAbbreviationsBesideText)
{
    EXPECT_EQ("fine", Verdict("\2jan\5"));
    EXPECT_EQ("fine", Verdict("{A}\2jan\5\2feb\5 \"#%'(),=\""));
}

TEST(BibCheckValue, AcceptsAnAbbreviationWithoutAName)
{
    EXPECT_EQ("fine", Verdict("\2\5"));
}

TEST(BibCheckValue, RefusesAnAbbreviationInsideBraces)
{
    EXPECT_EQ("Abbreviation can't be appeared inside braces", Verdict("{x\2m\5}"));
}

TEST(BibCheckValue, RefusesAnAbbreviationInsideAnAbbreviation)
{
    EXPECT_EQ("Recursive Abbreviation is imposible", Verdict("\2a\2b\5\5"));
}

TEST(BibCheckValue, RefusesEveryKeyCharacterInAnAbbreviation)
{
    EXPECT_EQ("Invalid char in abbreviation", Verdict("\2a b\5"));
    for (char c : std::string("\"#%'(),={} ")) {
        std::string value = std::string("\2a") + c + "b\5";
        EXPECT_EQ("Invalid char in abbreviation", Verdict(value.c_str())) << c;
    }
}

TEST(BibCheckValue, AcceptsOtherCharactersInAnAbbreviation)
{
    EXPECT_EQ("fine", Verdict("\2a-b:c\\@!$&*+./;<>?[]^_`|~\t\xFF\5"));
}

TEST(BibCheckValue, RefusesAnOpenAbbreviation)
{
    EXPECT_EQ("Unclosed abbreviation", Verdict("\2jan"));
    EXPECT_EQ("Unclosed abbreviation", Verdict("{a}\2"));
}

TEST(BibCheckValue, RefusesALoneClosingMark)
{
    EXPECT_EQ("Closing Abbreviation without an opening", Verdict("\5"));
    EXPECT_EQ("Closing Abbreviation without an opening", Verdict("\2jan\5\5"));
    EXPECT_EQ("Closing Abbreviation without an opening", Verdict("{\5}"));
}

TEST(BibStripKeyChars, RemovesTheElevenCharacters)
{
    EXPECT_EQ("Smith2001a", Stripped("Smith, 2001 (a)"));
    EXPECT_EQ("ab", Stripped("a\"#%'(),={} b"));
    EXPECT_EQ("", Stripped("{} "));
    EXPECT_EQ("", Stripped(""));
}

TEST(BibStripKeyChars, KeepsEverythingElse)
{
    EXPECT_EQ("a:b/c-d\\e@f\tg\xE4", Stripped("a:b/c-d\\e@f\tg\xE4"));
}

#include "store/BibText.h"

#include <gtest/gtest.h>

#include <string>

#include "store/BibStore.h"

namespace
{

int Form(const std::string &text)
{
    return BibText_Form(text.data(), text.size());
}

std::string Normalised(std::string text)
{
    size_t length = text.size();
    text += '#'; // the spare byte
    return text.substr(0, BibText_Normalise(text.data(), length));
}

// What is left of a part that stands between an a and a z.
std::string Trimmed(const std::string &part)
{
    std::string text = "a" + part + "z";
    BibSpan span = BibText_TrimLines(text.data(), {1, text.size() - 1});
    return text.substr(span.start, span.end - span.start);
}

// What stands from the lost fields on; "" for none.
std::string LostFields(const std::string &text, bool inBrackets = false)
{
    return text.substr(BibText_FindLostFields(text.data(), {0, text.size()}, inBrackets));
}

} // namespace

TEST(BibTextForm, TellsOfLineEnds)
{
    for (const char *text : {"\r\n", "a\r\n", "a\r\nb", "\r\n\r\nb\r\n"})
        EXPECT_EQ(BIB_FORM_CRLF, Form(text)) << text;
    for (const char *text : {"", "a", "\n", "a\r\nb\n", "a\nb\r\n", "a\r\r\n", "\r", "a\r\nb\r"})
        EXPECT_EQ(0, Form(text)) << text;
}

TEST(BibTextForm, TellsOfTheEncodingAndTheMark)
{
    EXPECT_EQ(0, Form("\xC3\xBC"));
    EXPECT_EQ(BIB_FORM_CODE_PAGE, Form("\xFC"));
    EXPECT_EQ(BIB_FORM_MARK, Form("\xEF\xBB\xBF"));
    EXPECT_EQ(BIB_FORM_ALL, Form("\xEF\xBB\xBF\xFC\r\n"));
    EXPECT_EQ(BIB_FORM_CODE_PAGE, Form("\xEF\xBB"));
}

TEST(BibTextNormalise, MakesPlainLines)
{
    EXPECT_EQ("", Normalised(""));
    EXPECT_EQ("a\n", Normalised("a"));
    EXPECT_EQ("a\n", Normalised("a\n"));
    EXPECT_EQ("a\nb\n\nc\n", Normalised("a\r\nb\r\r\nc\r"));
    EXPECT_EQ("a b\n", Normalised(std::string("a\0b", 3)));
    EXPECT_EQ("\n", Normalised("\xEF\xBB\xBF\n"));
}

TEST(BibTextLineAt, CountsFromOne)
{
    EXPECT_EQ(1, BibText_LineAt("a\nb", 1));
    EXPECT_EQ(2, BibText_LineAt("a\nb", 2));
}

TEST(BibTextTrimLines, LeavesTheLinesThatHoldMoreThanBlanks)
{
    EXPECT_EQ("", Trimmed(""));
    EXPECT_EQ("", Trimmed(" \n\t\n "));
    EXPECT_EQ("b", Trimmed("b"));
    EXPECT_EQ(" b ", Trimmed(" b "));
    EXPECT_EQ("\tb", Trimmed("\n\n\tb\n \n"));
    EXPECT_EQ(" b \n\n c", Trimmed(" \n b \n\n c\n"));
}

TEST(BibTextHasNoItem, IsTrueForBlanksAndCommentLines)
{
    for (const std::string text : {"", "\n \t\n", "% a\n", "  % a @b{\n\n\t%%\n"})
        EXPECT_TRUE(BibText_HasNoItem(text.data(), text.size())) << text;
    for (const std::string text : {"a", "% a\n@\n", "\f% a\nb", "a %\n"})
        EXPECT_FALSE(BibText_HasNoItem(text.data(), text.size())) << text;
}

TEST(BibTextFindLostFields, FindsFieldsBeforeAClosingBrace)
{
    EXPECT_EQ("= 1 }", LostFields(", year = 1 }"));
    EXPECT_EQ("={1}}", LostFields("\nyear={1}}"));
    EXPECT_EQ("= 1 % }\n}", LostFields("} year\n= 1 % }\n}"));
    EXPECT_EQ("= 1, b = 2}", LostFields("a = 1, b = 2}"));
    EXPECT_EQ("= 1)", LostFields("year = 1)", true));
    EXPECT_EQ("= (1))", LostFields("year = (1))", true));
    EXPECT_EQ("= 1 (}", LostFields("year = 1 (}", true));
}

TEST(BibTextFindLostFields, FindsNoneElsewhere)
{
    for (const char *text : {"", "}", "} year = 1", "year = 1", "= }", "{a = 1}", "% a = 1\n}",
                             "% {\na = 1\n}", "a = 1 % }", "a = 1)", "\n =}"})
        EXPECT_EQ("", LostFields(text)) << text;
    for (const char *text : {"(year = 1)", ")", ") year = 1", "% (\na = 1\n)"})
        EXPECT_EQ("", LostFields(text, true)) << text;
}

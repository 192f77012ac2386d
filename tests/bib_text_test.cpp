// tests/bib_text_test.cpp - line ends, encodings and comments of plain text.
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

TEST(BibTextIsAscii, LooksAtEveryByte)
{
    EXPECT_TRUE(BibText_IsAscii("a\x7F\xFC", 2));
    EXPECT_FALSE(BibText_IsAscii("a\x7F\xFC", 3));
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

TEST(BibTextLineAt, CountsTheEndsOfAllKinds)
{
    const char text[] = "a\nb\r\nc\rd\n\re";
    auto line = [&](char c) { return BibText_LineAt(text, strchr(text, c) - text); };
    EXPECT_EQ(1, line('a'));
    EXPECT_EQ(2, line('b'));
    EXPECT_EQ(3, line('c'));
    EXPECT_EQ(4, line('d'));
    EXPECT_EQ(6, line('e'));
}

TEST(BibTextCountLines, CountsTheirEnds)
{
    EXPECT_EQ(0, BibText_CountLines("a\nb\n", {0, 1}));
    EXPECT_EQ(1, BibText_CountLines("a\nb\n", {0, 2}));
    EXPECT_EQ(1, BibText_CountLines("a\nb\n", {2, 4}));
}

TEST(BibTextTrimLines, LeavesTheLinesThatHoldMoreThanBlanks)
{
    EXPECT_EQ("", Trimmed(""));
    EXPECT_EQ("", Trimmed(" \n\t\n "));
    EXPECT_EQ("b", Trimmed("b"));
    EXPECT_EQ(" b ", Trimmed(" b "));
    EXPECT_EQ("\tb", Trimmed("\n\n\tb\n \n"));
    EXPECT_EQ(" b \n\n c", Trimmed(" \n b \n\n c\n"));
    EXPECT_EQ("\f\n\v", Trimmed("\n\f\n\v\n")); // new pages
}

TEST(BibTextTrimLines, DropsMarksAtTheStart)
{
    EXPECT_EQ("", Trimmed("\xEF\xBB\xBF"));
    EXPECT_EQ(" b \xEF\xBB\xBF", Trimmed("\n\xEF\xBB\xBF\n\xEF\xBB\xBF b \xEF\xBB\xBF\n"));
}

TEST(BibTextHasNoItem, LooksForTheSignOutsideComments)
{
    for (const std::string text : {"", "\n \t\n", "% a\n", "a %\n", "  % a @b{\n\n\t%%\n"})
        EXPECT_TRUE(BibText_HasNoItem(text.data(), text.size())) << text;
    for (const std::string text : {"@", "% a\n@\n", "a%@\n", "a% @\n", "% a\nb@"})
        EXPECT_FALSE(BibText_HasNoItem(text.data(), text.size())) << text;
}

TEST(BibTextFindWords, SkipsCommentsAndBlanks)
{
    auto words = [](const std::string &text) {
        return text.substr(BibText_FindWords(text.data(), {0, text.size()}));
    };
    EXPECT_EQ("", words(" \n% a\n\t%b"));
    EXPECT_EQ("c % d", words("% a\n c % d"));
    EXPECT_EQ("a%b", words("\na%b"));
}

TEST(BibTextFindLostFields, FindsFieldsBeforeTheBraceThatWasToEndTheEntry)
{
    EXPECT_EQ("year = 1 }", LostFields(" year = 1 }"));
    EXPECT_EQ("year={1}}", LostFields("}\nyear={1}}"));
    EXPECT_EQ("a = 1, b = 2}", LostFields("a = 1, b = 2}"));
    EXPECT_EQ("b = 2 }", LostFields("a, b = 2 }"));
    EXPECT_EQ("author+an.x:y! = {1}}", LostFields("author+an.x:y! = {1}}"));
    EXPECT_EQ("ann\xC3\xA9"
              "e = 1}",
              LostFields("ann\xC3\xA9"
                         "e = 1}"));
    EXPECT_EQ("a = {b}, {c}, d = e }", LostFields("x, a = {b}, {c}, d = e }"));
    EXPECT_EQ("year = 1)", LostFields("year = 1)", true));
    EXPECT_EQ("year = 1 )  \nx", LostFields("year = 1 )  \nx", true));
    EXPECT_EQ("year = (1))", LostFields("year = (1))", true));
    EXPECT_EQ("year = 1 (}", LostFields("year = 1 (}", true));
    EXPECT_EQ("year = 1) b\n)", LostFields("year = 1) b\n)", true));
}

TEST(BibTextFindLostFields, FindsFieldsBehindACommaThatFollowsTheEntry)
{
    EXPECT_EQ("year = 1", LostFields(",\nyear = 1"));
    EXPECT_EQ("year\n= 1", LostFields("}\n, % a = b\nyear\n= 1"));
    EXPECT_EQ("a = {b}, {c = d}", LostFields(",, a = {b}, {c = d}"));
    EXPECT_EQ("year = \"}\"", LostFields("}}, year = \"}\""));
}

TEST(BibTextFindLostFields, FindsNoneElsewhere)
{
    for (const char *text : {"",
                             "}",
                             "} year = 1",
                             ", vim: set ts=4, sw=4 :",
                             ", {a, b = 1}, year = { }",
                             "year = 1",
                             "= }",
                             "{a = 1}",
                             "% a = 1\n}",
                             "% @b{\na = 1\n}",
                             "a = 1 % }",
                             "a = 1)",
                             "\n =}",
                             ",",
                             "},\n",
                             ", year",
                             ", and year = 1",
                             "a } {b, c = d}",
                             "http://a.b/c?d=e,f?g=h\n}",
                             "=Part A=\n}",
                             "Part A = B\n}",
                             "misc{l, x = {y}}"})
        EXPECT_EQ("", LostFields(text)) << text;
    for (const char *text : {"1) a = {b}, c = d\n2) foo", "a = 1) b", "(year = 1)", ")",
                             ") year = 1", "% @b(\na = 1\n)"})
        EXPECT_EQ("", LostFields(text, true)) << text;
}

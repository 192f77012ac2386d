// tests/help_page_test.cpp - what the help program shows.

#include "help/HelpPage.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "tests/support/TempFolder.h"

namespace
{

using std::string;

class HelpFindManual : public testing::Test
{
protected:
    string Make(const string &name)
    {
        std::filesystem::create_directories(
            std::filesystem::path(m_folder.Path(name)).parent_path());
        return m_folder.Write(name, "");
    }
    string Find(const string &program) { return Help_FindManual(m_folder.Path(program).c_str()); }

    TempFolder m_folder;
};

TEST_F(HelpFindManual, LooksBesideTheProgramFirst)
{
    Make("share/doc/cartulo/manual.html");
    string path = Make("bin/manual.html");
    EXPECT_EQ(path, Find("bin/metahelp"));
}

TEST_F(HelpFindManual, LooksWhereItIsInstalled)
{
    string path = Make("usr/share/doc/cartulo/manual.html");
    EXPECT_EQ(path, Find("usr/libexec/cartulo/metahelp"));
    EXPECT_EQ(path, Find("usr/bin/metahelp"));
}

TEST_F(HelpFindManual, FindsNothingElsewhere)
{
    Make("share/doc/manual.html");
    Make("doc/cartulo/manual.html");
    EXPECT_EQ("", Find("bin/metahelp"));
    EXPECT_EQ("", Help_FindManual(""));
    EXPECT_EQ("", Help_FindManual("metahelp"));
}

TEST(HelpNotice, IsForOtherTopicsOnly)
{
    EXPECT_EQ("", Help_Notice(".QRL.Cartulo"));
    EXPECT_EQ("", Help_Notice(""));
    EXPECT_EQ("There is no help on the topic \".QRL.&lt;b>&amp;\". This is the manual of Cartulo.",
              Help_Notice(".QRL.<b>&"));
}

TEST(HelpPage, HoldsTheManualInColoursBelowTheNotice)
{
    HelpColours colours = {"#000001", "#000002", "#000003"};
    EXPECT_EQ("<html><head><title>T &amp; U</title></head>"
              "<body bgcolor=\"#000001\" text=\"#000002\" link=\"#000003\">\n"
              "<h1>T &amp; U</h1>\n<p>x</p>\n</body></html>\n",
              Help_Page("<h1>T &amp; U</h1>\n<p>x</p>\n", colours, ""));
    string page = Help_Page("<p>x</p>", colours, "no topic");
    EXPECT_NE(string::npos, page.find("<title>Cartulo</title>")) << "no heading";
    EXPECT_LT(page.find("no topic"), page.find("<p>x</p>"));
}

TEST(HelpIsWebAddress, IsTrueForWhatABrowserOpens)
{
    for (const char *address : {"http://a.b", "https://a.b/c#d", "HTTPS://A", "mailto:a@b.c"})
        EXPECT_EQ(1, Help_IsWebAddress(address)) << address;
    for (const char *address : {"", "http", "#saving", "manual.md", "file:///etc", "javascript:x"})
        EXPECT_EQ(0, Help_IsWebAddress(address)) << address;
}

// --- Finding ---

class HelpFindText : public testing::Test
{
protected:
    string Find(const string &text, int start = 0)
    {
        HelpPlace place = Help_FindText(m_words, text, start);
        return std::to_string(place.first) + " to " + std::to_string(place.last);
    }

    //                                   0       1        2       3     4  5       6
    std::vector<string> m_words = {"first", "second ", "third", "\n", "", "first", " last"};
};

TEST_F(HelpFindText, FindsAPartOfAWord)
{
    EXPECT_EQ("1 to 1", Find("con"));
    EXPECT_EQ("2 to 2", Find("third"));
    EXPECT_EQ("-1 to -1", Find("thirds"));
}

TEST_F(HelpFindText, FindsTextOfSeveralWords)
{
    EXPECT_EQ("0 to 1", Find("firstsec"));
    EXPECT_EQ("1 to 2", Find("second third"));
    EXPECT_EQ("2 to 6", Find("third first last"));
}

TEST_F(HelpFindText, TakesAnyBlanksForOne)
{
    EXPECT_EQ("1 to 2", Find("  second \t third "));
    EXPECT_EQ("-1 to -1", Find("sec ond"));
    EXPECT_EQ("-1 to -1", Find("first second")) << "there is none between them";
}

TEST_F(HelpFindText, GoesOnBehindTheStartAndThenAtTheTop)
{
    EXPECT_EQ("0 to 0", Find("first", 0));
    EXPECT_EQ("5 to 5", Find("first", 1));
    EXPECT_EQ("0 to 0", Find("first", 6));
    EXPECT_EQ("0 to 0", Find("first", 7));
    EXPECT_EQ("0 to 0", Find("first", -1));
}

TEST_F(HelpFindText, FindsNoText)
{
    EXPECT_EQ("-1 to -1", Find(""));
    EXPECT_EQ("-1 to -1", Find("  "));
    m_words.clear();
    EXPECT_EQ("-1 to -1", Find("first"));
}

} // namespace

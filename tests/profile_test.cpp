// tests/profile_test.cpp - reading INI files.

#include "base/Profile.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include <sys/stat.h>

#include "tests/support/TempFolder.h"

namespace
{

using std::string;
using namespace std::string_literals;

const char GUARD = '~';

// An INI file, and questions about it. No call may write behind its buffer.
class Profile : public testing::Test
{
protected:
    void Write(const string &text) { m_path = m_folder.Write("test.ini", text); }

    string Get(const char *section, const char *key, const char *fallback = "none",
               size_t size = 100)
    {
        return Call(size, [&](char *buffer) {
            return Profile_GetString(section, key, fallback, buffer, size, m_path.c_str());
        });
    }

    // With all zeros: those that end the texts and the one that ends the list.
    string Section(const char *section, size_t size = 100)
    {
        return CallForList(size, [&](char *buffer) {
            return Profile_GetSection(section, buffer, size, m_path.c_str());
        });
    }

    string SectionNames(size_t size = 100)
    {
        return CallForList(size, [&](char *buffer) {
            return Profile_GetSectionNames(buffer, size, m_path.c_str());
        });
    }

    TempFolder m_folder;
    string m_path = m_folder.Path("missing.ini");
    size_t m_result = 0; // of the last call

private:
    template <typename Function> string Call(size_t size, Function function)
    {
        string buffer(size + 8, GUARD);
        m_result = function(buffer.data());
        EXPECT_EQ(string(8, GUARD), buffer.substr(size));
        if (size == 0)
            return "untouched";
        EXPECT_GT(size, m_result);
        EXPECT_EQ('\0', buffer[m_result]);
        return buffer.substr(0, m_result);
    }

    template <typename Function> string CallForList(size_t size, Function function)
    {
        string text = Call(size, [&](char *buffer) {
            size_t length = function(buffer);
            if (size >= 2) { // two zeros: the end of the last text, and of the list
                EXPECT_EQ(0, buffer[length]);
                EXPECT_TRUE((length > 0 && buffer[length - 1] == 0) || buffer[length + 1] == 0);
            }
            return length;
        });
        return size == 0 ? text : text + '\0';
    }
};

using ProfileString = Profile;
using ProfileSection = Profile;
using ProfileSectionNames = Profile;

// --- Values ---

TEST_F(ProfileString, IsTheValueOfTheKey)
{
    Write("[one]\na=1\nb=2\n[two]\na=3\n");
    EXPECT_EQ("1", Get("one", "a"));
    EXPECT_EQ("2", Get("one", "b"));
    EXPECT_EQ("3", Get("two", "a"));
    EXPECT_EQ(1u, m_result);
}

TEST_F(ProfileString, IsTheFallbackWhereThereIsNone)
{
    Write("a=0\n[one]\na=1\nc\n");
    EXPECT_EQ("none", Get("one", "b"));
    EXPECT_EQ("none", Get("two", "a"));
    EXPECT_EQ("none", Get("", "a"));
    EXPECT_EQ("none", Get("one", "c")) << "a line without '='";
    EXPECT_EQ("", Get("one", "b", nullptr));
    EXPECT_EQ("none", Get("one", "b", "none at all", 5));
    EXPECT_EQ(4u, m_result);
}

TEST_F(ProfileString, MayBeThatOfSeveralKeys)
{
    Write("[one]\na=1\nb=\"long value\"\n[two]\nc=3\n");
    const char *keys[] = {"b", "c", "A"};
    char values[3][5];
    memset(values, 'x', sizeof values);
    Profile_GetStrings("one", keys, 3, "none at all", values[0], sizeof values[0], m_path.c_str());
    EXPECT_STREQ("long", values[0]);
    EXPECT_STREQ("none", values[1]);
    EXPECT_STREQ("1", values[2]);
}

TEST_F(ProfileString, IgnoresLetterCaseOfNames)
{
    Write("[One]\nKey=Value\n");
    EXPECT_EQ("Value", Get("oNE", "kEY"));
}

TEST_F(ProfileString, TellsLettersApartThatAreNotASCII)
{
    Write("[one]\n\xC4=1\n\xE4=2\n");
    EXPECT_EQ("1", Get("one", "\xC4"));
    EXPECT_EQ("2", Get("one", "\xE4"));
}

TEST_F(ProfileString, ComparesWholeNames)
{
    Write("[one more]\nab=1\n[one]\nabc=2\na=3\n");
    EXPECT_EQ("none", Get("one", "ab"));
    EXPECT_EQ("3", Get("one", "a"));
    EXPECT_EQ("1", Get("one more", "ab"));
}

TEST_F(ProfileString, IsThatOfTheFirstSectionAndTheFirstLine)
{
    Write("[one]\na=1\nA=2\n[ONE]\na=3\nb=4\n");
    EXPECT_EQ("1", Get("one", "a"));
    EXPECT_EQ("none", Get("one", "b"));
}

TEST_F(ProfileString, MayBeEmpty)
{
    Write("[one]\na=\nb=\"\"\n");
    EXPECT_EQ("", Get("one", "a"));
    EXPECT_EQ("", Get("one", "b"));
}

TEST_F(ProfileString, ComesWithoutTheBlanksAround)
{
    Write(" [ one ] rest\n\t a \t=  1 2\t\n=no key\n");
    EXPECT_EQ("1 2", Get("one", "a"));
    EXPECT_EQ("no key", Get("one", ""));
}

TEST_F(ProfileString, ComesWithoutOnePairOfQuotes)
{
    Write("[q]\na=\" 1 \"\nb='2'\nc=\"\"3\"\"\nd=\"4'\ne=\"\nf=5\"6\"\n");
    EXPECT_EQ(" 1 ", Get("q", "a"));
    EXPECT_EQ("2", Get("q", "b"));
    EXPECT_EQ("\"3\"", Get("q", "c"));
    EXPECT_EQ("\"4'", Get("q", "d"));
    EXPECT_EQ("\"", Get("q", "e"));
    EXPECT_EQ("5\"6\"", Get("q", "f"));
}

TEST_F(ProfileString, MayHoldAnEqualsSignASemicolonAndABracket)
{
    Write("[one]\na=b=c ; d\ne=[two]\n");
    EXPECT_EQ("b=c ; d", Get("one", "a"));
    EXPECT_EQ("[two]", Get("one", "e"));
}

TEST_F(ProfileString, IsNotTakenFromComments)
{
    Write("[one]\n;a=1\n  ;a=2\n#a=3\n;[two]\nb=4\n");
    EXPECT_EQ("none", Get("one", "a"));
    EXPECT_EQ("3", Get("one", "#a"));
    EXPECT_EQ("4", Get("one", "b"));
}

TEST_F(ProfileString, IsFoundWithAnyLineEnds)
{
    Write("[one]\r\na=1\r\n\r\nb=2\n\nc=3");
    EXPECT_EQ("1", Get("one", "a"));
    EXPECT_EQ("2", Get("one", "b"));
    EXPECT_EQ("3", Get("one", "c"));
}

TEST_F(ProfileString, IsFoundBehindAByteOrderMark)
{
    Write("\xEF\xBB\xBF[one]\na=1\n");
    EXPECT_EQ("1", Get("one", "a"));
}

TEST_F(ProfileString, IsCutToTheBuffer)
{
    Write("[one]\na=12345\n");
    EXPECT_EQ("12345", Get("one", "a", "", 6));
    EXPECT_EQ(5u, m_result);
    EXPECT_EQ("1234", Get("one", "a", "", 5));
    EXPECT_EQ(4u, m_result);
    EXPECT_EQ("1", Get("one", "a", "", 2));
    EXPECT_EQ("", Get("one", "a", "", 1));
    EXPECT_EQ("untouched", Get("one", "a", "", 0));
    EXPECT_EQ(0u, m_result);
}

TEST_F(ProfileString, HasABlankInsteadOfAZero)
{
    Write("[one]\na=1\0002\nb=3\n"s);
    EXPECT_EQ("1 2", Get("one", "a"));
    EXPECT_EQ("3", Get("one", "b"));
}

TEST_F(ProfileString, IsReadAfreshEachTime)
{
    Write("[one]\na=1\n");
    EXPECT_EQ("1", Get("one", "a"));
    Write("[one]\na=2\n");
    EXPECT_EQ("2", Get("one", "a"));
}

TEST_F(ProfileString, IsTheFallbackWhereNoFileCanBeRead)
{
    EXPECT_EQ("none", Get("one", "a"));
    m_path = m_folder.Path();
    EXPECT_EQ("none", Get("one", "a"));
    m_path = m_folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(m_path.c_str(), 0600));
    EXPECT_EQ("none", Get("one", "a"));
    m_path = "";
    EXPECT_EQ("none", Get("one", "a"));
}

TEST_F(ProfileString, IsFoundInFilesOfUpToOneMiB)
{
    string text = "[one]\na=1\n;";
    Write(text + string((1 << 20) - text.size(), 'x'));
    EXPECT_EQ("1", Get("one", "a"));
    Write(text + string((1 << 20) + 1 - text.size(), 'x'));
    EXPECT_EQ("none", Get("one", "a"));
}

TEST_F(ProfileString, IsNotDisturbedByBrokenHeads)
{
    Write("[one\na=1\n[\n[two]\n[=b\n]c=2\n");
    EXPECT_EQ("none", Get("one", "a"));
    EXPECT_EQ("b", Get("two", "["));
    EXPECT_EQ("2", Get("two", "]c"));
}

// --- Sections ---

TEST_F(ProfileSection, HasTheLinesInTheirOrder)
{
    Write("[zero]\nz=0\n[one]\nb=2\na=1\n;c=3\n\nB=4\nword\n[two]\nd=5\n");
    EXPECT_EQ("b=2\0a=1\0B=4\0word\0\0"s, Section("ONE"));
    EXPECT_EQ(17u, m_result);
}

TEST_F(ProfileSection, HasLinesWithoutBlanksAround)
{
    Write("[one]\n  author = *editor \r\n * = An article\n two words \n = \n");
    EXPECT_EQ("author=*editor\0*=An article\0two words\0=\0\0"s, Section("one"));
}

TEST_F(ProfileSection, KeepsQuotes)
{
    Write("[one]\na = \" 1 \"\n");
    EXPECT_EQ("a=\" 1 \"\0\0"s, Section("one"));
}

TEST_F(ProfileSection, IsTheFirstOfItsName)
{
    Write("[one]\na=1\n[two]\n[ONE]\nb=2\n");
    EXPECT_EQ("a=1\0\0"s, Section("one"));
}

TEST_F(ProfileSection, IsEmptyWhenItHasNoLinesOrDoesNotExist)
{
    Write("[one]\n;\n[two]\na=1\n");
    EXPECT_EQ("\0"s, Section("one"));
    EXPECT_EQ(0u, m_result);
    EXPECT_EQ("\0"s, Section("three"));
    m_path = m_folder.Path("missing");
    EXPECT_EQ("\0"s, Section("one"));
}

TEST_F(ProfileSection, FitsExactly)
{
    Write("[one]\na=1\nb=2\n");
    EXPECT_EQ("a=1\0b=2\0\0"s, Section("one", 9));
    EXPECT_EQ(8u, m_result);
}

TEST_F(ProfileSection, IsCutToTheBuffer)
{
    Write("[one]\na=1\nb=2\n");
    EXPECT_EQ("a=1\0b=\0"s, Section("one", 8)) << "one byte less than all";
    EXPECT_EQ(6u, m_result);
    EXPECT_EQ("a=1\0b\0"s, Section("one", 7));
    EXPECT_EQ("a=1\0\0"s, Section("one", 6));
    EXPECT_EQ("a=1\0"s, Section("one", 5));
    EXPECT_EQ(3u, m_result);
    EXPECT_EQ("a=\0"s, Section("one", 4));
    EXPECT_EQ("a\0"s, Section("one", 3));
    EXPECT_EQ("\0"s, Section("one", 2));
    EXPECT_EQ("\0"s, Section("one", 1));
    EXPECT_EQ(0u, m_result);
    EXPECT_EQ("untouched", Section("one", 0));
    EXPECT_EQ(0u, m_result);
}

TEST_F(ProfileSection, IsCutInALongLine)
{
    Write("[one]\na=" + string(5000, 'x') + "\nb=2\n");
    EXPECT_EQ("a=" + string(96, 'x') + '\0', Section("one"));
    EXPECT_EQ(98u, m_result);
}

// --- Names of sections ---

TEST_F(ProfileSectionNames, AreInTheFilesOrderAndEachThereOnce)
{
    Write("a=0\n[ Two ]\na=1\n[one]\n[TWO]\n[]\n;[three]\n[*four]\n[on]\n");
    EXPECT_EQ("Two\0one\0*four\0on\0\0"s, SectionNames());
    EXPECT_EQ(17u, m_result);
}

TEST_F(ProfileSectionNames, AreNoneInAnEmptyFile)
{
    Write("");
    EXPECT_EQ("\0"s, SectionNames());
    m_path = m_folder.Path("missing");
    EXPECT_EQ("\0"s, SectionNames());
    EXPECT_EQ(0u, m_result);
}

TEST_F(ProfileSectionNames, AreCutToTheBuffer)
{
    Write("[ab]\n[cd]\n");
    EXPECT_EQ("ab\0cd\0\0"s, SectionNames(7));
    EXPECT_EQ(6u, m_result);
    EXPECT_EQ("ab\0c\0"s, SectionNames(6));
    EXPECT_EQ(4u, m_result);
    EXPECT_EQ("\0"s, SectionNames(2));
    EXPECT_EQ("\0"s, SectionNames(1));
    EXPECT_EQ("untouched", SectionNames(0));
}

} // namespace

// tests/preamble_text_test.cpp - the preamble as text of a control, and back.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "session/FileSet.h"
#include "tests/support/LoadText.h"
#include "ui/PreambleText.h"

static PreambleEdit ReadEdit(const std::wstring &typed, const char *stored)
{
    return Preamble_Read(typed, stored, Enc_Current());
}

static std::string Read(const std::wstring &typed)
{
    return ReadEdit(typed, "").text;
}

static const char TwoPieces[] = "\\def\\a{x}\r\n\\def\\b{y}\r\n";

TEST(PreambleRead, KeepsWhatWasNotTouched)
{
    EXPECT_EQ(TwoPieces, Read(L"\\def\\a{x}\r\n\\def\\b{y}\r\n"));
    EXPECT_EQ("{a\nb}\r\n", Read(L"{a\nb}\r\n"));
    EXPECT_EQ("", Read(L""));
}

TEST(PreambleRead, EndsAPieceWithAnEnterOutsideBraces)
{
    EXPECT_EQ("a\r\nb{}\r\nc\r\n", Read(L"a\nb{}\nc\r\n"));
    EXPECT_EQ("a\r\n\r\nb\r\n", Read(L"a\n\nb"));
}

TEST(PreambleRead, KeepsAnEnterInsideBracesInItsPiece)
{
    EXPECT_EQ("\\def\\a{x\n{y\n}\n}\r\nz\r\n", Read(L"\\def\\a{x\n{y\n}\n}\nz\r\n"));
}

TEST(PreambleRead, TakesAClosingBraceTooManyForNone)
{
    EXPECT_EQ("a}\r\nb\r\n", Read(L"a}\nb\r\n"));
    EXPECT_EQ("a}{\nb\r\n", Read(L"a}{\nb\r\n"));
}

TEST(PreambleRead, EndsWhatStandsBehindTheLastPiece)
{
    EXPECT_EQ("a\r\nb\r\n", Read(L"a\r\nb"));
    EXPECT_EQ("a\r\n", Read(L"a"));
    EXPECT_EQ("a {\n\r\n", Read(L"a {\n"));
}

TEST(PreambleRead, MakesNothingOfLineEndsAlone)
{
    EXPECT_EQ("", Read(L"\r\n\n\r\n"));
    EXPECT_EQ(" \r\n", Read(L" "));
}

TEST(PreambleRead, KeepsTheEndsOfPiecesInsideBraces)
{
    EXPECT_EQ("a{\r\nb!\r\n", Read(L"a{\r\nb!\r\n"));
    EXPECT_EQ("a{\r\nb\r\n{\n}\r\n", Read(L"a{\r\nb\n{\n}\r\n"));
}

TEST(PreambleRead, MakesMarksOfGuillemets)
{
    EXPECT_EQ("a \2jan\5\r\n", Read(L"a \u00ABjan\u00BB\r\n"));
}

TEST(PreambleRead, KeepsTheBytesOfPiecesThatWereNotTouched)
{
    const char stored[] = "Zo\303\253\r\nb\r\n\253c\273\r\n";
    PreambleEdit edit = ReadEdit(L"new\r\nZo\u00C3\u00AB\r\nb!\r\n\u00ABc\u00BB\r\n", stored);
    EXPECT_EQ("new\r\nZo\303\253\r\nb!\r\n\253c\273\r\n", edit.text);
    EXPECT_EQ(L"new\nb!\n", edit.touched);
    EXPECT_EQ("b", edit.replaced);
}

TEST(PreambleRead, KeepsTheBytesOfCopies)
{
    PreambleEdit edit = ReadEdit(L"a\r\n\u00AB\r\n\u00AB\n\u00AB!\r\n", "\253\r\n");
    EXPECT_EQ("a\r\n\253\r\n\253\r\n\2!\r\n", edit.text);
    EXPECT_EQ(L"a\n\u00AB!\n", edit.touched);
    EXPECT_EQ("", edit.replaced);
}

// A mark and a guillemet that is text look alike.
TEST(PreambleRead, TellsPiecesThatLookAlikeByTheirPlace)
{
    const char stored[] = "\253\r\nx\r\n\2\r\ny\r\n";
    EXPECT_EQ("x\r\n\2\r\ny\r\n", ReadEdit(L"x\r\n\u00AB\r\ny\r\n", stored).text);
    EXPECT_EQ("\253\r\nx\r\ny\r\n", ReadEdit(L"\u00AB\r\nx\r\ny\r\n", stored).text);
    EXPECT_EQ("new\r\nx\r\n\2\r\ny\r\n", ReadEdit(L"new\r\nx\r\n\u00AB\r\ny\r\n", stored).text);
}

TEST(PreambleRead, KeepsTheBytesOfMovedPieces)
{
    PreambleEdit edit = ReadEdit(L"b\r\n\u00AB\r\n", "\253\r\nb\r\n");
    EXPECT_EQ("b\r\n\253\r\n", edit.text);
    EXPECT_EQ(L"", edit.touched);
}

TEST(PreambleCheckMarks, RefusesWhatCouldNotBeReadAgain)
{
    EXPECT_EQ("", Preamble_CheckMarks("a}\r\n{\2jan\5\r\n\2x\5 \2y\5\r\n"));
    for (const char *text :
         {"a\r\n\2b\r\n", "b\5\r\n", "\2a\2b\5\5\r\n", "\2\5\r\n", "\2a{b\5\r\n"})
        EXPECT_EQ("The marks of an abbreviation must be a pair around the name of one.\n"
                  "Else the file could not be read any more.\n\nFix it to continue.",
                  Preamble_CheckMarks(text))
            << text;
}

TEST(PreambleCheckSize, AllowsWhatAFileHolds)
{
    EXPECT_EQ("", Preamble_CheckSize(std::string(8191, 'x')));
    EXPECT_EQ("The preamble of a file can have 8191 bytes, with two for the end of each piece.\n"
              "This one has 8192, 1 too many.\n\nShorten it to continue.",
              Preamble_CheckSize(std::string(8192, 'x')));
}

TEST(PreambleCheck, NamesEachWrongPiece)
{
    EXPECT_TRUE(Preamble_Check("").empty());
    EXPECT_TRUE(Preamble_Check(TwoPieces).empty());
    std::vector<PreambleFault> faults =
        Preamble_Check("good\r\na}\r\n{b\nc\r\n\2 \5\r\n\0021\5\r\n");
    ASSERT_EQ(4u, faults.size());
    EXPECT_EQ("a}", faults[0].piece);
    EXPECT_STREQ("Unbalanced braces (extra `}')", faults[0].reason);
    EXPECT_EQ("{b\nc", faults[1].piece);
    EXPECT_STREQ("Unbalanced braces (too few closing braces)", faults[1].reason);
    EXPECT_STREQ("Invalid char in abbreviation", faults[2].reason);
    EXPECT_THAT(faults[3].reason, testing::StartsWith("The name of an abbreviation"));
}

TEST(PreambleRead, KeepsTheBytesOfUntouchedPiecesInUtf8)
{
    PreambleEdit edit = Preamble_Read(L"\u00ABa\u00BB\r\n\u0416\r\n",
                                      "\xC2\xAB"
                                      "a\xC2\xBB\r\nb\r\n",
                                      &EncodingUtf8);
    EXPECT_EQ("\xC2\xAB"
              "a\xC2\xBB\r\n\xD0\x96\r\n",
              edit.text);
}

TEST(PreambleRead, TellsWhereOldPiecesAreNow)
{
    const struct {
        const wchar_t *typed;
        std::vector<int> places; // of a, b, c
    } rows[] = {
        {L"a\r\nb\r\nc\r\n", {0, 1, 2}},
        {L"a\r\nc\r\n", {0, -1, 1}},
        {L"A\r\nB\r\nC\r\n", {0, 1, 2}},
        {L"a\r\nx\r\nc\r\n", {0, 1, 2}},
        {L"a\r\nx\r\nb\r\nc\r\n", {0, 2, 3}},
        {L"x\r\na\r\nB\r\nc\r\n", {1, 2, 3}},
        {L"c\r\nb\r\na\r\n", {2, 1, 0}},
        {L"b\r\nb\r\n", {-1, 0, -1}},
        {L"c\r\n", {-1, -1, 0}},
        {L"", {-1, -1, -1}},
        {L"x\r\n", {0, -1, -1}},
    };
    for (const auto &row : rows)
        EXPECT_EQ(row.places, ReadEdit(row.typed, "a\r\nb\r\nc\r\n").places) << row.typed;
}

class PreambleFiles : public testing::Test
{
protected:
    PreambleFiles()
    {
        for (int i = 0; i < 3; ++i)
            records[i].baseName = names[i];
        set.files = files;
        set.count = 3;
    }

    char names[3][8] = {"refs", "Refs", "refs"};
    BibFile records[3] = {};
    BibFile *files[3] = {&records[0], &records[1], &records[2]};
    BibFileSet set = {};
};

TEST_F(PreambleFiles, BeginWithTheRememberedOneOrTheLast)
{
    EXPECT_EQ(0, Preamble_FitFile(&set, 0));
    EXPECT_EQ(2, Preamble_FitFile(&set, 2));
    EXPECT_EQ(2, Preamble_FitFile(&set, 3));
    set.count = 0;
    EXPECT_EQ(-1, Preamble_FitFile(&set, 0));
}

TEST_F(PreambleFiles, AreTheLastOfTheirName)
{
    EXPECT_EQ(2, Preamble_FindFile(&set, "refs"));
    EXPECT_EQ(1, Preamble_FindFile(&set, "Refs"));
    EXPECT_EQ(-1, Preamble_FindFile(&set, "REFS"));
}

// tests/bib_outside_test.cpp - what stands between the items of a file is there again after a save.
#include "session/Changes.h"
#include "store/BibOutside.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include <btparse.h>

#include "encoding/Encoding.h"
#include "session/EntryRules.h"
#include "session/FileSet.h"
#include "session/KnownStrings.h"
#include "tests/support/LoadText.h"
#include "tests/support/TempFolder.h"
#include "ui/FieldGrid.h"
#include "ui/PreambleText.h"

using testing::HasSubstr;

namespace
{

class BibOutsideTest : public testing::Test
{
protected:
    TempFolder folder;
    BibFile *file = nullptr;

    BibOutsideTest()
    {
        setenv("CARTULO_LOG", "6", 1);
        Bib_Initialize();
        Enc_Select("CP1252");
    }
    ~BibOutsideTest() override
    {
        if (file)
            Bib_FreeFile(file);
    }

    void Load(const std::string &text)
    {
        if (file)
            Bib_FreeFile(file);
        file = Bib_LoadFile(folder.Write("a.bib", text).c_str());
        ASSERT_NE(nullptr, file);
    }

    std::string Saved()
    {
        EXPECT_EQ(1, Bib_SaveFile(file));
        return folder.Read("a.bib");
    }

    std::string SavedFrom(const std::string &text)
    {
        Load(text);
        EXPECT_EQ(0, file->errorCount) << Messages(file);
        return Saved();
    }

    // A save does not change the text.
    void ExpectKept(const std::string &text)
    {
        EXPECT_EQ(text, SavedFrom(text));
        EXPECT_EQ(text, SavedFrom(text)) << "the second time";
    }

    BibEntry *Entry(const std::string &key)
    {
        BibEntry *entry = file->entries;
        while (entry && key != entry->key)
            entry = entry->next;
        return entry;
    }

    void RemoveEntry(const std::string &key)
    {
        EXPECT_EQ(1, Change_RemoveEntry(nullptr, file, Entry(key)));
    }

    void RemoveString(const std::string &name)
    {
        Change_RemoveString(nullptr, file, String_Find(file, 0, name.c_str()));
    }

    // As the panel commits it.
    void Commit(const std::string &key, const std::wstring &value)
    {
        FieldGrid grid = {};
        Grid_Fill(&grid, Entry(key), Bib_Encoding(file));
        grid.rows[0].text = value;
        BibEntry *changed = Grid_Build(&grid, grid.entry->type);
        ASSERT_EQ(1, Change_ReplaceEntry(nullptr, file, Entry(key), changed));
    }

    void EditPreamble(const std::wstring &typed)
    {
        PreambleEdit edit = Preamble_Read(typed, file->preamble, Bib_Encoding(file));
        EXPECT_EQ(1, Change_SetPreamble(nullptr, file, edit.text.c_str(), edit.places.data(),
                                        int(edit.places.size())));
    }

    std::string MessagesOf(const std::string &text)
    {
        Load(text);
        return Messages(file);
    }
};

// Comment lines before, between and after items of all four kinds, in the order and layout of a
// save.
const char AllKinds[] = "% comment one\n"
                        "@COMMENT{one}\n"
                        "% comment two\n"
                        "@COMMENT{two}\n"
                        "\n"
                        "% piece one\n"
                        "@PREAMBLE{{a} }\n"
                        "\n"
                        "% piece two\n"
                        "@PREAMBLE{{b}\n"
                        "\t# {c} }\n"
                        "\n"
                        "% string s\n"
                        "@STRING{s = {S}}\n"
                        "% string t\n"
                        "@STRING{t = {T}}\n"
                        "\n"
                        "% entry a\n"
                        "@misc{a,\n\tx = {1 a}\n}\n"
                        "% entry b\n"
                        "@misc{b,\n\tx = {1 b}\n}\n"
                        "% entry c\n"
                        "@misc{c,\n\tx = {1 c}\n}\n"
                        "% end\n";

} // namespace

// --- Where it stands ---

TEST_F(BibOutsideTest, StaysWithTheItemThatFollows)
{
    ExpectKept(AllKinds);
}

TEST_F(BibOutsideTest, FollowsItsItemToThePlaceWhereThatIsWritten)
{
    EXPECT_EQ("% of the comment\n@COMMENT{c}\n\n"
              "% of the preamble\n@PREAMBLE{{p} }\n\n"
              "% of the string\n@STRING{s = {S}}\n\n"
              "% of the entry\n@misc{e,\n\tx = s\n}\n"
              "% at the end\n",
              SavedFrom("% of the entry\n@misc{e, x = s}\n% of the string\n@string{s = {S}}\n"
                        "% of the preamble\n@preamble{{p}}\n% of the comment\n@comment{c}\n"
                        "% at the end\n"));
}

TEST_F(BibOutsideTest, IsKeptLineByLine)
{
    ExpectKept("%% head\n\n\t  free words  \n% 50% {\"}\n@misc{a,\n}\n\\LaTeX{} #1 = 'x'\n"
               "@misc{b,\n}\n  ~ )\n");
}

TEST_F(BibOutsideTest, LosesTheEmptyLinesAroundItOnly)
{
    EXPECT_EQ("% a\n\n\n% b\n@misc{k,\n}\n  % c \n",
              SavedFrom("\n \n% a\n\n\n% b\n \t\n\n@misc{k,}\n\n\n  % c \n\n"));
    EXPECT_EQ("@misc{k,\n}\n@misc{l,\n}\n", SavedFrom("\n\n@misc{k,}\n \t \n\n@misc{l,}\n\n"));
}

TEST_F(BibOutsideTest, MayStandOnTheLineOfAnItem)
{
    EXPECT_EQ("before \n@misc{k,\n}\n % behind\n@misc{l,\n}\n.\n",
              SavedFrom("before @misc{k,} % behind\n @misc{l,}."));
    EXPECT_EQ(Saved(), SavedFrom(Saved()));
}

TEST_F(BibOutsideTest, MayHoldAnItemThatIsCommentedOut)
{
    ExpectKept("% @misc{old,\n%   x = {y}\n% }\n@misc{k,\n}\n");
    ExpectKept("@misc{k,\n}\n%@misc{old,\n  x = {y},\n}\n@misc{l,\n}\nmisc{m, x = {y}}\n");
}

TEST_F(BibOutsideTest, MayBeAllThereIs)
{
    ExpectKept("% nothing yet\n\n  % but this\n");
    EXPECT_EQ(0, file->warningCount);
    EXPECT_EQ("% a\n", SavedFrom("\n% a"));
}

TEST_F(BibOutsideTest, IsAWarningWhenItIsAllThereIsAndNoComment)
{
    ExpectKept("% to whom\nit may concern\n");
    EXPECT_EQ("WARNING: line 2: there is text in the file, but no item\r\n", Messages(file));
    Load("% the last item\nwords\n@misc{k,}\n");
    RemoveEntry("k");
    ExpectKept(Saved());
}

// As everywhere in a file: it would be one as soon as there is an entry.
TEST_F(BibOutsideTest, IsAnErrorWithMarksOfAbbreviations)
{
    Load("% a\2b\n");
    EXPECT_EQ(1, file->errorCount);
}

// Such as notes in UTF-16.
TEST_F(BibOutsideTest, IsAnErrorInAFileThatIsNoText)
{
    Load(std::string("\xFE\xFF\0n\0o", 6));
    EXPECT_EQ(1, file->errorCount);
}

TEST_F(BibOutsideTest, GoesToTheNextItemWhenItsOwnIsDropped)
{
    EXPECT_EQ("% a\n% b\n@STRING{s = {S}}\n\n", SavedFrom("% a\n@string{}\n% b\n@string{s = {S}}"));
}

// Each line was once searched again from every one of its characters.
TEST_F(BibOutsideTest, MayBeAVeryLongLine)
{
    const std::string text =
        "@misc{a,\n\tx = 1\n}\nnote, x = y\n% " + std::string(300000, ' ') + "z\n@misc{b,\n}\n";
    EXPECT_EQ(text, SavedFrom(text));
    EXPECT_EQ(0, file->errorCount) << Messages(file);
}

TEST_F(BibOutsideTest, KeepsFormFeeds)
{
    const std::string text = "@misc{a,\n}\n\f\n@misc{b,\n}\n";
    EXPECT_EQ(text, SavedFrom(text));
}

TEST_F(BibOutsideTest, StandsBeforeTheFirstOfSeveralAbbreviations)
{
    EXPECT_EQ("% a\n@STRING{s = {S}}\n@STRING{t = {T}}\n% b\n@STRING{u = {U}}\n\n",
              SavedFrom("% a\n@string{s = {S}, t = {T}}\n% b\n@string{u = {U}}\n"));
}

TEST_F(BibOutsideTest, KeepsItsBytes)
{
    std::string text = "%";
    for (int byte = 1; byte < 256; ++byte)
        if (!strchr("\2\5\n\r", byte)) // marks are errors, line ends become one
            text += static_cast<char>(byte);
    ExpectKept(text + "\n@misc{k,\n}\n");
}

TEST_F(BibOutsideTest, MayBeLong)
{
    std::string text;
    for (int i = 0; i < 20000; ++i)
        text += "% line " + std::to_string(i) + " of a long comment\n";
    ExpectKept(text + "@misc{k,\n}\n" + text);
    ExpectKept("% " + std::string(3000000, 'x') + "\n@misc{k,\n}\n");
}

// --- Editing ---

TEST_F(BibOutsideTest, StaysWhenItsItemIsRenamedOrChanged)
{
    Load(AllKinds);
    Change_RenameEntry(nullptr, file, Entry("b"), "z");
    Commit("z", L"changed");
    Commit("a", L"changed, too");
    Entry("c")->type = Bib_TypeIndex("book");
    EXPECT_EQ(1, Change_SetString(nullptr, file, String_Find(file, 0, "s"), "new"));
    EditPreamble(L"A\r\nb\r\nc!\r\n");
    std::string expected = AllKinds;
    for (auto [from, to] : {std::pair("{a}", "{A}"), std::pair("{c}", "{c!}"),
                            std::pair("{S}", "{new}"), std::pair("{1 a}", "{changed, too}"),
                            std::pair("misc{b,\n\tx = {1 b}", "misc{z,\n\tx = "
                                                              "{changed}"),
                            std::pair("@misc{c", "@book{c")})
        expected.replace(expected.find(from), strlen(from), to);
    EXPECT_EQ(expected, Saved());
}

TEST_F(BibOutsideTest, GoesToTheNextItemWhenItsOwnIsRemoved)
{
    Load(AllKinds);
    RemoveEntry("b");
    RemoveString("s");
    EditPreamble(L"b\r\nc\r\n");
    EXPECT_EQ("% comment one\n@COMMENT{one}\n% comment two\n@COMMENT{two}\n\n"
              "% piece one\n% piece two\n@PREAMBLE{{b}\n\t# {c} }\n\n"
              "% string s\n% string t\n@STRING{t = {T}}\n\n"
              "% entry a\n@misc{a,\n\tx = {1 a}\n}\n"
              "% entry b\n% entry c\n@misc{c,\n\tx = {1 c}\n}\n% end\n",
              Saved());
}

TEST_F(BibOutsideTest, GoesToTheNextKindWhenTheLastOfItsOwnIsRemoved)
{
    Load(AllKinds);
    RemoveString("t");
    RemoveString("s");
    RemoveEntry("c");
    EXPECT_EQ("% comment one\n@COMMENT{one}\n% comment two\n@COMMENT{two}\n\n"
              "% piece one\n@PREAMBLE{{a} }\n\n% piece two\n@PREAMBLE{{b}\n\t# {c} }\n\n"
              "% string s\n% string t\n% entry a\n@misc{a,\n\tx = {1 a}\n}\n"
              "% entry b\n@misc{b,\n\tx = {1 b}\n}\n% entry c\n% end\n",
              Saved());
}

TEST_F(BibOutsideTest, GoesToTheEndWhenNothingFollows)
{
    Load(AllKinds);
    EditPreamble(L"");
    for (const char *name : {"s", "t"})
        RemoveString(name);
    for (const char *key : {"c", "a", "b"})
        RemoveEntry(key);
    EXPECT_EQ("% comment one\n@COMMENT{one}\n% comment two\n@COMMENT{two}\n\n"
              "% piece one\n% piece two\n% string s\n% string t\n% entry a\n% entry b\n"
              "% entry c\n% end\n",
              Saved());
}

TEST_F(BibOutsideTest, IsNotThatOfANewItem)
{
    Load("% a\n@misc{a,\n}\n% b\n@misc{b,\n}\n% end\n");
    Bib_NewEntry(file, "new", "misc", "\0", 0);
    EXPECT_EQ(1, Change_AddString(nullptr, file, "s", "S"));
    EXPECT_EQ("@STRING{s = {S}}\n\n@misc{new,\n}\n% a\n@misc{a,\n}\n% b\n@misc{b,\n}\n% end\n",
              Saved());
}

// The new one may stand where the old one stood in memory.
TEST_F(BibOutsideTest, IsNotThatOfAnItemThatComesAfterARemoval)
{
    Load("% a\n@misc{a,\n}\n@misc{b,\n}\n");
    RemoveEntry("a");
    Bib_NewEntry(file, "c", "misc", "\0", 0);
    EXPECT_EQ("@misc{c,\n}\n% a\n@misc{b,\n}\n", Saved());
}

TEST_F(BibOutsideTest, FollowsThePiecesOfAPreambleThatMove)
{
    Load("% one\n@PREAMBLE{{a} }\n\n% two\n@PREAMBLE{{b} }\n\n% end\n");
    EditPreamble(L"b\r\nnew\r\na\r\n");
    EXPECT_EQ("% two\n@PREAMBLE{{b}\n\t# {new} }\n\n% one\n@PREAMBLE{{a} }\n\n% end\n", Saved());
    EditPreamble(L"a\r\n");
    EXPECT_EQ("% two\n% one\n@PREAMBLE{{a} }\n\n% end\n", Saved());
    EditPreamble(L"");
    EXPECT_EQ("% two\n% one\n% end\n", Saved());
}

TEST_F(BibOutsideTest, FollowsThePiecesThatGoToWhateverComesNext)
{
    const char piece[] = "% p\n@PREAMBLE{{a} }\n\n";
    for (const char *rest : {"% s\n@STRING{s = {S}}\n\n@misc{k,\n}\n% end\n",
                             "% k\n@misc{k,\n}\n% end\n", "% end\n"}) {
        Load(piece + std::string(rest));
        EditPreamble(L"");
        EXPECT_EQ("% p\n" + std::string(rest), Saved());
    }
}

TEST_F(BibOutsideTest, IsWrittenEvenWhenItsItemIsTakenAwayWithoutAWord)
{
    Load(AllKinds);
    BibComment *comments = file->comments;
    BibString *strings = file->strings;
    BibEntry *entries = file->entries;
    file->comments = nullptr;
    file->strings = nullptr;
    file->entries = nullptr;
    file->preamble[0] = 0;
    EXPECT_EQ("% comment one\n% comment two\n% piece one\n% piece two\n% string s\n% string t\n"
              "% entry a\n% entry b\n% entry c\n% end\n",
              Saved());
    file->comments = comments->next;
    file->strings = strings->next;
    file->entries = entries->next;
    EXPECT_EQ("@COMMENT{two}\n\n% comment one\n% comment two\n% piece one\n% piece two\n"
              "@STRING{t = {T}}\n\n% string s\n% string t\n@misc{b,\n\tx = {1 b}\n}\n"
              "@misc{c,\n\tx = {1 c}\n}\n% entry a\n% entry b\n% entry c\n% end\n",
              Saved());
    file->comments = comments;
    file->strings = strings;
    file->entries = entries;
}

TEST_F(BibOutsideTest, IsFoundAfterThisProcessHasParsedAnotherText)
{
    std::string path = folder.Write("c.bib", std::string(AllKinds) + AllKinds);
    FILE *stream = fopen(path.c_str(), "r");
    boolean status;
    while (AST *ast = bt_parse_entry(stream, path.data(), BTO_NOSTORE, &status))
        bt_free_ast(ast);
    fclose(stream);
    ExpectKept(AllKinds);
    ExpectKept("% head\n@misc{k,\n}\n");
}

TEST_F(BibOutsideTest, IsNotTakenFromTheEndByAnItemThatIsParsedLater)
{
    Load("@misc{a,\n}\n% end\n");
    FILE *stream = fopen(folder.Write("c.bib", "@misc{c,}\n").c_str(), "r");
    boolean status;
    AST *ast = bt_parse_entry(stream, const_cast<char *>("c.bib"), BTO_NOSTORE, &status);
    EXPECT_EQ(1, Bib_AddEntryFromAst(file, ast));
    bt_free_ast(ast);
    fclose(stream);
    EXPECT_EQ("@misc{c,\n}\n@misc{a,\n}\n% end\n", Saved());
}

// --- Messages ---

TEST_F(BibOutsideTest, IsNoCommentInsideAnItem)
{
    EXPECT_EQ("WARNING: line 3: a comment inside an entry is not kept when the file is saved\r\n"
              "WARNING: line 5: a comment inside an entry is not kept when the file is saved\r\n",
              MessagesOf("% kept\n@misc{k, x = {% text},\n% dropped\n y = {2}\n% }\n} % kept\n"));
    EXPECT_EQ(2, file->warningCount);
    EXPECT_EQ("% kept\n@misc{k,\n\tx = {% text},\n\ty = 2\n}\n % kept\n", Saved());
    EXPECT_EQ("WARNING: line 1: a comment inside an entry is not kept when the file is saved\r\n",
              MessagesOf("@string{a = %\n {b}}"));
}

TEST_F(BibOutsideTest, IsReportedByTheParserAsBefore)
{
    EXPECT_EQ("WARNING: line 3: 1 characters of junk seen at toplevel\r\n",
              MessagesOf("@misc{k, x = {y}\n}}\n@misc{l,}\n"));
    EXPECT_EQ(0, file->errorCount);
    EXPECT_EQ(1, file->warningCount);
    EXPECT_EQ("@misc{k,\n\tx = {y}\n}\n}\n@misc{l,\n}\n", Saved());
}

TEST_F(BibOutsideTest, IsAnErrorWhenItHasTheFieldsOfAnEntry)
{
    const char lost[] =
        "ERROR: line 3: fields stand outside an entry: there is a closing brace too many before "
        "them\r\n";
    for (const char *text : {"@misc{k,\n x = {y}},\n z = 12\n}\n", "@misc{k,\n x = {y}}\n z = 12 }",
                             "@misc(k,\n x = {y}),\n z = 12)\n", "@misc(k,\n x = {y}},\n z = 12)",
                             "@misc{k,\n x = {y}},\n z = 12\n@misc{l,}"}) {
        EXPECT_THAT(MessagesOf(text), HasSubstr(lost)) << text;
        EXPECT_EQ(1, file->errorCount) << text;
    }
}

TEST_F(BibOutsideTest, IsReportedForEveryEntryThatLostFields)
{
    std::string text;
    for (int i = 0; i < 30000; ++i)
        text += "@misc{k" + std::to_string(i) + ",\n x = {y}},\n z = 12\n}\n";
    Load(text);
    EXPECT_EQ(30000, file->errorCount);
    EXPECT_THAT(Messages(file), HasSubstr("ERROR: line 7: fields stand outside"));
}

// Else they would leave no room for more important messages.
TEST_F(BibOutsideTest, IsListedForTheFirstCommentsInsideItemsOnly)
{
    std::string text;
    for (int i = 0; i < 100001; ++i)
        text += "@misc{k,\n% dropped\n}\n";
    Load(text + "@misc{k, x = {y}},\n z = 12\n}\n");
    EXPECT_EQ(100001, file->warningCount);
    EXPECT_EQ(1, file->errorCount);
    EXPECT_THAT(Messages(file), HasSubstr("ERROR: line 300005: fields stand outside"));
    EXPECT_THAT(Messages(file), HasSubstr("WARNING: line 149: a comment inside an entry"));
    EXPECT_THAT(Messages(file), testing::Not(HasSubstr("line 152")));
}

// --- The form of the file ---

TEST_F(BibOutsideTest, HasTheLineEndsOfTheFile)
{
    const std::string text = "% a\r\n\r\n% b\r\n@COMMENT{c}\r\n\r\n@PREAMBLE{{p}\r\n\t# {q} }\r\n"
                             "\r\n@STRING{s = {S}}\r\n\r\n@misc{k,\r\n\tx = {y}\r\n}\r\n% end\r\n";
    ExpectKept(text);
    EXPECT_EQ(BIB_FORM_CRLF, file->form);
    std::string plain = text;
    for (size_t at = plain.find('\r'); at != plain.npos; at = plain.find('\r', at))
        plain.erase(at, 1);
    ExpectKept(plain);
    EXPECT_EQ(0, file->form);
}

TEST_F(BibOutsideTest, HasPlainLineEndsUnlessAllAreOthers)
{
    EXPECT_EQ("@misc{k,\r\n}\r\n", SavedFrom("@misc{k,}\r\n"));
    EXPECT_EQ("@misc{k,\r\n}\r\n", SavedFrom("\r\n@misc{k,}"));
    for (const char *text : {"@misc{k,\r\n}\n", "@misc{k,\n}\r\n", "@misc{k,\r}\r\n",
                             "@misc{k,\r}\r", "@misc{k,}\r\n\r", "@misc{k,}"})
        EXPECT_EQ("@misc{k,\n}\n", SavedFrom(text)) << text;
}

TEST_F(BibOutsideTest, EndsLinesInValuesLikeTheOthers)
{
    Load("@misc{k, x = {y}}\r\n");
    Commit("k", L"a\nb\r\nc");
    EXPECT_EQ("@misc{k,\r\n\tx = {a\r\nb\r\nc}\r\n}\r\n", Saved());
}

TEST_F(BibOutsideTest, ComesAfterTheByteOrderMark)
{
    ExpectKept("\xEF\xBB\xBF% a\n@misc{k,\n}\n");
    EXPECT_EQ(0, file->warningCount);
    EXPECT_EQ(BIB_FORM_MARK, file->form);
    EXPECT_EQ("\xEF\xBB\xBF@COMMENT{c}\n\n% a\n@misc{k,\n}\n",
              SavedFrom("\xEF\xBB\xBF% a\n@misc{k,}\n@comment{c}\n"));
    ExpectKept("\xEF\xBB\xBF@misc{k,\r\n}\r\n");
    ExpectKept("\xEF\xBB\xBF% all\n");
}

// As in the middle of files that were put together.
TEST_F(BibOutsideTest, HasNoByteOrderMarkOfItsOwn)
{
    EXPECT_EQ("@COMMENT{c}\n\n@misc{a,\n}\n", SavedFrom("@misc{a,}\n\xEF\xBB\xBF@comment{c}\n"));
    EXPECT_EQ("% b\n@COMMENT{c}\n\n@misc{a,\n}\n",
              SavedFrom("@misc{a,}\n\xEF\xBB\xBF% b\n@comment{c}\n"));
}

TEST_F(BibOutsideTest, IsCountedForTheFormOfTheFile)
{
    Load("% M\xFCller\n@misc{k,\n}\n");
    EXPECT_EQ(BIB_FORM_CODE_PAGE, file->form);
    Load("% M\xC3\xBCller\n@misc{k,\n}\n");
    EXPECT_EQ(0, file->form);
}

TEST_F(BibOutsideTest, TellsOfAFileThatOnlyBeginsAsUtf8)
{
    const std::string text = "% M\xC3\xBCller\n@misc{k,\n\tx = {M\xFCller}\n}\n";
    EXPECT_EQ("", MessagesOf(text));
    Enc_Select("CP65001");
    EXPECT_EQ(
        "WARNING: line 3: this is no UTF-8 any more, so the whole file is taken for CP1252\r\n",
        MessagesOf(text));
    EXPECT_EQ(text, Saved());
    EXPECT_EQ("", MessagesOf("% M\xFCller\n@misc{k,\n}\n"));
    EXPECT_EQ(
        "WARNING: line 2: this is no UTF-8 any more, so the whole file is taken for CP1252\r\n",
        MessagesOf("\xEF\xBB\xBF@misc{k,\n\tx = {M\xFCller}\n}\n"));
}

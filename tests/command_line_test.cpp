// tests/command_line_test.cpp - tokens, file names, and the files that a command line opens.
#include "session/CommandLine.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include <unistd.h>

#include <gtest/gtest.h>

#include "base/Sys.h"
#include "encoding/Encoding.h"

namespace fs = std::filesystem;

namespace
{

std::string ReadText(const std::string &path)
{
    std::ifstream stream(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(stream), {}};
}

void WriteText(const std::string &path, const std::string &text)
{
    std::ofstream(path, std::ios::binary) << text;
}

// The log is opened once in a process, so all tests of a run share its file.
const std::string &LogFile()
{
    static const struct File {
        File()
        {
            char name[] = "/tmp/cartulo-log-XXXXXX";
            int fd = mkstemp(name);
            if (fd >= 0)
                close(fd);
            path = name;
        }
        ~File() { fs::remove(path); }
        std::string path;
    } file;
    return file.path;
}

// Sees the trace lines since the start of the test.
class Traced : public ::testing::Test
{
protected:
    void SetUp() override
    {
        setenv("CARTULO_LOG", ("1:" + LogFile()).c_str(), 1);
        logStart = ReadText(LogFile()).size();
    }

    std::vector<std::string> LogLines() const
    {
        std::vector<std::string> lines;
        std::string text = ReadText(LogFile()).substr(logStart);
        for (size_t start = 0, end; (end = text.find('\n', start)) != text.npos; start = end + 1)
            lines.push_back(text.substr(start, end - start));
        return lines;
    }

    long Logged(const std::string &line) const
    {
        std::vector<std::string> lines = LogLines();
        return std::count(lines.begin(), lines.end(), line);
    }

    size_t logStart = 0;
};

using Tokens = std::vector<std::string>;

Tokens Split(const char *text, size_t size = TOKEN_SIZE)
{
    Tokens tokens;
    std::vector<char> token(size);
    while ((text = NextToken(text, token.data(), size)))
        tokens.push_back(token.data());
    return tokens;
}

} // namespace

// --- BuildCommandLine ---

using BuildCommandLineTest = Traced;

TEST(CommandStartUp, IsAloneWithoutAFolder)
{
    StartUp start = Command_StartUp("refs.bib -d/home/");
    EXPECT_EQ("Cartulo", start.instance);
    EXPECT_EQ("", start.baseFolder);
    EXPECT_STREQ("refs.bib -d/home/", start.commandLine);
    EXPECT_STREQ("", Command_StartUp("").commandLine);
}

TEST(CommandStartUp, ServesTheFolderOfTheFirstArgument)
{
    StartUp start = Command_StartUp("-d/home/u/ refs.bib -eCP1250");
    EXPECT_EQ("Cartulo-/home/u/", start.instance);
    EXPECT_EQ("/home/u/", start.baseFolder);
    EXPECT_STREQ("refs.bib -eCP1250", start.commandLine);
}

TEST(CommandStartUp, IgnoresTheCaseOfTheOptionAndTurnsBackslashes)
{
    StartUp start = Command_StartUp("-DC:\\work\\");
    EXPECT_EQ("Cartulo-C:/work/", start.instance);
    EXPECT_EQ("C:\\work\\", start.baseFolder);
    EXPECT_STREQ("", start.commandLine);
}

TEST(CommandStartUp, TakesAFolderInQuotes)
{
    StartUp start = Command_StartUp("\"-d/my papers/\" a");
    EXPECT_EQ("/my papers/", start.baseFolder);
    EXPECT_STREQ("a", start.commandLine);
}

TEST(CommandStartUp, LeavesAFolderThatIsTooLongToThePanel)
{
    std::string fits = "-d" + std::string(BASE_FOLDER_SIZE - 1, 'x');
    EXPECT_EQ(BASE_FOLDER_SIZE - 1u, Command_StartUp(fits.c_str()).baseFolder.size());
    std::string line = fits + "x";
    StartUp start = Command_StartUp(line.c_str());
    EXPECT_EQ("Cartulo", start.instance);
    EXPECT_EQ("", start.baseFolder);
    EXPECT_EQ(line, start.commandLine);
}

TEST_F(BuildCommandLineTest, JoinsTheArgumentsFromTheSecondOn)
{
    const char *argv[] = {"cartulo", "-d/work", "refs", "more.bib"};
    EXPECT_STREQ("-d/work refs more.bib", BuildCommandLine(4, argv));
    EXPECT_EQ(1, Logged("INFO: Command_Line - -d/work refs more.bib"));
}

TEST_F(BuildCommandLineTest, IsEmptyWithoutArguments)
{
    const char *argv[] = {"cartulo"};
    EXPECT_STREQ("", BuildCommandLine(1, argv));
    EXPECT_STREQ("", BuildCommandLine(0, argv));
}

TEST_F(BuildCommandLineTest, QuotesAnArgumentWithABlankOnly)
{
    const char *argv[] = {"cartulo", "my refs", "tab\there", "", "it's", "a \"b\""};
    EXPECT_STREQ("\"my refs\" tab\there  it's \"a \"b\"\"", BuildCommandLine(6, argv));
}

TEST_F(BuildCommandLineTest, TakesALineThatJustFits)
{
    std::string longest(COMMAND_LINE_SIZE - 1, 'x');
    const char *argv[] = {"cartulo", longest.c_str()};
    EXPECT_EQ(longest, BuildCommandLine(2, argv));
}

TEST_F(BuildCommandLineTest, RefusesALineThatDoesNotFit)
{
    std::string tooLong(COMMAND_LINE_SIZE - 2, 'x');
    const char *argv[] = {"cartulo", tooLong.c_str(), "y"};
    EXPECT_EQ(nullptr, BuildCommandLine(3, argv));
    ASSERT_EQ(1u, LogLines().size());
    EXPECT_EQ(0u, LogLines()[0].find("Cartulo: ERROR: Command line too long: xxx"));
}

// --- Command_QuoteArgument ---

TEST(CommandQuote, TakesTheKindThatTheTextDoesNotHold)
{
    EXPECT_EQ("\"a b\"", Command_Quote("a b"));
    EXPECT_EQ("\"it's\"", Command_Quote("it's"));
    EXPECT_EQ("'a \"b\"'", Command_Quote("a \"b\""));
    EXPECT_EQ("", Command_Quote("it's \"b\""));
}

TEST(CommandQuoteArgument, LeavesPlainArguments)
{
    EXPECT_EQ("refs.bib", Command_QuoteArgument("refs.bib"));
    EXPECT_EQ("", Command_QuoteArgument(""));
    EXPECT_EQ("a\"b", Command_QuoteArgument("a\"b"));
}

TEST(CommandQuoteArgument, QuotesBytesThatTheTokenizerCutsAt)
{
    EXPECT_EQ("\"M\xC3\xBCller.bib\"", Command_QuoteArgument("M\xC3\xBCller.bib"));
    EXPECT_EQ("\"it's\xFF\"", Command_QuoteArgument("it's\xFF"));
}

TEST(CommandQuoteArgument, TakesTheOtherQuoteAroundADoubleQuote)
{
    EXPECT_EQ("'a\"\xE4'", Command_QuoteArgument("a\"\xE4"));
}

TEST(CommandQuoteArgument, LeavesWhatHoldsBothQuotes)
{
    EXPECT_EQ("a\"'\xE4", Command_QuoteArgument("a\"'\xE4"));
}

TEST(CommandQuoteArgument, LeavesBlanksToTheJoining)
{
    EXPECT_EQ("M\xFCller 2.bib", Command_QuoteArgument("M\xFCller 2.bib"));
}

TEST(CommandQuoteArgument, MakesTheTokenizerGiveTheArgumentBack)
{
    for (const char *argument :
         {"M\xC3\xBCller.bib", "\xC3\xBC", "it's\xFF", "a\"\xE4", "-d/b\xFC/"})
        EXPECT_EQ(Tokens{argument}, Split(Command_QuoteArgument(argument).c_str()));
}

// --- NextToken ---

TEST(NextTokenTest, SplitsAtBlanksAndControlCharacters)
{
    EXPECT_EQ((Tokens{"a", "b", "c", "d"}), Split(" a\tb\n\x01 c  d "));
}

TEST(NextTokenTest, HasNoneInNothing)
{
    char out[8] = "old";
    EXPECT_EQ(nullptr, NextToken(nullptr, out, sizeof out));
    EXPECT_STREQ("", out);
    strcpy(out, "old");
    EXPECT_EQ(nullptr, NextToken(" \t\r\n", out, sizeof out));
    EXPECT_STREQ("", out);
}

TEST(NextTokenTest, ReturnsTheStartOfTheFollowingToken)
{
    char out[8];
    EXPECT_STREQ("bc d", NextToken("a  bc d", out, sizeof out));
    EXPECT_STREQ("", NextToken("a  ", out, sizeof out));
}

TEST(NextTokenTest, TakesTextInQuotesOfEitherKind)
{
    EXPECT_EQ((Tokens{"my refs", "a\"b", "it's"}), Split("\"my refs\" 'a\"b' \"it's\""));
}

TEST(NextTokenTest, EndsAQuotedTokenAtItsQuoteEvenWithoutABlank)
{
    EXPECT_EQ((Tokens{"a b", "c"}), Split("\"a b\"c"));
}

TEST(NextTokenTest, RunsToTheEndWithoutAClosingQuote)
{
    EXPECT_EQ((Tokens{"a b "}), Split("'a b "));
    EXPECT_EQ((Tokens{""}), Split("\""));
}

TEST(NextTokenTest, GivesAnEmptyTokenForEmptyQuotes)
{
    EXPECT_EQ((Tokens{"", "a"}), Split("\"\" a"));
}

TEST(NextTokenTest, KeepsQuotesInsideAToken)
{
    EXPECT_EQ((Tokens{"a\"b", "c\""}), Split("a\"b c\""));
}

TEST(NextTokenTest, KeepsHighBytesInQuotes)
{
    EXPECT_EQ((Tokens{"M\xFCller"}), Split("'M\xFCller'"));
}

TEST(NextTokenTest, EndsAnUnquotedTokenAtAHighByteAndStays)
{
    char out[16];
    const char *rest = NextToken("M\xFCller b", out, sizeof out);
    EXPECT_STREQ("M", out);
    EXPECT_STREQ("\xFCller b", rest);
    EXPECT_EQ(rest, NextToken(rest, out, sizeof out));
    EXPECT_STREQ("", out);
}

TEST(NextTokenTest, CutsALongTokenButStepsOverAllOfIt)
{
    EXPECT_EQ((Tokens{"abc", "ij"}), Split("abcdefgh ij", 4));
    EXPECT_EQ((Tokens{"abc", "ij"}), Split("'abcdefgh' ij", 4));
    EXPECT_EQ((Tokens{"", ""}), Split("a b", 1));
}

// --- Command_ResolveName ---

namespace
{

class InFolder : public Traced
{
protected:
    void SetUp() override
    {
        Traced::SetUp();
        char name[] = "/tmp/cartulo-command-XXXXXX";
        ASSERT_NE(nullptr, mkdtemp(name));
        folder = std::string(name) + "/";
        SetBase(folder);
    }

    void TearDown() override { fs::remove_all(folder); }

    void SetBase(const std::string &base) { strcpy(state.baseFolder, base.c_str()); }

    std::string Write(const std::string &name, const std::string &text = "")
    {
        WriteText(folder + name, text);
        return folder + name;
    }

    std::string folder; // with a '/' at its end
    CommandState state = {};
};

class CommandResolveName : public InFolder
{
protected:
    // The path, with a '?' in front when it does not exist.
    std::string Resolve(const std::string &token)
    {
        std::string path;
        return Command_ResolveName(&state, token.c_str(), &path) ? path : "?" + path;
    }
};

char *FindNothing(const char *)
{
    return nullptr;
}

char *FindInLibrary(const char *name)
{
    return strdup((std::string("/library/") + name + ".found").c_str());
}

} // namespace

TEST_F(CommandResolveName, GivesARelativeNameTheEndingWhenItHasNoDot)
{
    std::string path = Write("refs.bib");
    EXPECT_EQ(path, Resolve("refs"));
    EXPECT_EQ(path, Resolve("refs.bib"));
    EXPECT_EQ(2, Logged("Cartulo: Check: " + path));
}

TEST_F(CommandResolveName, TakesARelativeNameWithADotAsItStands)
{
    std::string path = Write("refs.old");
    Write("refs.old.bib");
    EXPECT_EQ(path, Resolve("refs.old"));
    EXPECT_EQ("?" + folder + "./refs", Resolve("./refs"));
}

TEST_F(CommandResolveName, LooksForTheDotInTheNameAlone)
{
    fs::create_directory(folder + "v1.2");
    std::string path = Write("v1.2/refs.bib");
    SetBase(folder + "v1.2/");
    EXPECT_EQ(path, Resolve("refs"));
}

TEST_F(CommandResolveName, DropsWhatFollowsTheLastSeparatorOfTheBaseFolder)
{
    std::string path = Write("refs.bib");
    SetBase(folder + "work");
    EXPECT_EQ(path, Resolve("refs"));
    SetBase("C:\\work");
    EXPECT_EQ("?C:\\name.bib", Resolve("name"));
    SetBase("/a\\b/c\\d");
    EXPECT_EQ("?/a\\b/c\\name.bib", Resolve("name"));
}

TEST_F(CommandResolveName, TakesTheNameAloneWhenTheBaseFolderHasNoSeparator)
{
    SetBase("work");
    EXPECT_EQ("?cartulo-no-such-name.bib", Resolve("cartulo-no-such-name"));
    SetBase("");
    EXPECT_EQ("?cartulo-no-such-name.bib", Resolve("cartulo-no-such-name"));
}

TEST_F(CommandResolveName, GivesAnAbsoluteNameTheEndingUnlessItHasIt)
{
    std::string path = Write("refs.bib");
    EXPECT_EQ(path, Resolve(folder + "refs"));
    EXPECT_EQ(path, Resolve(path));
    Write("old.BIB");
    EXPECT_EQ(folder + "old.BIB", Resolve(folder + "old.BIB"));
    EXPECT_EQ("?" + folder + "refs.old.bib", Resolve(folder + "refs.old"));
    EXPECT_EQ(1, Logged("Cartulo: Check: " + folder + "refs.old.bib"));
}

TEST_F(CommandResolveName, KnowsAbsoluteNamesOfBothKinds)
{
    EXPECT_EQ("?C:\\refs.bib", Resolve("C:\\refs"));
    EXPECT_EQ("?C:\\refs.BIB", Resolve("C:\\refs.BIB"));
    EXPECT_EQ("?\\\\server\\refs.bib", Resolve("\\\\server\\refs"));
    EXPECT_EQ("?" + folder + "\\refs.bib", Resolve("\\refs"));
}

TEST_F(CommandResolveName, AddsTheEndingToAnAbsoluteNameOfFourCharacters)
{
    EXPECT_EQ("?/bib.bib", Resolve("/bib"));
    EXPECT_EQ("?C:.b.bib", Resolve("C:.b"));
}

TEST_F(CommandResolveName, AsksTheEnvironmentForARelativeNameOnly)
{
    state.findBib = FindInLibrary;
    EXPECT_EQ("/library/refs.found", Resolve("refs"));
    EXPECT_EQ("?/no/such/refs.bib", Resolve("/no/such/refs"));
    std::string path = Write("refs.bib");
    EXPECT_EQ(path, Resolve("refs"));
    state.findBib = FindNothing;
    EXPECT_EQ("?" + folder + "none.bib", Resolve("none"));
}

// --- Command_Process ---

namespace
{

class CommandProcess : public InFolder
{
protected:
    void SetUp() override
    {
        InFolder::SetUp();
        if (BibTypeCount == 0)
            Bib_Initialize();
        set.box = [](void *owner, const char *caption, const char *text) {
            static_cast<CommandProcess *>(owner)->boxes.push_back(std::string(caption) + "|" +
                                                                  text);
        };
        set.boxOwner = this;
    }

    void TearDown() override
    {
        FileSet_Free(&set);
        InFolder::TearDown();
    }

    CommandResult Run(const std::string &line)
    {
        return Command_Process(&set, &state, line.c_str());
    }

    std::string WriteBib(const std::string &name)
    {
        return Write(name, "@Book{knuth84,\n  title = {The TeXbook}\n}\n");
    }

    // Replaces the title of the file's first entry.
    void Edit(BibFile *file, const char *title)
    {
        BibField *field = &file->entries->fields[0];
        free(field->value);
        field->value = Bib_CopyText(title, strlen(title));
        file->modified = 1;
    }

    Tokens Names() const
    {
        Tokens names;
        for (int i = 0; i < set.count; ++i)
            names.push_back(fs::path(set.files[i]->path).filename());
        return names;
    }

    std::string LoadErrors() const { return set.loadErrors ? set.loadErrors : ""; }

    // 1 when nobody holds the lock.
    int CanBeLocked(const std::string &path)
    {
        int handle = Sys_LockFile(path.c_str());
        Sys_UnlockFile(handle);
        return handle != 0;
    }

    // Takes what is in the folder away, so that saving there fails, and puts it back.
    void BreakFolder(const std::string &name)
    {
        fs::rename(folder + name, folder + name + ".away");
    }
    void MendFolder(const std::string &name)
    {
        fs::remove_all(folder + name);
        fs::rename(folder + name + ".away", folder + name);
    }

    BibFileSet set = {};
    std::vector<std::string> boxes;
};

} // namespace

TEST_F(CommandProcess, OpensNothingForAnEmptyLine)
{
    CommandResult result = Run("");
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ(0, result.changes);
    EXPECT_EQ(0, set.count);
    EXPECT_EQ(1, Logged("Cartulo: Command: "));
}

TEST_F(CommandProcess, OpensTheNamedFilesInTheirOrder)
{
    std::string first = WriteBib("b.bib");
    std::string second = WriteBib("a.bib");
    CommandResult result = Run("b " + second);
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ(2, result.changes);
    EXPECT_EQ((Tokens{"b.bib", "a.bib"}), Names());
    EXPECT_NE(0, set.files[0]->lockHandle);
    EXPECT_STREQ("knuth84", set.files[1]->entries->key);
    EXPECT_EQ(1, Logged("Cartulo: Command: b " + second));
    EXPECT_EQ(1, Logged("Cartulo: Check: " + first));
    EXPECT_EQ(1, Logged("Cartulo: Loading: " + first));
    EXPECT_EQ("", LoadErrors());
}

TEST_F(CommandProcess, OpensAQuotedName)
{
    WriteBib("my M\xC3\xBCller.bib");
    EXPECT_EQ(0, Run("\"my M\xC3\xBCller\"").errors);
    EXPECT_EQ(1, set.count);
}

TEST_F(CommandProcess, ReportsAFileThatIsNotThereAndGoesOn)
{
    WriteBib("a.bib");
    CommandResult result = Run("none /no/such/name a");
    EXPECT_EQ(2, result.errors);
    EXPECT_EQ(1, result.changes);
    EXPECT_EQ((Tokens{"a.bib"}), Names());
    EXPECT_EQ("ERROR: The file 'none' not found\nERROR: The file '/no/such/name' not found\n",
              LoadErrors());
    EXPECT_EQ(1, Logged("Cartulo: ERROR: Can't locate Bib-file: none"));
    EXPECT_EQ(1, Logged("Cartulo: ERROR: Can't locate Bib-file: /no/such/name"));
}

TEST_F(CommandProcess, CountsTheErrorsInAFile)
{
    Write("broken.bib", "@Book{knuth84,\n  title = {The TeXbook}\n  author = {Knuth}\n}\n");
    CommandResult result = Run("broken");
    ASSERT_EQ(1, set.count);
    EXPECT_GT(result.errors, 0);
    EXPECT_EQ(set.files[0]->errorCount, result.errors);
    EXPECT_EQ(1, result.changes);
}

TEST_F(CommandProcess, KeepsAFileThatIsNamedAgainWithItsEdits)
{
    std::string path = WriteBib("a.bib");
    Run("a");
    BibFile *file = set.files[0];
    file->modified = 1;
    CommandResult result = Run("a.bib");
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ(0, result.changes);
    ASSERT_EQ(1, set.count);
    EXPECT_EQ(file, set.files[0]);
    EXPECT_EQ(1, file->inUse);
    EXPECT_EQ(1, file->modified);
    EXPECT_NE(0, file->lockHandle);
    EXPECT_EQ(1, Logged("Cartulo: Loading: " + path));
    EXPECT_EQ(1, Logged("Cartulo: Reused Bib file: " + path));
}

TEST_F(CommandProcess, KeepsAFileWhoseNameDiffersInCaseOnly)
{
    std::string path = WriteBib("a.bib");
    fs::create_symlink("a.bib", folder + "A.BIB");
    Run("a");
    BibFile *file = set.files[0];
    EXPECT_EQ(0, Run("A.BIB").changes);
    ASSERT_EQ(1, set.count);
    EXPECT_EQ(file, set.files[0]);
}

TEST_F(CommandProcess, TellsTwoFilesApartWhoseNamesDifferInCaseOnly)
{
    WriteBib("a.bib");
    WriteBib("A.bib");
    Run("a");
    EXPECT_EQ(2, Run("A").changes);
    EXPECT_EQ((Tokens{"A.bib"}), Names());
}

TEST_F(CommandProcess, ReportsAChangeWhenReuseReordersTheFiles)
{
    WriteBib("a.bib");
    WriteBib("b.bib");
    Run("a b");
    EXPECT_EQ(1, Run("b a").changes);
    EXPECT_EQ((Tokens{"b.bib", "a.bib"}), Names());
    EXPECT_EQ(0, Run("b a").changes);
}

TEST_F(CommandProcess, ListsAnOpenFileTwiceThatIsNamedTwice)
{
    WriteBib("a.bib");
    Run("a");
    BibFile *file = set.files[0];
    Run("a a");
    ASSERT_EQ(2, set.count);
    EXPECT_EQ(file, set.files[0]);
    EXPECT_EQ(file, set.files[1]);
}

TEST_F(CommandProcess, ClosesOnceAFileThatIsListedTwice)
{
    std::string path = WriteBib("a.bib");
    Run("a");
    Run("a a");
    EXPECT_EQ(1, Run("").changes);
    EXPECT_EQ(0, set.count);
    EXPECT_EQ(1, Logged("Cartulo: Close Unused Bib file: " + path));
}

TEST_F(CommandProcess, LoadsANewFileTwiceThatIsNamedTwice)
{
    WriteBib("a.bib");
    CommandResult result = Run("a a");
    EXPECT_EQ(2, result.changes);
    EXPECT_EQ(0, result.errors);
    ASSERT_EQ(2, set.count);
    EXPECT_NE(set.files[0], set.files[1]);
    EXPECT_EQ(0, set.files[0]->readOnly);
    EXPECT_EQ(1, set.files[1]->readOnly);
    EXPECT_EQ(0, set.files[1]->lockHandle);
    EXPECT_TRUE(boxes.empty());
}

TEST_F(CommandProcess, ClosesFilesThatAreNotNamedAgain)
{
    std::string first = WriteBib("a.bib");
    WriteBib("b.bib");
    std::string before = ReadText(first);
    Run("a b");
    CommandResult result = Run("b");
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ(1, result.changes);
    EXPECT_EQ((Tokens{"b.bib"}), Names());
    EXPECT_EQ(before, ReadText(first));
    EXPECT_TRUE(CanBeLocked(first));
    EXPECT_EQ(1, Logged("Cartulo: Close Unused Bib file: " + first));
}

TEST_F(CommandProcess, SavesAndClosesEverythingWhenNothingIsNamedAgain)
{
    std::string first = WriteBib("a.bib");
    std::string second = WriteBib("b.bib");
    WriteBib("c.bib");
    Run("a b");
    Edit(set.files[0], "One");
    Edit(set.files[1], "Two");
    EXPECT_EQ(3, Run("c").changes);
    EXPECT_EQ((Tokens{"c.bib"}), Names());
    EXPECT_NE(std::string::npos, ReadText(first).find("One"));
    EXPECT_NE(std::string::npos, ReadText(second).find("Two"));
    EXPECT_TRUE(CanBeLocked(first));
    EXPECT_TRUE(CanBeLocked(second));
    EXPECT_TRUE(boxes.empty());
}

TEST_F(CommandProcess, SavesAFileFirstThatIsOpenUnderAnotherName)
{
    WriteBib("a.bib");
    Run("a");
    Edit(set.files[0], "Edited");
    CommandResult result = Run("./a.bib");
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ(2, result.changes);
    ASSERT_EQ(1, set.count);
    EXPECT_EQ(folder + "./a.bib", set.files[0]->path);
    EXPECT_STREQ("Edited", set.files[0]->entries->fields[0].value);
    EXPECT_EQ(0, set.files[0]->readOnly);
    EXPECT_NE(0, set.files[0]->lockHandle);
}

TEST_F(CommandProcess, KeepsAFileOpenThatCannotBeSaved)
{
    fs::create_directory(folder + "sub");
    std::string path = WriteBib("sub/a.bib");
    WriteBib("b.bib");
    Run("sub/a.bib b");
    BibFile *file = set.files[0];
    Edit(file, "Unsaved");

    BreakFolder("sub");
    CommandResult result = Run("b");
    EXPECT_EQ(1, result.errors);
    EXPECT_EQ(1, result.changes);
    EXPECT_EQ((Tokens{"b.bib", "a.bib"}), Names());
    EXPECT_EQ(file, set.files[1]);
    EXPECT_EQ(1, file->modified);
    EXPECT_EQ("ERROR: The file '" + path +
                  "' could not be saved (No such file or directory), it stays open\n",
              LoadErrors());

    MendFolder("sub");
    EXPECT_EQ(0, Run("b").errors);
    EXPECT_EQ((Tokens{"b.bib"}), Names());
    EXPECT_NE(std::string::npos, ReadText(path).find("Unsaved"));
}

TEST_F(CommandProcess, KeepsEarlierLoadErrors)
{
    Run("one");
    Run("two");
    EXPECT_EQ("ERROR: The file 'one' not found\nERROR: The file 'two' not found\n", LoadErrors());
}

TEST_F(CommandProcess, StopsAtAHighByteOutsideQuotesAndSaysSo)
{
    WriteBib("a.bib");
    WriteBib("b.bib");
    CommandResult result = Run("a  \xFC b");
    EXPECT_EQ(1, result.errors);
    EXPECT_EQ((Tokens{"a.bib"}), Names());
    EXPECT_NE(std::string::npos, LoadErrors().find("'\xFC b'"));
    EXPECT_EQ(1, Logged("Cartulo: ERROR: Command line not understood from: \xFC b"));
}

TEST_F(CommandProcess, StopsAtAHighByteAtTheStart)
{
    CommandResult result = Run(" \xFC");
    EXPECT_EQ(1, result.errors);
    EXPECT_NE(std::string::npos, LoadErrors().find("'\xFC'"));
}

TEST_F(CommandProcess, CutsANameAtAHighByteAndReportsBothParts)
{
    CommandResult result = Run("M\xFCller.bib");
    EXPECT_EQ(2, result.errors);
    EXPECT_NE(std::string::npos, LoadErrors().find("'M' not found"));
    EXPECT_NE(std::string::npos, LoadErrors().find("'\xFCller.bib'"));
}

TEST_F(CommandProcess, RefusesALineThatIsTooLong)
{
    WriteBib("a.bib");
    Run("a");
    BibFile *file = set.files[0];
    CommandResult result = Run("b " + std::string(COMMAND_LINE_SIZE, 'x'));
    EXPECT_EQ(1, result.errors);
    EXPECT_EQ(0, result.changes);
    ASSERT_EQ(1, set.count);
    EXPECT_EQ(file, set.files[0]);
    EXPECT_EQ("ERROR: The command line is longer than 1023 characters, nothing of it was carried "
              "out\n",
              LoadErrors());
}

TEST_F(CommandProcess, TakesALineThatJustFits)
{
    std::string line(COMMAND_LINE_SIZE - 1, ' ');
    EXPECT_EQ(0, Run(line).errors);
    EXPECT_EQ(1, Run(line + " ").errors);
}

TEST_F(CommandProcess, RefusesWhatCouldNotBeBuilt)
{
    WriteBib("a.bib");
    Run("a");
    CommandResult result = Command_Process(&set, &state, nullptr);
    EXPECT_EQ(1, result.errors);
    EXPECT_EQ(0, result.changes);
    EXPECT_EQ(1, set.count);
    EXPECT_NE("", LoadErrors());
}

// --- Options ---

TEST_F(CommandProcess, IgnoresTheOptionsAAndB)
{
    CommandResult result = Run("-a -bcd");
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ((Tokens{"Cartulo: Command: -a -bcd"}), LogLines());
}

TEST_F(CommandProcess, LogsAnUnknownOption)
{
    CommandResult result = Run("-x -D/tmp/ -");
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ(folder, state.baseFolder);
    EXPECT_EQ((Tokens{"Cartulo: Command: -x -D/tmp/ -", "Cartulo: Unknown argument: -x",
                      "Cartulo: Unknown argument: -D/tmp/", "Cartulo: Unknown argument: -"}),
              LogLines());
}

TEST_F(CommandProcess, ResolvesLaterNamesAgainstTheFolderOfOptionD)
{
    fs::create_directory(folder + "sub");
    WriteBib("a.bib");
    WriteBib("sub/b.bib");
    EXPECT_EQ(0, Run("a \"-d" + folder + "sub/\" b").errors);
    EXPECT_EQ((Tokens{"a.bib", "b.bib"}), Names());
    EXPECT_EQ(folder + "sub/", state.baseFolder);
    Run("-d");
    EXPECT_STREQ("", state.baseFolder);
}

TEST_F(CommandProcess, TakesACapitalLetterForTheFolderThatComesFirst)
{
    fs::create_directory(folder + "sub");
    WriteBib("sub/b.bib");
    EXPECT_EQ(0, Run("\"-D" + folder + "sub/\" b").errors);
    EXPECT_EQ((Tokens{"b.bib"}), Names());
    EXPECT_EQ(folder + "sub/", state.baseFolder);
}

TEST_F(CommandProcess, RefusesAFolderThatDoesNotFit)
{
    std::string longest(BASE_FOLDER_SIZE - 1, 'x');
    EXPECT_EQ(0, Run("-d" + longest).errors);
    EXPECT_EQ(longest, state.baseFolder);
    EXPECT_EQ(1, Run("-dy" + longest).errors);
    EXPECT_EQ(longest, state.baseFolder);
    EXPECT_EQ("ERROR: The folder name 'y" + longest + "' is too long\n", LoadErrors());
}

TEST_F(CommandProcess, SelectsTheEncodingOfOptionE)
{
    Run("-ecp1251");
    EXPECT_STREQ("CP1251", Enc_Current()->name);
    EXPECT_EQ(1, Run("-eUTF-8").errors);
    EXPECT_STREQ("CP1251", Enc_Current()->name);
    EXPECT_EQ(
        "ERROR: There is no code page 'UTF-8' (UTF-8 is called CP65001), CP1251 stays selected\n",
        LoadErrors());
    EXPECT_EQ(1, Logged("Cartulo: ERROR: Can't select unknown encoding: UTF-8"));
}

TEST_F(CommandProcess, SelectsUtf8ForTheFilesThatAreUtf8)
{
    Write("a.bib", "@misc{a, x = {\xC3\xBC}}\n");
    Write("b.bib", "@misc{b, x = {\xFC}}\n");
    EXPECT_EQ(0, Run("-eCP65001 a b").errors);
    EXPECT_EQ(&EncodingUtf8, Bib_Encoding(set.files[0]));
    EXPECT_STREQ("CP1252", Bib_Encoding(set.files[1])->name);
    Run("-eCP1251 a b");
    EXPECT_STREQ("CP1251", Bib_Encoding(set.files[0])->name);
}

// Else it would be read as bytes that are no UTF-8, and written like that.
TEST_F(CommandProcess, TakesAFileForUtf8NoMoreWhenItWasEditedInACodePage)
{
    Write("a.bib", "@string{s = {\xC3\xBC}}\n@misc{a, x = {\xC3\xBC}}\n");
    WriteBib("b.bib");
    Run("-eCP1252 a b");
    char *value = set.files[0]->entries->fields[0].value;
    value[0] = '\xFC';
    value[1] = 0;
    Run("-eCP65001 a b");
    EXPECT_STREQ("CP1252", Bib_Encoding(set.files[0])->name);
    EXPECT_EQ(&EncodingUtf8, Bib_Encoding(set.files[1]));
}

TEST_F(CommandProcess, LooksAtAllOpenFilesWhenItSelectsUtf8)
{
    Write("a.bib", "@misc{a, x = {\xFC}}\n");
    Write("b.bib", "@misc{b, x = {\xFC}}\n");
    Run("a b");
    BibFile *a = set.files[0], *b = set.files[1];
    a->form = b->form = 0;       // as if they had been edited
    Run("a b -i -eCP65001 b a"); // a and b are put aside before
    EXPECT_EQ(BIB_FORM_CODE_PAGE, a->form);
    EXPECT_EQ(BIB_FORM_CODE_PAGE, b->form);
    a->form = 0;
    Run("a -eCP65001 b");
    EXPECT_EQ(BIB_FORM_CODE_PAGE, a->form); // listed already
}

TEST_F(CommandProcess, TakesFilesOffTheListAtOptionIWithoutClosingThem)
{
    std::string path = WriteBib("a.bib");
    WriteBib("b.bib");
    Run("a");
    BibFile *file = set.files[0];
    CommandResult result = Run("a -i b");
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ((Tokens{"b.bib"}), Names());
    EXPECT_EQ(1, file->inUse);
    EXPECT_NE(0, file->lockHandle);
    EXPECT_EQ(0, Logged("Cartulo: Close Unused Bib file: " + path));
}

TEST_F(CommandProcess, ListsFilesAgainThatAnEarlierOptionITookOff)
{
    std::string path = WriteBib("a.bib");
    WriteBib("b.bib");
    Run("a");
    BibFile *file = set.files[0];
    Run("a -i b");
    EXPECT_EQ(0, Run("b a").errors);
    EXPECT_EQ((Tokens{"b.bib", "a.bib"}), Names());
    EXPECT_EQ(file, set.files[1]);
    EXPECT_EQ(0, file->readOnly);
    EXPECT_NE(0, file->lockHandle);
    EXPECT_EQ(0, set.asideCount);
}

TEST_F(CommandProcess, ListsANewFileAgainThatOptionITookOff)
{
    std::string path = WriteBib("a.bib");
    CommandResult result = Run("a -i a");
    EXPECT_EQ(0, result.errors);
    EXPECT_EQ((Tokens{"a.bib"}), Names());
    EXPECT_EQ(0, set.files[0]->readOnly);
    EXPECT_EQ(0, set.asideCount);
    EXPECT_EQ(1, Logged("Cartulo: Loading: " + path));
}

TEST_F(CommandProcess, KnowsAFileThatOptionITookOffByItsOtherNames)
{
    fs::create_hard_link(WriteBib("a.bib"), folder + "h.bib");
    Run("a");
    EXPECT_EQ(0, Run("a -i h").errors);
    EXPECT_EQ((Tokens{"a.bib"}), Names());
    EXPECT_EQ(0, set.files[0]->readOnly);
}

TEST_F(CommandProcess, ClosesFilesThatAnEarlierOptionITookOff)
{
    std::string path = WriteBib("a.bib");
    Run("a");
    Run("a -i");
    EXPECT_FALSE(CanBeLocked(path));
    Run("");
    EXPECT_EQ(1, Logged("Cartulo: Close Unused Bib file: " + path));
    EXPECT_TRUE(CanBeLocked(path));
}

TEST_F(CommandProcess, ReportsAChangeWhenOptionIEmptiesTheList)
{
    WriteBib("a.bib");
    Run("a");
    EXPECT_EQ(1, Run("a -i").changes);
    EXPECT_EQ(0, set.count);
}

TEST_F(CommandProcess, ListsAFileAgainThatIsNamedAfterOptionI)
{
    WriteBib("a.bib");
    Run("a");
    BibFile *file = set.files[0];
    EXPECT_EQ(0, Run("a -i a").changes);
    ASSERT_EQ(1, set.count);
    EXPECT_EQ(file, set.files[0]);
}

TEST_F(CommandProcess, ClosesFilesThatAreNotNamedBeforeOptionI)
{
    std::string path = WriteBib("a.bib");
    Run("a");
    Run("-i");
    EXPECT_EQ(0, set.count);
    EXPECT_EQ(1, Logged("Cartulo: Close Unused Bib file: " + path));
    EXPECT_TRUE(CanBeLocked(path));
}

TEST_F(CommandProcess, SavesModifiedFilesThatOptionITakesOffTheList)
{
    std::string path = WriteBib("a.bib");
    Run("a");
    BibFile *file = set.files[0];
    Edit(file, "Saved");
    EXPECT_EQ(0, Run("a -i").errors);
    EXPECT_EQ(0, file->modified);
    EXPECT_NE(0, file->lockHandle);
    EXPECT_NE(std::string::npos, ReadText(path).find("Saved"));
}

TEST_F(CommandProcess, KeepsAFileListedThatCannotBeSavedAtOptionI)
{
    fs::create_directory(folder + "sub");
    std::string path = WriteBib("sub/a.bib");
    SetBase(folder + "sub/");
    Run("a");
    BibFile *file = set.files[0];
    Run("a a");
    Edit(file, "Unsaved");

    // Found under its name, but it cannot be saved: a folder stands in the way of the backup.
    BreakFolder("sub");
    fs::create_directory(folder + "sub");
    fs::create_directory(path);
    CommandResult result = Run("a a -i");
    EXPECT_EQ(1, result.errors);
    ASSERT_EQ(1, set.count);
    EXPECT_EQ(file, set.files[0]);
    EXPECT_EQ(1, file->modified);
    EXPECT_EQ("ERROR: The file '" + path + "' could not be saved (Is a directory), it stays open\n",
              LoadErrors());
    MendFolder("sub");
}

TEST_F(CommandProcess, ReadsTheCompanionOfOptionW)
{
    Run("-w123:7/Srv");
    EXPECT_EQ(123u, state.companionWindow);
    EXPECT_EQ(7u, state.companionNumber);
    EXPECT_STREQ("Srv", state.companionService);
}

TEST_F(CommandProcess, TakesANumberAfterTheSlashAsPartOfTheService)
{
    Run("-w5:6");
    Run("-w123/Srv:7");
    EXPECT_EQ(123u, state.companionWindow);
    EXPECT_EQ(0u, state.companionNumber);
    EXPECT_STREQ("Srv:7", state.companionService);
}

TEST_F(CommandProcess, KeepsTheServiceWhenOptionWHasNone)
{
    Run("-w1:2//tmp/Quarlo");
    EXPECT_STREQ("/tmp/Quarlo", state.companionService);
    Run("-w3");
    EXPECT_EQ(3u, state.companionWindow);
    EXPECT_EQ(0u, state.companionNumber);
    EXPECT_STREQ("/tmp/Quarlo", state.companionService);
    Run("-w4/");
    EXPECT_STREQ("", state.companionService);
}

TEST_F(CommandProcess, TakesTextInPlaceOfTheWindowAsZero)
{
    Run("-w9");
    Run("-wSrv:8");
    EXPECT_EQ(0u, state.companionWindow);
    EXPECT_EQ(8u, state.companionNumber);
    Run("-w");
    EXPECT_EQ(0u, state.companionWindow);
}

TEST_F(CommandProcess, ReadsAWindowHandleThatWasWrittenAsANegativeNumber)
{
    Run("-w-2");
    EXPECT_EQ(0xFFFFFFFEu, state.companionWindow);
}

TEST_F(CommandProcess, CutsTheServiceToItsRoom)
{
    Run("-w1/" + std::string(300, 's'));
    EXPECT_EQ(std::string(BASE_FOLDER_SIZE, 's'), state.companionService);
}

// tests/companion_test.cpp - the services of the TeX environment.

#include "base/Companion.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <string>

#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "base/Sys.h"
#include "store/BibStore.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TempFolder.h"

namespace
{

using std::string;
namespace fs = std::filesystem;

const char NOTHING[] = "(null)";

string TextOf(char *text)
{
    string copy = text ? text : NOTHING;
    free(text);
    return copy;
}

// A user with empty folders of his own, and a system with a kpsewhich only where a test makes one.
class Companion : public testing::Test
{
protected:
    Companion()
    {
        setenv("HOME", m_folder.Path("home").c_str(), 1);
        setenv("XDG_CONFIG_HOME", m_folder.Path("config").c_str(), 1);
        setenv("XDG_DATA_HOME", m_folder.Path("data").c_str(), 1);
        setenv("XDG_RUNTIME_DIR", m_folder.Path().c_str(), 1);
        setenv("PATH", m_folder.Path("path").c_str(), 1);
        unsetenv("BIBINPUTS");
    }

    // A file and the folders above it; its path.
    string Make(const string &name, const string &text = "")
    {
        fs::create_directories(fs::path(m_folder.Path(name)).parent_path());
        return m_folder.Write(name, text);
    }

    string MakeProgram(const string &name, const string &text = "")
    {
        string path = Make(name, text);
        chmod(path.c_str(), 0755);
        return path;
    }

    void MakeKpsewhich(const string &script)
    {
        MakeProgram("path/kpsewhich", "#!/bin/sh\nPATH=/bin:/usr/bin\n" + script + "\n");
    }

    void Set(const string &text) { Make("config/Cartulo/environment.ini", text); }

    void GoTo(const string &name)
    {
        fs::create_directories(m_folder.Path(name));
        ASSERT_EQ(0, chdir(m_folder.Path(name).c_str()));
    }

    TempFolder m_folder;
};

string Search(const char *category, const string &name)
{
    return TextOf(TNSearch(category, name.c_str()));
}

string Value(const char *section, const char *key)
{
    return TextOf(TNSValue(section, key));
}

using TNSearchBib = Companion;

class TNSearchPicture : public Companion, public testing::WithParamInterface<const char *>
{
protected:
    string Find(const string &name) { return Search(GetParam(), name); }

    // Where the user's own pictures of that category are.
    string Own(const string &name)
    {
        return GetParam() == string("Icon") ? "data/cartulo/icons/" + name : "data/cartulo/" + name;
    }
};

using TNSearchProgram = Companion;
using TNSearchTest = Companion;
using TNSValueTest = Companion;
using Frames = Companion;

// --- BIB files, with TeX ---

TEST_F(TNSearchBib, AsksKpsewhich)
{
    string path = Make("texmf/refs.bib");
    MakeKpsewhich("echo \"$*\" >" + m_folder.Path("asked") + "\necho " + path);
    EXPECT_EQ(path, Search("bib", "refs"));
    EXPECT_EQ("-format=bib -- refs\n", m_folder.Read("asked"));
}

TEST_F(TNSearchBib, GivesKpsewhichTheNameAsItIs)
{
    string path = Make("texmf/refs.bib");
    MakeKpsewhich("printf '<%s>' \"$@\" >" + m_folder.Path("asked") + "\necho " + path);
    for (string name : {"-help", "a b", "$HOME", "`touch x`;#", "*", "'", "\xC3\xBC"}) {
        EXPECT_EQ(path, Search("bib", name));
        EXPECT_EQ("<-format=bib><--><" + name + ">", m_folder.Read("asked"));
    }
}

TEST_F(TNSearchBib, TakesTheFirstLine)
{
    string path = Make("texmf/my refs.bib");
    MakeKpsewhich("echo '" + path + "'; echo /other/refs.bib; echo warning >&2");
    EXPECT_EQ(path, Search("bib", "refs"));
}

TEST_F(TNSearchBib, MakesARelativeAnswerFull)
{
    GoTo("work");
    Make("work/refs.bib");
    MakeKpsewhich("echo ./refs.bib");
    EXPECT_EQ(fs::canonical(m_folder.Path("work/refs.bib")), Search("bib", "refs"));
    MakeKpsewhich("echo refs.bib");
    EXPECT_EQ(fs::canonical(m_folder.Path("work/refs.bib")), Search("bib", "refs"));
}

TEST_F(TNSearchBib, BelievesKpsewhichThatThereIsNone)
{
    Make("bibs/refs.bib");
    setenv("BIBINPUTS", m_folder.Path("bibs").c_str(), 1);
    MakeKpsewhich("exit 1");
    EXPECT_EQ(NOTHING, Search("bib", "refs"));
}

// What is no answer leaves the folders to be looked through.
TEST_F(TNSearchBib, LooksItselfWhereKpsewhichDoesNotAnswer)
{
    string path = Make("bibs/refs.bib");
    setenv("BIBINPUTS", m_folder.Path("bibs").c_str(), 1);
    for (const char *script :
         {"exit 0", "echo", "echo /no/such/file.bib", "exit 127", "kill -SEGV $$", "exec yes"}) {
        MakeKpsewhich(script);
        EXPECT_EQ(path, Search("bib", "refs")) << script;
    }
    MakeProgram("path/kpsewhich", "#!/no/such/interpreter\n");
    EXPECT_EQ(path, Search("bib", "refs"));
    fs::remove(m_folder.Path("path/kpsewhich"));
    EXPECT_EQ(path, Search("bib", "refs"));
}

TEST_F(TNSearchBib, LooksItselfWhenKpsewhichHangs)
{
    string path = Make("bibs/refs.bib");
    setenv("BIBINPUTS", m_folder.Path("bibs").c_str(), 1);
    MakeKpsewhich("echo /etc/passwd; sleep 600");
    int32_t start = Sys_Milliseconds();
    EXPECT_EQ(path, Search("bib", "refs"));
    int32_t passed = Sys_Milliseconds() - start;
    EXPECT_LE(3000, passed);
    EXPECT_GT(15000, passed);
}

// --- BIB files, without TeX ---

TEST_F(TNSearchBib, FindsNothingWithoutBibinputs)
{
    GoTo("work");
    Make("work/refs.bib");
    EXPECT_EQ(NOTHING, Search("bib", "refs"));
}

TEST_F(TNSearchBib, LooksThroughTheFoldersInTheirOrder)
{
    string second = Make("b/refs.bib");
    string third = Make("c/refs.bib");
    string list = m_folder.Path("a") + ":" + m_folder.Path("b") + ":" + m_folder.Path("c/");
    setenv("BIBINPUTS", list.c_str(), 1);
    EXPECT_EQ(second, Search("bib", "refs.bib"));
    fs::remove(second);
    EXPECT_EQ(third, Search("bib", "refs.bib"));
    EXPECT_EQ(NOTHING, Search("bib", "other.bib"));
}

TEST_F(TNSearchBib, TriesTheNameAsTypedAndWithItsEnding)
{
    setenv("BIBINPUTS", m_folder.Path("b").c_str(), 1);
    string ended = Make("b/refs.bib");
    EXPECT_EQ(ended, Search("bib", "refs"));
    string plain = Make("b/refs");
    EXPECT_EQ(plain, Search("bib", "refs"));
    EXPECT_EQ(ended, Search("bib", "refs.bib"));
    string twice = Make("b/two.bib.bib");
    EXPECT_EQ(NOTHING, Search("bib", "two.bib"));
    EXPECT_EQ(NOTHING, Search("bib", "two.BIB"));
    EXPECT_EQ(twice, Search("bib", "two.bib.bib"));
    string dotted = Make("b/a.b.bib");
    EXPECT_EQ(dotted, Search("bib", "a.b"));
    string bare = Make("b/.bib.bib");
    EXPECT_EQ(bare, Search("bib", ".bib")) << "an ending needs a name before it";
}

TEST_F(TNSearchBib, LooksBelowAFolderThatEndsInTwoSlashes)
{
    string path = Make("b/x/y/refs.bib");
    setenv("BIBINPUTS", m_folder.Path("b").c_str(), 1);
    EXPECT_EQ(NOTHING, Search("bib", "refs"));
    setenv("BIBINPUTS", (m_folder.Path("b") + "/").c_str(), 1);
    EXPECT_EQ(NOTHING, Search("bib", "refs"));
    setenv("BIBINPUTS", (m_folder.Path("b") + "//").c_str(), 1);
    EXPECT_EQ(path, Search("bib", "refs"));
    setenv("BIBINPUTS", ("/nowhere:" + m_folder.Path("b") + "///:").c_str(), 1);
    EXPECT_EQ(path, Search("bib", "refs"));
}

TEST_F(TNSearchBib, TakesAnEmptyPartForTheCurrentFolder)
{
    GoTo("work");
    string path = fs::canonical(m_folder.Path("work")) / "refs.bib";
    Make("work/refs.bib");
    for (string list : {"", ":/nowhere", "/nowhere:", "/nowhere::/nowhere", "."}) {
        setenv("BIBINPUTS", list.c_str(), 1);
        EXPECT_EQ(path, Search("bib", "refs")) << list;
    }
    setenv("BIBINPUTS", "/nowhere", 1);
    EXPECT_EQ(NOTHING, Search("bib", "refs"));
}

TEST_F(TNSearchBib, MakesTheAnswerFullWhereAPartIsRelative)
{
    GoTo("work");
    Make("work/bibs/deep/refs.bib");
    setenv("BIBINPUTS", "bibs//", 1);
    EXPECT_EQ(fs::canonical(m_folder.Path("work/bibs/deep/refs.bib")), Search("bib", "refs"));
}

// --- Any category ---

TEST_F(TNSearchTest, DoesNotLookForNamesWithFolders)
{
    string path = Make("bibs/refs.bib");
    MakeKpsewhich("echo " + path);
    MakeProgram("data/cartulo/bin/tool");
    Make("data/cartulo/icons/icon.svg");
    setenv("BIBINPUTS", m_folder.Path().c_str(), 1);
    EXPECT_EQ(NOTHING, Search("bib", "bibs/refs"));
    EXPECT_EQ(NOTHING, Search("bib", path));
    EXPECT_EQ(NOTHING, Search("Program", "../bin/tool"));
    EXPECT_EQ(NOTHING, Search("Logo", "icons/icon"));
}

TEST_F(TNSearchTest, FindsNothingForNoNameOrAnUnknownCategory)
{
    Make("data/cartulo/icons/.svg");
    Make("data/cartulo/icons/icon.svg");
    for (const char *category : {"bib", "Icon", "Logo", "Program"})
        EXPECT_EQ(NOTHING, Search(category, "")) << category;
    EXPECT_EQ(NOTHING, Search("icon", "icon"));
    EXPECT_EQ(NOTHING, Search("", "icon"));
}

// --- Pictures ---

TEST_P(TNSearchPicture, AreTheUsersOwn)
{
    string path = Make(Own("Some-Name.png"));
    EXPECT_EQ(path, Find("Some-Name"));
    EXPECT_EQ(NOTHING, Find("Some-Name.png"));
    EXPECT_EQ(NOTHING, Find("Some"));
}

TEST_P(TNSearchPicture, AreTakenInTheOrderOfTheirEndings)
{
    for (const char *ending : {".gif", ".bmp", ".xpm", ".png", ".svg"}) {
        string path = Make(Own(string("picture") + ending));
        EXPECT_EQ(path, Find("picture"));
    }
    Make(Own("other.jpeg"));
    EXPECT_EQ(NOTHING, Find("other"));
}

TEST_P(TNSearchPicture, AreFirstLookedForInTheFoldersOfTheSettings)
{
    Make(Own("picture.svg"));
    string third = Make("c/picture.gif");
    string second = Make("b/picture.gif");
    Make("relative/picture.gif");
    GoTo("");
    Set("[Search]\n" + string(GetParam()) + "=relative:" + m_folder.Path("a") +
        "::" + m_folder.Path("b") + ":" + m_folder.Path("c") + "\n");
    EXPECT_EQ(second, Find("picture"));
    fs::remove(second);
    EXPECT_EQ(third, Find("picture"));
}

INSTANTIATE_TEST_SUITE_P(Categories, TNSearchPicture, testing::Values("Icon", "Logo"));

TEST_F(TNSearchTest, FindsThePicturesOfTheProgramItself)
{
    string path = Search("Icon", "Warning");
    EXPECT_TRUE(fs::exists(path)) << path;
    EXPECT_EQ("Warning.svg", fs::path(path).filename().string());
    string own = Make("data/cartulo/icons/Warning.gif");
    EXPECT_EQ(own, Search("Icon", "Warning")) << "the user's comes first";
}

// --- Programs ---

TEST_F(TNSearchProgram, AreTheUsersOwnBeforeThoseInPath)
{
    string inPath = MakeProgram("path/tool");
    EXPECT_EQ(inPath, Search("Program", "tool"));
    string own = MakeProgram("data/cartulo/bin/tool");
    EXPECT_EQ(own, Search("Program", "tool"));
    string set = MakeProgram("tools/tool");
    Set("[Search]\nProgram=" + m_folder.Path("tools"));
    EXPECT_EQ(set, Search("Program", "tool"));
    EXPECT_EQ(NOTHING, Search("Program", "other"));
}

TEST_F(TNSearchProgram, AreFilesThatMayBeStarted)
{
    Make("data/cartulo/bin/tool");
    fs::create_directories(m_folder.Path("path/tool"));
    EXPECT_EQ(NOTHING, Search("Program", "tool"));
}

TEST_F(TNSearchProgram, AreNotTakenFromTheCurrentFolder)
{
    GoTo("work");
    MakeProgram("work/tool");
    MakeProgram("work/bin/tool");
    setenv("PATH", ":.:bin:", 1);
    EXPECT_EQ(NOTHING, Search("Program", "tool"));
}

// --- A program that is installed ---

class TNSearchInstalled : public Companion
{
protected:
    // What the program finds when it is installed as `name`.
    string FindAs(const string &name, const char *category, const char *wanted)
    {
        string program = m_folder.Path(name);
        fs::create_directories(fs::path(program).parent_path());
        fs::copy_file(SEARCH_PROGRAM, program, fs::copy_options::skip_existing);
        const char *const argv[] = {program.c_str(), category, wanted, nullptr};
        int status;
        string text = TextOf(Sys_RunForOutput(argv, 30000, &status));
        return text.substr(0, text.find('\n'));
    }
};

TEST_F(TNSearchInstalled, FindsThePicturesBesideItsFolder)
{
    string icon = Make("usr/share/cartulo/icons/Warning.svg");
    string logo = Make("usr/share/cartulo/Cartulo.png");
    for (const char *name : {"usr/bin/search", "usr/libexec/cartulo/search"}) {
        EXPECT_EQ(icon, FindAs(name, "Icon", "Warning"));
        EXPECT_EQ(logo, FindAs(name, "Logo", "Cartulo"));
        EXPECT_EQ("none", FindAs(name, "Icon", "no-such-icon"));
    }
    string own = Make("data/cartulo/icons/Warning.bmp");
    EXPECT_EQ(own, FindAs("usr/bin/search", "Icon", "Warning"));
}

TEST_F(TNSearchInstalled, FindsItsHelpersBeforeThoseInPath)
{
    const char name[] = "usr/bin/search";
    MakeProgram("path/tool");
    string helper = MakeProgram("usr/libexec/cartulo/tool");
    EXPECT_EQ(helper, FindAs(name, "Program", "tool"));
    string beside = MakeProgram("usr/bin/tool");
    EXPECT_EQ(beside, FindAs(name, "Program", "tool"));
    EXPECT_EQ(m_folder.Path(name), FindAs(name, "Program", "search"));
}

// --- Settings ---

TEST_F(TNSValueTest, IsReadFromTheUsersFile)
{
    EXPECT_EQ(NOTHING, Value("Common", "TOOLSIZE"));
    Set("[Common]\nTOOLSIZE=24\nEmpty=\nQuoted=\" x \"\n");
    EXPECT_EQ("24", Value("Common", "TOOLSIZE"));
    EXPECT_EQ("24", Value("COMMON", "ToolSize"));
    EXPECT_EQ("", Value("Common", "Empty"));
    EXPECT_EQ(" x ", Value("Common", "Quoted"));
    EXPECT_EQ(NOTHING, Value("Common", "Other"));
    EXPECT_EQ(NOTHING, Value("Other", "TOOLSIZE"));
    Set("[Common]\nTOOLSIZE=16\n");
    EXPECT_EQ("16", Value("Common", "TOOLSIZE"));
}

TEST_F(TNSValueTest, IsCutWhenItIsVeryLong)
{
    Set("[a]\nb=" + string(4095, 'x') + "\nc=" + string(5000, 'y') + "\n");
    EXPECT_EQ(string(4095, 'x'), Value("a", "b"));
    EXPECT_EQ(string(4095, 'y'), Value("a", "c"));
}

TEST(TNSFind, FindsNothing)
{
    EXPECT_EQ(nullptr, TNSFind("!NoMake"));
    EXPECT_EQ(nullptr, TNSFind("!AutoDownload=OFF"));
}

// --- Windows ---

// Another process that registers a window and lives until it is ended.
pid_t StartOwner(
    const char *instance, long window, const std::function<void()> &then = [] {})
{
    int ends[2];
    EXPECT_EQ(0, pipe(ends));
    pid_t process = fork();
    if (process == 0) {
        RegisterFrame(instance, window);
        then();
        if (write(ends[1], "", 1) == 1)
            sleep(600);
        _exit(0);
    }
    close(ends[1]);
    char byte;
    EXPECT_EQ(1, read(ends[0], &byte, 1));
    close(ends[0]);
    return process;
}

void End(pid_t process)
{
    kill(process, SIGKILL);
    waitpid(process, nullptr, 0);
}

TEST_F(Frames, AreFoundByTheirName)
{
    EXPECT_EQ(0, FindFrame("Cartulo"));
    RegisterFrame("Cartulo", 0x7FFFFFFF);
    RegisterFrame("Cartulo-/home/me/", 2);
    EXPECT_EQ(0x7FFFFFFF, FindFrame("Cartulo"));
    EXPECT_EQ(2, FindFrame("Cartulo-/home/me/"));
    EXPECT_EQ(0, FindFrame("cartulo"));
    EXPECT_EQ(0, FindFrame(""));
}

TEST_F(Frames, AreFoundByOtherProcesses)
{
    pid_t owner = StartOwner("Cartulo", 12345);
    EXPECT_EQ(12345, FindFrame("Cartulo"));
    End(owner);
}

TEST_F(Frames, AreForgottenWhenTheirProcessIsKilled)
{
    pid_t owner = StartOwner("Cartulo", 12345);
    End(owner);
    EXPECT_EQ(0, FindFrame("Cartulo"));
    owner = StartOwner("Cartulo", 7);
    EXPECT_EQ(7, FindFrame("Cartulo"));
    End(owner);
}

TEST_F(Frames, AreForgottenThoughAChildOfTheirProcessLivesOn)
{
    int ends[2];
    ASSERT_EQ(0, pipe(ends));
    pid_t owner = StartOwner("Cartulo", 12345, [&] {
        pid_t child = fork();
        if (child == 0)
            sleep(600);
        if (write(ends[1], &child, sizeof child) != sizeof child)
            _exit(1);
    });
    pid_t child;
    ASSERT_EQ(static_cast<ssize_t>(sizeof child), read(ends[0], &child, sizeof child));
    End(owner);
    EXPECT_EQ(0, FindFrame("Cartulo"));
    kill(child, SIGKILL);
}

TEST_F(Frames, AreThoseOfTheLastCall)
{
    RegisterFrame("Cartulo", 1);
    RegisterFrame("Cartulo", 2);
    EXPECT_EQ(2, FindFrame("Cartulo"));
    pid_t first = StartOwner("Cartulo", 3);
    pid_t second = StartOwner("Cartulo", 4);
    EXPECT_EQ(4, FindFrame("Cartulo"));
    End(first);
    EXPECT_EQ(4, FindFrame("Cartulo"));
    End(second);
    EXPECT_EQ(0, FindFrame("Cartulo"));
}

TEST_F(Frames, AreNoneWithoutAWindow)
{
    RegisterFrame("Cartulo", 5);
    RegisterFrame("Cartulo", 0);
    EXPECT_EQ(0, FindFrame("Cartulo"));
}

TEST_F(Frames, AreNotTakenFromAnotherText)
{
    string path = TextOf(Sys_PrivatePath("Cartulo", ".frame"));
    for (const char *text : {"", "12x", "x", " "}) {
        ASSERT_EQ(1, Sys_PostNote(path.c_str(), text));
        EXPECT_EQ(0, FindFrame("Cartulo")) << text;
    }
}

TEST_F(Frames, AreMissedWithAWarningWhereThereIsNoPlaceForThem)
{
    setenv("XDG_RUNTIME_DIR", "/no/such/folder", 1);
    setenv("TMPDIR", "/no/such/folder", 1);
    EXPECT_EQ("WARNING: RegisterFrame No such file or directory\n", LogOf(nullptr, [] {
                  RegisterFrame("Cartulo", 1);
                  if (FindFrame("Cartulo") != 0)
                      _exit(1);
              }));
}

} // namespace

// tests/sys_program_test.cpp - other programs, and files in folders.

#include "base/Sys.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "tests/support/TempFolder.h"

namespace
{

using std::string;

const char NOTHING[] = "(null)";
const int LONG = 30000; // milliseconds; no test waits for it

string TextOf(char *text)
{
    string copy = text ? text : NOTHING;
    free(text);
    return copy;
}

struct Outcome {
    string output;
    int status = -1;
    int milliseconds = 0;
};

Outcome RunProgram(std::vector<const char *> argv, int milliseconds = LONG)
{
    Outcome outcome;
    argv.push_back(nullptr);
    int32_t start = Sys_Milliseconds();
    outcome.output = TextOf(Sys_RunForOutput(argv.data(), milliseconds, &outcome.status));
    outcome.milliseconds = Sys_Milliseconds() - start;
    return outcome;
}

Outcome RunScript(const string &script, int milliseconds = LONG)
{
    return RunProgram({"/bin/sh", "-c", script.c_str()}, milliseconds);
}

int IsAlive(const string &pid)
{
    return kill(atoi(pid.c_str()), 0) == 0;
}

// 0 also for one that has ended and waits for init to take note.
int IsRunning(const string &pid)
{
    string state;
    std::ifstream stream("/proc/" + std::to_string(atoi(pid.c_str())) + "/stat");
    std::getline(stream, state);
    return !state.empty() && state.find(") Z ") == string::npos;
}

// Until a file holds text.
string WaitForText(const TempFolder &folder, const string &name)
{
    for (int i = 0; i < 1000 && folder.Read(name).empty(); ++i)
        usleep(10000);
    return folder.Read(name);
}

int OpenDescriptors()
{
    int count = 0;
    for (const auto &entry : std::filesystem::directory_iterator("/proc/self/fd"))
        count += !entry.path().empty();
    return count;
}

class SysFindFile : public testing::Test
{
protected:
    string Make(const string &path) const
    {
        std::filesystem::create_directories(
            std::filesystem::path(m_folder.Path(path)).parent_path());
        return m_folder.Write(path, "");
    }
    string Find(const string &name, int deep) const
    {
        return TextOf(Sys_FindFile(m_folder.Path().c_str(), name.c_str(), deep));
    }

    TempFolder m_folder;
};

// --- Running programs ---

TEST(SysRunForOutput, ReturnsTheOutputAndTheStatus)
{
    Outcome outcome = RunScript("echo one; echo two");
    EXPECT_EQ("one\ntwo\n", outcome.output);
    EXPECT_EQ(0, outcome.status);
    outcome = RunScript("echo sorry; exit 3");
    EXPECT_EQ("sorry\n", outcome.output);
    EXPECT_EQ(3, outcome.status);
    outcome = RunScript("exit 1");
    EXPECT_EQ("", outcome.output);
    EXPECT_EQ(1, outcome.status);
}

TEST(SysRunForOutput, PassesArgumentsAsTheyAre)
{
    EXPECT_EQ("<$HOME><a b><'\"><*><>\n", RunProgram({"/bin/sh", "-c", "printf '<%s>' \"$@\"; echo",
                                                      "sh", "$HOME", "a b", "'\"", "*", ""})
                                              .output);
}

TEST(SysRunForOutput, LooksForProgramsInPath)
{
    TempFolder folder;
    string path = folder.Write("tool", "#!/bin/sh\necho found\n");
    chmod(path.c_str(), 0755);
    setenv("PATH", ("/nowhere:" + folder.Path() + ":/bin:/usr/bin").c_str(), 1);
    EXPECT_EQ("found\n", RunProgram({"tool"}).output);
    EXPECT_EQ(NOTHING, RunProgram({"cartulo-no-such-tool"}).output);
}

TEST(SysRunForOutput, FailsForWhatCannotBeStarted)
{
    TempFolder folder;
    string plain = folder.Write("plain", "text");
    string orphan = folder.Write("orphan", "#!/no/such/interpreter\n");
    chmod(orphan.c_str(), 0755);
    int before = OpenDescriptors();
    for (const string &path : {plain, orphan, folder.Path(), folder.Path("missing"), string()}) {
        EXPECT_EQ(NOTHING, RunProgram({path.c_str()}).output) << path;
        EXPECT_NE(0, errno);
    }
    EXPECT_EQ(before, OpenDescriptors());
}

TEST(SysRunForOutput, GivesNothingToReadAndDropsErrors)
{
    int ends[2];
    ASSERT_EQ(0, pipe(ends));
    ASSERT_EQ(2, dup2(ends[1], 2)); // ours
    fcntl(ends[0], F_SETFL, O_NONBLOCK);
    EXPECT_EQ("read: \n", RunScript("echo wrong >&2; read line; echo \"read: $line\"").output);
    char byte;
    EXPECT_EQ(-1, read(ends[0], &byte, 1));
}

TEST(SysRunForOutput, EndsAProgramThatTakesTooLong)
{
    TempFolder folder;
    Outcome outcome =
        RunScript("echo $$ >" + folder.Path("pid") + "; echo early; exec sleep 100", 300);
    EXPECT_EQ(NOTHING, outcome.output);
    EXPECT_LE(300, outcome.milliseconds);
    EXPECT_GT(5000, outcome.milliseconds);
    EXPECT_FALSE(IsAlive(WaitForText(folder, "pid"))) << "ended, and reaped";
}

TEST(SysRunForOutput, EndsWhatTheProgramHasStartedToo)
{
    TempFolder folder;
    RunScript("sleep 100 & echo $! >" + folder.Path("pid") + "; wait", 300);
    string pid = WaitForText(folder, "pid");
    for (int i = 0; i < 500 && IsRunning(pid); ++i)
        usleep(10000);
    EXPECT_FALSE(IsRunning(pid));
}

TEST(SysRunForOutput, DoesNotWaitForWhatKeepsTheOutputOpen)
{
    TempFolder folder;
    Outcome outcome = RunScript("sleep 100 & echo $! >" + folder.Path("pid") + "; echo done", LONG);
    EXPECT_EQ("done\n", outcome.output);
    EXPECT_EQ(0, outcome.status);
    EXPECT_GT(10000, outcome.milliseconds);
    string pid = folder.Read("pid");
    EXPECT_TRUE(IsAlive(pid)) << "a program that ends well may leave others behind";
    kill(atoi(pid.c_str()), SIGKILL);
}

TEST(SysRunForOutput, WaitsForAProgramThatClosesItsOutput)
{
    Outcome outcome = RunScript("echo all; exec >&-; sleep 0.2; exit 4");
    EXPECT_EQ("all\n", outcome.output);
    EXPECT_EQ(4, outcome.status);
    EXPECT_EQ(NOTHING, RunScript("exec >&-; sleep 100", 200).output);
}

TEST(SysRunForOutput, TakesMoreThanAPipeHolds)
{
    EXPECT_EQ(1000000u, RunScript("head -c 1000000 /dev/zero | tr '\\0' x").output.size());
}

TEST(SysRunForOutput, RefusesAnOutputWithoutEnd)
{
    Outcome outcome = RunScript("exec yes", LONG);
    EXPECT_EQ(NOTHING, outcome.output);
    EXPECT_GT(10000, outcome.milliseconds);
}

TEST(SysRunForOutput, TellsACrashFromAnAnswer)
{
    EXPECT_EQ(NOTHING, RunScript("echo text; kill -SEGV $$").output);
}

TEST(SysRunForOutput, WorksWhereEndedChildrenAreIgnored)
{
    signal(SIGCHLD, SIG_IGN);
    Outcome outcome = RunScript("echo text; exit 5");
    EXPECT_EQ("text\n", outcome.output);
    EXPECT_EQ(5, outcome.status);
}

TEST(SysRunForOutput, WorksWithoutStandardStreams)
{
    for (int stream : {2, 1, 0}) {
        close(stream);
        EXPECT_EQ("text\n", RunScript("echo text; echo wrong >&2; read line").output);
    }
}

TEST(SysRunForOutput, PassesNoSignalSettingsOn)
{
    Sys_SurviveFailedWrites();
    sigset_t all;
    sigfillset(&all);
    sigprocmask(SIG_BLOCK, &all, nullptr);
    // The last digits are those of the classic signals.
    string theirs =
        RunScript("grep -E '^Sig(Blk|Ign)' /proc/self/status | grep -o '.......$'").output;
    EXPECT_EQ("0000000\n0000000\n", theirs);
}

TEST(SysRunForOutput, PassesNoFilesOn)
{
    TempFolder folder;
    close_range(3, ~0u, 0); // what this program was started with
    int lock = Sys_LockFile(folder.Path("lock").c_str());
    ASSERT_NE(0, lock);
    EXPECT_EQ("0\n1\n2\n", RunScript("for i in 0 1 2 3 4 5 6 7 8 9; do"
                                     " [ -e /proc/$$/fd/$i ] && echo $i; done; true")
                               .output);
    Sys_UnlockFile(lock);
}

TEST(SysRunForOutput, LeavesNothingOpen)
{
    int before = OpenDescriptors();
    RunScript("echo text");
    RunScript("sleep 100", 50);
    RunScript("exec yes");
    EXPECT_EQ(before, OpenDescriptors());
    EXPECT_EQ(-1, waitpid(-1, nullptr, WNOHANG)) << "no child is left";
}

TEST(SysIsProgram, IsAFileThatMayBeStarted)
{
    TempFolder folder;
    string path = folder.Write("tool", "");
    EXPECT_EQ(0, Sys_IsProgram(path.c_str()));
    chmod(path.c_str(), 0700);
    EXPECT_EQ(1, Sys_IsProgram(path.c_str()));
    EXPECT_EQ(0, Sys_IsProgram(folder.Path().c_str()));
    EXPECT_EQ(0, Sys_IsProgram(folder.Path("missing").c_str()));
}

// --- Finding files ---

TEST_F(SysFindFile, LooksInTheFolder)
{
    string path = Make("refs.bib");
    Make("below/deep.bib");
    EXPECT_EQ(path, Find("refs.bib", 0));
    EXPECT_EQ(NOTHING, Find("deep.bib", 0));
    EXPECT_EQ(NOTHING, Find("REFS.bib", 0));
    EXPECT_EQ(NOTHING, Find("below", 0)) << "a folder";
    EXPECT_EQ(NOTHING, TextOf(Sys_FindFile(m_folder.Path("none").c_str(), "refs.bib", 1)));
}

TEST_F(SysFindFile, LooksIntoTheFoldersBelow)
{
    string path = Make("a/b/.c/refs.bib");
    EXPECT_EQ(path, Find("refs.bib", 1));
    EXPECT_EQ(NOTHING, Find("missing.bib", 1));
}

TEST_F(SysFindFile, FindsTheNearestAndAmongThoseTheFirstByName)
{
    Make("a/b/refs.bib");
    Make("c/refs.bib");
    string path = Make("b/refs.bib");
    EXPECT_EQ(path, Find("refs.bib", 1));
    path = Make("refs.bib");
    EXPECT_EQ(path, Find("refs.bib", 1));
}

TEST_F(SysFindFile, FollowsLinksToFilesOnly)
{
    string path = Make("outside/refs.bib");
    std::filesystem::create_directories(m_folder.Path("in/below"));
    std::filesystem::create_directory_symlink("..", m_folder.Path("in/loop"));
    std::filesystem::create_directory_symlink("../outside", m_folder.Path("in/away"));
    string in = m_folder.Path("in");
    EXPECT_EQ(NOTHING, TextOf(Sys_FindFile(in.c_str(), "refs.bib", 1)));
    string link = m_folder.Path("in/below/refs.bib");
    std::filesystem::create_symlink(path, link);
    EXPECT_EQ(link, TextOf(Sys_FindFile(in.c_str(), "refs.bib", 1)));
}

TEST_F(SysFindFile, MayStartAtALinkToAFolder)
{
    Make("real/below/refs.bib");
    string link = m_folder.Path("link");
    std::filesystem::create_directory_symlink("real", link);
    EXPECT_EQ(link + "/below/refs.bib", TextOf(Sys_FindFile(link.c_str(), "refs.bib", 1)));
}

TEST_F(SysFindFile, LooksAtABoundedNumberOfFolders)
{
    for (int i = 0; i < 150; ++i)
        for (int j = 0; j < 100; ++j)
            std::filesystem::create_directories(
                m_folder.Path("d" + std::to_string(1000 + i) + "/" + std::to_string(j)));
    string last = Make("d1149/99/below/refs.bib");
    EXPECT_EQ(NOTHING, Find("refs.bib", 1));
    EXPECT_EQ(last, TextOf(Sys_FindFile(m_folder.Path("d1149").c_str(), "refs.bib", 1)));
}

} // namespace

// tests/sys_places_test.cpp - the user's folders, and notes of processes.

#include "base/Sys.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <functional>
#include <string>

#include <pwd.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "store/BibStore.h"
#include "tests/support/TempFolder.h"
#include "tests/support/ToldLater.h"

namespace
{

using std::string;

const char NOTHING[] = "(null)";

string TextOf(char *text)
{
    string copy = text ? text : NOTHING;
    free(text);
    return copy;
}

int ModeOf(const string &path)
{
    struct stat state;
    return lstat(path.c_str(), &state) == 0 ? state.st_mode & 07777 : -1;
}

// A home of its own, and no settings of the user who runs the tests.
class Places : public testing::Test
{
protected:
    Places()
    {
        for (const char *variable : {"XDG_CONFIG_HOME", "XDG_DATA_HOME", "XDG_RUNTIME_DIR"})
            unsetenv(variable);
        setenv("HOME", m_folder.Path("home").c_str(), 1);
        setenv("TMPDIR", m_folder.Path().c_str(), 1);
    }

    string Private(const char *name) { return TextOf(Sys_PrivatePath(name, ".end", &m_why)); }

    string TemporaryPrivate() const { return m_folder.Path("quarlo-" + std::to_string(getuid())); }

    TempFolder m_folder;
    SysReason m_why = {}; // that there is no private path
};

using SysConfigFolder = Places;
using SysDataFolder = Places;
using SysPrivatePath = Places;

// Another process that does something and then lives on until it is ended.
class Helper
{
public:
    explicit Helper(const std::function<int()> &start)
    {
        int ends[2];
        EXPECT_EQ(0, pipe(ends));
        m_process = fork();
        if (m_process == 0) {
            char result = start() ? 'y' : 'n';
            if (write(ends[1], &result, 1) == 1)
                sleep(600);
            _exit(0);
        }
        char result = 0;
        EXPECT_EQ(1, read(ends[0], &result, 1));
        EXPECT_EQ('y', result);
        close(ends[0]);
        close(ends[1]);
    }
    ~Helper() { Kill(); }

    void Kill()
    {
        if (m_process <= 0)
            return;
        kill(m_process, SIGKILL);
        waitpid(m_process, nullptr, 0);
        m_process = 0;
    }

private:
    pid_t m_process;
};

class SysNote : public testing::Test
{
protected:
    int Post(const char *text) const { return Sys_PostNote(m_path.c_str(), text); }
    string Read() const { return TextOf(Sys_ReadNote(m_path.c_str())); }

    string ReadElsewhere() const
    {
        int ends[2];
        EXPECT_EQ(0, pipe(ends));
        pid_t process = fork();
        if (process == 0) {
            string text = Read();
            _exit(write(ends[1], text.data(), text.size()) < 0);
        }
        close(ends[1]);
        char text[5000];
        ssize_t length = read(ends[0], text, sizeof text);
        close(ends[0]);
        waitpid(process, nullptr, 0);
        return string(text, static_cast<size_t>(length > 0 ? length : 0));
    }

    TempFolder m_folder;
    string m_path = m_folder.Path("note");
};

// --- The user's folders ---

TEST_F(SysConfigFolder, IsTheOneOfTheVariable)
{
    setenv("XDG_CONFIG_HOME", "/some/where", 1);
    EXPECT_EQ("/some/where", TextOf(Sys_ConfigFolder()));
}

TEST_F(SysConfigFolder, IsInTheHomeFolderOtherwise)
{
    string expected = m_folder.Path("home/.config");
    EXPECT_EQ(expected, TextOf(Sys_ConfigFolder()));
    setenv("XDG_CONFIG_HOME", "", 1);
    EXPECT_EQ(expected, TextOf(Sys_ConfigFolder()));
    setenv("XDG_CONFIG_HOME", "relative/folder", 1);
    EXPECT_EQ(expected, TextOf(Sys_ConfigFolder()));
}

TEST_F(SysConfigFolder, AsksTheAccountWhereThereIsNoHome)
{
    string home = getpwuid(getuid())->pw_dir;
    unsetenv("HOME");
    EXPECT_EQ(home + "/.config", TextOf(Sys_ConfigFolder()));
    setenv("HOME", "", 1);
    EXPECT_EQ(home + "/.config", TextOf(Sys_ConfigFolder()));
}

TEST_F(SysDataFolder, IsTheOneOfTheVariable)
{
    setenv("XDG_DATA_HOME", "/some/where", 1);
    EXPECT_EQ("/some/where", TextOf(Sys_DataFolder()));
}

TEST_F(SysDataFolder, IsInTheHomeFolderOtherwise)
{
    string expected = m_folder.Path("home/.local/share");
    EXPECT_EQ(expected, TextOf(Sys_DataFolder()));
    setenv("XDG_DATA_HOME", "relative", 1);
    EXPECT_EQ(expected, TextOf(Sys_DataFolder()));
}

// --- Where the user's processes meet ---

TEST_F(SysPrivatePath, IsInTheRuntimeFolder)
{
    setenv("XDG_RUNTIME_DIR", m_folder.Path().c_str(), 1);
    string path = Private("name");
    EXPECT_EQ(m_folder.Path("quarlo"), std::filesystem::path(path).parent_path());
    EXPECT_EQ(".end", std::filesystem::path(path).extension());
    EXPECT_EQ(0700, ModeOf(m_folder.Path("quarlo")));
}

TEST_F(SysPrivatePath, IsInTheTemporaryFolderOtherwise)
{
    for (const char *runtime : {"", "relative", "/no/such/folder"}) {
        setenv("XDG_RUNTIME_DIR", runtime, 1);
        EXPECT_EQ(TemporaryPrivate(), std::filesystem::path(Private("name")).parent_path());
    }
    EXPECT_EQ(0700, ModeOf(TemporaryPrivate()));
}

TEST_F(SysPrivatePath, IsTheSameForTheSameName)
{
    EXPECT_EQ(Private("Cartulo"), Private("Cartulo"));
    EXPECT_NE(NOTHING, Private("Cartulo"));
}

TEST_F(SysPrivatePath, DiffersForDifferentNames)
{
    std::set<string> paths;
    for (const char *name : {"", "a", "b", "A", "ab", "ba", "a/b", "a\nb", "\xC3\xBC"})
        paths.insert(Private(name));
    EXPECT_EQ(9u, paths.size());
    EXPECT_NE(TextOf(Sys_PrivatePath("a", ".x")), TextOf(Sys_PrivatePath("a", ".y")));
}

// Also of another version of the program: they meet there.
TEST_F(SysPrivatePath, IsNamedByTheFnvHash)
{
    EXPECT_EQ("cbf29ce484222325.end", std::filesystem::path(Private("")).filename());
    EXPECT_EQ("af63dc4c8601ec8c.end", std::filesystem::path(Private("a")).filename());
    EXPECT_EQ("85944171f73967e8.end", std::filesystem::path(Private("foobar")).filename());
}

TEST_F(SysPrivatePath, IsShortForAnyName)
{
    EXPECT_EQ(Private("a").size(), Private(string(100000, '/').c_str()).size());
}

TEST_F(SysPrivatePath, IsNoneWhereOthersCanEnter)
{
    string folder = TemporaryPrivate();
    for (int mode : {0750, 0705, 0701, 0777}) {
        ASSERT_TRUE(mkdir(folder.c_str(), 0700) == 0 || errno == EEXIST);
        ASSERT_EQ(0, chmod(folder.c_str(), mode));
        EXPECT_EQ(NOTHING, Private("name"));
        EXPECT_EQ("Permission denied", ToldLater(m_why));
        EXPECT_EQ(mode, ModeOf(folder)) << "not ours to change";
    }
    chmod(folder.c_str(), 0700);
    EXPECT_NE(NOTHING, Private("name"));
}

TEST_F(SysPrivatePath, IsNoneBehindALink)
{
    std::filesystem::create_directory(m_folder.Path("real"));
    chmod(m_folder.Path("real").c_str(), 0700);
    std::filesystem::create_directory_symlink("real", TemporaryPrivate());
    EXPECT_EQ(NOTHING, Private("name"));
    std::filesystem::remove(TemporaryPrivate());
    std::filesystem::create_directory_symlink("missing", TemporaryPrivate());
    EXPECT_EQ(NOTHING, Private("name"));
}

TEST_F(SysPrivatePath, IsNoneWhereAFileIsInTheWay)
{
    m_folder.Write("quarlo-" + std::to_string(getuid()), "");
    EXPECT_EQ(NOTHING, Private("name"));
}

TEST_F(SysPrivatePath, IsNoneInAFolderOfSomebodyElse)
{
    if (geteuid() != 0)
        GTEST_SKIP() << "only root can make such a folder";
    ASSERT_EQ(0, mkdir(TemporaryPrivate().c_str(), 0700));
    ASSERT_EQ(0, chown(TemporaryPrivate().c_str(), 65534, 65534));
    EXPECT_EQ(NOTHING, Private("name"));
}

TEST_F(SysPrivatePath, IsNoneWhereNoFolderCanBeMade)
{
    setenv("TMPDIR", m_folder.Path("missing").c_str(), 1);
    EXPECT_EQ(NOTHING, Private("name"));
    EXPECT_EQ("No such file or directory", ToldLater(m_why));
}

TEST(SysLoginName, IsThatOfTheAccount)
{
    const passwd *user = getpwuid(getuid());
    EXPECT_EQ(user ? string(user->pw_name) : std::to_string(getuid()), Sys_LoginName());
}

// --- Notes ---

TEST_F(SysNote, IsReadByItsProcessAndByOthers)
{
    EXPECT_EQ(1, Post("text"));
    EXPECT_EQ("text", Read());
    EXPECT_EQ("text", ReadElsewhere());
    EXPECT_EQ("text", Read()) << "still there";
    EXPECT_EQ("text", ReadElsewhere()) << "our own reading does not end it";
    EXPECT_EQ(0600, ModeOf(m_path));
}

TEST_F(SysNote, IsNoneWhereNobodyLeftOne)
{
    EXPECT_EQ(NOTHING, Read());
    m_folder.Write("note", "text");
    EXPECT_EQ(NOTHING, Read());
}

TEST_F(SysNote, IsReplacedByALaterOne)
{
    EXPECT_EQ(1, Post("a long text"));
    EXPECT_EQ(1, Post("short"));
    EXPECT_EQ("short", Read());
    EXPECT_EQ("short", ReadElsewhere());
    EXPECT_EQ((std::set<string>{"note"}), m_folder.Names());
}

TEST_F(SysNote, EndsWithItsProcess)
{
    Helper helper([this] { return Post("theirs"); });
    EXPECT_EQ("theirs", Read());
    helper.Kill();
    EXPECT_EQ(NOTHING, Read());
    EXPECT_EQ("theirs", m_folder.Read("note")) << "nobody tidied up";
    EXPECT_EQ(1, Post("ours"));
    EXPECT_EQ("ours", ReadElsewhere());
}

TEST_F(SysNote, DoesNotLiveOnInAChild)
{
    int ends[2];
    ASSERT_EQ(0, pipe(ends));
    Helper helper([&] {
        int ok = Post("theirs");
        pid_t child = fork();
        if (child == 0) {
            sleep(600);
            _exit(0);
        }
        return ok && write(ends[1], &child, sizeof child) == sizeof child;
    });
    pid_t child;
    ASSERT_EQ(static_cast<ssize_t>(sizeof child), read(ends[0], &child, sizeof child));
    EXPECT_EQ("theirs", Read());
    helper.Kill();
    EXPECT_EQ(0, kill(child, 0));
    EXPECT_EQ(NOTHING, Read());
    kill(child, SIGKILL);
}

TEST_F(SysNote, DoesNotEndWithAChildThatReadsIt)
{
    ASSERT_EQ(1, Post("ours"));
    EXPECT_EQ("ours", ReadElsewhere());
    EXPECT_EQ("ours", ReadElsewhere());
}

TEST_F(SysNote, DoesNotEndWhenAProgramIsStarted)
{
    ASSERT_EQ(1, Post("ours"));
    const char *argv[] = {"true", nullptr};
    int status = -1;
    free(Sys_RunForOutput(argv, 30000, &status));
    ASSERT_EQ(0, status);
    EXPECT_EQ("ours", ReadElsewhere());
}

TEST_F(SysNote, IsThatOfTheLastOfTwoProcesses)
{
    Helper first([this] { return Post("first"); });
    ASSERT_EQ(1, Post("ours"));
    Helper second([this] { return Post("second"); });
    EXPECT_EQ("second", Read());
    first.Kill();
    EXPECT_EQ("second", Read());
    second.Kill();
    EXPECT_EQ(NOTHING, Read()) << "ours was replaced";
    ASSERT_EQ(1, Post("ours again"));
    EXPECT_EQ("ours again", ReadElsewhere());
}

TEST_F(SysNote, IsNeverSeenHalf)
{
    pid_t writer = fork();
    if (writer == 0)
        for (int i = 0;; ++i)
            Post(string(i % 2 ? 4000 : 10, 'x').c_str());
    while (Read() == NOTHING)
        usleep(1000);
    std::set<size_t> sizes;
    for (int i = 0; i < 5000; ++i)
        sizes.insert(Read().size());
    kill(writer, SIGKILL);
    waitpid(writer, nullptr, 0);
    EXPECT_EQ((std::set<size_t>{10, 4000}), sizes);
}

TEST_F(SysNote, IsReadFromNothingButAFile)
{
    ASSERT_EQ(0, mkfifo(m_path.c_str(), 0600));
    EXPECT_EQ(NOTHING, Read());
    unlink(m_path.c_str());
    string other = m_folder.Path("other");
    Helper helper([&] { return Sys_PostNote(other.c_str(), "text"); });
    ASSERT_EQ(0, symlink("other", m_path.c_str()));
    EXPECT_EQ(NOTHING, Read());
    EXPECT_EQ("text", TextOf(Sys_ReadNote(other.c_str())));
}

TEST_F(SysNote, IsAtMostFourKilobytes)
{
    EXPECT_EQ(1, Post(string(4096, 'x').c_str()));
    EXPECT_EQ(4096u, Read().size());
    EXPECT_EQ(0, Post(string(4097, 'y').c_str()));
    EXPECT_EQ(string(4096, 'x'), Read());
    EXPECT_EQ((std::set<string>{"note"}), m_folder.Names());
}

TEST_F(SysNote, FailsWhereItCannotBeWritten)
{
    m_path = m_folder.Path("missing/note");
    SysReason why = {};
    EXPECT_EQ(0, Sys_PostNote(m_path.c_str(), "text", &why));
    EXPECT_EQ("No such file or directory", ToldLater(why));
    m_path = m_folder.Path();
    EXPECT_EQ(0, Sys_PostNote(m_path.c_str(), "text", &why));
    EXPECT_NE("", ToldLater(why));
    EXPECT_EQ(0, Sys_PostNote(m_folder.Path("note").c_str(), string(4097, 'y').c_str(), &why));
    EXPECT_EQ("File too large", ToldLater(why));
}

} // namespace

// tests/sys_socket_test.cpp - byte streams between the user's processes.

#include "base/Sys.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstring>
#include <string>
#include <vector>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include "store/BibStore.h"
#include "tests/support/TempFolder.h"
#include "tests/support/ToldLater.h"

namespace
{

const int NOBODY = 65534;

// Runs `body` in another process: 1 when it returned nonzero there.
template <typename Body> int InAnotherProcess(Body body)
{
    pid_t child = fork();
    if (child == 0)
        _exit(body() ? 0 : 1);
    int status = -1;
    waitpid(child, &status, 0);
    EXPECT_TRUE(WIFEXITED(status));
    return WEXITSTATUS(status) == 0;
}

int BindSocket(const std::string &path, int type)
{
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    strcpy(address.sun_path, path.c_str());
    int bound = socket(AF_UNIX, type, 0);
    EXPECT_EQ(0, bind(bound, reinterpret_cast<sockaddr *>(&address), sizeof address));
    return bound;
}

// A socket file that nobody serves.
void LeaveDeadSocket(const std::string &path)
{
    close(BindSocket(path, SOCK_STREAM));
}

int Accept(int listener)
{
    return Sys_WaitReadable(listener, 5000) ? Sys_AcceptLocal(listener) : 0;
}

std::string Receive(int socket)
{
    char buffer[100];
    long got = Sys_WaitReadable(socket, 5000) ? Sys_Receive(socket, buffer, sizeof buffer) : -2;
    return got > 0 ? std::string(buffer, static_cast<size_t>(got)) : std::to_string(got);
}

// A server and one peer of it.
class SysSocket : public testing::Test
{
protected:
    void SetUp() override
    {
        SysReason why = {};
        listener = Sys_ListenLocal(path.c_str(), &why);
        ASSERT_NE(0, listener) << why.text;
        client = Sys_ConnectLocal(path.c_str(), 1000, &why);
        ASSERT_NE(0, client) << why.text;
        server = Accept(listener);
        ASSERT_NE(0, server);
    }

    void TearDown() override
    {
        Sys_CloseSocket(client);
        if (server)
            Sys_CloseSocket(server);
        Sys_CloseListener(listener, path.c_str());
        EXPECT_EQ(0u, folder.Names().size());
    }

    TempFolder folder;
    std::string path = folder.Path("socket");
    int listener = 0, client = 0, server = 0;
};

// --- Reading and writing ---

TEST_F(SysSocket, CarriesBytesBothWays)
{
    EXPECT_EQ(5, Sys_Send(client, "hello", 5));
    EXPECT_EQ("hello", Receive(server));
    EXPECT_EQ(2, Sys_Send(server, "yo", 2));
    EXPECT_EQ("yo", Receive(client));
}

TEST_F(SysSocket, NeverWaits)
{
    char byte;
    EXPECT_EQ(0, Sys_Receive(client, &byte, 1));
    EXPECT_EQ(0, Sys_AcceptLocal(listener));
    EXPECT_EQ(0, Sys_WaitReadable(client, 20));
    std::string block(100000, 'x');
    long sent = 0, total = 0;
    while ((sent = Sys_Send(client, block.data(), block.size())) > 0)
        total += sent;
    EXPECT_EQ(0, sent);
    EXPECT_LT(100, total);
    EXPECT_EQ(0, Sys_WaitWritable(client, 20));
    EXPECT_NE("0", Receive(server));
}

TEST_F(SysSocket, TellsThatTheOtherSideIsGone)
{
    Sys_Send(server, "bye", 3);
    Sys_CloseSocket(server);
    server = 0;
    EXPECT_EQ("bye", Receive(client));
    EXPECT_EQ("-1", Receive(client));
    EXPECT_EQ(-1, Sys_Send(client, "x", 1));
    EXPECT_EQ(1, Sys_WaitWritable(client, 0));
}

TEST_F(SysSocket, IsNotInherited)
{
    for (int socket : {listener, client, server}) {
        EXPECT_TRUE(fcntl(socket, F_GETFD) & FD_CLOEXEC);
        EXPECT_TRUE(fcntl(socket, F_GETFL) & O_NONBLOCK);
    }
}

TEST_F(SysSocket, FinishesWhenAllWasRead)
{
    Sys_Send(client, "all", 3);
    EXPECT_EQ(-1, Sys_FinishSending(client, 20));
    EXPECT_EQ("all", Receive(server));
    EXPECT_EQ("-1", Receive(server));
    Sys_Send(server, "thanks", 6);
    Sys_CloseSocket(server);
    server = 0;
    EXPECT_EQ(1, Sys_FinishSending(client, 5000));
}

TEST_F(SysSocket, DoesNotFinishWhenSomethingWasLeftUnread)
{
    Sys_Send(client, "all", 3);
    char byte;
    EXPECT_EQ(1, Sys_Receive(server, &byte, 1));
    Sys_CloseSocket(server);
    server = 0;
    EXPECT_EQ(0, Sys_FinishSending(client, 5000));
}

TEST_F(SysSocket, FinishesInTimeWhateverComes)
{
    std::string block(1000, 'x');
    while (Sys_Send(server, block.data(), block.size()) > 0) {
    }
    pid_t child = fork(); // talks on and on
    if (child == 0) {
        alarm(20);
        for (;;)
            Sys_Send(server, block.data(), block.size());
    }
    int32_t start = Sys_Milliseconds();
    EXPECT_EQ(-1, Sys_FinishSending(client, 100));
    EXPECT_GT(5000, Sys_Milliseconds() - start);
    kill(child, SIGKILL);
    waitpid(child, nullptr, 0);
}

// --- Who may serve a path ---

TEST(SysListenLocal, MakesAFileForTheUserAlone)
{
    TempFolder folder;
    std::string path = folder.Path("socket");
    mode_t mask = umask(0);
    int listener = Sys_ListenLocal(path.c_str());
    umask(mask);
    ASSERT_LT(2, listener);
    struct stat status;
    ASSERT_EQ(0, lstat(path.c_str(), &status));
    EXPECT_TRUE(S_ISSOCK(status.st_mode));
    EXPECT_EQ(0600u, status.st_mode & 07777);
    EXPECT_EQ(std::set<std::string>{"socket"}, folder.Names());
    Sys_CloseListener(listener, path.c_str());
    EXPECT_TRUE(folder.Names().empty());
}

TEST(SysListenLocal, ReplacesADeadSocket)
{
    SysReason why = {};
    TempFolder folder;
    std::string path = folder.Path("socket");
    LeaveDeadSocket(path);
    EXPECT_EQ(0, Sys_ConnectLocal(path.c_str(), 100, &why));
    EXPECT_EQ("Connection refused", ToldLater(why));
    int listener = Sys_ListenLocal(path.c_str());
    ASSERT_NE(0, listener);
    int client = Sys_ConnectLocal(path.c_str(), 100);
    EXPECT_NE(0, client);
    Sys_CloseSocket(client);
    Sys_CloseListener(listener, path.c_str());
}

TEST(SysListenLocal, NeverReplacesALiveSocket)
{
    SysReason why = {};
    TempFolder folder;
    std::string path = folder.Path("socket");
    int listener = Sys_ListenLocal(path.c_str());
    ASSERT_NE(0, listener);
    EXPECT_EQ(0, Sys_ListenLocal(path.c_str(), &why));
    EXPECT_EQ("Address already in use", ToldLater(why));
    EXPECT_TRUE(InAnotherProcess([&] { return Sys_ListenLocal(path.c_str()) == 0; }));
    int client = Sys_ConnectLocal(path.c_str(), 100);
    EXPECT_NE(0, client);
    Sys_CloseSocket(client);
    Sys_CloseListener(listener, path.c_str());
}

TEST(SysListenLocal, NeverReplacesASocketWithAFullQueue)
{
    SysReason why = {};
    TempFolder folder;
    std::string path = folder.Path("socket");
    int listener = Sys_ListenLocal(path.c_str());
    ASSERT_EQ(0, listen(listener, 0));
    int waiting = Sys_ConnectLocal(path.c_str(), 100);
    ASSERT_NE(0, waiting);
    int32_t start = Sys_Milliseconds();
    EXPECT_EQ(0, Sys_ConnectLocal(path.c_str(), 50, &why));
    EXPECT_EQ("Connection timed out", ToldLater(why));
    EXPECT_LE(50, Sys_Milliseconds() - start);
    EXPECT_EQ(0, Sys_ListenLocal(path.c_str()));
    Sys_CloseSocket(waiting);
    Sys_CloseListener(listener, path.c_str());
}

// Else thousands that are gone would have to be heard before the next that is there.
TEST(SysListenLocal, LetsNotTooManyWait)
{
    SysReason why = {};
    TempFolder folder;
    std::string path = folder.Path("socket");
    int listener = Sys_ListenLocal(path.c_str());
    int waiting = 0;
    while (int client = Sys_ConnectLocal(path.c_str(), 0, &why)) {
        Sys_CloseSocket(client);
        ++waiting;
    }
    EXPECT_EQ("Connection timed out", ToldLater(why));
    EXPECT_LE(200, waiting);
    EXPECT_GE(300, waiting);
    Sys_CloseListener(listener, path.c_str());
}

TEST(SysListenLocal, LeavesEverythingElseAlone)
{
    TempFolder folder;
    std::string file = folder.Write("file", "text");
    std::string link = folder.Path("link");
    std::string other = folder.Path("other");
    std::string dead = folder.Path("dead");
    LeaveDeadSocket(dead);
    ASSERT_EQ(0, symlink("dead", link.c_str()));
    ASSERT_EQ(0, mkdir(folder.Path("folder").c_str(), 0700));
    int bound = BindSocket(other, SOCK_DGRAM);
    std::set<std::string> before = folder.Names();
    for (const std::string &path : {file, link, folder.Path("folder"), other})
        EXPECT_EQ(0, Sys_ListenLocal(path.c_str())) << path;
    EXPECT_EQ(before, folder.Names());
    EXPECT_EQ("text", folder.Read("file"));
    close(bound);
}

TEST(SysListenLocal, LeavesTheSocketOfAnotherUserAlone)
{
    SysReason why = {};
    if (geteuid() != 0)
        GTEST_SKIP() << "only the superuser can make one";
    TempFolder folder;
    std::string path = folder.Path("socket");
    LeaveDeadSocket(path);
    ASSERT_EQ(0, chown(path.c_str(), NOBODY, NOBODY));
    EXPECT_EQ(0, Sys_ListenLocal(path.c_str(), &why));
    EXPECT_EQ("Permission denied", ToldLater(why));
    EXPECT_EQ(1u, folder.Names().size());
}

TEST(SysListenLocal, RefusesWhatIsNoPathOfASocket)
{
    SysReason why = {};
    TempFolder folder;
    std::string longest = folder.Path(std::string(107 - folder.Path("").size(), 'x'));
    EXPECT_EQ(0, Sys_ListenLocal(""));
    EXPECT_EQ(0, Sys_ConnectLocal("", 100));
    EXPECT_EQ(0, Sys_ListenLocal((longest + "x").c_str(), &why));
    EXPECT_EQ("File name too long", ToldLater(why));
    EXPECT_EQ(0, Sys_ConnectLocal((longest + "x").c_str(), 100, &why));
    EXPECT_EQ("File name too long", ToldLater(why));
    EXPECT_EQ(0, Sys_ListenLocal(folder.Path("missing/socket").c_str(), &why));
    EXPECT_EQ("No such file or directory", ToldLater(why));
    int listener = Sys_ListenLocal(longest.c_str());
    EXPECT_NE(0, listener);
    Sys_CloseListener(listener, longest.c_str());
}

// Processes that all try to serve one path at the same moment.
class Racers
{
public:
    explicit Racers(const std::string &path)
    {
        EXPECT_EQ(0, pipe(m_start) | pipe(m_answers) | pipe(m_end));
        for (int i = 0; i < COUNT; ++i) {
            m_children[i] = fork();
            if (m_children[i] == 0)
                Race(path);
        }
    }

    ~Racers()
    {
        for (int fd : {m_start[0], m_answers[0], m_answers[1], m_end[0], m_end[1]})
            close(fd);
        for (pid_t child : m_children)
            waitpid(child, nullptr, 0);
    }

    // How many serve it now.
    int Start()
    {
        int winners = 0;
        char answer = 0;
        close(m_start[1]);
        for (int i = 0; i < COUNT && read(m_answers[0], &answer, 1) == 1; ++i)
            winners += answer;
        return winners;
    }

private:
    enum { COUNT = 8 };

    [[noreturn]] void Race(const std::string &path)
    {
        char byte;
        close(m_start[1]);
        close(m_end[1]);
        while (read(m_start[0], &byte, 1) > 0) {
        }
        byte = Sys_ListenLocal(path.c_str()) != 0;
        bool told = write(m_answers[1], &byte, 1) == 1;
        while (read(m_end[0], &byte, 1) > 0) {
        }
        _exit(told ? 0 : 1);
    }

    int m_start[2], m_answers[2], m_end[2];
    pid_t m_children[COUNT];
};

TEST(SysListenLocal, HasOneWinnerAmongManyAtOnce)
{
    TempFolder folder;
    std::string path = folder.Path("socket");
    for (int round = 0; round < 20; ++round) {
        LeaveDeadSocket(path);
        Racers racers(path);
        EXPECT_EQ(1, racers.Start());
        int client = Sys_ConnectLocal(path.c_str(), 100);
        EXPECT_NE(0, client) << "the winner's file is gone";
        Sys_CloseSocket(client);
        unlink(path.c_str());
    }
}

TEST(SysListenLocal, WaitsForTheFolderNoLongerThanItMust)
{
    TempFolder folder;
    int lock = open(folder.Path().c_str(), O_RDONLY);
    ASSERT_EQ(0, flock(lock, LOCK_EX));
    int32_t start = Sys_Milliseconds();
    EXPECT_EQ(0, Sys_ListenLocal(folder.Path("socket").c_str()));
    EXPECT_GT(5000, Sys_Milliseconds() - start);
    close(lock);
}

TEST(SysCloseListener, LeavesTheFileOfASuccessorAlone)
{
    TempFolder folder;
    std::string path = folder.Path("socket");
    int first = Sys_ListenLocal(path.c_str());
    unlink(path.c_str());
    int second = Sys_ListenLocal(path.c_str());
    ASSERT_NE(0, second);
    Sys_CloseListener(first, path.c_str());
    EXPECT_EQ(1u, folder.Names().size());
    Sys_CloseListener(second, path.c_str());
    EXPECT_EQ(0u, folder.Names().size());
}

// --- Who may connect ---

TEST(SysAcceptLocal, TurnsAwayAnotherUser)
{
    SysReason why = {};
    if (geteuid() != 0)
        GTEST_SKIP() << "only the superuser can become one";
    TempFolder folder;
    std::string path = folder.Path("socket");
    int listener = Sys_ListenLocal(path.c_str());
    chmod(folder.Path().c_str(), 0755);
    chmod(path.c_str(), 0666);
    // The connection itself succeeds; its server is not of the same user.
    EXPECT_TRUE(InAnotherProcess([&] {
        return setuid(NOBODY) == 0 && Sys_ConnectLocal(path.c_str(), 100, &why) == 0 &&
               ToldLater(why) == "Permission denied";
    }));
    EXPECT_EQ(1, Sys_WaitReadable(listener, 1000));
    EXPECT_EQ(0, Sys_AcceptLocal(listener));
    Sys_CloseListener(listener, path.c_str());
}

TEST(SysAcceptLocal, TakesTheNextAfterAnotherUser)
{
    if (geteuid() != 0)
        GTEST_SKIP() << "only the superuser can become one";
    TempFolder folder;
    std::string path = folder.Path("socket");
    int listener = Sys_ListenLocal(path.c_str());
    chmod(folder.Path().c_str(), 0755);
    chmod(path.c_str(), 0666);
    InAnotherProcess([&] { return setuid(NOBODY) == 0 && Sys_ConnectLocal(path.c_str(), 100); });
    int client = Sys_ConnectLocal(path.c_str(), 100);
    int server = Sys_AcceptLocal(listener);
    ASSERT_NE(0, server);
    Sys_Send(client, "me", 2);
    EXPECT_EQ("me", Receive(server));
    Sys_CloseSocket(client);
    Sys_CloseSocket(server);
    Sys_CloseListener(listener, path.c_str());
}

TEST(SysConnectLocal, SaysWhyItFails)
{
    SysReason why = {};
    TempFolder folder;
    EXPECT_EQ(0, Sys_ConnectLocal(folder.Path("missing").c_str(), 100, &why));
    EXPECT_EQ("No such file or directory", ToldLater(why));
}

TEST(SysListenLocal, StaysOffTheStandardStreams)
{
    TempFolder folder;
    std::string path = folder.Path("socket");
    EXPECT_TRUE(InAnotherProcess([&] {
        for (int fd : {0, 1, 2})
            close(fd);
        int listener = Sys_ListenLocal(path.c_str());
        int client = Sys_ConnectLocal(path.c_str(), 100);
        int server = Sys_AcceptLocal(listener);
        return listener > 2 && client > 2 && server > 2 && fcntl(0, F_GETFD) < 0;
    }));
}

} // namespace

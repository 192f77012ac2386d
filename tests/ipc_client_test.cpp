// tests/ipc_client_test.cpp - the client's side of the command channel.

#include "app/Ipc.h"
#include "app/IpcClient.h"
#include "app/IpcMessage.h"

#include <gtest/gtest.h>

#include <csignal>
#include <functional>
#include <string>
#include <vector>

#include <sys/wait.h>
#include <unistd.h>

#include "base/Sys.h"
#include "store/BibStore.h"
#include "tests/support/LogWatch.h"
#include "tests/support/TempFolder.h"

namespace
{

using Lines = std::vector<std::string>;

// A service in a temporary folder, with a server in a process of its own.
class IpcClient : public testing::Test
{
protected:
    IpcClient()
    {
        setenv("XDG_RUNTIME_DIR", folder.Path().c_str(), 1);
        service = folder.Path("service");
    }

    ~IpcClient() override
    {
        if (server <= 0)
            return;
        kill(server, SIGKILL);
        waitpid(server, nullptr, 0);
    }

    // Listens at the path and gives the first client to `body`.
    void Serve(const std::string &path, const std::function<void(int client)> &body)
    {
        SysReason why = {};
        int listener = Sys_ListenLocal(path.c_str(), &why);
        ASSERT_NE(0, listener) << why.text;
        server = fork();
        if (server != 0) {
            Sys_CloseSocket(listener);
            return;
        }
        Sys_WaitReadable(listener, 10000);
        int client = Sys_AcceptLocal(listener);
        body(client);
        Sys_CloseSocket(client);
        _exit(0);
    }

    // Reads what the client sends until it says no more, and keeps it in a file.
    void Record(int client) const
    {
        std::string all;
        char buffer[1000];
        for (long got = 0; got >= 0;) {
            got = Sys_WaitReadable(client, 10000) ? Sys_Receive(client, buffer, sizeof buffer) : -1;
            all.append(buffer, got > 0 ? static_cast<size_t>(got) : 0);
        }
        folder.Write("received", all);
    }

    std::string Received()
    {
        waitpid(server, nullptr, 0);
        server = 0;
        return folder.Read("received");
    }

    std::string Connected(bool connected) const
    {
        return "Client host=\"localhost\" port=\"" + service + "\" topic=\"CommandLine\" " +
               (connected ? "connected" : "failed to connect");
    }

    LogWatch log;
    TempFolder folder;
    std::string service;
    pid_t server = 0;
};

void Say(int client, const std::string &bytes)
{
    Sys_Send(client, bytes.data(), bytes.size());
}

// Reads the request for the connection, and accepts it.
void Accept(int client)
{
    char buffer[16];
    Sys_WaitReadable(client, 10000);
    Sys_Receive(client, buffer, sizeof buffer);
    Say(client, "\x0A");
}

// --- Paths ---

TEST_F(IpcClient, MeetsInAPrivateFolder)
{
    std::string path = Ipc_SocketPath("/tmp/Quarlo-DDE-Cartulo-/home/u/work/");
    EXPECT_EQ(folder.Path("quarlo/"), path.substr(0, path.rfind('/') + 1));
    EXPECT_EQ(".sock", path.substr(path.size() - 5));
    EXPECT_EQ(path, Ipc_SocketPath("/tmp/Quarlo-DDE-Cartulo-/home/u/work/"));
    EXPECT_NE(path, Ipc_SocketPath("/tmp/Quarlo-DDE-Cartulo-/home/u/work"));
}

TEST_F(IpcClient, MeetsAtTheNameWhereASocketCanStand)
{
    EXPECT_EQ(service, Ipc_NamedPath(service.c_str()));
    for (const std::string &name :
         {std::string(), std::string("service"), std::string("folder/service"),
          folder.Path("missing/service"), folder.Path("service/"), std::string("/")})
        EXPECT_EQ("", Ipc_NamedPath(name.c_str())) << name;
}

// --- SendCommand ---

TEST_F(IpcClient, SendsACommand)
{
    Serve(Ipc_SocketPath(service.c_str()), [this](int client) {
        Accept(client);
        Record(client);
    });
    log.Lines();
    EXPECT_EQ(1, SendCommand(service.c_str(), "-d/w/ \xC3\xBC.bib"));
    EXPECT_EQ((Lines{"SendCommand -d/w/ \xC3\xBC.bib", "DDE client is connecting...",
                     "Connection " + Connected(true), "DDE client Execute...",
                     "DDE client disconnected from server"}),
              log.Lines());
    EXPECT_EQ(Ipc_Execute("-d/w/ \xC3\xBC.bib") + "\x0B", Received());
}

TEST_F(IpcClient, TriesTheNameToo)
{
    Serve(service, [this](int client) {
        Accept(client);
        Record(client);
    });
    EXPECT_EQ(1, SendCommand(service.c_str(), "a.bib"));
    EXPECT_EQ(Ipc_Execute("a.bib") + "\x0B", Received());
}

TEST_F(IpcClient, FailsAtOnceWhereNobodyServes)
{
    log.Lines();
    EXPECT_EQ(0, SendCommand(service.c_str(), "a.bib", 60000));
    EXPECT_EQ((Lines{"SendCommand a.bib", "DDE client is connecting...",
                     "Connection " + Connected(false)}),
              log.Lines());
}

TEST_F(IpcClient, FailsWhenTheTopicIsRefused)
{
    Serve(service, [](int client) {
        Sys_WaitReadable(client, 10000);
        Say(client, "\x09");
    });
    EXPECT_EQ(0, SendCommand(service.c_str(), "a.bib", 60000));
}

TEST_F(IpcClient, FailsWhenTheAnswerMakesNoSense)
{
    Serve(service, [](int client) { Say(client, "HTTP/1.1 200 OK"); });
    EXPECT_EQ(0, SendCommand(service.c_str(), "a.bib", 60000));
}

TEST_F(IpcClient, WaitsForAMuteServerNoLongerThanItMust)
{
    int listener = Sys_ListenLocal(Ipc_SocketPath(service.c_str()).c_str());
    ASSERT_NE(0, listener);
    int32_t start = Sys_Milliseconds();
    EXPECT_EQ(0, SendCommand(service.c_str(), "a.bib", 50));
    EXPECT_LE(50, Sys_Milliseconds() - start);
    EXPECT_GT(5000, Sys_Milliseconds() - start);
    Sys_CloseListener(listener, Ipc_SocketPath(service.c_str()).c_str());
}

TEST_F(IpcClient, IsNotHeldUpByAServerThatOnlyTalks)
{
    Serve(service, [](int client) {
        std::string news = Ipc_Advise("item", "news");
        for (;;)
            Say(client, news);
    });
    int32_t start = Sys_Milliseconds();
    EXPECT_EQ(0, SendCommand(service.c_str(), "a.bib", 50));
    EXPECT_GT(5000, Sys_Milliseconds() - start);
}

TEST_F(IpcClient, SaysWhenTheServerLeavesTheTextUnread)
{
    Serve(service, [](int client) {
        Accept(client);
        Sys_WaitReadable(client, 10000);
    });
    log.Lines();
    EXPECT_EQ(0, SendCommand(service.c_str(), "a.bib", 60000));
    EXPECT_EQ((Lines{"SendCommand a.bib", "DDE client is connecting...",
                     "Connection " + Connected(true), "DDE client Execute...",
                     "DDE client Execute failed!", "DDE client disconnected from server"}),
              log.Lines());
}

TEST_F(IpcClient, LeavesTheTextWithABusyServer)
{
    Serve(service, [this](int client) {
        Accept(client);
        usleep(300000);
        Record(client);
    });
    EXPECT_EQ(1, SendCommand(service.c_str(), "a.bib", 50));
    EXPECT_EQ(Ipc_Execute("a.bib") + "\x0B", Received());
}

TEST_F(IpcClient, SendsNoMoreThanAServerTakes)
{
    std::string longest(IPC_DATA_SIZE - 1, 'x');
    Serve(service, [this](int client) {
        Accept(client);
        Record(client);
    });
    EXPECT_EQ(1, SendCommand(service.c_str(), longest.c_str(), 60000));
    EXPECT_TRUE(Ipc_Execute(longest.c_str()) + "\x0B" == Received());
    Serve(service, [this](int client) {
        Accept(client);
        Record(client);
    });
    EXPECT_EQ(0, SendCommand(service.c_str(), (longest + "x").c_str(), 60000));
    EXPECT_EQ("", Received());
}

// --- The other operations ---

TEST_F(IpcClient, RequestsAndPokes)
{
    Serve(service, [this](int client) {
        Accept(client);
        Sys_WaitReadable(client, 10000);
        Say(client, Ipc_Advise("item", "news") + Ipc_Reply("value") + "\x09\x0B");
        Record(client);
    });
    std::string data;
    {
        MyClient client(60000);
        ASSERT_TRUE(client.Connect(service.c_str(), "CommandLine"));
        log.Lines();
        EXPECT_TRUE(client.Connection()->Request("one", &data));
        EXPECT_EQ("value", data);
        EXPECT_FALSE(client.Connection()->Request("two", &data));
        EXPECT_FALSE(client.Connection()->Request("three", &data));
        EXPECT_TRUE(client.Connection()->Poke("four", "4"));
    }
    EXPECT_EQ((Lines{"DDE client Request...", "DDE client OnAdvise...", "DDE client Request...",
                     "DDE client Request...", "DDE client OnDisconnect()", "DDE client Poke...",
                     "DDE client disconnected from server"}),
              log.Lines());
    EXPECT_EQ(Ipc_Request("one") + Ipc_Request("two") + Ipc_Request("three") +
                  Ipc_Poke("four", "4"),
              Received());
}

} // namespace

// tests/gui/ipc_test.cpp - the command channel: clients of every kind, as they meet a server behind
// a real window.

#include "tests/gui/GuiTest.h"

#include <algorithm>
#include <csignal>
#include <memory>
#include <sstream>
#include <utility>

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <wx/datetime.h>
#include <wx/dcclient.h>
#include <wx/dialog.h>
#include <wx/timer.h>

#include "app/Ipc.h"
#include "app/IpcMessage.h"
#include "app/IpcServer.h"
#include "base/Companion.h"
#include "base/Sys.h"
#include "store/BibStore.h"
#include "ui/Cartulo.h"
#include "ui/QListBox.h"

using namespace std::string_literals;
using Lines = std::vector<LogLine>;
using Commands = std::vector<std::string>;

static const std::string Accepted = "\x0A", Refused = "\x09", Goodbye = "\x0B";
static const std::string Hello = Ipc_Connect("CommandLine");
static const std::string AskBytes = Ipc_Request("bytes[3]"), Bytes = Ipc_Reply("123");
static const std::string Gone = "(gone)", Silence = "(silence)";

// A client that sends whatever it likes.
class RawClient
{
public:
    explicit RawClient(const std::string &path, const std::string &bytes = "")
    {
        SysReason why = {};
        m_socket = Sys_ConnectLocal(path.c_str(), 1000, &why);
        EXPECT_NE(0, m_socket) << path << ": " << why.text;
        Say(bytes);
    }
    ~RawClient() { Leave(); }
    RawClient(const RawClient &) = delete;

    void Say(const std::string &bytes)
    {
        EXPECT_EQ(long(bytes.size()), Sys_Send(m_socket, bytes.data(), bytes.size()));
    }

    // Sends as much as the system takes.
    void Fill(const std::string &bytes)
    {
        while (Sys_Send(m_socket, bytes.data(), bytes.size()) > 0) {
        }
    }

    void Leave()
    {
        if (m_socket)
            Sys_CloseSocket(m_socket);
        m_socket = 0;
    }

    // The next bytes that the server sends, as many as that; Gone when it hangs up before.
    std::string Hear(size_t size, int milliseconds = 30000)
    {
        long got = 0;
        char buffer[512];
        std::string heard;
        auto isDone = [&] {
            got = Sys_Receive(m_socket, buffer, std::min(sizeof buffer, size - heard.size()));
            heard.append(buffer, got > 0 ? size_t(got) : 0);
            return got < 0 || heard.size() == size;
        };
        if (!WaitFor(isDone, milliseconds))
            return heard + Silence;
        return got < 0 ? heard + Gone : heard;
    }

private:
    int m_socket;
};

// A program that runs beside this one.
class Process
{
public:
    explicit Process(const std::vector<std::string> &words)
    {
        int ends[2];
        EXPECT_EQ(0, pipe2(ends, O_CLOEXEC));
        m_process = fork();
        if (m_process == 0)
            Run(words, ends[1]);
        close(ends[1]);
        fcntl(ends[0], F_SETFL, O_NONBLOCK);
        m_output = ends[0];
    }

    ~Process()
    {
        kill(m_process, SIGKILL);
        waitpid(m_process, nullptr, 0);
        close(m_output);
    }

    // What it has written when it has written that, or has ended.
    std::string Output(const std::string &last)
    {
        bool ended = false;
        WaitFor([&] {
            ended = !Read();
            return ended || m_text.find(last) != m_text.npos;
        });
        return m_text;
    }

    // All that it writes.
    std::string Output()
    {
        EXPECT_TRUE(WaitFor([this] { return !Read(); })) << "it does not end";
        return m_text;
    }

private:
    [[noreturn]] static void Run(const std::vector<std::string> &words, int output)
    {
        std::vector<char *> arguments;
        for (const std::string &word : words)
            arguments.push_back(const_cast<char *>(word.c_str()));
        arguments.push_back(nullptr);
        dup2(output, STDOUT_FILENO);
        execv(arguments[0], arguments.data());
        _exit(127);
    }

    bool Read() // false at the end
    {
        char buffer[1000];
        ssize_t got = read(m_output, buffer, sizeof buffer);
        m_text.append(buffer, got > 0 ? size_t(got) : 0);
        return got != 0;
    }

    pid_t m_process;
    int m_output;
    std::string m_text;
};

class CommandServer : public CartuloWindow
{
protected:
    void SetUp() override
    {
        setenv("XDG_RUNTIME_DIR", folder.Path().c_str(), 1);
        service = folder.Path("service");
        path = Ipc_SocketPath(service.c_str());
        Open("");
        ForgetLog();
        server.reset(StartCommandServer(service.c_str(), frame));
        ASSERT_TRUE(server);
    }

    void TearDown() override
    {
        server.reset();
        CartuloWindow::TearDown();
    }

    // The command lines that the program has been given since the last call; waits for that many.
    Commands Executed(size_t count, int milliseconds = 30000)
    {
        static const std::string start = "Cartulo: Command: ";
        WaitFor(
            [&] {
                for (const LogLine &line : TakeLog(start))
                    m_executed.push_back(line.text.substr(start.size()));
                return m_executed.size() >= count;
            },
            milliseconds);
        return std::exchange(m_executed, Commands());
    }

    // True when all that was sent before has been dealt with.
    bool IsServing() { return RawClient(path, Hello + AskBytes).Hear(9) == Accepted + Bytes; }

    std::string service, path;
    std::unique_ptr<MyServer> server;

private:
    Commands m_executed;
};

// --- Start and end ---

TEST_F(CommandServer, ServesItsName)
{
    EXPECT_EQ((Lines{{"INFO: DDE server started " + service, TNS_LIFECYCLE},
                     {"INFO: DDE server uses DDE", TNS_LIFECYCLE}}),
              TakeLog("INFO: DDE server"));
    for (const std::string &place : {path, service})
        EXPECT_EQ(Accepted, RawClient(place, Hello).Hear(1)) << place;
    server.reset();
    EXPECT_EQ(Lines({{"INFO: DDE server Disconnected client", TNS_LIFECYCLE}}),
              TakeLog("INFO: DDE server Dis"));
    EXPECT_FALSE(Sys_FileExists(path.c_str()));
    EXPECT_FALSE(Sys_FileExists(service.c_str()));
}

TEST_F(CommandServer, LeavesALiveServerAlone)
{
    ForgetLog();
    EXPECT_EQ(nullptr, StartCommandServer(service.c_str(), frame));
    EXPECT_EQ(Lines({{"ERROR: DDE server failed to start " + service, TNS_ERROR}}),
              TakeLog("ERROR: "));
    EXPECT_TRUE(IsServing());
    EXPECT_EQ(Accepted, RawClient(service, Hello).Hear(1));
}

TEST_F(CommandServer, TakesThePlaceOfADeadOne)
{
    server.reset();
    pid_t child = fork();
    if (child == 0)
        _exit(Sys_ListenLocal(path.c_str()) && Sys_ListenLocal(service.c_str()) ? 0 : 1);
    int status = -1;
    waitpid(child, &status, 0);
    ASSERT_EQ(0, status);
    ASSERT_TRUE(Sys_FileExists(path.c_str()));
    server.reset(StartCommandServer(service.c_str(), frame));
    ASSERT_TRUE(server);
    EXPECT_TRUE(IsServing());
    EXPECT_EQ(Accepted, RawClient(service, Hello).Hear(1));
}

TEST_F(CommandServer, ServesThePrivatePathWhereTheNameIsTaken)
{
    server.reset();
    folder.Write("service", "mine");
    ForgetLog();
    server.reset(StartCommandServer(service.c_str(), frame));
    ASSERT_TRUE(server);
    EXPECT_EQ(
        Lines({{"INFO: DDE server can't listen at " + service + ": File exists", TNS_LIFECYCLE},
               {"WARNING: DDE server can't be met at " + service, TNS_WARNING},
               {"INFO: DDE server started " + service, TNS_LIFECYCLE},
               {"INFO: DDE server uses DDE", TNS_LIFECYCLE}}),
        TakeLog(""));
    EXPECT_TRUE(IsServing());
    EXPECT_EQ("mine", folder.Read("service"));
}

TEST_F(CommandServer, KeepsTheNewestConnection)
{
    EXPECT_EQ(nullptr, server->Connection());
    RawClient first(path, Hello);
    EXPECT_EQ(Accepted, first.Hear(1));
    MyConnection *connection = server->Connection();
    EXPECT_NE(nullptr, connection);
    {
        RawClient second(path, Hello);
        EXPECT_EQ(Accepted, second.Hear(1));
        EXPECT_NE(connection, server->Connection());
        first.Say(AskBytes);
        EXPECT_EQ(Bytes, first.Hear(8));
    }
    EXPECT_TRUE(WaitFor([this] { return server->Connection() == nullptr; }));
    first.Say(AskBytes);
    EXPECT_EQ(Bytes, first.Hear(8));
}

// --- What clients may ask ---

TEST_F(CommandServer, AcceptsOneTopic)
{
    ForgetLog();
    EXPECT_EQ(Accepted, RawClient(path, Hello).Hear(1));
    EXPECT_EQ((Lines{{"INFO: DDE server OnAcceptConnection CommandLine", TNS_LIFECYCLE},
                     {"INFO: DDE server Connection accepted", TNS_LIFECYCLE}}),
              TakeLog("INFO: DDE server"));
    for (const std::string &topic : {"commandline"s, "CommandLine "s, ""s}) {
        ForgetLog();
        RawClient client(path, Ipc_Connect(topic.c_str()) + Ipc_Execute("no.bib"));
        EXPECT_EQ(Refused + Gone, client.Hear(2)) << topic;
        EXPECT_EQ(Lines({{"ERROR: DDE server Unknown topic, connection refused", TNS_ERROR}}),
                  TakeLog("ERROR: "));
    }
    EXPECT_TRUE(IsServing());
    EXPECT_EQ(Commands(), Executed(1, 100));
}

TEST_F(CommandServer, AnswersRequests)
{
    RawClient client(path, Hello);
    ASSERT_EQ(Accepted, client.Hear(1));
    ForgetLog();
    client.Say(AskBytes);
    EXPECT_EQ(Bytes, client.Hear(8));
    EXPECT_EQ(Lines({{"INFO: DDE server OnRequest...", TNS_LIFECYCLE}}), TakeLog("INFO: DDE "));

    std::string length, before = wxDateTime::Now().Format().ToStdString();
    client.Say(Ipc_Request("Date"));
    length = client.Hear(5);
    std::string date = client.Hear(before.size() + 1);
    EXPECT_EQ("\x08" + std::string(1, char(before.size() + 1)) + "\0\0\0"s, length);
    std::string after = wxDateTime::Now().Format().ToStdString();
    EXPECT_TRUE(date == before + '\0' || date == after + '\0') << date;
}

TEST_F(CommandServer, AnswersTheTimeBeforeTheDate)
{
    auto text = [] {
        wxDateTime now = wxDateTime::Now();
        return (now.FormatTime() + " " + now.FormatDate()).ToStdString();
    };
    std::string before = text();
    RawClient client(path, Hello + Ipc_Request("Date+len"));
    std::string answer = client.Hear(1 + 5 + before.size() + 1);
    EXPECT_TRUE(answer == Accepted + Ipc_Reply(before + '\0') ||
                answer == Accepted + Ipc_Reply(text() + '\0'))
        << answer;
}

TEST_F(CommandServer, HasNoOtherItems)
{
    RawClient client(path, Hello);
    ASSERT_EQ(Accepted, client.Hear(1));
    for (const char *item :
         {"date", "DATE", "Date+Len", "Date+x", "Date ", "Bytes[3]", "bytes[2]", "bytes[3]x", ""}) {
        ForgetLog();
        client.Say(Ipc_Request(item));
        EXPECT_EQ(Refused, client.Hear(1)) << item;
        EXPECT_EQ(Lines({{"ERROR: DDE server Unknown requestOnExecute "s + item, TNS_LIFECYCLE}}),
                  TakeLog("ERROR: "));
        EXPECT_EQ(Lines(), TakeLog("INFO: DDE server OnRequest"));
    }
    client.Say("\x02\x05\0\0\0Date\0\x01"s);
    EXPECT_EQ(Refused, client.Hear(1));
}

TEST_F(CommandServer, RefusesAPoke)
{
    RawClient client(path, Hello);
    ASSERT_EQ(Accepted, client.Hear(1));
    ForgetLog();
    client.Say(Ipc_Poke("Date", "2000") + AskBytes);
    EXPECT_EQ(Bytes, client.Hear(8)); // nothing comes before it
    EXPECT_EQ((Lines{{"INFO: DDE server OnPoke...", TNS_LIFECYCLE},
                     {"INFO: DDE server OnRequest...", TNS_LIFECYCLE}}),
              TakeLog("INFO: DDE server"));
}

TEST_F(CommandServer, AdvisesOfAnItem)
{
    RawClient client(path, Hello);
    ASSERT_EQ(Accepted, client.Hear(1));
    EXPECT_FALSE(server->Connection()->Advise("too early"));
    ForgetLog();
    client.Say("\x04\x04\0\0\0news"s);
    EXPECT_EQ("\x04", client.Hear(1));
    EXPECT_TRUE(server->Connection()->Advise("rain"));
    EXPECT_EQ("\x06\x04\0\0\0news\x11\x05\0\0\0rain\0"s, client.Hear(19));
    client.Say("\x07\x04\0\0\0news"s);
    EXPECT_EQ("\x07", client.Hear(1));
    EXPECT_FALSE(server->Connection()->Advise("too late"));
    EXPECT_EQ((Lines{{"INFO: DDE server OnStartAdvise news", TNS_LIFECYCLE},
                     {"INFO: DDE server Advice news", TNS_LIFECYCLE},
                     {"INFO: DDE server OnStopAdvise news", TNS_LIFECYCLE}}),
              TakeLog("INFO: DDE server"));
}

TEST_F(CommandServer, AdvisesNoFasterThanTheClientListens)
{
    RawClient client(path, Hello + "\x04\x04\0\0\0news"s);
    ASSERT_EQ(Accepted + "\x04", client.Hear(2));
    std::string expected, text(1000, 'x');
    while (server->Connection()->Advise(text.c_str()))
        expected += Ipc_Advise("news", text.c_str());
    EXPECT_TRUE(expected == client.Hear(expected.size()));
    EXPECT_TRUE(server->Connection()->Advise("rain"));
    EXPECT_EQ(Ipc_Advise("news", "rain"), client.Hear(19));
}

TEST_F(CommandServer, NoticesThatAClientLeaves)
{
    for (const std::string &last : {Goodbye, ""s}) {
        RawClient client(path, Hello);
        ASSERT_EQ(Accepted, client.Hear(1));
        ForgetLog();
        client.Say(last);
        client.Leave();
        EXPECT_TRUE(WaitFor([this] { return server->Connection() == nullptr; }));
        EXPECT_EQ(Lines({{"INFO: DDE server OnDisconnect()", TNS_LIFECYCLE}}), TakeLog(""));
    }
}

// --- Commands ---

TEST_F(CommandServer, OpensTheFilesOfACommand)
{
    std::string one = folder.Write("one.bib", "@book{one, title = {First}}\n");
    std::string two = folder.Write("zw\xC3\xB6lf.bib", "@book{two, title = {Second}}\n");
    RawClient client(path, Hello + Ipc_Execute((one + " '" + two + "'").c_str()));
    EXPECT_TRUE(WaitFor([this] { return Panel()->Files()->count == 2; }));
    EXPECT_TRUE(WaitFor([this] { return Rows().size() == 2; }));
    EXPECT_EQ(two, Panel()->Files()->files[1]->path);
    EXPECT_TRUE(IsShowing(List()->GetId()));
}

template <typename Character> static std::string RawText(const std::basic_string<Character> &text)
{
    return {reinterpret_cast<const char *>(text.data()), (text.size() + 1) * sizeof(Character)};
}

TEST_F(CommandServer, TakesTextInManyFormats)
{
    auto execute = [](char format, const std::string &data) {
        return "\x01"s + format + char(data.size()) + "\0\0\0"s + data;
    };
    ForgetLog();
    RawClient client(path, Hello + execute(1, RawText("'-ba\xFC'"s)) +
                               execute(17, RawText("'-bb\xC3\xBC'"s)) +
                               execute(18, RawText(U"'-bc\u00FC'"s)) +
                               execute(13, RawText(u"'-bd\u00FC'"s)) + execute(20, "-be"));
    EXPECT_EQ((Commands{"'-ba\xFC'", "'-bb\xC3\xBC'", "'-bc\xC3\xBC'", "'-bd\xC3\xBC'", "-be"}),
              Executed(5));
}

TEST_F(CommandServer, LogsACommand)
{
    ForgetLog();
    RawClient client(path, Hello + Ipc_Execute("-bnone") + AskBytes);
    EXPECT_EQ(Accepted + Bytes, client.Hear(9));
    EXPECT_EQ(Lines({{"INFO: DDE server Execute -bnone", TNS_LIFECYCLE}}),
              TakeLog("INFO: DDE server Execute"));
}

TEST_F(CommandServer, RefusesACommandThatIsNoText)
{
    ForgetLog();
    RawClient client(path, Hello + "\x01\x02\x05\0\0\0a.bib"s + AskBytes);
    EXPECT_EQ(Accepted + Bytes, client.Hear(9));
    EXPECT_EQ(Lines({{"ERROR: DDE server Execute refused, its data is no text", TNS_ERROR}}),
              TakeLog("ERROR: "));
    EXPECT_EQ(Commands(), Executed(1, 100));
}

TEST_F(CommandServer, TakesMessagesInAnyPieces)
{
    RawClient both(path, Hello + Ipc_Execute("-bone") + Ipc_Execute("-btwo") + Goodbye);
    EXPECT_EQ((Commands{"-bone", "-btwo"}), Executed(2));
    RawClient slow(path);
    for (char byte : Hello + Ipc_Execute("-bslow")) {
        slow.Say(std::string(1, byte));
        WaitFor([] { return false; }, 1);
    }
    EXPECT_EQ(Commands{"-bslow"}, Executed(1));
}

TEST_F(CommandServer, TakesACommandOfOneWhoLeavesAtOnce)
{
    RawClient(path, Hello + Ipc_Execute("-bquick")).Leave();
    EXPECT_EQ(Commands{"-bquick"}, Executed(1));
}

TEST_F(CommandServer, ExecutesNoHalfMessage)
{
    std::string message = Ipc_Execute("-bhalf");
    for (size_t size = 1; size < message.size(); ++size) {
        RawClient client(path, Hello);
        ASSERT_EQ(Accepted, client.Hear(1));
        client.Say(message.substr(0, size));
        client.Leave();
    }
    EXPECT_TRUE(IsServing());
    EXPECT_EQ(Commands(), Executed(1, 100));
    EXPECT_EQ(nullptr, server->Connection());
}

// --- Commands while the program is busy ---

// Runs `body` while a dialog of the program is open.
static void WhileADialogIsOpen(wxWindow *parent, const std::function<void()> &body)
{
    AllowDialogs allow;
    wxDialog dialog(parent, wxID_ANY, "Busy");
    dialog.CallAfter([&] {
        body();
        dialog.EndModal(wxID_OK);
    });
    dialog.ShowModal();
}

TEST_F(CommandServer, LetsACommandWaitForTheEndOfADialog)
{
    RawClient client(path);
    WhileADialogIsOpen(frame, [&] {
        client.Say(Hello + Ipc_Execute("-bone") + Ipc_Execute("-btwo") + AskBytes);
        EXPECT_EQ(Accepted + Bytes, client.Hear(9));
        EXPECT_EQ(Commands(), Executed(1, 300));
    });
    EXPECT_EQ((Commands{"-bone", "-btwo"}), Executed(2));
}

TEST_F(CommandServer, LetsNotTooManyCommandsWait)
{
    RawClient client(path);
    WhileADialogIsOpen(frame, [&] {
        client.Say(Hello);
        ForgetLog();
        for (int i = 0; i < 70; ++i)
            client.Say(Ipc_Execute(("-b" + std::to_string(i)).c_str()));
        client.Say(AskBytes);
        EXPECT_EQ(Accepted + Bytes, client.Hear(9));
        EXPECT_EQ(6u, TakeLog("ERROR: DDE server Too many commands wait").size());
    });
    Commands executed = Executed(64);
    ASSERT_EQ(64u, executed.size());
    EXPECT_EQ("-b63", executed.back());
    EXPECT_EQ(Commands(), Executed(1, 100));
}

// While a message box of a command asks something.
class LookWhileAsked : public wxModalDialogHook
{
public:
    explicit LookWhileAsked(const std::function<void()> &look) : m_look(look) { Register(); }

    int boxes = 0;

protected:
    int Enter(wxDialog *dialog) override
    {
        if (dynamic_cast<wxMessageDialog *>(dialog)) {
            ++boxes;
            m_look();
        }
        return wxID_OK;
    }

private:
    std::function<void()> m_look;
};

// Another process that holds the lock of a file.
class LockHolder
{
public:
    explicit LockHolder(const std::string &file)
    {
        char byte;
        int ends[2];
        EXPECT_EQ(0, pipe(ends));
        m_process = fork();
        if (m_process == 0) {
            alarm(60);
            if (Sys_LockFile(file.c_str()) && write(ends[1], "+", 1) == 1)
                pause();
            _exit(1);
        }
        close(ends[1]);
        EXPECT_EQ(1, read(ends[0], &byte, 1)) << "it did not get the lock";
        close(ends[0]);
    }

    ~LockHolder()
    {
        kill(m_process, SIGKILL);
        waitpid(m_process, nullptr, 0);
    }

private:
    pid_t m_process;
};

TEST_F(CommandServer, RunsOneCommandAtATime)
{
    std::string locked = folder.Write("locked.bib", "");
    LockHolder holder(locked);
    RawClient client(path, Hello);
    ASSERT_EQ(Accepted, client.Hear(1));
    LookWhileAsked hook([&] {
        client.Say(Ipc_Execute("-bsecond") + AskBytes);
        EXPECT_EQ(Bytes, client.Hear(8));
        EXPECT_EQ(Commands{locked}, Executed(2, 300));
    });
    client.Say(Ipc_Execute(locked.c_str()));
    EXPECT_TRUE(WaitFor([&] { return hook.boxes > 0; }));
    EXPECT_EQ(Commands{"-bsecond"}, Executed(1));
    hook.Unregister();
}

// Counts the messages in the log that begin so: all, and at most between two of its ticks.
class LogCounter : public wxTimer
{
public:
    explicit LogCounter(const std::string &start) : m_start(start)
    {
        ForgetLog();
        Start(1);
    }

    size_t all = 0, most = 0;

private:
    void Notify() override
    {
        size_t count = TakeLog(m_start).size();
        all += count;
        most = std::max(most, count);
    }

    std::string m_start;
};

TEST_F(CommandServer, LetsTheWindowGoOnBetweenCommands)
{
    std::string commands;
    for (int i = 0; i < 60; ++i)
        commands += Ipc_Execute("-bmany");
    LogCounter counter("Cartulo: Command: ");
    RawClient client(path, Hello + commands);
    EXPECT_TRUE(WaitFor([&] { return counter.all == 60; }));
    EXPECT_LT(counter.most, 10u);
}

TEST_F(CommandServer, LetsTheWindowGoOnBetweenMessages)
{
    std::string pokes;
    for (int i = 0; i < 1000; ++i)
        pokes += Ipc_Poke("x", "");
    LogCounter counter("INFO: DDE server OnPoke");
    RawClient client(path, Hello + pokes);
    EXPECT_TRUE(WaitFor([&] { return counter.all == 1000; }));
    EXPECT_LT(counter.most, 100u);
}

TEST_F(CommandServer, TakesOnlyTheCommandsOfOneWhoIsGone)
{
    std::string requests, last = folder.Write("last.bib", "@book{last, title = {Last}}\n");
    for (int i = 0; i < 1000; ++i)
        requests += AskBytes;
    LogCounter counter("INFO: DDE server OnRequest");
    RawClient(path, Hello + requests + Ipc_Execute(last.c_str())).Leave();
    EXPECT_TRUE(WaitFor([this] { return Panel()->Files()->count == 1; }));
    EXPECT_LT(counter.all, 100u);
    EXPECT_TRUE(IsServing());
}

TEST_F(CommandServer, OutlivesTheWindow)
{
    RawClient client(path, Hello);
    ASSERT_EQ(Accepted, client.Hear(1));
    frame->Destroy();
    DeleteClosedWindows();
    ASSERT_FALSE(frame);
    client.Say(Ipc_Execute("-blate") + AskBytes);
    EXPECT_EQ(Bytes, client.Hear(8));
    EXPECT_EQ(Commands(), Executed(1, 100));
}

TEST_F(CommandServer, DropsCommandsOnceTheWindowIsClosed)
{
    frame->Close(true);
    ASSERT_TRUE(frame);
    ASSERT_EQ(nullptr, Panel());
    RawClient client(path, Hello + Ipc_Execute("-blate") + AskBytes);
    EXPECT_EQ(Accepted + Bytes, client.Hear(9));
    EXPECT_EQ(Commands(), Executed(1, 100));
    DeleteClosedWindows();
}

// --- Hostile clients ---

TEST_F(CommandServer, DropsWhoSendsNoMessages)
{
    std::string allBytes;
    for (int byte = 255; byte >= 0; --byte)
        allBytes += char(byte);
    for (const std::string &bytes :
         {allBytes, "GET / HTTP/1.1\r\n\r\n"s, "\0"s, Ipc_Execute("-bunasked"), AskBytes,
          "\x0A\xFF\xFF\xFF\xFF"s, "\x0A\x01\x01\0\0"s, Hello + Hello,
          Hello + "\x01\x11\xFF\xFF\xFF\x7F"s, Hello + "\x01\x11\x01\0\x01\0"s,
          Hello + "\x02\xFF\xFF\xFF\xFF"s, Hello + "\x06\x01\0\0\0x\x01\0\0\0\0"s, Hello + "\x09"s,
          Hello + allBytes}) {
        ForgetLog();
        RawClient client(path, bytes);
        std::string expected = bytes.compare(0, Hello.size(), Hello) == 0 ? Accepted : "";
        EXPECT_EQ(expected + Gone, client.Hear(50)) << bytes;
        EXPECT_EQ(1u, TakeLog("WARNING: DDE server drops a client: it sends").size()) << bytes;
    }
    EXPECT_TRUE(IsServing());
    EXPECT_EQ(Commands(), Executed(1, 100));
}

TEST_F(CommandServer, DropsWhoDoesNotGoOn)
{
    RawClient idle(path, Hello);
    EXPECT_EQ(Accepted, idle.Hear(1));
    RawClient mute(path);
    RawClient half(path, Hello + Ipc_Execute("-bhalf").substr(0, 8));
    EXPECT_EQ(Accepted, half.Hear(1));
    ForgetLog();
    EXPECT_EQ(Silence, mute.Hear(1, 2500)); // half of its time
    EXPECT_EQ(Lines(), TakeLog("WARNING: "));
    RawClient deaf(path, Hello); // asks, and reads no answer
    for (int i = 0; i < 10; ++i) {
        deaf.Fill(AskBytes + AskBytes + AskBytes + AskBytes);
        EXPECT_TRUE(IsServing());
    }
    size_t dropped = 0;
    EXPECT_TRUE(WaitFor([&] {
        dropped += TakeLog("WARNING: DDE server drops a client: it does not go on").size();
        return dropped == 3;
    }));
    EXPECT_EQ(Gone, mute.Hear(1));
    EXPECT_EQ(Gone, half.Hear(1));
    std::string heard = deaf.Hear(1 << 20);
    EXPECT_EQ(Gone, heard.substr(heard.size() - Gone.size()));
    idle.Say(AskBytes);
    EXPECT_EQ(Bytes, idle.Hear(8));
    EXPECT_EQ(Commands(), Executed(1, 100));
}

TEST_F(CommandServer, ServesTheNextOfManyMuteClients)
{
    std::vector<std::unique_ptr<RawClient>> mute;
    for (int i = 0; i < 200; ++i)
        mute.push_back(std::make_unique<RawClient>(path));
    EXPECT_EQ("sent: 1\n", Process({IPC_PEER, "send", service, "-bnext"}).Output());
    EXPECT_EQ(Commands{"-bnext"}, Executed(1));
}

TEST_F(CommandServer, ServesTheNextOfManyIdleClients)
{
    std::vector<std::unique_ptr<RawClient>> idle;
    for (int i = 0; i < 200; ++i)
        idle.push_back(std::make_unique<RawClient>(path, Hello));
    EXPECT_EQ("sent: 1\n", Process({IPC_PEER, "send", service, "-bnext"}).Output());
    EXPECT_EQ(Commands{"-bnext"}, Executed(1));
}

TEST_F(CommandServer, TakesACommandOfEachOfManyClients)
{
    std::vector<std::unique_ptr<RawClient>> clients;
    for (int i = 0; i < 60; ++i)
        clients.push_back(std::make_unique<RawClient>(path, Hello + Ipc_Execute("-b") + Goodbye));
    EXPECT_EQ(Commands(60, "-b"), Executed(60));
}

// Another process that sends requests as fast as it can, and reads the answers.
class Flood
{
public:
    explicit Flood(const std::string &path) : m_process(fork())
    {
        if (m_process == 0)
            Run(path);
    }

    ~Flood()
    {
        kill(m_process, SIGKILL);
        waitpid(m_process, nullptr, 0);
    }

private:
    [[noreturn]] static void Run(const std::string &path)
    {
        char answers[4096];
        std::string bytes = Hello;
        int socket = Sys_ConnectLocal(path.c_str(), 1000);
        alarm(60);
        for (;;) {
            Sys_Send(socket, bytes.data(), bytes.size());
            Sys_Receive(socket, answers, sizeof answers);
            bytes = AskBytes;
        }
    }

    pid_t m_process;
};

TEST_F(CommandServer, DoesNotKeepTheWindowFromDrawing)
{
    std::vector<std::unique_ptr<Flood>> floods;
    for (int i = 0; i < 4; ++i)
        floods.push_back(std::make_unique<Flood>(path));
    size_t requests = 0;
    EXPECT_TRUE(WaitFor([&] {
        requests += TakeLog("INFO: DDE server OnRequest").size();
        return requests > 100;
    }));
    int drawn = 0;
    AllowDialogs allow;
    wxDialog dialog(frame, wxID_ANY, "Busy"); // has an event loop of the real kind
    dialog.Bind(wxEVT_PAINT, [&](wxPaintEvent &) {
        wxPaintDC dc(&dialog);
        ForgetLog();
        if (++drawn == 20)
            dialog.EndModal(wxID_OK);
        else
            dialog.CallAfter([&] { dialog.Refresh(); });
    });
    wxTimer giveUp(&dialog);
    dialog.Bind(wxEVT_TIMER, [&](wxTimerEvent &) { dialog.EndModal(wxID_CANCEL); });
    giveUp.StartOnce(30000);
    EXPECT_EQ(wxID_OK, dialog.ShowModal()) << "drawn only " << drawn << " times";
    EXPECT_TRUE(IsServing());
}

// --- Programs that are built on the toolkit's connections ---

// Dates of the size that is told for them become "a date".
static std::string WithoutDates(const std::string &output)
{
    std::string all, line;
    for (std::istringstream stream(output); std::getline(stream, line); all += line + '\n') {
        size_t quote = line.find('"');
        size_t length = quote == line.npos ? 0 : line.size() - quote - 2;
        std::string said = ": " + std::to_string(length + 1) + " bytes \"";
        if (line.compare(0, 4, "Date") == 0 && length > 10 && line.find(said) != line.npos)
            line.replace(line.find(said), line.npos, ": a date");
    }
    return all;
}

TEST_F(CommandServer, ServesTheToolkitsClient)
{
    Process peer({IPC_PEER, "client", service});
    peer.Output("start advise");
    ASSERT_TRUE(server->Connection());
    EXPECT_TRUE(server->Connection()->Advise("rain"));
    EXPECT_EQ("commandline: refused\n"
              "CommandLine: connected\n"
              "Date: a date\n"
              "Date+len: a date\n"
              "bytes[3]: 3 bytes \"123\"\n"
              "date: nothing\n"
              "Date+x: nothing\n"
              "Bytes[3]: nothing\n"
              "poke: 1\n" // that it was sent
              "start advise: 1\n"
              "advised of news: rain\n"
              "stop advise: 1\n"
              "execute: 1\n"
              "execute wide: 1\n"
              "execute 8-bit: 1\n"
              "execute bitmap: 1\n"
              "bytes[3]: 3 bytes \"123\"\n"
              "goodbye: 1\n",
              WithoutDates(peer.Output()));
    EXPECT_EQ((Commands{"'-bone \xC3\xBC'", "'-btwo \xC3\xBC'", "'-bthree \xFC'"}),
              Executed(4, 300));
}

TEST_F(CommandServer, TakesACommandOfASecondStart)
{
    EXPECT_EQ("sent: 1\nsent: 1\n",
              Process({IPC_PEER, "send", service, "-d/w/ -ba", "'-b\xC3\xBC'"}).Output());
    EXPECT_EQ((Commands{"-d/w/ -ba", "'-b\xC3\xBC'"}), Executed(2));
}

class ToolkitServer : public testing::Test
{
protected:
    ToolkitServer() { setenv("XDG_RUNTIME_DIR", folder.Path().c_str(), 1); }

    TempFolder folder;
    std::string service = folder.Path("companion");
};

TEST_F(ToolkitServer, TakesACommand)
{
    Process peer({IPC_PEER, "serve", service});
    ASSERT_EQ("serving\n", peer.Output("serving\n"));
    ForgetLog();
    EXPECT_EQ(1, SendCommand(service.c_str(), "-s (key) ...InsCite", 30000));
    EXPECT_EQ((Lines{{"INFO: SendCommand -s (key) ...InsCite", TNS_LIFECYCLE},
                     {"INFO: DDE client is connecting...", TNS_LIFECYCLE},
                     {"INFO: Connection Client host=\"localhost\" port=\"" + service +
                          "\" topic=\"CommandLine\" connected",
                      TNS_LIFECYCLE},
                     {"INFO: DDE client Execute...", TNS_LIFECYCLE},
                     {"INFO: DDE client disconnected from server", TNS_LIFECYCLE}}),
              TakeLog(""));
    EXPECT_EQ("serving\n"
              "accept CommandLine\n"
              "execute CommandLine: -s (key) ...InsCite\n"
              "client left\n",
              peer.Output());
}

TEST_F(ToolkitServer, TakesACommandThoughItIsSlow)
{
    Process peer({IPC_PEER, "serve", service, "3000"});
    ASSERT_EQ("serving\n", peer.Output("serving\n"));
    EXPECT_EQ(1, SendCommand(service.c_str(), "-s (key) ...InsCite", 1000));
    EXPECT_EQ("serving\n"
              "accept CommandLine\n"
              "execute CommandLine: -s (key) ...InsCite\n"
              "client left\n",
              peer.Output());
}

TEST_F(ToolkitServer, AnswersRequestsAndTakesAPoke)
{
    Process peer({IPC_PEER, "serve", service});
    ASSERT_EQ("serving\n", peer.Output("serving\n"));
    EXPECT_EQ("known: answer\nunknown: nothing\npoke: 1\n",
              Process({IPC_PEER, "send", service}).Output());
    EXPECT_EQ("serving\n"
              "accept CommandLine\n"
              "request known\n"
              "request unknown\n"
              "poke item: value\n"
              "client left\n",
              peer.Output());
}

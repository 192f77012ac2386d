// bench/Attacks.cpp - clients of the command channel that do what they can to keep a program busy.
#include "bench/Attacks.h"

#include <csignal>
#include <cstdint>
#include <cstdlib>
#include <memory>

#include <sys/wait.h>
#include <unistd.h>

#include "app/Ipc.h"
#include "app/IpcClient.h"
#include "app/IpcMessage.h"
#include "base/Sys.h"

enum { PATIENCE = 1000, PAUSE = 1000, BLOCK_SIZE = 16 * 1024, CROWD = 200, MANY = 4, TRIES = 10 };
enum { LONGEST_LIFE = 120 }; // seconds, should nobody end the process

namespace
{

class Client
{
public:
    explicit Client(const Victim &victim, const std::string &bytes = "")
        : m_socket(Sys_ConnectLocal(victim.path.c_str(), PATIENCE))
    {
        Send(bytes);
    }
    ~Client() { Leave(); }
    Client(const Client &) = delete;

    // Sends until nothing more goes.
    void Fill(const std::string &bytes)
    {
        while (Send(bytes) > 0) {
        }
    }

    // Sends all of it, dropping what comes.
    void SendAll(const std::string &bytes)
    {
        size_t sent = 0;
        while (m_socket && sent < bytes.size()) {
            long count = Send(bytes.substr(sent));
            sent += count > 0 ? size_t(count) : 0;
            if (count == 0)
                Sys_WaitWritable(m_socket, 1);
            Receive();
        }
    }

    void AwaitAnswer()
    {
        if (m_socket)
            Sys_WaitReadable(m_socket, PATIENCE);
        Receive();
    }

    bool IsConnected() const { return m_socket != 0; }

private:
    long Send(const std::string &bytes)
    {
        return m_socket ? Note(Sys_Send(m_socket, bytes.data(), bytes.size())) : -1;
    }

    void Receive()
    {
        char block[BLOCK_SIZE];
        while (m_socket && Note(Sys_Receive(m_socket, block, sizeof block)) > 0) {
        }
    }

    long Note(long count)
    {
        if (count < 0)
            Leave();
        return count;
    }

    void Leave()
    {
        if (m_socket)
            Sys_CloseSocket(m_socket);
        m_socket = 0;
    }

    int m_socket; // 0 when it is not connected
};

} // namespace

static const std::string Hello = Ipc_Connect(Ipc_Topic);

static std::string Repeat(const std::string &text, size_t size)
{
    std::string all;
    while (all.size() + text.size() <= size)
        all += text;
    return all;
}

// Clients that stay; those that were dropped come again.
static void Reconnect(std::vector<std::unique_ptr<Client>> *clients, const Victim &victim)
{
    for (std::unique_ptr<Client> &client : *clients)
        if (!client || !client->IsConnected())
            client = std::make_unique<Client>(victim, Hello);
}

// --- What they do ---

static void Spin(const Victim &)
{
    for (volatile unsigned i = 0;; i = i + 1) {
    }
}

static void SendGarbage(const Victim &victim)
{
    uint32_t state = 1;
    std::string bytes(BLOCK_SIZE, 0);
    for (;;) {
        for (char &byte : bytes)
            byte = static_cast<char>((state = state * 1664525u + 1013904223u) >> 24);
        Client(victim, bytes);
        Client(victim, Hello + bytes);
    }
}

static void SendHalfMessages(const Victim &victim)
{
    std::string message = Ipc_Execute("-a");
    for (size_t size = 1;; size = size % (message.size() - 1) + 1)
        Client(victim, Hello + message.substr(0, size));
}

static void SendHugeLengths(const Victim &victim)
{
    const std::string start("\x01\x11\xFF\xFF\xFF\x7F", 6);
    for (;;)
        Client(victim, Hello + start + std::string(BLOCK_SIZE, 'x'));
}

// The longest that are still taken.
static void SendLongMessages(const Victim &victim)
{
    std::string message = Ipc_Poke("item", std::string(IPC_DATA_SIZE - 1, ' ').c_str());
    for (;;) {
        Client client(victim, Hello);
        while (client.IsConnected())
            client.SendAll(message);
    }
}

static void ComeInCrowds(const Victim &victim)
{
    for (;;) {
        std::vector<std::unique_ptr<Client>> clients;
        for (int i = 0; i < CROWD; ++i)
            clients.push_back(std::make_unique<Client>(victim, i % 2 ? Hello : ""));
        usleep(PAUSE);
    }
}

static void NeverRead(const Victim &victim)
{
    std::string requests = Repeat(Ipc_Request("Date"), BLOCK_SIZE);
    std::vector<std::unique_ptr<Client>> clients(4);
    for (;;) {
        Reconnect(&clients, victim);
        for (const std::unique_ptr<Client> &client : clients)
            client->Fill(requests);
        usleep(PAUSE);
    }
}

static void AskOneByOne(const Victim &victim)
{
    std::string request = Ipc_Request("Date");
    for (;;) {
        Client client(victim, Hello);
        while (client.IsConnected()) {
            client.SendAll(request);
            client.AwaitAnswer();
        }
    }
}

static void AskInBlocks(const Victim &victim)
{
    std::string requests = Repeat(Ipc_Request("Date+len"), BLOCK_SIZE);
    std::vector<std::unique_ptr<Client>> clients(4);
    for (;;) {
        Reconnect(&clients, victim);
        for (const std::unique_ptr<Client> &client : clients)
            client->SendAll(requests);
    }
}

static void SendCommands(const Victim &victim, const std::string &text)
{
    std::string commands = Repeat(Ipc_Execute(text.c_str()), BLOCK_SIZE);
    for (;;) {
        Client client(victim, Hello);
        while (client.IsConnected())
            client.SendAll(commands);
    }
}

static void NameTheSameFile(const Victim &victim)
{
    SendCommands(victim, victim.openFile);
}

static void NameNothing(const Victim &victim)
{
    SendCommands(victim, "-a");
}

static void DoEverything(const Victim &victim)
{
    static void (*const Runs[])(const Victim &) = {
        SendGarbage, SendHalfMessages, SendHugeLengths, SendLongMessages, ComeInCrowds,
        NeverRead,   AskOneByOne,      AskInBlocks,     NameTheSameFile};
    for (auto run : Runs) {
        if (fork() == 0) {
            alarm(LONGEST_LIFE);
            run(victim);
        }
    }
    for (;;)
        pause();
}

const std::vector<Attack> Attacks = {
    {"nobody", nullptr, 0},
    {"busy processes that are no clients", Spin, MANY},
    {"garbage", SendGarbage, MANY},
    {"half messages", SendHalfMessages, MANY},
    {"huge lengths", SendHugeLengths, MANY},
    {"messages of 64 KiB", SendLongMessages, MANY},
    {"200 connections at once", ComeInCrowds, 1},
    {"clients that never read", NeverRead, MANY},
    {"requests, one by one", AskOneByOne, MANY},
    {"requests in blocks", AskInBlocks, MANY},
    {"commands: the file that is open", NameTheSameFile, 1},
    {"all of these at once", DoEverything, 1},
    {"commands: \"-a\"", NameNothing, 1},
};

// --- Processes ---

// Every attack has a process group of its own.
static pid_t Start(const Attack &attack, const Victim &victim, pid_t group)
{
    pid_t process = fork();
    if (process != 0) {
        setpgid(process, group);
        return process;
    }
    setpgid(0, group);
    alarm(LONGEST_LIFE);
    attack.run(victim);
    _exit(1);
}

std::vector<pid_t> Attacks_Start(const Attack &attack, const Victim &victim)
{
    std::vector<pid_t> processes;
    for (int i = 0; i < attack.processes; ++i)
        processes.push_back(Start(attack, victim, processes.empty() ? 0 : processes[0]));
    return processes;
}

void Attacks_Stop(const std::vector<pid_t> &processes)
{
    if (!processes.empty())
        kill(-processes[0], SIGKILL);
}

void Attacks_Await(const std::vector<pid_t> &processes)
{
    for (pid_t process : processes)
        waitpid(process, nullptr, 0);
}

static bool Ask(const Victim &victim)
{
    std::string answer;
    MyClient client(PATIENCE);
    return client.Connect(victim.service.c_str(), Ipc_Topic) &&
           client.Connection()->Request("bytes[3]", &answer) && answer == "123";
}

pid_t Attacks_StartHonestClient(const Victim &victim)
{
    pid_t process = fork();
    if (process != 0)
        return process;
    for (int i = 0; i < TRIES; ++i)
        if (Ask(victim))
            _exit(0);
    _exit(1);
}

// app/IpcServer.cpp - the server's side of the command channel.

#include "app/IpcServer.h"

#include <algorithm>

#include <wx/evtloop.h>
#include <wx/evtloopsrc.h>

#include "app/Ipc.h"
#include "base/Companion.h"
#include "base/Sys.h"
#include "store/BibStore.h"

enum { PEERS_MAX = 16, COMMANDS_MAX = 64 };

// Milliseconds.
enum {
    TICK_NEXT = 1,      // there is more to do, after what the user waits for
    TICK_ACCEPT = 20,   // clients wait for room
    TICK_COMMAND = 100, // commands wait for the end of a dialog
    TICK_PEER = 500     // clients are amid something
};

wxBEGIN_EVENT_TABLE(MyServer, wxEvtHandler)
    EVT_TIMER(wxID_ANY, MyServer::OnTimer)
wxEND_EVENT_TABLE()

// A socket at which clients arrive.
class IpcListener : private wxEventLoopSourceHandler
{
public:
    IpcListener(MyServer *server, int socket, const std::string &path)
        : m_server(server), m_socket(socket), m_path(path)
    {
    }

    ~IpcListener() override
    {
        m_source.reset();
        Sys_CloseListener(m_socket, m_path.c_str());
    }

    bool Watch() // until a client arrives
    {
        if (!m_source)
            m_source.reset(wxEventLoopBase::AddSourceForFD(m_socket, this, wxEVENT_SOURCE_INPUT));
        return m_source != nullptr;
    }

private:
    void OnReadWaiting() override
    {
        m_source.reset();
        m_server->Accept(m_socket);
    }
    void OnWriteWaiting() override {}
    void OnExceptionWaiting() override {}

    MyServer *m_server;
    int m_socket;
    std::string m_path;
    std::unique_ptr<wxEventLoopSource> m_source; // null while it is not watched
};

MyServer::MyServer(MyFrame *frame) : m_frame(frame), m_timer(this) {}

MyServer::~MyServer()
{
    m_listeners.clear();
    m_peers.clear();
    TNSMessage("INFO: DDE server ", "Disconnected client", TNS_LIFECYCLE);
}

// --- Clients arrive and leave ---

bool MyServer::Listen(const std::string &path)
{
    SysReason why = {};
    int socket = Sys_ListenLocal(path.c_str(), &why);
    if (!socket) {
        std::string text = "can't listen at " + path + ": " + why.text;
        TNSMessage("INFO: DDE server ", text.c_str(), TNS_LIFECYCLE);
        return false;
    }
    m_listeners.push_back(std::make_unique<IpcListener>(this, socket, path));
    return m_listeners.back()->Watch();
}

bool MyServer::Create(const char *service)
{
    if (!Listen(Ipc_SocketPath(service)))
        return false;
    std::string named = Ipc_NamedPath(service);
    if (!named.empty() && !Listen(named))
        TNSMessage("WARNING: DDE server can't be met at ", service, TNS_WARNING);
    return true;
}

// Pausing when there is nothing to be had: the event loop would come back at once.
void MyServer::Accept(int listener)
{
    int count = 0;
    while (count < PEERS_MAX && AcceptOne(listener))
        ++count;
    m_acceptPaused = count == 0;
    AskForTurn();
}

bool MyServer::AcceptOne(int listener)
{
    int socket = MakeRoom() ? Sys_AcceptLocal(listener) : 0;
    if (socket)
        m_peers.push_back(std::make_unique<IpcPeer>(this, socket));
    return socket != 0;
}

// By dropping a quiet client, unless it has just sent something more.
bool MyServer::MakeRoom()
{
    auto open = std::count_if(m_peers.begin(), m_peers.end(),
                              [](const auto &peer) { return !peer->IsClosed(); });
    if (open < PEERS_MAX)
        return true;
    IpcPeer *quiet = FindQuietPeer();
    if (!quiet)
        return false;
    if (!quiet->Advance() && !quiet->IsClosed())
        quiet->Drop("others wait");
    return quiet->IsClosed();
}

// The one that others may replace: rather one that has not said yet what it wants, else the one
// that has been quiet for longest. Null when all are busy.
IpcPeer *MyServer::FindQuietPeer() const
{
    IpcPeer *found = nullptr;
    for (const auto &peer : m_peers) {
        if (peer->IsClosed() || peer->QuietTime() < TICK_ACCEPT)
            continue;
        bool isNew = !peer->Connection();
        bool foundIsNew = found && !found->Connection();
        if (!found || isNew > foundIsNew ||
            (isNew == foundIsNew && peer->QuietTime() > found->QuietTime()))
            found = peer.get();
    }
    return found;
}

std::unique_ptr<MyConnection> MyServer::OnAcceptConnection(const std::string &topic, IpcPeer *peer)
{
    TNSMessage("INFO: DDE server OnAcceptConnection ", topic.c_str(), TNS_LIFECYCLE);
    if (topic != Ipc_Topic) {
        TNSMessage("ERROR: DDE server ", "Unknown topic, connection refused", TNS_ERROR);
        return nullptr;
    }
    auto connection = std::make_unique<MyConnection>(this, peer);
    m_connection = connection.get();
    TNSMessage("INFO: DDE server ", "Connection accepted", TNS_LIFECYCLE);
    return connection;
}

void MyServer::OnClosed(const IpcPeer *peer)
{
    if (peer->Connection() == m_connection)
        m_connection = nullptr;
    m_acceptPaused = false; // there is room
    AskForTurn();
}

// --- Turns ---

void MyServer::AskForTurn()
{
    if (m_turnPending)
        return;
    m_turnPending = true;
    CallAfter(&MyServer::OnTurn);
}

void MyServer::OnTurn()
{
    m_turnPending = false;
    m_peers.erase(std::remove_if(m_peers.begin(), m_peers.end(),
                                 [](const auto &peer) { return peer->IsClosed(); }),
                  m_peers.end());
    for (const auto &peer : m_peers)
        peer->Watch();
    for (const auto &listener : m_listeners)
        if (!m_acceptPaused)
            listener->Watch();
    SetTimer();
    RunNextCommand();
}

void MyServer::OnTimer(wxTimerEvent &)
{
    m_acceptPaused = false;
    for (const auto &peer : m_peers) {
        peer->DropWhenStalled();
        if (peer->HasMore())
            peer->Advance();
    }
    AskForTurn();
}

int MyServer::NextTick() const
{
    if (std::any_of(m_peers.begin(), m_peers.end(),
                    [](const auto &peer) { return peer->HasMore(); }))
        return TICK_NEXT;
    if (m_acceptPaused)
        return TICK_ACCEPT;
    if (!m_commands.empty())
        return TICK_COMMAND;
    bool unfinished = std::any_of(m_peers.begin(), m_peers.end(),
                                  [](const auto &peer) { return peer->IsUnfinished(); });
    return unfinished ? TICK_PEER : 0;
}

// A timer that runs is not started again, or a busy server would never hear it.
void MyServer::SetTimer()
{
    int tick = NextTick();
    if (tick > 0 && (!m_timer.IsRunning() || m_timer.GetInterval() > tick))
        m_timer.StartOnce(tick);
}

// --- Commands ---

void MyServer::QueueCommand(const std::string &text)
{
    if (m_commands.size() < COMMANDS_MAX)
        m_commands.push_back(text);
    else
        TNSMessage("ERROR: DDE server ", "Too many commands wait, the last is dropped", TNS_ERROR);
}

// Carrying one out may ask the user, and further turns come while the box is open. A turn that asks
// for the next one gets it at once, before all drawing and input: so the timer brings that.
void MyServer::RunNextCommand()
{
    if (m_running || m_commands.empty())
        return;
    if (!m_frame || !m_frame->Panel()) {
        m_commands.clear();
        return;
    }
    if (!m_frame->MayTakeCommand())
        return; // the timer brings the next turn
    std::string command = m_commands.front();
    m_running = true;
    if (m_frame->TakeCommand(command.c_str()))
        m_commands.pop_front();
    m_running = false;
    if (!m_commands.empty())
        m_timer.StartOnce(TICK_NEXT);
}

MyServer *StartCommandServer(const char *service, MyFrame *frame)
{
    auto server = std::make_unique<MyServer>(frame);
    if (!server->Create(service)) {
        TNSMessage("ERROR: DDE server failed to start ", service, TNS_ERROR);
        return nullptr;
    }
    TNSMessage("INFO: DDE server started ", service, TNS_LIFECYCLE);
    TNSMessage("INFO: DDE server ", "uses DDE", TNS_LIFECYCLE);
    return server.release();
}

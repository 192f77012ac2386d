// app/IpcConnection.cpp - a client of the command server: what it may ask, and its socket.
#include "app/IpcServer.h"

#include <wx/datetime.h>

#include "app/IpcMessage.h"
#include "base/Companion.h"
#include "base/Sys.h"

enum { PATIENCE = 5000, BLOCK_SIZE = 16 * 1024 };

// Messages that are heard at once: of who waits for answers, and of who is gone.
enum { ANSWERS_AT_ONCE = 16, MESSAGES_AT_ONCE = 256 };

static void LogServer(const char *text)
{
    TNSMessage("INFO: DDE server ", text, TNS_LIFECYCLE);
}

// --- What a client may ask ---

bool MyConnection::OnExecute(const IpcMessage *message)
{
    std::string text;
    if (!Ipc_CommandText(message, &text)) {
        TNSMessage("ERROR: DDE server ", "Execute refused, its data is no text", TNS_ERROR);
        return false;
    }
    TNSMessage("INFO: DDE server Execute ", text.c_str(), TNS_LIFECYCLE);
    m_server->QueueCommand(text);
    return true;
}

// What the item is now, in the bytes that are sent. False when there is no such item.
static bool ValueOf(const std::string &item, std::string *value)
{
    wxDateTime now = wxDateTime::Now();
    if (item == "Date")
        *value = now.Format().ToStdString() + '\0';
    else if (item == "Date+len")
        *value = (now.FormatTime() + " " + now.FormatDate()).ToStdString() + '\0';
    else if (item == "bytes[3]")
        *value = "123";
    else
        return false;
    return true;
}

const std::string *MyConnection::OnRequest(const std::string &item)
{
    if (!ValueOf(item, &m_reply)) {
        // Misspelt, stands so.
        TNSMessage("ERROR: DDE server Unknown requestOnExecute ", item.c_str(), TNS_LIFECYCLE);
        return nullptr;
    }
    LogServer("OnRequest...");
    return &m_reply;
}

bool MyConnection::OnPoke()
{
    LogServer("OnPoke...");
    return false;
}

bool MyConnection::OnStartAdvise(const std::string &item)
{
    TNSMessage("INFO: DDE server OnStartAdvise ", item.c_str(), TNS_LIFECYCLE);
    m_advise = item;
    return true;
}

bool MyConnection::OnStopAdvise(const std::string &item)
{
    TNSMessage("INFO: DDE server OnStopAdvise ", item.c_str(), TNS_LIFECYCLE);
    m_advise.clear();
    return true;
}

bool MyConnection::OnDisconnect()
{
    LogServer("OnDisconnect()");
    return true;
}

bool MyConnection::Advise(const char *text)
{
    if (m_advise.empty())
        return false;
    TNSMessage("INFO: DDE server Advice ", m_advise.c_str(), TNS_LIFECYCLE);
    return m_peer->Send(Ipc_Advise(m_advise.c_str(), text));
}

// --- The socket ---

IpcPeer::IpcPeer(MyServer *server, int socket)
    : m_server(server), m_socket(socket), m_since(Sys_Milliseconds())
{
}

IpcPeer::~IpcPeer()
{
    Close();
}

bool IpcPeer::IsUnfinished() const
{
    return !m_connection || !m_input.empty() || !m_output.empty();
}

int IpcPeer::QuietTime() const
{
    return Sys_Milliseconds() - m_since;
}

void IpcPeer::Watch()
{
    if (IsClosed() || m_source || HasMore())
        return;
    int direction = m_output.empty() ? wxEVENT_SOURCE_INPUT : wxEVENT_SOURCE_OUTPUT;
    m_source.reset(
        wxEventLoopBase::AddSourceForFD(m_socket, this, direction | wxEVENT_SOURCE_EXCEPTION));
    if (!m_source)
        Drop("the event loop does not take it");
}

// The descriptor comes before drawing in the event loop: a client that never pauses would freeze
// the window if it were watched on. The server's turn comes after drawing.
void IpcPeer::Serve()
{
    m_source.reset();
    Advance();
    m_server->AskForTurn();
}

bool IpcPeer::Advance()
{
    if (IsClosed())
        return false;
    bool moved = m_output.empty() ? m_more || Receive() : Flush();
    HandleInput();
    return moved;
}

bool IpcPeer::Receive()
{
    char block[BLOCK_SIZE];
    long count = Sys_Receive(m_socket, block, sizeof block);
    if (count < 0)
        m_ended = true;
    if (count <= 0)
        return false;
    if (m_input.empty())
        m_since = Sys_Milliseconds();
    m_input.append(block, static_cast<size_t>(count));
    return true;
}

bool IpcPeer::Flush()
{
    long count = Sys_Send(m_socket, m_output.data(), m_output.size());
    if (count < 0) {
        m_output.clear();
        m_deaf = true;
    }
    if (count <= 0)
        return false;
    m_since = Sys_Milliseconds();
    m_output.erase(0, static_cast<size_t>(count));
    return true;
}

bool IpcPeer::Send(const std::string &bytes)
{
    if (IsClosed() || m_deaf || !m_output.empty())
        return false;
    m_output = bytes;
    Flush();
    if (!m_output.empty()) {
        m_source.reset(); // it is watched for the other direction from the next turn on
        m_server->AskForTurn();
    }
    return !m_deaf;
}

// Short messages are many to a block, and answering them all would take too long.
void IpcPeer::HandleInput()
{
    int left = m_deaf ? MESSAGES_AT_ONCE : ANSWERS_AT_ONCE;
    while (left > 0 && !IsClosed() && m_output.empty() && TakeMessage())
        --left;
    m_more = left == 0;
    if (m_ended && m_output.empty() && !m_more)
        Leave();
}

// False when there is none yet, or no more.
bool IpcPeer::TakeMessage()
{
    size_t used;
    IpcMessage message;
    switch (Ipc_Decode(IPC_FROM_CLIENT, m_input.data(), m_input.size(), &message, &used)) {
    case IPC_MORE:
        return false;
    case IPC_BAD:
        Drop("it sends what is no message");
        return false;
    case IPC_COMPLETE:
        break;
    }
    m_input.erase(0, used);
    m_since = Sys_Milliseconds();
    Handle(message);
    return true;
}

void IpcPeer::Handle(const IpcMessage &message)
{
    if (message.code == IPC_DISCONNECT) {
        m_input.clear();
        Leave();
        return;
    }
    if ((message.code == IPC_CONNECT) == (m_connection != nullptr))
        Drop("it sends messages out of turn");
    else if (message.code == IPC_CONNECT)
        Open(message.name);
    else
        Answer(message);
}

void IpcPeer::Open(const std::string &topic)
{
    m_connection = m_server->OnAcceptConnection(topic, this);
    Send(Ipc_CodeAlone(m_connection ? IPC_CONNECT : IPC_FAIL));
    if (m_connection)
        return;
    m_input.clear();
    m_ended = true;
}

void IpcPeer::Answer(const IpcMessage &message)
{
    if (m_deaf && message.code != IPC_EXECUTE)
        return; // nobody waits for the answer any more
    const std::string *reply;
    switch (message.code) {
    case IPC_EXECUTE:
        m_connection->OnExecute(&message);
        break;
    case IPC_REQUEST:
        reply = m_connection->OnRequest(message.name);
        Send(reply ? Ipc_Reply(*reply) : Ipc_CodeAlone(IPC_FAIL));
        break;
    case IPC_POKE:
        m_connection->OnPoke(); // no answer exists, not even to a refusal
        break;
    case IPC_ADVISE_START:
        Send(
            Ipc_CodeAlone(m_connection->OnStartAdvise(message.name) ? IPC_ADVISE_START : IPC_FAIL));
        break;
    case IPC_ADVISE_STOP:
        Send(Ipc_CodeAlone(m_connection->OnStopAdvise(message.name) ? IPC_ADVISE_STOP : IPC_FAIL));
        break;
    }
}

// The client is gone. Half a message is not carried out.
void IpcPeer::Leave()
{
    if (IsClosed())
        return;
    if (!m_input.empty()) {
        Drop("it left in the middle of a message");
        return;
    }
    if (m_connection)
        m_connection->OnDisconnect();
    Close();
}

void IpcPeer::Drop(const char *why)
{
    std::string text = std::string("drops a client: ") + why;
    TNSMessage("WARNING: DDE server ", text.c_str(), TNS_WARNING);
    Close();
}

void IpcPeer::Close()
{
    if (IsClosed())
        return;
    m_source.reset();
    Sys_CloseSocket(m_socket);
    m_socket = 0;
    m_server->OnClosed(this);
}

bool IpcPeer::IsStalled() const
{
    return !IsClosed() && IsUnfinished() && QuietTime() > PATIENCE;
}

// Where the program itself was busy for so long, what it waits for may have come meanwhile.
void IpcPeer::DropWhenStalled()
{
    while (IsStalled() && Advance()) {
    }
    if (IsStalled())
        Drop("it does not go on");
}

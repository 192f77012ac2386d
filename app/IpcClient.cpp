// app/IpcClient.cpp - the client's side of the command channel.
#include "app/IpcClient.h"

#include <cstdlib>
#include <cstring>

#include "app/Ipc.h"
#include "app/IpcMessage.h"
#include "base/Companion.h"
#include "base/Sys.h"

static void LogClient(const char *text)
{
    TNSMessage("INFO: DDE client ", text, TNS_LIFECYCLE);
}

// --- Where services are ---

std::string Ipc_SocketPath(const char *service)
{
    char *path = Sys_PrivatePath(service, ".sock");
    std::string text = path ? path : "";
    free(path);
    return text;
}

std::string Ipc_NamedPath(const char *service)
{
    std::string path = service;
    size_t slash = path.rfind('/');
    bool usable = path[0] == '/' && slash + 1 < path.size() &&
                  Sys_FileExists(path.substr(0, slash + 1).c_str());
    return usable ? path : "";
}

// --- CmdConnection ---

CmdConnection::CmdConnection(int socket, int milliseconds)
    : m_socket(socket), m_milliseconds(milliseconds)
{
}

CmdConnection::~CmdConnection()
{
    Sys_CloseSocket(m_socket);
}

bool CmdConnection::Open(const char *topic, int milliseconds)
{
    IpcMessage answer;
    int32_t end = Sys_Milliseconds() + milliseconds;
    return Send(Ipc_Connect(topic), end) && ReceiveAnswer(&answer, end) &&
           answer.code == IPC_CONNECT;
}

bool CmdConnection::Execute(const char *text)
{
    LogClient("Execute...");
    if (strlen(text) + 1 > IPC_DATA_SIZE)
        return false; // no server takes that
    int32_t end = Sys_Milliseconds() + m_milliseconds;
    return Send(Ipc_Execute(text) + Ipc_CodeAlone(IPC_DISCONNECT), end) &&
           Sys_FinishSending(m_socket, Sys_TimeLeft(end)) != 0;
}

bool CmdConnection::Request(const char *item, std::string *data)
{
    LogClient("Request...");
    IpcMessage answer;
    int32_t end = Sys_Milliseconds() + m_milliseconds;
    if (!Send(Ipc_Request(item), end) || !ReceiveAnswer(&answer, end) ||
        answer.code != IPC_REQUEST_REPLY)
        return false;
    *data = answer.data;
    return true;
}

bool CmdConnection::Poke(const char *item, const char *text)
{
    LogClient("Poke...");
    return Send(Ipc_Poke(item, text), Sys_Milliseconds() + m_milliseconds);
}

bool CmdConnection::Send(const std::string &bytes, int32_t end)
{
    size_t sent = 0;
    while (sent < bytes.size()) {
        long count = Sys_Send(m_socket, bytes.data() + sent, bytes.size() - sent);
        if (count < 0)
            return false;
        sent += static_cast<size_t>(count);
        if (count == 0 && !Sys_WaitWritable(m_socket, Sys_TimeLeft(end)))
            return false;
    }
    return true;
}

// The next message that is an answer to something.
bool CmdConnection::ReceiveAnswer(IpcMessage *answer, int32_t end)
{
    while (TakeMessage(answer, end)) {
        if (answer->code == IPC_DISCONNECT) {
            OnDisconnect();
            return false;
        }
        if (answer->code != IPC_ADVISE)
            return true;
        OnAdvise();
    }
    return false;
}

bool CmdConnection::TakeMessage(IpcMessage *message, int32_t end)
{
    size_t used;
    for (;;) {
        switch (Ipc_Decode(IPC_FROM_SERVER, m_input.data(), m_input.size(), message, &used)) {
        case IPC_COMPLETE:
            m_input.erase(0, used);
            return true;
        case IPC_BAD:
            return false;
        case IPC_MORE:
            if (!ReadMore(end))
                return false;
        }
    }
}

bool CmdConnection::ReadMore(int32_t end)
{
    char block[4096];
    if (Sys_TimeLeft(end) == 0 || !Sys_WaitReadable(m_socket, Sys_TimeLeft(end)))
        return false;
    long count = Sys_Receive(m_socket, block, sizeof block);
    if (count < 0) {
        OnDisconnect();
        return false;
    }
    m_input.append(block, static_cast<size_t>(count));
    return true;
}

void CmdConnection::OnAdvise()
{
    LogClient("OnAdvise...");
}

void CmdConnection::OnDisconnect()
{
    LogClient("OnDisconnect()");
}

// --- MyClient ---

MyClient::~MyClient()
{
    if (!m_connection)
        return;
    m_connection.reset();
    LogClient("disconnected from server");
}

bool MyClient::Connect(const char *service, const char *topic)
{
    LogClient("is connecting...");
    int32_t end = Sys_Milliseconds() + m_milliseconds;
    for (const std::string &path : {Ipc_SocketPath(service), Ipc_NamedPath(service)}) {
        int socket = path.empty() ? 0 : Sys_ConnectLocal(path.c_str(), Sys_TimeLeft(end));
        if (!socket)
            continue;
        m_connection = std::make_unique<CmdConnection>(socket, m_milliseconds);
        if (m_connection->Open(topic, Sys_TimeLeft(end)))
            return true;
        m_connection.reset();
    }
    return false;
}

// --- Handing over ---

static void LogConnection(const char *service, const char *topic, bool connected)
{
    std::string text = "Client host=\"localhost\" port=\"" + std::string(service) + "\" topic=\"" +
                       topic + "\" " + (connected ? "connected" : "failed to connect");
    TNSMessage("INFO: Connection ", text.c_str(), TNS_LIFECYCLE);
}

int SendCommand(const char *service, const char *text, int milliseconds)
{
    TNSMessage("INFO: SendCommand ", text, TNS_LIFECYCLE);
    MyClient client(milliseconds);
    bool connected = client.Connect(service, Ipc_Topic);
    LogConnection(service, Ipc_Topic, connected);
    if (!connected)
        return 0;
    if (client.Connection()->Execute(text))
        return 1;
    TNSMessage("ERROR: DDE client ", "Execute failed!", TNS_ERROR);
    return 0;
}

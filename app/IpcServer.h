// app/IpcServer.h - the server's side of the command channel: the server (IpcServer.cpp), and its
// clients (IpcConnection.cpp).
#pragma once

#include <cstdint>
#include <deque>
#include <memory>
#include <string>
#include <vector>

#include <wx/event.h>
#include <wx/evtloop.h>
#include <wx/evtloopsrc.h>
#include <wx/timer.h>
#include <wx/weakref.h>

#include "app/MyFrame.h"

struct IpcMessage;
class IpcListener;
class IpcPeer;
class MyServer;

// What a client may ask once it is accepted. Nothing here waits, or runs a command.
class MyConnection
{
public:
    MyConnection(MyServer *server, IpcPeer *peer) : m_server(server), m_peer(peer) {}

    bool OnExecute(const IpcMessage *message);             // false when the data is no text
    const std::string *OnRequest(const std::string &item); // valid until the next; null for none
    bool OnPoke();
    bool OnStartAdvise(const std::string &item);
    bool OnStopAdvise(const std::string &item);
    bool OnDisconnect();

    // Tells the client news of the item that it wants to hear of. False when there is no such
    // item, or the client has not taken yet what it was sent before.
    bool Advise(const char *text);

private:
    MyServer *m_server;
    IpcPeer *m_peer;      // owns this
    std::string m_advise; // item under advise; "" for none
    std::string m_reply;
};

// The socket of a client. It is read a piece at a time, and not at all while the client leaves an
// answer unread, so that nobody can keep the program busy or fill its memory.
class IpcPeer : private wxEventLoopSourceHandler
{
public:
    IpcPeer(MyServer *server, int socket);
    ~IpcPeer() override;

    bool IsClosed() const { return m_socket == 0; } // the server frees it at its next turn
    bool IsUnfinished() const; // not accepted yet, amid a message, or an answer is unread
    int QuietTime() const;     // milliseconds since something was finished
    MyConnection *Connection() const { return m_connection.get(); } // null until it is accepted

    // It has said more than was heard at once. The server lets it go on, after a while.
    bool HasMore() const { return !IsClosed() && m_more && m_output.empty(); }

    void Watch();                        // until it is ready; then it is the server's turn
    bool Advance();                      // reads or writes a piece; true when there was one
    bool Send(const std::string &bytes); // false when earlier ones are unread, or it is gone
    void Drop(const char *why);          // logged
    void DropWhenStalled();

private:
    void OnReadWaiting() override { Serve(); }
    void OnWriteWaiting() override { Serve(); }
    void OnExceptionWaiting() override { Serve(); }
    void Serve();
    bool Flush();
    bool Receive();
    void HandleInput();
    bool TakeMessage();
    void Handle(const IpcMessage &message);
    void Open(const std::string &topic);
    void Answer(const IpcMessage &message);
    void Leave();
    void Close();
    bool IsStalled() const;

    MyServer *m_server;
    int m_socket;
    std::unique_ptr<wxEventLoopSource> m_source; // null while it is not watched
    std::unique_ptr<MyConnection> m_connection;
    std::string m_input, m_output;
    bool m_ended = false; // nothing more is read
    bool m_deaf = false;  // it is gone; what it said before that still counts
    bool m_more = false;  // there may be whole messages in m_input
    int32_t m_since;      // when something was last finished
};

// Serves clients in the event loop, each a little at a time. Its own work is done in turns, which
// come after drawing and input: there gone clients are freed, the others watched again, and the
// next command carried out.
class MyServer : public wxEvtHandler
{
public:
    explicit MyServer(MyFrame *frame);
    ~MyServer() override; // not from within a command

    bool Create(const char *service); // false, logged, when it cannot be served

    MyConnection *Connection() const { return m_connection; } // accepted last; null when it left

    // For the clients.
    std::unique_ptr<MyConnection> OnAcceptConnection(const std::string &topic, IpcPeer *peer);
    void QueueCommand(const std::string &text); // dropped, logged, when too many wait
    void OnClosed(const IpcPeer *peer);
    void AskForTurn();

    void Accept(int listener); // for the listeners

private:
    bool Listen(const std::string &path);
    bool AcceptOne(int listener);
    bool MakeRoom();
    IpcPeer *FindQuietPeer() const;
    void OnTurn();
    void OnTimer(wxTimerEvent &event);
    void RunNextCommand();
    void SetTimer();
    int NextTick() const;

    wxWeakRef<MyFrame> m_frame;
    std::vector<std::unique_ptr<IpcListener>> m_listeners;
    std::vector<std::unique_ptr<IpcPeer>> m_peers; // also closed ones, until the next turn
    MyConnection *m_connection = nullptr;          // belongs to its peer
    std::deque<std::string> m_commands;            // wait until the frame may take them
    wxTimer m_timer;
    bool m_turnPending = false;
    bool m_running = false;      // a command
    bool m_acceptPaused = false; // until the timer

    wxDECLARE_EVENT_TABLE();
};

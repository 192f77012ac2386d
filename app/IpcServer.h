// app/IpcServer.h - the server's side of the command channel.
#pragma once

#include <deque>
#include <memory>
#include <string>
#include <vector>

#include <wx/event.h>
#include <wx/timer.h>
#include <wx/weakref.h>

#include "app/MyFrame.h"

class IpcListener;
class IpcPeer;
class MyConnection;

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

// app/MyApp.h - the application object: start-up order and exit.
#pragma once

#include <wx/app.h>
#include <wx/weakref.h>

#include "app/MyFrame.h"
#include "session/CommandLine.h"

class MyServer;

class MyApp : public wxApp
{
public:
    // The program's arguments as the system passed them; they stay valid.
    MyApp(int argc, char **argv);

    bool OnInit() override; // false: the program ends at once
    int OnExit() override;

    // True when another process has taken the command line, and OnInit returned false for that.
    static bool HasHandedOver() { return handedOver; }

protected:
    wxAppTraits *CreateTraits() override;

private:
    const char *BuildLine();
    bool CheckParser();
    bool IsFirst();
    bool TakeInstance(const std::string &name);
    bool HandOver(const std::string &name);
    void Publish(long window);
    void OpenConfig();
    void OnActivateApp(wxActivateEvent &event);

    int m_argumentCount;
    char **m_arguments;
    static inline bool handedOver = false;
    StartUp m_start;
    std::string m_service; // name of the command channel
    CommandState m_state = {};
    int m_instanceLock = 0;       // held while this is the first instance of its folder
    MyServer *m_server = nullptr; // ours; null when it could not be started
    wxWeakRef<MyFrame> m_frame;   // the toolkit destroys it

    wxDECLARE_EVENT_TABLE();
};

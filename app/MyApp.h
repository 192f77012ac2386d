// app/MyApp.h - the application object: start-up order and exit.
#pragma once

#include <wx/app.h>
#include <wx/weakref.h>

#include "app/CommandLine.h"
#include "app/MyFrame.h"

class MyApp : public wxApp
{
public:
    // The program's arguments as the system passed them; they stay valid.
    MyApp(int argc, char **argv);

    bool OnInit() override; // false: the program ends at once
    int OnExit() override;

protected:
    wxAppTraits *CreateTraits() override;

private:
    bool CheckParser();
    const char *TakeCommandLine();
    void OpenConfig();
    void OnActivateApp(wxActivateEvent &event);

    int m_argumentCount;
    char **m_arguments;
    CommandState m_state = {};
    wxWeakRef<MyFrame> m_frame;

    wxDECLARE_EVENT_TABLE();
};

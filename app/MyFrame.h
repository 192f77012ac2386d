// app/MyFrame.h - the program's only top-level window: tool bar, keyboard, status bar, close.
// Commands are carried out by the panel; the frame hands them on.
#pragma once

#include <wx/frame.h>

#include "app/CommandLine.h"

class Cartulo;
class wxSearchCtrl;

class MyFrame : public wxFrame
{
public:
    // Loads the files that the command line names. `state` outlives the frame.
    MyFrame(const wxString &title, const char *commandLine, CommandState *state);

    Cartulo *Panel() const { return m_panel; } // null once the window is closed

    void OnDeactivation(); // the program lost the focus to another: saves all files

private:
    void CreateTools();
    void OnQuit(wxCommandEvent &event);
    void OnFind(wxCommandEvent &event);
    void OnCommand(wxCommandEvent &event);
    void OnSearch(wxCommandEvent &event);
    void OnCharHook(wxKeyEvent &event);
    void OnClose(wxCloseEvent &event);
    bool MayLoseChanges();

    Cartulo *m_panel = nullptr;       // child window; null until it is made and once this is closed
    wxSearchCtrl *m_search = nullptr; // child of the tool bar

    wxDECLARE_EVENT_TABLE();
};

// app/MyFrame.h - the program's only top-level window: tool bar, keyboard, status bar, close.
// Commands are carried out by the panel; the frame hands them on.
#pragma once

#include <memory>

#include <wx/frame.h>
#include <wx/timer.h>

#include "app/FrameRules.h"
#include "session/CommandLine.h"

class Cartulo;
class DialogCount;
struct Command;
class wxMenu;
class wxSearchCtrl;

class MyFrame : public wxFrame
{
public:
    // Loads the files that the command line names. `state` outlives the frame.
    MyFrame(const wxString &title, const char *commandLine, CommandState *state);
    ~MyFrame() override;

    bool Show(bool show = true) override;
    bool IsNew() const; // true until the window manager has had the time to place the window

    Cartulo *Panel() const { return m_panel; } // null once the window is closed

    // Auto-save mode, on from the start: closing and leaving the window save all files. With it
    // off, closing asks and leaving does nothing.
    void SetAutoSave(bool on) { m_autoSave = on; }
    bool AutoSave() const { return m_autoSave; }

    // The program got the focus or lost it. A loss counts when it lasts: while one window of ours
    // closes, there may be none with the focus for a moment.
    void OnActivation(bool active);
    bool IsLeaving() const { return m_leaving.IsRunning(); } // lost, and it does not count yet
    void OnDeactivation();                                   // it lost the focus to another program

    // Command lines of other programs: only while nothing is being asked, loaded or saved. The
    // messages window and the About box may be open.
    bool MayTakeCommand() const;

    // False when the user wants to go on with the entry that is edited: the command waits until
    // that is done.
    bool TakeCommand(const char *commandLine);

private:
    void Place();
    void SaveGeometry();
    void CreateTools();
    void CreateStatusFields();
    void AddTool(const Command &command);
    void AddSearch(const Command &command);
    void UpdateCiteTool();
    void FitSearch();
    void OnQuit(wxCommandEvent &event);
    void OnHelp(wxCommandEvent &event);
    void OnAbout(wxCommandEvent &event);
    void OnContextMenu(wxCommandEvent &event);
    void OnFind(wxCommandEvent &event);
    void OnCommand(wxCommandEvent &event);
    void OnSearch(wxCommandEvent &event);
    void OnCharHook(wxKeyEvent &event);
    bool LeaveSearch(int key);
    bool SearchHasFocus() const;
    bool TakesEnter() const;
    void Correct();
    void OnActivate(wxActivateEvent &event);
    void OnMove(wxMoveEvent &event);
    void OnSize(wxSizeEvent &event);
    void OnLeft(wxTimerEvent &event);
    void OnClose(wxCloseEvent &event);
    bool MayClose(bool mayAsk);
    bool MayLoseChanges();

    CommandState *m_state;
    std::unique_ptr<DialogCount> m_dialogs;
    Cartulo *m_panel = nullptr;       // child window; null until it is made and once this is closed
    wxSearchCtrl *m_search = nullptr; // child of the tool bar
    int m_toolsWidth = 0;             // of the tool bar without the search field
    wxMenu *m_contextMenu = nullptr;  // nobody fills it yet
    bool m_autoSave = true;
    wxTimer m_leaving;           // runs while a loss of the focus does not count yet
    bool m_commandWaits = false; // for the end of editing
    wxRect m_place;              // where the window shall open
    int m_corrections = 2;       // tries that are left to put it there
    int32_t m_placedSince = 0;   // when it was shown, or got its first focus (Sys_Milliseconds)
    bool m_hadFocus = false;

    wxDECLARE_EVENT_TABLE();
};

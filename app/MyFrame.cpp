#include "app/MyFrame.h"

#include <wx/msgdlg.h>
#include <wx/srchctrl.h>
#include <wx/toolbar.h>

#include "app/Companion.h"
#include "app/FrameRules.h"
#include "app/Icons.h"
#include "app/Ids.h"
#include "app/Log.h"
#include "app/Native.h"
#include "ui/Cartulo.h"
#include "ui/MessagesText.h"

enum { ICON_SIZE = 16, TOOL_MARGIN = 4, SEARCH_WIDTH = 240 };

// The first row that matches handles the event.
wxBEGIN_EVENT_TABLE(MyFrame, wxFrame)
    EVT_MENU(ID_CLOSE, MyFrame::OnQuit)
    EVT_MENU(ID_EXIT, MyFrame::OnQuit)
    EVT_MENU(ID_SEARCH, MyFrame::OnFind)
    EVT_MENU_RANGE(ID_COMMAND_FIRST, ID_COMMAND_LAST, MyFrame::OnCommand)
    EVT_TEXT(ID_SEARCH, MyFrame::OnSearch)
    EVT_SEARCH(ID_SEARCH, MyFrame::OnSearch)
    EVT_CHAR_HOOK(MyFrame::OnCharHook)
    EVT_CLOSE(MyFrame::OnClose)
wxEND_EVENT_TABLE()

MyFrame::MyFrame(const wxString &title, const char *commandLine, CommandState *state)
    : wxFrame(nullptr, wxID_ANY, title)
{
    SetMinSize(FromDIP(wxSize(512, 512)));
    SetSize(FromDIP(wxSize(800, 600)));
    SetFont(wxFontInfo(10));
    SetIcons(Icon_Program());
    AppLog("Cartulo::Frame --- ", "Creating Helper ...");
    m_panel = new Cartulo(this, commandLine, state);
    CreateTools();
    AppLog("Cartulo::Frame --- ", "Status Bar.");
    CreateStatusBar();
    SetStatusText(m_panel->CountText());
    AppLog("Cartulo::Frame --- ", "End.");
}

void MyFrame::CreateTools()
{
    wxToolBar *bar = CreateToolBar();
    bar->SetToolBitmapSize(wxSize(ICON_SIZE, ICON_SIZE));
    bar->SetMargins(TOOL_MARGIN, TOOL_MARGIN);
    bar->AddTool(ID_SAVE, "Save", Icon_Load("document-save", ICON_SIZE, wxART_FILE_SAVE),
                 "Save All BIB files.");
    bar->EnableTool(ID_SAVE, false);
    if (Messages_HasCounts(m_panel->Files()))
        bar->AddTool(ID_MESSAGES, "Messages", Icon_Load("Warning", ICON_SIZE, wxART_WARNING),
                     "Show error/warning messages of loading current BIB-file (Alt+M)");
    m_search = new wxSearchCtrl(bar, ID_SEARCH, "", wxDefaultPosition,
                                FromDIP(wxSize(SEARCH_WIDTH, -1)), wxTE_PROCESS_ENTER);
    m_search->SetDescriptiveText("Find");
    m_search->SetToolTip("Enter string to find entries");
    bar->AddControl(m_search, "Find");
    bar->Realize();
}

void MyFrame::OnQuit(wxCommandEvent &)
{
    Close(true);
}

void MyFrame::OnFind(wxCommandEvent &)
{
    m_search->SetFocus();
    m_search->SelectAll();
}

// Commands that the panel does not handle come up from it again: it must not pass them on.
void MyFrame::OnCommand(wxCommandEvent &event)
{
    if (!m_panel || !m_panel->ProcessWindowEventLocally(event))
        event.Skip();
}

void MyFrame::OnSearch(wxCommandEvent &event)
{
    TNSMessage("INFO: MyFrame::OnSearch ", "", TNS_ACTION);
    OnCommand(event);
}

static void LogKey(const wxKeyEvent &event)
{
    int key = event.GetKeyCode();
    uint32_t character = key < WXK_START ? uint32_t(key) : 0; // the others are no characters
    wxString text = wxString::Format(
        "Key=%d(%c),Mod=%x", key, wxUniChar(Frame_LogCharacter(character)), event.GetModifiers());
    TNSMessage("INFO: MyFrame::OnCharHook ", text.utf8_str(), TNS_LIFECYCLE);
}

void MyFrame::OnCharHook(wxKeyEvent &event)
{
    if (GetStatusBar())
        SetStatusText("", 0);
    LogKey(event);
    bool alt = event.AltDown(), ctrl = event.ControlDown();
    int key = Frame_ShortcutKey(event.GetKeyCode(), event.GetUnicodeKey(),
                                Native_LatinLetter(event), alt, ctrl);
    const Shortcut *row = Frame_FindShortcut(key, alt, ctrl);
    if (!row || !m_panel) {
        event.Skip();
        return;
    }
    TNSMessage("INFO: MyFrame::OnCharHook ", row->label, TNS_LIFECYCLE);
    m_panel->GetEventHandler()->QueueEvent(new wxCommandEvent(wxEVT_MENU, row->id));
}

void MyFrame::OnDeactivation()
{
    if (m_panel)
        m_panel->SaveAll(true);
}

void MyFrame::OnClose(wxCloseEvent &event)
{
    if (!m_panel) {
        if (event.CanVeto())
            event.Veto();
        return; // a box about a file is open, and the constructor waits for it
    }
    m_panel->SaveAll(true);
    if (event.CanVeto() && !MayLoseChanges()) {
        event.Veto();
        return;
    }
    m_panel = nullptr; // nothing is saved any more: the user may just have given the changes up
    Destroy();
}

// Asks when files could not be saved.
bool MyFrame::MayLoseChanges()
{
    if (FileSet_ModifiedCount(m_panel->Files()) == 0)
        return true;
    return wxMessageBox("These Bib-files can't be saved:\n\n" + m_panel->UnsavedText() +
                            "\nDo you want to close and to lose the changes ?",
                        "Save Bibliography File - Question",
                        wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION, this) == wxYES;
}

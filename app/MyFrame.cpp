// app/MyFrame.cpp - the program's only top-level window: tool bar, keyboard, status bar, close.

#include "app/MyFrame.h"

#include <algorithm>
#include <cstdlib>

#include <wx/button.h>
#include <wx/config.h>
#include <wx/display.h>
#include <wx/menu.h>
#include <wx/modalhook.h>
#include <wx/msgdlg.h>
#include <wx/srchctrl.h>
#include <wx/toolbar.h>
#include <wx/utils.h>

#include "app/AboutDlg.h"
#include "base/Companion.h"
#include "base/Log.h"
#include "base/Sys.h"
#include "session/MessagesText.h"
#include "ui/Cartulo.h"
#include "ui/Commands.h"
#include "ui/Icons.h"
#include "ui/Ids.h"
#include "ui/Messages.h"
#include "ui/Native.h"
#include "ui/QListBox.h"

enum { SMALLEST_WINDOW = 512, DEFAULT_PLACE = 50, TOOL_MARGIN = 4, SEARCH_WIDTH = 160 };
enum { SMALLEST_SEARCH = 80, ENCODING_MARGIN = 32 };
enum { LEAVING_TIMER = 1 };
// Milliseconds that a window manager may take; the longest when it never gives the window the
// focus.
enum { PLACING_TIME = 500, LONGEST_PLACING_TIME = 10000, LEAVING_TIME = 250 };

// The first row that matches handles the event.
wxBEGIN_EVENT_TABLE(MyFrame, wxFrame)
    EVT_MENU(ID_CLOSE, MyFrame::OnQuit)
    EVT_MENU(ID_EXIT, MyFrame::OnQuit)
    EVT_MENU(ID_HELP, MyFrame::OnHelp)
    EVT_BUTTON(ID_HELP, MyFrame::OnHelp)
    EVT_MENU(ID_ABOUT, MyFrame::OnAbout)
    EVT_BUTTON(ID_ABOUT, MyFrame::OnAbout)
    EVT_MENU(ID_CONTEXT_MENU, MyFrame::OnContextMenu)
    EVT_MENU(ID_SEARCH, MyFrame::OnFind)
    EVT_MENU_RANGE(ID_COMMAND_FIRST, ID_COMMAND_LAST, MyFrame::OnCommand)
    EVT_TEXT(ID_SEARCH, MyFrame::OnSearch)
    EVT_SEARCH(ID_SEARCH, MyFrame::OnSearch)
    EVT_CHAR_HOOK(MyFrame::OnCharHook)
    EVT_ACTIVATE(MyFrame::OnActivate)
    EVT_MOVE(MyFrame::OnMove)
    EVT_SIZE(MyFrame::OnSize)
    EVT_TIMER(LEAVING_TIMER, MyFrame::OnLeft)
    EVT_CLOSE(MyFrame::OnClose)
wxEND_EVENT_TABLE()

// Counts the open dialogs that must not have the files exchanged under them.
class DialogCount : public wxModalDialogHook
{
public:
    DialogCount() { Register(); }
    ~DialogCount() override { Unregister(); }

    int Open() const { return m_open; }

protected:
    int Enter(wxDialog *dialog) override
    {
        m_open += Counts(dialog);
        return wxID_NONE; // it is shown
    }

    void Exit(wxDialog *dialog) override { m_open -= Counts(dialog); }

private:
    static int Counts(wxDialog *dialog)
    {
        return !dynamic_cast<Cartulo_Messages *>(dialog) && !dynamic_cast<AboutDlg *>(dialog);
    }

    int m_open = 0;
};

// --- Construction ---

MyFrame::MyFrame(const wxString &title, const char *commandLine, CommandState *state)
    : wxFrame(nullptr, wxID_ANY, title), m_state(state), m_dialogs(new DialogCount),
      m_leaving(this, LEAVING_TIMER)
{
    Place();
    SetFont(wxFontInfo(10));
    SetIcons(Icon_Program());
    AppLog("Cartulo::Frame --- ", "Creating Helper ...");
    m_panel = new Cartulo(this, commandLine, state);
    CreateTools();
    AppLog("Cartulo::Frame --- ", "Status Bar.");
    CreateStatusFields();
    AppLog("Cartulo::Frame --- ", "End.");
}

// What happens, and the encoding of the selected entry's file.
void MyFrame::CreateStatusFields()
{
    wxStatusBar *bar = CreateStatusBar(2);
    const int widths[] = {-1, bar->GetTextExtent("CP65001").x + FromDIP(ENCODING_MARGIN)};
    bar->SetStatusWidths(2, widths);
    bar->SetStatusText(m_panel->CountText(), 0);
    bar->SetStatusText(m_panel->EncodingText(), 1);
}

MyFrame::~MyFrame()
{
    TNSMessage("INFO: MyFrame::~MyFrame ", "Begin", TNS_LIFECYCLE);
    SaveGeometry();
    delete m_contextMenu;
    TNSMessage("INFO: MyFrame::~MyFrame ", "End", TNS_LIFECYCLE);
}

static wxRect Desktop()
{
    wxRect desktop;
    for (unsigned i = 0; i < wxDisplay::GetCount(); ++i)
        desktop.Union(wxDisplay(i).GetGeometry());
    return desktop;
}

// Where the last run left the window.
void MyFrame::Place()
{
    wxConfigBase *config = wxConfigBase::Get();
    wxPoint place(int(config->ReadLong("/MainWindow/x", DEFAULT_PLACE)),
                  int(config->ReadLong("/MainWindow/y", DEFAULT_PLACE)));
    wxSize size(int(config->ReadLong("/MainWindow/w", FRAME_MIN_WIDTH)),
                int(config->ReadLong("/MainWindow/h", FRAME_MIN_HEIGHT)));
    wxSize smallest = FromDIP(wxSize(FRAME_MIN_WIDTH, FRAME_MIN_HEIGHT));
    wxRect desktop = Desktop();
    place = FromDIP(place);
    size = FromDIP(size);
    FrameGeometry fit =
        Frame_FitGeometry({place.x, place.y, size.x, size.y}, {smallest.x, smallest.y},
                          {desktop.GetRight() + 1, desktop.GetBottom() + 1});
    SetMinSize(FromDIP(wxSize(SMALLEST_WINDOW, SMALLEST_WINDOW)));
    m_place = wxRect(fit.x, fit.y, fit.width, fit.height);
    SetSize(m_place);
}

bool MyFrame::Show(bool show)
{
    m_placedSince = Sys_Milliseconds();
    return wxFrame::Show(show);
}

// A window manager that is done gives it the focus; on a busy machine that takes a while.
bool MyFrame::IsNew() const
{
    int32_t placing = m_hadFocus ? PLACING_TIME : LONGEST_PLACING_TIME;
    return !IsShown() || Sys_Milliseconds() - m_placedSince < placing;
}

void MyFrame::OnActivate(wxActivateEvent &event)
{
    event.Skip();
    if (!event.GetActive() || m_hadFocus)
        return;
    m_hadFocus = true;
    m_placedSince = Sys_Milliseconds();
    CallAfter(&MyFrame::Correct);
}

// Some window managers choose a place of their own for a new window, and none tells the size of
// the borders before. So it is put where it belongs again, at once, before the user has seen it.
void MyFrame::Correct()
{
    if (!IsShown() || !IsNew() || m_corrections == 0 || GetRect() == m_place)
        return;
    --m_corrections;
    SetSize(m_place);
}

void MyFrame::OnMove(wxMoveEvent &event)
{
    CallAfter(&MyFrame::Correct);
    event.Skip();
}

void MyFrame::OnSize(wxSizeEvent &event)
{
    if (m_panel)
        m_panel->HoldSash(IsNew());
    if (m_search)
        FitSearch();
    CallAfter(&MyFrame::Correct);
    event.Skip();
}

void MyFrame::SaveGeometry()
{
    wxConfigBase *config = wxConfigBase::Get(false);
    if (!config || IsIconized())
        return;
    if (IsMaximized()) {
        config->Write("/MainWindow/Max", 1);
        return;
    }
    wxPoint place = ToDIP(GetPosition());
    wxSize size = ToDIP(GetSize());
    config->Write("/MainWindow/x", place.x);
    config->Write("/MainWindow/y", place.y);
    config->Write("/MainWindow/w", size.x);
    config->Write("/MainWindow/h", size.y);
    config->Write("/MainWindow/Max", 0);
}

// --- Tools ---

static int ToolIconSize()
{
    char *setting = TNSValue("Common", "TOOLSIZE");
    int size = Frame_ToolIconSize(setting);
    if (size != TOOL_ICON_SIZE)
        TNSMessage("INFO: Cartulo toolbar size: ", setting, TNS_LIFECYCLE);
    free(setting);
    return size;
}

void MyFrame::AddTool(const Command &command)
{
    const CommandTool &tool = command.tool;
    wxToolBar *bar = GetToolBar();
    bar->AddTool(command.id, tool.label, Icon_Load(tool.icon, bar->GetToolBitmapSize().x),
                 tool.tip);
}

void MyFrame::AddSearch(const Command &command)
{
    wxToolBar *bar = GetToolBar();
    m_search = new wxSearchCtrl(bar, command.id, "", wxDefaultPosition,
                                FromDIP(wxSize(SEARCH_WIDTH, -1)), wxTE_PROCESS_ENTER);
    m_search->SetDescriptiveText("Find");
    m_search->SetToolTip(command.tool.tip);
    bar->AddControl(m_search, command.tool.label);
}

// Messages have a tool only where there are some when the window opens.
void MyFrame::CreateTools()
{
    wxToolBar *bar = CreateToolBar();
    int size = ToolIconSize();
    bar->SetToolBitmapSize(wxSize(size, size));
    bar->SetMargins(TOOL_MARGIN, TOOL_MARGIN);
    const bool hasMessages = Messages_HasCounts(m_panel->Files());
    for (const Command *command = Commands; command < Commands + CommandCount; ++command) {
        if (!command->tool.label || (command->id == ID_MESSAGES && !hasMessages))
            continue;
        if (command->tool.icon)
            AddTool(*command);
        else
            AddSearch(*command);
    }
    bar->Realize();
    m_toolsWidth = bar->GetBestSize().x - m_search->GetSize().x;
    FitSearch();
    UpdateCiteTool();
    m_panel->Update_Tools();
}

// In a narrow window the search field makes room for the tools: the bar hides what does not fit.
void MyFrame::FitSearch()
{
    int room = GetClientSize().x - m_toolsWidth;
    int width = std::clamp(room, FromDIP(SMALLEST_SEARCH), FromDIP(SEARCH_WIDTH));
    if (width != m_search->GetSize().x)
        m_search->SetSize(width, m_search->GetSize().y);
}

void MyFrame::UpdateCiteTool()
{
    GetToolBar()->EnableTool(ID_CITE, *m_state->companionService != 0);
}

// --- Commands ---

void MyFrame::OnQuit(wxCommandEvent &)
{
    if (!m_panel || m_panel->FinishEditing())
        Close(true);
}

void MyFrame::OnHelp(wxCommandEvent &)
{
    char *program = TNSearch("Program", "metahelp");
    if (!program) {
        TNSMessage("ERROR: MyFrame::OnHelp", " Can't find <Program>metahelp", TNS_ERROR);
        ShowStatusError(this, "ERROR: The help program \"metahelp\" can't be found.");
        return;
    }
    TNSMessage("INFO: Running ", ("\"" + std::string(program) + "\" .QRL.Cartulo").c_str(),
               TNS_LIFECYCLE);
    const char *arguments[] = {program, ".QRL.Cartulo", nullptr};
    if (wxExecute(arguments, wxEXEC_ASYNC) == 0)
        ShowStatusError(this, "ERROR: The help program can't be started.");
    free(program);
}

void MyFrame::OnAbout(wxCommandEvent &)
{
    AboutDlg dialog(this);
    dialog.ShowModal();
}

void MyFrame::OnContextMenu(wxCommandEvent &)
{
    if (m_contextMenu)
        PopupMenu(m_contextMenu);
}

bool MyFrame::MayTakeCommand() const
{
    return m_dialogs->Open() == 0 && m_panel && !m_panel->IsBusy() &&
           !(m_commandWaits && m_panel->InEditMode());
}

bool MyFrame::TakeCommand(const char *commandLine)
{
    m_commandWaits = !m_panel->FinishEditing();
    if (m_commandWaits || !m_panel) // closed while it asked
        return false;
    m_panel->ProcessCommand(commandLine, "Pellion");
    m_panel->ShowOpenFiles();
    UpdateCiteTool();
    return true;
}

void MyFrame::OnFind(wxCommandEvent &)
{
    if (!Native_IsMapped(m_search)) { // keys would be lost in it
        ShowStatusError(this, "The window is too narrow for the search field.");
        return;
    }
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
    wxString text = wxString::Format("Key=%d(%c),Mod=%x", key, wxUniChar(Log_Character(character)),
                                     event.GetModifiers());
    TNSMessage("INFO: MyFrame::OnCharHook ", text.utf8_str(), TNS_LIFECYCLE);
}

bool MyFrame::SearchHasFocus() const
{
    wxWindow *focus = FindFocus();
    return m_search && focus && m_search->IsDescendant(focus);
}

// The arrow leads from the search field down into what it found.
bool MyFrame::LeaveSearch(int key)
{
    if (key != WXK_DOWN || !m_panel || !SearchHasFocus())
        return false;
    m_panel->FocusList();
    return true;
}

// The toolkit's code of the key, or what the keyboard table has instead.
static int KeyOf(const wxKeyEvent &event)
{
    switch (event.GetKeyCode()) {
    case WXK_NUMPAD_ENTER:
        return WXK_RETURN;
    case WXK_F1:
        return COMMAND_KEY_F1;
    default:
        return event.GetKeyCode();
    }
}

// Whether the control with the focus does: a button is pressed, and the search field searches.
bool MyFrame::TakesEnter() const
{
    return SearchHasFocus() || dynamic_cast<wxButton *>(FindFocus());
}

void MyFrame::OnCharHook(wxKeyEvent &event)
{
    if (m_dialogs->Open() > 0) { // a key from before the dialog came
        event.Skip();
        return;
    }
    if (GetStatusBar())
        SetStatusText("", 0);
    LogKey(event);
    if (LeaveSearch(event.GetKeyCode()))
        return;
    bool alt = event.AltDown(), ctrl = event.ControlDown();
    int key = KeyOf(event);
    if (key == WXK_RETURN && TakesEnter()) {
        event.Skip();
        return;
    }
    key = Command_Key(key, event.GetUnicodeKey(), Native_LatinLetter(event), alt, ctrl);
    const Command *found = m_panel ? Command_Find(key, alt, ctrl, m_panel->InEditMode()) : nullptr;
    if (!found) {
        event.Skip();
        return;
    }
    TNSMessage("INFO: MyFrame::OnCharHook ", found->keyLabel, TNS_LIFECYCLE);
    // Not queued: what is typed next is for the new mode, or for the dialog.
    wxCommandEvent command(wxEVT_MENU, found->id);
    m_panel->GetEventHandler()->ProcessEvent(command);
}

// --- Leaving and closing ---

void MyFrame::OnActivation(bool active)
{
    if (active)
        m_leaving.Stop();
    else
        m_leaving.StartOnce(LEAVING_TIME);
}

void MyFrame::OnLeft(wxTimerEvent &)
{
    OnDeactivation();
}

void MyFrame::OnDeactivation()
{
    if (m_panel && m_autoSave)
        m_panel->SaveAll(true);
}

void MyFrame::OnClose(wxCloseEvent &event)
{
    if (!m_panel) {
        if (event.CanVeto())
            event.Veto();
        return; // a box about a file is open, and the constructor waits for it
    }
    bool mayVeto = event.CanVeto();
    bool goOn = m_panel->FinishEditing() || !mayVeto;
    if (!m_panel)
        return; // closed while it asked
    if (!goOn || !MayClose(mayVeto)) {
        event.Veto();
        return;
    }
    m_panel = nullptr; // nothing is saved any more: the user may just have given the changes up
    Destroy();
}

// Saves; false when the user wants to stay.
bool MyFrame::MayClose(bool mayAsk)
{
    bool quiet = m_autoSave || !mayAsk;
    int saved = m_panel->SaveAll(quiet);
    if (saved < 0)
        return false;
    bool dropped = !quiet && saved == 0 && !m_panel->Files()->saveErrors; // answered with No
    return !mayAsk || dropped || MayLoseChanges();
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

// ui/Cartulo.cpp - the editor panel: the entry list at the left, the selected entry at the right.
#include "ui/Cartulo.h"

#include <wx/button.h>
#include <wx/config.h>
#include <wx/filedlg.h>
#include <wx/frame.h>
#include <wx/msgdlg.h>
#include <wx/panel.h>
#include <wx/sizer.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/toolbar.h>

#include "base/Companion.h"
#include "base/Log.h"
#include "encoding/Encoding.h"
#include "session/Changes.h"
#include "session/Schema.h"
#include "session/Values.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/EntryPane.h"
#include "ui/Icons.h"
#include "ui/Ids.h"
#include "ui/Messages.h"
#include "ui/Native.h"
#include "ui/Preamble.h"
#include "ui/QListBox.h"
#include "ui/Status.h"
#include "ui/Strings.h"
#include "ui/Theme.h"

enum { SASH_POSITION = 300, SMALLEST_PANE = 20, BLANK_BORDER = 8 };
static const char SashKey[] = "/MainWindow/Splitter"; // in the toolkit's configuration
static const double LIST_SHARE = 0.35;                // of what the window grows or shrinks

// Every command comes from a button or as a tool, key or menu.
#define ON_COMMAND(id, handler) EVT_BUTTON(id, handler) EVT_MENU(id, handler)

wxBEGIN_EVENT_TABLE(Cartulo, wxSplitterWindow)
    ON_COMMAND(ID_OPEN, Cartulo::OnOpen)
    ON_COMMAND(ID_SAVE, Cartulo::OnSave)
    ON_COMMAND(ID_MESSAGES, Cartulo::OnShowMessages)
    ON_COMMAND(ID_CITE, Cartulo::OnInsertCite)
    ON_COMMAND(ID_STRINGS, Cartulo::OnEditStrings)
    ON_COMMAND(ID_PREAMBLE, Cartulo::OnEditPreamble)
    ON_COMMAND(ID_NEW_ENTRY, Cartulo::OnNewEntry)
    ON_COMMAND(ID_REMOVE_ENTRY, Cartulo::OnRemoveEntry)
    ON_COMMAND(ID_RENAME_ENTRY, Cartulo::OnRenameEntry)
    ON_COMMAND(ID_EDIT_ENTRY, Cartulo::OnEditEntry)
    ON_COMMAND(ID_COMMIT_ENTRY, Cartulo::OnCommitEntry)
    EVT_CHOICE(ID_TYPE, Cartulo::OnChangeType)
    ON_COMMAND(ID_NEW_FIELD, Cartulo::OnNewField)
    ON_COMMAND(ID_RENAME_FIELD, Cartulo::OnRenameField)
    ON_COMMAND(ID_REMOVE_FIELD, Cartulo::OnRemoveField)
    ON_COMMAND(ID_EDIT_FIELD, Cartulo::OnEditField)
    EVT_COMMAND_RANGE(ID_REMOVE_ROW, ID_REMOVE_ROW_END, wxEVT_BUTTON, Cartulo::OnRemoveField)
    EVT_TEXT(ID_SEARCH, Cartulo::OnSearch)
    EVT_SEARCH(ID_SEARCH, Cartulo::OnSearch)
    EVT_LISTBOX(ID_INDEX, Cartulo::OnIndexChanged)
    EVT_LISTBOX_DCLICK(ID_INDEX, Cartulo::OnIndexActivate)
    EVT_SPLITTER_SASH_POS_CHANGED(ID_SPLITTER, Cartulo::OnSashMove)
    EVT_PAINT(Cartulo::OnPaint)
wxEND_EVENT_TABLE()

// --- Construction ---

static wxWindow *OpenButton(wxWindow *parent)
{
    wxButton *button = new wxButton(parent, ID_OPEN, "Open");
    button->SetBitmap(Icon_Load("document-open", TOOL_ICON_SIZE));
    button->SetToolTip("Click to open BIB-file.");
    return button;
}

static wxWindow *AddButton(wxWindow *parent)
{
    wxWindow *button = new xBitmapButton(parent, ID_NEW_ENTRY, "&Add", "list-add");
    button->SetToolTip("Add new Bibliography entry (Alt+A)");
    return button;
}

// As soon as what goes on now is done.
static void ForceMessages(wxWindow *panel)
{
    TNSMessage("INFO: Forcing displayign messages box. ", "", TNS_LIFECYCLE); // misspelt, stands so
    panel->GetEventHandler()->QueueEvent(new wxCommandEvent(wxEVT_MENU, ID_MESSAGES));
}

Cartulo::Cartulo(wxWindow *parent, const char *commandLine, CommandState *state)
    : wxSplitterWindow(parent, ID_SPLITTER, wxDefaultPosition, parent->GetClientSize(),
                       wxSP_3D | wxSP_LIVE_UPDATE, "splitter"),
      m_state(state)
{
    m_set.box = [](void *owner, const char *caption, const char *text) {
        Box_Warn(static_cast<Cartulo *>(owner), caption, PathText(text));
    };
    m_set.changed = [](void *owner) { static_cast<Cartulo *>(owner)->UpdateSaveTool(); };
    m_set.boxOwner = this;
    ReadSchema();
    AppLog("IFNO: Cartulo::Cartulo ", "Parse_Command_Line"); // misspelt, stands so
    ProcessCommand(commandLine, "OnInit");
    AppLog("More ...");
    m_sashPosition = int(wxConfigBase::Get()->ReadLong(SashKey, 0));
    SetMinimumPaneSize(FromDIP(SMALLEST_PANE));
    m_list = new QListBox(this, this, ID_INDEX, wxDefaultPosition, wxDefaultSize, wxBORDER_STATIC);
    m_list->SetFiles(&m_set);
    m_list->Update_Index(nullptr, m_search.c_str());
    m_entryPane = new EntryPane(this, &m_grid, [this] { FocusForMode(); });
    Arrange();
    ClearEntry();
    if (m_list->Item(0))
        ShowRow("OnIndexChanged");
    UpdateHelpText();
}

Cartulo::~Cartulo()
{
    TNSMessage("INFO: Cartulo::~Cartulo ", "Begin", TNS_LIFECYCLE);
    KeepSashPosition();
    wxConfigBase *config = wxConfigBase::Get(false);
    if (config && m_sashPosition > 0)
        config->Write(SashKey, m_sashPosition);
    DestroyChildren(); // they refer to the files and to the grid
    FileSet_Free(&m_set);
    TNSMessage("INFO: Cartulo::~Cartulo ", "End", TNS_LIFECYCLE);
}

// The types of the file come before those that BIB files bring along.
void Cartulo::ReadSchema()
{
    m_ini = Schema_FindIni();
    if (!Schema_SelectEncoding(m_ini.c_str(), &m_set))
        ForceMessages(this);
    m_name = Schema_ApplicationName(m_ini.c_str());
    Bib_Initialize();
    Schema_RegisterTypes(m_ini.c_str());
}

// --- Panes ---

// A pane with a text above a button, in the middle.
static wxPanel *CreateBlankPane(wxWindow *parent, const wxString &text,
                                wxWindow *(*createButton)(wxWindow *parent))
{
    wxPanel *pane = new wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                wxBORDER_NONE | wxTAB_TRAVERSAL);
    const int border = parent->FromDIP(BLANK_BORDER);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->AddStretchSpacer();
    column->Add(Theme_CreateHeading(pane, text), wxSizerFlags().Expand().Border(wxALL, border));
    column->Add(createButton(pane), wxSizerFlags().Centre().Border(wxALL, border));
    column->AddStretchSpacer();
    pane->SetSizer(column);
    pane->Hide();
    return pane;
}

// The blank ones are made when they are needed.
wxWindow *Cartulo::Pane(PanelPane pane)
{
    static const char openText[] = "To open TeX Bibliography file (BIB) click the button:";
    static const char newText[] = "To add new enrty click the button:"; // misspelt, stands so
    switch (pane) {
    case PANE_OPEN:
        if (!m_openPane)
            m_openPane = CreateBlankPane(this, openText, OpenButton);
        return m_openPane;
    case PANE_NEW:
        if (!m_newPane)
            m_newPane = CreateBlankPane(this, newText, AddButton);
        return m_newPane;
    case PANE_ENTRY:
        break;
    }
    return m_entryPane;
}

// The panes that fit what is open.
void Cartulo::Arrange()
{
    PanelPane pane = Panel_Pane(m_set.count, int(m_list->GetItemCount()));
    wxWindow *window = Pane(pane);
    if (pane == PANE_OPEN)
        ShowAlone(window);
    else if (IsSplit())
        ReplacePane(window);
    else
        Split(window);
    Layout();
}

void Cartulo::ShowAlone(wxWindow *pane)
{
    KeepSashPosition();
    if (IsSplit())
        Unsplit();
    m_list->Hide();
    m_entryPane->Hide();
    if (m_newPane)
        m_newPane->Hide();
    pane->Show();
    Initialize(pane);
    pane->SetFocus();
}

void Cartulo::Split(wxWindow *pane)
{
    m_list->Show();
    m_list->SetFocus(); // before the button that has it is hidden
    if (m_openPane)
        m_openPane->Hide();
    pane->Show();
    SplitVertically(m_list, pane, FromDIP(m_sashPosition > 0 ? m_sashPosition : SASH_POSITION));
}

void Cartulo::ReplacePane(wxWindow *pane)
{
    wxWindow *old = GetWindow2();
    if (old == pane)
        return;
    wxWindow *focus = FindFocus();
    if (focus && old->IsDescendant(focus))
        m_list->SetFocus(); // a hidden window must not keep the focus: keys would be lost
    ReplaceWindow(old, pane);
    old->Hide();
    pane->Show();
}

void Cartulo::HoldSash(bool hold)
{
    SetSashGravity(hold ? 0 : LIST_SHARE);
}

void Cartulo::KeepSashPosition()
{
    if (IsSplit())
        m_sashPosition = ToDIP(GetSashPosition());
}

// --- Files ---

static bool IsCommand(const wxEvent &event)
{
    const wxEventType type = event.GetEventType();
    return type == wxEVT_MENU || type == wxEVT_BUTTON || type == wxEVT_CHOICE ||
           type == wxEVT_LISTBOX || type == wxEVT_LISTBOX_DCLICK || type == wxEVT_TEXT ||
           type == wxEVT_SEARCH;
}

// While files are opened, closed or saved a box may be open, and events that were queued before
// still come in: no command may touch the files then.
bool Cartulo::TryBefore(wxEvent &event)
{
    if (!m_busy || !IsCommand(event))
        return wxSplitterWindow::TryBefore(event);
    ShowStatus(this, "Cartulo waits for an answer, or is busy with the files: please try again.");
    return true;
}

// 1 when the record, which was at `path`, is still in the set; it may have been freed.
static int IsOpen(const BibFileSet *set, const BibFile *file, const std::string &path)
{
    for (int i = 0; i < set->count; ++i)
        if (set->files[i] == file && path == set->files[i]->path)
            return 1;
    return 0;
}

int Cartulo::ProcessCommand(const char *commandLine, const char *)
{
    // No row and no entry may be read while files are closed: boxes let the window draw.
    BibEntry *entry = m_entry;
    const BibFile *file = entry ? m_set.files[m_file] : nullptr;
    std::string path = file ? file->path : "";
    m_entry = nullptr;
    m_file = -1;
    Grid_Clear(&m_grid);
    if (m_list)
        m_list->Drop_Index();
    m_busy = true;
    const EncodingRecord *encoding = Enc_Current();
    CommandResult result = Command_Process(&m_set, m_state, commandLine);
    m_busy = false;
    if (Enc_Current() != encoding)
        m_search = Value_Read(m_searchText, Enc_Current());
    if (m_list) {
        m_list->Update_Index(IsOpen(&m_set, file, path) ? entry : nullptr, m_search.c_str());
        Arrange();
    }
    if (m_messages)
        m_messages->Fill(&m_set);
    if (result.errors != 0)
        ForceMessages(this);
    return 0;
}

void Cartulo::ShowOpenFiles()
{
    Arrange();
    Update_Tools();
    ClearEntry();
    ShowRow("OnIndexChanged");
    ShowEncoding(this, EncodingText()); // once: each change is drawn at once, which takes its time
    ShowStatus(this, CountText());
}

void Cartulo::OnOpen(wxCommandEvent &)
{
    if (!FinishEditing())
        return;
    wxFileDialog dialog(wxGetTopLevelParent(this), "Open BIB file", "", "",
                        "BIB files (*.bib)|*.bib;*.BIB", wxFD_OPEN | wxFD_FILE_MUST_EXIST);
    if (dialog.ShowModal() == wxID_OK)
        OpenFile(PathBytes(dialog.GetPath()));
}

void Cartulo::OpenFile(const std::string &path)
{
    std::string commandLine = Command_Quote(path.c_str());
    if (commandLine.empty()) {
        Box_Warn(this, "Open BIB file",
                 "A file whose path holds both ' and \" can't be opened:\n\n" +
                     PathText(path.c_str()));
        return;
    }
    ProcessCommand(commandLine.c_str(), "OnOpen");
    ShowOpenFiles();
}

const EncodingRecord *Cartulo::Encoding() const
{
    return Bib_Encoding(m_set.files[m_file]);
}

wxString Cartulo::EncodingText() const
{
    return m_entry ? Enc_Label(Encoding()) : "";
}

wxString Cartulo::CountText() const
{
    return wxString::Format("There are %d bibliography entries in %d BIB files.",
                            FileSet_EntryCount(&m_set), m_set.count);
}

void Cartulo::OnShowMessages(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnShowMessages", "", TNS_ACTION);
    if (m_messages) { // a command line came in while it is open
        m_messages->Fill(&m_set);
        return;
    }
    Cartulo_Messages dialog(wxGetTopLevelParent(this), &m_set);
    m_messages = &dialog;
    dialog.ShowModal();
    m_messages = nullptr;
}

// A field that can be edited gets what is chosen.
void Cartulo::OnEditStrings(wxCommandEvent &)
{
    int row = m_entryPane->RowWithFocus(m_grid.count);
    TNSMessage("INFO: Cartulo::OnEditStrings, mode=", row < 0 ? "Edit" : "Insert", TNS_ACTION);
    Cartulo_Strings dialog(wxGetTopLevelParent(this), &m_set, m_ini,
                           row < 0 ? nullptr : m_entryPane->Value(row));
    dialog.ShowModal();
    if (row >= 0)
        m_entryPane->FocusRow(row);
}

void Cartulo::OnEditPreamble(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnEditPreamble", "", TNS_ACTION);
    Cartulo_Preamble(wxGetTopLevelParent(this), &m_set).ShowModal();
}

// --- Other programs ---

void Cartulo::OnInsertCite(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnInsertCite", "", TNS_ACTION);
    if (!m_entry || m_state->companionWindow == 0 || !*m_state->companionService)
        return;
    wxString command = "-s (" + StoreText(m_entry->key, Encoding()) + ") ...InsCite";
    AppLog("Pass* ", command.utf8_str());
    Native_BringForward(m_state->companionWindow);
    if (!m_state->sendCommand ||
        !m_state->sendCommand(m_state->companionService, command.utf8_str()))
        ShowStatusError(this, "ERROR: The editor of the document does not answer.");
}

// --- Saving ---

static wxToolBar *ToolBarOf(wxWindow *window)
{
    wxFrame *frame = dynamic_cast<wxFrame *>(wxGetTopLevelParent(window));
    return frame ? frame->GetToolBar() : nullptr;
}

static void EnableTool(wxWindow *window, int id, bool enable)
{
    if (wxToolBar *bar = ToolBarOf(window))
        bar->EnableTool(id, enable);
}

void Cartulo::UpdateSaveTool()
{
    EnableTool(this, ID_SAVE, FileSet_ModifiedCount(&m_set) != 0);
}

void Cartulo::Update_Tools()
{
    TNSMessage("INFO: Cartulo::Update_Tools(): ", m_editMode ? "EditMode" : "ListMode",
               TNS_LIFECYCLE);
    m_list->Enable(!m_editMode);
    PanelTools tools = Panel_Tools(&m_set, m_file, m_editMode);
    EnableTool(this, ID_NEW_ENTRY, tools.add);
    for (int id : {ID_REMOVE_ENTRY, ID_RENAME_ENTRY, ID_EDIT_ENTRY})
        EnableTool(this, id, tools.change);
    UpdateSaveTool();
}

void Cartulo::SetModified(int file)
{
    if (file >= 0 && file < m_set.count)
        Change_Count(&m_set, m_set.files[file]); // brings the tool up to date
    else if (file > 0)
        AppLog("SetModified-ERROR - wrong file index ",
               wxString::Format(" %d out of 0..%d", file, m_set.count).utf8_str());
}

int Cartulo::SaveAll(bool quiet)
{
    TNSMessage("INFO: Cartulo::SaveAll", "", TNS_ACTION);
    if (m_busy || FileSet_ModifiedCount(&m_set) == 0)
        return 0;
    int answer = quiet ? int(wxYES)
                       : Ask("Save Bibliography File - Question",
                             PathText(Panel_SaveQuestion(&m_set).c_str()), wxYES_NO | wxCANCEL);
    if (answer != wxYES)
        return answer == wxNO ? 0 : -1;
    m_busy = true;
    int saved = FileSet_SaveAll(&m_set);
    m_busy = false;
    UpdateSaveTool();
    if (!saved)
        ShowStatusError(this, "ERROR: Can't save all modified BIB files.");
    return saved;
}

wxString Cartulo::UnsavedText() const
{
    if (m_set.saveErrors)
        return PathText(m_set.saveErrors);
    return PathText(FileSet_ModifiedPaths(&m_set).c_str());
}

void Cartulo::OnSave(wxCommandEvent &)
{
    int saved = SaveAll(true);
    if (saved == 0 && FileSet_ModifiedCount(&m_set) != 0)
        Box_Warn(this, "Save Bibliography File",
                 "These Bib-files can't be saved:\n\n" + UnsavedText());
    else if (m_editMode)
        ShowStatus(this, "The entry that you edit is not saved yet: finish it first, with Esc.");
    else if (saved == 1)
        ShowStatus(this, "All modified BIB files are saved.");
}

// --- The list ---

void Cartulo::OnSearch(wxCommandEvent &event)
{
    wxSearchCtrl *field = dynamic_cast<wxSearchCtrl *>(event.GetEventObject());
    if (!field) {
        TNSMessage("ERROR: Cartulo::OnSearch ", "Uknown source", TNS_ERROR); // misspelt, stands so
        return;
    }
    m_searchText = field->GetValue().ToStdWstring();
    m_search = Value_Read(m_searchText, Enc_Current());
    wxString text = StoreText(m_search.c_str(), Enc_Current());
    TNSMessage("INFO: Cartulo::OnSearch ", text.utf8_str(), TNS_ACTION);
    m_list->Update_Index(m_entry, m_search.c_str());
    bool found = m_list->GetItemCount() > 0 || m_search.empty();
    ShowStatus(this, found ? "" : "No entry holds this text.");
    if (m_editMode)
        return; // the entry that is edited stays, found or not
    if (m_set.count > 0)
        Arrange();
    ShowSelection();
}

void Cartulo::FocusList()
{
    if (m_list->IsShown() && m_list->IsEnabled())
        m_list->SetFocus();
}

// The selected entry, or an empty pane.
void Cartulo::ShowSelection()
{
    const IndexItem *item = m_list->Item(m_list->GetSelection());
    if (item) {
        ShowEntry(item->entry, item->file);
        return;
    }
    ClearEntry();
    ShowEncoding(this, "");
}

// Shows the selected row. `handler` names the caller in the log.
void Cartulo::ShowRow(const char *handler)
{
    int row = m_list->GetSelection();
    const IndexItem *item = m_list->Item(row);
    if (!item) {
        TNSMessage(wxString::Format("WARNING: Cartulo::%s ", handler).utf8_str(),
                   "no selection in index", TNS_WARNING);
        return;
    }
    TNSMessage(wxString::Format("INFO: Cartulo::%s to ", handler).utf8_str(),
               m_list->GetItemText(row).utf8_str(), TNS_ACTION);
    ShowEntry(item->entry, item->file);
}

void Cartulo::OnIndexChanged(wxCommandEvent &)
{
    ShowRow("OnIndexChanged");
}

void Cartulo::OnIndexActivate(wxCommandEvent &)
{
    ShowRow("OnIndexActivate");
}

// Tells how long the start took; the base class paints.
void Cartulo::OnPaint(wxPaintEvent &event)
{
    if (!m_isPainted)
        TNSMessage("INFO: Cartulo::OnPaint ", "First", TNS_LIFECYCLE);
    m_isPainted = true;
    event.Skip();
}

void Cartulo::OnSashMove(wxSplitterEvent &event)
{
    wxSize left = GetWindow1()->GetSize(), right = GetWindow2()->GetSize();
    TNSMessage("INFO: Cartulo::OnSashMOve ", // misspelt, stands so
               wxString::Format("sash pos=%d, w1=%dx%d, w2=%dx%d", event.GetSashPosition(), left.x,
                                left.y, right.x, right.y)
                   .utf8_str(),
               TNS_ACTION);
    event.Skip();
}

#include "ui/Cartulo.h"

#include <cstdlib>

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/config.h>
#include <wx/filedlg.h>
#include <wx/frame.h>
#include <wx/msgdlg.h>
#include <wx/panel.h>
#include <wx/settings.h>
#include <wx/sizer.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/toolbar.h>

#include "base/Companion.h"
#include "base/Log.h"
#include "encoding/Encoding.h"
#include "session/Changes.h"
#include "session/Schema.h"
#include "session/Values.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/Icons.h"
#include "ui/Ids.h"
#include "ui/Messages.h"
#include "ui/Native.h"
#include "ui/PanelRules.h"
#include "ui/Preamble.h"
#include "ui/QListBox.h"
#include "ui/Status.h"
#include "ui/Strings.h"
#include "ui/Theme.h"

enum { SASH_POSITION = 300, SMALLEST_PANE = 20, HELP_HEIGHT = 40 };
enum { SMALLEST_VALUE = 60 };                         // width that is left in the narrowest window
static const char SashKey[] = "/MainWindow/Splitter"; // in the toolkit's configuration
static const double LIST_SHARE = 0.35;                // of what the window grows or shrinks
static const Colour HeadingColour = {0, 0, 100};

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

Cartulo::Cartulo(wxWindow *parent, const char *commandLine, CommandState *state)
    : wxSplitterWindow(parent, ID_SPLITTER, wxDefaultPosition, parent->GetClientSize(),
                       wxSP_3D | wxSP_LIVE_UPDATE, "splitter"),
      m_state(state)
{
    m_set.box = ShowBox;
    m_set.changed = OnChanged;
    m_set.owner = this;
    ReadSchema();
    AppLog("IFNO: Cartulo::Cartulo ", "Parse_Command_Line");
    ProcessCommand(commandLine, "OnInit");
    AppLog("More ...");
    m_sashPosition = int(wxConfigBase::Get()->ReadLong(SashKey, 0));
    SetMinimumPaneSize(FromDIP(SMALLEST_PANE));
    m_list = new QListBox(this, this, ID_INDEX, wxDefaultPosition, wxDefaultSize, wxBORDER_STATIC);
    m_list->SetFiles(&m_set);
    m_list->Update_Index(nullptr, m_search.c_str());
    CreateEntryPane();
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
    m_list->Drop_Index();
    FileSet_Free(&m_set);
    TNSMessage("INFO: Cartulo::~Cartulo ", "End", TNS_LIFECYCLE);
}

// The types of the file come before those that BIB files bring along.
void Cartulo::ReadSchema()
{
    m_ini = Schema_FindIni();
    if (!Schema_SelectEncoding(m_ini.c_str(), &m_set))
        ForceMessages();
    m_name = Schema_ApplicationName(m_ini.c_str());
    Bib_Initialize();
    Schema_RegisterTypes(m_ini.c_str());
}

wxStaticText *Cartulo::CreateHeading(wxWindow *parent, const wxString &text)
{
    wxStaticText *heading =
        new wxStaticText(parent, wxID_ANY, text, wxDefaultPosition, wxDefaultSize,
                         wxALIGN_CENTRE_HORIZONTAL | wxST_ELLIPSIZE_END);
    heading->SetFont(heading->GetFont().Bold());
    Theme_SetTextColour(heading, HeadingColour);
    return heading;
}

// File, type, and the rows of the fields, as they are needed.
wxSizer *Cartulo::CreateFieldGrid()
{
    wxFlexGridSizer *grid = new wxFlexGridSizer(3, wxSize(FromDIP(COLUMN_GAP), 0));
    m_fields = grid;
    grid->AddGrowableCol(1);
    wxSizerFlags labelPlace = wxSizerFlags().CentreVertical();
    grid->Add(new wxStaticText(m_entryPane, wxID_ANY, "BIB File:"), labelPlace);
    m_fileName = new wxStaticText(m_entryPane, wxID_ANY, "file-name.bib", wxDefaultPosition,
                                  wxDefaultSize, wxST_ELLIPSIZE_START | wxST_NO_AUTORESIZE);
    m_fileName->SetMinSize(FromDIP(wxSize(SMALLEST_VALUE, -1)));
    grid->Add(m_fileName, wxSizerFlags().Expand().Border(wxTOP | wxBOTTOM, FromDIP(4)));
    grid->AddSpacer(0);
    grid->Add(new wxStaticText(m_entryPane, wxID_ANY, "Entry Type:"), labelPlace);
    m_type = new wxChoice(m_entryPane, ID_TYPE);
    m_type->SetMinSize(FromDIP(wxSize(SMALLEST_VALUE, -1)));
    m_type->Disable();
    grid->Add(m_type, wxSizerFlags().Expand());
    grid->AddSpacer(0);
    return grid;
}

void Cartulo::CreateRow(int index)
{
    FieldRow &row = m_rows[index];
    row.label = new wxStaticText(m_entryPane, wxID_ANY, "Field:", wxDefaultPosition, wxDefaultSize,
                                 wxST_ELLIPSIZE_END | wxST_NO_AUTORESIZE);
    row.value = new wxTextCtrl(m_entryPane, wxID_ANY, "FieldValue");
    row.value->SetForegroundColour(wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT));
    row.value->SetMinSize(FromDIP(wxSize(SMALLEST_VALUE, -1)));
    row.remove = new xBitmapButton(m_entryPane, ID_REMOVE_ROW + index, "&Delete", "list-remove");
    row.remove->SetToolTip("Delete the field");
    wxWindow *before = m_type;
    if (index > 0)
        before = m_rows[index - 1].remove;
    row.label->MoveAfterInTabOrder(before);
    row.value->MoveAfterInTabOrder(row.label);
    row.remove->MoveAfterInTabOrder(row.value);
    m_fields->Add(row.label, wxSizerFlags().CentreVertical());
    m_fields->Add(row.value, wxSizerFlags().Expand());
    m_fields->Add(row.remove, wxSizerFlags().CentreVertical());
}

// Most entries have few fields, and controls take their time. GTK animates a button that is made in
// a window on the screen into its shape, and tells sizes from amid that: all get that of the first,
// which is made before.
void Cartulo::CreateRows(int count)
{
    if (m_rowCount >= count)
        return;
    for (; m_rowCount < count; ++m_rowCount) {
        CreateRow(m_rowCount);
        m_rows[m_rowCount].remove->SetMinSize(m_rows[0].remove->GetBestSize());
    }
    // Tab has to know the rows at once, not when there is nothing else to do.
    m_entryPane->OnInternalIdle();
}

void Cartulo::CreateEntryPane()
{
    m_entryPane = new wxScrolledWindow(this, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                       wxBORDER_STATIC | wxTAB_TRAVERSAL | wxVSCROLL);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    wxSizerFlags place = wxSizerFlags().Expand().Border(wxALL, FromDIP(PANE_BORDER));
    column->Add(CreateHeading(m_entryPane, "Records of currently selected bibliography entry"),
                place);
    column->Add(CreateFieldGrid(), place);
    CreateRows(1);
    m_moreFields = new wxStaticText(m_entryPane, wxID_ANY, "");
    column->Add(m_moreFields, place);
    column->Add(CreateNewFieldRow(), place);
    m_noteLine = new wxBoxSizer(wxVERTICAL);
    column->Add(m_noteLine, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, FromDIP(PANE_BORDER)));
    m_help = new wxTextCtrl(m_entryPane, wxID_ANY, "Ctrl+F1 to help", wxDefaultPosition,
                            wxDefaultSize, wxTE_MULTILINE | wxTE_READONLY | wxTE_NO_VSCROLL);
    m_help->SetMinSize(FromDIP(wxSize(-1, HELP_HEIGHT)));
    column->Add(m_help, wxSizerFlags(place).Proportion(1));
    m_entryPane->SetSizer(column);
    m_entryPane->SetScrollRate(0, FromDIP(16));
    Native_KeepScrollBars(m_entryPane);
    m_entryPane->Bind(wxEVT_SIZE, &Cartulo::OnEntrySize, this);
    m_type->Bind(wxEVT_MOUSEWHEEL, &Cartulo::OnWheel, this);
    m_newFieldKey->Bind(wxEVT_MOUSEWHEEL, &Cartulo::OnWheel, this);
    m_entryPane->Hide();
}

// A pane with a text above a button, in the middle.
wxPanel *Cartulo::CreateBlankPane(const wxString &text, wxWindow *(*createButton)(wxWindow *parent))
{
    wxPanel *pane = new wxPanel(this, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                wxBORDER_NONE | wxTAB_TRAVERSAL);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->AddStretchSpacer();
    column->Add(CreateHeading(pane, text),
                wxSizerFlags().Expand().Border(wxALL, FromDIP(PANE_BORDER)));
    column->Add(createButton(pane), wxSizerFlags().Centre().Border(wxALL, FromDIP(PANE_BORDER)));
    column->AddStretchSpacer();
    pane->SetSizer(column);
    pane->Hide();
    return pane;
}

// --- Panes ---

wxWindow *Cartulo::OpenPane()
{
    if (!m_openPane)
        m_openPane =
            CreateBlankPane("To open TeX Bibliography file (BIB) click the button:", OpenButton);
    return m_openPane;
}

wxWindow *Cartulo::NewPane()
{
    if (!m_newPane)
        m_newPane = CreateBlankPane("To add new enrty click the button:", AddButton);
    return m_newPane;
}

// The panes that fit what is open.
void Cartulo::Arrange()
{
    int pane = Panel_Pane(m_set.count, int(m_list->GetItemCount()));
    if (pane == PANE_OPEN)
        ShowAlone(OpenPane());
    else if (IsSplit())
        ReplacePane(pane == PANE_NEW ? NewPane() : m_entryPane);
    else
        Split(pane == PANE_NEW ? NewPane() : m_entryPane);
    Layout();
}

void Cartulo::RefreshPane()
{
    if (IsSplit() && m_set.count > 0)
        Arrange();
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
    SplitVertically(m_list, pane, FromDIP(SashPosition()));
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

int Cartulo::SashPosition() const
{
    return m_sashPosition > 0 ? m_sashPosition : SASH_POSITION;
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

void Cartulo::ShowBox(void *owner, const char *caption, const char *text)
{
    static_cast<Cartulo *>(owner)->ShowWarning(caption, PathText(text));
}

void Cartulo::OnChanged(void *owner)
{
    static_cast<Cartulo *>(owner)->UpdateSaveTool();
}

void Cartulo::ShowWarning(const wxString &caption, const wxString &text)
{
    Box_Warn(wxGetTopLevelParent(this), caption, text);
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
        ForceMessages();
    return 0;
}

void Cartulo::ForceMessages()
{
    TNSMessage("INFO: Forcing displayign messages box. ", "", TNS_LIFECYCLE);
    GetEventHandler()->QueueEvent(new wxCommandEvent(wxEVT_MENU, ID_MESSAGES));
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
        ShowWarning("Open BIB file", "A file whose path holds both ' and \" can't be opened:\n\n" +
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
    int row = RowWithFocus(m_grid.count);
    TNSMessage("INFO: Cartulo::OnEditStrings, mode=", row < 0 ? "Edit" : "Insert", TNS_ACTION);
    Cartulo_Strings dialog(wxGetTopLevelParent(this), &m_set, m_ini,
                           row < 0 ? nullptr : m_rows[row].value);
    dialog.ShowModal();
    if (row >= 0)
        FocusRow(row);
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
        Change_Count(&m_set, m_set.files[file]);
    else if (file > 0)
        AppLog("SetModified-ERROR - wrong file index ",
               wxString::Format(" %d out of 0..%d", file, m_set.count).utf8_str());
    UpdateSaveTool();
}

// wxYES, wxNO or wxCANCEL.
int Cartulo::AskToSave()
{
    m_busy = true; // another program may be activated meanwhile: nothing is saved before the answer
    int answer = wxMessageBox(PathText(Panel_SaveQuestion(&m_set).c_str()),
                              "Save Bibliography File - Question",
                              wxYES_NO | wxCANCEL | wxICON_QUESTION, wxGetTopLevelParent(this));
    m_busy = false;
    return answer;
}

int Cartulo::SaveAll(bool quiet)
{
    TNSMessage("INFO: Cartulo::SaveAll", "", TNS_ACTION);
    if (m_busy || FileSet_ModifiedCount(&m_set) == 0)
        return 0;
    int answer = quiet ? wxYES : AskToSave();
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
        ShowWarning("Save Bibliography File",
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
        TNSMessage("ERROR: Cartulo::OnSearch ", "Uknown source", TNS_ERROR);
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
    RefreshPane();
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
    if (item)
        ShowEntry(item->entry, item->file);
    else
        ClearEntry();
    ShowEncoding(this, EncodingText());
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
    TNSMessage("INFO: Cartulo::OnSashMOve ",
               wxString::Format("sash pos=%d, w1=%dx%d, w2=%dx%d", event.GetSashPosition(), left.x,
                                left.y, right.x, right.y)
                   .utf8_str(),
               TNS_ACTION);
    event.Skip();
}

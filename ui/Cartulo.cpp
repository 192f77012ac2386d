#include "ui/Cartulo.h"

#include <algorithm>
#include <cstdlib>
#include <vector>

#include <wx/button.h>
#include <wx/filedlg.h>
#include <wx/frame.h>
#include <wx/msgdlg.h>
#include <wx/panel.h>
#include <wx/sizer.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/toolbar.h>

#include "app/Companion.h"
#include "app/Ids.h"
#include "app/Log.h"
#include "encoding/Encoding.h"
#include "ui/DisplayText.h"
#include "ui/Messages.h"
#include "ui/QListBox.h"
#include "ui/Theme.h"

enum { SASH_POSITION = 300, SMALLEST_PANE = 20, COLUMN_GAP = 8, PANE_BORDER = 8 };
static const double LIST_SHARE = 0.35; // of what the window grows or shrinks
static const Colour HeadingColour = {0, 0, 100};

wxBEGIN_EVENT_TABLE(Cartulo, wxSplitterWindow)
    EVT_BUTTON(ID_OPEN, Cartulo::OnOpen)
    EVT_MENU(ID_OPEN, Cartulo::OnOpen)
    EVT_BUTTON(ID_SAVE, Cartulo::OnSave)
    EVT_MENU(ID_SAVE, Cartulo::OnSave)
    EVT_BUTTON(ID_MESSAGES, Cartulo::OnShowMessages)
    EVT_MENU(ID_MESSAGES, Cartulo::OnShowMessages)
    EVT_TEXT(ID_SEARCH, Cartulo::OnSearch)
    EVT_SEARCH(ID_SEARCH, Cartulo::OnSearch)
    EVT_LISTBOX(ID_INDEX, Cartulo::OnIndexChanged)
    EVT_LISTBOX_DCLICK(ID_INDEX, Cartulo::OnIndexActivate)
    EVT_SPLITTER_SASH_POS_CHANGED(ID_SPLITTER, Cartulo::OnSashMove)
wxEND_EVENT_TABLE()

// --- Construction ---

Cartulo::Cartulo(wxWindow *parent, const char *commandLine, CommandState *state)
    : wxSplitterWindow(parent, ID_SPLITTER, wxDefaultPosition, parent->GetClientSize(),
                       wxSP_3D | wxSP_LIVE_UPDATE, "splitter"),
      m_state(state)
{
    m_set.box = ShowBox;
    m_set.boxOwner = this;
    Bib_Initialize();
    AppLog("IFNO: Cartulo::Cartulo ", "Parse_Command_Line");
    ProcessCommand(commandLine, "OnInit");
    AppLog("More ...");
    SetMinimumPaneSize(FromDIP(SMALLEST_PANE));
    SetSashGravity(LIST_SHARE);
    m_list = new QListBox(this, this, ID_INDEX, wxDefaultPosition, wxDefaultSize, wxBORDER_STATIC);
    CreateEntryPane();
    CreateOpenPane();
    Arrange();
    RefreshList(nullptr);
}

Cartulo::~Cartulo()
{
    TNSMessage("INFO: Cartulo::~Cartulo ", "Begin", TNS_LIFECYCLE);
    m_list->Drop_Index();
    FileSet_Free(&m_set);
    TNSMessage("INFO: Cartulo::~Cartulo ", "End", TNS_LIFECYCLE);
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

void Cartulo::CreateEntryPane()
{
    m_entryPane = new wxScrolledWindow(this, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                       wxBORDER_STATIC | wxTAB_TRAVERSAL | wxVSCROLL);
    wxFlexGridSizer *grid = new wxFlexGridSizer(2, wxSize(FromDIP(COLUMN_GAP), 0));
    grid->AddGrowableCol(1);
    wxSizerFlags labelPlace = wxSizerFlags().CentreVertical();
    wxSizerFlags textPlace = wxSizerFlags().Expand().Border(wxTOP | wxBOTTOM, FromDIP(4));
    grid->Add(new wxStaticText(m_entryPane, wxID_ANY, "BIB File:"), labelPlace);
    m_fileName = new wxStaticText(m_entryPane, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                                  wxST_ELLIPSIZE_START | wxST_NO_AUTORESIZE);
    grid->Add(m_fileName, textPlace);
    grid->Add(new wxStaticText(m_entryPane, wxID_ANY, "Entry Type:"), labelPlace);
    m_typeName = new wxStaticText(m_entryPane, wxID_ANY, "");
    grid->Add(m_typeName, textPlace);
    for (FieldRow &row : m_rows) {
        row.label = new wxStaticText(m_entryPane, wxID_ANY, "Field:");
        row.value = new wxTextCtrl(m_entryPane, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                                   wxTE_READONLY);
        grid->Add(row.label, labelPlace);
        grid->Add(row.value, wxSizerFlags().Expand());
    }
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(CreateHeading(m_entryPane, "Records of currently selected bibliography entry"),
                wxSizerFlags().Expand().Border(wxALL, FromDIP(PANE_BORDER)));
    column->Add(grid, wxSizerFlags().Expand().Border(wxALL, FromDIP(PANE_BORDER)));
    m_moreFields = new wxStaticText(m_entryPane, wxID_ANY, "");
    column->Add(m_moreFields, wxSizerFlags().Border(wxALL, FromDIP(PANE_BORDER)));
    m_entryPane->SetSizer(column);
    m_entryPane->SetScrollRate(0, FromDIP(16));
    m_entryPane->Hide();
}

void Cartulo::CreateOpenPane()
{
    m_openPane = new wxPanel(this, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                             wxBORDER_NONE | wxTAB_TRAVERSAL);
    wxButton *button = new wxButton(m_openPane, ID_OPEN, "Open");
    button->SetToolTip("Click to open BIB-file.");
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->AddStretchSpacer();
    column->Add(CreateHeading(m_openPane, "To open TeX Bibliography file (BIB) click the button:"),
                wxSizerFlags().Expand().Border(wxALL, FromDIP(PANE_BORDER)));
    column->Add(button, wxSizerFlags().Centre().Border(wxALL, FromDIP(PANE_BORDER)));
    column->AddStretchSpacer();
    m_openPane->SetSizer(column);
    m_openPane->Hide();
}

// --- Files ---

void Cartulo::ShowBox(void *owner, const char *caption, const char *text)
{
    static_cast<Cartulo *>(owner)->ShowWarning(caption, PathText(text));
}

void Cartulo::ShowWarning(const wxString &caption, const wxString &text)
{
    wxMessageBox(text, caption, wxOK | wxICON_WARNING, wxGetTopLevelParent(this));
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
    if (m_list)
        m_list->Drop_Index();
    m_busy = true;
    CommandResult result = Command_Process(&m_set, m_state, commandLine);
    m_busy = false;
    if (m_list) {
        if (result.changes != 0)
            Arrange();
        RefreshList(IsOpen(&m_set, file, path) ? entry : nullptr);
    }
    if (result.errors != 0) {
        TNSMessage("INFO: Forcing displayign messages box. ", "", TNS_LIFECYCLE);
        GetEventHandler()->QueueEvent(new wxCommandEvent(wxEVT_MENU, ID_MESSAGES));
    }
    return 0;
}

// Shows the rows of what is open now, and the entry `select` or the first.
void Cartulo::RefreshList(BibEntry *select)
{
    m_list->Update_Index(select, m_search.c_str());
    Update_Tools();
    if (m_list->GetItemCount() > 0)
        ShowRow("OnIndexChanged");
    else
        ClearEntry();
}

// The panes that fit the number of files.
void Cartulo::Arrange()
{
    if (m_set.count > 0 && !IsSplit()) {
        m_list->SetFocus(); // before the button that has it is hidden
        m_openPane->Hide();
        SplitVertically(m_list, m_entryPane, FromDIP(SASH_POSITION));
    } else if (m_set.count == 0) {
        Unsplit(m_entryPane);
        m_list->Hide();
        m_openPane->Show();
        Initialize(m_openPane);
        m_openPane->SetFocus();
    }
    Layout();
}

void Cartulo::OnOpen(wxCommandEvent &)
{
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
    ShowStatus(this, CountText());
}

wxString Cartulo::CountText() const
{
    return wxString::Format("There are %d bibliography entries in %d BIB files.",
                            FileSet_EntryCount(&m_set), m_set.count);
}

void Cartulo::OnShowMessages(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnShowMessages", "", TNS_ACTION);
    Cartulo_Messages dialog(wxGetTopLevelParent(this), &m_set);
    dialog.ShowModal();
}

// --- Saving ---

static wxToolBar *ToolBarOf(wxWindow *window)
{
    wxFrame *frame = dynamic_cast<wxFrame *>(wxGetTopLevelParent(window));
    return frame ? frame->GetToolBar() : nullptr;
}

void Cartulo::UpdateSaveTool()
{
    if (wxToolBar *bar = ToolBarOf(this))
        bar->EnableTool(ID_SAVE, FileSet_ModifiedCount(&m_set) != 0);
}

void Cartulo::Update_Tools()
{
    TNSMessage("INFO: Cartulo::Update_Tools(): ", "ListMode", TNS_LIFECYCLE);
    UpdateSaveTool();
}

void Cartulo::SetModified(int file)
{
    if (file >= 0 && file < m_set.count)
        ++m_set.files[file]->modified;
    else if (file > 0)
        AppLog("SetModified-ERROR - wrong file index ",
               wxString::Format(" %d out of 0..%d", file, m_set.count).utf8_str());
    UpdateSaveTool();
}

// wxYES, wxNO or wxCANCEL.
int Cartulo::AskToSave()
{
    char *question = FileSet_SaveQuestion(&m_set);
    m_busy = true; // another program may be activated meanwhile: nothing is saved before the answer
    int answer = wxMessageBox(PathText(question), "Save Bibliography File - Question",
                              wxYES_NO | wxCANCEL | wxICON_QUESTION, wxGetTopLevelParent(this));
    m_busy = false;
    free(question);
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
    char *paths = FileSet_ModifiedPaths(&m_set);
    wxString text = PathText(paths);
    free(paths);
    return text;
}

void Cartulo::OnSave(wxCommandEvent &)
{
    if (SaveAll(true) == 0 && FileSet_ModifiedCount(&m_set) != 0)
        ShowWarning("Save Bibliography File",
                    "These Bib-files can't be saved:\n\n" + UnsavedText());
}

// --- The list ---

void Cartulo::OnSearch(wxCommandEvent &event)
{
    wxSearchCtrl *field = dynamic_cast<wxSearchCtrl *>(event.GetEventObject());
    if (!field) {
        TNSMessage("ERROR: Cartulo::OnSearch ", "Uknown source", TNS_ERROR);
        return;
    }
    std::wstring text = field->GetValue().ToStdWstring();
    std::vector<char> narrow(text.size() + 1);
    m_search = Enc_FromUnicode(narrow.data(), text.c_str());
    TNSMessage("INFO: Cartulo::OnSearch ", StoreText(m_search.c_str()).utf8_str(), TNS_ACTION);
    m_list->Update_Index(m_entry, m_search.c_str());
    bool found = m_list->GetItemCount() > 0 || m_search.empty();
    ShowStatus(this, found ? "" : "No entry holds this text.");
    ShowSelection();
}

// The selected entry, or an empty pane.
void Cartulo::ShowSelection()
{
    const IndexItem *item = m_list->Item(m_list->GetSelection());
    if (item)
        ShowEntry(item->entry, item->file);
    else
        ClearEntry();
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

// --- The entry pane ---

// A text control holds no more than 65,534 bytes, and nothing behind a NUL.
void Cartulo::FillRow(int row, const BibField *field)
{
    wxTextCtrl *value = m_rows[row].value;
    wxString text = StoreText(field->value);
    m_rows[row].label->SetLabelText(StoreText(BibFieldTable[field->name]));
    value->ChangeValue(text);
    if (value->GetValue() == text)
        value->UnsetToolTip();
    else
        value->SetToolTip("This value is too long to be shown in full.");
}

void Cartulo::ShowEntry(BibEntry *entry, int file)
{
    if (!entry)
        return;
    m_entry = entry;
    m_file = file;
    wxString path = PathText(m_set.files[file]->path);
    m_entryPane->Freeze();
    m_fileName->SetLabelText(path);
    m_fileName->SetToolTip(path);
    m_typeName->SetLabelText(StoreText(BibTypeTable[entry->type]));
    int shown = std::min<int>(entry->fieldCount, ROW_COUNT);
    for (int i = 0; i < shown; ++i)
        FillRow(i, &entry->fields[i]);
    ShowMoreFields(entry->fieldCount - shown);
    ShowRows(shown);
    m_entryPane->Thaw();
}

void Cartulo::ClearEntry()
{
    m_entry = nullptr;
    m_file = -1;
    m_fileName->SetLabelText("");
    m_fileName->UnsetToolTip();
    m_typeName->SetLabelText("");
    ShowMoreFields(0);
    ShowRows(0);
}

// Nobody shall take an entry with more fields than rows for one with that many fields.
void Cartulo::ShowMoreFields(int count)
{
    m_moreFields->SetLabelText(count == 1
                                   ? wxString("1 more field is not shown.")
                                   : wxString::Format("%d more fields are not shown.", count));
    m_moreFields->Show(count > 0);
}

// Shows the first rows, as many as `count`.
void Cartulo::ShowRows(int count)
{
    for (int i = 0; i < ROW_COUNT; ++i) {
        if (i >= count && m_rows[i].value->HasFocus())
            m_list->SetFocus(); // a hidden window must not keep the focus: keys would be lost
        m_rows[i].label->Show(i < count);
        m_rows[i].value->Show(i < count);
    }
    m_entryPane->FitInside(); // the scroll bar follows the rows
    m_entryPane->Layout();
}

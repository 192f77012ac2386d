// ui/CartuloEdit.cpp - the entry pane: showing an entry, editing it, committing what was edited.
#include "ui/Cartulo.h"

#include <algorithm>
#include <initializer_list>
#include <vector>

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/msgdlg.h>
#include <wx/settings.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "base/Log.h"
#include "encoding/Encoding.h"
#include "session/Changes.h"
#include "session/EntryRules.h"
#include "session/KnownStrings.h"
#include "session/Schema.h"
#include "ui/Commands.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/Icons.h"
#include "ui/Ids.h"
#include "ui/Native.h"
#include "ui/QListBox.h"
#include "ui/Theme.h"
#include "ui/TypeChoice.h"

enum { LABEL_WIDTH = 96 };                   // in the narrowest window
enum { NOTE_INDEX = 3 };                     // of the note on missing fields, in its row
enum { LONGEST_TYPE = 300 };                 // what is shown of one
enum { KEY_WIDTH = 160, SMALLEST_KEY = 40 }; // of the box for the key of a new field

static const char CommitTitle[] = "Commit of Bibliography Entry - Question";

// --- Rows and their controls ---

static bool Fits(const wxTextCtrl *value)
{
    wxString text = value->GetValue();
    return BoundedText(text) == text &&
           value->GetSizeFromTextSize(value->GetTextExtent(text)).x <= value->GetSize().x;
}

// What is too long for the row can be read in its tip.
void Cartulo::FitRow(int row)
{
    wxStaticText *label = m_rows[row].label;
    wxTextCtrl *value = m_rows[row].value;
    int widest = std::max(FromDIP(LABEL_WIDTH), m_entryPane->GetClientSize().x / 3);
    int width = label->GetTextExtent(label->GetLabelText()).x;
    label->SetMinSize(wxSize(std::min(width, widest), -1));
    label->SetToolTip(width > widest ? label->GetLabelText() : wxString());
    if (m_grid.rows[row].locked)
        value->SetToolTip(Text_LockedTip);
    else
        value->SetToolTip(Fits(value) ? wxString() : BoundedText(value->GetValue()));
}

// A text control holds no more than 65,534 bytes, and nothing behind a NUL: what it cannot hold is
// not to be edited in it.
void Cartulo::FillRow(int index)
{
    GridRow &row = m_grid.rows[index];
    m_rows[index].value->ChangeValue(wxString(row.filled));
    m_rows[index].value->SetInsertionPoint(0); // a long one is shown from its beginning
    std::wstring held = m_rows[index].value->GetValue().ToStdWstring();
    row.locked = held != row.filled;
    row.filled = row.text = held;
}

void Cartulo::FillRows()
{
    CreateRows(m_grid.count);
    for (int i = 0; i < m_grid.count; ++i)
        FillRow(i);
    WriteRows();
}

// What the user typed, into the rows.
void Cartulo::ReadRows()
{
    for (int i = 0; i < m_grid.count; ++i)
        m_grid.rows[i].text = m_rows[i].value->GetValue().ToStdWstring();
}

void Cartulo::WriteRow(int index)
{
    const GridRow &row = m_grid.rows[index];
    FieldRow &controls = m_rows[index];
    bool own = m_editMode && !row.inherited;
    controls.label->SetLabelText(KeyText(index));
    if (controls.value->GetValue().ToStdWstring() != row.text)
        controls.value->ChangeValue(wxString(row.text));
    bool locked = !own || row.crossref || row.locked;
    controls.value->Enable(!locked);
    controls.value->SetForegroundColour(m_editMode && locked
                                            ? Theme_PaleTextColour()
                                            : wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT));
    controls.remove->Enable(own);
    controls.label->Show();
    controls.value->Show();
    controls.remove->Show(!row.crossref || !m_grid.parent);
    FitRow(index);
}

void Cartulo::HideRow(int index)
{
    m_rows[index].label->Hide();
    for (wxWindow *control :
         std::initializer_list<wxWindow *>{m_rows[index].value, m_rows[index].remove}) {
        control->Hide();
        control->Disable();
    }
}

// A control that is hidden or disabled must not keep the focus: keys would be lost.
void Cartulo::WriteRows()
{
    CreateRows(m_grid.count);
    for (int i = 0; i < m_rowCount; ++i) {
        bool hadFocus = m_rows[i].value->HasFocus();
        if (hadFocus && i >= m_grid.count)
            FocusForMode();
        if (i < m_grid.count)
            WriteRow(i);
        else
            HideRow(i);
        if (hadFocus && !m_rows[i].value->IsEnabled())
            FocusForMode();
    }
    ShowMoreFields();
}

// Nobody shall take an entry with more fields than rows for one with that many fields.
void Cartulo::ShowMoreFields()
{
    std::string text = Grid_HiddenText(&m_grid);
    m_moreFields->SetLabelText(text);
    m_moreFields->Show(!text.empty());
}

wxSizerFlags Cartulo::PlaceInRow() const
{
    return wxSizerFlags().CentreVertical().Border(wxRIGHT, FromDIP(COLUMN_GAP));
}

wxSizer *Cartulo::CreateNewFieldRow()
{
    m_newFieldLabel = new wxStaticText(m_entryPane, wxID_ANY, "Add Field:");
    m_newFieldKey = new wxComboBox(m_entryPane, ID_NEW_FIELD_KEY);
    m_newField = new xBitmapButton(m_entryPane, ID_NEW_FIELD, "&Add", "list-add");
    m_newField->SetToolTip("Add new fields to the Entry with specified key (Alt+A)");
    m_missingFields = new wxStaticText(m_entryPane, wxID_ANY, "(no comment)");
    m_done = new wxButton(m_entryPane, ID_COMMIT_ENTRY, "Done");
    m_done->SetToolTip("Finish editing the entry.");
    m_newFieldRow = new wxBoxSizer(wxHORIZONTAL);
    for (wxWindow *control : std::initializer_list<wxWindow *>{m_newFieldLabel, m_newFieldKey,
                                                               m_newField, m_missingFields})
        m_newFieldRow->Add(control, PlaceInRow());
    m_newFieldRow->AddStretchSpacer();
    m_newFieldRow->Add(m_done, wxSizerFlags().CentreVertical());
    ShowEditControls();
    return m_newFieldRow;
}

void Cartulo::LayOutEntry()
{
    m_entryPane->FitInside(); // the scroll bar follows the rows
    m_entryPane->Layout();
    PlaceNote();
}

// The width that the row for a new field has for its key and a note.
int Cartulo::NewFieldRoom() const
{
    int room = m_entryPane->GetClientSize().x - FromDIP(2 * PANE_BORDER + 4 * COLUMN_GAP);
    for (const wxWindow *control :
         std::initializer_list<const wxWindow *>{m_newFieldLabel, m_newField, m_done})
        room -= control->GetBestSize().x;
    return room;
}

// The note on missing fields stands beside the button that adds one where there is room for it in
// one line, else below, in as many lines as it takes: sizers know nothing of those.
void Cartulo::PlaceNote()
{
    if (!m_missingFields->IsShown())
        return;
    const int room = NewFieldRoom();
    const wxSize keySize(std::clamp(room, FromDIP(SMALLEST_KEY), FromDIP(KEY_WIDTH)), -1);
    const bool beside = m_missingFields->GetBestSize().x <= room - keySize.x;
    wxSizer *place = beside ? m_newFieldRow : m_noteLine;
    wxSize size = wxDefaultSize;
    if (!beside)
        size = wxSize(1, Native_HeightForWidth(m_missingFields, m_newFieldRow->GetSize().x));
    if (m_missingFields->GetContainingSizer() == place && m_missingFields->GetMinSize() == size &&
        m_newFieldKey->GetMinSize() == keySize)
        return;
    m_newFieldKey->SetMinSize(keySize);
    m_missingFields->GetContainingSizer()->Detach(m_missingFields);
    m_missingFields->SetMinSize(size);
    if (beside)
        place->Insert(NOTE_INDEX, m_missingFields, PlaceInRow());
    else
        place->Add(m_missingFields, wxSizerFlags().Expand());
    m_entryPane->FitInside();
    m_entryPane->Layout();
}

// Over a choice it would choose: whoever turns the wheel wants to scroll the pane.
void Cartulo::OnWheel(wxMouseEvent &event)
{
    if (event.GetWheelAxis() != wxMOUSE_WHEEL_VERTICAL)
        return;
    m_wheelRest += event.GetWheelRotation() * event.GetLinesPerAction(); // small on touchpads
    const int lines = m_wheelRest / event.GetWheelDelta();
    m_wheelRest -= lines * event.GetWheelDelta();
    m_entryPane->ScrollLines(-lines);
}

void Cartulo::OnEntrySize(wxSizeEvent &event)
{
    event.Skip();
    for (int i = 0; i < std::min(m_rowCount, m_grid.count); ++i)
        FitRow(i);
    CallAfter(&Cartulo::PlaceNote); // when the sizers have done their work
}

// --- Showing ---

void Cartulo::ShowEntry(BibEntry *entry, int file)
{
    if (!entry)
        return;
    m_entry = entry;
    m_file = file;
    m_typeName = BibTypeTable[entry->type];
    wxString path = PathText(m_set.files[file]->path);
    m_entryPane->Freeze();
    m_fileName->SetLabelText(path);
    m_fileName->SetToolTip(path);
    TypeChoice_Fill(m_type, LONGEST_TYPE);
    TypeChoice_Select(m_type, entry->type);
    m_type->Enable(m_editMode);
    ShowEncoding(this, EncodingText());
    Grid_Fill(&m_grid, entry, Encoding());
    FillRows();
    Update_Tools();
    if (m_editMode)
        CheckMandatoryFields(m_grid.count - 1);
    else
        Update_Field_Colors(m_typeName.c_str());
    ShowEditControls();
    LayOutEntry();
    m_entryPane->Thaw();
}

void Cartulo::ClearEntry()
{
    m_entry = nullptr;
    m_file = -1;
    m_typeName.clear();
    m_fileName->SetLabelText("");
    m_fileName->UnsetToolTip();
    m_type->SetSelection(wxNOT_FOUND);
    Grid_Clear(&m_grid);
    WriteRows();
    Update_Tools();
    ShowEditControls();
    LayOutEntry();
}

void Cartulo::ShowEditControls()
{
    for (wxWindow *control : std::initializer_list<wxWindow *>{m_missingFields, m_newFieldLabel,
                                                               m_newFieldKey, m_newField, m_done})
        control->Show(m_editMode);
}

void Cartulo::Update_Field_Colors(const char *type)
{
    TNSMessage("INFO: Update_Field_Colors for ", type, TNS_LIFECYCLE);
    for (int i = 0; i < m_grid.count; ++i) {
        FieldClass fieldClass = Schema_FieldClass(m_ini.c_str(), type, m_grid.rows[i].key.c_str());
        Theme_SetTextColour(m_rows[i].label, Colour_OfField(fieldClass));
    }
}

void Cartulo::CheckMandatoryFields(int last)
{
    std::vector<SchemaRow> rows;
    for (int i = 0; i <= last && i < m_grid.count; ++i)
        rows.push_back({m_grid.rows[i].key, m_grid.rows[i].inherited});
    for (const HiddenField &field : Grid_HiddenFields(&m_grid))
        rows.push_back({field.key, field.inherited});
    Update_Field_Colors(m_typeName.c_str());
    SchemaAdvice advice = Schema_Advise(m_ini.c_str(), m_typeName.c_str(), rows);
    m_newFieldKey->Clear();
    for (const std::string &key : advice.proposals)
        m_newFieldKey->Append(OwnText(key.c_str()));
    if (advice.selected >= 0)
        m_newFieldKey->SetSelection(advice.selected);
    wxString note = OwnText(advice.note.c_str());
    m_missingFields->SetLabelText(note);
    m_missingFields->SetToolTip(note);
}

void Cartulo::UpdateHelpText()
{
    std::string text = Command_HelpText(m_ini.c_str(), m_typeName.c_str(), m_editMode);
    m_help->ChangeValue(OwnText(text.c_str()));
}

// --- The mode ---

void Cartulo::FocusForMode()
{
    if (m_editMode)
        m_type->SetFocus();
    else if (m_list->IsShown())
        m_list->SetFocus();
}

void Cartulo::FocusRow(int row)
{
    Text_Focus(m_rows[row].value);
}

// The list is enabled before it gets the focus, and disabled after it lost it.
void Cartulo::SetEditMode(bool on)
{
    m_editMode = on;
    if (!on)
        m_list->Enable();
    m_type->Enable(on);
    FocusForMode();
    m_list->Enable(!on);
}

void Cartulo::OnEditEntry(wxCommandEvent &)
{
    int row = m_list->GetSelection();
    const IndexItem *item = m_list->Item(row);
    if (!item) {
        TNSMessage("WARNING: Cartulo::OnEditEntry ", "no selection in index", TNS_WARNING);
        return;
    }
    TNSMessage("INFO: Cartulo::OnEditEntry to ", m_list->GetItemText(row).utf8_str(), TNS_ACTION);
    if (m_set.files[item->file]->readOnly) {
        ShowStatusError(this, "ERROR: You can't edit records in readonly BIB-file");
        TNSMessage("WARNING: Cartulo::OnEditEntry ",
                   "locked editing file opened in of readonly mode.", TNS_WARNING);
        return;
    }
    SetEditMode(!m_editMode);
    ShowEntry(item->entry, item->file);
    UpdateHelpText();
}

void Cartulo::OnChangeType(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnChangeType to ", "...", TNS_ACTION);
    int type = TypeChoice_Type(m_type);
    if (type < 0)
        return;
    TNSMessage("INFO: Cartulo::OnChangeType to ", BibTypeTable[type], TNS_ACTION);
    if (m_typeName != BibTypeTable[type]) {
        m_typeName = BibTypeTable[type];
        CheckMandatoryFields(m_grid.count - 1);
        LayOutEntry();
    }
    UpdateHelpText();
}

// --- Committing ---

void Cartulo::OnCommitEntry(wxCommandEvent &)
{
    CommitEntry();
}

void Cartulo::CommitEntry()
{
    TNSMessage("INFO: Cartulo::OnCommitEntry", "", TNS_ACTION);
    bool nothingToShow = !m_editMode && (!m_entry || !m_entryPane->IsShown());
    if (!nothingToShow && Commit())
        ToggleEditing();
}

bool Cartulo::FinishEditing()
{
    if (!m_editMode)
        return true;
    if (m_busy)
        return false; // the user is being asked already
    CommitEntry();
    return !m_editMode;
}

// Takes the edits over or drops them, as the user says. False when the editing goes on.
bool Cartulo::Commit()
{
    if (!m_entry || !m_editMode || m_set.files[m_file]->readOnly)
        return true;
    ReadRows();
    int chosen = TypeChoice_Type(m_type), type = chosen >= 0 ? chosen : m_entry->type;
    GridChanges changes = Grid_Compare(&m_grid, type);
    if (!Grid_HasChanges(&changes))
        return true;
    int answer = Ask(Grid_Question(&changes), wxYES_NO | wxCANCEL);
    if (answer != wxYES)
        return answer == wxNO;
    if (!Grid_ChangesOnlyType(&changes) && !(AcceptLosses() && CheckRows()))
        return false;
    if (changes.type && !TakeType(&type))
        return false;
    if (!Grid_ChangesOnlyType(&changes))
        return ReplaceEntry(type);
    return Change_SetType(&m_set, m_set.files[m_file], m_entry, type) != 0;
}

// The type as the file has it. False when it can't have one of that name, and the editing goes on.
bool Cartulo::TakeType(int *type)
{
    std::string reason;
    *type = Entry_TypeIn(m_set.files[m_file], *type, &reason);
    if (*type < 0)
        ShowWarning(CommitTitle,
                    StoreText(reason.c_str(), Encoding()) + "\n\nChoose another type.");
    return *type >= 0;
}

// A question about the commit. wxYES, wxNO or wxCANCEL.
int Cartulo::Ask(const wxString &text, int buttons)
{
    m_busy = true; // another program may be activated meanwhile
    int answer =
        wxMessageBox(text, CommitTitle, buttons | wxICON_QUESTION, wxGetTopLevelParent(this));
    m_busy = false;
    return answer;
}

bool Cartulo::AcceptLosses()
{
    StringSources sources = Strings_Sources(&m_set, m_ini);
    std::wstring losses = Grid_Losses(&m_grid, &sources);
    return losses.empty() || Ask(wxString(losses), wxYES_NO | wxNO_DEFAULT) == wxYES;
}

// One box for each value that cannot be written; false when there is one. The first gets the focus.
bool Cartulo::CheckRows()
{
    int firstBad = -1;
    for (int i = 0; i < m_grid.count; ++i) {
        const char *reason = Grid_CheckRow(&m_grid, i);
        if (!reason)
            continue;
        if (firstBad < 0)
            firstBad = i;
        ShowWarning(CommitTitle, "Wrong syntax of value in the field: `" + KeyText(i) + "':\n\n" +
                                     reason +
                                     "\n\nIn this reason modification of entire entry can't be "
                                     "accepted.\nFix an error and try again.");
    }
    if (firstBad >= 0 && m_rows[firstBad].value->IsEnabled())
        FocusRow(firstBad);
    return firstBad < 0;
}

// Puts the entry as it was edited in the place of the old one. False when it cannot be built, and
// the editing goes on.
bool Cartulo::ReplaceEntry(int type)
{
    if (!Grid_HasRoom(&m_grid)) {
        ShowWarning(CommitTitle, "There are too many different names of fields in all open files."
                                 "\n\nClose some of the files, or use known names.");
        return false;
    }
    BibEntry *entry = Grid_Build(&m_grid, type);
    if (!entry) {
        AppLog("ERROR: Not enought memory for allocating new entry");
        ShowWarning(CommitTitle, "There is not enough memory for the changed entry.");
        return false;
    }
    m_list->Drop_Index(); // its rows refer to the old entry
    if (Change_ReplaceEntry(&m_set, m_set.files[m_file], m_entry, entry)) {
        m_entry = entry;
        return true;
    }
    Bib_FreeEntry(entry); // it was no file's
    ShowWarning(CommitTitle, "The changes can't be stored: the entry is not in its file any more.");
    return true;
}

// Back to the list, with the entry as it is in the store now. From the list, it is the way in.
void Cartulo::ToggleEditing()
{
    SetEditMode(!m_editMode);
    Grid_Clear(&m_grid); // the old entry may be gone
    m_list->Update_Index(m_entry, m_search.c_str());
    RefreshPane();
    ShowEntry(m_entry, m_file);
    m_entryPane->Scroll(0, 0);
    if (!m_editMode)
        FollowList();
    FocusForMode();
    UpdateHelpText();
}

// What is shown is what the list has selected: the changed entry may not hold the searched text any
// more.
void Cartulo::FollowList()
{
    const IndexItem *item = m_list->Item(m_list->GetSelection());
    if (item && item->entry == m_entry)
        return;
    ShowSelection();
    ShowStatus(this, "The entry is not in the list: it does not hold the searched text.");
}

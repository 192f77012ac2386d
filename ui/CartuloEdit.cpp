// ui/CartuloEdit.cpp - the entry pane: showing an entry, editing it, committing what was edited.
#include "ui/Cartulo.h"

#include <vector>

#include <wx/msgdlg.h>
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
#include "ui/EntryPane.h"
#include "ui/Ids.h"
#include "ui/QListBox.h"

static const char CommitTitle[] = "Commit of Bibliography Entry - Question";

// --- Showing ---

void Cartulo::ShowEntry(BibEntry *entry, int file)
{
    if (!entry)
        return;
    m_entry = entry;
    m_file = file;
    m_typeName = BibTypeTable[entry->type];
    m_entryPane->Freeze();
    m_entryPane->ShowFile(PathText(m_set.files[file]->path));
    m_entryPane->ShowType(entry->type);
    m_entryPane->EnableType(m_editMode);
    ShowEncoding(this, EncodingText());
    Grid_Fill(&m_grid, entry, Encoding());
    m_entryPane->FillRows();
    Update_Tools();
    if (m_editMode)
        CheckMandatoryFields(m_grid.count - 1);
    else
        Update_Field_Colors(m_typeName.c_str());
    m_entryPane->ShowEditControls();
    m_entryPane->LayOut();
    m_entryPane->Thaw();
}

void Cartulo::ClearEntry()
{
    m_entry = nullptr;
    m_file = -1;
    m_typeName.clear();
    m_entryPane->ShowFile("");
    m_entryPane->ShowType(-1);
    Grid_Clear(&m_grid);
    m_entryPane->WriteRows();
    Update_Tools();
    m_entryPane->ShowEditControls();
    m_entryPane->LayOut();
}

void Cartulo::Update_Field_Colors(const char *type)
{
    TNSMessage("INFO: Update_Field_Colors for ", type, TNS_LIFECYCLE);
    m_entryPane->ColourRows(m_ini.c_str(), type);
}

void Cartulo::CheckMandatoryFields(int last)
{
    std::vector<SchemaRow> rows;
    for (int i = 0; i <= last && i < m_grid.count; ++i)
        rows.push_back({m_grid.rows[i].key, m_grid.rows[i].inherited});
    for (const HiddenField &field : Grid_HiddenFields(&m_grid))
        rows.push_back({field.key, field.inherited});
    Update_Field_Colors(m_typeName.c_str());
    m_entryPane->ShowAdvice(Schema_Advise(m_ini.c_str(), m_typeName.c_str(), rows));
}

void Cartulo::UpdateHelpText()
{
    std::string text = Command_HelpText(m_ini.c_str(), m_typeName.c_str(), m_editMode);
    m_entryPane->ShowHelp(OwnText(text.c_str()));
}

// --- The mode ---

void Cartulo::FocusForMode()
{
    if (m_editMode)
        m_entryPane->FocusType();
    else if (m_list->IsShown())
        m_list->SetFocus();
}

// The list is enabled before it gets the focus, and disabled after it lost it.
void Cartulo::SetEditMode(bool on)
{
    m_editMode = on;
    m_entryPane->SetEditMode(on);
    if (!on)
        m_list->Enable();
    m_entryPane->EnableType(on);
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
                   "locked editing file opened in of readonly mode.", TNS_WARNING); // stands so
        return;
    }
    SetEditMode(!m_editMode);
    ShowEntry(item->entry, item->file);
    UpdateHelpText();
}

void Cartulo::OnChangeType(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnChangeType to ", "...", TNS_ACTION);
    int type = m_entryPane->ChosenType();
    if (type < 0)
        return;
    TNSMessage("INFO: Cartulo::OnChangeType to ", BibTypeTable[type], TNS_ACTION);
    if (m_typeName != BibTypeTable[type]) {
        m_typeName = BibTypeTable[type];
        CheckMandatoryFields(m_grid.count - 1);
        m_entryPane->LayOut();
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
    m_entryPane->ReadRows();
    int chosen = m_entryPane->ChosenType(), type = chosen >= 0 ? chosen : m_entry->type;
    GridChanges changes = Grid_Compare(&m_grid, type);
    if (!Grid_HasChanges(&changes))
        return true;
    int answer = Ask(CommitTitle, Grid_Question(&changes), wxYES_NO | wxCANCEL);
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
        Box_Warn(this, CommitTitle,
                 StoreText(reason.c_str(), Encoding()) + "\n\nChoose another type.");
    return *type >= 0;
}

// wxYES, wxNO or wxCANCEL.
int Cartulo::Ask(const wxString &caption, const wxString &text, int buttons)
{
    m_busy = true; // another program may be activated meanwhile: nothing is saved before the answer
    int answer = wxMessageBox(text, caption, buttons | wxICON_QUESTION, wxGetTopLevelParent(this));
    m_busy = false;
    return answer;
}

bool Cartulo::AcceptLosses()
{
    StringSources sources = Strings_Sources(&m_set, m_ini);
    std::wstring losses = Grid_Losses(&m_grid, &sources);
    return losses.empty() || Ask(CommitTitle, wxString(losses), wxYES_NO | wxNO_DEFAULT) == wxYES;
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
        Box_Warn(this, CommitTitle,
                 "Wrong syntax of value in the field: `" + m_entryPane->KeyText(i) + "':\n\n" +
                     reason +
                     // "In this reason" stands so.
                     "\n\nIn this reason modification of entire entry can't be "
                     "accepted.\nFix an error and try again.");
    }
    if (firstBad >= 0 && m_entryPane->Value(firstBad)->IsEnabled())
        m_entryPane->FocusRow(firstBad);
    return firstBad < 0;
}

// Puts the entry as it was edited in the place of the old one. False when it cannot be built, and
// the editing goes on.
bool Cartulo::ReplaceEntry(int type)
{
    if (!Grid_HasRoom(&m_grid)) {
        Box_Warn(this, CommitTitle,
                 "There are too many different names of fields in all open files."
                 "\n\nClose some of the files, or use known names.");
        return false;
    }
    BibEntry *entry = Grid_Build(&m_grid, type);
    if (!entry) {
        AppLog("ERROR: Not enought memory for allocating new entry"); // misspelt, stands so
        Box_Warn(this, CommitTitle, "There is not enough memory for the changed entry.");
        return false;
    }
    m_list->Drop_Index(); // its rows refer to the old entry
    if (Change_ReplaceEntry(&m_set, m_set.files[m_file], m_entry, entry)) {
        m_entry = entry;
        return true;
    }
    Bib_FreeEntry(entry); // it was no file's
    Box_Warn(this, CommitTitle,
             "The changes can't be stored: the entry is not in its file any more.");
    return true;
}

// Back to the list, with the entry as it is in the store now. From the list, it is the way in.
void Cartulo::ToggleEditing()
{
    SetEditMode(!m_editMode);
    Grid_Clear(&m_grid); // the old entry may be gone
    m_list->Update_Index(m_entry, m_search.c_str());
    Arrange();
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

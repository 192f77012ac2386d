// ui/CartuloFields.cpp - the commands on the fields of the entry that is edited.
#include "ui/Cartulo.h"

#include <wx/combobox.h>
#include <wx/msgdlg.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "base/Log.h"
#include "session/FieldCheck.h"
#include "session/Names.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/EntryPane.h"
#include "ui/FieldDialogs.h"
#include "ui/Ids.h"
#include "ui/PanelRules.h"
#include "ui/QListBox.h"

static const char AddTitle[] = "Adding New Field";
static_assert(ID_REMOVE_ROW_END - ID_REMOVE_ROW == GRID_ROWS);

static void LogRow(const char *prefix, int row, const wxString &key)
{
    wxString text = wxString::Format("k=%d, name=", row) + key;
    TNSMessage(prefix, text.utf8_str(), TNS_ACTION);
}

// --- Adding ---

void Cartulo::OnNewField(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnNewField", "", TNS_ACTION);
    if (!m_editMode || !m_entry)
        return;
    TypedName key =
        Name_Read(m_entryPane->NewKey()->GetValue().ToStdWstring().c_str(), m_grid.encoding);
    switch (Name_Check(key)) {
    case NAME_EMPTY:
        Box_Warn(this, AddTitle,
                 "Field key is undefined.\nPlease enter key name or choose some "
                 "standard value in list of combo box.");
        break;
    case NAME_BAD_CHARS: // only the window for another name removes them
        Box_WarnOrCancel(this, AddTitle, FieldKey_BadCharsText);
        break;
    case NAME_MISFIT:
        Box_Warn(this, AddTitle, Name_MisfitText(key));
        break;
    case NAME_UNWRITABLE:
        Box_Warn(this, AddTitle, FieldCheck_NameText);
        break;
    case NAME_OK:
    case NAME_TAKEN: // told when it is added
        AddField(key.text);
        return;
    }
    m_entryPane->NewKey()->SetFocus();
}

void Cartulo::AddField(const std::string &key)
{
    AppLog("Adding field: ", key.c_str());
    int row = 0;
    m_entryPane->ReadRows();
    switch (Grid_Add(&m_grid, key.c_str(), &row)) {
    case GRID_FULL:
        Box_Warn(this, AddTitle, "Sorry, you can't add more fields because of limitation");
        return;
    case GRID_EXISTS:
        Box_Warn(this, AddTitle, FieldKey_TakenText);
        return;
    case GRID_ADDED:
    case GRID_OVERRIDDEN:
        break;
    }
    m_entryPane->WriteRows();
    CheckMandatoryFields(m_grid.count - 1);
    m_entryPane->LayOut();
    if (m_entryPane->Value(row)->IsEnabled())
        m_entryPane->Value(row)->SetFocus();
}

// --- Changing ---

// The row of a stored field, which a command is for: that with the cursor. -1, with a word on it,
// when there is none.
int Cartulo::RowForCommand(const char *logPrefix)
{
    int row = m_editMode ? m_entryPane->FocusedRow() : -1;
    if (row >= 0)
        LogRow(logPrefix, row, m_entryPane->KeyText(row));
    else if (m_editMode)
        ShowStatus(this,
                   "Put the cursor into a field first, one that was there before the editing.");
    return row;
}

void Cartulo::OnEditField(wxCommandEvent &)
{
    int row = RowForCommand("INFO: Editing Field: ");
    if (row < 0)
        return;
    wxString key = m_entryPane->KeyText(row);
    wxString text = m_entryPane->Value(row)->GetValue();
    for (bool taken = false; !taken;) {
        Cartulo_EditField dialog(wxGetTopLevelParent(this), key, text);
        if (dialog.ShowModal() != wxID_OK)
            break;
        text = dialog.Value();
        taken = Text_Take(m_entryPane->Value(row), text);
        if (!taken)
            Box_Warn(this, dialog.GetTitle(), Text_TooLong);
    }
    m_entryPane->FocusRow(row);
}

void Cartulo::OnRenameField(wxCommandEvent &)
{
    int row = RowForCommand("INFO: Renaming Field: ");
    if (row < 0)
        return;
    wxString key = m_entryPane->KeyText(row);
    m_entryPane->ReadRows();
    Cartulo_RenameField dialog(wxGetTopLevelParent(this), &m_grid, key,
                               m_entryPane->NewKey()->GetStrings(),
                               m_entryPane->NewKey()->GetValue());
    if (dialog.ShowModal() == wxID_OK && !dialog.NewName().empty()) {
        Grid_Rename(&m_grid, row, dialog.NewName().c_str());
        m_entryPane->WriteRows();
        CheckMandatoryFields(m_entry->fieldCount - 1);
        m_entryPane->LayOut();
    }
    if (m_entryPane->Value(row)->IsEnabled())
        m_entryPane->FocusRow(row);
}

// --- Removing ---

void Cartulo::OnRemoveField(wxCommandEvent &event)
{
    int id = event.GetId();
    wxString text =
        wxString::Format("id=%d(%d..%d)", id, int(ID_REMOVE_ROW), int(ID_REMOVE_ROW_END));
    TNSMessage("INFO: Cartulo::OnRemoveField ", text.utf8_str(), TNS_ACTION);
    if (!m_editMode || !m_entry)
        return;
    int stored = Grid_StoredRows(&m_grid),
        row = Panel_RowToRemove(id, m_entryPane->FocusedRow(), stored);
    if (row < 0) {
        TNSMessage("INFO: Cartulo::OnRemoveField ", "unknown target", TNS_ACTION);
    } else if (row >= stored) {
        TNSMessage("INFO: Cartulo::OnRemoveField ", "unknown target2", TNS_ACTION);
        ShowStatus(this, row < m_grid.count
                             ? "A field that was just added can be removed after \"Done\"."
                             : "Put the cursor into a field first.");
    } else {
        RemoveRow(row);
    }
}

void Cartulo::RemoveRow(int row)
{
    if (row >= m_grid.count || m_grid.rows[row].inherited)
        return;
    std::string key = m_grid.rows[row].key;
    LogRow("INFO: Cartulo::OnRemoveField ", row, m_entryPane->KeyText(row));
    int focused = m_entryPane->RowWithFocus(m_grid.count);
    m_entryPane->ReadRows();
    GridRemove result = Grid_Remove(&m_grid, row);
    if (result == GRID_NO_ROW)
        return;
    if (result == GRID_REMOVED)
        AppLog("WARNING, removing the field: ", key.c_str());
    else
        m_entryPane->FillRow(row);
    m_entryPane->WriteRows();
    if (result == GRID_INHERITED) {
        m_entryPane->NewKey()->Append(StoreText(key.c_str(), m_grid.encoding));
        return;
    }
    CheckMandatoryFields(m_grid.count - 1);
    m_entryPane->NewKey()->SetValue(
        StoreText(key.c_str(), m_grid.encoding)); // adding brings it back
    m_entryPane->LayOut();
    m_entryPane->KeepFocus(focused > row ? focused - 1 : focused);
}

// ui/CartuloFields.cpp - the commands on the fields of the entry that is edited.
#include "ui/Cartulo.h"

#include <algorithm>

#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/msgdlg.h>
#include <wx/textctrl.h>

#include "app/Companion.h"
#include "app/Ids.h"
#include "app/Log.h"
#include "ui/DisplayText.h"
#include "ui/FieldDialogs.h"
#include "ui/FieldKeys.h"

static const char AddTitle[] = "Adding New Field";

// The row whose value has the focus; -1 for none, and for rows that the stored entry does not have.
int Cartulo::FocusedRow() const
{
    int stored = m_entry ? std::min<int>(m_entry->fieldCount, GRID_ROWS) : 0;
    for (int i = 0; i < std::min(stored, m_grid.count); ++i)
        if (m_rows[i].value->HasFocus())
            return i;
    return -1;
}

static void LogRow(const char *prefix, int row, const std::string &key)
{
    wxString text = wxString::Format("k=%d, name=", row) + StoreText(key.c_str());
    TNSMessage(prefix, text.utf8_str(), TNS_ACTION);
}

// --- Adding ---

void Cartulo::OnNewField(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnNewField", "", TNS_ACTION);
    if (!m_editMode || !m_entry)
        return;
    std::string key = FieldKey_Typed(m_newFieldKey->GetValue().ToStdWstring().c_str());
    switch (FieldKey_CheckNew(key.c_str())) {
    case FIELD_KEY_EMPTY:
        ShowWarning(AddTitle, "Field key is undefined.\nPlease enter key name or choose some "
                              "standard value in list of combo box.");
        return;
    case FIELD_KEY_BAD_CHARS: // nothing is removed here
        wxMessageBox(FieldKey_BadCharsText, AddTitle, wxOK | wxCANCEL | wxICON_WARNING,
                     wxGetTopLevelParent(this));
        return;
    case FIELD_KEY_UNWRITABLE:
        ShowWarning(AddTitle, FieldKey_UnwritableText);
        return;
    default:
        AddField(key);
    }
}

void Cartulo::AddField(const std::string &key)
{
    AppLog("Adding field: ", key.c_str());
    int row = 0;
    ReadRows();
    switch (Grid_Add(&m_grid, key.c_str(), &row)) {
    case GRID_FULL:
        ShowWarning(AddTitle, "Sorry, you can't add more fields because of limitation");
        return;
    case GRID_EXISTS:
        ShowWarning(AddTitle, FieldKey_TakenText);
        return;
    case GRID_ADDED:
    case GRID_OVERRIDDEN:
        break;
    }
    WriteRows();
    CheckMandatoryFields(m_grid.count - 1);
    LayOutEntry();
    if (m_rows[row].value->IsEnabled())
        m_rows[row].value->SetFocus();
}

// --- Changing ---

void Cartulo::OnEditField(wxCommandEvent &)
{
    int row = m_editMode ? FocusedRow() : -1;
    if (row < 0)
        return;
    const std::string &key = m_grid.rows[row].key;
    LogRow("INFO: Editing Field: ", row, key);
    Cartulo_EditField dialog(wxGetTopLevelParent(this), StoreText(key.c_str()),
                             m_rows[row].value->GetValue());
    if (dialog.ShowModal() == wxID_OK && dialog.Value() != m_rows[row].value->GetValue())
        m_rows[row].value->ChangeValue(dialog.Value());
    m_rows[row].value->SetFocus();
}

void Cartulo::OnRenameField(wxCommandEvent &)
{
    int row = m_editMode ? FocusedRow() : -1;
    if (row < 0)
        return;
    const std::string &key = m_grid.rows[row].key;
    LogRow("INFO: Renaming Field: ", row, key);
    ReadRows();
    Cartulo_RenameField dialog(wxGetTopLevelParent(this), &m_grid, StoreText(key.c_str()),
                               m_newFieldKey->GetStrings(), m_newFieldKey->GetValue());
    if (dialog.ShowModal() == wxID_OK && !dialog.NewName().empty()) {
        Grid_Rename(&m_grid, row, dialog.NewName().c_str());
        WriteRows();
        CheckMandatoryFields(m_entry->fieldCount - 1);
        LayOutEntry();
    }
    if (m_rows[row].value->IsEnabled())
        m_rows[row].value->SetFocus();
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
    int row = FieldKey_RowToRemove(id, FocusedRow(), m_entry->fieldCount);
    if (row < 0)
        TNSMessage("INFO: Cartulo::OnRemoveField ", "unknown target", TNS_ACTION);
    else if (row >= std::min<int>(m_entry->fieldCount, GRID_ROWS))
        TNSMessage("INFO: Cartulo::OnRemoveField ", "unknown target2", TNS_ACTION);
    else
        RemoveRow(row);
}

void Cartulo::RemoveRow(int row)
{
    if (row >= m_grid.count || m_grid.rows[row].inherited)
        return;
    std::string key = m_grid.rows[row].key;
    LogRow("INFO: Cartulo::OnRemoveField ", row, key);
    bool hadFocus = m_rows[row].value->HasFocus();
    ReadRows();
    GridRemove result = Grid_Remove(&m_grid, row);
    if (result == GRID_NO_ROW)
        return;
    if (result == GRID_REMOVED)
        AppLog("WARNING, removing the field: ", key.c_str());
    WriteRows();
    if (result == GRID_INHERITED) {
        m_newFieldKey->Append(StoreText(key.c_str()));
        return;
    }
    CheckMandatoryFields(m_grid.count - 1);
    m_newFieldKey->SetValue(StoreText(key.c_str())); // adding brings it back
    LayOutEntry();
    if (hadFocus && !m_rows[row].value->IsEnabled())
        FocusForMode();
}

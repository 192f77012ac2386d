// ui/CartuloEntries.cpp - the commands that add, rename and remove entries.
#include "ui/Cartulo.h"

#include <wx/msgdlg.h>

#include "base/Companion.h"
#include "base/Log.h"
#include "session/Changes.h"
#include "session/EntryRules.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/EntryDialogs.h"
#include "ui/QListBox.h"

void Cartulo::OnNewEntry(wxCommandEvent &)
{
    if (!FinishEditing())
        return;
    if (Entry_WritableFiles(&m_set).empty()) {
        ShowStatus(this, "ERROR: You can't add entries to readonly BIB-files.", true);
        return;
    }
    Cartulo_NewEntry dialog(wxGetTopLevelParent(this), {&m_set, m_file, m_entry}, m_ini);
    m_dialogResult = dialog.ShowModal();
    if (!dialog.Changed())
        return;
    ShowChanged(dialog.Changed());
    if (m_entry != dialog.Changed())
        ShowStatus(this, "The new entry is not in the list: it does not hold the searched text.");
}

void Cartulo::OnRenameEntry(wxCommandEvent &)
{
    if (!FinishEditing())
        return;
    if (m_file >= 0 && m_set.files[m_file]->readOnly) {
        ShowStatusError(this, "ERROR: You can't rename entry of ReadOnly file.");
        return;
    }
    Cartulo_RenameEntry dialog(wxGetTopLevelParent(this), {&m_set, m_file, m_entry});
    m_dialogResult = dialog.ShowModal();
    if (!dialog.Changed())
        return;
    ShowChanged(dialog.Changed());
}

// Brings the list up to date. Where it has not got this entry, the first row is selected.
void Cartulo::ShowChanged(BibEntry *entry)
{
    m_list->Update_Index(entry, m_search.c_str());
    Arrange();
    ShowSelection();
    FocusList();
}

void Cartulo::OnRemoveEntry(wxCommandEvent &)
{
    TNSMessage("INFO: Cartulo::OnRemoveEntry ", "", TNS_ACTION);
    if (!FinishEditing())
        return;
    int row = m_list->GetSelection();
    if (row == wxNOT_FOUND) {
        TNSMessage("WARNING: Cartulo::OnRemoveEntry ", "no selection in index", TNS_WARNING);
        return;
    }
    const IndexItem *item = m_list->Item(row);
    if (!item) {
        AppLog("DELETEENTRY: ", "There is no current entry");
        return;
    }
    m_entry = item->entry;
    m_file = item->file;
    if (m_set.files[m_file]->readOnly) {
        ShowStatusError(this, "ERROR: You can't remove entry of ReadOnly file.");
        return;
    }
    wxString text = m_list->GetItemText(row);
    AppLog(text.utf8_str());
    wxMessageDialog box(this, text, "Removing Entry", wxYES_NO);
    box.SetExtendedMessage("Do you want to remove this entry from its file ?");
    if (box.ShowModal() == wxID_YES)
        RemoveEntry(row);
}

// Of the current entry, which has this row.
void Cartulo::RemoveEntry(int row)
{
    BibFile *file = m_set.files[m_file];
    AppLog("Delete Entry: ", m_entry->key);
    std::string referrers = Entry_Referrers(file, m_entry);
    if (!referrers.empty()) {
        Box_Warn(this, "Removing Bibliography Entry",
                 "The entry `" + StoreText(m_entry->key, Encoding()) +
                     "' can't be removed, because following entries:\n\n" +
                     StoreText(referrers.c_str(), Encoding()) +
                     ".\n\nrefer it in `crossref' field.");
        return;
    }
    BibEntry *next = EntryIndex_Next(m_list->Item(0), int(m_list->GetItemCount()), row);
    BibEntry *entry = m_entry;
    m_entry = nullptr;
    Grid_Clear(&m_grid); // this and the list refer to the entry
    m_list->Drop_Index();
    bool isRemoved = Change_RemoveEntry(&m_set, file, entry) != 0;
    ShowChanged(isRemoved ? next : entry);
}

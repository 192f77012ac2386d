// ui/QListBox.h - the entry list: one row per entry of all open files.
//
// Rows refer to entries that belong to their files. Whoever frees entries or files calls
// Drop_Index before, or Update_Index right after, so that no row outlives its entry.
#pragma once

#include <wx/vlbox.h>

#include "ui/EntryIndex.h"
#include "ui/Status.h" // ShowStatus, ShowStatusError

class Cartulo;
struct BibFileSet;

class QListBox : public wxVListBox
{
public:
    QListBox();
    QListBox(Cartulo *owner, wxWindow *parent, wxWindowID id,
             const wxPoint &position = wxDefaultPosition, const wxSize &size = wxDefaultSize,
             long style = 0);
    ~QListBox() override;

    // Whose entries the list shows: those of its owner, who says so right after making the list; it
    // has none before. They outlive the list.
    void SetFiles(const BibFileSet *files) { m_files = files; }

    // Rebuilds the rows and selects that of `select`, else the first; raises no event. Call after
    // every change of entries or of the filter (store text). Returns 1, or 0 when no file is open
    // (the old rows stay, and are no longer read).
    int Update_Index(BibEntry *select, const char *filter);

    // Takes all rows away until the next Update_Index.
    void Drop_Index();

    // The row's entry and file; null when there is no such row. Valid until the next rebuild.
    const IndexItem *Item(int row) const;

    virtual wxString GetItemText(size_t n) const; // "griske84 (refs)"

private:
    void OnDrawItem(wxDC &dc, const wxRect &rect, size_t n) const override;
    wxCoord OnMeasureItem(size_t n) const override;
    void OnDrawBackground(wxDC &dc, const wxRect &rect, size_t n) const override;
    void OnKeyDown(wxKeyEvent &event);
    void OnChar(wxKeyEvent &event);
    void MeasureLineHeight();
    BibFile *const *Files() const;
    int FileCount() const;
    int RowCount() const; // rows that may be read

    int m_lineHeight = 12;
    int m_itemCount = 0;
    Cartulo *m_owner = nullptr;          // the panel; outlives the list
    const BibFileSet *m_files = nullptr; // of the panel
    IndexItem *m_index = nullptr;        // ours, malloc'd
    TypeAhead m_typeAhead;

    wxDECLARE_EVENT_TABLE();
};

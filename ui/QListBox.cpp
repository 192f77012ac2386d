// ui/QListBox.cpp - the entry list: one row per entry of all open files.
#include "ui/QListBox.h"

#include <cstdlib>

#include <wx/dc.h>
#include <wx/settings.h>
#include <wx/utils.h>

#include "base/Companion.h"
#include "base/Log.h"
#include "base/Sys.h"
#include "encoding/Encoding.h"
#include "session/FileSet.h"
#include "ui/DisplayText.h"

wxBEGIN_EVENT_TABLE(QListBox, wxVListBox)
    EVT_KEY_DOWN(QListBox::OnKeyDown)
    EVT_CHAR(QListBox::OnChar)
wxEND_EVENT_TABLE()

QListBox::QListBox()
{
    SetMargins(8, 0);
}

QListBox::QListBox(Cartulo *owner, wxWindow *parent, wxWindowID id, const wxPoint &position,
                   const wxSize &size, long style)
    : m_owner(owner)
{
    SetMargins(8, 0);
    Create(parent, id, position, size, style);
    MeasureLineHeight();
}

QListBox::~QListBox()
{
    free(m_index);
}

void QListBox::MeasureLineHeight()
{
    // All letters: the highest and the deepest of the font are among them.
    const char *letters = "qwertyuiopasdfghjklzxcvbnmQWERTYUIOPASDFGHJKLZXCVBNM";
    int width, height = 0, descent = 0, leading;
    GetTextExtent(letters, &width, &height, &descent, &leading);
    m_lineHeight = height + descent;
    if (m_lineHeight > 0)
        return;
    m_lineHeight = 32;
    TNSMessage("WARNING: QListBox: ", "adjust base unit to some defaults", TNS_WARNING);
}

BibFile *const *QListBox::Files() const
{
    return m_files ? m_files->files : nullptr;
}

int QListBox::FileCount() const
{
    return m_files ? m_files->count : 0;
}

int QListBox::RowCount() const
{
    bool filesAreGone = m_owner && FileCount() < 1;
    return m_index && !filesAreGone ? m_itemCount : 0;
}

const IndexItem *QListBox::Item(int row) const
{
    return row >= 0 && row < RowCount() ? &m_index[row] : nullptr;
}

wxString QListBox::GetItemText(size_t n) const
{
    const IndexItem *item = n < size_t(RowCount()) ? &m_index[n] : nullptr;
    if (!item)
        return "";
    if (!m_owner || item->file >= FileCount())
        return OwnText(EntryIndex_RowText(item, nullptr, 0).c_str());
    // The two halves come in different encodings: a key from a file, a name from the system.
    const BibFile *file = Files()[item->file];
    return StoreText(item->entry->key, Bib_Encoding(file)) + " (" + PathText(file->baseName) + ")";
}

void QListBox::OnDrawItem(wxDC &dc, const wxRect &rect, size_t n) const
{
    if (n >= size_t(RowCount()))
        return;
    dc.SetTextForeground(wxSystemSettings::GetColour(
        IsSelected(n) ? wxSYS_COLOUR_LISTBOXHIGHLIGHTTEXT : wxSYS_COLOUR_LISTBOXTEXT));
    // All rows run from left to right, also those of a key in Hebrew or Arabic letters.
    dc.DrawText(L"\x200E" + GetItemText(n), rect.GetTopLeft());
}

wxCoord QListBox::OnMeasureItem(size_t) const
{
    return m_lineHeight;
}

void QListBox::OnDrawBackground(wxDC &dc, const wxRect &rect, size_t n) const
{
    wxVListBox::OnDrawBackground(dc, rect, n);
}

int QListBox::Update_Index(BibEntry *select, const char *filter)
{
    SetSelection(wxNOT_FOUND);
    if (!m_owner)
        return 0;
    int32_t start = Sys_Milliseconds();
    if (FileCount() < 1)
        return 0;
    free(m_index);
    m_itemCount = EntryIndex_Build(&m_index, Files(), FileCount(), filter);
    SetItemCount(m_itemCount);
    SetSelection(EntryIndex_RowToSelect(m_index, m_itemCount, select));
    Refresh();
    int32_t time = Sys_Milliseconds() - start;
    TNSMessage("QListBox::Update_Index Time: ", wxString::Format("%d ms", int(time)).utf8_str(),
               TNS_ACTION);
    return 1;
}

void QListBox::Drop_Index()
{
    SetSelection(wxNOT_FOUND);
    SetItemCount(0);
    free(m_index);
    m_index = nullptr;
    m_itemCount = 0;
    Refresh();
}

// The base class would move the focus and then hand the key to the type-ahead search as well.
void QListBox::OnKeyDown(wxKeyEvent &event)
{
    if (!HandleAsNavigationKey(event))
        event.Skip();
}

static void LogKey(uint32_t key, int32_t now, int32_t last)
{
    wxString text =
        wxString::Format("Key=%d(%c), Time=%d-%d=%d ms", int(key), wxUniChar(Log_Character(key)),
                         int(now), int(last), int(uint32_t(now) - uint32_t(last)));
    TNSMessage("INFO: QListBox:OnChar ", text.utf8_str(), TNS_LIFECYCLE);
}

void QListBox::OnChar(wxKeyEvent &event)
{
    uint32_t key = uint32_t(event.GetUnicodeKey());
    int32_t now = int32_t(event.GetTimestamp());
    LogKey(key, now, m_typeAhead.lastKeyTime);
    switch (TypeAhead_Key(&m_typeAhead, key, event.GetModifiers() != 0, now, GetSelection(),
                          m_index, RowCount(), Files(), FileCount())) {
    case TYPE_AHEAD_SKIP:
        event.Skip();
        return;
    case TYPE_AHEAD_NO_ROW:
        wxBell();
        ShowStatus(this, m_typeAhead.prefix);
        return;
    case TYPE_AHEAD_ROW:
        SetSelection(m_typeAhead.lastFound);
        ShowStatus(this, m_typeAhead.prefix);
        SendSelectedEvent();
    }
}

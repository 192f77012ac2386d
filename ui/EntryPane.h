// ui/EntryPane.h - the pane of the selected entry: its file and type, a row for each field, what
// adds another one, the note on missing fields, and the help text.
//
// The rows show a FieldGrid, which belongs to the owner; what is typed goes into it with ReadRows.
// Commands of the pane's buttons are events that come up to the parent.
#pragma once

#include <wx/scrolwin.h>
#include <wx/sizer.h>

#include <functional>
#include <string>

#include "ui/FieldGrid.h"

class xBitmapButton;
class wxButton;
class wxChoice;
class wxComboBox;
class wxStaticText;
class wxTextCtrl;
struct SchemaAdvice;

class EntryPane : public wxScrolledWindow
{
public:
    // The grid outlives the pane. `giveFocus` takes the focus from a control that goes or must not
    // have it.
    EntryPane(wxWindow *parent, FieldGrid *grid, const std::function<void()> &giveFocus);

    // Whether the entry is edited. Counts for rows that are written and controls that are shown
    // from then on.
    void SetEditMode(bool on) { m_editMode = on; }

    // --- File and type ---

    void ShowFile(const wxString &path); // "" for none
    void ShowType(int type);             // index into BibTypeTable; -1 for none
    int ChosenType() const;              // the same
    void EnableType(bool enable);
    void FocusType();

    // --- Rows ---

    // From the grid. What a control made of a value goes into the grid: it may not hold all of it.
    void FillRows();
    void FillRow(int row);
    void WriteRows(); // after a change of the grid
    void ReadRows();  // what the user typed, into the grid
    void ColourRows(const char *ini, const char *type);

    wxString KeyText(int row) const;
    wxTextCtrl *Value(int row) const { return m_rows[row].value; }
    int RowWithFocus(int count) const; // among the first `count` ones; -1 for none
    int FocusedRow() const;            // of the stored fields; -1 for none
    void FocusRow(int row);
    void KeepFocus(int row); // in that row, or else somewhere; -1 changes nothing

    // --- Below the rows ---

    wxComboBox *NewKey() const { return m_newFieldKey; } // of the field to add
    void ShowAdvice(const SchemaAdvice &advice);
    void ShowEditControls(); // or hides them
    void ShowHelp(const wxString &text);
    void LayOut(); // after any of these

private:
    enum { COLUMN_GAP = 8, PANE_BORDER = 8 };

    struct FieldRow {
        wxStaticText *label;
        wxTextCtrl *value;
        xBitmapButton *remove;
    };

    wxSizer *CreateFieldGrid();
    void CreateRow(int index);
    void CreateRows(int count);
    wxSizer *CreateNewFieldRow();
    void CreateHelp();
    void FitRow(int row);
    void WriteRow(int row);
    void HideRow(int row);
    void ShowMoreFields();
    wxSizerFlags PlaceInRow() const;
    int NewFieldRoom() const;
    void PlaceNote();
    void OnSize(wxSizeEvent &event);
    void OnWheel(wxMouseEvent &event);

    FieldGrid *m_grid;
    std::function<void()> m_giveFocus;
    bool m_editMode = false;
    int m_wheelRest = 0; // of a line that the mouse wheel has not turned yet

    wxStaticText *m_fileName = nullptr; // child windows
    wxChoice *m_type = nullptr;
    FieldRow m_rows[GRID_ROWS] = {};
    int m_rowCount = 0;                   // of those that are made
    wxStaticText *m_moreFields = nullptr; // how many fields found no row
    wxStaticText *m_newFieldLabel = nullptr;
    wxComboBox *m_newFieldKey = nullptr;
    xBitmapButton *m_newField = nullptr;
    wxStaticText *m_missingFields = nullptr;
    wxButton *m_done = nullptr;
    wxTextCtrl *m_help = nullptr;
    wxSizer *m_fields = nullptr; // sizers: of the rows
    wxSizer *m_newFieldRow = nullptr;
    wxSizer *m_noteLine = nullptr; // below it, for a long note on missing fields

    wxDECLARE_EVENT_TABLE();
};

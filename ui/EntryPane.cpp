// ui/EntryPane.cpp - the controls of the selected entry.
#include "ui/EntryPane.h"

#include <algorithm>
#include <initializer_list>
#include <vector>

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/settings.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "session/Schema.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/Icons.h"
#include "ui/Ids.h"
#include "ui/Native.h"
#include "ui/Theme.h"
#include "ui/TypeChoice.h"

enum { SMALLEST_VALUE = 60 }; // width that is left in the narrowest window
enum { LABEL_WIDTH = 96 };    // in the narrowest window
enum { HELP_HEIGHT = 40 };
enum { NOTE_INDEX = 3 };                     // of the note on missing fields, in its row
enum { LONGEST_TYPE = 300 };                 // what is shown of one
enum { KEY_WIDTH = 160, SMALLEST_KEY = 40 }; // of the box for the key of a new field

wxBEGIN_EVENT_TABLE(EntryPane, wxScrolledWindow)
    EVT_SIZE(EntryPane::OnSize)
wxEND_EVENT_TABLE()

// --- Construction ---

EntryPane::EntryPane(wxWindow *parent, FieldGrid *grid, const std::function<void()> &giveFocus)
    : wxScrolledWindow(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                       wxBORDER_STATIC | wxTAB_TRAVERSAL | wxVSCROLL),
      m_grid(grid), m_giveFocus(giveFocus)
{
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    wxSizerFlags place = wxSizerFlags().Expand().Border(wxALL, FromDIP(PANE_BORDER));
    column->Add(Theme_CreateHeading(this, "Records of currently selected bibliography entry"),
                place);
    column->Add(CreateFieldGrid(), place);
    CreateRows(1);
    m_moreFields = new wxStaticText(this, wxID_ANY, "");
    column->Add(m_moreFields, place);
    column->Add(CreateNewFieldRow(), place);
    m_noteLine = new wxBoxSizer(wxVERTICAL);
    column->Add(m_noteLine, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, FromDIP(PANE_BORDER)));
    CreateHelp();
    column->Add(m_help, wxSizerFlags(place).Proportion(1));
    SetSizer(column);
    SetScrollRate(0, FromDIP(16));
    Native_KeepScrollBars(this);
    m_type->Bind(wxEVT_MOUSEWHEEL, &EntryPane::OnWheel, this);
    m_newFieldKey->Bind(wxEVT_MOUSEWHEEL, &EntryPane::OnWheel, this);
    Hide();
}

void EntryPane::CreateHelp()
{
    m_help = new wxTextCtrl(this, wxID_ANY, "Ctrl+F1 to help", wxDefaultPosition, wxDefaultSize,
                            wxTE_MULTILINE | wxTE_READONLY | wxTE_NO_VSCROLL);
    m_help->SetMinSize(FromDIP(wxSize(-1, HELP_HEIGHT)));
}

// File, type, and the rows of the fields, as they are needed.
wxSizer *EntryPane::CreateFieldGrid()
{
    wxFlexGridSizer *grid = new wxFlexGridSizer(3, wxSize(FromDIP(COLUMN_GAP), 0));
    m_fields = grid;
    grid->AddGrowableCol(1);
    wxSizerFlags labelPlace = wxSizerFlags().CentreVertical();
    grid->Add(new wxStaticText(this, wxID_ANY, "BIB File:"), labelPlace);
    m_fileName = new wxStaticText(this, wxID_ANY, "file-name.bib", wxDefaultPosition, wxDefaultSize,
                                  wxST_ELLIPSIZE_START | wxST_NO_AUTORESIZE);
    m_fileName->SetMinSize(FromDIP(wxSize(SMALLEST_VALUE, -1)));
    grid->Add(m_fileName, wxSizerFlags().Expand().Border(wxTOP | wxBOTTOM, FromDIP(4)));
    grid->AddSpacer(0);
    grid->Add(new wxStaticText(this, wxID_ANY, "Entry Type:"), labelPlace);
    m_type = new wxChoice(this, ID_TYPE);
    m_type->SetMinSize(FromDIP(wxSize(SMALLEST_VALUE, -1)));
    m_type->Disable();
    grid->Add(m_type, wxSizerFlags().Expand());
    grid->AddSpacer(0);
    return grid;
}

void EntryPane::CreateRow(int index)
{
    FieldRow &row = m_rows[index];
    row.label = new wxStaticText(this, wxID_ANY, "Field:", wxDefaultPosition, wxDefaultSize,
                                 wxST_ELLIPSIZE_END | wxST_NO_AUTORESIZE);
    row.value = new wxTextCtrl(this, wxID_ANY, "FieldValue");
    row.value->SetForegroundColour(wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT));
    row.value->SetMinSize(FromDIP(wxSize(SMALLEST_VALUE, -1)));
    row.remove = new xBitmapButton(this, ID_REMOVE_ROW + index, "&Delete", "list-remove");
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
void EntryPane::CreateRows(int count)
{
    if (m_rowCount >= count)
        return;
    for (; m_rowCount < count; ++m_rowCount) {
        CreateRow(m_rowCount);
        m_rows[m_rowCount].remove->SetMinSize(m_rows[0].remove->GetBestSize());
    }
    // Tab has to know the rows at once, not when there is nothing else to do.
    OnInternalIdle();
}

wxSizer *EntryPane::CreateNewFieldRow()
{
    m_newFieldLabel = new wxStaticText(this, wxID_ANY, "Add Field:");
    m_newFieldKey = new wxComboBox(this, ID_NEW_FIELD_KEY);
    m_newField = new xBitmapButton(this, ID_NEW_FIELD, "&Add", "list-add");
    m_newField->SetToolTip("Add new fields to the Entry with specified key (Alt+A)");
    m_missingFields = new wxStaticText(this, wxID_ANY, "(no comment)");
    m_done = new wxButton(this, ID_COMMIT_ENTRY, "Done");
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

wxSizerFlags EntryPane::PlaceInRow() const
{
    return wxSizerFlags().CentreVertical().Border(wxRIGHT, FromDIP(COLUMN_GAP));
}

// --- File and type ---

void EntryPane::ShowFile(const wxString &path)
{
    m_fileName->SetLabelText(path);
    if (path.empty())
        m_fileName->UnsetToolTip();
    else
        m_fileName->SetToolTip(path);
}

void EntryPane::ShowType(int type)
{
    if (type >= 0)
        TypeChoice_Fill(m_type, LONGEST_TYPE);
    TypeChoice_Select(m_type, type);
}

int EntryPane::ChosenType() const
{
    return TypeChoice_Type(m_type);
}

void EntryPane::EnableType(bool enable)
{
    m_type->Enable(enable);
}

void EntryPane::FocusType()
{
    m_type->SetFocus();
}

// --- Rows ---

static bool Fits(const wxTextCtrl *value)
{
    wxString text = value->GetValue();
    return BoundedText(text) == text &&
           value->GetSizeFromTextSize(value->GetTextExtent(text)).x <= value->GetSize().x;
}

// What is too long for the row can be read in its tip.
void EntryPane::FitRow(int row)
{
    wxStaticText *label = m_rows[row].label;
    wxTextCtrl *value = m_rows[row].value;
    int widest = std::max(FromDIP(LABEL_WIDTH), GetClientSize().x / 3);
    int width = label->GetTextExtent(label->GetLabelText()).x;
    label->SetMinSize(wxSize(std::min(width, widest), -1));
    label->SetToolTip(width > widest ? label->GetLabelText() : wxString());
    if (m_grid->rows[row].locked)
        value->SetToolTip(Text_LockedTip);
    else
        value->SetToolTip(Fits(value) ? wxString() : BoundedText(value->GetValue()));
}

// A text control holds no more than 65,534 bytes, and nothing behind a NUL: what it cannot hold is
// not to be edited in it.
void EntryPane::FillRow(int index)
{
    GridRow &row = m_grid->rows[index];
    m_rows[index].value->ChangeValue(wxString(row.filled));
    m_rows[index].value->SetInsertionPoint(0); // a long one is shown from its beginning
    std::wstring held = m_rows[index].value->GetValue().ToStdWstring();
    row.locked = held != row.filled;
    row.filled = row.text = held;
}

void EntryPane::FillRows()
{
    CreateRows(m_grid->count);
    for (int i = 0; i < m_grid->count; ++i)
        FillRow(i);
    WriteRows();
}

// What the user typed, into the rows.
void EntryPane::ReadRows()
{
    for (int i = 0; i < m_grid->count; ++i)
        m_grid->rows[i].text = m_rows[i].value->GetValue().ToStdWstring();
}

void EntryPane::WriteRow(int index)
{
    const GridRow &row = m_grid->rows[index];
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
    controls.remove->Show(!row.crossref || !m_grid->parent);
    FitRow(index);
}

void EntryPane::HideRow(int index)
{
    m_rows[index].label->Hide();
    for (wxWindow *control :
         std::initializer_list<wxWindow *>{m_rows[index].value, m_rows[index].remove}) {
        control->Hide();
        control->Disable();
    }
}

// A control that is hidden or disabled must not keep the focus: keys would be lost.
void EntryPane::WriteRows()
{
    CreateRows(m_grid->count);
    for (int i = 0; i < m_rowCount; ++i) {
        bool hadFocus = m_rows[i].value->HasFocus();
        if (hadFocus && i >= m_grid->count)
            m_giveFocus();
        if (i < m_grid->count)
            WriteRow(i);
        else
            HideRow(i);
        if (hadFocus && !m_rows[i].value->IsEnabled())
            m_giveFocus();
    }
    ShowMoreFields();
}

// Nobody shall take an entry with more fields than rows for one with that many fields.
void EntryPane::ShowMoreFields()
{
    std::string text = Grid_HiddenText(m_grid);
    m_moreFields->SetLabelText(text);
    m_moreFields->Show(!text.empty());
}

void EntryPane::ColourRows(const char *ini, const char *type)
{
    std::vector<const char *> keys;
    for (int i = 0; i < m_grid->count; ++i)
        keys.push_back(m_grid->rows[i].key.c_str());
    std::vector<FieldClass> classes = Schema_FieldClasses(ini, type, keys);
    for (int i = 0; i < m_grid->count; ++i)
        Theme_SetTextColour(m_rows[i].label, Colour_OfField(classes[i]));
}

wxString EntryPane::KeyText(int row) const
{
    return StoreText(m_grid->rows[row].key.c_str(), m_grid->encoding);
}

// --- The focus ---

int EntryPane::FocusedRow() const
{
    return RowWithFocus(std::min(Grid_StoredRows(m_grid), m_grid->count));
}

int EntryPane::RowWithFocus(int count) const
{
    for (int i = 0; i < count; ++i)
        if (m_rows[i].value->HasFocus())
            return i;
    return -1;
}

void EntryPane::FocusRow(int row)
{
    Text_Focus(m_rows[row].value);
}

// In the row that moved up, or else somewhere.
void EntryPane::KeepFocus(int row)
{
    if (row < 0)
        return;
    if (row < m_grid->count && m_rows[row].value->IsEnabled())
        FocusRow(row);
    else
        m_giveFocus();
}

// --- Below the rows ---

void EntryPane::ShowAdvice(const SchemaAdvice &advice)
{
    m_newFieldKey->Clear();
    for (const std::string &key : advice.proposals)
        m_newFieldKey->Append(OwnText(key.c_str()));
    if (advice.selected >= 0)
        m_newFieldKey->SetSelection(advice.selected);
    wxString note = OwnText(advice.note.c_str());
    m_missingFields->SetLabelText(note);
    m_missingFields->SetToolTip(note);
}

void EntryPane::ShowEditControls()
{
    for (wxWindow *control : std::initializer_list<wxWindow *>{m_missingFields, m_newFieldLabel,
                                                               m_newFieldKey, m_newField, m_done})
        control->Show(m_editMode);
}

void EntryPane::ShowHelp(const wxString &text)
{
    m_help->ChangeValue(text);
}

void EntryPane::LayOut()
{
    FitInside(); // the scroll bar follows the rows
    Layout();
    PlaceNote();
}

// The width that the row for a new field has for its key and a note.
int EntryPane::NewFieldRoom() const
{
    int room = GetClientSize().x - FromDIP(2 * PANE_BORDER + 4 * COLUMN_GAP);
    for (const wxWindow *control :
         std::initializer_list<const wxWindow *>{m_newFieldLabel, m_newField, m_done})
        room -= control->GetBestSize().x;
    return room;
}

// The note on missing fields stands beside the button that adds one where there is room for it in
// one line, else below, in as many lines as it takes: sizers know nothing of those.
void EntryPane::PlaceNote()
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
    FitInside();
    Layout();
}

// Over a choice it would choose: whoever turns the wheel wants to scroll the pane.
void EntryPane::OnWheel(wxMouseEvent &event)
{
    if (event.GetWheelAxis() != wxMOUSE_WHEEL_VERTICAL)
        return;
    m_wheelRest += event.GetWheelRotation() * event.GetLinesPerAction(); // small on touchpads
    const int lines = m_wheelRest / event.GetWheelDelta();
    m_wheelRest -= lines * event.GetWheelDelta();
    ScrollLines(-lines);
}

void EntryPane::OnSize(wxSizeEvent &event)
{
    event.Skip();
    for (int i = 0; i < std::min(m_rowCount, m_grid->count); ++i)
        FitRow(i);
    CallAfter(&EntryPane::PlaceNote); // when the sizers have done their work
}

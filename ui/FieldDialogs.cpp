// ui/FieldDialogs.cpp - the windows for a field of the entry that is edited: its value, its name.
#include "ui/FieldDialogs.h"

#include <wx/combobox.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "session/FieldCheck.h"
#include "session/Names.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/FieldGrid.h"

const char FieldKey_BadCharsText[] = "Specified field key includes wrong characters.\n"
                                     "We will remove them from key and continue.";
const char FieldKey_TakenText[] = "Field with specified key is already exists."; // stands so

// --- The value ---

wxBEGIN_EVENT_TABLE(Cartulo_EditField, wxDialog)
    EVT_BUTTON(wxID_OK, Cartulo_EditField::OnOK)
wxEND_EVENT_TABLE()

Cartulo_EditField::Cartulo_EditField(wxWindow *parent, const wxString &key, const wxString &value)
    : wxDialog(parent, wxID_ANY, "Editing Field", wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER)
{
    SetFont(wxFontInfo(10));
    wxBoxSizer *heading = new wxBoxSizer(wxHORIZONTAL);
    heading->Add(new wxStaticText(this, wxID_ANY, "Field Key:"),
                 wxSizerFlags().Border(wxRIGHT, FromDIP(DIALOG_GAP)));
    wxStaticText *keyText = new wxStaticText(this, ID_FIELD_KEY, "");
    keyText->SetLabelText(key);
    heading->Add(keyText);
    m_value = new wxTextCtrl(this, ID_FIELD_VALUE, "There is no editable field", wxDefaultPosition,
                             wxDefaultSize, wxTE_MULTILINE | Text_WrapStyle(value));
    m_value->SetMinSize(FromDIP(wxSize(600, 200)));

    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(heading, wxSizerFlags().Border(wxBOTTOM, FromDIP(DIALOG_BORDER)));
    column->Add(m_value, wxSizerFlags(1).Expand());
    Dialog_Finish(this, column, m_value);
    m_value->ChangeValue(value);
    m_value->SetInsertionPointEnd();
}

wxString Cartulo_EditField::Value() const
{
    return m_value->GetValue();
}

void Cartulo_EditField::OnOK(wxCommandEvent &event)
{
    TNSMessage("INFO: ", "Cartulo_EditField::OnOK", TNS_ACTION);
    event.Skip(); // closes
}

// --- The name ---

wxBEGIN_EVENT_TABLE(Cartulo_RenameField, wxDialog)
    EVT_BUTTON(wxID_OK, Cartulo_RenameField::OnOK)
wxEND_EVENT_TABLE()

Cartulo_RenameField::Cartulo_RenameField(wxWindow *parent, const FieldGrid *grid,
                                         const wxString &key, const wxArrayString &proposals,
                                         const wxString &proposal)
    : wxDialog(parent, wxID_ANY, "Renaming Field"), m_grid(grid)
{
    SetFont(wxFontInfo(10));
    wxTextCtrl *oldName = new wxTextCtrl(this, ID_FIELD_KEY, key);
    oldName->Disable();
    m_name = new wxComboBox(this, ID_FIELD_NEW_NAME, proposal, wxDefaultPosition, wxDefaultSize,
                            proposals);
    wxFlexGridSizer *rows = Dialog_CreateRows(this);
    Dialog_AddRow(rows, this, "Old Field Name:", oldName);
    Dialog_AddRow(rows, this, "New Field Name:", m_name);
    Dialog_Finish(this, rows, m_name);
}

// False when the user has to see to the name first. An empty one is accepted: nothing changes.
bool Cartulo_RenameField::Accept(const TypedName &name)
{
    switch (Grid_CheckNewName(m_grid, name)) {
    case NAME_OK:
    case NAME_EMPTY:
        return true;
    case NAME_BAD_CHARS:
        Box_OfferStripped(this, GetTitle(), FieldKey_BadCharsText, name, m_name);
        return false;
    case NAME_MISFIT:
        Box_Warn(this, GetTitle(), Name_MisfitText(name));
        return false;
    case NAME_UNWRITABLE:
        Box_Warn(this, GetTitle(), FieldCheck_NameText);
        return false;
    case NAME_TAKEN:
        Box_Warn(this, GetTitle(), FieldKey_TakenText);
    }
    return false;
}

void Cartulo_RenameField::OnOK(wxCommandEvent &event)
{
    TypedName name = Name_Read(m_name->GetValue().ToStdWstring().c_str(), m_grid->encoding);
    if (!Accept(name))
        return;
    m_newName = name.text;
    event.Skip(); // closes
}

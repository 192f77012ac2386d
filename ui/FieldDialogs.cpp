#include "ui/FieldDialogs.h"

#include <wx/combobox.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "app/Companion.h"
#include "ui/DisplayText.h"
#include "ui/FieldKeys.h"

enum { ID_FIELD_KEY = 6001, ID_FIELD_VALUE = 6002, DIALOG_BORDER = 12, COLUMN_GAP = 8 };

// --- The value ---

wxBEGIN_EVENT_TABLE(Cartulo_EditField, wxDialog)
    EVT_BUTTON(wxID_OK, Cartulo_EditField::OnOK)
    EVT_CHAR_HOOK(Cartulo_EditField::OnCharHook)
wxEND_EVENT_TABLE()

Cartulo_EditField::Cartulo_EditField(wxWindow *parent, const wxString &key, const wxString &value)
    : wxDialog(parent, wxID_ANY, "Editing Field", wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER)
{
    SetFont(wxFontInfo(10));
    wxBoxSizer *heading = new wxBoxSizer(wxHORIZONTAL);
    heading->Add(new wxStaticText(this, wxID_ANY, "Field Key:"),
                 wxSizerFlags().Border(wxRIGHT, FromDIP(COLUMN_GAP)));
    wxStaticText *keyText = new wxStaticText(this, ID_FIELD_KEY, "");
    keyText->SetLabelText(key);
    heading->Add(keyText);
    m_value = new wxTextCtrl(this, ID_FIELD_VALUE, "There is no editable field", wxDefaultPosition,
                             wxDefaultSize, wxTE_MULTILINE);
    m_value->SetMinSize(FromDIP(wxSize(600, 200)));
    m_value->ChangeValue(value);

    const int border = FromDIP(DIALOG_BORDER);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(heading, wxSizerFlags().Border(wxALL, border));
    column->Add(m_value, wxSizerFlags(1).Expand().Border(wxLEFT | wxRIGHT, border));
    column->Add(CreateStdDialogButtonSizer(wxOK | wxCANCEL),
                wxSizerFlags().Expand().Border(wxALL, border));
    SetSizerAndFit(column);
    CentreOnParent();
    m_value->SetFocus();
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

void Cartulo_EditField::OnCharHook(wxKeyEvent &event)
{
    int key = event.GetKeyCode();
    if (!event.ControlDown() || (key != WXK_RETURN && key != WXK_NUMPAD_ENTER)) {
        event.Skip();
        return;
    }
    wxCommandEvent press(wxEVT_BUTTON, wxID_OK);
    ProcessWindowEvent(press);
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
    m_name =
        new wxComboBox(this, ID_FIELD_VALUE, proposal, wxDefaultPosition, wxDefaultSize, proposals);
    m_name->SetValue(proposal);
    wxFlexGridSizer *rows = new wxFlexGridSizer(2, FromDIP(wxSize(COLUMN_GAP, COLUMN_GAP)));
    rows->AddGrowableCol(1);
    rows->Add(new wxStaticText(this, wxID_ANY, "Old Field Name:"), wxSizerFlags().CentreVertical());
    rows->Add(oldName, wxSizerFlags().Expand());
    rows->Add(new wxStaticText(this, wxID_ANY, "New Field Name:"), wxSizerFlags().CentreVertical());
    rows->Add(m_name, wxSizerFlags().Expand());

    const int border = FromDIP(DIALOG_BORDER);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(rows, wxSizerFlags(1).Expand().Border(wxALL, border));
    column->Add(CreateStdDialogButtonSizer(wxOK | wxCANCEL),
                wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, border));
    SetSizerAndFit(column);
    CentreOnParent();
    m_name->SetFocus();
}

void Cartulo_RenameField::Refuse(const wxString &text)
{
    wxMessageBox(text, GetTitle(), wxOK | wxICON_WARNING, this);
}

void Cartulo_RenameField::OnOK(wxCommandEvent &event)
{
    std::string name = FieldKey_Typed(m_name->GetValue().ToStdWstring().c_str());
    switch (FieldKey_CheckNewName(m_grid, name.c_str())) {
    case FIELD_KEY_EMPTY:
        break; // closes, and nothing changes
    case FIELD_KEY_BAD_CHARS:
        if (wxMessageBox(FieldKey_BadCharsText, GetTitle(), wxOK | wxCANCEL | wxICON_WARNING,
                         this) == wxOK) {
            Bib_StripKeyChars(name.data());
            m_name->SetValue(StoreText(name.c_str()));
        }
        return;
    case FIELD_KEY_UNWRITABLE:
        Refuse(FieldKey_UnwritableText);
        return;
    case FIELD_KEY_TAKEN:
        Refuse(FieldKey_TakenText);
        return;
    case FIELD_KEY_OK:
        m_newName = name;
    }
    event.Skip(); // closes
}

// ui/Messages.cpp - the window with the errors and warnings of loading.
#include "ui/Messages.h"

#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "session/MessagesText.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/Theme.h"

enum { ID_MESSAGES_TEXT = 6001 };

wxBEGIN_EVENT_TABLE(Cartulo_Messages, wxDialog)
    EVT_BUTTON(wxID_OK, Cartulo_Messages::OnOK)
wxEND_EVENT_TABLE()

static Colour HeadingColour(MessagesVerdict verdict)
{
    switch (verdict) {
    case MESSAGES_ERRORS:
        return {200, 0, 0};
    case MESSAGES_WARNINGS:
        return {0, 128, 0};
    default:
        return {0, 0, 128};
    }
}

static wxString TextOf(const BibFileSet *set)
{
    return wxString(Messages_Text(set, PathTextWide));
}

Cartulo_Messages::Cartulo_Messages(wxWindow *parent, const BibFileSet *set)
    : wxDialog(parent, wxID_ANY, "Bibliography File Loading Error Messages", wxDefaultPosition,
               wxDefaultSize, wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER)
{
    SetFont(wxFontInfo(10));
    m_heading = new wxStaticText(this, wxID_ANY, "");
    wxString text = TextOf(set);
    // "There is no messages" stands so.
    m_text = new wxTextCtrl(this, ID_MESSAGES_TEXT, "There is no messages ...", wxDefaultPosition,
                            wxDefaultSize, wxTE_MULTILINE | wxTE_READONLY | Text_WrapStyle(text));
    m_text->SetFont(wxFontInfo(10).Family(wxFONTFAMILY_TELETYPE));
    m_text->SetMinSize(FromDIP(wxSize(600, 200)));
    ShowText(set, text);

    const int border = FromDIP(DIALOG_BORDER);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(m_heading, wxSizerFlags().Border(wxALL, border));
    column->Add(m_text, wxSizerFlags(1).Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, border));
    column->Add(CreateStdDialogButtonSizer(wxOK), Dialog_ButtonPlace(this));
    SetSizerAndFit(column);
    // The window manager centres the dialog on its parent. It alone knows at the start where that
    // is.
    FindWindow(wxID_OK)->SetFocus();
}

void Cartulo_Messages::Fill(const BibFileSet *set)
{
    ShowText(set, TextOf(set));
}

void Cartulo_Messages::ShowText(const BibFileSet *set, const wxString &text)
{
    MessagesVerdict verdict = Messages_Verdict(set);
    m_heading->SetLabelText(Messages_Heading(verdict));
    Theme_SetTextColour(m_heading, HeadingColour(verdict));
    m_text->ChangeValue(text);
}

void Cartulo_Messages::OnOK(wxCommandEvent &event)
{
    TNSMessage("INFO: ", "Cartulo_Messages::OnOK", TNS_ACTION);
    event.Skip(); // closes
}

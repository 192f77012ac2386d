// ui/Messages.h - the window with the errors and warnings of loading.
#pragma once

#include <wx/dialog.h>

#include "session/FileSet.h"

class wxStaticText;
class wxTextCtrl;

class Cartulo_Messages : public wxDialog
{
public:
    Cartulo_Messages(wxWindow *parent, const BibFileSet *set);

    void Fill(const BibFileSet *set); // reads the set once, here

private:
    void ShowText(const BibFileSet *set, const wxString &text);
    void OnOK(wxCommandEvent &event);

    wxStaticText *m_heading; // child windows
    wxTextCtrl *m_text;

    wxDECLARE_EVENT_TABLE();
};

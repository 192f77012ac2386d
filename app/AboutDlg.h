// app/AboutDlg.h - what the program is, its version and its licence.
#pragma once

#include <wx/dialog.h>

class AboutDlg : public wxDialog
{
public:
    explicit AboutDlg(wxWindow *parent);
};

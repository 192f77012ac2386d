// ui/Messages.h - the window with the errors and warnings of loading.
#pragma once

#include <wx/dialog.h>

#include "store/BibFileSet.h"

class Cartulo_Messages : public wxDialog
{
public:
    // Reads the set once, here.
    Cartulo_Messages(wxWindow *parent, const BibFileSet *set);

private:
    void OnOK(wxCommandEvent &event);

    wxDECLARE_EVENT_TABLE();
};

// ui/Dialogs.h - what the program's windows and boxes have in common.
#pragma once

#include <string>

#include <wx/string.h>

class wxDialog;
class wxFlexGridSizer;
class wxSizer;
class wxTextEntry;
class wxWindow;

// Device-independent pixels.
enum {
    DIALOG_BORDER = 12,
    DIALOG_GAP = 8,
    DIALOG_ITEM = 400 // the widest item of a choice
};

// Two columns, labels and controls; the second one grows.
wxFlexGridSizer *Dialog_CreateRows(wxWindow *dialog);
void Dialog_AddRow(wxFlexGridSizer *rows, wxWindow *dialog, const wxString &label,
                   wxWindow *control);

// Puts OK and Cancel below the content, fits and centres the dialog. `focus` gets the focus. Enter
// in a field of one line is OK at once, and Ctrl+Enter everywhere.
void Dialog_Finish(wxDialog *dialog, wxSizer *content, wxWindow *focus);

void Box_Warn(wxWindow *parent, const wxString &caption, const wxString &text);

// A warning that may be cancelled; true for OK.
bool Box_WarnOrCancel(wxWindow *parent, const wxString &caption, const wxString &text);

// True for Yes. `style` may be wxNO_DEFAULT.
bool Box_Ask(wxWindow *parent, const wxString &caption, const wxString &text, long style = 0);

// Offers to take the characters out of `key` (store text) that no key may hold; what is left goes
// into `entry`, for the user to look at.
void Box_OfferStripped(wxWindow *parent, const wxString &caption, const wxString &text,
                       std::string key, wxTextEntry *entry);

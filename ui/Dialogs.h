// ui/Dialogs.h - what the program's windows and boxes have in common.
#pragma once

#include <wx/sizer.h>
#include <wx/string.h>

struct TypedName;
class wxDialog;
class wxTextCtrl;
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

// For the toolkit's row of buttons at the end of a dialog's column: it has a border of its own at
// the right.
wxSizerFlags Dialog_ButtonPlace(const wxWindow *dialog);

// Puts OK and Cancel below the content, fits and centres the dialog. `focus` gets the focus. Enter
// in a field of one line is OK at once, and Ctrl+Enter everywhere.
void Dialog_Finish(wxDialog *dialog, wxSizer *content, wxWindow *focus);

// The boxes belong to the top-level window of `parent`.
void Box_Warn(wxWindow *parent, const wxString &caption, const wxString &text);

// A warning that may be cancelled; true for OK.
bool Box_WarnOrCancel(wxWindow *parent, const wxString &caption, const wxString &text);

// True for Yes. `style` may be wxNO_DEFAULT.
bool Box_Ask(wxWindow *parent, const wxString &caption, const wxString &text, long style = 0);

// Offers to take the characters out of `key` that no key may hold; what is left goes into `field`,
// which is a text entry and gets the focus.
void Box_OfferStripped(wxWindow *parent, const wxString &caption, const wxString &text,
                       const TypedName &key, wxWindow *field);

// --- Texts in controls ---

extern const char Text_TooLong[];   // for the user: of a value that no control for one line holds
extern const char Text_LockedTip[]; // for the tip of a control that can't show its value

void Text_Focus(wxTextCtrl *control); // the cursor stays where it is, and nothing gets selected

// False when the control can't hold the text: it keeps what it has. Unless that is the same, the
// cursor goes to its end.
bool Text_Take(wxTextCtrl *control, const wxString &text);

// How a control for several lines wraps this text: between words, unless one is so long that this
// would take minutes.
long Text_WrapStyle(const wxString &text);

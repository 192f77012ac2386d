// ui/Dialogs.cpp - what the program's windows and boxes have in common.
#include "ui/Dialogs.h"

#include <algorithm>

#include <wx/dialog.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/textentry.h>

#include "session/Names.h"
#include "store/BibStore.h"
#include "ui/DisplayText.h"

enum { LONG_WORD = 1000 }; // characters

wxFlexGridSizer *Dialog_CreateRows(wxWindow *dialog)
{
    wxFlexGridSizer *rows = new wxFlexGridSizer(2, dialog->FromDIP(wxSize(DIALOG_GAP, DIALOG_GAP)));
    rows->AddGrowableCol(1);
    return rows;
}

void Dialog_AddRow(wxFlexGridSizer *rows, wxWindow *dialog, const wxString &label,
                   wxWindow *control)
{
    rows->Add(new wxStaticText(dialog, wxID_ANY, label), wxSizerFlags().CentreVertical());
    rows->Add(control, wxSizerFlags().Expand());
}

static bool IsLine(wxWindow *window)
{
    wxTextCtrl *text = dynamic_cast<wxTextCtrl *>(window);
    return text ? !text->IsMultiLine() : dynamic_cast<wxTextEntry *>(window) != nullptr;
}

// GTK lets a button that Enter presses look pressed for a quarter of a second first. Who types on
// meanwhile would type into the dialog, and with Esc give it up.
static void AcceptByEnter(wxDialog *dialog, wxKeyEvent &event)
{
    wxWindow *window = static_cast<wxWindow *>(event.GetEventObject());
    bool isEnter = event.GetKeyCode() == WXK_RETURN || event.GetKeyCode() == WXK_NUMPAD_ENTER;
    bool accepts = event.ControlDown() || (!event.HasAnyModifiers() && IsLine(window));
    if (!isEnter || !accepts) {
        event.Skip();
        return;
    }
    wxCommandEvent press(wxEVT_BUTTON, wxID_OK);
    dialog->ProcessWindowEvent(press);
}

wxSizerFlags Dialog_ButtonPlace(const wxWindow *dialog)
{
    return wxSizerFlags().Expand().Border(wxLEFT | wxBOTTOM, dialog->FromDIP(DIALOG_BORDER));
}

void Dialog_Finish(wxDialog *dialog, wxSizer *content, wxWindow *focus)
{
    const int border = dialog->FromDIP(DIALOG_BORDER);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(content, wxSizerFlags(1).Expand().Border(wxALL, border));
    column->Add(dialog->CreateStdDialogButtonSizer(wxOK | wxCANCEL), Dialog_ButtonPlace(dialog));
    dialog->SetSizerAndFit(column);
    dialog->CentreOnParent();
    dialog->Bind(wxEVT_CHAR_HOOK, [dialog](wxKeyEvent &event) { AcceptByEnter(dialog, event); });
    focus->SetFocus();
}

void Box_Warn(wxWindow *parent, const wxString &caption, const wxString &text)
{
    wxMessageBox(text, caption, wxOK | wxICON_WARNING, wxGetTopLevelParent(parent));
}

bool Box_WarnOrCancel(wxWindow *parent, const wxString &caption, const wxString &text)
{
    return wxMessageBox(text, caption, wxOK | wxCANCEL | wxICON_WARNING,
                        wxGetTopLevelParent(parent)) == wxOK;
}

bool Box_Ask(wxWindow *parent, const wxString &caption, const wxString &text, long style)
{
    return wxMessageBox(text, caption, wxYES_NO | wxICON_QUESTION | style,
                        wxGetTopLevelParent(parent)) == wxYES;
}

void Box_OfferStripped(wxWindow *parent, const wxString &caption, const wxString &text,
                       const TypedName &key, wxWindow *field)
{
    wxTextEntry *entry = dynamic_cast<wxTextEntry *>(field);
    const bool accepted = Box_WarnOrCancel(parent, caption, text);
    const long at = entry->GetInsertionPoint();
    field->SetFocus();
    entry->SetInsertionPoint(at); // the focus has selected all
    if (!accepted)
        return;
    std::string stripped = key.text;
    Bib_StripKeyChars(stripped.data());
    entry->ChangeValue(StoreText(stripped.c_str(), key.encoding));
    entry->SetInsertionPointEnd();
}

// --- Texts in controls ---

const char Text_TooLong[] = "The value is too long: a field can be edited up to 65,534 bytes.";
const char Text_LockedTip[] = "This value can't be shown in full, so it stays as it is.";

// The toolkit selects the whole text: the next letter would take its place.
void Text_Focus(wxTextCtrl *control)
{
    long at = control->GetInsertionPoint();
    control->SetFocus();
    control->SetInsertionPoint(at);
}

bool Text_Take(wxTextCtrl *control, const wxString &text)
{
    wxString old = control->GetValue();
    if (text == old)
        return true;
    control->ChangeValue(text);
    bool taken = control->GetValue() == text;
    if (!taken)
        control->ChangeValue(old);
    control->SetInsertionPointEnd();
    return taken;
}

long Text_WrapStyle(const wxString &text)
{
    int length = 0, longest = 0;
    for (wxUniChar c : text) {
        length = c == ' ' || c == '\n' ? 0 : length + 1;
        longest = std::max(longest, length);
    }
    return longest > LONG_WORD ? wxTE_CHARWRAP : wxTE_BESTWRAP;
}

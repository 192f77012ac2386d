// ui/Status.cpp - the status bar of a window's frame.
#include "ui/Status.h"

#include <wx/frame.h>
#include <wx/statusbr.h>
#include <wx/utils.h>

static wxStatusBar *StatusBarOf(wxWindow *window)
{
    wxFrame *frame = dynamic_cast<wxFrame *>(wxGetTopLevelParent(window));
    return frame ? frame->GetStatusBar() : nullptr;
}

void ShowStatus(wxWindow *window, const wxString &text, bool bell)
{
    wxStatusBar *bar = StatusBarOf(window);
    if (!bar)
        return;
    bar->SetStatusText(text, 0);
    if (bell)
        wxBell();
}

void ShowStatusError(wxWindow *window, const wxString &text)
{
    ShowStatus(window, text, true);
}

void ShowEncoding(wxWindow *window, const wxString &name)
{
    if (wxStatusBar *bar = StatusBarOf(window))
        bar->SetStatusText(name, 1);
}

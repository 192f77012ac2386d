// ui/Status.h - the status bar of a window's frame.
#pragma once

#include <wx/string.h>

class wxWindow;

// A text for field 0 of the status bar of the window's frame, with or without the bell.
void ShowStatus(wxWindow *window, const wxString &text, bool bell = false);
void ShowStatusError(wxWindow *window, const wxString &text); // always with the bell

void ShowEncoding(wxWindow *window, const wxString &name); // in field 1

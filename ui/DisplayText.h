// ui/DisplayText.h - 8-bit texts for the controls of the toolkit.
#pragma once

#include <string>

#include <wx/string.h>

class wxWindow;

wxString StoreText(const char *text); // contents of BIB files, in the selected code page
wxString PathText(const char *text);  // names of files, and messages that hold them
std::wstring PathTextWide(const char *text);

// A name for a control that is as wide as its text: the middle of a long one is left out.
wxString ShortText(const wxWindow *control, const wxString &text, int width); // at 100 %

// A file name as the system wants it.
std::string PathBytes(const wxString &path);

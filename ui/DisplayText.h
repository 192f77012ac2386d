// ui/DisplayText.h - 8-bit texts for the controls of the toolkit.
#pragma once

#include <string>

#include <wx/string.h>

class wxWindow;

wxString StoreText(const char *text); // contents of BIB files, in the selected code page
wxString PathText(const char *text);  // names of files, and messages that hold them
std::wstring PathTextWide(const char *text);

// `text`, its middle left out where it is wider than `width` (device-independent pixels) in the
// control's font. For controls that grow with their text.
wxString ShortText(wxWindow *control, const wxString &text, int width);

// A file name as the system wants it.
std::string PathBytes(const wxString &path);

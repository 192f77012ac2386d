// ui/DisplayText.h - 8-bit texts for the controls of the toolkit.
#pragma once

#include <string>

#include <wx/string.h>

wxString StoreText(const char *text); // contents of BIB files, in the selected code page
wxString PathText(const char *text);  // names of files, and messages that hold them
std::wstring PathTextWide(const char *text);

// A file name as the system wants it.
std::string PathBytes(const wxString &path);

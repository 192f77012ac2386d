// ui/DisplayText.h - 8-bit texts for the controls of the toolkit.
#pragma once

#include <string>

#include <wx/string.h>

class wxWindow;
struct BibFile;
struct EncodingRecord;

wxString StoreText(const char *text, const EncodingRecord *encoding); // contents of a BIB file
wxString OwnText(const char *text);  // of the INI file, and names that the open files share
wxString PathText(const char *text); // names of files, and messages that hold them
std::wstring PathTextWide(const char *text);

// `text`, its middle left out where it is wider than `width` (device-independent pixels) in the
// control's font. For controls that grow with their text.
wxString ShortText(wxWindow *control, const wxString &text, int width);

wxString FileTip(const BibFile *file); // its path, and whether it is read-only

// The first 1000 characters of a longer text, and an ellipsis; for what shows a text whole: tips,
// boxes, lists.
wxString BoundedText(const wxString &text);

// A file name as the system wants it.
std::string PathBytes(const wxString &path);

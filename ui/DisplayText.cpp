// ui/DisplayText.cpp - 8-bit texts for the controls of the toolkit.
#include "ui/DisplayText.h"

#include <wx/control.h>
#include <wx/dcclient.h>
#include <wx/strconv.h>

#include "encoding/Encoding.h"
#include "session/Values.h"
#include "store/BibStore.h"

enum { LONGEST_TEXT = 1000 }; // characters

wxString StoreText(const char *text, const EncodingRecord *encoding)
{
    return wxString(Value_Show(text, encoding));
}

wxString OwnText(const char *text)
{
    return StoreText(text, Enc_OfText(text));
}

wxString PathText(const char *text)
{
    return wxString(text, wxConvWhateverWorks);
}

std::wstring PathTextWide(const char *text)
{
    return PathText(text).ToStdWstring();
}

std::string PathBytes(const wxString &path)
{
    return std::string(path.fn_str());
}

wxString FileTip(const BibFile *file)
{
    return PathText(file->path) + (file->readOnly ? " (read-only)" : "");
}

wxString BoundedText(const wxString &text)
{
    return text.length() > LONGEST_TEXT ? text.Left(LONGEST_TEXT) + L"\x2026" : text;
}

wxString ShortText(wxWindow *control, const wxString &text, int width)
{
    wxClientDC dc(control);
    dc.SetFont(control->GetFont());
    return wxControl::Ellipsize(text, dc, wxELLIPSIZE_MIDDLE, control->FromDIP(width),
                                wxELLIPSIZE_FLAGS_NONE);
}

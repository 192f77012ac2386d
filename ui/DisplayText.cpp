#include "ui/DisplayText.h"

#include <wx/strconv.h>

#include "encoding/Encoding.h"

wxString StoreText(const char *text)
{
    std::wstring wide;
    return wxString(Enc_ToUnicode(wide, text));
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

#include "app/Icons.h"

#include <wx/filename.h>
#include <wx/stdpaths.h>
#include <wx/utils.h>

static wxString UserDataFolder()
{
    wxString folder;
    if (wxGetEnv("XDG_DATA_HOME", &folder) && !folder.empty())
        return folder;
    return wxGetHomeDir() + "/.local/share";
}

// The path of a file in the first resource folder that has it; "" for none.
static wxString FindResource(const wxString &name)
{
    wxFileName executable(wxStandardPaths::Get().GetExecutablePath());
    const wxString folders[] = {UserDataFolder() + "/cartulo",
                                executable.GetPath() + "/../share/cartulo", CARTULO_RESOURCES};
    for (const wxString &folder : folders) {
        wxString path = folder + "/" + name;
        if (wxFileName::IsFileReadable(path))
            return path;
    }
    return "";
}

wxBitmapBundle Icon_Load(const wxString &name, int size, const wxArtID &fallback)
{
    wxString path = FindResource("icons/" + name + ".svg");
    wxBitmapBundle icon;
    if (!path.empty())
        icon = wxBitmapBundle::FromSVGFile(path, wxSize(size, size));
    return icon.IsOk() ? icon : wxArtProvider::GetBitmapBundle(fallback, wxART_TOOLBAR);
}

wxIconBundle Icon_Program()
{
    wxIconBundle icons;
    wxString path = FindResource("cartulo.svg");
    if (path.empty())
        return icons;
    wxBitmapBundle picture = wxBitmapBundle::FromSVGFile(path, wxSize(48, 48));
    for (int size : {16, 24, 32, 48, 64, 128}) {
        wxIcon icon;
        icon.CopyFromBitmap(picture.GetBitmap(wxSize(size, size)));
        if (icon.IsOk())
            icons.AddIcon(icon);
    }
    return icons;
}

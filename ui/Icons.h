// ui/Icons.h - pictures of the tools and of the program, and buttons that show them.
#pragma once

#include <wx/artprov.h>
#include <wx/bmpbndl.h>
#include <wx/button.h>
#include <wx/iconbndl.h>

// A picture in any format of the toolkit, as large as fits into `size` on a screen of normal
// density, SVG sharp on any. In a ".bmp" the colour 192, 192, 192 is transparent. An invalid
// bundle when there is no such picture; `path` may be null.
wxBitmapBundle Icon_LoadFile(const char *path, wxSize size);

// The icon of a tool by its name (TNSearch "Icon"; null for none). When it is missing, the
// desktop's picture `fallback`, and without one a box: no tool is ever invisible.
wxBitmapBundle Icon_Load(const char *name, int size, const wxArtID &fallback = wxArtID());

wxIconBundle Icon_Program(); // empty when it is missing

// A button with a label and, where there is a tool icon of that name, a picture; without a label it
// always has one. `icon` may be null. It never takes the keyboard focus.
class xBitmapButton : public wxButton
{
public:
    xBitmapButton(wxWindow *parent, wxWindowID id, const wxString &label, const char *icon);

    bool AcceptsFocus() const override { return false; }
};

// app/Icons.h - pictures of the tools and of the program.
//
// Looked for in $XDG_DATA_HOME/cartulo, then ../share/cartulo from the executable, then in the
// folder that the program was built from.
#pragma once

#include <wx/artprov.h>
#include <wx/bmpbndl.h>
#include <wx/iconbndl.h>

// The icon of a tool, sharp at any scale; when it is missing, the desktop's picture `fallback`.
wxBitmapBundle Icon_Load(const wxString &name, int size, const wxArtID &fallback);

wxIconBundle Icon_Program(); // empty when it is missing

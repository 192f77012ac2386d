// app/AboutDlg.cpp - what the program is, its version and its licence.

#include "app/AboutDlg.h"

#include <cstdlib>

#include <wx/button.h>
#include <wx/sizer.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>

#include "base/Companion.h"
#include "ui/Icons.h"
#include "ui/Theme.h"

enum { LOGO_SIZE = 128 };

// Null when there is none.
static wxStaticBitmap *CreateLogo(wxWindow *parent)
{
    char *path = TNSearch("Logo", "Cartulo");
    wxBitmapBundle logo = Icon_LoadFile(path, wxSize(LOGO_SIZE, LOGO_SIZE));
    free(path);
    return logo.IsOk() ? new wxStaticBitmap(parent, wxID_ANY, logo) : nullptr;
}

static wxStaticText *CreateName(wxWindow *parent)
{
    wxStaticText *name = new wxStaticText(parent, wxID_ANY, "Cartulo");
    name->SetFont(parent->GetFont().Bold());
    Theme_SetTextColour(name, {128, 0, 128});
    return name;
}

AboutDlg::AboutDlg(wxWindow *parent) : wxDialog(parent, wxID_ANY, "About ...")
{
    static const char *const lines[] = {
        "Desktop editor for BibTeX databases",
        "Version " CARTULO_VERSION ", " CARTULO_RELEASE_DATE,
        "Copyright (c) 2026 The Cartulo authors",
        "Released under the MIT License, without warranty of any kind.",
    };
    SetFont(wxFontInfo(10));
    const wxSizerFlags centred = wxSizerFlags().Centre().Border();
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    if (wxStaticBitmap *logo = CreateLogo(this))
        column->Add(logo, centred);
    column->Add(CreateName(this), centred);
    for (const char *line : lines)
        column->Add(new wxStaticText(this, wxID_ANY, line), centred);
    wxButton *close = new wxButton(this, wxID_CANCEL, "Close");
    column->Add(close, centred);

    wxBoxSizer *box = new wxBoxSizer(wxHORIZONTAL);
    box->Add(column, wxSizerFlags().Border(wxALL, FromDIP(12)));
    SetSizerAndFit(box);
    close->SetDefault();
    close->SetFocus();
}

// ui/Theme.cpp - texts in colour on light and dark desktops.
#include "ui/Theme.h"

#include <wx/settings.h>
#include <wx/stattext.h>

static const Colour HeadingColour = {0, 0, 100};

void Theme_SetTextColour(wxWindow *window, Colour colour)
{
    wxColour back = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
    Colour shown = Colour_ForText(colour, {back.Red(), back.Green(), back.Blue()},
                                  wxSystemSettings::GetAppearance().IsUsingDarkBackground());
    window->SetForegroundColour(wxColour(shown.red, shown.green, shown.blue));
}

wxStaticText *Theme_CreateHeading(wxWindow *parent, const wxString &text)
{
    wxStaticText *heading =
        new wxStaticText(parent, wxID_ANY, text, wxDefaultPosition, wxDefaultSize,
                         wxALIGN_CENTRE_HORIZONTAL | wxST_ELLIPSIZE_END);
    heading->SetFont(heading->GetFont().Bold());
    Theme_SetTextColour(heading, HeadingColour);
    return heading;
}

// Between the colour of a window's text and that of its background.
static wxColour Mix(double textShare)
{
    wxColour text = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT);
    wxColour back = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOW);
    auto mix = [textShare](unsigned char a, unsigned char b) {
        return wxColour::AlphaBlend(a, b, textShare);
    };
    return wxColour(mix(text.Red(), back.Red()), mix(text.Green(), back.Green()),
                    mix(text.Blue(), back.Blue()));
}

wxColour Theme_PaleTextColour()
{
    return Mix(0.6);
}

wxColour Theme_LockedColour()
{
    return Mix(0.12);
}

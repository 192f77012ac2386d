#include "ui/Theme.h"

#include <wx/settings.h>

void Theme_SetTextColour(wxWindow *window, Colour colour)
{
    wxColour back = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
    Colour shown = Panel_TextColour(colour, {back.Red(), back.Green(), back.Blue()},
                                    wxSystemSettings::GetAppearance().IsUsingDarkBackground());
    window->SetForegroundColour(wxColour(shown.red, shown.green, shown.blue));
}

wxColour Theme_PaleTextColour()
{
    wxColour text = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT);
    wxColour back = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOW);
    auto mix = [](unsigned char a, unsigned char b) { return wxColour::AlphaBlend(a, b, 0.6); };
    return wxColour(mix(text.Red(), back.Red()), mix(text.Green(), back.Green()),
                    mix(text.Blue(), back.Blue()));
}

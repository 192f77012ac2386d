#include "ui/Theme.h"

#include <wx/settings.h>

void Theme_SetTextColour(wxWindow *window, Colour colour)
{
    wxColour back = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
    Colour shown = Panel_TextColour(colour, {back.Red(), back.Green(), back.Blue()},
                                    wxSystemSettings::GetAppearance().IsUsingDarkBackground());
    window->SetForegroundColour(wxColour(shown.red, shown.green, shown.blue));
}

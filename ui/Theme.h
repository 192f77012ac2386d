// ui/Theme.h - texts in colour on light and dark desktops.
#pragma once

#include <wx/window.h>

#include "ui/Colours.h"

class wxStaticText;

// Gives the window's text `colour`, or its readable twin when the desktop is dark.
void Theme_SetTextColour(wxWindow *window, Colour colour);

// The heading of a pane, in the middle of its width.
wxStaticText *Theme_CreateHeading(wxWindow *parent, const wxString &text);

// For what can be read but not edited now: paler than other text, dark enough to read.
wxColour Theme_PaleTextColour();

wxColour Theme_LockedColour(); // background of a text for several lines that can't be edited now

// ui/PanelRules.h - decisions of the editor panel that need no window.
#pragma once

struct Colour {
    unsigned char red, green, blue;
};

// How far two colours stand apart for the eye: 1 (equal) to 21 (black on white).
double Panel_Contrast(Colour a, Colour b);

// The colour of a text whose colour was chosen for light backgrounds: itself on those, and on a
// dark one the same hue, light enough for a contrast of 4.5 at least.
Colour Panel_TextColour(Colour chosen, Colour background, bool darkTheme);

// ui/Colours.h - the colours of texts, on light and on dark desktops.
#pragma once

#include "session/Schema.h"

struct Colour {
    unsigned char red, green, blue;
};

// How far two colours stand apart for the eye: 1 (equal) to 21 (black on white).
double Colour_Contrast(Colour a, Colour b);

// The colour of a text whose colour was chosen for light backgrounds: itself on those, and on a
// dark one the same hue, light enough for a contrast of 4.5 at least, of 7 where the colour was
// dark, so that dark and bright ones stay apart.
Colour Colour_ForText(Colour chosen, Colour background, bool darkTheme);

Colour Colour_OfField(FieldClass fieldClass); // of a field's label, on a light background

// ui/Colours.cpp - the colours of texts, on light and on dark desktops.
#include "ui/Colours.h"

#include <algorithm>
#include <cmath>

enum { DIMMEST = 50 }; // of a colour on a dark desktop, percent

static double Linear(unsigned char channel)
{
    double c = channel / 255.0;
    return c <= 0.04045 ? c / 12.92 : std::pow((c + 0.055) / 1.055, 2.4);
}

// Relative luminance as the accessibility guidelines of the web define it.
static double Luminance(Colour c)
{
    return 0.2126 * Linear(c.red) + 0.7152 * Linear(c.green) + 0.0722 * Linear(c.blue);
}

double Colour_Contrast(Colour a, Colour b)
{
    double la = Luminance(a), lb = Luminance(b);
    return (std::max(la, lb) + 0.05) / (std::min(la, lb) + 0.05);
}

// The same hue at full strength.
static Colour Saturate(Colour c)
{
    int top = std::max({c.red, c.green, c.blue});
    if (top == 0)
        return c;
    auto scale = [top](int channel) { return (unsigned char)(channel * 255 / top); };
    return {scale(c.red), scale(c.green), scale(c.blue)};
}

static Colour MixWithWhite(Colour c, int percent)
{
    auto mix = [percent](int channel) {
        return (unsigned char)(channel + (255 - channel) * percent / 100);
    };
    return {mix(c.red), mix(c.green), mix(c.blue)};
}

static Colour Dim(Colour c, int percent)
{
    auto dim = [percent](int channel) { return (unsigned char)(channel * percent / 100); };
    return {dim(c.red), dim(c.green), dim(c.blue)};
}

Colour Colour_ForText(Colour chosen, Colour background, bool darkTheme)
{
    if (!darkTheme)
        return chosen;
    // What stands out by its darkness on a light background does so by its lightness here.
    double contrast = std::max({chosen.red, chosen.green, chosen.blue}) > 128 ? 4.5 : 7;
    Colour full = Saturate(chosen);
    for (int percent = DIMMEST; percent < 100; percent += 5)
        if (Colour dim = Dim(full, percent); Colour_Contrast(dim, background) >= contrast)
            return dim;
    for (int percent = 0; percent < 100; percent += 5) {
        Colour lighter = MixWithWhite(full, percent);
        if (Colour_Contrast(lighter, background) >= contrast)
            return lighter;
    }
    return {255, 255, 255};
}

Colour Colour_OfField(FieldClass fieldClass)
{
    switch (fieldClass) {
    case FIELD_CROSSREF:
        return {128, 0, 0};
    case FIELD_UNKNOWN:
        return {0, 128, 0};
    case FIELD_MANDATORY:
        return {0, 0, 128};
    case FIELD_OPTIONAL:
        break;
    }
    return {0, 0, 255};
}

#include <gtest/gtest.h>

#include "ui/PanelRules.h"

static const Colour White = {255, 255, 255}, Black = {0, 0, 0};
static const Colour Headings[] = {{0, 0, 100}, {0, 0, 128}, {0, 128, 0}, {128, 0, 0}, {200, 0, 0}};

TEST(PanelContrast, IsThatOfTheGuidelines)
{
    EXPECT_NEAR(21.0, Panel_Contrast(Black, White), 0.001);
    EXPECT_NEAR(1.0, Panel_Contrast(White, White), 0.001);
    EXPECT_NEAR(4.54, Panel_Contrast({118, 118, 118}, White), 0.01);
}

TEST(PanelTextColour, KeepsTheChosenColourOnLightThemes)
{
    for (Colour heading : Headings) {
        Colour c = Panel_TextColour(heading, White, false);
        EXPECT_EQ(heading.red, c.red);
        EXPECT_EQ(heading.green, c.green);
        EXPECT_EQ(heading.blue, c.blue);
    }
}

TEST(PanelTextColour, IsReadableOnDarkThemes)
{
    for (Colour background : {Black, Colour{45, 45, 45}, Colour{56, 56, 56}}) {
        for (Colour heading : Headings)
            EXPECT_GE(Panel_Contrast(Panel_TextColour(heading, background, true), background), 4.5);
    }
}

TEST(PanelTextColour, KeepsTheHueOnDarkThemes)
{
    Colour blue = Panel_TextColour({0, 0, 100}, {45, 45, 45}, true);
    EXPECT_EQ(255, blue.blue);
    EXPECT_EQ(blue.red, blue.green);
    EXPECT_LT(blue.red, blue.blue);
    Colour green = Panel_TextColour({0, 128, 0}, {45, 45, 45}, true);
    EXPECT_EQ(255, green.green);
    EXPECT_LT(green.red, green.green);
}

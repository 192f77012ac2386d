// tests/colours_test.cpp - the colours of texts.
#include <gmock/gmock.h>

#include <vector>

#include "ui/Colours.h"

using testing::ElementsAre;

static const Colour White = {255, 255, 255}, Black = {0, 0, 0};
static const Colour Headings[] = {{0, 0, 100}, {0, 0, 128}, {0, 128, 0}, {128, 0, 0}, {200, 0, 0}};

TEST(ColourContrast, IsThatOfTheGuidelines)
{
    EXPECT_NEAR(21.0, Colour_Contrast(Black, White), 0.001);
    EXPECT_NEAR(1.0, Colour_Contrast(White, White), 0.001);
    EXPECT_NEAR(4.54, Colour_Contrast({118, 118, 118}, White), 0.01);
}

TEST(ColourForText, KeepsTheChosenColourOnLightThemes)
{
    for (Colour heading : Headings) {
        Colour c = Colour_ForText(heading, White, false);
        EXPECT_EQ(heading.red, c.red);
        EXPECT_EQ(heading.green, c.green);
        EXPECT_EQ(heading.blue, c.blue);
    }
}

TEST(ColourForText, IsReadableOnDarkThemes)
{
    for (Colour background : {Black, Colour{45, 45, 45}, Colour{56, 56, 56}}) {
        for (Colour heading : Headings)
            EXPECT_GE(Colour_Contrast(Colour_ForText(heading, background, true), background), 4.5);
    }
}

TEST(ColourForText, KeepsDarkAndBrightColoursApartOnDarkThemes)
{
    const Colour back = {53, 53, 53};
    Colour dark = Colour_ForText({0, 0, 128}, back, true);
    Colour bright = Colour_ForText({0, 0, 255}, back, true);
    EXPECT_GE(Colour_Contrast(dark, bright), 1.4);
}

TEST(ColourForText, KeepsTheHueOnDarkThemes)
{
    Colour blue = Colour_ForText({0, 0, 100}, {45, 45, 45}, true);
    EXPECT_EQ(255, blue.blue);
    EXPECT_EQ(blue.red, blue.green);
    EXPECT_LT(blue.red, blue.blue);
    Colour green = Colour_ForText({0, 128, 0}, {45, 45, 45}, true);
    EXPECT_EQ(green.red, green.blue);
    EXPECT_LT(green.red, green.green);
    EXPECT_GT(green.green, 128); // lighter than on light themes
    EXPECT_LT(green.green, 220); // full green would glare
}

TEST(ColourOfField, TellsTheClassesApart)
{
    struct {
        FieldClass fieldClass;
        int red, green, blue;
    } const cases[] = {{FIELD_CROSSREF, 128, 0, 0},
                       {FIELD_UNKNOWN, 0, 128, 0},
                       {FIELD_MANDATORY, 0, 0, 128},
                       {FIELD_OPTIONAL, 0, 0, 255}};
    for (const auto &c : cases) {
        Colour colour = Colour_OfField(c.fieldClass);
        EXPECT_THAT((std::vector<int>{colour.red, colour.green, colour.blue}),
                    ElementsAre(c.red, c.green, c.blue));
    }
}

#include <gtest/gtest.h>

#include "ui/Ids.h"
#include "ui/PanelRules.h"

static const Colour White = {255, 255, 255}, Black = {0, 0, 0};
static const Colour Headings[] = {{0, 0, 100}, {0, 0, 128}, {0, 128, 0}, {128, 0, 0}, {200, 0, 0}};

TEST(PanelPane, FollowsTheFilesAndTheRows)
{
    EXPECT_EQ(PANE_OPEN, Panel_Pane(0, 0));
    EXPECT_EQ(PANE_OPEN, Panel_Pane(0, 7)); // rows of files that are closed
    EXPECT_EQ(PANE_ENTRY, Panel_Pane(1, 1));
    EXPECT_EQ(PANE_NEW, Panel_Pane(2, 0));
}

class PanelToolStates : public testing::Test
{
protected:
    PanelToolStates()
    {
        set.files = files;
        set.count = 2;
    }

    BibFile first = {}, second = {};
    BibFile *files[2] = {&first, &second};
    BibFileSet set = {};
};

TEST_F(PanelToolStates, ChangeAndAddInAWritableFile)
{
    PanelTools tools = Panel_Tools(&set, 1, false);
    EXPECT_TRUE(tools.add);
    EXPECT_TRUE(tools.change);
}

TEST_F(PanelToolStates, OnlyAddWhereTheCurrentFileIsReadOnly)
{
    first.readOnly = 1;
    PanelTools tools = Panel_Tools(&set, 0, false);
    EXPECT_TRUE(tools.add);
    EXPECT_FALSE(tools.change);
}

TEST_F(PanelToolStates, OnlyAddWithoutACurrentEntry)
{
    for (int file : {-1, 2}) {
        EXPECT_TRUE(Panel_Tools(&set, file, false).add);
        EXPECT_FALSE(Panel_Tools(&set, file, false).change);
    }
}

TEST_F(PanelToolStates, NothingWhereAllFilesAreReadOnly)
{
    first.readOnly = -1; // as files are that can't be written
    second.readOnly = 1;
    for (int file : {-1, 0, 1}) {
        EXPECT_FALSE(Panel_Tools(&set, file, false).add);
        EXPECT_FALSE(Panel_Tools(&set, file, false).change);
    }
}

TEST_F(PanelToolStates, NothingWithoutFilesOrWhileAnEntryIsEdited)
{
    EXPECT_FALSE(Panel_Tools(&set, 0, true).add);
    EXPECT_FALSE(Panel_Tools(&set, 0, true).change);
    set.count = 0;
    EXPECT_FALSE(Panel_Tools(&set, 0, false).add);
}

TEST(PanelContrast, IsThatOfTheGuidelines)
{
    EXPECT_NEAR(21.0, Colour_Contrast(Black, White), 0.001);
    EXPECT_NEAR(1.0, Colour_Contrast(White, White), 0.001);
    EXPECT_NEAR(4.54, Colour_Contrast({118, 118, 118}, White), 0.01);
}

TEST(PanelTextColour, KeepsTheChosenColourOnLightThemes)
{
    for (Colour heading : Headings) {
        Colour c = Colour_ForText(heading, White, false);
        EXPECT_EQ(heading.red, c.red);
        EXPECT_EQ(heading.green, c.green);
        EXPECT_EQ(heading.blue, c.blue);
    }
}

TEST(PanelTextColour, IsReadableOnDarkThemes)
{
    for (Colour background : {Black, Colour{45, 45, 45}, Colour{56, 56, 56}}) {
        for (Colour heading : Headings)
            EXPECT_GE(Colour_Contrast(Colour_ForText(heading, background, true), background), 4.5);
    }
}

TEST(PanelTextColour, KeepsDarkAndBrightColoursApartOnDarkThemes)
{
    const Colour back = {53, 53, 53};
    Colour dark = Colour_ForText({0, 0, 128}, back, true);
    Colour bright = Colour_ForText({0, 0, 255}, back, true);
    EXPECT_GE(Colour_Contrast(dark, bright), 1.4);
}

TEST(PanelTextColour, KeepsTheHueOnDarkThemes)
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

TEST(PanelRowToRemove, FollowsTheCommand)
{
    const struct {
        int id, focused, row;
    } rows[] = {{ID_REMOVE_ROW, -1, 0},     {ID_REMOVE_ROW + 15, 2, 15}, {ID_REMOVE_ROW_END, 2, -1},
                {ID_REMOVE_ROW - 1, 2, -1}, {ID_REMOVE_FIELD, 2, 2},     {ID_REMOVE_FIELD, -1, 5}};
    for (const auto &row : rows)
        EXPECT_EQ(row.row, Panel_RowToRemove(row.id, row.focused, 5)) << row.id;
}

// tests/panel_rules_test.cpp - panes, tools and rows of the panel.
#include <gtest/gtest.h>

#include "ui/Ids.h"
#include "ui/PanelRules.h"

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

TEST(PanelRowToRemove, FollowsTheCommand)
{
    const struct {
        int id, focused, row;
    } rows[] = {{ID_REMOVE_ROW, -1, 0},     {ID_REMOVE_ROW + 15, 2, 15}, {ID_REMOVE_ROW_END, 2, -1},
                {ID_REMOVE_ROW - 1, 2, -1}, {ID_REMOVE_FIELD, 2, 2},     {ID_REMOVE_FIELD, -1, 5}};
    for (const auto &row : rows)
        EXPECT_EQ(row.row, Panel_RowToRemove(row.id, row.focused, 5)) << row.id;
}

#include <gtest/gtest.h>

#include "app/FrameRules.h"
#include "app/Ids.h"

static int IdOf(int key, bool alt, bool ctrl)
{
    const Shortcut *row = Frame_FindShortcut(key, alt, ctrl);
    return row ? row->id : 0;
}

TEST(FrameFindShortcut, TakesAltAndCtrlAlike)
{
    EXPECT_EQ(ID_MESSAGES, IdOf('M', true, false));
    EXPECT_EQ(ID_MESSAGES, IdOf('M', false, true));
    EXPECT_EQ(ID_SAVE, IdOf('B', true, false));
    EXPECT_EQ(ID_SAVE, IdOf('B', false, true));
    EXPECT_EQ(ID_SEARCH, IdOf('F', false, true));
}

TEST(FrameFindShortcut, FoldsLetters)
{
    EXPECT_EQ(ID_MESSAGES, IdOf('m', true, false));
    EXPECT_EQ(ID_SAVE, IdOf('b', false, true));
}

TEST(FrameFindShortcut, LeavesPlainLettersToTheControls)
{
    EXPECT_EQ(0, IdOf('M', false, false));
    EXPECT_EQ(0, IdOf('b', false, false));
}

TEST(FrameFindShortcut, LeavesOtherKeysAlone)
{
    EXPECT_EQ(0, IdOf(0, true, false)); // a modifier key alone, or a letter of another script
    EXPECT_EQ(0, IdOf('Z', true, false));
    EXPECT_EQ(0, IdOf(0xB5, true, true)); // AltGr+M on a German keyboard
    EXPECT_EQ(0, IdOf(-1, true, true));
}

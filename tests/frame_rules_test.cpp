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
    EXPECT_EQ(ID_OPEN, IdOf('O', true, false));
    EXPECT_EQ(ID_OPEN, IdOf('O', false, true));
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

TEST(FrameShortcutKey, IsTheKeyItself)
{
    EXPECT_EQ('M', Frame_ShortcutKey('M', 'M', 'M', true, false));
    EXPECT_EQ(9, Frame_ShortcutKey(9, 9, 0, false, false));
    EXPECT_EQ('Z', Frame_ShortcutKey('Z', 'Z', 'Y', false, true)); // a German keyboard
}

TEST(FrameShortcutKey, IsThePrintedLetterOfAKeyWithAnotherLetter)
{
    EXPECT_EQ('M', Frame_ShortcutKey(0, 0x44C, 'M', true, false)); // a Russian keyboard
    EXPECT_EQ('B', Frame_ShortcutKey(0, 0x3B2, 'B', false, true)); // a Greek one
    EXPECT_EQ(0, Frame_ShortcutKey(0, 0, 0, true, false));
}

TEST(FrameShortcutKey, LeavesWhatAltGrTypesToTheControl)
{
    EXPECT_EQ(0, Frame_ShortcutKey('M', 0xB5, 'M', true, true));
    EXPECT_EQ(0, Frame_ShortcutKey('Q', '@', 'Q', true, true));
    EXPECT_EQ(0, Frame_ShortcutKey(0, 0x20AC, 'E', true, true));
    EXPECT_EQ(0, Frame_ShortcutKey(0, 0, 'E', true, true));
}

TEST(FrameShortcutKey, TakesAltAndCtrlTogetherWhenTheyTypeNothingElse)
{
    EXPECT_EQ('M', Frame_ShortcutKey('M', 'M', 'M', true, true));
    EXPECT_EQ('M', Frame_ShortcutKey('M', 0, 'M', true, true));
    EXPECT_EQ('M', Frame_ShortcutKey('M', 13, 'M', true, true)); // Ctrl+M is that character
}

TEST(FrameLogCharacter, IsABlankForWhatCannotBeShown)
{
    for (uint32_t c : {0x0, 0x1, 0x9, 0xD, 0x1B, 0x1F, 0x7F, 0x80, 0x9F, 0xD800, 0xDFFF})
        EXPECT_EQ(uint32_t(' '), Frame_LogCharacter(c)) << c;
    for (uint32_t c : {0x20, 0x41, 0x7E, 0xA0, 0xFC, 0x44C, 0xD7FF, 0xE000, 0xFFFD})
        EXPECT_EQ(c, Frame_LogCharacter(c));
}

TEST(FrameFindShortcut, LeavesOtherKeysAlone)
{
    EXPECT_EQ(0, IdOf(0, true, false)); // a modifier key alone, or a letter of another script
    EXPECT_EQ(0, IdOf('Z', true, false));
    EXPECT_EQ(0, IdOf(0xB5, true, true)); // AltGr+M on a German keyboard
    EXPECT_EQ(0, IdOf(-1, true, true));
}

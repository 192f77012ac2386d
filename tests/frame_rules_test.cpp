#include <string>

#include <gtest/gtest.h>

#include "app/FrameRules.h"
#include "ui/Ids.h"

static int IdOf(int key, bool alt, bool ctrl, bool editMode = false)
{
    int id = 0;
    return Frame_FindShortcut(key, alt, ctrl, editMode, &id) ? id : 0;
}

static std::string LabelOf(int key, bool alt)
{
    int id = 0;
    const Shortcut *row = Frame_FindShortcut(key, alt, false, false, &id);
    return row ? row->label : "";
}

static const FrameSize Smallest = {800, 600}, Screen = {1920, 1080};

static void ExpectPlace(FrameGeometry expected, FrameGeometry stored, FrameSize desktop = Screen)
{
    FrameGeometry fit = Frame_FitGeometry(stored, Smallest, desktop);
    EXPECT_EQ(expected.x, fit.x);
    EXPECT_EQ(expected.y, fit.y);
    EXPECT_EQ(expected.width, fit.width);
    EXPECT_EQ(expected.height, fit.height);
}

TEST(FrameFitGeometry, KeepsAPlaceOnTheDesktop)
{
    ExpectPlace({50, 50, 800, 600}, {50, 50, 800, 600});
    ExpectPlace({1120, 480, 800, 600}, {1120, 480, 800, 600}); // just at the edges
    ExpectPlace({0, 0, 1920, 1080}, {0, 0, 1920, 1080});
}

TEST(FrameFitGeometry, RaisesASmallSize)
{
    ExpectPlace({10, 20, 800, 600}, {10, 20, 300, 599});
}

TEST(FrameFitGeometry, PullsTheWindowBackOntoTheDesktop)
{
    ExpectPlace({1120, 100, 800, 600}, {1800, 100, 800, 600});
    ExpectPlace({100, 480, 800, 600}, {100, 5000, 800, 600});
    ExpectPlace({0, 0, 900, 700}, {-5, -300, 900, 700});
}

TEST(FrameFitGeometry, IsNoLargerThanTheDesktop)
{
    ExpectPlace({0, 0, 1920, 1080}, {50, 50, 4000, 3000});
    ExpectPlace({0, 0, 640, 480}, {50, 50, 800, 600}, {640, 480});
}

TEST(FrameToolIconSize, IsSixteenWithoutALargerSetting)
{
    EXPECT_EQ(16, Frame_ToolIconSize(nullptr));
    EXPECT_EQ(16, Frame_ToolIconSize(""));
    EXPECT_EQ(16, Frame_ToolIconSize("16"));
    EXPECT_EQ(16, Frame_ToolIconSize("-24"));
    EXPECT_EQ(16, Frame_ToolIconSize("large"));
}

TEST(FrameToolIconSize, IsALittleMoreThanALargerSetting)
{
    EXPECT_EQ(21, Frame_ToolIconSize("17"));
    EXPECT_EQ(28, Frame_ToolIconSize("24"));
    EXPECT_EQ(260, Frame_ToolIconSize("100000")); // and leaves room for the list
}

TEST(FrameFindShortcut, HasACommandForEachMode)
{
    struct {
        int key;
        int listId, editId;
    } const rows[] = {
        {'A', ID_NEW_ENTRY, ID_NEW_FIELD},
        {'D', ID_REMOVE_ENTRY, ID_REMOVE_FIELD},
        {'N', ID_RENAME_ENTRY, ID_RENAME_FIELD},
        {'E', ID_EDIT_ENTRY, ID_EDIT_FIELD},
        {'S', ID_STRINGS, ID_STRINGS},
        {'P', ID_PREAMBLE, ID_PREAMBLE},
        {'M', ID_MESSAGES, ID_MESSAGES},
        {'B', ID_SAVE, ID_SAVE},
        {'F', ID_SEARCH, ID_SEARCH},
        {'O', ID_OPEN, ID_OPEN},
    };
    for (const auto &row : rows) {
        EXPECT_EQ(row.listId, IdOf(row.key, true, false, false)) << row.key;
        EXPECT_EQ(row.listId, IdOf(row.key, false, true, false)) << row.key;
        EXPECT_EQ(row.editId, IdOf(row.key, true, false, true)) << row.key;
        EXPECT_EQ(row.editId, IdOf(row.key, false, true, true)) << row.key;
        EXPECT_EQ(0, IdOf(row.key, false, false, false)) << row.key;
        EXPECT_EQ(0, IdOf(row.key, false, false, true)) << row.key;
    }
}

TEST(FrameFindShortcut, TakesControlKeysWithoutModifier)
{
    EXPECT_EQ(ID_EDIT_ENTRY, IdOf(27, false, false, false));
    EXPECT_EQ(ID_COMMIT_ENTRY, IdOf(27, false, false, true));
    EXPECT_EQ(ID_CITE, IdOf(13, false, false, false));
    EXPECT_EQ(ID_CITE, IdOf(13, false, false, true));
    EXPECT_EQ(ID_EDIT_ENTRY, IdOf(9, false, false, false));
    EXPECT_EQ(ID_EDIT_ENTRY, IdOf(9, false, true, false));
}

TEST(FrameFindShortcut, LeavesTabToTheControlsWhileAnEntryIsEdited)
{
    EXPECT_EQ(0, IdOf(9, false, false, true));
    EXPECT_EQ(0, IdOf(9, false, true, true));
}

TEST(FrameFindShortcut, OpensTheManual)
{
    EXPECT_EQ(ID_HELP, IdOf(FRAME_KEY_F1, false, false, false));
    EXPECT_EQ(ID_HELP, IdOf(FRAME_KEY_F1, false, true, true));
}

TEST(FrameFindShortcut, FoldsLetters)
{
    EXPECT_EQ(ID_NEW_ENTRY, IdOf('a', true, false));
    EXPECT_EQ(ID_MESSAGES, IdOf('m', true, false));
    EXPECT_EQ(ID_SAVE, IdOf('b', false, true));
    EXPECT_EQ(0, IdOf('b', false, false));
}

TEST(FrameFindShortcut, NamesTheCommandForTheLog)
{
    EXPECT_EQ("Insert \\cite ...", LabelOf(13, false));
    EXPECT_EQ("Delete Entry ...", LabelOf('D', true));
    EXPECT_EQ("Edit Entry ...", LabelOf(27, false));
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
        EXPECT_EQ(uint32_t(' '), Log_Character(c)) << c;
    for (uint32_t c : {0x20, 0x41, 0x7E, 0xA0, 0xFC, 0x44C, 0xD7FF, 0xE000, 0xFFFD})
        EXPECT_EQ(c, Log_Character(c));
}

TEST(FrameFindShortcut, LeavesOtherKeysAlone)
{
    EXPECT_EQ(0, IdOf(0, true, false)); // a modifier key alone, or a letter of another script
    EXPECT_EQ(0, IdOf('Z', true, false));
    EXPECT_EQ(0, IdOf(0xB5, true, true)); // AltGr+M on a German keyboard
    EXPECT_EQ(0, IdOf(-1, true, true));
}

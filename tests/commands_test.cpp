// tests/commands_test.cpp - the table of commands: keys, tools, help.
#include <gtest/gtest.h>

#include <set>
#include <string>

#include "encoding/Encoding.h"
#include "store/BibStore.h"
#include "tests/support/TempFolder.h"
#include "ui/Commands.h"
#include "ui/Ids.h"

// --- The keyboard ---

static int IdOf(int key, bool alt, bool ctrl, bool editMode = false)
{
    const Command *command = Command_Find(key, alt, ctrl, editMode);
    return command ? command->id : 0;
}

static std::string LabelOf(int key, bool alt)
{
    const Command *command = Command_Find(key, alt, false, false);
    return command ? command->keyLabel : "";
}

TEST(CommandFind, HasACommandForEachMode)
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

TEST(CommandFind, TakesControlKeysWithoutModifier)
{
    EXPECT_EQ(ID_EDIT_ENTRY, IdOf(27, false, false, false));
    EXPECT_EQ(ID_COMMIT_ENTRY, IdOf(27, false, false, true));
    EXPECT_EQ(ID_CITE, IdOf(13, false, false, false));
    EXPECT_EQ(ID_CITE, IdOf(13, false, false, true));
    EXPECT_EQ(ID_EDIT_ENTRY, IdOf(9, false, false, false));
    EXPECT_EQ(ID_EDIT_ENTRY, IdOf(9, false, true, false));
}

TEST(CommandFind, LeavesTabToTheControlsWhileAnEntryIsEdited)
{
    EXPECT_EQ(0, IdOf(9, false, false, true));
    EXPECT_EQ(0, IdOf(9, false, true, true));
}

TEST(CommandFind, OpensTheManual)
{
    EXPECT_EQ(ID_HELP, IdOf(COMMAND_KEY_F1, false, false, false));
    EXPECT_EQ(ID_HELP, IdOf(COMMAND_KEY_F1, false, true, true));
}

TEST(CommandFind, FoldsLetters)
{
    EXPECT_EQ(ID_NEW_ENTRY, IdOf('a', true, false));
    EXPECT_EQ(ID_MESSAGES, IdOf('m', true, false));
    EXPECT_EQ(ID_SAVE, IdOf('b', false, true));
    EXPECT_EQ(0, IdOf('b', false, false));
}

TEST(CommandFind, NamesTheCommandForTheLog)
{
    EXPECT_EQ("Insert \\cite ...", LabelOf(13, false));
    EXPECT_EQ("Delete Entry ...", LabelOf('D', true));
    EXPECT_EQ("Edit Entry ...", LabelOf(27, false));
}

TEST(CommandKey, IsTheKeyItself)
{
    EXPECT_EQ('M', Command_Key('M', 'M', 'M', true, false));
    EXPECT_EQ(9, Command_Key(9, 9, 0, false, false));
    EXPECT_EQ('Z', Command_Key('Z', 'Z', 'Y', false, true)); // a German keyboard
}

TEST(CommandKey, IsThePrintedLetterOfAKeyWithAnotherLetter)
{
    EXPECT_EQ('M', Command_Key(0, 0x44C, 'M', true, false)); // a Russian keyboard
    EXPECT_EQ('B', Command_Key(0, 0x3B2, 'B', false, true)); // a Greek one
    EXPECT_EQ(0, Command_Key(0, 0, 0, true, false));
}

TEST(CommandKey, LeavesWhatAltGrTypesToTheControl)
{
    EXPECT_EQ(0, Command_Key('M', 0xB5, 'M', true, true));
    EXPECT_EQ(0, Command_Key('Q', '@', 'Q', true, true));
    EXPECT_EQ(0, Command_Key(0, 0x20AC, 'E', true, true));
    EXPECT_EQ(0, Command_Key(0, 0, 'E', true, true));
}

TEST(CommandKey, TakesAltAndCtrlTogetherWhenTheyTypeNothingElse)
{
    EXPECT_EQ('M', Command_Key('M', 'M', 'M', true, true));
    EXPECT_EQ('M', Command_Key('M', 0, 'M', true, true));
    EXPECT_EQ('M', Command_Key('M', 13, 'M', true, true)); // Ctrl+M is that character
}

TEST(CommandFind, LeavesOtherKeysAlone)
{
    EXPECT_EQ(0, IdOf(0, true, false)); // a modifier key alone, or a letter of another script
    EXPECT_EQ(0, IdOf('Z', true, false));
    EXPECT_EQ(0, IdOf(0xB5, true, true)); // AltGr+M on a German keyboard
    EXPECT_EQ(0, IdOf(-1, true, true));
}

// --- The table ---

TEST(CommandTable, HasNoKeyTwiceInAMode)
{
    for (bool editMode : {false, true}) {
        std::set<int> keys;
        for (const Command *command = Commands; command < Commands + CommandCount; ++command)
            for (int key : editMode ? command->editKeys : command->listKeys)
                EXPECT_TRUE(key == 0 || keys.insert(key).second) << command->id << ": " << key;
    }
}

TEST(CommandTable, HasNoCommandTwice)
{
    std::set<int> ids;
    for (const Command *command = Commands; command < Commands + CommandCount; ++command)
        EXPECT_TRUE(ids.insert(command->id).second) << command->id;
}

TEST(CommandTable, LabelsWhatHasKeys)
{
    for (const Command *command = Commands; command < Commands + CommandCount; ++command)
        EXPECT_EQ(command->listKeys[0] != 0 || command->editKeys[0] != 0,
                  command->keyLabel != nullptr)
            << command->id;
}

TEST(CommandTable, HasTheToolsInTheirOrder)
{
    std::string tools;
    for (const Command *command = Commands; command < Commands + CommandCount; ++command)
        if (command->tool.label)
            tools += std::string(command->tool.label) + " ";
    EXPECT_EQ("Save Strings Preambles \\cite New Rename Delete Edit Messages Find Help About ",
              tools);
}

TEST(CommandTable, HasAPictureForEachTool)
{
    std::string resources = DEFAULT_INI;
    resources.erase(resources.rfind('/'));
    for (const Command *command = Commands; command < Commands + CommandCount; ++command)
        if (command->tool.icon) {
            std::string picture = resources + "/icons/" + command->tool.icon + ".svg";
            EXPECT_TRUE(Sys_FileExists(picture.c_str())) << picture;
        }
}

// --- Help ---

static const char Types[] = "[article]\n* = a paper.\n";

class CommandHelpText : public testing::Test
{
protected:
    CommandHelpText() { Bib_Initialize(); }

    TempFolder folder;
};

TEST_F(CommandHelpText, HelpsWithTheList)
{
    std::string ini = folder.Write("a.ini", Types);
    EXPECT_EQ("<Entry List> Mode Accelerators:\n"
              "\tAlt+E\tEdit an Entry (also ESC) - comes to <Entry Editing> mode,\n"
              "\tAlt+A\tAdd New Entry\n"
              "\tAlt+D\tDelete an Entry\n"
              "\tAlt+N\tRename an Entry\n"
              "\tAlt+S\tEdit Strings\n"
              "\tAlt+P\tEdit Preamble\n"
              "\tAlt+B\tSave Modified BIB files\n"
              "\tEnter\tInsert proper \\cite command into your document.",
              Command_HelpText(ini.c_str(), "article", false));
}

static const std::string EditingHelp =
    "<Entry Editing> mode Accelerators:\n"
    "\tESC\tReturn to <Entry List> mode.\n"
    "\tAlt+E\tEdits currently selected field in large window.\n"
    "\tAlt+A\tAdd new Field with key name specified in bottom combo box.\n"
    "\tAlt+D\tDelete currently selected field.\n"
    "\tAlt+N\tRename currently selected field (change field key).\n"
    "\tAlt+S\tEdit Strings. It is useful to insert into a field reference on string.\n"
    "\tAlt+P\tEdit Preamble.\n"
    "\tEnter\tInsert proper \\cite command into your document.\n";

TEST_F(CommandHelpText, HelpsWithEditing)
{
    std::string ini = folder.Write("a.ini", Types);
    EXPECT_EQ(EditingHelp + "`Article' entry is for a paper.",
              Command_HelpText(ini.c_str(), "Article", true));
    EXPECT_EQ(EditingHelp + "`talk' entry is for Custom Entry Type",
              Command_HelpText(ini.c_str(), "talk", true));
}

TEST_F(CommandHelpText, IsCutWhileAnEntryIsEdited)
{
    std::string prose(2000, 'x');
    std::string ini = folder.Write("a.ini", "[t]\n* = " + prose + "\n");
    EXPECT_EQ((EditingHelp + "`t' entry is for " + prose).substr(0, 1023),
              Command_HelpText(ini.c_str(), "t", true));
}

TEST_F(CommandHelpText, IsNotCutAmidALetter)
{
    Enc_Select("CP65001");
    std::string letters;
    for (int i = 0; i < 700; ++i)
        letters += "\xC3\xBC";
    for (std::string start : {"", "x"}) {
        std::string ini = folder.Write("a.ini", "[misc]\n* = " + start + letters + "\n");
        std::string text = Command_HelpText(ini.c_str(), "misc", true);
        EXPECT_TRUE(Enc_IsUtf8(text.data(), text.size()));
        EXPECT_LE(1022u, text.size());
    }
}

// tests/gui/keyboard_test.cpp - the keyboard as the user's keys reach the window, with real focus.

#include "tests/gui/GuiTest.h"

#include <wx/scrolwin.h>
#include <wx/srchctrl.h>

#include "base/Companion.h"
#include "ui/Cartulo.h"
#include "ui/Ids.h"
#include "ui/QListBox.h"

class Keyboard : public CartuloWindow
{
protected:
    void SetUp() override
    {
        Open(folder.Write("a.bib", "@book{one, title = {First}, note = {Note}}\n"
                                   "@book{two, title = {Second}, note = {Note}}\n"));
        ASSERT_TRUE(WaitForKeys(List()));
    }
};

TEST_F(Keyboard, StartsInTheListAndFindsAKey)
{
    SendText(List(), "tw");
    EXPECT_TRUE(WaitFor([this] { return List()->GetSelection() == 1; }));
    EXPECT_EQ((Field{"title", "Second"}), ShownFields().at(0));
}

TEST_F(Keyboard, MovesThroughTheListWithTheArrows)
{
    SendKey(List(), WXK_DOWN);
    EXPECT_TRUE(WaitFor([this] { return List()->GetSelection() == 1; }));
    EXPECT_EQ((Field{"title", "Second"}), ShownFields().at(0));
}

TEST_F(Keyboard, SearchesWithEnterInTheSearchField)
{
    SendKey(List(), 'F', wxMOD_CONTROL);
    SendText(Search(), "second");
    EXPECT_TRUE(WaitFor([this] { return List()->GetItemCount() == 1; }));
    for (int key : {int(WXK_RETURN), int(WXK_NUMPAD_ENTER)}) {
        ForgetLog();
        SendKey(Search(), key);
        std::vector<LogLine> log;
        EXPECT_TRUE(WaitFor([&] {
            for (const LogLine &line : TakeLog("INFO: Cartulo::On"))
                log.push_back(line);
            return !log.empty();
        })) << key;
        EXPECT_EQ((std::vector<LogLine>{{"INFO: Cartulo::OnSearch second", TNS_ACTION}}), log);
    }
}

TEST_F(Keyboard, SearchesWithCtrlFAndGoesDownIntoTheList)
{
    SendKey(List(), 'F', wxMOD_CONTROL);
    SendText(Search(), "second");
    EXPECT_TRUE(WaitFor([this] { return List()->GetItemCount() == 1; }));
    SendKey(Search(), WXK_DOWN);
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
    EXPECT_EQ(0, List()->GetSelection());
}

TEST_F(Keyboard, ShowsTheMessagesFromTheSearchField)
{
    Search()->SetFocus();
    wxString text;
    wxTEST_DIALOG((SendKey(Search(), 'M', wxMOD_ALT), WaitFor([&] { return !text.empty(); })),
                  ExpectMessages("There is no any messages related with loading BIB-files", &text));
    EXPECT_FALSE(text.empty());
}

// The pane goes while a button of it has the focus.
TEST_F(Keyboard, KeepsWorkingWhenTheOpenPaneGoes)
{
    frame->TakeCommand("");
    ASSERT_TRUE(WaitFor([this] { return IsShowing(ID_OPEN); }));
    Panel()->FindWindow(ID_OPEN)->SetFocus();
    ASSERT_TRUE(WaitForKeys(Panel()->FindWindow(ID_OPEN)));
    frame->TakeCommand(folder.Path("a.bib").c_str());
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
    SendText(List(), "tw");
    EXPECT_TRUE(WaitFor([this] { return List()->GetSelection() == 1; }));
}

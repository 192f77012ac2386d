// The keyboard as the user's keys reach the window, with real focus.

#include "tests/gui/GuiTest.h"

#include <wx/scrolwin.h>
#include <wx/srchctrl.h>
#include <wx/uiaction.h>

#include "app/Ids.h"
#include "ui/Cartulo.h"
#include "ui/QListBox.h"

class Keyboard : public CartuloWindow
{
protected:
    void SetUp() override
    {
        Open(folder.Write("a.bib", "@book{one, title = {First}, note = {Note}}\n"
                                   "@book{two, title = {Second}, note = {Note}}\n"));
        ASSERT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
    }

    bool FocusIsInEntryPane() const
    {
        wxWindow *focus = wxWindow::FindFocus();
        return focus && EntryPane()->IsDescendant(focus);
    }

    wxUIActionSimulator keys;
};

TEST_F(Keyboard, StartsInTheListAndFindsAKey)
{
    keys.Text("tw");
    EXPECT_TRUE(WaitFor([this] { return List()->GetSelection() == 1; }));
    EXPECT_EQ((Field{"title", "Second"}), ShownFields().at(0));
}

TEST_F(Keyboard, MovesThroughTheListWithTheArrows)
{
    keys.Char(WXK_DOWN);
    EXPECT_TRUE(WaitFor([this] { return List()->GetSelection() == 1; }));
    EXPECT_EQ((Field{"title", "Second"}), ShownFields().at(0));
}

TEST_F(Keyboard, LeavesTheListWithTab)
{
    keys.Char(WXK_TAB);
    EXPECT_TRUE(WaitFor([this] { return FocusIsInEntryPane(); }));
}

TEST_F(Keyboard, SearchesWithCtrlFAndGoesBackToTheListWithTab)
{
    keys.Char('F', wxMOD_CONTROL);
    ASSERT_TRUE(WaitFor([this] { return Search()->HasFocus(); }));
    keys.Text("second");
    EXPECT_TRUE(WaitFor([this] { return List()->GetItemCount() == 1; }));
    keys.Char(WXK_TAB);
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
}

TEST_F(Keyboard, ShowsTheMessagesFromEveryControl)
{
    EntryPane()->SetFocus();
    ASSERT_TRUE(WaitFor([this] { return FocusIsInEntryPane(); }));
    wxString text;
    wxTEST_DIALOG((keys.Char('M', wxMOD_ALT), WaitFor([&] { return !text.empty(); })),
                  ExpectMessages("There is no any messages related with loading BIB-files", &text));
    EXPECT_FALSE(text.empty());
}

TEST_F(Keyboard, KeepsWorkingWhenTheRowWithTheFocusIsHidden)
{
    keys.Char(WXK_TAB);
    ASSERT_TRUE(WaitFor([this] { return FocusIsInEntryPane(); }));
    Panel()->ProcessCommand(folder.Write("new.bib", "").c_str(), "test");
    EXPECT_TRUE(ShownFields().empty());
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
}

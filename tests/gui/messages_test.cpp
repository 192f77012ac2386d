// tests/gui/messages_test.cpp - the window with the messages of loading.

#include "tests/gui/DialogTest.h"

#include <wx/clipbrd.h>
#include <wx/settings.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "ui/Cartulo.h"
#include "ui/Colours.h"
#include "ui/Ids.h"
#include "ui/PanelRules.h"

using Lines = std::vector<LogLine>;

static const char Broken[] = "@book{one, title = {First} year = 3}\n";

class Messages : public CartuloWindow
{
protected:
    void OpenClean() { Open(folder.Write("a.bib", "@book{one, title = {First}}\n")); }

    // The heading for that many errors and warnings.
    void ExpectHeading(int errors, int warnings, const wxString &text, const Colour &colour)
    {
        BibFile *file = Panel()->Files()->files[0];
        file->errorCount = errors;
        file->warningCount = warnings;
        Cartulo_Messages dialog(frame, Panel()->Files());
        wxStaticText *heading = FirstChild<wxStaticText>(&dialog);
        EXPECT_EQ(text, heading->GetLabelText());
        wxColour back = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
        Colour shown = Colour_ForText(colour, {back.Red(), back.Green(), back.Blue()},
                                      wxSystemSettings::GetAppearance().IsUsingDarkBackground());
        EXPECT_EQ(wxColour(shown.red, shown.green, shown.blue), heading->GetForegroundColour());
    }
};

TEST_F(Messages, StandInAFixedWidthFont)
{
    OpenClean();
    auto look = [](Cartulo_Messages &dialog) {
        EXPECT_EQ("Bibliography File Loading Error Messages", dialog.GetTitle());
        EXPECT_EQ(10, dialog.GetFont().GetPointSize());
        wxTextCtrl *text = Find<wxTextCtrl>(dialog, 6001);
        EXPECT_TRUE(text->GetFont().IsFixedWidth());
        EXPECT_EQ(dialog.FromDIP(wxSize(600, 200)), text->GetMinSize());
        EXPECT_TRUE(text->IsMultiLine());
        EXPECT_FALSE(text->IsEditable());
        EXPECT_TRUE(dialog.FindWindow(wxID_OK));
        ExpectRoom(dialog);
    };
    ForgetLog();
    wxTEST_DIALOG(Run(ID_MESSAGES), UseDialog<Cartulo_Messages>(look));
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnShowMessages", TNS_ACTION}}),
              TakeLog("INFO: Cartulo::OnShowMessages"));
}

TEST_F(Messages, CanBeCopied)
{
    wxTEST_DIALOG((Open(folder.Write("a.bib", Broken)), HandleQueuedEvents()),
                  ExpectMessages("There are errors in loading BIB files"));
    auto copy = [](Cartulo_Messages &dialog) {
        wxTextCtrl *text = Find<wxTextCtrl>(dialog, 6001);
        text->SelectAll();
        text->Copy();
        wxClipboardLocker lock;
        wxTextDataObject data;
        EXPECT_TRUE(wxTheClipboard->GetData(data));
        EXPECT_EQ(text->GetValue(), data.GetText());
        EXPECT_TRUE(data.GetText().Contains("SYNTAX ERROR: line 1: "));
    };
    wxTEST_DIALOG(Run(ID_MESSAGES), UseDialog<Cartulo_Messages>(copy));
}

TEST_F(Messages, LogTheirEnd)
{
    OpenClean();
    ForgetLog();
    wxTEST_DIALOG(Run(ID_MESSAGES), UseDialog<Cartulo_Messages>([](Cartulo_Messages &dialog) {
                      EXPECT_TRUE(PressOK(dialog));
                  }));
    EXPECT_EQ((Lines{{"INFO: Cartulo_Messages::OnOK", TNS_ACTION}}),
              TakeLog("INFO: Cartulo_Messages"));
}

// Runs on a light and on a dark desktop.
TEST_F(Messages, HaveHeadingsInColours)
{
    OpenClean();
    ExpectHeading(1, 1, "There are errors in loading BIB files", {200, 0, 0});
    ExpectHeading(0, 1, "There are warnings in loading BIB files", {0, 128, 0});
    ExpectHeading(0, 0, "There is no any messages related with loading BIB-files", {0, 0, 128});
}

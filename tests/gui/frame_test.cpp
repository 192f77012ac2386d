// tests/gui/frame_test.cpp - the main frame: tools, place and size, keys, help, commands of other
// programs, closing.

#include "tests/gui/GuiTest.h"

#include <cstdlib>
#include <cstring>

#include <sys/stat.h>

#include <wx/settings.h>
#include <wx/srchctrl.h>
#include <wx/app.h>
#include <wx/textctrl.h>
#include <wx/toolbar.h>
#include <wx/utils.h>

#include "app/AboutDlg.h"
#include "base/Companion.h"
#include "ui/Cartulo.h"
#include "ui/Icons.h"
#include "ui/Ids.h"
#include "ui/Native.h"
#include "ui/QListBox.h"

static const char OneEntry[] = "@book{one, title = {First}}\n";
static const char Broken[] = "@book{one, title = {First}}\n@book{two\n";

using Lines = std::vector<LogLine>;

class Frame : public CartuloWindow
{
protected:
    void SetUp() override
    {
        setenv("XDG_CONFIG_HOME", folder.Path().c_str(), 1);
        setenv("XDG_DATA_HOME", folder.Path("data").c_str(), 1);
    }

    void Send(int id)
    {
        wxCommandEvent event(wxEVT_MENU, id);
        frame->ProcessWindowEvent(event);
    }

    // As a button of the panel does that has this number.
    void SendFromButton(int id)
    {
        wxCommandEvent event(wxEVT_BUTTON, id);
        Panel()->ProcessWindowEvent(event);
    }

    // A program for the frame to start, which leaves its arguments in a file.
    void WriteProgram(const char *name)
    {
        ASSERT_EQ(0, mkdir(folder.Path("data").c_str(), 0700));
        ASSERT_EQ(0, mkdir(folder.Path("data/cartulo").c_str(), 0700));
        ASSERT_EQ(0, mkdir(folder.Path("data/cartulo/bin").c_str(), 0700));
        std::string path =
            folder.Write(std::string("data/cartulo/bin/") + name,
                         "#!/bin/sh\nprintf '<%s>' \"$@\" >'" + folder.Path("half") + "'\nmv '" +
                             folder.Path("half") + "' '" + folder.Path("arguments") + "'\n");
        ASSERT_EQ(0, chmod(path.c_str(), 0700));
    }
};

// --- Tools ---

struct Tool {
    int id;
    wxString label, tip;
    bool operator==(const Tool &o) const { return id == o.id && label == o.label && tip == o.tip; }
};

static void PrintTo(const Tool &tool, std::ostream *out)
{
    *out << tool.id << ' ' << tool.label << ": " << tool.tip;
}

static std::vector<Tool> ToolsOf(wxFrame *frame)
{
    std::vector<Tool> tools;
    wxToolBar *bar = frame->GetToolBar();
    for (size_t i = 0; i < bar->GetToolsCount(); ++i) {
        const wxToolBarToolBase *tool = bar->GetToolByPos(int(i));
        wxString tip =
            tool->IsControl() ? tool->GetControl()->GetToolTipText() : tool->GetShortHelp();
        tools.push_back({tool->GetId(), tool->GetLabel(), tip});
    }
    return tools;
}

static const Tool MessagesTool = {
    ID_MESSAGES, "Messages", "Show error/warning messages of loading current BIB-file (Alt+M)"};

static const std::vector<Tool> Tools = {
    {ID_SAVE, "Save", "Save All BIB files."},
    {ID_STRINGS, "Strings", "Edit/Insert Strings [Abbreviations] (Alt+S)"},
    {ID_PREAMBLE, "Preambles", "Edit Preamble (Alt+P)"},
    {ID_CITE, "\\cite", "Inserts `\\cite' command into the currently edited (La)TeX file (ENTER)"},
    {ID_NEW_ENTRY, "New", "Add new Bibliography entry (Alt+A)"},
    {ID_RENAME_ENTRY, "Rename", "Rename currently selected entry (Alt+N)"},
    {ID_REMOVE_ENTRY, "Delete", "Remove currently selected entry (Alt+D)"},
    {ID_EDIT_ENTRY, "Edit", "Edit currently selected entry (Alt+E,ESC,TAB)"},
    {ID_SEARCH, "Find", "Enter string to find entries"},
    {ID_HELP, "Help", "Help on using Cartulo"},
    {ID_ABOUT, "About", "About Cartulo"}};

TEST_F(Frame, HasItsToolsInOrder)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_EQ(Tools, ToolsOf(frame));
}

TEST_F(Frame, HasAToolForTheMessagesOfItsFirstFiles)
{
    std::vector<Tool> expected = Tools;
    expected.insert(expected.begin() + 8, MessagesTool);
    wxTEST_DIALOG(Open(folder.Write("a.bib", Broken)),
                  ExpectMessages("There are errors in loading BIB files"));
    EXPECT_EQ(expected, ToolsOf(frame));
}

TEST_F(Frame, ShowsTheMessagesOfLaterFilesWithoutATool)
{
    Open(folder.Write("a.bib", OneEntry));
    frame->TakeCommand(folder.Write("b.bib", Broken).c_str());
    ExpectMessages messages("There are errors in loading BIB files");
    wxTEST_DIALOG(HandleQueuedEvents(), messages);
    EXPECT_EQ(Tools, ToolsOf(frame));
    wxTEST_DIALOG(PressShortcut('M', true, false), messages);
}

TEST_F(Frame, LogsThatItShowsTheMessages)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_EQ(Lines(), TakeLog("INFO: Forcing"));
    frame->TakeCommand(folder.Write("b.bib", Broken).c_str());
    EXPECT_EQ((Lines{{"INFO: Forcing displayign messages box. ", TNS_LIFECYCLE}}),
              TakeLog("INFO: Forcing"));
    wxTEST_DIALOG(HandleQueuedEvents(), ExpectMessages("There are errors in loading BIB files"));
}

TEST_F(Frame, LogsASearch)
{
    Open(folder.Write("a.bib", OneEntry));
    ForgetLog();
    SearchFor("First");
    EXPECT_EQ((Lines{{"INFO: MyFrame::OnSearch ", TNS_ACTION}}), TakeLog("INFO: MyFrame::"));
}

TEST_F(Frame, StartsWithNothingToSave)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_FALSE(ToolEnabled(ID_SAVE));
    Change(0, "Changed");
    EXPECT_TRUE(ToolEnabled(ID_SAVE));
}

TEST_F(Frame, CitesOnlyForACompanionWithAService)
{
    Open(folder.Write("a.bib", OneEntry) + " -w123");
    EXPECT_FALSE(ToolEnabled(ID_CITE));
    frame->TakeCommand((folder.Path("a.bib") + " -w123/Srv").c_str());
    EXPECT_TRUE(ToolEnabled(ID_CITE));
}

TEST_F(Frame, CitesForTheCompanionThatItIsStartedWith)
{
    Open(folder.Write("a.bib", OneEntry) + " -w123/Srv");
    EXPECT_TRUE(ToolEnabled(ID_CITE));
}

TEST_F(Frame, HasToolsOfTheSizeThatTheEnvironmentAsksFor)
{
    ASSERT_EQ(0, mkdir(folder.Path("Cartulo").c_str(), 0700));
    folder.Write("Cartulo/environment.ini", "[Common]\nTOOLSIZE=24\n");
    Open("");
    EXPECT_EQ((Lines{{"INFO: Cartulo toolbar size: 24", TNS_LIFECYCLE}}),
              TakeLog("INFO: Cartulo toolbar size: "));
    EXPECT_EQ(wxSize(28, 28), frame->GetToolBar()->GetToolBitmapSize());
}

TEST_F(Frame, HasSmallToolsOtherwise)
{
    Open("");
    EXPECT_EQ(wxSize(16, 16), frame->GetToolBar()->GetToolBitmapSize());
    EXPECT_TRUE(TakeLog("INFO: Cartulo toolbar size: ").empty());
}

// 1 when the tool bar shows the search field as a whole.
static bool ShowsSearch(MyFrame *frame, wxWindow *search)
{
    return Native_IsMapped(search) &&
           search->GetScreenRect().GetRight() <= frame->GetScreenRect().GetRight();
}

TEST_F(Frame, KeepsItsSearchFieldInTheNarrowestWindow)
{
    wxTEST_DIALOG(Open(folder.Write("a.bib", Broken)), // with the tool for messages
                  ExpectMessages("There are errors in loading BIB files"));
    ASSERT_TRUE(WaitFor([this] { return !frame->IsNew(); }));
    int width = Search()->GetSize().x;
    frame->SetSize(frame->GetMinSize());
    ASSERT_TRUE(WaitFor([this] { return frame->GetSize() == frame->GetMinSize(); }));
    EXPECT_TRUE(WaitFor([this] { return ShowsSearch(frame, Search()); }));
    EXPECT_LT(Search()->GetSize().x, width);
    PressShortcut('F', true, false);
    EXPECT_EQ("", Status());

    frame->SetSize(900, 600);
    EXPECT_TRUE(WaitFor([&] { return Search()->GetSize().x == width; }));
}

TEST_F(Frame, LeavesTheFocusWhereThereIsNoRoomForTheSearchField)
{
    ASSERT_EQ(0, mkdir(folder.Path("Cartulo").c_str(), 0700));
    folder.Write("Cartulo/environment.ini", "[Common]\nTOOLSIZE=100\n");
    Open(folder.Write("a.bib", OneEntry));
    ASSERT_TRUE(WaitFor([this] { return !Native_IsMapped(Search()); }));
    ASSERT_TRUE(WaitForKeys(List()));
    PressShortcut('F', true, false);
    EXPECT_TRUE(List()->HasFocus());
    EXPECT_EQ("The window is too narrow for the search field.", Status());
}

// --- Looks ---

TEST_F(Frame, HasTheIconOfTheProgram)
{
    Open("");
    wxIconBundle expected = Icon_Program(), icons = frame->GetIcons();
    ASSERT_LT(0u, expected.GetIconCount());
    ASSERT_EQ(expected.GetIconCount(), icons.GetIconCount());
    for (size_t i = 0; i < icons.GetIconCount(); ++i) {
        wxImage image = wxBitmap(icons.GetIconByIndex(i)).ConvertToImage();
        wxImage own = wxBitmap(expected.GetIconByIndex(i)).ConvertToImage();
        ASSERT_EQ(own.GetSize(), image.GetSize());
        EXPECT_EQ(0, memcmp(own.GetData(), image.GetData(), 3 * own.GetWidth() * own.GetHeight()));
    }
}

// Runs on desktops of different fonts.
TEST_F(Frame, HasAFontOfTenPoints)
{
    Open("");
    EXPECT_EQ(10, frame->GetFont().GetPointSize());
    if (const char *size = getenv("CARTULO_TEST_FONT")) {
        wxFont desktop = wxSystemSettings::GetFont(wxSYS_DEFAULT_GUI_FONT);
        EXPECT_EQ(atoi(size), desktop.GetPointSize()) << "not the desktop that this run needs";
    }
}

// --- Place and size ---

class Place : public Frame
{
protected:
    void Store(int x, int y, int w, int h)
    {
        Config()->Write("/MainWindow/x", x);
        Config()->Write("/MainWindow/y", y);
        Config()->Write("/MainWindow/w", w);
        Config()->Write("/MainWindow/h", h);
    }

    wxRect Stored()
    {
        auto read = [this](const char *key) { return int(Config()->ReadLong(key, -1)); };
        return wxRect(read("/MainWindow/x"), read("/MainWindow/y"), read("/MainWindow/w"),
                      read("/MainWindow/h"));
    }

    void ExpectAt(const wxRect &place)
    {
        EXPECT_TRUE(WaitFor([&] { return frame->GetRect() == place; }))
            << frame->GetPosition().x << ' ' << frame->GetPosition().y << ' ' << frame->GetSize().x
            << ' ' << frame->GetSize().y;
    }
};

TEST_F(Place, IsInTheCornerTheFirstTime)
{
    Open("");
    ExpectAt({50, 50, 800, 600});
}

TEST_F(Place, IsThatOfTheLastRun)
{
    Store(120, 90, 900, 700);
    Open("");
    ExpectAt({120, 90, 900, 700});
    ASSERT_TRUE(WaitFor([this] { return !frame->IsNew(); }));
    frame->SetSize(wxRect(200, 150, 850, 650));
    ExpectAt({200, 150, 850, 650});
    Close();
    EXPECT_EQ(wxRect(200, 150, 850, 650), Stored());
    EXPECT_EQ(0, Config()->ReadLong("/MainWindow/Max", -1));
    Open("");
    ExpectAt({200, 150, 850, 650});
    Close();
    EXPECT_EQ(wxRect(200, 150, 850, 650), Stored());
}

TEST_F(Place, IsNotTooSmall)
{
    Store(100, 100, 300, 10);
    Open("");
    ExpectAt({100, 100, 800, 600});
}

TEST_F(Place, IsOnTheDesktop)
{
    wxSize desktop = wxGetDisplaySize();
    Store(5000, -40, 900, 700);
    Open("");
    ExpectAt({desktop.x - 900, 0, 900, 700});
}

TEST_F(Place, IsKeptWhenTheWindowClosesFromTheTaskBar)
{
    Store(120, 90, 900, 700);
    Config()->Write("/MainWindow/Max", 7); // nothing is written at all
    Open("");
    ExpectAt({120, 90, 900, 700});
    frame->Iconize();
    ASSERT_TRUE(WaitFor([this] { return frame->IsIconized(); }));
    Close();
    EXPECT_EQ(wxRect(120, 90, 900, 700), Stored());
    EXPECT_EQ(7, Config()->ReadLong("/MainWindow/Max", -1));
}

TEST_F(Place, IsKeptWhenTheWindowFillsTheScreen)
{
    Store(120, 90, 900, 700);
    Open("");
    ExpectAt({120, 90, 900, 700});
    frame->Maximize();
    ASSERT_TRUE(WaitFor([this] { return frame->IsMaximized(); }));
    Close();
    EXPECT_EQ(wxRect(120, 90, 900, 700), Stored());
    EXPECT_EQ(1, Config()->ReadLong("/MainWindow/Max", -1));
    Open("");
    EXPECT_FALSE(frame->IsMaximized());
    ExpectAt({120, 90, 900, 700});
    Close();
    EXPECT_EQ(0, Config()->ReadLong("/MainWindow/Max", -1));
}

TEST_F(Place, IsTheUsersOnceTheWindowIsOpen)
{
    Open("");
    ExpectAt({50, 50, 800, 600});
    ASSERT_TRUE(WaitFor([this] { return !frame->IsNew(); }));
    frame->SetSize(wxRect(300, 200, 810, 610));
    // A window manager may answer in two steps, so the window may be elsewhere for a moment; but
    // never where the last run left it.
    EXPECT_FALSE(WaitFor([this] { return frame->GetRect() == wxRect(50, 50, 800, 600); }, 200));
    ExpectAt({300, 200, 810, 610});
}

TEST_F(Place, IsLoggedAtTheEnd)
{
    Open("");
    Close();
    EXPECT_EQ((Lines{{"INFO: MyFrame::~MyFrame Begin", TNS_LIFECYCLE},
                     {"INFO: MyFrame::~MyFrame End", TNS_LIFECYCLE}}),
              TakeLog("INFO: MyFrame::~MyFrame"));
}

// --- Keys ---

TEST_F(Frame, TakesTheKeypadsEnterForEnter)
{
    Open(folder.Write("a.bib", OneEntry));
    for (int key : {int(WXK_RETURN), int(WXK_NUMPAD_ENTER)}) {
        ForgetLog();
        PressShortcut(key, false, false);
        EXPECT_EQ((Lines{{"INFO: Cartulo::OnInsertCite", TNS_ACTION}}), TakeLog("INFO: Cartulo::"));
    }
}

TEST_F(Frame, NamesTheCommandOfAKeyInTheLog)
{
    Open(folder.Write("a.bib", OneEntry));
    ForgetLog();
    wxTEST_DIALOG(PressShortcut('d', true, false), ExpectBox("Removing Entry", "one (a)", wxID_NO));
    EXPECT_EQ((Lines{{"INFO: MyFrame::OnCharHook Key=100(d),Mod=1", TNS_LIFECYCLE},
                     {"INFO: MyFrame::OnCharHook Delete Entry ...", TNS_LIFECYCLE}}),
              TakeLog("INFO: MyFrame::OnCharHook"));
}

// --- Help and About ---

TEST_F(Frame, StartsTheHelpProgramWithItsTopic)
{
    WriteProgram("metahelp");
    Open("");
    PressShortcut(WXK_F1, false, true);
    EXPECT_EQ(
        (Lines{{"INFO: Running \"" + folder.Path("data/cartulo/bin/metahelp") + "\" .QRL.Cartulo",
                TNS_LIFECYCLE}}),
        TakeLog("INFO: Running "));
    ASSERT_TRUE(WaitFor([this] { return folder.Names().count("arguments") != 0; }));
    EXPECT_EQ("<.QRL.Cartulo>", folder.Read("arguments"));
}

TEST_F(Frame, SaysThatThereIsNoHelpProgram)
{
    setenv("PATH", folder.Path().c_str(), 1);
    Open("");
    Send(ID_HELP);
    EXPECT_EQ((Lines{{"ERROR: MyFrame::OnHelp Can't find <Program>metahelp", TNS_ERROR}}),
              TakeLog("ERROR: MyFrame::OnHelp"));
    EXPECT_EQ("ERROR: The help program \"metahelp\" can't be found.", Status());
    frame->SetStatusText("");
    SendFromButton(ID_HELP);
    EXPECT_EQ("ERROR: The help program \"metahelp\" can't be found.", Status());
}

TEST_F(Frame, ShowsTheAboutBox)
{
    Open("");
    wxTEST_DIALOG(Send(ID_ABOUT), wxExpectDismissableModal<AboutDlg>(wxID_CANCEL));
    wxTEST_DIALOG(SendFromButton(ID_ABOUT), wxExpectDismissableModal<AboutDlg>(wxID_CANCEL));
}

TEST_F(Frame, HasNoContextMenuYet)
{
    Open("");
    Send(ID_CONTEXT_MENU); // returns
    EXPECT_TRUE(TakeLog("ERROR").empty());
}

// --- Commands of other programs ---

TEST_F(Frame, TakesCommandsWhileNothingIsAsked)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_TRUE(frame->MayTakeCommand());
    frame->TakeCommand(folder.Write("b.bib", "@misc{two, note = {Second}}\n").c_str());
    EXPECT_EQ((std::vector<wxString>{"two (b)"}), Rows());
    EXPECT_EQ((std::vector<Field>{{"note", "Second"}}), ShownFields());
    EXPECT_EQ("There are 1 bibliography entries in 1 BIB files.", Status());
}

// Whether a command may come while the dialog is open, which is closed then.
template <class Dialog> static bool MayTakeCommandDuring(MyFrame *frame, Dialog *dialog)
{
    AllowDialogs allow;
    bool may = false;
    wxTheApp->CallAfter([&] {
        may = frame->MayTakeCommand();
        dialog->EndModal(wxID_CANCEL);
    });
    dialog->ShowModal();
    return may;
}

TEST_F(Frame, TakesCommandsOverDialogsThatOnlyShowSomething)
{
    Open("");
    AboutDlg about(frame);
    EXPECT_TRUE(MayTakeCommandDuring(frame, &about));
    Cartulo_Messages messages(frame, Panel()->Files());
    EXPECT_TRUE(MayTakeCommandDuring(frame, &messages));
}

TEST_F(Frame, TakesNoCommandsUnderADialogThatAsks)
{
    Open("");
    wxDialog dialog(frame, wxID_ANY, "Question");
    EXPECT_FALSE(MayTakeCommandDuring(frame, &dialog));
    EXPECT_TRUE(frame->MayTakeCommand());
}

TEST_F(Frame, TakesNoCommandOnceItIsClosed)
{
    Open("");
    frame->Close();
    ASSERT_TRUE(frame);
    EXPECT_FALSE(frame->MayTakeCommand());
    DeleteClosedWindows();
}

// The first messages stay open while a command brings more.
TEST_F(Frame, AddsTheMessagesOfACommandToThoseThatAreShown)
{
    Open(folder.Write("a.bib", OneEntry));
    AllowDialogs allow;
    int opened = 0;
    wxString text;
    wxTheApp->CallAfter([&] {
        frame->TakeCommand(folder.Path("missing.bib").c_str());
        HandleQueuedEvents();
        for (wxWindow *window : wxTopLevelWindows) {
            Cartulo_Messages *messages = dynamic_cast<Cartulo_Messages *>(window);
            if (!messages)
                continue;
            ++opened;
            text = dynamic_cast<wxTextCtrl *>(messages->FindWindow(6001))->GetValue();
            messages->EndModal(wxID_OK);
        }
    });
    Send(ID_MESSAGES);
    EXPECT_EQ(1, opened);
    EXPECT_TRUE(text.Contains("missing.bib' not found")) << text;
}

TEST_F(Frame, ShowsThatTheFilesOfTheMessagesAreClosed)
{
    std::string other = folder.Write("b.bib", OneEntry);
    wxTEST_DIALOG(Open(folder.Write("a.bib", Broken)),
                  ExpectMessages("There are errors in loading BIB files"));
    AllowDialogs allow;
    wxString before, after;
    wxTheApp->CallAfter([&] {
        Cartulo_Messages *messages = nullptr;
        for (wxWindow *window : wxTopLevelWindows)
            messages = messages ? messages : dynamic_cast<Cartulo_Messages *>(window);
        ASSERT_TRUE(messages);
        wxTextCtrl *text = dynamic_cast<wxTextCtrl *>(messages->FindWindow(6001));
        before = text->GetValue();
        frame->TakeCommand(other.c_str());
        after = text->GetValue();
        messages->EndModal(wxID_OK);
    });
    Send(ID_MESSAGES);
    EXPECT_TRUE(before.Contains("a.bib")) << before;
    EXPECT_FALSE(after.Contains("a.bib")) << after;
}

// --- Leaving and closing ---

class AutoSave : public Frame
{
protected:
    void SetUp() override
    {
        Frame::SetUp();
        Open(folder.Write("a.bib", OneEntry));
        Change(0, "Changed");
    }

    bool IsSaved() const { return folder.Read("a.bib").find("Changed") != std::string::npos; }

    ExpectBox Question(int button) const
    {
        return ExpectBox("Save Bibliography File - Question",
                         "There are modified Bib-files:\n\n" + folder.Path("a.bib") +
                             "\n\nDo you want to save them ?",
                         button);
    }
};

TEST_F(AutoSave, SavesWhenTheProgramIsLeft)
{
    frame->OnDeactivation();
    EXPECT_TRUE(IsSaved());
}

TEST_F(AutoSave, SavesNothingWhenTheProgramIsLeftAndItIsOff)
{
    frame->SetAutoSave(false);
    frame->OnDeactivation();
    EXPECT_FALSE(IsSaved());
}

TEST_F(AutoSave, SavesWhenTheWindowCloses)
{
    Close();
    EXPECT_TRUE(IsSaved());
}

TEST_F(AutoSave, AsksWhenTheWindowClosesAndItIsOff)
{
    frame->SetAutoSave(false);
    wxTEST_DIALOG(frame->Close(), Question(wxID_CANCEL));
    DeleteClosedWindows();
    ASSERT_TRUE(frame);
    EXPECT_FALSE(IsSaved());
    wxTEST_DIALOG(Close(), Question(wxID_NO));
    EXPECT_FALSE(IsSaved());
}

TEST_F(AutoSave, SavesOnYesWhenTheWindowClosesAndItIsOff)
{
    frame->SetAutoSave(false);
    wxTEST_DIALOG(Close(), Question(wxID_YES));
    EXPECT_TRUE(IsSaved());
}

TEST_F(AutoSave, SavesWithoutQuestionWhenTheWindowMustClose)
{
    frame->SetAutoSave(false);
    frame->Close(true);
    DeleteClosedWindows();
    EXPECT_FALSE(frame);
    EXPECT_TRUE(IsSaved());
}

// tests/gui/window_test.cpp - the window: files, saving, messages, keys, colours.

#include "tests/gui/GuiTest.h"

#include <cmath>
#include <csignal>
#include <filesystem>
#include <functional>

#include <sys/wait.h>
#include <unistd.h>

#include <wx/button.h>
#include <wx/scrolwin.h>
#include <wx/settings.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/toolbar.h>

#include "base/Companion.h"
#include "base/Sys.h"
#include "ui/Cartulo.h"
#include "ui/Colours.h"
#include "ui/Ids.h"
#include "ui/Messages.h"
#include "ui/PanelRules.h"
#include "ui/QListBox.h"

using Window = CartuloWindow;

static const char OneEntry[] = "@book{one, title = {First}}\n";

static const char Shown[] = "INFO: Cartulo::OnIndexChanged to ";
using Lines = std::vector<LogLine>;

// --- Files ---

TEST_F(Window, OffersToOpenAFileWhenNoneIsNamed)
{
    Open("");
    EXPECT_TRUE(IsShowing(ID_OPEN));
    EXPECT_FALSE(IsShowing(ID_INDEX));
    EXPECT_FALSE(EntryPane()->IsShownOnScreen());
    EXPECT_EQ("There are 0 bibliography entries in 0 BIB files.", Status());
}

// Lets the file dialog be shown, as it knows its path only then, and answers it. Answers a message
// box that follows, too.
class AnswerFileDialog : public wxModalDialogHook
{
public:
    explicit AnswerFileDialog(const wxString &path) : m_path(path) { Register(); }

    wxString title, wildcard;
    wxString box; // caption and text

protected:
    int Enter(wxDialog *shown) override
    {
        if (wxMessageDialog *message = dynamic_cast<wxMessageDialog *>(shown)) {
            box += message->GetTitle() + ": " + message->GetMessage();
            return wxID_OK;
        }
        wxFileDialog *dialog = dynamic_cast<wxFileDialog *>(shown);
        if (!dialog)
            return wxID_NONE;
        title = dialog->GetMessage();
        wildcard = dialog->GetWildcard();
        dialog->CallAfter([this, dialog] {
            bool ready = WaitFor([&] {
                dialog->SetPath(m_path);
                return dialog->GetPath() == m_path;
            });
            dialog->EndModal(ready ? wxID_OK : wxID_CANCEL);
        });
        return wxID_NONE;
    }

private:
    wxString m_path;
};

TEST_F(Window, OpensTheFileThatTheDialogNames)
{
    std::string path = folder.Write("with blank.bib", OneEntry);
    Open("");
    AllowDialogs allow;
    AnswerFileDialog answer(path);
    Press(ID_OPEN);
    EXPECT_EQ("Open BIB file", answer.title);
    EXPECT_EQ("BIB files (*.bib)|*.bib;*.BIB", answer.wildcard);
    EXPECT_EQ((std::vector<wxString>{"one (with blank)"}), Rows());
    EXPECT_FALSE(IsShowing(ID_OPEN));
    EXPECT_TRUE(IsShowing(ID_INDEX));
    EXPECT_EQ("There are 1 bibliography entries in 1 BIB files.", Status());
    EXPECT_EQ((Lines{{std::string(Shown) + "one (with blank)", TNS_ACTION}}), TakeLog(Shown));
}

TEST_F(Window, OpensAnotherFileThroughItsShortcuts)
{
    Open(folder.Write("a.bib", OneEntry));
    std::string b = folder.Write("b's.bib", "@misc{two, note = {Second}}\n");
    std::string c = folder.Write("C.BIB", "@misc{three, note = {Third}}\n");
    AllowDialogs allow;
    {
        AnswerFileDialog answer(b);
        PressShortcut('O', true, false);
        EXPECT_EQ((std::vector<wxString>{"two (b's)"}), Rows());
    }
    AnswerFileDialog answer(c);
    PressShortcut('o', false, true);
    EXPECT_EQ((std::vector<wxString>{"three (C)"}), Rows());
    EXPECT_EQ((std::vector<Field>{{"note", "Third"}}), ShownFields());
}

TEST_F(Window, SaysThatAPathWithBothQuotesCannotBeOpened)
{
    std::string path = folder.Write("\"it's\".bib", OneEntry);
    Open(folder.Write("a.bib", OneEntry));
    AllowDialogs allow;
    AnswerFileDialog answer(path);
    PressShortcut('O', true, false);
    EXPECT_EQ("Open BIB file: A file whose path holds both ' and \" can't be opened:\n\n" + path,
              answer.box);
    EXPECT_EQ((std::vector<wxString>{"one (a)"}), Rows());
}

TEST_F(Window, LogsTheEntryThatItShowsFirst)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_EQ((Lines{{std::string(Shown) + "one (a)", TNS_ACTION}}), TakeLog(Shown));
}

TEST_F(Window, LogsNothingAboutASelectionWhenItOpensWithoutEntries)
{
    Open(folder.Write("new.bib", ""));
    for (const LogLine &line : TakeLog(""))
        EXPECT_EQ(std::string::npos, line.text.find("OnIndex")) << line.text;
}

TEST_F(Window, WarnsWhenACommandLineLeavesNothingToSelect)
{
    Open(folder.Write("a.bib", OneEntry));
    ForgetLog();
    frame->TakeCommand("");
    EXPECT_EQ((Lines{{"WARNING: Cartulo::OnIndexChanged no selection in index", TNS_WARNING}}),
              TakeLog("WARNING: Cartulo::OnIndexChanged"));
}

TEST_F(Window, GoesBackToTheOpenPaneWhenTheLastFileIsClosed)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_NE(nullptr, Panel()->CurrentEntry());
    frame->TakeCommand("");
    EXPECT_EQ(nullptr, Panel()->CurrentEntry());
    EXPECT_TRUE(IsShowing(ID_OPEN));
    EXPECT_FALSE(IsShowing(ID_INDEX));
    frame->Refresh();
    wxYield(); // draws
}

TEST_F(Window, ShowsAnEmptyLibraryAsAnEmptyList)
{
    Open(folder.Write("new.bib", ""));
    EXPECT_TRUE(IsShowing(ID_INDEX));
    EXPECT_FALSE(IsShowing(ID_OPEN));
    EXPECT_TRUE(ShownFields().empty());
}

TEST_F(Window, LetsGoOfEntriesOfFilesThatACommandLineDrops)
{
    std::string a = folder.Write("a.bib", OneEntry);
    std::string b = folder.Write("b.bib", "@misc{two, note = {Second}}\n");
    Open(a);
    frame->TakeCommand(b.c_str());
    EXPECT_EQ((std::vector<wxString>{"two (b)"}), Rows());
    EXPECT_EQ((std::vector<Field>{{"note", "Second"}}), ShownFields());
    ASSERT_NE(nullptr, Panel()->CurrentEntry());
    EXPECT_STREQ("two", Panel()->CurrentEntry()->key);
}

TEST_F(Window, KeepsTheShownEntryWhenItsFileStaysOpen)
{
    std::string a = folder.Write("a.bib", std::string(OneEntry) + "@misc{two, note = {Second}}\n");
    std::string b = folder.Write("b.bib", "@misc{aaa, note = {Third}}\n");
    Open(a);
    TypeIntoList('t', 1000);
    frame->TakeCommand((b + " " + a).c_str());
    EXPECT_EQ(3u, Rows().size());
    EXPECT_EQ((std::vector<Field>{{"note", "Second"}}), ShownFields());
    EXPECT_EQ(a, TextAfter("BIB File:"));
}

TEST_F(Window, KeepsTheShownEntryWhenTheSameFilesAreNamedAgain)
{
    std::string a = folder.Write("a.bib", std::string(OneEntry) + "@misc{two, note = {Second}}\n");
    Open(a);
    TypeIntoList('t', 1000);
    const BibEntry *entry = Panel()->CurrentEntry();
    frame->TakeCommand(a.c_str());
    EXPECT_EQ(entry, Panel()->CurrentEntry());
    EXPECT_EQ(1, List()->GetSelection());
    EXPECT_EQ((std::vector<Field>{{"note", "Second"}}), ShownFields());
}

// Another process that holds the lock of a file.
class OtherProgram
{
public:
    explicit OtherProgram(const std::string &path)
    {
        int ready[2];
        EXPECT_EQ(0, pipe(ready));
        m_process = fork();
        if (m_process == 0) {
            char answer = Sys_LockFile(path.c_str()) ? 'y' : 'n';
            if (write(ready[1], &answer, 1) != 1)
                _exit(1);
            for (;;)
                pause();
        }
        char answer = 0;
        EXPECT_EQ(1, read(ready[0], &answer, 1));
        EXPECT_EQ('y', answer);
        close(ready[0]);
        close(ready[1]);
    }

    ~OtherProgram()
    {
        kill(m_process, SIGKILL);
        waitpid(m_process, nullptr, 0);
    }

private:
    pid_t m_process;
};

TEST_F(Window, SaysThatAFileIsLockedElsewhere)
{
    std::string path = folder.Write("taken.bib", OneEntry);
    OtherProgram other(path);
    SysReason why = {};
    ASSERT_EQ(0, Sys_LockFile(path.c_str(), &why));
    wxString text = "File: `" + path + "'\n" + why.text;
    wxString messages;
    wxTEST_DIALOG((Open(path), HandleQueuedEvents()), ExpectBox("Openning BIB file", text, wxID_OK),
                  ExpectMessages("There are errors in loading BIB files", &messages));
    EXPECT_EQ("ERROR: " + text + "\n", messages);
    EXPECT_EQ(0, Panel()->Files()->count);
    EXPECT_TRUE(IsShowing(ID_OPEN));
}

TEST_F(Window, StaysWhileItIsMade)
{
    std::string path = folder.Write("taken.bib", OneEntry);
    OtherProgram other(path);
    WhileBoxIsOpen hook([] { EXPECT_FALSE(wxTopLevelWindows.GetLast()->GetData()->Close()); },
                        wxID_OK);
    Open(path + " " + folder.Write("b.bib", OneEntry));
    EXPECT_EQ(1, hook.boxes);
    ASSERT_TRUE(frame);
    EXPECT_TRUE(frame->IsShown());
    EXPECT_EQ((std::vector<wxString>{"one (b)"}), Rows());
}

// Commands that were queued before a box came up.
TEST_F(Window, TouchesNoFilesWhileABoxIsOpen)
{
    std::string a = folder.Write("a.bib", OneEntry), taken = folder.Write("taken.bib", OneEntry);
    Open(a + " " + folder.Write("b.bib", OneEntry));
    OtherProgram other(taken);
    WhileBoxIsOpen hook(
        [this] {
            EXPECT_TRUE(Panel()->IsBusy());
            for (int id : {ID_OPEN, ID_SAVE, ID_CITE, ID_MESSAGES, ID_REMOVE_ENTRY})
                Panel()->GetEventHandler()->QueueEvent(new wxCommandEvent(wxEVT_MENU, id));
            HandleQueuedEvents();
            EXPECT_EQ("Cartulo waits for an answer, or is busy with the files: please try again.",
                      Status());
        },
        wxID_OK);
    frame->TakeCommand((a + " " + taken).c_str());
    EXPECT_EQ(1, hook.boxes); // no file dialog
    EXPECT_EQ((std::vector<wxString>{"one (a)"}), Rows());
}

TEST_F(Window, PressesTheFocusedButtonWithEnter)
{
    std::string path = folder.Write("a.bib", OneEntry);
    Open("");
    Panel()->FindWindow(ID_OPEN)->SetFocus();
    AllowDialogs allow;
    AnswerFileDialog answer(path);
    SendKey(Panel()->FindWindow(ID_OPEN), WXK_RETURN);
    EXPECT_TRUE(WaitFor([&] { return !Rows().empty(); }));
    EXPECT_EQ("Open BIB file", answer.title);
}

// --- Messages ---

TEST_F(Window, ShowsTheMessagesOfABrokenFile)
{
    std::string path = folder.Write("broken.bib", "@book{one, title = {First} year = 3}\n");
    wxString text;
    wxTEST_DIALOG((Open(path), HandleQueuedEvents()),
                  ExpectMessages("There are errors in loading BIB files", &text));
    EXPECT_TRUE(text.StartsWith("The file: '" + path + "' has 1 error:\nSYNTAX ERROR: line 1: "))
        << text;
    EXPECT_TRUE(frame->GetToolBar()->FindById(ID_MESSAGES));
    wxTEST_DIALOG(PressShortcut('M', true, false),
                  ExpectMessages("There are errors in loading BIB files"));
}

TEST_F(Window, NamesAFileThatIsMissing)
{
    wxString text;
    wxTEST_DIALOG((Open("/nowhere/gone.bib"), HandleQueuedEvents()),
                  ExpectMessages("There are errors in loading BIB files", &text));
    EXPECT_EQ("ERROR: The file '/nowhere/gone.bib' not found\n", text);
    EXPECT_FALSE(frame->GetToolBar()->FindById(ID_MESSAGES)); // no file has counts
}

TEST_F(Window, HasMessagesOnRequestOnlyWhenAllIsWell)
{
    std::string path = folder.Write("a.bib", OneEntry);
    Open(path);
    EXPECT_FALSE(frame->GetToolBar()->FindById(ID_MESSAGES));
    wxString text;
    wxTEST_DIALOG(PressShortcut('M', false, true),
                  ExpectMessages("There is no any messages related with loading BIB-files", &text));
    EXPECT_EQ("The file: '" + path + "':\n\n", text);
}

TEST_F(Window, ClosesTheMessagesWithItsButton)
{
    Open(folder.Write("a.bib", OneEntry));
    AllowDialogs allow;
    Cartulo_Messages dialog(frame, Panel()->Files());
    dialog.CallAfter([&] {
        EXPECT_TRUE(WaitFor([&] { return dialog.IsShownOnScreen(); }));
        wxCommandEvent press(wxEVT_BUTTON, wxID_OK);
        dialog.FindWindow(wxID_OK)->ProcessWindowEvent(press);
    });
    EXPECT_EQ(wxID_OK, dialog.ShowModal());
}

// --- Saving ---

TEST_F(Window, SavesAModifiedFileThroughItsTool)
{
    std::string path = folder.Write("a.bib", OneEntry);
    Open(path);
    EXPECT_FALSE(SaveEnabled());
    Change(0, "Changed");
    EXPECT_TRUE(SaveEnabled());
    wxCommandEvent tool(wxEVT_TOOL, ID_SAVE);
    frame->GetToolBar()->ProcessWindowEvent(tool);
    EXPECT_FALSE(SaveEnabled());
    EXPECT_EQ(0, Panel()->Files()->files[0]->modified);

    // The same record, saved elsewhere, gives the same bytes.
    std::string twin = folder.Write("twin.bib", "@book{one, title = {Changed}}\n");
    BibFile *file = Bib_LoadFile(twin.c_str());
    file->modified = 1;
    ASSERT_EQ(1, Bib_SaveFile(file));
    Bib_FreeFile(file);
    EXPECT_EQ(folder.Read("twin.bib"), folder.Read("a.bib"));
    EXPECT_NE(std::string::npos, folder.Read("a.bib").find("Changed"));
    EXPECT_NE(0, Panel()->Files()->files[0]->lockHandle) << "must be locked again";
}

TEST_F(Window, SavesWithItsShortcuts)
{
    Open(folder.Write("a.bib", OneEntry));
    Change(0, "With Alt");
    PressShortcut('B', true, false);
    EXPECT_NE(std::string::npos, folder.Read("a.bib").find("With Alt"));
    Change(0, "With Ctrl");
    PressShortcut('b', false, true);
    EXPECT_NE(std::string::npos, folder.Read("a.bib").find("With Ctrl"));
    EXPECT_FALSE(SaveEnabled());
}

class SaveQuestion : public CartuloWindow
{
protected:
    void SetUp() override
    {
        std::string a = folder.Write("a.bib", OneEntry), b = folder.Write("b.bib", OneEntry),
                    c = folder.Write("c.bib", OneEntry);
        Open(a + " " + b + " " + c);
        Change(0, "Changed");
        Change(2, "Changed");
        question =
            "There are modified Bib-files:\n\n" + a + "\n" + c + "\n\nDo you want to save them ?";
    }

    bool IsSaved(const char *name) const
    {
        return folder.Read(name).find("Changed") != std::string::npos;
    }

    wxString caption = "Save Bibliography File - Question";
    wxString question;
    int result = 2;
};

TEST_F(SaveQuestion, SavesOnYes)
{
    wxTEST_DIALOG(result = Panel()->SaveAll(false), ExpectBox(caption, question, wxID_YES));
    EXPECT_EQ(1, result);
    EXPECT_TRUE(IsSaved("a.bib") && IsSaved("c.bib"));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(SaveQuestion, SavesNothingOnNo)
{
    wxTEST_DIALOG(result = Panel()->SaveAll(false), ExpectBox(caption, question, wxID_NO));
    EXPECT_EQ(0, result);
    EXPECT_FALSE(IsSaved("a.bib") || IsSaved("c.bib"));
    EXPECT_TRUE(SaveEnabled());
}

TEST_F(SaveQuestion, ReportsCancel)
{
    wxTEST_DIALOG(result = Panel()->SaveAll(false), ExpectBox(caption, question, wxID_CANCEL));
    EXPECT_EQ(-1, result);
    EXPECT_FALSE(IsSaved("a.bib") || IsSaved("c.bib"));
    EXPECT_TRUE(SaveEnabled());
}

TEST_F(SaveQuestion, IsNotAskedWhenQuiet)
{
    EXPECT_EQ(1, Panel()->SaveAll(true));
    EXPECT_TRUE(IsSaved("a.bib") && IsSaved("c.bib"));
}

TEST_F(SaveQuestion, IsNotAskedWithoutChanges)
{
    EXPECT_EQ(1, Panel()->SaveAll(true));
    EXPECT_EQ(0, Panel()->SaveAll(false));
    EXPECT_EQ(0, Panel()->SaveAll(true));
}

TEST_F(SaveQuestion, IsNotAskedWhenTheProgramLosesTheFocus)
{
    frame->OnDeactivation();
    EXPECT_TRUE(IsSaved("a.bib") && IsSaved("c.bib"));
}

TEST_F(Window, SavesWhenTheLossOfTheFocusLasts)
{
    Open(folder.Write("a.bib", OneEntry));
    Change(0, "Changed");
    frame->OnActivation(false);
    EXPECT_EQ(OneEntry, folder.Read("a.bib"));
    EXPECT_TRUE(WaitFor([this] { return !SaveEnabled(); }));
    EXPECT_NE(OneEntry, folder.Read("a.bib"));
}

// As when a dialog closes under a slow window manager.
TEST_F(Window, SavesNothingWhenTheFocusComesBackAtOnce)
{
    Open(folder.Write("a.bib", OneEntry));
    Change(0, "Changed");
    frame->OnActivation(false);
    EXPECT_TRUE(frame->IsLeaving());
    frame->OnActivation(true);
    EXPECT_FALSE(frame->IsLeaving());
    EXPECT_FALSE(WaitFor([this] { return !SaveEnabled(); }, 500));
    EXPECT_EQ(OneEntry, folder.Read("a.bib"));
}

TEST_F(SaveQuestion, IsNotAskedWhenTheWindowCloses)
{
    frame->Close();
    DeleteClosedWindows();
    EXPECT_FALSE(frame);
    EXPECT_TRUE(IsSaved("a.bib") && IsSaved("c.bib"));
}

TEST_F(Window, ForgetsNoChangeWhenAFileCannotBeSaved)
{
    std::filesystem::create_directory(folder.Path("gone"));
    std::string path = folder.Write("gone/a.bib", OneEntry);
    Open(path);
    Change(0, "Changed");
    std::filesystem::remove_all(folder.Path("gone"));
    // Neither the file nor its lock can be had again.
    SysReason why = {};
    EXPECT_EQ(0, Sys_LockFile(path.c_str(), &why));
    ExpectBox lock("ReLocking BIB file", "File: `" + path + "'\n" + why.text, wxID_OK);
    int result = 2;
    wxTEST_DIALOG(result = Panel()->SaveAll(true), lock);
    EXPECT_EQ(0, result);
    EXPECT_TRUE(SaveEnabled());
    EXPECT_EQ("ERROR: Can't save all modified BIB files.", Status());

    wxString caption = "Save Bibliography File - Question";
    wxString question = "These Bib-files can't be saved:\n\nFile: `" + path + "'\n" + why.text +
                        "\n\nDo you want to close and to lose the changes ?";
    wxTEST_DIALOG(frame->Close(), ExpectBox(caption, question, wxID_NO));
    ASSERT_TRUE(frame && frame->IsShown());
    wxTEST_DIALOG(frame->Close(), ExpectBox(caption, question, wxID_YES));
    DeleteClosedWindows();
    EXPECT_FALSE(frame);
}

TEST_F(SaveQuestion, KeepsTheProgramFromSavingBeforeTheAnswer)
{
    WhileBoxIsOpen hook([this] { frame->OnDeactivation(); }, wxID_NO);
    EXPECT_EQ(0, Panel()->SaveAll(false));
    EXPECT_EQ(1, hook.boxes);
    EXPECT_FALSE(IsSaved("a.bib") || IsSaved("c.bib"));
    frame->OnDeactivation();
    EXPECT_TRUE(IsSaved("a.bib") && IsSaved("c.bib"));
}

// A file that was opened, changed, and cannot be saved any more.
class FailedSave : public CartuloWindow
{
protected:
    void SetUp() override
    {
        path = folder.Write("a.bib", OneEntry);
        Open(path);
        Change(0, "Changed");
        Panel()->Files()->files[0]->readOnly = 1;
        text = "These Bib-files can't be saved:\n\nFile: `" + path + "'\nThe file is read-only\n";
    }

    std::string path;
    wxString text;
};

TEST_F(FailedSave, IsExplainedWhenTheUserAskedForIt)
{
    ExpectBox box("Save Bibliography File", text, wxID_OK);
    wxTEST_DIALOG(PressShortcut('B', true, false), box);
    EXPECT_TRUE(SaveEnabled());
    EXPECT_EQ("ERROR: Can't save all modified BIB files.", Status());
    wxCommandEvent tool(wxEVT_TOOL, ID_SAVE);
    wxTEST_DIALOG(frame->GetToolBar()->ProcessWindowEvent(tool), box);
}

TEST_F(FailedSave, ShowsNoBoxWhenTheProgramLosesTheFocus)
{
    frame->OnDeactivation();
    EXPECT_TRUE(SaveEnabled());
    EXPECT_EQ("ERROR: Can't save all modified BIB files.", Status());
}

TEST_F(FailedSave, IsExplainedBeforeTheWindowCloses)
{
    wxTEST_DIALOG(frame->Close(),
                  ExpectBox("Save Bibliography File - Question",
                            text + "\nDo you want to close and to lose the changes ?", wxID_NO));
    EXPECT_TRUE(frame && frame->IsShown());
}

TEST_F(FailedSave, IsNotTriedAgainOnceTheWindowIsClosed)
{
    BibFile *file = Panel()->Files()->files[0];
    wxTEST_DIALOG(frame->Close(),
                  ExpectBox("Save Bibliography File - Question",
                            text + "\nDo you want to close and to lose the changes ?", wxID_YES));
    file->readOnly = 0;
    frame->OnDeactivation();
    EXPECT_EQ(OneEntry, folder.Read("a.bib"));
    DeleteClosedWindows();
    EXPECT_FALSE(frame);
}

TEST_F(Window, NamesARecordThatIsListedTwiceOnce)
{
    std::string path = folder.Write("a.bib", OneEntry);
    Open(path);
    frame->TakeCommand((path + " " + path).c_str());
    ASSERT_EQ(2, Panel()->Files()->count);
    ASSERT_EQ(Panel()->Files()->files[0], Panel()->Files()->files[1]);
    Change(1, "Changed");
    EXPECT_EQ(path + "\n", Panel()->UnsavedText());
    wxTEST_DIALOG(Panel()->SaveAll(false), ExpectBox("Save Bibliography File - Question",
                                                     "There are modified Bib-files:\n\n" + path +
                                                         "\n\nDo you want to save them ?",
                                                     wxID_NO));
    Panel()->Files()->files[0]->readOnly = 1;
    wxString text =
        "These Bib-files can't be saved:\n\nFile: `" + path + "'\nThe file is read-only\n";
    ExpectBox box("Save Bibliography File", text, wxID_OK);
    wxTEST_DIALOG(PressShortcut('B', true, false), box);
}

TEST_F(Window, IgnoresAModificationOfNoFile)
{
    Open(folder.Write("a.bib", OneEntry));
    Panel()->SetModified(-1);
    EXPECT_EQ(Lines(), TakeLog("Cartulo: SetModified"));
    Panel()->SetModified(1);
    EXPECT_EQ(
        (Lines{{"Cartulo: SetModified-ERROR - wrong file index  1 out of 0..1", TNS_WARNING}}),
        TakeLog("Cartulo: SetModified"));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Window, IgnoresAModificationWithoutFiles)
{
    Open("");
    Panel()->SetModified(0);
    EXPECT_EQ(Lines(), TakeLog("Cartulo: SetModified"));
    EXPECT_FALSE(SaveEnabled());
}

// --- Commands and keys ---

TEST_F(Window, PassesNoCommandBackAndForth)
{
    Open(folder.Write("a.bib", OneEntry));
    for (int id : {ID_COMMAND_FIRST + 0, 6005, ID_COMMAND_LAST + 0}) {
        wxCommandEvent event(wxEVT_MENU, id);
        EXPECT_FALSE(Panel()->ProcessWindowEvent(event));
        EXPECT_FALSE(frame->ProcessWindowEvent(event));
    }
}

TEST_F(Window, PutsTheFocusIntoTheSearchField)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
    PressShortcut('F', false, true);
    EXPECT_TRUE(WaitFor([this] { return Search()->HasFocus(); }));
}

TEST_F(Window, KnowsItsShortcutsOnAnotherKeyboard)
{
    const unsigned hardwareF = 41;
    Open(folder.Write("a.bib", OneEntry));
    ASSERT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
    PressShortcut(0, true, true, 0x430, hardwareF); // AltGr types a character here
    EXPECT_FALSE(Search()->HasFocus());
    PressShortcut(0, false, true, 0x430, hardwareF);
    EXPECT_TRUE(WaitFor([this] { return Search()->HasFocus(); }));
}

TEST_F(Window, LeavesWhatAltGrTypesToTheControl)
{
    Open(folder.Write("a.bib", OneEntry));
    Change(0, "Changed");
    PressShortcut('B', true, true, 0x201D);
    EXPECT_TRUE(SaveEnabled());
    PressShortcut('B', true, true);
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Window, LogsEachKeyInAWholeLine)
{
    const struct {
        int key;
        const char *line;
    } keys[] = {{0, "Key=0( ),Mod=1"},
                {'x', "Key=120(x),Mod=1"},
                {WXK_BACK, "Key=8( ),Mod=1"},
                {WXK_DELETE, "Key=127( ),Mod=1"},
                {0xFC, "Key=252(\xC3\xBC),Mod=1"},
                {WXK_F2, "Key=341( ),Mod=1"}};
    Open("");
    for (const auto &row : keys) {
        ForgetLog();
        PressShortcut(row.key, true, false);
        std::string line = std::string("INFO: MyFrame::OnCharHook ") + row.line;
        EXPECT_EQ((Lines{{line, TNS_LIFECYCLE}}), TakeLog("INFO: MyFrame::OnCharHook "));
    }
}

TEST_F(Window, ClearsTheStatusLineWithEachKey)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_NE("", Status());
    PressShortcut('X', false, false);
    EXPECT_EQ("", Status());
}

TEST_F(Window, ClosesOnTheCommandsForIt)
{
    for (int id : {ID_CLOSE + 0, ID_EXIT + 0}) {
        Open(folder.Write("a.bib", OneEntry));
        wxCommandEvent event(wxEVT_MENU, id);
        frame->ProcessWindowEvent(event);
        DeleteClosedWindows();
        EXPECT_FALSE(frame);
    }
}

TEST_F(Window, IsNotSmallerThanItsMinimum)
{
    Open("");
    EXPECT_EQ(frame->FromDIP(wxSize(512, 512)), frame->GetMinSize());
    EXPECT_TRUE(WaitFor([this] { return frame->GetSize() == frame->FromDIP(wxSize(800, 600)); }));
}

TEST_F(Window, SharesItsWidthBetweenListAndEntry)
{
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_EQ(frame->FromDIP(300), Panel()->GetSashPosition());
    ASSERT_TRUE(WaitFor([this] { return !frame->IsNew(); }));
    int width = EntryPane()->GetSize().x;
    auto isSashNear = [this](double place) {
        return std::abs(frame->ToDIP(Panel()->GetSashPosition()) - place) <= 10;
    };
    frame->SetSize(frame->GetMinSize());
    EXPECT_TRUE(WaitFor([&] {
        return EntryPane()->GetSize().x != width && isSashNear(300 - 0.35 * (800 - 512));
    })) << Panel()->GetSashPosition();
    frame->SetSize(frame->FromDIP(wxSize(800, 600)));
    EXPECT_TRUE(WaitFor([&] { return EntryPane()->GetSize().x == width && isSashNear(300); }))
        << Panel()->GetSashPosition();
}

// --- Colours ---

static Colour Of(const wxColour &colour)
{
    return {colour.Red(), colour.Green(), colour.Blue()};
}

static void CheckTexts(wxWindow *window)
{
    for (wxWindow *child : window->GetChildren()) {
        if (wxStaticText *text = dynamic_cast<wxStaticText *>(child)) {
            EXPECT_GE(
                Colour_Contrast(Of(text->GetForegroundColour()), Of(text->GetBackgroundColour())),
                4.5)
                << text->GetLabelText();
        }
        CheckTexts(child);
    }
}

// Runs on a light and on a dark desktop.
TEST_F(Window, HasReadableColours)
{
    const char *theme = getenv("GTK_THEME");
    bool dark = theme && wxString(theme).Contains("dark");
    ASSERT_EQ(dark, wxSystemSettings::GetAppearance().IsUsingDarkBackground());
    Open(folder.Write("a.bib", OneEntry));
    CheckTexts(frame);
    Cartulo_Messages messages(frame, Panel()->Files());
    CheckTexts(&messages);
    auto colour = [](wxSystemColour index) { return Of(wxSystemSettings::GetColour(index)); };
    EXPECT_GE(Colour_Contrast(colour(wxSYS_COLOUR_LISTBOXTEXT), colour(wxSYS_COLOUR_LISTBOX)), 4.5);
}

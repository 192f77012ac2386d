// tests/gui/edit_test.cpp - editing an entry in its pane: the two modes, inherited fields, the
// commit.

#include "tests/gui/EditTest.h"

#include <map>

#include <wx/scrolwin.h>
#include <wx/settings.h>

#include "base/Companion.h"
#include "ui/Colours.h"
#include "ui/Native.h"
#include "ui/PanelRules.h"

using Lines = std::vector<LogLine>;

// --- The modes ---

TEST_F(Edit, ChangesBetweenTheModes)
{
    OpenText(Article);
    StartEditing();
    EXPECT_FALSE(List()->IsEnabled());
    EXPECT_TRUE(Type()->IsEnabled());
    EXPECT_TRUE(Value("title")->IsEnabled());
    EXPECT_TRUE(Remover(0)->IsEnabled());
    EXPECT_TRUE(IsShowing(ID_COMMIT_ENTRY));
    EXPECT_TRUE(EntryPaneSays("Add Field:"));
    EXPECT_TRUE(WaitFor([this] { return Type()->HasFocus(); }));
    for (int id : {ID_NEW_ENTRY, ID_REMOVE_ENTRY, ID_RENAME_ENTRY, ID_EDIT_ENTRY})
        EXPECT_FALSE(ToolEnabled(id));
    Send(ID_COMMIT_ENTRY); // nothing changed: no question
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_TRUE(List()->IsEnabled());
    EXPECT_FALSE(Value("title")->IsEnabled());
    EXPECT_FALSE(IsShowing(ID_COMMIT_ENTRY));
    EXPECT_FALSE(EntryPaneSays("Add Field:"));
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
}

TEST_F(Edit, LogsItsSteps)
{
    OpenText(Article);
    ForgetLog();
    StartEditing();
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnEditEntry to one (a)", TNS_ACTION},
                     {"INFO: Cartulo::Update_Tools(): EditMode", TNS_LIFECYCLE},
                     {"INFO: Update_Field_Colors for article", TNS_LIFECYCLE}}),
              TakeLog("INFO: "));
    Choose("book");
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnChangeType to ...", TNS_ACTION},
                     {"INFO: Cartulo::OnChangeType to book", TNS_ACTION},
                     {"INFO: Update_Field_Colors for book", TNS_LIFECYCLE}}),
              TakeLog("INFO: "));
    Choose("article");
    ForgetLog();
    Send(ID_COMMIT_ENTRY);
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnCommitEntry", TNS_ACTION},
                     {"INFO: Cartulo::Update_Tools(): ListMode", TNS_LIFECYCLE},
                     {"INFO: Update_Field_Colors for article", TNS_LIFECYCLE}}),
              TakeLog("INFO: "));
}

TEST_F(Edit, StartsAndEndsWithEscape)
{
    OpenText(Article);
    PressShortcut(WXK_ESCAPE, false, false);
    EXPECT_TRUE(Panel()->InEditMode());
    PressShortcut(WXK_ESCAPE, false, false);
    EXPECT_FALSE(Panel()->InEditMode());
}

// Whoever types fast has typed on before the queue of events is handled.
TEST_F(Edit, StartsBeforeTheNextKeyComes)
{
    OpenText(Article);
    wxKeyEvent key(wxEVT_CHAR_HOOK);
    key.m_keyCode = key.m_uniChar = WXK_ESCAPE;
    List()->ProcessWindowEvent(key);
    EXPECT_TRUE(Panel()->InEditMode());
}

TEST_F(Edit, RefusesAReadOnlyFile)
{
    wxTEST_DIALOG(Open(folder.Write("a.bib", std::string(Article) + "@book{two\n")),
                  ExpectMessages("There are errors in loading BIB files"));
    Send(ID_EDIT_ENTRY);
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_EQ("ERROR: You can't edit records in readonly BIB-file", Status());
    EXPECT_EQ((Lines{{"WARNING: Cartulo::OnEditEntry locked editing file opened in of readonly "
                      "mode.",
                      TNS_WARNING}}),
              TakeLog("WARNING: Cartulo::OnEditEntry"));
}

TEST_F(Edit, WarnsWithoutASelection)
{
    OpenText("");
    ForgetLog();
    Send(ID_EDIT_ENTRY);
    EXPECT_EQ((Lines{{"WARNING: Cartulo::OnEditEntry no selection in index", TNS_WARNING}}),
              TakeLog("WARNING: Cartulo::OnEditEntry"));
    Send(ID_COMMIT_ENTRY);
    EXPECT_FALSE(Panel()->InEditMode());
}

TEST_F(Edit, DropsEditsWhenTheEditCommandIsGivenAgain)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "Changed");
    Send(ID_EDIT_ENTRY);
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_EQ("T", Value("title")->GetValue());
    EXPECT_FALSE(SaveEnabled());
}

// A menu command leads into the editing of a read-only file, and "Done" out of it again.
TEST_F(Edit, CommitsNothingToAReadOnlyFile)
{
    wxTEST_DIALOG(Open(folder.Write("a.bib", std::string(Article) + "@book{two\n")),
                  ExpectMessages("There are errors in loading BIB files"));
    Send(ID_COMMIT_ENTRY);
    ASSERT_TRUE(Panel()->InEditMode());
    SetValue("title", "Changed");
    Send(ID_COMMIT_ENTRY);
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_EQ("T", Value("title")->GetValue());
}

TEST_F(Edit, ExplainsTheKeysOfTheMode)
{
    OpenText(Article);
    auto help = [this] {
        for (wxWindow *child : EntryPane()->GetChildren()) {
            wxTextCtrl *text = dynamic_cast<wxTextCtrl *>(child);
            if (text && text->IsMultiLine())
                return text->GetValue();
        }
        return wxString();
    };
    EXPECT_TRUE(help().StartsWith("<Entry List> Mode Accelerators:\n")) << help();
    StartEditing();
    EXPECT_TRUE(help().StartsWith("<Entry Editing> mode Accelerators:\n")) << help();
    EXPECT_TRUE(help().EndsWith("`article' entry is for a paper")) << help();
    Choose("book");
    EXPECT_TRUE(help().EndsWith("`book' entry is for Custom Entry Type")) << help();
}

// Wherever the window leaves room for it, the note is whole, and "Done" can be reached.
TEST_F(Edit, NotesMissingFieldsInFull)
{
    OpenText("@article{one, note = {N}}\n");
    StartEditing();
    ASSERT_TRUE(WaitFor([this] { return !frame->IsNew(); }));
    wxWindow *done = Panel()->FindWindow(ID_COMMIT_ENTRY);
    auto fits = [&] {
        const int width = EntryPane()->GetClientSize().x;
        const wxStaticText *note = NoteText();
        int height = Native_HeightForWidth(note, note->GetSize().x);
        return note->GetRect().GetRight() < width && done->GetRect().GetRight() < width &&
               done->GetSize().x >= done->GetBestSize().x && note->GetSize().y >= height &&
               !note->GetRect().Intersects(done->GetRect());
    };
    for (int width : {1200, 800, 640}) {
        frame->SetSize(frame->FromDIP(wxSize(width, 600)));
        ASSERT_TRUE(WaitFor([&] { return frame->GetSize().x == frame->FromDIP(width); })) << width;
        EXPECT_TRUE(WaitFor(fits)) << width;
    }
}

TEST_F(Edit, ScrollsByTheWheelOverItsChoices)
{
    OpenText(
        "@article{one, a = 1, b = 2, c = 3, d = 4, e = 5, f = 6, g = 7, h = 8, i = 9, j = 10}\n");
    StartEditing();
    ASSERT_TRUE(WaitFor([this] { return !frame->IsNew(); }));
    frame->SetSize(frame->FromDIP(wxSize(640, 512)));
    ASSERT_TRUE(WaitFor([this] { return frame->GetSize().y == frame->FromDIP(512); }));
    wxScrolledWindow *pane = dynamic_cast<wxScrolledWindow *>(EntryPane());
    ASSERT_TRUE(pane);
    int top = pane->GetViewStart().y;
    wxWindow *choices[] = {Type(), NewKey()};
    for (wxWindow *choice : choices) {
        wxMouseEvent wheel(wxEVT_MOUSEWHEEL);
        wheel.m_wheelDelta = 120;
        wheel.m_linesPerAction = 3;
        wheel.m_wheelRotation = -60;
        choice->ProcessWindowEvent(wheel);
        EXPECT_EQ(top + 1, pane->GetViewStart().y);
        choice->ProcessWindowEvent(wheel); // the other half of a line counts, too
        top = pane->GetViewStart().y;
    }
    EXPECT_EQ(6, top);
}

// Runs on a light and on a dark desktop.
TEST_F(Edit, TellsFieldsApartByColours)
{
    OpenText("@article{one, title = {T}, note = {N}, crossref = {x}, extra = {E}}\n"
             "@extra-type{two, title = {T}}\n");
    auto colours = [this] {
        std::map<wxString, Colour> all;
        for (wxWindow *child : EntryPane()->GetChildren()) {
            wxStaticText *text = dynamic_cast<wxStaticText *>(child);
            wxColour colour = child->GetForegroundColour();
            if (text && text->IsShown())
                all[text->GetLabelText()] = {colour.Red(), colour.Green(), colour.Blue()};
        }
        return all;
    };
    const wxColour back = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
    auto isShown = [&](const char *key, Colour chosen) {
        Colour wanted = Colour_ForText(chosen, {back.Red(), back.Green(), back.Blue()},
                                       wxSystemSettings::GetAppearance().IsUsingDarkBackground());
        Colour shown = colours()[key];
        return shown.red == wanted.red && shown.green == wanted.green && shown.blue == wanted.blue;
    };
    EXPECT_TRUE(isShown("title", {0, 0, 128}));
    EXPECT_TRUE(isShown("note", {0, 0, 255}));
    EXPECT_TRUE(isShown("crossref", {128, 0, 0}));
    EXPECT_TRUE(isShown("extra", {0, 128, 0}));
    StartEditing();
    Choose("book");
    EXPECT_TRUE(isShown("title", {0, 0, 128}));
    EXPECT_TRUE(isShown("note", {0, 128, 0}));
    Choose("extra-type"); // without a section
    EXPECT_TRUE(isShown("title", {0, 128, 0}));
    EXPECT_TRUE(isShown("crossref", {128, 0, 0}));
    EXPECT_TRUE(NewKey()->IsListEmpty());
    EXPECT_EQ("", Note());
}

// --- The commit ---

TEST_F(Edit, StoresAChangedValue)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_EQ("New Title", Value("title")->GetValue());
    EXPECT_TRUE(SaveEnabled());
    EXPECT_NE(std::string::npos, Saved().find("New Title"));
    ASSERT_NE(nullptr, Panel()->CurrentEntry());
    EXPECT_EQ(1u, Rows().size());
}

TEST_F(Edit, DropsTheEditsOnNo)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_NO));
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_EQ("T", Value("title")->GetValue());
    EXPECT_FALSE(SaveEnabled());
}

// Events of the toolkit come in while it asks, too.
TEST_F(Edit, IsNotCalledBusyByItsOwnQuestion)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    WhileBoxIsOpen hook([this] { Panel()->UpdateWindowUI(wxUPDATE_UI_RECURSE); }, wxID_CANCEL);
    const wxString before = Status();
    Send(ID_COMMIT_ENTRY);
    EXPECT_EQ(before, Status());
}

TEST_F(Edit, GoesOnOnCancel)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_CANCEL));
    EXPECT_TRUE(Panel()->InEditMode());
    EXPECT_EQ("New Title", Value("title")->GetValue());
    Send(ID_EDIT_ENTRY);
}

TEST_F(Edit, AsksNothingWhenAValueIsAsItWas)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    SetValue("title", "T");
    Send(ID_COMMIT_ENTRY);
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Edit, ChangesTheTypeAlone)
{
    OpenText(Article);
    StartEditing();
    Choose("book");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("YES", 0, 0, 0, wxID_YES));
    EXPECT_EQ("book", TextAfter("Entry Type:"));
    EXPECT_NE(std::string::npos, Saved().find("@book{one,"));
}

// The file could not be read any more.
TEST_F(Edit, TakesNoTypeThatCannotBeWritten)
{
    folder.Write("Cartulo/cartulo.ini", std::string(EditTypes) + "[my type]\ntitle=\n");
    OpenText(Article);
    StartEditing();
    Choose("my type");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("YES", 0, 0, 0, wxID_YES),
                  ExpectBox(CommitTitle,
                            "An entry of the type `my type' can't be written to a BIB file.\n\n"
                            "Choose another type.",
                            wxID_OK));
    EXPECT_TRUE(Panel()->InEditMode());
    SetValue("title", "Changed");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("YES", 0, 1, 0, wxID_YES),
                  ExpectBox(CommitTitle,
                            "An entry of the type `my type' can't be written to a BIB file.\n\n"
                            "Choose another type.",
                            wxID_OK));
    Choose("book");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("YES", 0, 1, 0, wxID_YES));
    EXPECT_EQ("@book{one,\n\tauthor = {A},\n\ttitle = {Changed},\n\tyear = 1999\n}\n", Saved());
}

static wxString WrongSyntax(const char *field, const char *message)
{
    return wxString::Format("Wrong syntax of value in the field: `%s':\n\n%s\n\nIn this reason "
                            "modification of entire entry can't be accepted.\nFix an error and "
                            "try again.",
                            field, message);
}

TEST_F(Edit, RefusesEachValueThatCannotBeWritten)
{
    OpenText(Article);
    StartEditing();
    SetValue("author", "{open");
    SetValue("title", "{open too");
    wxString message = Bib_CheckValue("{open"), other = Bib_CheckValue("{open too");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 2, 0, wxID_YES),
                  ExpectBox(CommitTitle, WrongSyntax("author", message.utf8_str()), wxID_OK),
                  ExpectBox(CommitTitle, WrongSyntax("title", other.utf8_str()), wxID_OK));
    EXPECT_TRUE(Panel()->InEditMode());
    EXPECT_EQ("{open", Value("author")->GetValue());
    EXPECT_TRUE(WaitFor([this] { return Value("author")->HasFocus(); }));
    EXPECT_FALSE(Value("author")->HasSelection());
    EXPECT_FALSE(SaveEnabled());
    Send(ID_EDIT_ENTRY);
}

TEST_F(Edit, AsksBeforeItLosesCharacters)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", L"\u0141\u00F3d\u017A");
    wxString asked;
    class Losses : public wxExpectModalBase<wxMessageDialog, Losses>
    {
    public:
        Losses(wxString *asked, int button) : m_asked(asked), m_button(button) {}

    protected:
        int OnInvoked(wxMessageDialog *dialog) const override
        {
            EXPECT_EQ(CommitTitle, dialog->GetTitle());
            *m_asked = dialog->GetMessage();
            return m_button;
        }

    private:
        wxString *m_asked;
        int m_button;
    };
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES),
                  Losses(&asked, wxID_NO));
    EXPECT_TRUE(asked.Contains("can't be stored in CP1252")) << asked;
    EXPECT_TRUE(asked.Contains("title")) << asked;
    EXPECT_TRUE(asked.Contains(L"\u0141")) << asked;
    EXPECT_FALSE(asked.Contains(L"\u00F3")) << asked;
    EXPECT_TRUE(Panel()->InEditMode());
    EXPECT_EQ(L"\u0141\u00F3d\u017A", Value("title")->GetValue());
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES),
                  Losses(&asked, wxID_YES));
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_NE(std::string::npos, Saved().find("\xFF\xF3"
                                              "d\xFF"));
}

TEST_F(Edit, IsNotSavedBeforeItIsFinished)
{
    OpenText(std::string(Article) + "@book{two, year = {1999}}\n");
    StartEditing();
    SetValue("year", "2001");
    Send(ID_SAVE);
    EXPECT_EQ("The entry that you edit is not saved yet: finish it first, with Esc.", Status());
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    Send(ID_SAVE);
    EXPECT_EQ("All modified BIB files are saved.", Status());
    EXPECT_NE(std::string::npos, folder.Read("a.bib").find("2001"));
}

TEST_F(Edit, CountsFieldsWithoutARowAsPresent)
{
    std::string text = "@article{one";
    for (int i = 0; i < 16; ++i)
        text += ", f" + std::to_string(i) + " = {v}";
    OpenText(text + ", author = {A}, crossref = {p}}\n@book{p, title = {T}, year = {1999}}\n");
    EXPECT_TRUE(
        EntryPaneSays("2 more fields are not shown. 2 more inherited fields are not shown."));
    StartEditing();
    EXPECT_EQ("", Note());
}

TEST_F(Edit, KeepsBytesThatNobodyTouched)
{
    OpenText("@article{one,\n  author = {\xABquoted\xBB},\n  title = {T},\n  year = {1999}\n}\n");
    StartEditing();
    SetValue("title", "New");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_NE(std::string::npos, Saved().find("\xABquoted\xBB"));
}

TEST_F(Edit, KeepsAValueThatItsControlCannotHold)
{
    std::string text(70000, 'x');
    OpenText("@article{one, author = {" + text + "}, title = {T}}\n");
    StartEditing();
    EXPECT_FALSE(Value("author")->IsEnabled());
    SetValue("title", "New");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_NE(std::string::npos, Saved().find(text));
}

TEST_F(Edit, CarriesFieldsOverThatFoundNoRow)
{
    std::string text = "@article{one";
    for (int i = 0; i < 18; ++i)
        text += ", f" + std::to_string(i) + " = {v" + std::to_string(i) + "}";
    OpenText(text + "}\n");
    StartEditing();
    SetValue("f0", "New");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    std::string saved = Saved();
    EXPECT_NE(std::string::npos, saved.find("v17"));
    EXPECT_NE(std::string::npos, saved.find("New"));
    EXPECT_EQ(18, Panel()->CurrentEntry()->fieldCount);
}

// --- Inherited fields ---

TEST_F(Edit, ShowsInheritedFieldsForReading)
{
    OpenText(Child);
    EXPECT_EQ((std::vector<Field>{{"crossref", "parent"}, {"title", "T"}, {"year", "1999"}}),
              ShownFields());
    StartEditing();
    EXPECT_FALSE(Value("crossref")->IsEnabled());
    EXPECT_FALSE(Remover(0)->IsShown());
    EXPECT_TRUE(Value("title")->IsEnabled());
    EXPECT_FALSE(Value("year")->IsEnabled());
    EXPECT_FALSE(Remover(2)->IsEnabled());
}

TEST_F(Edit, LetsACrossrefWithoutTargetBeRemoved)
{
    OpenText("@book{parent, title = {P}, year = {1999}}\n@article{child, crossref = {parent}}\n");
    ASSERT_STREQ("child", Panel()->CurrentEntry()->key);
    StartEditing();
    EXPECT_TRUE(Remover(0)->IsShown());
    EXPECT_EQ(1u, ShownFields().size());
}

// --- What may not cost an edit ---

TEST_F(Edit, IsFinishedBeforeTheWindowCloses)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    wxTEST_DIALOG(frame->Close(), Question("NO", 0, 1, 0, wxID_CANCEL));
    DeleteClosedWindows();
    ASSERT_TRUE(frame);
    EXPECT_TRUE(Panel()->InEditMode());
    wxTEST_DIALOG(Close(), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_NE(std::string::npos, folder.Read("a.bib").find("New Title"));
}

TEST_F(Edit, MayBeClosedByForceWhileItAsks)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    WhileBoxIsOpen hook([this] { frame->Close(true); }, wxID_CANCEL);
    frame->Close();
    DeleteClosedWindows();
    EXPECT_FALSE(frame);
}

TEST_F(Edit, IsFinishedBeforeTheQuitCommand)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    wxCommandEvent event(wxEVT_MENU, ID_EXIT);
    wxTEST_DIALOG(frame->ProcessWindowEvent(event), Question("NO", 0, 1, 0, wxID_CANCEL));
    DeleteClosedWindows();
    ASSERT_TRUE(frame);
    wxTEST_DIALOG(frame->ProcessWindowEvent(event), Question("NO", 0, 1, 0, wxID_NO));
    DeleteClosedWindows();
    EXPECT_FALSE(frame);
    EXPECT_EQ(std::string::npos, folder.Read("a.bib").find("New Title"));
}

TEST_F(Edit, KeepsACommandWaiting)
{
    std::string other = folder.Write("b.bib", "@misc{two, note = {Second}}\n");
    OpenText(Article);
    StartEditing();
    SetValue("title", "New Title");
    wxTEST_DIALOG(EXPECT_FALSE(frame->TakeCommand(other.c_str())),
                  Question("NO", 0, 1, 0, wxID_CANCEL));
    EXPECT_FALSE(frame->MayTakeCommand()); // asked once
    EXPECT_EQ("New Title", Value("title")->GetValue());
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_TRUE(frame->MayTakeCommand());
    EXPECT_TRUE(frame->TakeCommand(other.c_str()));
    EXPECT_NE(std::string::npos, folder.Read("a.bib").find("New Title"));
    EXPECT_EQ((std::vector<wxString>{"two (b)"}), Rows());
}

// Commands of the list reach the panel while an entry is edited when their keys were quicker.
TEST_F(Edit, IsFinishedBeforeTheCommandsOnEntries)
{
    OpenText(Article);
    for (int id : {ID_NEW_ENTRY, ID_RENAME_ENTRY, ID_REMOVE_ENTRY, ID_OPEN}) {
        StartEditing();
        SetValue("title", "New Title");
        wxTEST_DIALOG(Send(id), Question("NO", 0, 1, 0, wxID_CANCEL));
        EXPECT_TRUE(Panel()->InEditMode()) << id;
        EXPECT_EQ("New Title", Value("title")->GetValue()) << id;
        Send(ID_EDIT_ENTRY);
    }
    StartEditing();
    SetValue("title", "New Title");
    wxTEST_DIALOG(Send(ID_REMOVE_ENTRY), Question("NO", 0, 1, 0, wxID_YES),
                  ExpectBox("Removing Entry", "one (a)", wxID_NO));
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_EQ("New Title", Value("title")->GetValue());
}

TEST_F(Edit, OutlivesASearch)
{
    OpenText(std::string(Article) + "@book{two, title = {Second}}\n");
    StartEditing();
    SetValue("title", "New Title");
    for (const char *text : {"Second", "in no entry"}) {
        SearchFor(text);
        EXPECT_TRUE(Panel()->InEditMode());
        EXPECT_EQ("New Title", Value("title")->GetValue());
        EXPECT_TRUE(EntryPane()->IsShownOnScreen());
    }
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_TRUE(IsShowing(ID_NEW_ENTRY));
    EXPECT_NE(std::string::npos, Saved().find("New Title"));
}

// What is shown is what the commands act on.
TEST_F(Edit, LeavesTheListOnASearchThatTheEntryNoLongerMatches)
{
    OpenText(std::string(Article) + "@book{two, year = {1999}}\n");
    SearchFor("1999");
    for (const char *key : {"one", "two"}) {
        ASSERT_STREQ(key, Panel()->CurrentEntry()->key);
        StartEditing();
        SetValue("year", "2001");
        wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
        EXPECT_EQ("The entry is not in the list: it does not hold the searched text.", Status());
    }
    EXPECT_EQ(nullptr, Panel()->CurrentEntry());
    EXPECT_FALSE(ToolEnabled(ID_RENAME_ENTRY));
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_TRUE(IsShowing(ID_NEW_ENTRY));
    Send(ID_COMMIT_ENTRY); // nothing is shown that could be edited
    EXPECT_FALSE(Panel()->InEditMode());
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
    SearchFor("");
    EXPECT_EQ("2001", Value("year")->GetValue());
}

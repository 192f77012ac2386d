// tests/gui/preamble_test.cpp - the window for preambles.

#include "tests/gui/DialogTest.h"
#include "tests/gui/EditTest.h"

#include <wx/clipbrd.h>

#include "base/Companion.h"
#include "ui/Preamble.h"
#include "ui/PreambleText.h"

using Lines = std::vector<LogLine>;
using Texts = std::vector<wxString>;
using UsePreamble = UseDialog<Cartulo_Preamble>;
using Steps = std::function<void(Cartulo_Preamble &)>;

static const char TwoPieces[] = "@preamble{{\\def\\a{x}} # \"\\def\\b{y}\"}\n";
static const char OnePiece[] = "@preamble{{other}}\n";
static const char TooLong[] =
    "The preamble of a file can have 8191 bytes, with two for the end of each piece.\n"
    "This one has 8202, 11 too many.\n\nShorten it to continue.";
static wxString Long(size_t length) // with words
{
    wxString text;
    while (text.length() < length)
        text += "a long text ";
    return text.Left(length);
}

static const long Refusal = wxOK | wxICON_EXCLAMATION;

static wxTextCtrl *TextOf(wxDialog &dialog)
{
    return Find<wxTextCtrl>(dialog, ID_PREAMBLE_TEXT);
}

static wxChoice *FileOf(wxDialog &dialog)
{
    return Find<wxChoice>(dialog, ID_PREAMBLE_FILE);
}

static ExpectBox AcceptQuestion(int answer)
{
    return ExpectBox("Editing Preamble Question",
                     "There are changes in current preamble text.\n\n Do you want to accept they ?",
                     answer, wxYES_NO | wxICON_QUESTION);
}

static ExpectBox SyntaxError(const wxString &text)
{
    return ExpectBox("Editing Preamble - Syntax Error",
                     text + "\n\nWrong preamble can;t be accepted.\nFix it and then try again.",
                     wxID_OK, Refusal);
}

static wxString Clipboard()
{
    wxClipboardLocker lock;
    wxTextDataObject data;
    EXPECT_TRUE(wxTheClipboard->GetData(data));
    return data.GetText();
}

class Preamble : public Edit
{
protected:
    void SetUp() override
    {
        Edit::SetUp();
        CurrentPreamble = 0;
    }

    void OpenTwo()
    {
        Open(folder.Write("a.bib", TwoPieces) + " " + folder.Write("b.bib", OnePiece));
    }

    void Use(const Steps &steps) { wxTEST_DIALOG(Send(ID_PREAMBLE), UsePreamble(steps)); }

    void Use(const Steps &steps, const ExpectBox &box)
    {
        wxTEST_DIALOG(Send(ID_PREAMBLE), UsePreamble(steps), box);
    }

    // Accepts a text, or does not.
    static Steps Type(const wxString &text, bool closes = true)
    {
        return [=](Cartulo_Preamble &dialog) {
            TextOf(dialog)->ChangeValue(text);
            EXPECT_EQ(closes, PressOK(dialog));
            EXPECT_EQ(text, TextOf(dialog)->GetValue());
        };
    }

    // Types a text and turns to the second file; `shown` is what is shown then.
    static Steps Leave(const wxString &text, int file, const wxString &shown)
    {
        return [=](Cartulo_Preamble &dialog) {
            TextOf(dialog)->ChangeValue(text);
            ChooseItem(dialog, ID_PREAMBLE_FILE, 1);
            EXPECT_EQ(file, FileOf(dialog)->GetSelection());
            EXPECT_EQ(file, CurrentPreamble);
            EXPECT_EQ(shown, TextOf(dialog)->GetValue());
        };
    }

    const char *Stored(int file = 0) const { return Panel()->Files()->files[file]->preamble; }
};

// --- Showing ---

TEST_F(Preamble, IsShownPieceByPiece)
{
    OpenTwo();
    ForgetLog();
    auto look = [](Cartulo_Preamble &dialog) {
        EXPECT_EQ("Editing Preamble", dialog.GetTitle());
        EXPECT_EQ((Texts{"Show Preamble of BIB-file:"}), Labels(dialog));
        EXPECT_EQ((Texts{"a", "b"}), Items(Find<wxChoice>(dialog, 6001)));
        EXPECT_EQ("a", FileOf(dialog)->GetStringSelection());
        wxTextCtrl *text = Find<wxTextCtrl>(dialog, 6002);
        EXPECT_EQ("\\def\\a{x}\r\n\\def\\b{y}\r\n", text->GetValue());
        EXPECT_EQ(3, text->GetNumberOfLines());
        EXPECT_TRUE(text->IsEditable());
        EXPECT_TRUE(text->GetFont().IsFixedWidth());
        EXPECT_EQ(dialog.FromDIP(wxSize(600, 200)), text->GetMinSize());
        for (int button : {wxID_OK, wxID_CANCEL})
            EXPECT_TRUE(dialog.FindWindow(button)) << button;
        ExpectRoom(dialog);
    };
    Use(look);
    Lines log = TakeLog("INFO: Cartulo");
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnEditPreamble", TNS_ACTION},
                     {"INFO: Cartulo_Preamble::UpdatePreamble a", TNS_ACTION}}),
              log);
}

TEST_F(Preamble, IsThatOfTheFileShownLast)
{
    OpenTwo();
    Use([](Cartulo_Preamble &dialog) { ChooseItem(dialog, ID_PREAMBLE_FILE, 1); });
    auto look = [](Cartulo_Preamble &dialog) {
        EXPECT_EQ("b", FileOf(dialog)->GetStringSelection());
        EXPECT_EQ("other\r\n", TextOf(dialog)->GetValue());
    };
    Use(look);
    CurrentPreamble = 7;
    Use(look);
}

TEST_F(Preamble, NeedsAFile)
{
    Open("");
    ForgetLog();
    auto look = [](Cartulo_Preamble &dialog) {
        EXPECT_TRUE(FileOf(dialog)->IsEmpty());
        EXPECT_EQ("There is no editable BIB-files", TextOf(dialog)->GetValue());
        EXPECT_FALSE(TextOf(dialog)->IsEditable());
        EXPECT_TRUE(PressOK(dialog));
    };
    Use(look);
    Lines log = TakeLog("");
    EXPECT_EQ(1, std::count(log.begin(), log.end(),
                            LogLine{"ERROR: There is no editable BIB files", TNS_ERROR}));
    for (const LogLine &line : log)
        EXPECT_FALSE(wxString(line.text).Contains("Editing Preamble: ")) << line.text;
}

TEST_F(Preamble, OfAReadOnlyFileIsOnlyShown)
{
    OpenTwo();
    Panel()->Files()->files[0]->readOnly = 1;
    Use([](Cartulo_Preamble &dialog) { EXPECT_FALSE(TextOf(dialog)->IsEditable()); });
    Use(Type("new"));
    Use(Leave("new", 1, "other\r\n"));
    EXPECT_STREQ("\\def\\a{x}\r\n\\def\\b{y}\r\n", Stored());
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Preamble, IsThatOfTheLastOfFilesWithOneName)
{
    std::filesystem::create_directory(folder.Path("sub"));
    Open(folder.Write("a.bib", TwoPieces) + " " + folder.Write("sub/a.bib", OnePiece));
    auto type = [](Cartulo_Preamble &dialog) {
        EXPECT_EQ(1, FileOf(dialog)->GetSelection());
        EXPECT_EQ("other\r\n", TextOf(dialog)->GetValue());
        ChooseItem(dialog, ID_PREAMBLE_FILE, 0);
        EXPECT_EQ(1, FileOf(dialog)->GetSelection());
        EXPECT_EQ(1, CurrentPreamble);
        TextOf(dialog)->ChangeValue("new");
        ChooseItem(dialog, ID_PREAMBLE_FILE, 0); // shows the same file: no question
        EXPECT_EQ(1, FileOf(dialog)->GetSelection());
        EXPECT_EQ("new", TextOf(dialog)->GetValue());
        EXPECT_TRUE(PressOK(dialog));
    };
    Use(type);
    EXPECT_STREQ("\\def\\a{x}\r\n\\def\\b{y}\r\n", Stored(0));
    EXPECT_STREQ("new\r\n", Stored(1));
    EXPECT_EQ(0, Panel()->Files()->files[0]->modified);
    EXPECT_EQ(1, Panel()->Files()->files[1]->modified);
}

// --- Accepting ---

TEST_F(Preamble, IsAcceptedByOK)
{
    OpenTwo();
    ForgetLog();
    Use(Type("\\def\\a{x}\r\n\\def\\b{y\n}\r\nlast"));
    Lines log = TakeLog("");
    for (const LogLine &line :
         Lines{{"INFO: Cartulo_Preamble::OnOK", TNS_ACTION},
               {"Cartulo: Editing Preamble: Preamble was changed - save it.", TNS_TRACE}})
        EXPECT_EQ(1, std::count(log.begin(), log.end(), line)) << line.text;
    EXPECT_EQ("@PREAMBLE{{\\def\\a{x}}\n\t# {\\def\\b{y\n}}\n\t# {last} }\n\n", Saved());
}

TEST_F(Preamble, MayBecomeEmpty)
{
    OpenTwo();
    Use(Type(""));
    EXPECT_EQ("", Saved());
}

TEST_F(Preamble, IsLeftAloneWhenItIsTheSame)
{
    OpenText("@preamble{{\253quoted\273}}\n");
    ForgetLog();
    Use([](Cartulo_Preamble &dialog) { EXPECT_TRUE(PressOK(dialog)); });
    EXPECT_EQ((Lines{{"Cartulo: Editing Preamble: Preamble was not changed", TNS_TRACE}}),
              TakeLog("Cartulo: Editing Preamble"));
    EXPECT_FALSE(SaveEnabled());
    EXPECT_STREQ("\253quoted\273\r\n", Stored());
}

TEST_F(Preamble, IsLeftAloneByCancel)
{
    OpenTwo();
    Use([](Cartulo_Preamble &dialog) {
        TextOf(dialog)->ChangeValue("new");
        dialog.Show();
        PressButton(dialog, wxID_CANCEL);
        EXPECT_FALSE(dialog.IsShown());
    });
    EXPECT_STREQ("\\def\\a{x}\r\n\\def\\b{y}\r\n", Stored());
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Preamble, IsRefusedForAWrongPieceAndGoesToTheClipboard)
{
    OpenTwo();
    Use(Type("good\r\nbad}\r\n"), SyntaxError("bad}\n:Unbalanced braces (extra `}')"));
    EXPECT_STREQ("\\def\\a{x}\r\n\\def\\b{y}\r\n", Stored());
    EXPECT_FALSE(SaveEnabled());
    EXPECT_EQ("good\nbad}\n", Clipboard());
    EXPECT_EQ("The preamble is as it was; what you typed is in the clipboard.", Status());
}

TEST_F(Preamble, TellsOfEachWrongPiece)
{
    OpenTwo();
    wxTEST_DIALOG(Send(ID_PREAMBLE), UsePreamble(Type("a}\nb}")),
                  SyntaxError("a}\n:Unbalanced braces (extra `}')"),
                  SyntaxError("b}\n:Unbalanced braces (extra `}')"));
}

TEST_F(Preamble, IsRefusedWhenItIsTooLong)
{
    OpenTwo();
    Use(Type(Long(8200), false), ExpectBox("Editing Preamble", TooLong, wxID_OK, Refusal));
    EXPECT_FALSE(SaveEnabled());
    Use(Type(Long(8189)));
    EXPECT_EQ(8191u, strlen(Stored()));
}

TEST_F(Preamble, AsksBeforeItLosesCharacters)
{
    OpenTwo();
    wxString question = L"`PREAMBLE': \u0142 can't be stored in CP1252 and would become \u00FF.\n"
                        L"\nDo you want to accept these changes anyway ?";
    const long style = wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION;
    Use(Type(L"\u0142", false), ExpectBox("Editing Preamble Question", question, wxID_NO, style));
    EXPECT_FALSE(SaveEnabled());
    Use(Type(L"\u0142"), ExpectBox("Editing Preamble Question", question, wxID_YES, style));
    EXPECT_STREQ("\377\r\n", Stored());
}

TEST_F(Preamble, KeepsGuillemetsOfPiecesThatAreNotTouched)
{
    OpenText("@preamble{{{Zo\303\253}} # {b}}\n"); // a letter of UTF-8 in another code page
    Use(Type(L"{Zo\u00C3\u00AB}\r\nb!\r\n"));
    EXPECT_STREQ("{Zo\303\253}\r\nb!\r\n", Stored());
}

TEST_F(Preamble, ShowsWhatTheCodePageTakesForTheEndOfAText)
{
    Open(folder.Write("a.bib", "@preamble{{a \200 b} # {c}}\n") + " -eCP20127");
    Use([](Cartulo_Preamble &dialog) {
        EXPECT_EQ(wxString(L"a \uFFFD b\r\nc\r\n"), TextOf(dialog)->GetValue());
        TextOf(dialog)->ChangeValue(L"a \uFFFD b\r\nnew\r\n");
        EXPECT_TRUE(PressOK(dialog));
    });
    EXPECT_STREQ("a \200 b\r\nnew\r\n", Stored());
}

TEST_F(Preamble, GetsPastedTextWithTheLineEndsOfEnter)
{
    OpenTwo();
    auto paste = [](Cartulo_Preamble &dialog) {
        {
            wxClipboardLocker lock;
            wxTheClipboard->SetData(new wxTextDataObject("{c\r\nd}"));
        }
        TextOf(dialog)->SetInsertionPointEnd();
        TextOf(dialog)->Paste();
        wxString pasted = "\\def\\a{x}\r\n\\def\\b{y}\r\n{c\nd}";
        EXPECT_TRUE(WaitFor([&] { return TextOf(dialog)->GetValue() == pasted; }));
        EXPECT_TRUE(PressOK(dialog));
    };
    Use(paste);
    EXPECT_STREQ("\\def\\a{x}\r\n\\def\\b{y}\r\n{c\nd}\r\n", Stored());
}

TEST_F(Preamble, TakesNoPastedTextThatIsTooLong)
{
    OpenTwo();
    auto paste = [](Cartulo_Preamble &dialog) {
        {
            wxClipboardLocker lock;
            wxTheClipboard->SetData(new wxTextDataObject(Long(8200)));
        }
        wxString before = TextOf(dialog)->GetValue();
        TextOf(dialog)->Paste();
        HandleQueuedEvents();
        EXPECT_EQ(before, TextOf(dialog)->GetValue());
    };
    Use(paste, ExpectBox("Editing Preamble",
                         "The preamble of a file can have 8191 bytes, with two for the end of each "
                         "piece.\nThis one has 8200, 9 too many.\n\nShorten it to continue.",
                         wxID_OK, Refusal));
}

// --- Turning to another file ---

TEST_F(Preamble, IsStoredUncheckedOnYesWhenAnotherFileIsChosen)
{
    OpenTwo();
    Use(Leave("bad}", 1, "other\r\n"), AcceptQuestion(wxID_YES));
    EXPECT_STREQ("bad}\r\n", Stored());
    EXPECT_EQ(1, Panel()->Files()->files[0]->modified);
}

TEST_F(Preamble, StaysWhenItWouldMakeTheFileUnreadable)
{
    OpenTwo();
    wxString text = L"see \u00ABb c";
    wxTEST_DIALOG(Send(ID_PREAMBLE), UsePreamble(Leave(text, 0, text)), AcceptQuestion(wxID_YES),
                  ExpectBox("Editing Preamble",
                            "The marks of an abbreviation must be a pair around the name of one.\n"
                            "Else the file could not be read any more.\n\nFix it to continue.",
                            wxID_OK, Refusal));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Preamble, ShowsTheFileThatTheQuestionIsAbout)
{
    OpenTwo();
    auto leave = [this](Cartulo_Preamble &dialog) {
        TextOf(dialog)->ChangeValue("new");
        WhileBoxIsOpen look([&] { EXPECT_EQ(0, FileOf(dialog)->GetSelection()); }, wxID_NO);
        ChooseItem(dialog, ID_PREAMBLE_FILE, 1);
        EXPECT_EQ(1, look.boxes);
        EXPECT_EQ(1, FileOf(dialog)->GetSelection());
    };
    Use(leave);
}

TEST_F(Preamble, IsDroppedOnNoWhenAnotherFileIsChosen)
{
    OpenTwo();
    Use(Leave("new", 1, "other\r\n"), AcceptQuestion(wxID_NO));
    EXPECT_STREQ("\\def\\a{x}\r\n\\def\\b{y}\r\n", Stored());
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Preamble, StaysWhenTheQuestionIsLeft)
{
    OpenTwo();
    Use(Leave("new", 0, "new"), AcceptQuestion(wxID_CANCEL));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Preamble, IsLeftWithoutAQuestionWhenItIsTheSame)
{
    OpenTwo();
    Use(Leave("\\def\\a{x}\n\\def\\b{y}", 1, "other\r\n"));
}

TEST_F(Preamble, StaysWhenItIsTooLongToBeLeft)
{
    OpenTwo();
    wxString text = Long(8200);
    wxTEST_DIALOG(Send(ID_PREAMBLE), UsePreamble(Leave(text, 0, text)), AcceptQuestion(wxID_YES),
                  ExpectBox("Editing Preamble", TooLong, wxID_OK, Refusal));
    EXPECT_FALSE(SaveEnabled());
}

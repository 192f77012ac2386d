// tests/gui/encoding_test.cpp - files in UTF-8 and in a code page, side by side in one window.

#include "tests/gui/DialogTest.h"
#include "tests/gui/EditTest.h"

#include <wx/listbox.h>
#include <wx/srchctrl.h>
#include <wx/statusbr.h>

#include "session/KnownStrings.h"
#include "ui/EntryDialogs.h"
#include "ui/Preamble.h"
#include "ui/PreambleText.h"
#include "ui/Strings.h"

using Texts = std::vector<wxString>;

// As a save writes them. Characters of 1 to 4 bytes, right-to-left and combining ones, private
// ones, and guillemets that are text.
static const char World[] =
    "% \xD0\xB1\xD0\xB8\xD0\xB1\xD0\xBB\xD0\xB8\xD0\xBE\n"
    "@PREAMBLE{{\xC3\xBC} }\n\n"
    "@STRING{z\xC3\xBCrich = {Z\xC3\xBCrich}}\n\n"
    "@misc{M\xC3\xBCller,\n"
    "\tauthor = {\xC5\x81ukasz \xD0\x98\xD0\xB2\xD0\xB0\xD0\xBD},\n"
    "\ttitle = {\xD7\xA9\xD7\x9C\xD7\x95\xD7\x9D e\xCC\x81 \xE2\x82\xAC},\n"
    "\tnote = {\xC2\xAB\xF0\x9F\x98\x80\xC2\xBB \xEE\x80\x80\xEF\xBF\xBE},\n"
    "\taddress = z\xC3\xBCrich,\n"
    "\tyear = 2001\n}\n";
static const char Latin[] = "@misc{H\xF6\xDF,\n\tauthor = {J\xFCrgen},\n\tyear = 1950\n}\n";

class Encodings : public Edit
{
protected:
    void SetUp() override
    {
        Edit::SetUp();
        folder.Write("Cartulo/cartulo.ini",
                     std::string("[Preamble]\nEncoding=CP65001\n") + EditTypes);
        CurrentPreamble = 0;
        CurrentStringSource = STRINGS_OF_ALL_FILES;
    }

    void OpenBoth() { Open(folder.Write("a.bib", World) + " " + folder.Write("b.bib", Latin)); }

    wxString EncodingField() const { return frame->GetStatusBar()->GetStatusText(1); }

    void SelectRow(int row)
    {
        List()->SetSelection(row);
        wxCommandEvent event(wxEVT_LISTBOX, ID_INDEX);
        event.SetEventObject(List());
        List()->ProcessWindowEvent(event);
    }

    void Commit()
    {
        wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
        EXPECT_FALSE(Panel()->InEditMode());
    }

    // Answers the question about what would be lost with No.
    void RefuseToLose(const wxString &losses)
    {
        wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES),
                      ExpectBox(CommitTitle,
                                losses + "\n\nDo you want to accept these changes anyway ?",
                                wxID_NO, wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION));
        EXPECT_TRUE(Panel()->InEditMode());
    }

    std::string SavedFile(const char *name)
    {
        EXPECT_EQ(1, Panel()->SaveAll(true));
        return folder.Read(name);
    }

    static std::string Replaced(std::string text, const std::string &what, const std::string &with)
    {
        return text.replace(text.find(what), what.size(), with);
    }
};

// --- Showing ---

TEST_F(Encodings, AreShownSideBySide)
{
    OpenBoth();
    EXPECT_EQ((Texts{L"H\u00F6\u00DF (b)", L"M\u00FCller (a)"}), Rows());
    EXPECT_EQ("CP1252", EncodingField());
    EXPECT_EQ((Field{"author", L"J\u00FCrgen"}), ShownFields().at(0));
    SelectRow(1);
    EXPECT_EQ("UTF-8", EncodingField());
    EXPECT_EQ((std::vector<Field>{{"author", L"\u0141ukasz \u0418\u0432\u0430\u043D"},
                                  {"title", L"\u05E9\u05DC\u05D5\u05DD e\u0301 \u20AC"},
                                  {"note", L"\u00AB\U0001F600\u00BB \uE000\uFFFE"},
                                  {"address", L"\u00ABz\u00FCrich\u00BB"},
                                  {"year", "2001"}}),
              ShownFields());
}

TEST_F(Encodings, AreNamedForTheSelectedEntryOnly)
{
    OpenBoth();
    SearchFor("no such text");
    EXPECT_EQ("", EncodingField());
    SearchFor("");
    EXPECT_EQ("CP1252", EncodingField());
    Panel()->ProcessCommand(("-eCP1251 " + folder.Path("b.bib")).c_str(), "test");
    Panel()->ShowOpenFiles();
    EXPECT_EQ("CP1251", EncodingField());
    EXPECT_EQ((Texts{L"H\u0446\u042F (b)"}), Rows());
}

TEST_F(Encodings, ComeFromTheIniFileOnlyWithoutAnOption)
{
    Open(folder.Write("a.bib", World) + " -eCP1252");
    EXPECT_EQ("CP1252", EncodingField());
    EXPECT_EQ((Texts{L"M\u00C3\u00BCller (a)"}), Rows());
}

TEST_F(Encodings, AreAnErrorWhenTheIniFileNamesNone)
{
    folder.Write("Cartulo/cartulo.ini", "[Preamble]\nEncoding=UTF-8\n");
    wxString text;
    wxTEST_DIALOG(
        {
            Open(folder.Write("a.bib", Latin));
            HandleQueuedEvents();
        },
        ExpectMessages("There are errors in loading BIB files", &text));
    EXPECT_TRUE(text.StartsWith("ERROR: The file '" + folder.Path("Cartulo/cartulo.ini") +
                                "' names the encoding 'UTF-8', which is not known (UTF-8"));
    EXPECT_EQ("CP1252", EncodingField());
}

// --- Searching ---

TEST_F(Encodings, AreSearchedForTheSameLetters)
{
    OpenBoth();
    SearchFor(L"j\u00FCrg");
    EXPECT_EQ((Texts{L"H\u00F6\u00DF (b)"}), Rows());
    SearchFor(L"\u0142UKASZ \u0438\u0412");
    EXPECT_EQ((Texts{L"M\u00FCller (a)"}), Rows());
    SearchFor(L"J\u00DC"); // the case of other letters counts in a code page
    EXPECT_EQ(Texts(), Rows());
}

TEST_F(Encodings, AreThoseOfKeysThatAreTyped)
{
    OpenBoth();
    TypeIntoList('m', 1000);
    TypeIntoList(L'\u00FC', 1100);
    EXPECT_EQ(1, List()->GetSelection());
    EXPECT_EQ(L"m\u00FC", Status());
    TypeIntoList('h', 5000);
    TypeIntoList(L'\u00F6', 5100);
    TypeIntoList(L'\u00DF', 5200);
    EXPECT_EQ(0, List()->GetSelection());
    EXPECT_EQ(L"h\u00F6\u00DF", Status());
}

// --- Editing ---

TEST_F(Encodings, KeepTheBytesOfWhatIsNotTouched)
{
    OpenBoth();
    SelectRow(1);
    StartEditing();
    SetValue("year", "2002");
    Commit();
    EXPECT_EQ(Replaced(World, "2001", "2002"), SavedFile("a.bib"));
    EXPECT_EQ(Latin, folder.Read("b.bib"));
}

TEST_F(Encodings, AreThoseOfTheFileForWhatIsTyped)
{
    OpenBoth();
    SelectRow(1);
    StartEditing();
    SetValue("author", L"J\u00FCrgen \U0001F600"); // no guillemets, so no question about them
    Commit();
    EXPECT_EQ(Replaced(World, "\xC5\x81ukasz \xD0\x98\xD0\xB2\xD0\xB0\xD0\xBD",
                       "J\xC3\xBCrgen \xF0\x9F\x98\x80"),
              SavedFile("a.bib"));
}

TEST_F(Encodings, AskBeforeALetterIsLostThatOnlyOneOfThemHas)
{
    OpenBoth();
    StartEditing();
    SetValue("author", L"\u0416 J\u00FCrgen");
    RefuseToLose(L"`author': \u0416 can't be stored in CP1252 and would become \u00FF.");
    SetValue("author", L"\u20AC J\u00FCrgen");
    Commit();
    EXPECT_EQ(Replaced(Latin, "{J", "{\x80 J"), SavedFile("b.bib"));
}

TEST_F(Encodings, AskBeforeGuillemetsOfAUtf8FileBecomeMarks)
{
    OpenBoth();
    SelectRow(1);
    StartEditing();
    SetValue("note", L"\u00ABz\u00FCrich\u00BB");
    RefuseToLose(L"`note': \u00AB and \u00BB will mark an abbreviation, not stand as text.");
}

TEST_F(Encodings, AskBeforeQuotedWordsBecomeAbbreviations)
{
    OpenBoth();
    StartEditing();
    SetValue("author", L"Le \u00ABMonde\u00BB");
    RefuseToLose(L"`author': no abbreviation \u00ABMonde\u00BB is known. As text, quotation marks "
                 L"are typed in another way, like << and >>.");
    SetValue("author", L"\u00ABz\u00FCrich\u00BB \u00ABjan\u00BB"); // of the other file; a month
    Commit();
    EXPECT_EQ(Replaced(Latin, "{J\xFCrgen}", "z\xFCrich # { } # jan"), SavedFile("b.bib"));
}

// --- Windows ---

TEST_F(Encodings, AreThoseOfTheFileForANewKey)
{
    OpenBoth();
    auto type = [](const wxString &key, int file, bool closes) {
        return UseDialog<Cartulo_NewEntry>([=](Cartulo_NewEntry &dialog) {
            ChooseItem(dialog, ID_ENTRY_FILE, file);
            Find<wxTextCtrl>(dialog, ID_ENTRY_KEY)->SetValue(key);
            EXPECT_EQ(closes, PressOK(dialog));
        });
    };
    wxTEST_DIALOG(Send(ID_NEW_ENTRY), type(L"\u0416uk", 1, false),
                  ExpectBox("Adding New Entry",
                            "The key includes characters that can't be stored in CP1252.",
                            wxID_OK));
    wxTEST_DIALOG(Send(ID_NEW_ENTRY), type(L"\u0416uk", 0, true));
    wxTEST_DIALOG(Send(ID_NEW_ENTRY), type(L"\u00DCb", 1, true));
    EXPECT_NE(std::string::npos, SavedFile("a.bib").find("\xD0\x96uk"));
    EXPECT_NE(std::string::npos, folder.Read("b.bib").find("\xDC"
                                                           "b"));
}

TEST_F(Encodings, AreThoseOfEachFileInTheListOfStrings)
{
    Open(folder.Write("a.bib", World) + " " +
         folder.Write("b.bib", std::string("@string{\xF6 = {\xD6}}\n") + Latin));
    wxTEST_DIALOG(Send(ID_STRINGS), UseDialog<Cartulo_Strings>([](Cartulo_Strings &dialog) {
                      EXPECT_EQ((Texts{L"z\u00FCrich = Z\u00FCrich", L"\u00F6 = \u00D6"}),
                                Items(FirstChild<wxListBox>(&dialog)));
                  }));
}

TEST_F(Encodings, AreThoseOfTheFileForAPreamble)
{
    Open(folder.Write("a.bib", World));
    wxTEST_DIALOG(Send(ID_PREAMBLE), UseDialog<Cartulo_Preamble>([](Cartulo_Preamble &dialog) {
                      wxTextCtrl *text = Find<wxTextCtrl>(dialog, ID_PREAMBLE_TEXT);
                      EXPECT_EQ(L"\u00FC\r\n", text->GetValue());
                      text->SetValue(L"\u0416\r\n");
                      EXPECT_TRUE(PressOK(dialog));
                  }));
    EXPECT_EQ(Replaced(World, "{\xC3\xBC}", "{\xD0\x96}"), SavedFile("a.bib"));
}

TEST_F(Encodings, AreThoseOfTheFileForItsMessages)
{
    wxString text;
    wxTEST_DIALOG(
        {
            Open(folder.Write("a.bib", "@misc{\xC3\xBC \xC3\xBC}\n"));
            HandleQueuedEvents();
        },
        ExpectMessages("There are errors in loading BIB files", &text));
    EXPECT_TRUE(text.Contains(L"found \"\u00FC\"")) << text;
}

// --- Text between the items ---

TEST_F(Encodings, KeepTheTextBetweenTheItems)
{
    const std::string text = "% head\n@STRING{s = {S}}\n% s\n@STRING{t = {T}}\n\n% one\n"
                             "@misc{one,\n\ta = 1\n}\n% two\n@misc{two,\n\ta = 2\n}\n% end\n";
    OpenText(text);
    StartEditing();
    SetValue("a", "3");
    Commit();
    EXPECT_EQ(Replaced(text, "a = 1", "a = 3"), Saved());
    List()->SetSelection(0);
    wxTEST_DIALOG(Send(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "one (a)", wxID_YES));
    EXPECT_EQ("% head\n@STRING{s = {S}}\n% s\n@STRING{t = {T}}\n\n% one\n% two\n"
              "@misc{two,\n\ta = 2\n}\n% end\n",
              Saved());
}

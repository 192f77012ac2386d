// tests/gui/list_test.cpp - the entry list in the window: rows, search, type-ahead.

#include "tests/gui/GuiTest.h"

#include <cstring>
#include <regex>

#include <wx/srchctrl.h>
#include <wx/scrolwin.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "ui/Cartulo.h"
#include "ui/Ids.h"
#include "ui/QListBox.h"

class ListInWindow : public CartuloWindow
{
protected:
    void SetUp() override
    {
        std::string animals = folder.Write("animals.bib", "@book{zebra, title = {Stripes}}\n"
                                                          "@book{Aba, title = {Letters}}\n"
                                                          "@book{abe, title = {Monkeys}}\n");
        std::string plants = folder.Write("plants.bib", "@misc{knuth84, note = {Oak}}\n"
                                                        "@misc{knight, note = {Monkey puzzle}}\n");
        Open(animals + " " + plants);
    }

    wxString Selected() const
    {
        int row = List()->GetSelection();
        return row < 0 ? wxString("none") : List()->GetItemText(row);
    }
};

TEST_F(ListInWindow, ShowsAllEntriesOfAllFilesSorted)
{
    std::vector<wxString> expected = {"Aba (animals)", "abe (animals)", "knight (plants)",
                                      "knuth84 (plants)", "zebra (animals)"};
    EXPECT_EQ(expected, Rows());
    EXPECT_EQ("Aba (animals)", Selected());
    EXPECT_EQ("There are 5 bibliography entries in 2 BIB files.", Status());
}

TEST_F(ListInWindow, ShowsTheEntryOfTheSelectedRow)
{
    EXPECT_EQ("book", TextAfter("Entry Type:"));
    EXPECT_EQ(folder.Path("animals.bib"), TextAfter("BIB File:"));
    EXPECT_EQ((std::vector<Field>{{"title", "Letters"}}), ShownFields());
    List()->SetSelection(2);
    wxCommandEvent event(wxEVT_LISTBOX, ID_INDEX);
    List()->ProcessWindowEvent(event);
    EXPECT_EQ("misc", TextAfter("Entry Type:"));
    EXPECT_EQ(folder.Path("plants.bib"), TextAfter("BIB File:"));
    EXPECT_EQ((std::vector<Field>{{"note", "Monkey puzzle"}}), ShownFields());
}

TEST_F(ListInWindow, ShowsTheEntryOfARowThatIsDoubleClicked)
{
    List()->SetSelection(2);
    ForgetLog();
    wxMouseEvent event(wxEVT_LEFT_DCLICK);
    event.SetPosition(List()->GetItemRect(2).GetTopLeft());
    List()->ProcessWindowEvent(event);
    std::vector<LogLine> expected = {
        {"INFO: Cartulo::OnIndexActivate to knight (plants)", TNS_ACTION}};
    EXPECT_EQ(expected, TakeLog("INFO: Cartulo::On"));
    EXPECT_EQ((std::vector<Field>{{"note", "Monkey puzzle"}}), ShownFields());
    EXPECT_FALSE(Panel()->InEditMode());
}

TEST_F(ListInWindow, LogsADoubleClickOnNoRow)
{
    SearchFor("nowhere");
    ForgetLog();
    wxCommandEvent event(wxEVT_LISTBOX_DCLICK, ID_INDEX);
    List()->ProcessWindowEvent(event);
    std::vector<LogLine> expected = {
        {"WARNING: Cartulo::OnIndexActivate no selection in index", TNS_WARNING}};
    EXPECT_EQ(expected, TakeLog(""));
}

TEST_F(ListInWindow, NarrowsToWhatTheSearchFinds)
{
    SearchFor("MONKEY");
    EXPECT_EQ((std::vector<wxString>{"abe (animals)", "knight (plants)"}), Rows());
    EXPECT_EQ("abe (animals)", Selected());
    EXPECT_EQ((std::vector<Field>{{"title", "Monkeys"}}), ShownFields());
}

TEST_F(ListInWindow, SearchesValuesAndNotKeys)
{
    SearchFor("knuth");
    EXPECT_TRUE(Rows().empty());
}

TEST_F(ListInWindow, ShowsAnEmptyPaneWhenNothingIsFound)
{
    SearchFor("nowhere");
    EXPECT_TRUE(Rows().empty());
    EXPECT_EQ("none", Selected());
    EXPECT_TRUE(ShownFields().empty());
    EXPECT_EQ(nullptr, Panel()->CurrentEntry());
    EXPECT_TRUE(IsShowing(ID_INDEX));
    SearchFor("");
    EXPECT_EQ(5u, Rows().size());
    EXPECT_EQ(1u, ShownFields().size());
}

TEST_F(ListInWindow, SaysWhenNothingIsFound)
{
    SearchFor("nowhere");
    EXPECT_EQ("No entry holds this text.", Status());
    SearchFor("oak");
    EXPECT_EQ("", Status());
    SearchFor("nowhere");
    SearchFor("");
    EXPECT_EQ("", Status());
}

TEST_F(ListInWindow, LogsTheSearchTextAsItWasTyped)
{
    ForgetLog();
    SearchFor(L"M\u00FCnchen");
    std::vector<LogLine> expected = {{"INFO: Cartulo::OnSearch M\xC3\xBCnchen", TNS_ACTION}};
    EXPECT_EQ(expected, TakeLog("INFO: Cartulo::OnSearch"));
}

TEST_F(ListInWindow, KeepsTheEntryThatWasFoundWhenTheSearchIsCleared)
{
    SearchFor("puzzle");
    SearchFor("");
    EXPECT_EQ("knight (plants)", Selected());
    EXPECT_EQ((std::vector<Field>{{"note", "Monkey puzzle"}}), ShownFields());
}

TEST_F(ListInWindow, SearchesForTheSameLettersInAnotherCodePage)
{
    Open(folder.Write("a.bib", "@misc{one, note = {\xE9}}\n@misc{two, note = {\x82}}\n"));
    SearchFor(L"\u00E9");
    EXPECT_EQ((std::vector<wxString>{"one (a)"}), Rows());
    frame->TakeCommand((folder.Path("a.bib") + " -eCP852").c_str());
    EXPECT_EQ((std::vector<wxString>{"two (a)"}), Rows());
    frame->TakeCommand((folder.Path("a.bib") + " -eCP1252").c_str());
    EXPECT_EQ((std::vector<wxString>{"one (a)"}), Rows());
}

TEST_F(ListInWindow, RefusesASearchFromElsewhere)
{
    wxCommandEvent event(wxEVT_TEXT, ID_SEARCH);
    event.SetEventObject(List());
    event.SetString("Oak");
    frame->ProcessWindowEvent(event);
    EXPECT_EQ(5u, Rows().size());
    std::vector<LogLine> expected = {{"ERROR: Cartulo::OnSearch Uknown source", TNS_ERROR}};
    EXPECT_EQ(expected, TakeLog("ERROR: "));
}

TEST_F(ListInWindow, FindsAKeyByItsFirstLetters)
{
    TypeIntoList('k', 1000);
    EXPECT_EQ("knight (plants)", Selected());
    TypeIntoList('n', 1500);
    TypeIntoList('u', 2500); // exactly a second later
    EXPECT_EQ("knuth84 (plants)", Selected());
    EXPECT_EQ("knu", Status());
    EXPECT_EQ((std::vector<Field>{{"note", "Oak"}}), ShownFields());
}

TEST_F(ListInWindow, StartsAnewAfterMoreThanASecond)
{
    TypeIntoList('k', 1000);
    TypeIntoList('z', 2001);
    EXPECT_EQ("zebra (animals)", Selected());
    EXPECT_EQ("z", Status());
}

TEST_F(ListInWindow, KeepsSelectionAndPrefixWhenALetterMatchesNothing)
{
    TypeIntoList('k', 1000);
    TypeIntoList('q', 1100);
    EXPECT_EQ("knight (plants)", Selected());
    EXPECT_EQ("k", Status());
    TypeIntoList('n', 1200);
    TypeIntoList('u', 1300);
    EXPECT_EQ("knuth84 (plants)", Selected());
}

TEST_F(ListInWindow, StartsAnewAfterAnotherRowWasSelected)
{
    TypeIntoList('k', 1000);
    List()->SetSelection(4);
    TypeIntoList('a', 1100);
    EXPECT_EQ("Aba (animals)", Selected()); // not "ka"
}

TEST_F(ListInWindow, LeavesModifiedKeysAlone)
{
    TypeIntoList('z', 1000, wxMOD_ALT);
    TypeIntoList('z', 1000, wxMOD_SHIFT);
    TypeIntoList(0, 1000);
    EXPECT_EQ("Aba (animals)", Selected());
}

TEST_F(ListInWindow, LogsEachKeyInAWholeLine)
{
    const char prefix[] = "INFO: QListBox:OnChar ";
    const struct {
        wxChar key;
        const char *character;
    } keys[] = {{0, "0( )"},
                {8, "8( )"},
                {'q', "113(q)"},
                {0xFC, "252(\xC3\xBC)"},
                {0x1D4B3, "119987(\xF0\x9D\x92\xB3)"}};
    for (const auto &row : keys) {
        ForgetLog();
        TypeIntoList(row.key, 2000);
        std::vector<LogLine> lines = TakeLog(prefix);
        ASSERT_EQ(1u, lines.size());
        std::string start = std::string(prefix) + "Key=" + row.character + ", Time=2000-";
        EXPECT_EQ(start, lines[0].text.substr(0, start.size()));
        EXPECT_EQ(" ms", lines[0].text.substr(lines[0].text.size() - 3));
        EXPECT_EQ(TNS_LIFECYCLE, lines[0].level);
    }
}

TEST_F(ListInWindow, LogsHowLongItTakesToFill)
{
    ForgetLog();
    EXPECT_EQ(1, List()->Update_Index(nullptr, ""));
    std::vector<LogLine> lines = TakeLog("");
    ASSERT_EQ(1u, lines.size());
    EXPECT_TRUE(
        std::regex_match(lines[0].text, std::regex("QListBox::Update_Index Time: [0-9]+ ms")))
        << lines[0].text;
    EXPECT_EQ(TNS_ACTION, lines[0].level);
}

TEST_F(ListInWindow, ReturnsZeroWithoutFilesAndNeverReadsTheOldRows)
{
    EXPECT_EQ(1, List()->Update_Index(nullptr, ""));
    frame->TakeCommand(""); // closes all files
    EXPECT_EQ(0, List()->Update_Index(nullptr, ""));
    EXPECT_EQ(-1, List()->GetSelection());
    EXPECT_EQ(nullptr, List()->Item(0));
    EXPECT_EQ("", List()->GetItemText(0));
}

TEST_F(ListInWindow, ShowsSixteenFieldsAtMost)
{
    std::string text = "@misc{many";
    for (int i = 10; i < 30; ++i)
        text += ", field" + std::to_string(i) + " = {" + std::to_string(i) + "}";
    frame->TakeCommand(folder.Write("many.bib", text + "}\n").c_str());
    std::vector<Field> fields = ShownFields();
    ASSERT_EQ(16u, fields.size());
    EXPECT_EQ((Field{"field10", "10"}), fields.front());
    EXPECT_EQ((Field{"field25", "25"}), fields.back());
    EXPECT_GT(EntryPane()->GetVirtualSize().y, EntryPane()->GetClientSize().y) << "must scroll";
}

TEST_F(ListInWindow, TellsOfTheFieldsThatItDoesNotShow)
{
    auto open = [&](int fields) {
        std::string text = "@misc{many";
        for (int i = 0; i < fields; ++i)
            text += ", f" + std::to_string(i) + " = 1";
        frame->TakeCommand(folder.Write(std::to_string(fields) + ".bib", text + "}\n").c_str());
    };
    auto note = [&] {
        for (wxWindow *child : EntryPane()->GetChildren()) {
            wxStaticText *text = dynamic_cast<wxStaticText *>(child);
            if (text && text->IsShown() && text->GetLabelText().EndsWith("not shown."))
                return text->GetLabelText();
        }
        return wxString();
    };
    open(16);
    EXPECT_EQ("", note());
    open(17);
    EXPECT_EQ("1 more field is not shown.", note());
    open(40);
    EXPECT_EQ("24 more fields are not shown.", note());
    SearchFor("nothing has this");
    EXPECT_EQ("", note());
}

TEST_F(ListInWindow, ShowsTextsInTheSelectedCodePage)
{
    std::string path =
        folder.Write("o.bib", "@misc{\xFCn, title = {M\xFCnchen \\& 100\x80} # jan}\n");
    frame->TakeCommand(path.c_str());
    EXPECT_EQ((std::vector<wxString>{L"\u00FCn (o)"}), Rows());
    EXPECT_EQ(L"M\u00FCnchen \\& 100\u20AC\u00ABjan\u00BB", ShownFields().at(0).value);
}

TEST_F(ListInWindow, ShowsFileNamesInTheSystemsEncoding)
{
    std::string path = folder.Write("M\xC3\xBCller.bib", "@misc{a, note = {n}}\n");
    frame->TakeCommand(("\"" + path + "\"").c_str());
    EXPECT_EQ((std::vector<wxString>{L"a (M\u00FCller)"}), Rows());
    EXPECT_TRUE(TextAfter("BIB File:").EndsWith(L"/M\u00FCller.bib"));
}

TEST_F(ListInWindow, HintsAtAValueThatIsTooLongForItsControl)
{
    std::string path =
        folder.Write("long.bib", "@misc{a, note = {" + std::string(70000, 'x') + "}, x = {y}}\n");
    frame->TakeCommand(path.c_str());
    std::vector<wxString> hints;
    for (wxWindow *child : EntryPane()->GetChildren()) {
        wxTextCtrl *value = dynamic_cast<wxTextCtrl *>(child);
        if (value && value->IsShown() && !value->IsMultiLine())
            hints.push_back(child->GetToolTipText());
    }
    EXPECT_EQ(
        (std::vector<wxString>{"This value can't be shown in full, so it stays as it is.", ""}),
        hints);
    EXPECT_EQ(70000u, strlen(Panel()->CurrentEntry()->fields[0].value));
}

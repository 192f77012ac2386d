// tests/gui/entry_dialogs_test.cpp - the commands that add, rename and remove entries, and their
// windows.

#include "tests/gui/DialogTest.h"

#include <cstdlib>

#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "ui/Cartulo.h"
#include "ui/EntryDialogs.h"
#include "ui/Ids.h"
#include "ui/QListBox.h"

using Lines = std::vector<LogLine>;

namespace
{

using UseNew = UseDialog<Cartulo_NewEntry>;
using UseRename = UseDialog<Cartulo_RenameEntry>;

wxChoice *FileOf(wxDialog &dialog)
{
    return Find<wxChoice>(dialog, ID_ENTRY_FILE);
}

wxTextCtrl *KeyOf(wxDialog &dialog)
{
    return Find<wxTextCtrl>(dialog, ID_ENTRY_KEY);
}

wxChoice *TypeOf(wxDialog &dialog)
{
    return Find<wxChoice>(dialog, ID_ENTRY_TYPE);
}

wxCheckBox *CheckOf(wxDialog &dialog)
{
    return Find<wxCheckBox>(dialog, ID_ENTRY_CHILD);
}

using ::PressOK;

// With this key; true when that closes the window.
bool PressOK(wxDialog &dialog, const wxString &key)
{
    KeyOf(dialog)->SetValue(key);
    return PressOK(dialog);
}

const char Adding[] = "Adding New Entry", Renaming[] = "Renaming Entry";
const char BadChars[] = "The key includes invalid characters.\n"
                        "We will remove them from key and continue.";
const char Elsewhere[] = "Specified Key is already present in another BIB files.\n"
                         "Are you shure that you want to add duplication in your BIB-File ?";
const char NewElsewhere[] = "Specified New Key is already present in another BIB files.\n"
                            "Are you shure that you want to add duplication in your BIB-File ?";
const long Refusal = wxOK | wxICON_EXCLAMATION, Offer = wxOK | wxCANCEL | wxICON_EXCLAMATION,
           Question = wxYES_NO | wxICON_QUESTION;

const char Talks[] = "@misc{Griske84, note = {Talk}}\n";
const char Books[] = "@book{Ost77, title = {East}}\n";
const char Broken[] = "@book{broken, title = {First}}\n@book{two\n";
const char Family[] = "@inbook{first, crossref = {parent}}\n"
                      "@inbook{second, crossref = {PARENT}}\n"
                      "@book{parent, title = {P}}\n"
                      "@inbook{last, crossref = {parent}}\n";

} // namespace

class EntryCommands : public CartuloWindow
{
protected:
    void SetUp() override
    {
        setenv("XDG_CONFIG_HOME", folder.Path().c_str(), 1);
        std::filesystem::create_directory(folder.Path("Cartulo"));
        folder.Write("Cartulo/cartulo.ini",
                     "[misc]\nnote=\n[book]\nauthor=*editor\neditor=*author\ntitle=*\nyear=\n");
    }

    // Files that have errors show their messages.
    void OpenBroken(const std::string &commandLine)
    {
        wxTEST_DIALOG(Open(commandLine), ExpectMessages("There are errors in loading BIB files"));
    }

    void Select(const wxString &row)
    {
        std::vector<wxString> rows = Rows();
        for (size_t i = 0; i < rows.size(); ++i) {
            if (rows[i] != row)
                continue;
            List()->SetSelection(int(i));
            wxCommandEvent event(wxEVT_LISTBOX, ID_INDEX);
            List()->ProcessWindowEvent(event);
            return;
        }
        ADD_FAILURE() << "no row " << row;
    }

    wxString Selected() const
    {
        int row = List()->GetSelection();
        return row < 0 ? wxString("none") : List()->GetItemText(row);
    }

    int Modified(int file) const { return Panel()->Files()->files[file]->modified; }

    std::string Saved(const std::string &name)
    {
        EXPECT_EQ(1, Panel()->SaveAll(true));
        return folder.Read(name);
    }

    template <class Dialog> void Show(int command, const std::function<void(Dialog &)> &steps)
    {
        ShowDialog<Dialog>([&] { Run(command); }, steps);
    }
};

using NewEntry = EntryCommands;
using RenameEntry = EntryCommands;
using RemoveEntry = EntryCommands;

// --- The window for a new entry ---

TEST_F(NewEntry, AsksForFileKeyTypeAndParent)
{
    Open(folder.Write("talks.bib", Talks) + " " + folder.Write("R&D.bib", Books));
    Select("Ost77 (R&D)");
    auto look = [](Cartulo_NewEntry &dialog) {
        EXPECT_EQ("Creating New Bibliography Entry", dialog.GetTitle());
        EXPECT_EQ((std::vector<wxString>{
                      "Add Entry to BIB-file:", "Entry Key:", "Entry Type:", "Create 'crossref':"}),
                  Labels(dialog));
        EXPECT_EQ((std::vector<wxString>{"talks", "R&D"}), Items(FileOf(dialog)));
        EXPECT_EQ("R&D", FileOf(dialog)->GetStringSelection());
        EXPECT_EQ("", KeyOf(dialog)->GetValue());
        EXPECT_EQ("book", TypeOf(dialog)->GetStringSelection());
        EXPECT_FALSE(CheckOf(dialog)->GetValue());
        EXPECT_TRUE(CheckOf(dialog)->IsEnabled());
        for (int button : {wxID_OK, wxID_CANCEL})
            EXPECT_TRUE(dialog.FindWindow(button)) << button;
        ExpectRoom(dialog);
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(look));
    EXPECT_EQ(wxID_CANCEL, Panel()->DialogResult());
}

TEST_F(NewEntry, OffersEveryTypeButTheFixedOnes)
{
    Open(folder.Write("a.bib", Talks));
    auto look = [](Cartulo_NewEntry &dialog) {
        std::vector<wxString> types = Items(TypeOf(dialog));
        ASSERT_EQ(size_t(BibTypeCount - BIB_FIXED_TYPES), types.size());
        for (int i = BIB_FIXED_TYPES; i < BibTypeCount; ++i)
            EXPECT_EQ(BibTypeTable[i], types[i - BIB_FIXED_TYPES]);
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(look));
}

TEST_F(NewEntry, HasDefaultsWithoutACurrentEntry)
{
    Open(folder.Write("a.bib", "") + " " + folder.Write("b.bib", ""));
    ASSERT_EQ(nullptr, Panel()->CurrentEntry());
    ForgetLog();
    auto look = [](Cartulo_NewEntry &dialog) {
        EXPECT_EQ("a", FileOf(dialog)->GetStringSelection());
        EXPECT_EQ(0, TypeOf(dialog)->GetSelection());
        EXPECT_FALSE(CheckOf(dialog)->IsEnabled());
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(look));
    EXPECT_EQ(Lines{}, TakeLog("ERROR: "));
}

TEST_F(NewEntry, LogsThatThereIsNoFileWhereItFoundOne)
{
    Open(folder.Write("a.bib", Talks));
    ForgetLog();
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew([](Cartulo_NewEntry &) {}));
    EXPECT_EQ((Lines{{"ERROR: There is no editable BIB files", TNS_ERROR}}), TakeLog("ERROR: "));
}

TEST_F(NewEntry, OffersTheFilesThatCanBeWritten)
{
    std::string broken = folder.Write("b.bib", Broken);
    OpenBroken(broken + " " + folder.Write("z.bib", Talks));
    Select("broken (b)");
    ForgetLog();
    auto look = [](Cartulo_NewEntry &dialog) {
        EXPECT_EQ((std::vector<wxString>{"z"}), Items(FileOf(dialog)));
        EXPECT_EQ("z", FileOf(dialog)->GetStringSelection());
        EXPECT_EQ("book", TypeOf(dialog)->GetStringSelection());
        EXPECT_FALSE(CheckOf(dialog)->IsEnabled()) << "its file can't be written";
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(look));
    EXPECT_EQ(Lines{}, TakeLog("ERROR: "));
}

TEST_F(NewEntry, OffersNoParentThatHasOneItself)
{
    Open(folder.Write("a.bib", Family));
    Select("second (a)");
    auto look = [](Cartulo_NewEntry &dialog) { EXPECT_FALSE(CheckOf(dialog)->IsEnabled()); };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(look));
}

TEST_F(NewEntry, NeedsAFileThatCanBeWritten)
{
    OpenBroken(folder.Write("b.bib", Broken));
    Run(ID_NEW_ENTRY);
    EXPECT_EQ("ERROR: You can't add entries to readonly BIB-files.", Status());
    frame->TakeCommand("");
    Run(ID_NEW_ENTRY);
    EXPECT_EQ("ERROR: You can't add entries to readonly BIB-files.", Status());
}

TEST_F(NewEntry, ShortensLongNames)
{
    std::string name(200, 'n');
    Open(folder.Write(name + ".bib", "@" + std::string(300, 't') + "{one, note = {x}}\n"));
    auto look = [&](Cartulo_NewEntry &dialog) {
        EXPECT_LT(dialog.GetSize().x, dialog.FromDIP(800));
        EXPECT_TRUE(PressOK(dialog, "new"));
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(look));
    EXPECT_EQ("new (" + name + ")", Selected());
}

// --- Its key ---

TEST_F(NewEntry, StaysOpenOnAnEmptyKey)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_NewEntry &dialog) { EXPECT_FALSE(PressOK(dialog, " \t ")); };
    wxTEST_DIALOG(
        Run(ID_NEW_ENTRY), UseNew(press),
        ExpectBox(Adding, "Please enter key of the new bibliography entry.", wxID_OK, Refusal));
    EXPECT_EQ(1u, Rows().size());
    EXPECT_EQ(0, Modified(0));
}

TEST_F(NewEntry, TakesTheBlanksOutOfItsKey)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_NewEntry &dialog) { EXPECT_TRUE(PressOK(dialog, " my key ")); };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(press));
    EXPECT_EQ("mykey (a)", Selected());
    EXPECT_EQ(wxID_OK, Panel()->DialogResult());
}

TEST_F(NewEntry, OffersToTakeBadCharactersOut)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_NewEntry &dialog) {
        EXPECT_FALSE(PressOK(dialog, "a{b}"));
        EXPECT_EQ("a{b}", KeyOf(dialog)->GetValue());
        EXPECT_FALSE(PressOK(dialog, "a {b}"));
        EXPECT_EQ("ab", KeyOf(dialog)->GetValue());
        EXPECT_TRUE(PressOK(dialog, KeyOf(dialog)->GetValue()));
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(press), ExpectBox(Adding, BadChars, wxID_CANCEL, Offer),
                  ExpectBox(Adding, BadChars, wxID_OK, Offer));
    EXPECT_EQ("ab (a)", Selected());
}

TEST_F(NewEntry, RefusesKeysThatCantBeStored)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_NewEntry &dialog) {
        EXPECT_FALSE(PressOK(dialog, wxString(L"\u0141ukasz{")));
        EXPECT_EQ(wxString(L"\u0141ukasz{"), KeyOf(dialog)->GetValue());
        EXPECT_FALSE(PressOK(dialog, "a\\b"));
        EXPECT_TRUE(PressOK(dialog, wxString(L"M\u00FCller")));
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(press),
                  ExpectBox(Adding, "The key includes characters that can't be stored in CP1252.",
                            wxID_OK, Refusal),
                  ExpectBox(Adding, "An entry with this key can't be written to a BIB file.",
                            wxID_OK, Refusal));
    EXPECT_STREQ("M\xFCller", Panel()->CurrentEntry()->key);
}

TEST_F(NewEntry, RefusesKeysOfTheFile)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_NewEntry &dialog) {
        EXPECT_FALSE(PressOK(dialog, "gRISKE84"));
        EXPECT_EQ("gRISKE84", KeyOf(dialog)->GetValue());
    };
    wxTEST_DIALOG(
        Run(ID_NEW_ENTRY), UseNew(press),
        ExpectBox(Adding, "Specified Key is already present in the BIB file.", wxID_OK, Refusal));
    EXPECT_EQ(1u, Rows().size());
}

TEST_F(NewEntry, AsksAboutKeysOfOtherFiles)
{
    Open(folder.Write("a.bib", Talks) + " " + folder.Write("b.bib", Books));
    ASSERT_EQ("Griske84 (a)", Selected());
    auto press = [](Cartulo_NewEntry &dialog) {
        EXPECT_FALSE(PressOK(dialog, "ost77"));
        EXPECT_FALSE(PressOK(dialog, "ost77"));
        EXPECT_TRUE(PressOK(dialog, "ost77"));
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(press), ExpectBox(Adding, Elsewhere, wxID_NO, Question),
                  ExpectBox(Adding, Elsewhere, wxID_CANCEL, Question),
                  ExpectBox(Adding, Elsewhere, wxID_YES, Question));
    EXPECT_EQ("ost77 (a)", Selected());
    EXPECT_EQ(3u, Rows().size());
}

// --- What it makes ---

TEST_F(NewEntry, HasTheMandatoryFieldsOfItsType)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_NewEntry &dialog) {
        EXPECT_TRUE(TypeOf(dialog)->SetStringSelection("book"));
        EXPECT_TRUE(PressOK(dialog, "new1"));
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(press));
    EXPECT_EQ("new1 (a)", Selected());
    EXPECT_STREQ("new1", Panel()->CurrentEntry()->key);
    EXPECT_EQ("book", TextAfter("Entry Type:"));
    EXPECT_EQ((std::vector<Field>{{"author", ""}, {"editor", ""}, {"title", ""}}), ShownFields());
    EXPECT_EQ(1, Modified(0));
    EXPECT_TRUE(SaveEnabled());
    EXPECT_EQ("@book{new1,\n\tauthor = {},\n\teditor = {},\n\ttitle = {}\n}\n"
              "@misc{Griske84,\n\tnote = {Talk}\n}\n",
              Saved("a.bib"));
}

TEST_F(NewEntry, ReadsTheDescriptionOfItsTypeAfresh)
{
    Open(folder.Write("a.bib", Books));
    folder.Write("Cartulo/cartulo.ini", "[book]\npublisher=*\n");
    wxTEST_DIALOG(Run(ID_NEW_ENTRY),
                  UseNew([](Cartulo_NewEntry &dialog) { EXPECT_TRUE(PressOK(dialog, "new1")); }));
    EXPECT_EQ((std::vector<Field>{{"publisher", ""}}), ShownFields());
}

TEST_F(NewEntry, RefusesTypesWithFieldsThatCantBeWritten)
{
    Open(folder.Write("a.bib", Books));
    folder.Write("Cartulo/cartulo.ini", "[book]\nend page=*\n");
    wxTEST_DIALOG(Run(ID_NEW_ENTRY),
                  UseNew([](Cartulo_NewEntry &dialog) { EXPECT_FALSE(PressOK(dialog, "new1")); }),
                  ExpectBox(Adding,
                            "The type `book' asks for the field `end page', which can't be written "
                            "to a BIB file.",
                            wxID_OK, Refusal));
    EXPECT_EQ(0, Modified(0));
}

TEST_F(NewEntry, RefersToTheCurrentEntryInItsFile)
{
    Open(folder.Write("a.bib", Talks) + " " + folder.Write("b.bib", Books));
    Select("Ost77 (b)");
    auto press = [](Cartulo_NewEntry &dialog) {
        FileOf(dialog)->SetSelection(0);
        CheckOf(dialog)->SetValue(true);
        EXPECT_TRUE(PressOK(dialog, "child"));
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(press));
    EXPECT_EQ("child (b)", Selected());
    EXPECT_EQ(0, Modified(0));
    EXPECT_EQ(1, Modified(1));
    EXPECT_EQ("@book{child,\n\tcrossref = {Ost77}\n}\n@book{Ost77,\n\ttitle = {East}\n}\n",
              Saved("b.bib"));
    EXPECT_EQ(Talks, folder.Read("a.bib"));
}

TEST_F(NewEntry, GoesToTheChosenOneOfTwoFilesWithOneName)
{
    std::string older = folder.Write("refs.2020.bib", Talks);
    std::string newer = folder.Write("refs.2021.bib", Books);
    Open(older + " " + newer);
    auto press = [](Cartulo_NewEntry &dialog) {
        EXPECT_NE(FileOf(dialog)->GetString(0), FileOf(dialog)->GetString(1));
        FileOf(dialog)->SetSelection(1);
        EXPECT_TRUE(TypeOf(dialog)->SetStringSelection("misc"));
        EXPECT_TRUE(PressOK(dialog, "new1"));
    };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(press));
    EXPECT_EQ(newer, TextAfter("BIB File:"));
    EXPECT_EQ("@misc{new1,\n}\n@book{Ost77,\n\ttitle = {East}\n}\n", Saved("refs.2021.bib"));
}

TEST_F(NewEntry, TellsWhenTheSearchHidesIt)
{
    Open(folder.Write("a.bib", Talks));
    SearchFor("Talk");
    auto press = [](Cartulo_NewEntry &dialog) { EXPECT_TRUE(PressOK(dialog, "new1")); };
    wxTEST_DIALOG(Run(ID_NEW_ENTRY), UseNew(press));
    EXPECT_EQ("Griske84 (a)", Selected());
    EXPECT_STREQ("Griske84", Panel()->CurrentEntry()->key);
    EXPECT_EQ("The new entry is not in the list: it does not hold the searched text.", Status());
    SearchFor("");
    EXPECT_EQ(2u, Rows().size());
}

TEST_F(NewEntry, BringsTheEntryPaneBack)
{
    Open(folder.Write("a.bib", ""));
    ASSERT_TRUE(IsShowing(ID_NEW_ENTRY));
    auto press = [](Cartulo_NewEntry &dialog) {
        EXPECT_TRUE(TypeOf(dialog)->SetStringSelection("book"));
        EXPECT_TRUE(PressOK(dialog, "new1"));
    };
    wxTEST_DIALOG(Press(ID_NEW_ENTRY), UseNew(press));
    EXPECT_FALSE(IsShowing(ID_NEW_ENTRY));
    EXPECT_TRUE(EntryPane()->IsShownOnScreen());
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
    for (int id : {ID_RENAME_ENTRY, ID_REMOVE_ENTRY, ID_EDIT_ENTRY})
        EXPECT_TRUE(ToolEnabled(id)) << id;
}

// --- The window for another key ---

TEST_F(RenameEntry, AsksForTheKeyAlone)
{
    Open(folder.Write("a.bib", Talks) + " " + folder.Write("R&D.bib", Books));
    Select("Ost77 (R&D)");
    ForgetLog();
    auto look = [](Cartulo_RenameEntry &dialog) {
        EXPECT_EQ("Renaming Bibliography Entry", dialog.GetTitle());
        EXPECT_EQ(
            (std::vector<wxString>{"Entry in BIB-file:", "New Key for the Entry:", "Entry Type:"}),
            Labels(dialog));
        EXPECT_EQ((std::vector<wxString>{"a", "R&D"}), Items(FileOf(dialog)));
        EXPECT_EQ("R&D", FileOf(dialog)->GetStringSelection());
        EXPECT_EQ("Ost77", KeyOf(dialog)->GetValue());
        EXPECT_EQ("book", TypeOf(dialog)->GetStringSelection());
        EXPECT_FALSE(FileOf(dialog)->IsEnabled());
        EXPECT_FALSE(TypeOf(dialog)->IsEnabled());
        for (wxWindow *child : dialog.GetChildren())
            EXPECT_GE(child->GetSize().x, child->GetBestSize().x) << child->GetLabel();
    };
    wxTEST_DIALOG(Run(ID_RENAME_ENTRY), UseRename(look));
    EXPECT_EQ(Lines{}, TakeLog("ERROR: "));
    EXPECT_EQ(wxID_CANCEL, Panel()->DialogResult());
    static_assert(ID_ENTRY_KEY == 6002);
}

TEST_F(RenameEntry, IsRefusedInAFileThatCantBeWritten)
{
    OpenBroken(folder.Write("b.bib", Broken));
    Run(ID_RENAME_ENTRY);
    EXPECT_EQ("ERROR: You can't rename entry of ReadOnly file.", Status());
}

TEST_F(RenameEntry, DoesNothingWithoutAnEntry)
{
    Open(folder.Write("a.bib", ""));
    auto press = [](Cartulo_RenameEntry &dialog) { EXPECT_TRUE(PressOK(dialog, "new1")); };
    wxTEST_DIALOG(Run(ID_RENAME_ENTRY), UseRename(press));
    EXPECT_EQ(0, Modified(0));
    EXPECT_EQ(wxID_OK, Panel()->DialogResult());
}

TEST_F(RenameEntry, ClosesOnAnEmptyKey)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_RenameEntry &dialog) { EXPECT_TRUE(PressOK(dialog, " ")); };
    wxTEST_DIALOG(
        Run(ID_RENAME_ENTRY), UseRename(press),
        ExpectBox(Renaming, "Please enter new key for the bibliography entry.", wxID_OK, Refusal));
    EXPECT_EQ("Griske84 (a)", Selected());
    EXPECT_EQ(0, Modified(0));
}

TEST_F(RenameEntry, StaysOpenOnTheKeyThatItHas)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_RenameEntry &dialog) {
        EXPECT_FALSE(PressOK(dialog, "Griske84"));
        EXPECT_FALSE(PressOK(dialog, "Griske 84"));
    };
    wxTEST_DIALOG(Run(ID_RENAME_ENTRY), UseRename(press));
    EXPECT_EQ(0, Modified(0));
}

TEST_F(RenameEntry, RefusesKeysOfTheFile)
{
    Open(folder.Write("a.bib", std::string(Talks) + Books));
    ASSERT_EQ("Griske84 (a)", Selected());
    auto press = [](Cartulo_RenameEntry &dialog) {
        EXPECT_FALSE(PressOK(dialog, "griske84"));
        EXPECT_FALSE(PressOK(dialog, "OST77"));
        EXPECT_EQ("OST77", KeyOf(dialog)->GetValue());
    };
    ExpectBox taken(Renaming, "Specified New Key is already present in the BIB file.", wxID_OK,
                    Refusal);
    ExpectBox again = taken;
    wxTEST_DIALOG(Run(ID_RENAME_ENTRY), UseRename(press), taken, again);
    EXPECT_STREQ("Griske84", Panel()->CurrentEntry()->key);
}

TEST_F(RenameEntry, OffersToTakeBadCharactersOut)
{
    Open(folder.Write("a.bib", Talks));
    auto press = [](Cartulo_RenameEntry &dialog) {
        EXPECT_FALSE(PressOK(dialog, "a=b"));
        EXPECT_EQ("a=b", KeyOf(dialog)->GetValue());
        EXPECT_FALSE(PressOK(dialog, "a=b"));
        EXPECT_EQ("ab", KeyOf(dialog)->GetValue());
        EXPECT_FALSE(PressOK(dialog, "a\\b"));
        EXPECT_TRUE(PressOK(dialog, "ab"));
    };
    wxTEST_DIALOG(Run(ID_RENAME_ENTRY), UseRename(press),
                  ExpectBox(Renaming, BadChars, wxID_CANCEL, Offer),
                  ExpectBox(Renaming, BadChars, wxID_OK, Offer),
                  ExpectBox(Renaming, "An entry with this key can't be written to a BIB file.",
                            wxID_OK, Refusal));
    EXPECT_EQ("ab (a)", Selected());
}

TEST_F(RenameEntry, AsksAboutKeysOfOtherFiles)
{
    Open(folder.Write("a.bib", Talks) + " " + folder.Write("b.bib", Books));
    auto press = [](Cartulo_RenameEntry &dialog) {
        EXPECT_FALSE(PressOK(dialog, "ost77"));
        EXPECT_TRUE(PressOK(dialog, "ost77"));
    };
    wxTEST_DIALOG(Run(ID_RENAME_ENTRY), UseRename(press),
                  ExpectBox(Renaming, NewElsewhere, wxID_NO, Question),
                  ExpectBox(Renaming, NewElsewhere, wxID_YES, Question));
    EXPECT_EQ("ost77 (a)", Selected());
}

TEST_F(RenameEntry, TakesTheChildrenBeforeItAlong)
{
    Open(folder.Write("a.bib", Family));
    Select("parent (a)");
    auto press = [](Cartulo_RenameEntry &dialog) { EXPECT_TRUE(PressOK(dialog, "Mother")); };
    wxTEST_DIALOG(Run(ID_RENAME_ENTRY), UseRename(press));
    EXPECT_EQ("Mother (a)", Selected());
    EXPECT_STREQ("Mother", Panel()->CurrentEntry()->key);
    EXPECT_EQ(1, Modified(0));
    EXPECT_TRUE(SaveEnabled());
    EXPECT_EQ("@inbook{first,\n\tcrossref = {Mother}\n}\n"
              "@inbook{second,\n\tcrossref = {Mother}\n}\n"
              "@book{Mother,\n\ttitle = {P}\n}\n"
              "@inbook{last,\n\tcrossref = {parent}\n}\n",
              Saved("a.bib"));
}

TEST_F(RenameEntry, SelectsTheEntryAmongThoseThatTheSearchFinds)
{
    Open(folder.Write("a.bib", "@misc{a, note = x}\n@misc{b, note = y}\n@misc{c, note = x}\n"));
    SearchFor("x");
    ASSERT_EQ("a (a)", Selected());
    auto press = [](Cartulo_RenameEntry &dialog) { EXPECT_TRUE(PressOK(dialog, "d")); };
    wxTEST_DIALOG(Run(ID_RENAME_ENTRY), UseRename(press));
    EXPECT_EQ((std::vector<wxString>{"c (a)", "d (a)"}), Rows());
    EXPECT_EQ("d (a)", Selected());
    EXPECT_STREQ("d", Panel()->CurrentEntry()->key);
}

// --- Removing ---

TEST_F(RemoveEntry, AsksFirst)
{
    Open(folder.Write("R&D.bib", Talks));
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY),
                  ExpectBox("Removing Entry", "Griske84 (R&D)", wxID_NO, wxYES_NO));
    EXPECT_EQ(1u, Rows().size());
    EXPECT_EQ(0, Modified(0));
}

TEST_F(RemoveEntry, SelectsTheNextRow)
{
    Open(folder.Write("a.bib", "@misc{a, note = 1}\n@misc{b, note = 2}\n@misc{c, note = 3}\n"));
    Select("b (a)");
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "b (a)", wxID_YES));
    EXPECT_EQ("c (a)", Selected());
    EXPECT_STREQ("c", Panel()->CurrentEntry()->key);
    EXPECT_EQ((std::vector<Field>{{"note", "3"}}), ShownFields());
    EXPECT_EQ(1, Modified(0));
    EXPECT_TRUE(SaveEnabled());
    EXPECT_EQ("@misc{a,\n\tnote = 1\n}\n@misc{c,\n\tnote = 3\n}\n", Saved("a.bib"));
}

TEST_F(RemoveEntry, SelectsTheRowBeforeTheLast)
{
    Open(folder.Write("a.bib", "@misc{a, note = 1}\n@misc{b, note = 2}\n@misc{c, note = 3}\n"));
    Select("c (a)");
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "c (a)", wxID_YES));
    EXPECT_EQ("b (a)", Selected());
    EXPECT_STREQ("b", Panel()->CurrentEntry()->key);
}

TEST_F(RemoveEntry, LeavesTheListEmptyAfterTheOnlyRow)
{
    Open(folder.Write("a.bib", Talks));
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "Griske84 (a)", wxID_YES));
    EXPECT_TRUE(Rows().empty());
    EXPECT_EQ(nullptr, Panel()->CurrentEntry());
    EXPECT_TRUE(ShownFields().empty());
    EXPECT_TRUE(IsShowing(ID_NEW_ENTRY));
    EXPECT_TRUE(WaitFor([this] { return List()->HasFocus(); }));
    EXPECT_FALSE(ToolEnabled(ID_REMOVE_ENTRY));
    EXPECT_TRUE(ToolEnabled(ID_NEW_ENTRY));
    EXPECT_EQ("", Saved("a.bib"));
    Run(ID_REMOVE_ENTRY); // says nothing, as there is nothing
}

TEST_F(RemoveEntry, KeepsTheSearch)
{
    Open(folder.Write("a.bib", "@misc{a, note = x}\n@misc{b, note = y}\n@misc{c, note = x}\n"));
    SearchFor("x");
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "a (a)", wxID_YES));
    EXPECT_EQ((std::vector<wxString>{"c (a)"}), Rows());
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "c (a)", wxID_YES));
    EXPECT_TRUE(Rows().empty());
    EXPECT_EQ(nullptr, Panel()->CurrentEntry());
    SearchFor("");
    EXPECT_EQ((std::vector<wxString>{"b (a)"}), Rows());
}

TEST_F(RemoveEntry, IsRefusedWhereEntriesBeforeItReferToIt)
{
    Open(folder.Write("a.bib", Family));
    Select("parent (a)");
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "parent (a)", wxID_YES),
                  ExpectBox("Removing Bibliography Entry",
                            "The entry `parent' can't be removed, because following "
                            "entries:\n\n`first', `second'.\n\nrefer it in `crossref' field.",
                            wxID_OK, Refusal));
    EXPECT_EQ(4u, Rows().size());
    EXPECT_EQ(0, Modified(0));
    EXPECT_STREQ("parent", Panel()->CurrentEntry()->key);
}

TEST_F(RemoveEntry, IsNotRefusedForEntriesBehindItOrOfOtherFiles)
{
    Open(folder.Write("a.bib", "@book{parent, title = {P}}\n@misc{last, crossref = {parent}}\n") +
         " " + folder.Write("b.bib", "@misc{away, crossref = {parent}}\n"));
    Select("parent (a)");
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "parent (a)", wxID_YES));
    EXPECT_EQ((std::vector<wxString>{"away (b)", "last (a)"}), Rows());
    EXPECT_EQ("@misc{last,\n\tcrossref = {parent}\n}\n", Saved("a.bib"));
}

TEST_F(RemoveEntry, IsRefusedInAFileThatCantBeWritten)
{
    OpenBroken(folder.Write("b.bib", Broken));
    Run(ID_REMOVE_ENTRY);
    EXPECT_EQ("ERROR: You can't remove entry of ReadOnly file.", Status());
}

TEST_F(RemoveEntry, IsLogged)
{
    Open(folder.Write("a.bib", "@misc{child, crossref = {x}}\n@misc{b, note = 2}\n"));
    Select("b (a)");
    ForgetLog();
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "b (a)", wxID_YES));
    EXPECT_EQ((Lines{{"Cartulo: b (a)", TNS_TRACE},
                     {"Cartulo: Delete Entry: b", TNS_TRACE},
                     {"Cartulo: crossref= x", TNS_TRACE}}),
              TakeLog("Cartulo: "));
}

TEST_F(RemoveEntry, LogsThatNothingIsSelected)
{
    Open(folder.Write("a.bib", ""));
    ForgetLog();
    Run(ID_REMOVE_ENTRY);
    Lines lines = TakeLog("");
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnRemoveEntry ", TNS_ACTION},
                     {"WARNING: Cartulo::OnRemoveEntry no selection in index", TNS_WARNING}}),
              lines);
}

TEST_F(RemoveEntry, TakesBothRowsOfAFileThatIsListedTwice)
{
    std::string path = folder.Write("a.bib", std::string(Talks) + Books);
    Open(path);
    frame->TakeCommand((path + " " + path).c_str());
    ASSERT_EQ(4u, Rows().size());
    wxTEST_DIALOG(Run(ID_REMOVE_ENTRY), ExpectBox("Removing Entry", "Griske84 (a)", wxID_YES));
    EXPECT_EQ((std::vector<wxString>{"Ost77 (a)", "Ost77 (a)"}), Rows());
    EXPECT_STREQ("Ost77", Panel()->CurrentEntry()->key);
}

// --- The keyboard ---

TEST_F(NewEntry, IsMadeByKeyboardAlone)
{
    Open(folder.Write("a.bib", Talks));
    Show<Cartulo_NewEntry>(ID_NEW_ENTRY, [](Cartulo_NewEntry &dialog) {
        SendText(KeyOf(dialog), "new1");
        EXPECT_TRUE(WaitFor([&] { return KeyOf(dialog)->GetValue() == "new1"; }));
        SendKey(KeyOf(dialog), WXK_RETURN);
    });
    EXPECT_EQ("new1 (a)", Selected());
    SendText(List(), "gr");
    EXPECT_TRUE(WaitFor([this] { return Selected() == "Griske84 (a)"; }));
}

TEST_F(NewEntry, IsGivenUpWithEscape)
{
    Open(folder.Write("a.bib", Talks));
    Search()->SetFocus();
    ASSERT_TRUE(WaitForKeys(Search()));
    Show<Cartulo_NewEntry>(ID_NEW_ENTRY,
                           [](Cartulo_NewEntry &dialog) { SendKey(KeyOf(dialog), WXK_ESCAPE); });
    EXPECT_EQ(wxID_CANCEL, Panel()->DialogResult());
    EXPECT_EQ(0, Modified(0));
    ASSERT_TRUE(WaitForKeys(Search()));
    ForgetLog();
    SendKey(Search(), 'M', wxMOD_ALT);
    auto isShown = [] { return !TakeLog("INFO: Cartulo::OnShowMessages").empty(); };
    wxTEST_DIALOG(EXPECT_TRUE(WaitFor(isShown)),
                  ExpectMessages("There is no any messages related with loading BIB-files"));
}

TEST_F(RenameEntry, IsDoneByKeyboardAlone)
{
    Open(folder.Write("a.bib", Talks));
    Show<Cartulo_RenameEntry>(ID_RENAME_ENTRY, [](Cartulo_RenameEntry &dialog) {
        SendKey(KeyOf(dialog), 'A', wxMOD_CONTROL);
        SendText(KeyOf(dialog), "new1");
        EXPECT_TRUE(WaitFor([&] { return KeyOf(dialog)->GetValue() == "new1"; }));
        SendKey(KeyOf(dialog), WXK_RETURN);
    });
    EXPECT_EQ("new1 (a)", Selected());
    EXPECT_TRUE(WaitForKeys(List()));
}

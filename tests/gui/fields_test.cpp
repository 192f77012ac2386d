// tests/gui/fields_test.cpp - the commands on the fields of the entry that is edited, and their
// windows.

#include "tests/gui/DialogTest.h"
#include "tests/gui/EditTest.h"

#include <algorithm>

#include "base/Companion.h"
#include "ui/FieldDialogs.h"

using Lines = std::vector<LogLine>;
using NewField = Edit;
using RemoveField = Edit;
using EditField = Edit;
using RenameField = Edit;

static const long Refusal = wxOK | wxICON_EXCLAMATION;
static const long Offer = wxOK | wxCANCEL | wxICON_EXCLAMATION;
static const char Unwritable[] =
    "A field of this name can't be written to a BIB file.\nIt must not "
    "begin with a digit, and hold no backslash or control character.";
static const char Misfit[] = "The key includes characters that can't be stored in CP1252.";
static const char BadChars[] = "Specified field key includes wrong characters.\nWe will remove "
                               "them from key and continue.";

// --- Adding ---

TEST_F(NewField, ProposesTheMissingFields)
{
    OpenText("@article{one, title = {T}}\n");
    StartEditing();
    EXPECT_EQ("author", NewKey()->GetValue());
    wxArrayString proposals = NewKey()->GetStrings();
    EXPECT_EQ((std::vector<wxString>{"author", "editor", "year", "note", "crossref"}),
              std::vector<wxString>(proposals.begin(), proposals.end()));
    EXPECT_EQ("There are missed mandatory fields: `author'/`editor' and `year'.", Note());
    Send(ID_NEW_FIELD);
    EXPECT_EQ("author", ShownFields().at(1).label);
    EXPECT_TRUE(WaitFor([this] { return Value("author")->HasFocus(); }));
    EXPECT_EQ("year", NewKey()->GetValue());
    EXPECT_EQ("There is missed mandatory field: `year'.", Note());
}

TEST_F(NewField, LosesTheBlanksOfItsKey)
{
    OpenText(Article);
    StartEditing();
    ForgetLog();
    AddField(" my key ");
    EXPECT_EQ((Lines{{"Cartulo: Adding field: mykey", TNS_TRACE}}), TakeLog("Cartulo: Adding"));
    EXPECT_EQ("mykey", ShownFields().at(3).label);
    EXPECT_TRUE(Value("mykey")->IsEnabled());
    EXPECT_TRUE(Remover(3)->IsEnabled());
    SetValue("mykey", "v");
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 1, 0, 0, wxID_YES));
    EXPECT_EQ("@article{one,\n\tauthor = {A},\n\ttitle = {T},\n\tyear = 1999,\n\tmykey = {v}\n}\n",
              Saved());
}

TEST_F(NewField, RefusesKeys)
{
    OpenText("@article{one, title = {T}, Journal = {J}}\n");
    StartEditing();
    const char *title = "Adding New Field";
    wxTEST_DIALOG(AddField(" "), ExpectBox(title,
                                           "Field key is undefined.\nPlease enter key name or "
                                           "choose some standard value in list of combo box.",
                                           wxID_OK, Refusal));
    for (int answer : {wxID_OK, wxID_CANCEL}) {
        wxTEST_DIALOG(AddField("a{b}"), ExpectBox(title, BadChars, answer, Offer));
        EXPECT_EQ("a{b}", NewKey()->GetValue());
    }
    for (const char *key : {"journal", "TITLE", "jour nal"})
        wxTEST_DIALOG(AddField(key), ExpectBox(title, "Field with specified key is already exists.",
                                               wxID_OK, Refusal));
    wxTEST_DIALOG(AddField("1st"), ExpectBox(title, Unwritable, wxID_OK, Refusal));
    wxTEST_DIALOG(AddField(L"\u0416anr"), ExpectBox(title, Misfit, wxID_OK, Refusal));
    EXPECT_TRUE(WaitFor([this] { return NewKey()->HasFocus(); }));
    EXPECT_EQ(2u, ShownFields().size());
}

TEST_F(NewField, FindsRoomForSixteen)
{
    OpenText(Article);
    StartEditing();
    for (int i = 3; i < 16; ++i)
        AddField(wxString::Format("f%d", i));
    EXPECT_EQ(16u, ShownFields().size());
    wxTEST_DIALOG(AddField("f16"),
                  ExpectBox("Adding New Field",
                            "Sorry, you can't add more fields because of limitation", wxID_OK,
                            Refusal));
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 13, 0, 0, wxID_YES));
    EXPECT_EQ(16, Panel()->CurrentEntry()->fieldCount);
}

TEST_F(NewField, OverridesAnInheritedOne)
{
    OpenText(Child);
    StartEditing();
    AddField("YEAR");
    EXPECT_TRUE(Value("year")->IsEnabled());
    EXPECT_TRUE(WaitFor([this] { return Value("year")->HasFocus(); }));
    EXPECT_EQ("1999", Value("year")->GetValue());
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 1, 0, 0, wxID_YES));
    EXPECT_EQ("@article{child,\n\tcrossref = {parent},\n\ttitle = {T},\n\tyear = 1999\n}\n"
              "@book{parent,\n\ttitle = {P},\n\tyear = 1999\n}\n",
              Saved());
}

TEST_F(NewField, NeedsAnEntryThatIsEdited)
{
    OpenText(Article);
    ForgetLog();
    Send(ID_NEW_FIELD);
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnNewField", TNS_ACTION}}), TakeLog(""));
    EXPECT_EQ(3u, ShownFields().size());
}

// --- Removing ---

TEST_F(RemoveField, TakesTheOneWithTheFocus)
{
    OpenText(Article);
    StartEditing();
    Focus(Value("title"));
    ForgetLog();
    PressShortcut('D', true, false);
    Lines lines = TakeLog("");
    auto holds = [&](const LogLine &line) {
        return std::find(lines.begin(), lines.end(), line) != lines.end();
    };
    EXPECT_TRUE(holds({"INFO: Cartulo::OnRemoveField id=6019(6023..6039)", TNS_ACTION}));
    EXPECT_TRUE(holds({"INFO: Cartulo::OnRemoveField k=1, name=title", TNS_ACTION}));
    EXPECT_TRUE(holds({"Cartulo: WARNING, removing the field: title", TNS_ACTION}));
    EXPECT_EQ((std::vector<Field>{{"author", "A"}, {"year", "1999"}}), ShownFields());
    EXPECT_EQ("title", NewKey()->GetValue()); // adding brings it back
    EXPECT_TRUE(WaitFor([this] { return Value("year")->HasFocus(); }));
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 0, 1, wxID_YES));
    EXPECT_EQ("@article{one,\n\tauthor = {A},\n\tyear = 1999\n}\n", Saved());
}

TEST_F(RemoveField, TakesTheOnlyOne)
{
    OpenText("@article{one, title = {T}}\n");
    StartEditing();
    Focus(Value("title"));
    PressShortcut('D', true, false);
    EXPECT_TRUE(ShownFields().empty());
    EXPECT_EQ("There are missed mandatory fields: `author'/`editor', `title', and `year'.", Note());
    EXPECT_TRUE(WaitFor([this] { return Type()->HasFocus(); }));
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 0, 1, wxID_YES));
    EXPECT_EQ(0, Panel()->CurrentEntry()->fieldCount);
}

TEST_F(RemoveField, TakesTheOneOfItsButton)
{
    OpenText(Article);
    StartEditing();
    Focus(Value("year"));
    PressRemover(0);
    EXPECT_EQ((std::vector<Field>{{"title", "T"}, {"year", "1999"}}), ShownFields());
    EXPECT_TRUE(WaitFor([this] { return Value("year")->HasFocus(); })); // one row higher now
    PressRemover(1);
    EXPECT_TRUE(WaitFor([this] { return Type()->HasFocus(); })); // there is no row behind it
}

// What the control cannot hold is not to be stored as the control has it.
TEST_F(RemoveField, KeepsTheInheritedValueThatIsTooLongForItsRow)
{
    const std::string text(70000, 'x');
    OpenText("@inbook{child, crossref = {parent}, author = {A}}\n@book{parent, author = {" + text +
             "}}\n");
    StartEditing();
    Focus(Value("author"));
    PressShortcut('D', true, false);
    AddField("author");
    EXPECT_FALSE(Value("author")->IsEnabled());
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_EQ(text, Panel()->CurrentEntry()->fields[1].value);
}

TEST_F(RemoveField, ShowsTheInheritedOneAgain)
{
    OpenText("@article{child, crossref = {parent}, year = {2000}, note = {N}}\n"
             "@book{parent, year = {1999}}\n");
    StartEditing();
    Focus(Value("year"));
    PressShortcut('D', true, false);
    EXPECT_EQ((std::vector<Field>{{"crossref", "parent"}, {"year", "1999"}, {"note", "N"}}),
              ShownFields());
    EXPECT_FALSE(Value("year")->IsEnabled());
    EXPECT_FALSE(Remover(1)->IsEnabled());
    EXPECT_TRUE(WaitFor([this] { return Type()->HasFocus(); }));
    EXPECT_EQ("year", NewKey()->GetStrings().Last());
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 0, 1, wxID_YES));
    EXPECT_EQ("@article{child,\n\tcrossref = {parent},\n\tnote = {N}\n}\n"
              "@book{parent,\n\tyear = 1999\n}\n",
              Saved());
}

TEST_F(RemoveField, LeavesNewOnesBehindTheStoredOnes)
{
    OpenText(Article);
    StartEditing();
    AddField("note");
    ForgetLog();
    PressRemover(3);
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnRemoveField id=6026(6023..6039)", TNS_ACTION},
                     {"INFO: Cartulo::OnRemoveField unknown target2", TNS_ACTION}}),
              TakeLog("INFO: Cartulo::OnRemoveField"));
    EXPECT_EQ(4u, ShownFields().size());
    EXPECT_EQ("A field that was just added can be removed after \"Done\".", Status());
    PressRemover(0); // now it moves up to a stored one's place
    PressRemover(2);
    EXPECT_EQ((std::vector<Field>{{"title", "T"}, {"year", "1999"}}), ShownFields());
}

TEST_F(RemoveField, NeedsATarget)
{
    OpenText(Article);
    StartEditing();
    Focus(Type());
    ForgetLog();
    Send(ID_REMOVE_FIELD);
    wxCommandEvent event(wxEVT_BUTTON, ID_REMOVE_ROW_END);
    Panel()->ProcessWindowEvent(event);
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnRemoveField id=6019(6023..6039)", TNS_ACTION},
                     {"INFO: Cartulo::OnRemoveField unknown target2", TNS_ACTION},
                     {"INFO: Cartulo::OnRemoveField id=6039(6023..6039)", TNS_ACTION},
                     {"INFO: Cartulo::OnRemoveField unknown target", TNS_ACTION}}),
              TakeLog("INFO: Cartulo::OnRemoveField"));
    EXPECT_EQ(3u, ShownFields().size());
}

// --- The large window ---

TEST_F(EditField, ShowsItsValueInALargeWindow)
{
    OpenText(Article);
    StartEditing();
    Focus(Value("title"));
    ForgetLog();
    auto change = [](Cartulo_EditField &dialog) {
        EXPECT_EQ("Editing Field", dialog.GetTitle());
        EXPECT_EQ((std::vector<wxString>{"Field Key:", "title"}), Labels(dialog));
        EXPECT_EQ("title", dialog.FindWindow(ID_FIELD_KEY)->GetLabel());
        EXPECT_EQ(10, dialog.GetFont().GetPointSize());
        wxTextCtrl *value = dynamic_cast<wxTextCtrl *>(dialog.FindWindow(ID_FIELD_VALUE));
        EXPECT_EQ("T", value->GetValue());
        EXPECT_TRUE(value->IsMultiLine());
        EXPECT_EQ(dialog.FromDIP(wxSize(600, 200)), value->GetMinSize());
        value->SetValue("Large");
    };
    wxTEST_DIALOG(PressShortcut('E', true, false),
                  UseDialog<Cartulo_EditField>(change, wxID_CANCEL));
    EXPECT_EQ((Lines{{"INFO: Editing Field: k=1, name=title", TNS_ACTION}}),
              TakeLog("INFO: Editing Field"));
    EXPECT_EQ("T", Value("title")->GetValue());
    auto accept = [&](Cartulo_EditField &dialog) {
        change(dialog);
        EXPECT_TRUE(PressOK(dialog));
    };
    wxTEST_DIALOG(PressShortcut('E', true, false), UseDialog<Cartulo_EditField>(accept));
    EXPECT_EQ((Lines{{"INFO: Cartulo_EditField::OnOK", TNS_ACTION}}),
              TakeLog("INFO: Cartulo_EditField"));
    EXPECT_EQ("Large", Value("title")->GetValue());
    EXPECT_TRUE(WaitFor([this] { return Value("title")->HasFocus(); }));
    EXPECT_FALSE(Value("title")->HasSelection()); // the next letter does not take its place
    EXPECT_EQ(5, Value("title")->GetInsertionPoint());
}

TEST_F(EditField, LeavesTheCursorWhereItWasOnCancel)
{
    OpenText(Article);
    StartEditing();
    SetValue("title", "Old Maps");
    Focus(Value("title"));
    Value("title")->SetInsertionPoint(3);
    auto change = [](Cartulo_EditField &dialog) {
        dynamic_cast<wxTextCtrl *>(dialog.FindWindow(ID_FIELD_VALUE))->SetValue("New");
    };
    wxTEST_DIALOG(Send(ID_EDIT_FIELD), UseDialog<Cartulo_EditField>(change, wxID_CANCEL));
    EXPECT_EQ(3, Value("title")->GetInsertionPoint());
}

TEST_F(EditField, TakesAValueOfManyLines)
{
    OpenText(Article);
    StartEditing();
    Focus(Value("title"));
    auto change = [](Cartulo_EditField &dialog) {
        dynamic_cast<wxTextCtrl *>(dialog.FindWindow(ID_FIELD_VALUE))->SetValue("First\n\tSecond");
    };
    wxTEST_DIALOG(PressShortcut('E', true, false), UseDialog<Cartulo_EditField>(change, wxID_OK));
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_NE(std::string::npos, Saved().find("\ttitle = {First\n\tSecond},\n"));
}

TEST_F(EditField, IsAcceptedByCtrlEnter)
{
    OpenText(Article);
    StartEditing();
    Focus(Value("title"));
    auto accept = [](Cartulo_EditField &dialog) {
        wxTextCtrl *value = dynamic_cast<wxTextCtrl *>(dialog.FindWindow(ID_FIELD_VALUE));
        value->SetValue("Large");
        dialog.Show();
        wxKeyEvent key(wxEVT_CHAR_HOOK);
        key.m_keyCode = WXK_RETURN;
        value->ProcessWindowEvent(key); // a new line
        EXPECT_TRUE(dialog.IsShown());
        key.SetControlDown(true);
        value->ProcessWindowEvent(key);
        EXPECT_FALSE(dialog.IsShown());
    };
    wxTEST_DIALOG(PressShortcut('E', true, false), UseDialog<Cartulo_EditField>(accept, wxID_OK));
    EXPECT_EQ("Large", Value("title")->GetValue());
}

// Within the time that a test may take.
TEST_F(EditField, TakesALongWord)
{
    const std::string text(60000, 'x');
    OpenText("@article{one, url = {" + text + "}}\n");
    StartEditing();
    Focus(Value("url"));
    auto isShown = [&](Cartulo_EditField &dialog) { EXPECT_TRUE(text == dialog.Value()); };
    wxTEST_DIALOG(PressShortcut('E', true, false), UseDialog<Cartulo_EditField>(isShown, wxID_OK));
    Send(ID_COMMIT_ENTRY); // nothing has changed
    EXPECT_FALSE(Panel()->InEditMode());
}

TEST_F(EditField, NeedsTheFocusInOne)
{
    OpenText(Article);
    StartEditing();
    ForgetLog();
    auto areRefused = [this] {
        for (int key : {'E', 'N'}) {
            PressShortcut(key, true, false);
            EXPECT_EQ("Put the cursor into a field first, one that was there before the editing.",
                      Status());
        }
    };
    Focus(Type());
    areRefused();
    AddField("note"); // which gets the focus, but is not stored yet
    ASSERT_TRUE(WaitFor([this] { return Value("note")->HasFocus(); }));
    areRefused();
    EXPECT_TRUE(Panel()->InEditMode());
    EXPECT_EQ(Lines(), TakeLog("INFO: Editing Field"));
    EXPECT_EQ(Lines(), TakeLog("INFO: Renaming Field"));
}

TEST_F(EditField, GivesTooLongAValueBack)
{
    OpenText(Article);
    StartEditing();
    Focus(Value("title"));
    wxString text;
    for (int i = 0; i < 35000; ++i)
        text += "x ";
    auto enter = [&](Cartulo_EditField &dialog) {
        dynamic_cast<wxTextCtrl *>(dialog.FindWindow(ID_FIELD_VALUE))->SetValue(text);
    };
    auto isKept = [&](Cartulo_EditField &dialog) { EXPECT_TRUE(text == dialog.Value()); };
    wxTEST_DIALOG(PressShortcut('E', true, false), UseDialog<Cartulo_EditField>(enter, wxID_OK),
                  ExpectBox("Editing Field",
                            "The value is too long: a field can be edited up to 65,534 bytes.",
                            wxID_OK, Refusal),
                  UseDialog<Cartulo_EditField>(isKept, wxID_CANCEL));
    EXPECT_EQ("T", Value("title")->GetValue());
}

// --- Renaming ---

TEST_F(RenameField, ChangesTheKey)
{
    OpenText(Article);
    StartEditing();
    Focus(Value("title"));
    NewKey()->SetValue("booktitle");
    ForgetLog();
    auto change = [this](Cartulo_RenameField &dialog) {
        EXPECT_EQ("Renaming Field", dialog.GetTitle());
        EXPECT_EQ((std::vector<wxString>{"Old Field Name:", "New Field Name:"}), Labels(dialog));
        wxTextCtrl *old = dynamic_cast<wxTextCtrl *>(dialog.FindWindow(ID_FIELD_KEY));
        EXPECT_EQ("title", old->GetValue());
        EXPECT_FALSE(old->IsEnabled());
        wxComboBox *name = dynamic_cast<wxComboBox *>(dialog.FindWindow(ID_FIELD_NEW_NAME));
        EXPECT_EQ(NewKey()->GetStrings(), name->GetStrings());
        EXPECT_EQ("booktitle", name->GetValue());
        EXPECT_TRUE(PressOK(dialog));
    };
    wxTEST_DIALOG(PressShortcut('N', true, false), UseDialog<Cartulo_RenameField>(change));
    EXPECT_EQ((Lines{{"INFO: Renaming Field: k=1, name=title", TNS_ACTION}}),
              TakeLog("INFO: Renaming Field"));
    EXPECT_EQ((Field{"booktitle", "T"}), ShownFields().at(1));
    EXPECT_EQ("There is missed mandatory field: `title'.", Note());
    EXPECT_TRUE(WaitFor([this] { return Value("booktitle")->HasFocus(); }));
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 1, 0, 1, wxID_YES));
    EXPECT_EQ("@article{one,\n\tauthor = {A},\n\tbooktitle = {T},\n\tyear = 1999\n}\n", Saved());
}

TEST_F(RenameField, ChangesNothingOnCancelOrWithoutAName)
{
    OpenText(Article);
    StartEditing();
    Focus(Value("title"));
    auto cancel = [](Cartulo_RenameField &dialog) {
        dynamic_cast<wxComboBox *>(dialog.FindWindow(ID_FIELD_NEW_NAME))->SetValue("booktitle");
    };
    auto empty = [](Cartulo_RenameField &dialog) {
        dynamic_cast<wxComboBox *>(dialog.FindWindow(ID_FIELD_NEW_NAME))->SetValue(" \t");
        EXPECT_TRUE(PressOK(dialog));
    };
    wxTEST_DIALOG(PressShortcut('N', true, false),
                  UseDialog<Cartulo_RenameField>(cancel, wxID_CANCEL));
    wxTEST_DIALOG(PressShortcut('N', true, false), UseDialog<Cartulo_RenameField>(empty));
    EXPECT_EQ((Field{"title", "T"}), ShownFields().at(1));
    Send(ID_COMMIT_ENTRY); // nothing to ask
    EXPECT_FALSE(Panel()->InEditMode());
}

TEST_F(RenameField, RefusesNames)
{
    OpenText("@article{one, author = {journal}, title = {T}}\n");
    StartEditing();
    Focus(Value("title"));
    auto tryAll = [](Cartulo_RenameField &dialog) {
        wxComboBox *name = dynamic_cast<wxComboBox *>(dialog.FindWindow(ID_FIELD_NEW_NAME));
        for (const char *text : {"1st", "Journal", "t", "a{b}"}) {
            name->SetValue(text);
            EXPECT_FALSE(PressOK(dialog)) << text;
            EXPECT_EQ(text, name->GetValue());
        }
        EXPECT_FALSE(PressOK(dialog));
        EXPECT_EQ("ab", name->GetValue());
        EXPECT_TRUE(PressOK(dialog));
    };
    const char *title = "Renaming Field";
    ExpectBox taken(title, "Field with specified key is already exists.", wxID_OK, Refusal);
    ExpectBox takenToo = taken;
    wxTEST_DIALOG(PressShortcut('N', true, false), UseDialog<Cartulo_RenameField>(tryAll),
                  ExpectBox(title, Unwritable, wxID_OK, Refusal), taken, takenToo,
                  ExpectBox(title, BadChars, wxID_CANCEL, Offer),
                  ExpectBox(title, BadChars, wxID_OK, Offer));
    EXPECT_EQ((Field{"ab", "T"}), ShownFields().at(1));
}

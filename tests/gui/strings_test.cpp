// tests/gui/strings_test.cpp - the windows for abbreviations.

#include "tests/gui/DialogTest.h"
#include "tests/gui/EditTest.h"

#include <wx/listbox.h>

#include "base/Companion.h"
#include "ui/Strings.h"

using Lines = std::vector<LogLine>;
using Texts = std::vector<wxString>;
using UseStrings = UseDialog<Cartulo_Strings>;
using UseString = UseDialog<Cartulo_Strings_Edit>;

static const char Title[] = "Editing Strings";
static const long Refusal = wxOK | wxICON_EXCLAMATION, Offer = wxOK | wxCANCEL | wxICON_EXCLAMATION;

static const char TwoStrings[] = "@string{jgo = {Good Order}}\n@string{acm = {A} # jgo}\n"
                                 "@article{one, title = {Old Maps}, series = jgo}\n";
static const char Lists[] = "[String]\nMonths=*Months\n[*Months]\njan=January\nfeb=February\n"
                            "[article]\ntitle=*\n";

static wxListBox *ListOf(const wxDialog &dialog)
{
    return FirstChild<wxListBox>(&dialog);
}

static wxTextCtrl *KeyOf(wxDialog &dialog)
{
    return Find<wxTextCtrl>(dialog, ID_STRING_KEY);
}

static wxTextCtrl *ValueOf(wxDialog &dialog)
{
    return Find<wxTextCtrl>(dialog, ID_STRING_VALUE);
}

static bool CanChange(wxDialog &dialog)
{
    int enabled = 0;
    for (int id : {ID_STRING_ADD, ID_STRING_REMOVE, ID_STRING_EDIT})
        enabled += dialog.FindWindow(id)->IsEnabled();
    EXPECT_TRUE(enabled == 0 || enabled == 3);
    return enabled == 3;
}

static void PressKey(wxWindow *window, int key, int modifiers = 0)
{
    wxKeyEvent event(wxEVT_CHAR_HOOK);
    event.m_keyCode = key;
    event.m_uniChar = wxChar(key);
    event.SetAltDown((modifiers & wxMOD_ALT) != 0);
    event.SetControlDown((modifiers & wxMOD_CONTROL) != 0);
    window->ProcessWindowEvent(event);
    event.SetEventType(wxEVT_KEY_UP);
    window->ProcessWindowEvent(event);
}

static void DoubleClick(Cartulo_Strings &dialog)
{
    wxCommandEvent event(wxEVT_LISTBOX_DCLICK, ListOf(dialog)->GetId());
    ListOf(dialog)->ProcessWindowEvent(event);
}

// Types both; true when OK closes the window.
static bool PressOK(wxDialog &dialog, const wxString &key, const wxString &value)
{
    KeyOf(dialog)->SetValue(key);
    ValueOf(dialog)->SetValue(value);
    return PressOK(dialog);
}

class Strings : public Edit
{
protected:
    void SetUp() override
    {
        Edit::SetUp();
        folder.Write("Cartulo/cartulo.ini", Lists);
        CurrentStringSource = STRINGS_OF_ALL_FILES;
    }

    void OpenTwo()
    {
        Open(folder.Write("a.bib", TwoStrings) + " " +
             folder.Write("b.bib", "@string{pub = {Press}}\n@misc{two, note = {N}}\n"));
    }

    // Opens the window for one abbreviation with a key, as the user does.
    void ShowString(int key, const std::function<void(Cartulo_Strings_Edit &)> &steps)
    {
        auto press = [&](Cartulo_Strings &strings) {
            ShowDialog<Cartulo_Strings_Edit>([&] { PressKey(ListOf(strings), key); }, steps);
            strings.EndModal(wxID_CANCEL);
        };
        ShowDialog<Cartulo_Strings>([this] { Run(ID_STRINGS); }, press);
    }

    BibFile *File(int i = 0) const { return Panel()->Files()->files[i]; }
};

// --- The list ---

TEST_F(Strings, ShowTheirSourcesAndCommands)
{
    OpenTwo();
    auto look = [](Cartulo_Strings &dialog) {
        EXPECT_EQ(Title, dialog.GetTitle());
        EXPECT_EQ((Texts{"Show Strings of BIB-file:"}), Labels(dialog));
        EXPECT_EQ((Texts{"Months", "*All Files*", "a", "b"}), Items(Find<wxChoice>(dialog, 6001)));
        const struct {
            int id;
            const char *label, *tip;
        } rows[] = {{6003, "&Add", "Add new string (Alt+A)"},
                    {6004, "&Delete", "Remove currently selected string (Alt+D)"},
                    {6005, "&Edit", "Edit value of currently selected string (Alt+E)"}};
        for (const auto &row : rows) {
            wxButton *button = Find<wxButton>(dialog, row.id);
            EXPECT_EQ(row.label, button->GetLabel());
            EXPECT_EQ(row.tip, button->GetToolTipText());
            EXPECT_TRUE(button->GetBitmap().IsOk());
            EXPECT_FALSE(button->AcceptsFocus());
        }
        EXPECT_EQ("Insert", dialog.FindWindow(5100)->GetLabel());
        EXPECT_EQ("Close", dialog.FindWindow(5101)->GetLabel());
        EXPECT_EQ(5100, dialog.GetAffirmativeId());
        EXPECT_EQ(5101, dialog.GetEscapeId());
        EXPECT_FALSE(dialog.FindWindow(5100)->IsEnabled());
        ExpectRoom(dialog);
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(look));
}

TEST_F(Strings, BeginWithTheOnlyFile)
{
    OpenText(TwoStrings);
    auto look = [](Cartulo_Strings &dialog) {
        EXPECT_EQ("a", Find<wxChoice>(dialog, ID_STRING_SOURCE)->GetStringSelection());
        EXPECT_EQ((Texts{"jgo = Good Order", wxString(L"acm = A\u00ABjgo\u00BB")}),
                  Items(ListOf(dialog)));
        EXPECT_EQ(0, ListOf(dialog)->GetSelection());
        EXPECT_TRUE(CanChange(dialog));
        EXPECT_EQ((Lines{{"INFO: Cartulo_Strings::Cartulo_Strings Initialize", TNS_LIFECYCLE},
                         {"INFO: Cartulo_Strings::UpdateStrings ", TNS_ACTION}}),
                  TakeLog("INFO: Cartulo_Strings"));
        ChooseItem(dialog, ID_STRING_SOURCE, 0);
        EXPECT_EQ((Texts{"jan = January", "feb = February"}), Items(ListOf(dialog)));
    };
    for (int i = 0; i < 2; ++i) {
        ForgetLog();
        wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(look));
    }
}

TEST_F(Strings, RememberTheirSourceWhileItIsOpen)
{
    OpenTwo();
    auto choose = [](Cartulo_Strings &dialog) {
        EXPECT_EQ(1, Find<wxChoice>(dialog, ID_STRING_SOURCE)->GetSelection());
        EXPECT_EQ(3u, ListOf(dialog)->GetCount());
        ChooseItem(dialog, ID_STRING_SOURCE, 3);
        EXPECT_EQ((Texts{"pub = Press"}), Items(ListOf(dialog)));
        ForgetLog();
        ChooseItem(dialog, ID_STRING_SOURCE, 3);
        EXPECT_EQ(Lines{}, TakeLog("INFO: Cartulo_Strings::UpdateStrings"));
    };
    auto look = [](Cartulo_Strings &dialog) {
        EXPECT_EQ("b", Find<wxChoice>(dialog, ID_STRING_SOURCE)->GetStringSelection());
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(choose));
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(look));
    EXPECT_EQ(1, CurrentStringSource);
}

TEST_F(Strings, BeginWithAllFilesWhenTheRememberedOneIsGone)
{
    OpenTwo();
    for (int gone : {2, -3}) {
        CurrentStringSource = gone;
        auto look = [](Cartulo_Strings &dialog) {
            EXPECT_EQ("*All Files*",
                      Find<wxChoice>(dialog, ID_STRING_SOURCE)->GetStringSelection());
        };
        wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(look));
    }
}

TEST_F(Strings, OfAllFilesAndOfListsCantBeChanged)
{
    OpenTwo();
    auto press = [](Cartulo_Strings &dialog) {
        ForgetLog();
        for (int item : {1, 0}) {
            ChooseItem(dialog, ID_STRING_SOURCE, item);
            EXPECT_FALSE(CanChange(dialog));
            for (int key : {int('A'), int('D'), int('E')})
                PressKey(ListOf(dialog), key);
        }
        EXPECT_EQ(2u, ListOf(dialog)->GetCount());
        Lines log = TakeLog("INFO: Cartulo_Strings::On");
        EXPECT_EQ(6, std::count(log.begin(), log.end(),
                                LogLine{"INFO: Cartulo_Strings::OnCharHook ", TNS_LIFECYCLE}));
        EXPECT_EQ(6u, log.size()); // no command
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Strings, OfAReadOnlyFileCantBeChanged)
{
    OpenText(TwoStrings);
    File()->readOnly = 1;
    auto press = [this](Cartulo_Strings &dialog) {
        EXPECT_FALSE(CanChange(dialog));
        for (int key : {int('A'), int('D'), int('E')})
            PressKey(ListOf(dialog), key);
        EXPECT_EQ(2u, ListOf(dialog)->GetCount());
        frame->SetStatusText("");
        DoubleClick(dialog);
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press));
    EXPECT_EQ("Choose a file that can be written to change its strings.", Status());
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Strings, ObeyPlainLettersAndThoseWithModifiers)
{
    OpenText(TwoStrings);
    for (int modifiers : {0, int(wxMOD_ALT), int(wxMOD_CONTROL)}) {
        for (bool inChoice : {false, true}) {
            ForgetLog();
            auto press = [&](Cartulo_Strings &dialog) {
                wxWindow *focus = ListOf(dialog);
                if (inChoice)
                    focus = dialog.FindWindow(ID_STRING_SOURCE);
                PressKey(focus, 'E', modifiers);
            };
            auto look = [](Cartulo_Strings_Edit &dialog) {
                EXPECT_EQ("jgo", KeyOf(dialog)->GetValue());
            };
            wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press), UseString(look));
            EXPECT_EQ((Lines{{"INFO: Cartulo_Strings::OnCharHook ", TNS_LIFECYCLE},
                             {"INFO: Cartulo_Strings::OnCharHook Edit String ...", TNS_LIFECYCLE}}),
                      TakeLog("INFO: Cartulo_Strings::OnCharHook"));
        }
    }
}

TEST_F(Strings, OpenWithTheirRowForADoubleClick)
{
    OpenText(TwoStrings);
    auto press = [](Cartulo_Strings &dialog) {
        ListOf(dialog)->SetSelection(1);
        DoubleClick(dialog);
    };
    auto look = [](Cartulo_Strings_Edit &dialog) { EXPECT_EQ("acm", KeyOf(dialog)->GetValue()); };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press), UseString(look));
}

TEST_F(Strings, AreDeletedWithoutAQuestionEvenWhenTheyAreUsed)
{
    OpenText(TwoStrings);
    ForgetLog();
    auto press = [](Cartulo_Strings &dialog) {
        PressKey(ListOf(dialog), 'D');
        EXPECT_EQ((Texts{wxString(L"acm = A\u00ABjgo\u00BB")}), Items(ListOf(dialog)));
        EXPECT_EQ(0, ListOf(dialog)->GetSelection());
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press));
    EXPECT_EQ((Lines{{"INFO: Cartulo_Strings::OnRemove", TNS_ACTION}}),
              TakeLog("INFO: Cartulo_Strings::OnRemove"));
    EXPECT_EQ("The string is deleted: jgo = Good Order", Status());
    EXPECT_EQ("@STRING{acm = {A} # jgo}\n\n@article{one,\n\ttitle = {Old Maps},\n"
              "\tseries = jgo\n}\n",
              Saved());
}

TEST_F(Strings, AreDeletedOneByOneWhileTheKeyIsHeld)
{
    OpenText("@string{a = {1}}\n@string{b = {2}}\n@string{c = {3}}\n");
    auto press = [](Cartulo_Strings &dialog) {
        wxKeyEvent event(wxEVT_CHAR_HOOK);
        event.m_keyCode = 'D';
        for (long time : {1000, 1660, 1700, 1740}) {
            event.SetTimestamp(time);
            ListOf(dialog)->ProcessWindowEvent(event);
        }
        EXPECT_EQ(2u, ListOf(dialog)->GetCount());
        wxKeyEvent release(wxEVT_KEY_UP);
        release.m_keyCode = WXK_ALT;
        ListOf(dialog)->ProcessWindowEvent(release);
        event.SetTimestamp(1780);
        ListOf(dialog)->ProcessWindowEvent(event);
        EXPECT_EQ(2u, ListOf(dialog)->GetCount());
        event.SetTimestamp(2800); // it was released elsewhere
        ListOf(dialog)->ProcessWindowEvent(event);
        EXPECT_EQ(1u, ListOf(dialog)->GetCount());
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press));
}

TEST_F(Strings, KeepTheirRowSelectedWhileTheyAreDeleted)
{
    OpenText("@string{a = {1}}\n@string{b = {2}}\n@string{c = {3}}\n");
    auto press = [](Cartulo_Strings &dialog) {
        ListOf(dialog)->SetSelection(1);
        PressButton(dialog, ID_STRING_REMOVE);
        EXPECT_EQ("c = 3", ListOf(dialog)->GetStringSelection());
        PressButton(dialog, ID_STRING_REMOVE);
        EXPECT_EQ("a = 1", ListOf(dialog)->GetStringSelection());
        PressButton(dialog, ID_STRING_REMOVE);
        PressButton(dialog, ID_STRING_REMOVE);
        PressButton(dialog, ID_STRING_EDIT);
        EXPECT_EQ(wxNOT_FOUND, ListOf(dialog)->GetSelection());
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press));
    EXPECT_EQ(nullptr, File()->strings);
    EXPECT_EQ(3, File()->modified);
}

TEST_F(Strings, ThatVanishedAreOnlyLogged)
{
    OpenText(TwoStrings);
    auto press = [this](Cartulo_Strings &dialog) {
        File()->strings->name[0] = 'X';
        for (int id : {ID_STRING_EDIT, ID_STRING_REMOVE}) {
            ForgetLog();
            PressButton(dialog, id);
            EXPECT_EQ(
                (Lines{{"Cartulo: INTERNAL-ERROR: Can't locate string key: jgo", TNS_WARNING}}),
                TakeLog("Cartulo: INTERNAL"));
        }
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(Strings, StayInSightAmongTenThousand)
{
    std::string text;
    for (int i = 0; i < 10000; ++i)
        text +=
            "@string{s" + std::to_string(i) + " = {Journal of Order " + std::to_string(i) + "}}\n";
    OpenText(text);
    auto look = [](Cartulo_Strings &dialog) {
        wxListBox *list = ListOf(dialog);
        ASSERT_EQ(10000u, list->GetCount());
        auto isInSight = [list](int row) {
            return list->GetTopItem() <= row && row < list->GetTopItem() + list->GetCountPerPage();
        };
        list->SetSelection(7000);
        list->EnsureVisible(7000);
        ASSERT_TRUE(WaitFor([&] { return isInSight(7000); }));
        PressButton(dialog, ID_STRING_REMOVE);
        EXPECT_EQ("s7001 = Journal of Order 7001", list->GetStringSelection());
        EXPECT_TRUE(WaitFor([&] { return isInSight(7000); })) << list->GetTopItem();
        dialog.EndModal(wxID_CANCEL);
    };
    ShowDialog<Cartulo_Strings>([this] { Run(ID_STRINGS); }, look);
}

TEST_F(Strings, AreLeftByTheArrowsFromTheSelectedRow)
{
    OpenText("@string{a = {1}}\n@string{b = {2}}\n@string{c = {3}}\n@string{d = {4}}\n");
    auto press = [](Cartulo_Strings &dialog) {
        wxListBox *list = ListOf(dialog);
        auto expectRow = [&](int key, int row) {
            SendKey(list, key);
            EXPECT_TRUE(WaitFor([&] { return list->GetSelection() == row; }))
                << list->GetSelection() << " instead of " << row;
        };
        expectRow(WXK_DOWN, 1);
        ShowDialog<Cartulo_Strings_Edit>([&] { PressKey(list, 'E'); },
                                         [](Cartulo_Strings_Edit &edit) {
                                             ValueOf(edit)->SetValue("changed");
                                             SendKey(ValueOf(edit), WXK_RETURN);
                                         });
        expectRow(WXK_DOWN, 2);
        ShowDialog<Cartulo_Strings_Edit>([&] { PressKey(list, 'A'); },
                                         [](Cartulo_Strings_Edit &edit) {
                                             KeyOf(edit)->SetValue("new");
                                             SendKey(KeyOf(edit), WXK_RETURN);
                                         });
        EXPECT_EQ(4, list->GetSelection());
        expectRow(WXK_UP, 3);
        PressKey(list, 'D');
        EXPECT_EQ("new = ", list->GetStringSelection());
        expectRow(WXK_UP, 2);
        dialog.EndModal(wxID_CANCEL);
    };
    ShowDialog<Cartulo_Strings>([this] { Run(ID_STRINGS); }, press);
}

// --- Inserting ---

TEST_F(Strings, AreInsertedAtTheCursor)
{
    OpenText(TwoStrings);
    StartEditing();
    Focus(Value("title"));
    Value("title")->SetInsertionPoint(3);
    ForgetLog();
    auto insert = [](Cartulo_Strings &dialog) {
        EXPECT_TRUE(dialog.FindWindow(wxID_OK)->IsEnabled());
        ListOf(dialog)->SetSelection(1);
        EXPECT_TRUE(PressOK(dialog));
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(insert));
    std::vector<LogLine> log = TakeLog("");
    for (const LogLine &line : Lines{{"INFO: Cartulo::OnEditStrings, mode=Insert", TNS_ACTION},
                                     {"INFO: Cartulo_Strings::OnOK", TNS_ACTION},
                                     {"Cartulo: Cartulo_Strings::OnOK, Insert ", TNS_TRACE},
                                     {"Cartulo: INFO:(1) \u00ABacm\u00BB", TNS_TRACE},
                                     {"Cartulo: INFO: at 3 insert \u00ABacm\u00BB", TNS_TRACE}})
        EXPECT_EQ(1, std::count(log.begin(), log.end(), line)) << line.text;
    EXPECT_EQ(wxString(L"Old\u00ABacm\u00BB Maps"), Value("title")->GetValue());
    EXPECT_EQ(8, Value("title")->GetInsertionPoint());
    EXPECT_TRUE(WaitFor([this] { return Value("title")->HasFocus(); }));
    EXPECT_EQ("", Value("title")->GetStringSelection());
    wxTEST_DIALOG(Send(ID_COMMIT_ENTRY), Question("NO", 0, 1, 0, wxID_YES));
    EXPECT_STREQ("Old\2acm\5 Maps", Panel()->CurrentEntry()->fields[0].value);
}

TEST_F(Strings, ComeFromAListByADoubleClick)
{
    OpenText(TwoStrings);
    StartEditing();
    AddField("month");
    Focus(Value("month"));
    auto insert = [](Cartulo_Strings &dialog) {
        ChooseItem(dialog, ID_STRING_SOURCE, 0);
        dialog.Show();
        DoubleClick(dialog);
        EXPECT_FALSE(dialog.IsShown());
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(insert));
    EXPECT_EQ(wxString(L"\u00ABjan\u00BB"), Value("month")->GetValue());
}

TEST_F(Strings, AreNotInsertedWhereNoneIsSelected)
{
    OpenText("@article{one, title = {Old Maps}}\n");
    StartEditing();
    Focus(Value("title"));
    ForgetLog();
    auto press = [](Cartulo_Strings &dialog) { EXPECT_TRUE(PressOK(dialog)); };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press));
    EXPECT_EQ((Lines{{"WARNING: Cartulo_Strings::OnOK has no selection.", TNS_WARNING}}),
              TakeLog("WARNING"));
    EXPECT_EQ("Old Maps", Value("title")->GetValue());
    EXPECT_EQ("Nothing was inserted, as no string was selected.", Status());
}

TEST_F(Strings, AreNotInsertedIntoAFullField)
{
    OpenText(TwoStrings);
    StartEditing();
    Focus(Value("title"));
    wxString full('x', 65530);
    Value("title")->SetValue(full);
    auto press = [](Cartulo_Strings &dialog) { EXPECT_TRUE(PressOK(dialog)); };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press),
                  ExpectBox(Title,
                            "The value is too long: a field can be edited up to 65,534 bytes.",
                            wxID_OK, Refusal));
    EXPECT_EQ(full, Value("title")->GetValue());
}

TEST_F(Strings, HaveNothingToBeInsertedIntoWithoutAField)
{
    OpenText(TwoStrings);
    auto look = [](Cartulo_Strings &dialog) {
        EXPECT_FALSE(dialog.FindWindow(wxID_OK)->IsEnabled());
    };
    ForgetLog();
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(look));
    StartEditing();
    Focus(NewKey());
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(look));
    EXPECT_EQ((Lines{{"INFO: Cartulo::OnEditStrings, mode=Edit", TNS_ACTION},
                     {"INFO: Cartulo::OnEditStrings, mode=Edit", TNS_ACTION}}),
              TakeLog("INFO: Cartulo::OnEditStrings"));
}

// --- A new one ---

class NewString : public Strings
{
protected:
    void Add(const std::function<void(Cartulo_Strings_Edit &)> &steps)
    {
        wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(PressAdd), UseString(steps));
    }

    void Add(const std::function<void(Cartulo_Strings_Edit &)> &steps, const ExpectBox &box)
    {
        wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(PressAdd), UseString(steps), box);
    }

    static void PressAdd(Cartulo_Strings &dialog) { PressButton(dialog, ID_STRING_ADD); }
};

TEST_F(NewString, HasAKeyAndAValue)
{
    OpenText(TwoStrings);
    auto look = [](Cartulo_Strings_Edit &dialog) {
        EXPECT_EQ("Creating New String Entry", dialog.GetTitle());
        EXPECT_EQ((Texts{"String Key:", "String Value:"}), Labels(dialog));
        EXPECT_EQ("", Find<wxTextCtrl>(dialog, 6001)->GetValue());
        EXPECT_EQ("", Find<wxTextCtrl>(dialog, 6002)->GetValue());
        for (int button : {wxID_OK, wxID_CANCEL})
            EXPECT_TRUE(dialog.FindWindow(button)) << button;
        EXPECT_EQ(dialog.GetParent()->GetSize().x, dialog.GetSize().x);
        ExpectRoom(dialog);
    };
    Add(look);
    EXPECT_EQ(nullptr, File()->strings->next->next);
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(NewString, StandsAtTheEndAndIsSelected)
{
    OpenText(TwoStrings);
    auto press = [](Cartulo_Strings &dialog) {
        ForgetLog();
        PressKey(ListOf(dialog), 'A', wxMOD_ALT);
        EXPECT_EQ("new = Value", ListOf(dialog)->GetStringSelection());
    };
    auto type = [](Cartulo_Strings_Edit &dialog) {
        EXPECT_EQ((Lines{{"INFO: Cartulo_Strings::OnAdd", TNS_ACTION}}),
                  TakeLog("INFO: Cartulo_Strings::OnAdd"));
        EXPECT_TRUE(PressOK(dialog, " n e w ", "Value"));
    };
    wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(press), UseString(type));
    EXPECT_TRUE(SaveEnabled());
    EXPECT_EQ("@STRING{jgo = {Good Order}}\n@STRING{acm = {A} # jgo}\n@STRING{new = {Value}}\n\n"
              "@article{one,\n\ttitle = {Old Maps},\n\tseries = jgo\n}\n",
              Saved());
}

TEST_F(NewString, NeedsAKey)
{
    OpenText(TwoStrings);
    Add([](Cartulo_Strings_Edit &dialog) { EXPECT_FALSE(PressOK(dialog, " \t", "V")); },
        ExpectBox(Title, "Please enter key for new string.", wxID_OK, Refusal));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(NewString, LosesBadCharactersOfItsKeyOnRequest)
{
    OpenText(TwoStrings);
    const char *text = "String  key includes invalid characters.\n"
                       "We will remove them and continue.";
    Add(
        [](Cartulo_Strings_Edit &dialog) {
            EXPECT_FALSE(PressOK(dialog, "a{b}#", "V"));
            EXPECT_EQ("a{b}#", KeyOf(dialog)->GetValue());
        },
        ExpectBox(Title, text, wxID_CANCEL, Offer));
    Add(
        [](Cartulo_Strings_Edit &dialog) {
            EXPECT_FALSE(PressOK(dialog, "a {b}#", "V"));
            EXPECT_EQ("ab", KeyOf(dialog)->GetValue());
            EXPECT_EQ(2, KeyOf(dialog)->GetInsertionPoint());
            EXPECT_TRUE(PressOK(dialog));
        },
        ExpectBox(Title, text, wxID_OK, Offer));
    EXPECT_STREQ("ab", File()->strings->next->next->name);
}

TEST_F(NewString, IsRefusedWhereItsFileHasTheKey)
{
    OpenTwo();
    CurrentStringSource = 0;
    Add([](Cartulo_Strings_Edit &dialog) { EXPECT_FALSE(PressOK(dialog, "ACM", "V")); },
        ExpectBox(Title,
                  "String with the same key is already defined in this BIB-file.\nPlease choose "
                  "another key or use edit function to modify the string",
                  wxID_OK, Refusal));
    EXPECT_FALSE(SaveEnabled());
    Add([](Cartulo_Strings_Edit &dialog) { EXPECT_TRUE(PressOK(dialog, "Pub", "V")); });
    EXPECT_TRUE(File(0)->modified);
    EXPECT_FALSE(File(1)->modified);
}

TEST_F(NewString, IsRefusedWhenItCouldNotBeReadBack)
{
    OpenText(TwoStrings);
    Add([](Cartulo_Strings_Edit &dialog) { EXPECT_FALSE(PressOK(dialog, "1st", "V")); },
        ExpectBox(Title,
                  "A string of this name can't be written to a BIB file.\nIt must not begin with "
                  "a digit, and hold no backslash or control character.",
                  wxID_OK, Refusal));
    Add([](Cartulo_Strings_Edit &dialog) { EXPECT_FALSE(PressOK(dialog, L"\u0142", "V")); },
        ExpectBox(Title, "The key includes characters that can't be stored in CP1252.", wxID_OK,
                  Refusal));
    Add([](Cartulo_Strings_Edit &dialog) { EXPECT_FALSE(PressOK(dialog, "n", "a}")); },
        ExpectBox(Title,
                  "Wrong string syntax:\n\nUnbalanced braces (extra `}')\n\nFix the problem to "
                  "continue.",
                  wxID_OK, Refusal));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(NewString, IsTypedOnBehindItsCleanedKey)
{
    OpenText(TwoStrings);
    ShowString('A', [](Cartulo_Strings_Edit &dialog) {
        KeyOf(dialog)->SetValue("a{b}");
        wxTEST_DIALOG(PressButton(dialog, wxID_OK),
                      ExpectBox(Title,
                                "String  key includes invalid characters.\n"
                                "We will remove them and continue.",
                                wxID_OK, Offer));
        SendKey(KeyOf(dialog), 'X');
        EXPECT_TRUE(WaitFor([&] { return KeyOf(dialog)->GetValue() == "abx"; }));
        dialog.EndModal(wxID_CANCEL);
    });
}

TEST_F(NewString, TakesTheFocusAndTheKeys)
{
    OpenText(TwoStrings);
    ShowString('A', [](Cartulo_Strings_Edit &dialog) {
        SendText(KeyOf(dialog), "ade"); // letters that are commands in the list
        EXPECT_TRUE(WaitFor([&] { return KeyOf(dialog)->GetValue() == "ade"; }));
        SendKey(KeyOf(dialog), WXK_TAB);
        SendText(ValueOf(dialog), "v");
        EXPECT_TRUE(WaitFor([&] { return ValueOf(dialog)->GetValue() == "v"; }));
        SendKey(ValueOf(dialog), WXK_RETURN);
    });
    EXPECT_STREQ("ade", File()->strings->next->next->name);
}

// --- A changed one ---

class ChangedString : public Strings
{
protected:
    using Steps = std::function<void(Cartulo_Strings_Edit &)>;

    void Change(int row, const Steps &steps)
    {
        wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(PressEdit(row)), UseString(steps));
    }

    void Change(int row, const Steps &steps, const ExpectBox &box)
    {
        wxTEST_DIALOG(Send(ID_STRINGS), UseStrings(PressEdit(row)), UseString(steps), box);
    }

    static std::function<void(Cartulo_Strings &)> PressEdit(int row)
    {
        return [row](Cartulo_Strings &dialog) {
            ListOf(dialog)->SetSelection(row);
            PressButton(dialog, ID_STRING_EDIT);
        };
    }

    static Steps Type(const wxString &value, bool accepted)
    {
        return [=](Cartulo_Strings_Edit &dialog) {
            ValueOf(dialog)->SetValue(value);
            EXPECT_EQ(accepted, PressOK(dialog));
            EXPECT_EQ(value, ValueOf(dialog)->GetValue());
        };
    }

    static ExpectBox Wrong(const wxString &reason)
    {
        return ExpectBox(Title,
                         "Wrong string syntax:\n\n" + reason + "\n\nFix the problem to continue.",
                         wxID_OK, Refusal);
    }
};

TEST_F(ChangedString, KeepsItsKey)
{
    OpenText(TwoStrings);
    ForgetLog();
    Change(1, [](Cartulo_Strings_Edit &dialog) {
        EXPECT_EQ("Editing the String Entry", dialog.GetTitle());
        EXPECT_EQ("acm", KeyOf(dialog)->GetValue());
        EXPECT_FALSE(KeyOf(dialog)->IsEnabled());
        EXPECT_EQ(wxString(L"A\u00ABjgo\u00BB"), ValueOf(dialog)->GetValue());
        ValueOf(dialog)->SetValue(L"\u00ABjgo\u00BB and others");
        EXPECT_TRUE(PressOK(dialog));
    });
    EXPECT_EQ((Lines{{"INFO: Cartulo_Strings::OnEdit", TNS_ACTION}}),
              TakeLog("INFO: Cartulo_Strings::OnEdit"));
    EXPECT_EQ("@STRING{jgo = {Good Order}}\n@STRING{acm = jgo # { and others}}\n\n"
              "@article{one,\n\ttitle = {Old Maps},\n\tseries = jgo\n}\n",
              Saved());
}

TEST_F(ChangedString, ChangesNothingWhenItsValueIsTheSame)
{
    OpenText(TwoStrings);
    Change(1, [](Cartulo_Strings_Edit &dialog) { EXPECT_TRUE(PressOK(dialog)); });
    Change(1, Type(L"A\u00ABjgo\u00BB", true));
    EXPECT_FALSE(SaveEnabled());
}

TEST_F(ChangedString, StaysOpenOnAWrongValue)
{
    OpenText(TwoStrings);
    Change(0, Type("{{a}", false), Wrong("Unbalanced braces (too few closing braces)"));
    Change(0, Type("a}", false), Wrong("Unbalanced braces (extra `}')"));
    Change(0, Type(L"\u00ABa b\u00BB", false), Wrong("Invalid char in abbreviation"));
    Change(0, Type(L"\u00AB\u00BB", false),
           Wrong("The name of an abbreviation is missing, begins with a digit, or holds a "
                 "backslash or a control character"));
    EXPECT_FALSE(SaveEnabled());
    EXPECT_STREQ("Good Order", File()->strings->value);
}

TEST_F(ChangedString, IsTheOneInTheRowAmongNamesakes)
{
    OpenText("@string{a = {1}}\n@string{A = {2}}\n");
    Change(1, Type("3", true));
    EXPECT_STREQ("1", File()->strings->value);
    EXPECT_STREQ("3", File()->strings->next->value);
}

TEST_F(ChangedString, AsksBeforeItLosesCharacters)
{
    OpenText("@string{a = {\253quoted\273}}\n");
    wxString question = L"`a': \u0142 can't be stored in CP1252 and would become \u00FF.\n"
                        L"`a': \u00AB and \u00BB will mark an abbreviation, not stand as text.\n"
                        L"\nDo you want to accept these changes anyway ?";
    const long style = wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION;
    Change(0, [](Cartulo_Strings_Edit &dialog) { EXPECT_TRUE(PressOK(dialog)); });
    EXPECT_STREQ("\253quoted\273", File()->strings->value);
    Change(0, Type(L"\u00ABquoted\u00BB\u0142", false), ExpectBox(Title, question, wxID_NO, style));
    EXPECT_STREQ("\253quoted\273", File()->strings->value);
    Change(0, Type(L"\u00ABquoted\u00BB\u0142", true), ExpectBox(Title, question, wxID_YES, style));
    EXPECT_STREQ("\2quoted\5\377", File()->strings->value);
}

TEST_F(ChangedString, IsTypedOnWhereTheCursorWas)
{
    OpenText(TwoStrings);
    ShowString('E', [this](Cartulo_Strings_Edit &dialog) {
        wxTextCtrl *value = ValueOf(dialog);
        SendKey(value, 'X');
        EXPECT_TRUE(WaitFor([&] { return value->GetValue() == "Good Orderx"; }));
        value->SetValue("Good}");
        value->SetInsertionPoint(5);
        wxTEST_DIALOG(PressButton(dialog, wxID_OK), Wrong("Unbalanced braces (extra `}')"));
        SendKey(value, WXK_BACK);
        EXPECT_TRUE(WaitFor([&] { return value->GetValue() == "Good"; }));
        SendKey(value, WXK_RETURN);
    });
    EXPECT_STREQ("Good", File()->strings->value);
}

TEST_F(ChangedString, KeepsAValueThatNoFieldHolds)
{
    std::string value(70000, 'x');
    OpenText("@string{a = {" + value + "}}\n");
    Change(0, [](Cartulo_Strings_Edit &dialog) {
        EXPECT_FALSE(ValueOf(dialog)->IsEditable());
        EXPECT_EQ("This value can't be shown in full, so it stays as it is.",
                  ValueOf(dialog)->GetToolTipText());
        EXPECT_TRUE(PressOK(dialog));
    });
    EXPECT_EQ(value, File()->strings->value);
    EXPECT_FALSE(SaveEnabled());
}

// tests/gui/commands_test.cpp - all commands in both modes: which of them apply, and where they
// leave the keyboard.

#include "tests/gui/EditTest.h"

#include <wx/filedlg.h>
#include <wx/modalhook.h>
#include <wx/srchctrl.h>

// --- Which apply ---

enum State { LIST, EDITING, READ_ONLY, READ_ONLY_EDITING, OTHER_WRITABLE, NO_ROW, NO_FILE, STATES };

static const char *const StateNames[STATES] = {
    "list", "editing", "read-only", "read-only, editing", "read-only list", "no row", "no file"};

static const char Broken[] = "@misc{broken, note = {x}}\n@misc{two\n";

class CommandStates : public Edit
{
protected:
    void OpenBroken(const std::string &others)
    {
        wxTEST_DIALOG(Open(folder.Write("b.bib", Broken) + others),
                      ExpectMessages("There are errors in loading BIB files"));
    }

    void Reach(int wanted)
    {
        switch (wanted) {
        case READ_ONLY:
        case READ_ONLY_EDITING:
            OpenBroken("");
            break;
        case OTHER_WRITABLE:
            OpenBroken(" " + folder.Write("z.bib", "@misc{zz, note = {z}}\n"));
            break;
        case NO_ROW:
            OpenText("");
            break;
        case NO_FILE:
            Open("");
            break;
        default:
            OpenText(Article);
        }
        if (wanted == EDITING || wanted == READ_ONLY_EDITING)
            Send(ID_COMMIT_ENTRY); // leads there from the list, also in a read-only file
        ASSERT_EQ(wanted == EDITING || wanted == READ_ONLY_EDITING, Panel()->InEditMode());
    }

    void InEachState(const std::function<void(int)> &check)
    {
        for (int state = 0; state < STATES; ++state) {
            SCOPED_TRACE(StateNames[state]);
            Reach(state);
            check(state);
            CartuloWindow::Close();
        }
    }
};

TEST_F(CommandStates, EnableTools)
{
    const struct {
        int id;
        bool enabled[STATES];
    } rows[] = {
        {ID_SAVE, {false, false, false, false, false, false, false}},
        {ID_STRINGS, {true, true, true, true, true, true, true}},
        {ID_PREAMBLE, {true, true, true, true, true, true, true}},
        {ID_CITE, {false, false, false, false, false, false, false}},
        {ID_NEW_ENTRY, {true, false, false, false, true, true, false}},
        {ID_RENAME_ENTRY, {true, false, false, false, false, false, false}},
        {ID_REMOVE_ENTRY, {true, false, false, false, false, false, false}},
        {ID_EDIT_ENTRY, {true, false, false, false, false, false, false}},
        {ID_HELP, {true, true, true, true, true, true, true}},
        {ID_ABOUT, {true, true, true, true, true, true, true}},
    };
    InEachState([&](int state) {
        for (const auto &row : rows)
            EXPECT_EQ(row.enabled[state], ToolEnabled(row.id)) << row.id;
    });
}

// The controls of the pane: shown, and enabled.
TEST_F(CommandStates, EnableControls)
{
    enum { N, S, E }; // not shown, shown, shown and enabled
    enum { LAST_REMOVER = ID_REMOVE_ROW_END - 1 };
    const struct {
        int id;
        int looks[STATES];
    } rows[] = {
        {ID_INDEX, {E, S, E, S, E, E, N}},
        {ID_TYPE, {S, E, S, E, S, N, N}},
        {ID_NEW_FIELD_KEY, {N, E, N, E, N, N, N}},
        {ID_NEW_FIELD, {N, E, N, E, N, N, N}},
        {ID_COMMIT_ENTRY, {N, E, N, E, N, N, N}},
        {ID_REMOVE_ROW, {S, E, S, E, S, N, N}},
        {LAST_REMOVER, {N, N, N, N, N, N, N}},
        {ID_NEW_ENTRY, {N, N, N, N, N, E, N}}, // on the pane of an empty list
        {ID_OPEN, {N, N, N, N, N, N, E}},
    };
    InEachState([&](int state) {
        for (const auto &row : rows) {
            const wxWindow *window = Panel()->FindWindow(row.id);
            bool isMadeWhenNeeded =
                row.id == LAST_REMOVER || row.id == ID_NEW_ENTRY || row.id == ID_OPEN;
            ASSERT_TRUE(window || isMadeWhenNeeded) << row.id;
            bool isShown = window && window->IsShownOnScreen();
            int looks = !isShown ? N : window->IsEnabled() ? E : S;
            EXPECT_EQ(row.looks[state], looks) << row.id;
        }
    });
}

// --- The keyboard afterwards ---

// Answers every box, accepting or not, and leaves other dialogs once they have the keyboard: of one
// that goes before, the window manager might still bring it forward.
class AnswerDialogs : public wxModalDialogHook
{
public:
    AnswerDialogs(bool accept, const wxString &path) : m_accept(accept), m_path(path)
    {
        Register();
    }
    ~AnswerDialogs() override { Unregister(); }

    int Count() const { return m_count; }

protected:
    int Enter(wxDialog *dialog) override
    {
        ++m_count;
        if (wxMessageDialog *box = dynamic_cast<wxMessageDialog *>(dialog)) {
            bool asks = (box->GetMessageDialogStyle() & wxYES_NO) != 0;
            return !m_accept ? wxID_CANCEL : asks ? wxID_YES : wxID_OK;
        }
        wxFileDialog *files = dynamic_cast<wxFileDialog *>(dialog);
        if (files && !m_accept)
            return wxID_CANCEL;
        dialog->CallAfter([this, dialog, files] {
            bool isReady = WaitFor([&] {
                if (files)
                    files->SetPath(m_path);
                return files ? HasKeyboard(files) && files->GetPath() == m_path
                             : dialog->IsActive();
            });
            EXPECT_TRUE(isReady) << dialog->GetTitle();
            dialog->EndModal(files && isReady ? wxID_OK : wxID_CANCEL);
        });
        return wxID_NONE;
    }

private:
    // The toolkit does not tell of a file dialog whether it is active.
    static bool HasKeyboard(wxFileDialog *files)
    {
        wxWindow *parent = wxGetTopLevelParent(files->GetParent());
        return !dynamic_cast<wxTopLevelWindow *>(parent)->IsActive();
    }

    bool m_accept;
    wxString m_path;
    AllowDialogs m_allow;
    int m_count = 0;
};

// All that the panel or the frame carries out without another program, and how many dialogs each
// shows in the list, while an entry is edited, and then with the focus in a field; all are left
// with "Cancel".
static const struct Command {
    int id, inList, inEditing, inField;
} Commands[] = {
    {ID_OPEN, 1, 1, 1},           {ID_SAVE, 0, 0, 0},         {ID_STRINGS, 1, 1, 1},
    {ID_PREAMBLE, 1, 1, 1},       {ID_MESSAGES, 1, 1, 1},     {ID_CITE, 0, 0, 0},
    {ID_NEW_ENTRY, 1, 1, 1},      {ID_REMOVE_ENTRY, 1, 1, 1}, {ID_RENAME_ENTRY, 1, 1, 1},
    {ID_EDIT_ENTRY, 0, 0, 0},     {ID_COMMIT_ENTRY, 0, 1, 1}, {ID_NEW_FIELD, 0, 0, 0},
    {ID_RENAME_FIELD, 0, 0, 1},   {ID_REMOVE_FIELD, 0, 0, 0}, {ID_EDIT_FIELD, 0, 0, 1},
    {ID_ABOUT, 1, 1, 1},          {ID_REMOVE_ROW, 0, 0, 0},   {ID_REMOVE_ROW + 1, 0, 0, 0},
    {ID_REMOVE_ROW + 2, 0, 0, 0},
};

class FocusWalk : public Edit
{
protected:
    // Runs a command and looks whether the keyboard still works then. Returns how many dialogs it
    // showed.
    int Run(int id, bool accept)
    {
        AnswerDialogs answers(accept, folder.Path("a.bib"));
        Send(id);
        EXPECT_TRUE(KeyboardWorks()) << id;
        wxWindow *focus = wxWindow::FindFocus(); // not always known for choices
        EXPECT_TRUE(!focus || (focus->IsShownOnScreen() && focus->IsEnabled())) << id;
        EXPECT_TRUE(frame->IsActive());
        return answers.Count();
    }

    // Carries out each command in a window of its own, where `start` leads: first refusing whatever
    // is asked, then accepting it. `dialogs` is how many the refused command shows there.
    void WalkFrom(const std::function<void()> &start, int Command::*dialogs)
    {
        for (bool accept : {false, true}) {
            for (const Command &command : Commands) {
                SCOPED_TRACE(testing::Message() << "accept " << accept);
                OpenText(Child);
                start();
                int shown = Run(command.id, accept);
                if (!accept) {
                    EXPECT_EQ(command.*dialogs, shown) << command.id;
                }
                frame->Destroy();
                DeleteClosedWindows();
            }
        }
    }

    void EditTitle()
    {
        StartEditing();
        SetValue("title", "New");
    }

private:
    // A real key reaches the window from wherever the focus is.
    bool KeyboardWorks()
    {
        ForgetLog();
        SendKey(frame, 'B', wxMOD_ALT);
        return WaitFor([] { return !TakeLog("INFO: MyFrame::OnCharHook Save").empty(); });
    }
};

TEST_F(FocusWalk, LeadsThroughAllCommandsOfTheList)
{
    WalkFrom([this] { Focus(List()); }, &Command::inList);
}

TEST_F(FocusWalk, LeadsThroughAllCommandsFromTheSearchField)
{
    WalkFrom([this] { Focus(Search()); }, &Command::inList);
}

TEST_F(FocusWalk, LeadsThroughAllCommandsFromTheTypeOfAnEditedEntry)
{
    WalkFrom(
        [this] {
            EditTitle();
            Focus(Type());
        },
        &Command::inEditing);
}

TEST_F(FocusWalk, LeadsThroughAllCommandsFromTheRowForANewField)
{
    WalkFrom(
        [this] {
            EditTitle();
            Focus(NewKey());
        },
        &Command::inEditing);
}

TEST_F(FocusWalk, LeadsThroughAllCommandsFromAField)
{
    WalkFrom(
        [this] {
            EditTitle();
            Focus(Value("title"));
        },
        &Command::inField);
}

TEST_F(FocusWalk, LeadsOutOfTheLastEntry)
{
    OpenText(Article);
    Focus(List());
    EXPECT_EQ(1, Run(ID_REMOVE_ENTRY, true));
    for (const Command &command : Commands)
        Run(command.id, false);
}

TEST_F(FocusWalk, LeadsThroughAllCommandsWithoutAFile)
{
    Open("");
    for (const Command &command : Commands)
        Run(command.id, false);
}

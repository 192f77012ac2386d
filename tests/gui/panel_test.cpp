// tests/gui/panel_test.cpp - the editor panel: its panes, the tools that apply, the sash, citing.

#include "tests/gui/GuiTest.h"

#include <cstdlib>
#include <cstring>

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/scrolwin.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "ui/Cartulo.h"
#include "ui/Ids.h"
#include "ui/QListBox.h"

static const char OneEntry[] = "@book{one, title = {First}}\n";

static std::string EntryWithFields(const char *key, int count)
{
    std::string text = std::string("@misc{") + key;
    for (int i = 0; i < count; ++i)
        text += ", f" + std::to_string(i) + " = {v}";
    return text + "}\n";
}

using Lines = std::vector<LogLine>;
using EditorPanel = CartuloWindow;

// --- Panes ---

TEST_F(EditorPanel, OffersToAddAnEntryWhereThereIsNone)
{
    Open(folder.Write("new.bib", ""));
    EXPECT_TRUE(IsShowing(ID_INDEX));
    EXPECT_TRUE(IsShowing(ID_NEW_ENTRY));
    EXPECT_FALSE(IsShowing(ID_OPEN));
    EXPECT_FALSE(EntryPane()->IsShownOnScreen());
    EXPECT_TRUE(WaitForKeys(List()));
}

TEST_F(EditorPanel, FollowsTheNumberOfFilesAndEntries)
{
    std::string empty = folder.Write("new.bib", ""), full = folder.Write("a.bib", OneEntry);
    Open("");
    struct {
        std::string commandLine;
        bool open, add, entry;
    } const rows[] = {{empty, false, true, false}, {full, false, false, true},
                      {"", true, false, false},    {full + " " + empty, false, false, true},
                      {empty, false, true, false}, {"", true, false, false},
                      {empty, false, true, false}};
    for (const auto &row : rows) {
        frame->TakeCommand(row.commandLine.c_str());
        EXPECT_EQ(row.open, IsShowing(ID_OPEN)) << row.commandLine;
        EXPECT_EQ(row.add, IsShowing(ID_NEW_ENTRY)) << row.commandLine;
        EXPECT_EQ(row.entry, EntryPane()->IsShownOnScreen()) << row.commandLine;
        EXPECT_EQ(!row.open, IsShowing(ID_INDEX)) << row.commandLine;
    }
}

// The heading of the pane that holds this control.
static wxStaticText *HeadingOver(const wxWindow *control)
{
    for (wxWindow *child : control->GetParent()->GetChildren())
        if (wxStaticText *text = dynamic_cast<wxStaticText *>(child))
            return text;
    return nullptr;
}

TEST_F(EditorPanel, SaysWhatEachPaneIsFor)
{
    Open("");
    auto expectHeading = [this](int id, const wxString &text) {
        ASSERT_TRUE(IsShowing(id));
        const wxStaticText *heading = HeadingOver(Panel()->FindWindow(id));
        ASSERT_TRUE(heading && heading->IsShownOnScreen());
        EXPECT_EQ(text, heading->GetLabelText());
        EXPECT_EQ(wxFONTWEIGHT_BOLD, heading->GetFont().GetWeight());
    };
    expectHeading(ID_OPEN, "To open TeX Bibliography file (BIB) click the button:");
    EXPECT_EQ("Open", Panel()->FindWindow(ID_OPEN)->GetLabel());
    EXPECT_EQ("Click to open BIB-file.", Panel()->FindWindow(ID_OPEN)->GetToolTipText());
    frame->TakeCommand(folder.Write("new.bib", "").c_str());
    expectHeading(ID_NEW_ENTRY, "To add new enrty click the button:");
    frame->TakeCommand(folder.Write("a.bib", OneEntry).c_str());
    expectHeading(ID_TYPE, "Records of currently selected bibliography entry");
}

TEST_F(EditorPanel, OffersToAddAnEntryWhileTheSearchFindsNone)
{
    Open(folder.Write("a.bib", OneEntry));
    Search()->SetFocus();
    ASSERT_TRUE(WaitForKeys(Search()));
    SearchFor("nothing like it");
    EXPECT_TRUE(IsShowing(ID_NEW_ENTRY));
    EXPECT_FALSE(EntryPane()->IsShownOnScreen());
    EXPECT_EQ(nullptr, Panel()->CurrentEntry());
    SearchFor("First");
    EXPECT_FALSE(IsShowing(ID_NEW_ENTRY));
    EXPECT_TRUE(EntryPane()->IsShownOnScreen());
    EXPECT_EQ((std::vector<Field>{{"title", "First"}}), ShownFields());
    EXPECT_TRUE(Search()->HasFocus());
}

TEST_F(EditorPanel, HasAButtonForEachField)
{
    Open(folder.Write("few.bib", "@book{a, title = {First}}\n") + " " +
         folder.Write("many.bib", EntryWithFields("b", 17)));
    for (int i = 0; i < 16; ++i)
        EXPECT_EQ(i < 1, IsShowing(ID_REMOVE_ROW + i)) << i;
    Panel()->ShowEntry(Panel()->Files()->files[1]->entries, 1);
    EXPECT_EQ(16u, ShownFields().size());
    for (int i = 0; i < 16; ++i) {
        wxButton *button = dynamic_cast<wxButton *>(Panel()->FindWindow(ID_REMOVE_ROW + i));
        ASSERT_NE(nullptr, button) << i;
        EXPECT_EQ("&Delete", button->GetLabel());
        EXPECT_EQ("Delete the field", button->GetToolTipText());
        EXPECT_TRUE(button->IsShown()) << i;
        EXPECT_FALSE(button->IsEnabled()) << i; // not while the list is in use
        EXPECT_EQ(Panel()->FindWindow(ID_REMOVE_ROW)->GetSize(), button->GetSize()) << i;
    }
}

TEST_F(EditorPanel, HidesWhatOnlyEditingNeeds)
{
    Open(folder.Write("a.bib", OneEntry));
    for (int id : {ID_NEW_FIELD_KEY, ID_NEW_FIELD, ID_COMMIT_ENTRY}) {
        ASSERT_NE(nullptr, Panel()->FindWindow(id)) << id;
        EXPECT_FALSE(IsShowing(id)) << id;
    }
    EXPECT_EQ("Finish editing the entry.", Panel()->FindWindow(ID_COMMIT_ENTRY)->GetToolTipText());
    EXPECT_EQ("Add new fields to the Entry with specified key (Alt+A)",
              Panel()->FindWindow(ID_NEW_FIELD)->GetToolTipText());
    EXPECT_FALSE(Panel()->FindWindow(ID_TYPE)->IsEnabled());
}

TEST_F(EditorPanel, ListsTheTypesOfAllFiles)
{
    Open(folder.Write("a.bib", OneEntry));
    frame->TakeCommand(folder.Write("b.bib", "@hologram{h, note = {n}}\n").c_str());
    wxChoice *types = dynamic_cast<wxChoice *>(Panel()->FindWindow(ID_TYPE));
    EXPECT_EQ("hologram", types->GetStringSelection());
    EXPECT_NE(wxNOT_FOUND, types->FindString("book"));
    EXPECT_EQ(wxNOT_FOUND, types->FindString("PREAMBLE"));
}

TEST_F(EditorPanel, ScrollsTheEntryWhenTheWindowIsLow)
{
    Open(folder.Write("a.bib", EntryWithFields("one", 16)));
    EXPECT_EQ(16u, ShownFields().size());
    EXPECT_GT(EntryPane()->GetVirtualSize().y, EntryPane()->GetClientSize().y);
    EXPECT_LE(EntryPane()->GetVirtualSize().x, EntryPane()->GetClientSize().x);
}

TEST_F(EditorPanel, FitsIntoTheNarrowestWindow)
{
    Open(folder.Write("a.bib", "@incollection{one, aVeryLongNameOfAFieldThatNobodyHas = {v}}\n"));
    ASSERT_TRUE(WaitFor([this] { return !frame->IsNew(); }));
    frame->SetSize(frame->GetMinSize());
    ASSERT_TRUE(WaitFor([this] { return frame->GetSize() == frame->GetMinSize(); }));
    EXPECT_TRUE(WaitFor([this] {
        return Panel()->FindWindow(ID_REMOVE_ROW)->GetRect().GetRight() <
               EntryPane()->GetClientSize().x;
    }));
    for (wxWindow *child : EntryPane()->GetChildren())
        EXPECT_TRUE(!child->IsShown() || child->GetSize().x > 25) << child->GetName();
}

// The tip of the first shown control of a kind.
template <class Control> static wxString TipOf(wxWindow *pane, const wxString &text)
{
    for (wxWindow *child : pane->GetChildren()) {
        Control *control = dynamic_cast<Control *>(child);
        if (control && control->IsShown() && control->GetLabelText() == text)
            return control->GetToolTipText();
    }
    return "no such control";
}

TEST_F(EditorPanel, TellsInTipsWhatFindsNoRoom)
{
    std::string name(80, 'n'), value(300, 'v'), huge(5000, 'h');
    Open(folder.Write("a.bib", "@misc{one, " + name + " = {short}, note = {" + value +
                                   "}, title = {" + huge + "}}\n"));
    std::vector<wxString> tips;
    for (wxWindow *child : EntryPane()->GetChildren())
        if (child->IsShown() && dynamic_cast<wxTextCtrl *>(child))
            tips.push_back(child->GetToolTipText());
    tips.pop_back(); // that of the help text
    EXPECT_EQ((std::vector<wxString>{"", value, wxString(huge).Left(1000) + L"\x2026"}), tips);
    EXPECT_EQ(name, TipOf<wxStaticText>(EntryPane(), name));
    EXPECT_EQ("", TipOf<wxStaticText>(EntryPane(), "note"));
}

// --- Tools ---

class PanelToolBar : public CartuloWindow
{
protected:
    void ExpectTools(bool add, bool change)
    {
        EXPECT_EQ(add, ToolEnabled(ID_NEW_ENTRY));
        for (int id : {ID_REMOVE_ENTRY, ID_RENAME_ENTRY, ID_EDIT_ENTRY})
            EXPECT_EQ(change, ToolEnabled(id)) << id;
    }
};

static const char LostField[] = "@book{broken, title = {First}}\n@book{two\n";

TEST_F(PanelToolBar, ApplyToAWritableFile)
{
    Open(folder.Write("a.bib", OneEntry));
    ExpectTools(true, true);
}

TEST_F(PanelToolBar, DoNotApplyWithoutFiles)
{
    Open("");
    ExpectTools(false, false);
}

TEST_F(PanelToolBar, DoNotApplyToFilesThatAreReadOnly)
{
    wxTEST_DIALOG(Open(folder.Write("a.bib", LostField)),
                  ExpectMessages("There are errors in loading BIB files"));
    ExpectTools(false, false);
}

TEST_F(PanelToolBar, FollowTheSelectedEntry)
{
    std::string broken = folder.Write("b.bib", LostField);
    wxTEST_DIALOG(Open(folder.Write("a.bib", OneEntry) + " " + broken),
                  ExpectMessages("There are errors in loading BIB files"));
    ASSERT_EQ("broken (b)", Rows().at(0));
    ExpectTools(true, false); // a new entry may go to the other file
    TypeIntoList('o', 1000);
    ASSERT_STREQ("one", Panel()->CurrentEntry()->key);
    ExpectTools(true, true);
}

TEST_F(PanelToolBar, AreLoggedWithTheMode)
{
    Open(folder.Write("a.bib", OneEntry));
    ForgetLog();
    Panel()->Update_Tools();
    EXPECT_EQ((Lines{{"INFO: Cartulo::Update_Tools(): ListMode", TNS_LIFECYCLE}}),
              TakeLog("INFO: Cartulo::Update_Tools"));
}

// --- The sash ---

TEST_F(EditorPanel, PutsTheSashWhereItWas)
{
    Config()->Write("/MainWindow/Splitter", 400);
    Open(folder.Write("a.bib", OneEntry));
    EXPECT_EQ(400, frame->ToDIP(Panel()->GetSashPosition()));
    Panel()->SetSashPosition(frame->FromDIP(350));
    Close();
    EXPECT_EQ(350, Config()->ReadLong("/MainWindow/Splitter", 0));
}

TEST_F(EditorPanel, HasADefaultPlaceForTheSash)
{
    for (int stored : {0, -1}) {
        if (stored == 0)
            Config()->Write("/MainWindow/Splitter", 0);
        else
            Config()->DeleteEntry("/MainWindow/Splitter");
        Open(folder.Write("a.bib", OneEntry));
        EXPECT_EQ(300, frame->ToDIP(Panel()->GetSashPosition()));
        Close();
    }
}

TEST_F(EditorPanel, KeepsTheSashOfARunWithoutFiles)
{
    Config()->Write("/MainWindow/Splitter", 400);
    Open("");
    Close();
    EXPECT_EQ(400, Config()->ReadLong("/MainWindow/Splitter", 0));
}

TEST_F(EditorPanel, PutsTheSashWhereItWasBeforeTheFilesWereClosed)
{
    Open(folder.Write("a.bib", OneEntry));
    Panel()->SetSashPosition(frame->FromDIP(350));
    frame->TakeCommand("");
    frame->TakeCommand(folder.Path("a.bib").c_str());
    EXPECT_EQ(350, frame->ToDIP(Panel()->GetSashPosition()));
}

TEST_F(EditorPanel, LogsWhereTheSashWasMoved)
{
    Open(folder.Write("a.bib", OneEntry));
    ForgetLog();
    wxSplitterEvent event(wxEVT_SPLITTER_SASH_POS_CHANGED, Panel());
    event.SetSashPosition(345);
    Panel()->ProcessWindowEvent(event);
    wxSize left = Panel()->GetWindow1()->GetSize(), right = Panel()->GetWindow2()->GetSize();
    wxString text = wxString::Format("INFO: Cartulo::OnSashMOve sash pos=345, w1=%dx%d, w2=%dx%d",
                                     left.x, left.y, right.x, right.y);
    EXPECT_EQ((Lines{{text.ToStdString(), TNS_ACTION}}), TakeLog("INFO: "));
}

// --- Saving ---

TEST_F(EditorPanel, LogsThatItSavesEvenWithoutChanges)
{
    Open(folder.Write("a.bib", OneEntry));
    ForgetLog();
    EXPECT_EQ(0, Panel()->SaveAll(true));
    EXPECT_EQ((Lines{{"INFO: Cartulo::SaveAll", TNS_ACTION}}), TakeLog("INFO: "));
}

// --- Citing ---

class Cite : public CartuloWindow
{
protected:
    void Insert(const std::string &option)
    {
        Open(folder.Write("a.bib", OneEntry) + option);
        ForgetLog();
        PressShortcut(WXK_RETURN, false, false);
    }

    void SetUp() override
    {
        state.sendCommand = [](const char *service, const char *text) {
            sent.push_back(std::string(service) + ": " + text);
            return answer;
        };
        sent.clear();
        answer = 1;
    }

    Lines Expected() const { return {{"INFO: Cartulo::OnInsertCite", TNS_ACTION}}; }

    static std::vector<std::string> sent;
    static int answer;
};
std::vector<std::string> Cite::sent;
int Cite::answer;

TEST_F(Cite, SendsTheKeyToTheCompanion)
{
    Insert(" -w1/Srv");
    EXPECT_EQ(std::vector<std::string>{"Srv: -s (one) ...InsCite"}, sent);
    EXPECT_EQ("", Status());
}

TEST_F(Cite, DoesNothingWithoutACompanion)
{
    Insert("");
    EXPECT_EQ(Expected(), TakeLog("INFO: Cartulo::OnInsertCite"));
}

TEST_F(Cite, SendsNothingWithoutAWindowOrAService)
{
    for (const char *option : {" -w0/Srv", " -w123", " -wabc/Srv"}) {
        strcpy(state.companionService, "");
        Insert(option);
        EXPECT_TRUE(TakeLog("Cartulo: Pass*").empty()) << option;
        EXPECT_TRUE(sent.empty()) << option;
        Close();
    }
}

TEST_F(Cite, SendsNothingWithoutAnEntry)
{
    Open(folder.Write("new.bib", "") + " -w123/Srv");
    ForgetLog();
    PressShortcut(WXK_RETURN, false, false);
    EXPECT_TRUE(TakeLog("Cartulo: Pass*").empty());
}

TEST_F(Cite, SaysThatTheCompanionDoesNotAnswer)
{
    answer = 0;
    Insert(" -w1/NobodyServesThis");
    EXPECT_EQ((Lines{{"Cartulo: Pass* -s (one) ...InsCite", TNS_TRACE}}),
              TakeLog("Cartulo: Pass*"));
    EXPECT_EQ("ERROR: The editor of the document does not answer.", Status());
}

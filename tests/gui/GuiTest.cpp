// tests/gui/GuiTest.cpp - tests of the windows, inside the running event loop.
#include "tests/gui/GuiTest.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <mutex>

#include <glib.h>
#include <wx/app.h>
#include <wx/choice.h>
#include <wx/fileconf.h>
#include <wx/scrolwin.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/toolbar.h>
#include <wx/uiaction.h>

#include "app/LogGui.h"
#include "base/Companion.h"
#include "encoding/Encoding.h"
#include "ui/Cartulo.h"
#include "ui/Ids.h"
#include "ui/Messages.h"
#include "ui/QListBox.h"

// --- Dialogs ---

static int dialogsAllowed = 0;

AllowDialogs::AllowDialogs()
{
    ++dialogsAllowed;
}

AllowDialogs::~AllowDialogs()
{
    --dialogsAllowed;
}

int GuiTestHook::Enter(wxDialog *dialog)
{
    int answer = wxTestingModalHook::Enter(dialog);
    return answer == wxID_NONE ? wxID_CANCEL : answer;
}

void GuiTestHook::ReportFailure(const wxString &message)
{
    ADD_FAILURE() << message;
}

// Outside of wxTEST_DIALOG.
class NoDialogs : public wxModalDialogHook
{
protected:
    int Enter(wxDialog *dialog) override
    {
        if (dialogsAllowed > 0)
            return wxID_NONE;
        wxMessageDialog *box = dynamic_cast<wxMessageDialog *>(dialog);
        ADD_FAILURE() << "unexpected dialog: " << dialog->GetTitle() << ": "
                      << (box ? box->GetMessage() : wxString());
        return wxID_CANCEL;
    }
};

ExpectBox::ExpectBox(const wxString &caption, const wxString &text, int button, long style)
    : m_caption(caption), m_text(text), m_button(button), m_style(style)
{
}

int ExpectBox::OnInvoked(wxMessageDialog *dialog) const
{
    EXPECT_EQ(m_caption, dialog->GetTitle());
    EXPECT_EQ(m_text, dialog->GetMessage());
    const long looks = wxOK | wxCANCEL | wxYES_NO | wxNO_DEFAULT | wxICON_MASK;
    if (m_style != 0) {
        EXPECT_EQ(m_style, dialog->GetMessageDialogStyle() & looks);
    }
    return m_button;
}

wxString ExpectBox::GetDefaultDescription() const
{
    return "message box \"" + m_caption + "\": " + m_text;
}

ExpectMessages::ExpectMessages(const wxString &heading, wxString *text)
    : m_heading(heading), m_text(text)
{
}

int ExpectMessages::OnInvoked(Cartulo_Messages *dialog) const
{
    EXPECT_EQ("Bibliography File Loading Error Messages", dialog->GetTitle());
    EXPECT_EQ(m_heading, FirstChild<wxStaticText>(dialog)->GetLabelText());
    if (m_text)
        *m_text = FirstChild<wxTextCtrl>(dialog)->GetValue();
    return wxID_OK;
}

wxString ExpectMessages::GetDefaultDescription() const
{
    return "messages window \"" + m_heading + "\"";
}

bool PressOK(wxDialog &dialog)
{
    dialog.Show();
    wxCommandEvent event(wxEVT_BUTTON, wxID_OK);
    event.SetEventObject(dialog.FindWindow(wxID_OK));
    dialog.ProcessWindowEvent(event);
    bool closed = !dialog.IsShown();
    dialog.Hide();
    dialog.SetReturnCode(closed ? wxID_OK : 0);
    return closed;
}

int WhileBoxIsOpen::Enter(wxDialog *dialog)
{
    if (dynamic_cast<Cartulo_Messages *>(dialog))
        return wxID_OK;
    ++boxes;
    m_action();
    return m_answer;
}

// --- What is said on the side ---

enum { REMARKS_MAX = 30 };

// The last warnings of the program and of the toolkit. They help to understand a failure, and would
// hide those of other tests.
static std::deque<std::string> remarks;
static size_t remarkCount = 0;
static std::mutex remarksMutex; // the toolkit has threads of its own

static void Remark(const std::string &text)
{
    std::lock_guard<std::mutex> lock(remarksMutex);
    if (!testing::UnitTest::GetInstance()->current_test_info()) {
        fprintf(stderr, "%s\n", text.c_str());
        return;
    }
    ++remarkCount;
    remarks.push_back(text);
    if (remarks.size() > REMARKS_MAX)
        remarks.pop_front();
}

// In the place of GLib's own, which prints.
static GLogWriterOutput RemarkOfToolkit(GLogLevelFlags level, const GLogField *fields, gsize count,
                                        gpointer data)
{
    if (level & (G_LOG_FLAG_FATAL | G_LOG_LEVEL_ERROR))
        return g_log_writer_default(level, fields, count, data); // the program ends now
    if (level & (G_LOG_LEVEL_CRITICAL | G_LOG_LEVEL_WARNING)) {
        gchar *text = g_log_writer_format_fields(level, fields, count, FALSE);
        Remark(text + strspn(text, "\n"));
        g_free(text);
    }
    return G_LOG_WRITER_HANDLED;
}

// Prints the remarks of a test that has failed.
class PrintRemarks : public testing::EmptyTestEventListener
{
    void OnTestStart(const testing::TestInfo &) override
    {
        std::lock_guard<std::mutex> lock(remarksMutex);
        remarks.clear();
        remarkCount = 0;
    }

    void OnTestEnd(const testing::TestInfo &test) override
    {
        std::lock_guard<std::mutex> lock(remarksMutex);
        if (!test.result()->Failed() || remarks.empty())
            return;
        printf("During this test the program and the toolkit said, last %zu of %zu:\n",
               remarks.size(), remarkCount);
        for (const std::string &text : remarks)
            printf("    %s\n", text.c_str());
        fflush(stdout);
    }
};

static void KeepRemarks()
{
    g_log_set_writer_func(RemarkOfToolkit, nullptr, nullptr);
    testing::UnitTest::GetInstance()->listeners().Append(new PrintRemarks);
}

// --- The log ---

static std::vector<LogLine> logged;

// Takes the place of the program's own.
void TNSMessage(const char *prefix, const char *text, int level)
{
    logged.push_back({std::string(prefix) + text, level});
    if (level >= TNS_WARNING)
        Remark(logged.back().text);
}

void PrintTo(const LogLine &line, std::ostream *out)
{
    *out << line.level << " \"" << line.text << '"';
}

std::vector<LogLine> TakeLog(const std::string &start)
{
    std::vector<LogLine> lines;
    for (const LogLine &line : logged) {
        if (line.text.compare(0, start.size(), start) == 0)
            lines.push_back(line);
    }
    logged.clear();
    return lines;
}

void ForgetLog()
{
    logged.clear();
}

// --- The event loop ---

bool WaitFor(const std::function<bool()> &condition, int milliseconds)
{
    using Clock = std::chrono::steady_clock;
    Clock::time_point end = Clock::now() + std::chrono::milliseconds(milliseconds);
    while (!condition()) {
        if (Clock::now() > end)
            return false;
        wxYield();
        wxMilliSleep(5);
    }
    return true;
}

static bool HasKeys(wxWindow *window)
{
    wxWindow *top = wxGetTopLevelParent(window);
    return dynamic_cast<wxTopLevelWindow *>(top)->IsActive() &&
           (window == top || window->HasFocus());
}

bool WaitForKeys(wxWindow *window)
{
    return WaitFor([window] { return HasKeys(window); });
}

void SendKey(wxWindow *window, int key, int modifiers)
{
    ASSERT_TRUE(WaitForKeys(window)) << "no focus for the key " << key;
    wxUIActionSimulator().Char(key, modifiers);
}

void SendText(wxWindow *window, const char *text)
{
    ASSERT_TRUE(WaitForKeys(window)) << "no focus for the text " << text;
    wxUIActionSimulator().Text(text);
}

void Click(wxWindow *control)
{
    ASSERT_TRUE(WaitForKeys(wxGetTopLevelParent(control)));
    wxSize size = control->GetSize();
    wxUIActionSimulator mouse;
    mouse.MouseMove(control->ClientToScreen(wxPoint(size.x / 2, size.y / 2)));
    ASSERT_TRUE(WaitFor([&] { return wxFindWindowAtPoint(wxGetMousePosition()) == control; }));
    mouse.MouseClick();
}

void HandleQueuedEvents()
{
    wxTheApp->ProcessPendingEvents();
}

// --- The window ---

wxConfigBase *CartuloWindow::Config()
{
    wxConfigBase *config = wxConfigBase::Get(false);
    if (!config) {
        config = new wxFileConfig("Cartulo", "Quarlo", folder.Path("Cartulo.conf"), "",
                                  wxCONFIG_USE_LOCAL_FILE);
        wxConfigBase::Set(config);
    }
    return config;
}

void CartuloWindow::Open(const std::string &commandLine)
{
    Config();
    ForgetLog();
    frame = new MyFrame("Quarlo Cartulo", commandLine.c_str(), &state);
    frame->Show();
    ASSERT_TRUE(WaitForKeys(frame));
}

void CartuloWindow::Close()
{
    frame->Close();
    DeleteClosedWindows();
    ASSERT_FALSE(frame);
}

void CartuloWindow::TearDown()
{
    Enc_Select("CP1252");
    delete wxConfigBase::Set(nullptr);
    if (!frame)
        return;
    for (int i = 0; i < Panel()->Files()->count; ++i)
        Panel()->Files()->files[i]->modified = 0;
    frame->Destroy();
    DeleteClosedWindows();
    EXPECT_FALSE(frame);
}

QListBox *CartuloWindow::List() const
{
    return FirstChild<QListBox>(Panel());
}

wxScrolledWindow *CartuloWindow::EntryPane() const
{
    return FirstChild<wxScrolledWindow>(Panel());
}

wxSearchCtrl *CartuloWindow::Search() const
{
    return FirstChild<wxSearchCtrl>(frame->GetToolBar());
}

std::vector<wxString> CartuloWindow::Rows() const
{
    std::vector<wxString> rows;
    for (size_t i = 0; i < List()->GetItemCount(); ++i)
        rows.push_back(List()->GetItemText(i));
    return rows;
}

std::vector<CartuloWindow::Field> CartuloWindow::ShownFields() const
{
    std::vector<Field> fields;
    wxString label;
    for (wxWindow *child : EntryPane()->GetChildren()) {
        if (wxStaticText *text = dynamic_cast<wxStaticText *>(child))
            label = text->GetLabelText();
        wxTextCtrl *value = dynamic_cast<wxTextCtrl *>(child);
        if (value && value->IsShown() && !value->IsMultiLine())
            fields.push_back({label, value->GetValue()});
    }
    return fields;
}

wxString CartuloWindow::TextAfter(const wxString &label) const
{
    bool found = false;
    for (wxWindow *child : EntryPane()->GetChildren()) {
        wxStaticText *text = dynamic_cast<wxStaticText *>(child);
        if (text && found)
            return text->GetLabelText();
        if (wxChoice *choice = found ? dynamic_cast<wxChoice *>(child) : nullptr)
            return choice->GetStringSelection();
        found = text && text->GetLabelText() == label;
    }
    ADD_FAILURE() << "no text " << label;
    return "";
}

wxString CartuloWindow::Status() const
{
    return frame->GetStatusBar()->GetStatusText(0);
}

bool CartuloWindow::ToolEnabled(int id) const
{
    return frame->GetToolBar()->GetToolEnabled(id);
}

bool CartuloWindow::SaveEnabled() const
{
    return ToolEnabled(ID_SAVE);
}

bool CartuloWindow::IsShowing(wxWindowID id) const
{
    wxWindow *window = Panel()->FindWindow(id);
    return window && window->IsShownOnScreen();
}

void CartuloWindow::SearchFor(const wxString &text)
{
    Search()->SetValue(text);
    HandleQueuedEvents();
}

void CartuloWindow::TypeIntoList(wxChar key, long time, int modifiers)
{
    wxKeyEvent event(wxEVT_CHAR);
    event.m_keyCode = key;
    event.m_uniChar = key;
    event.SetAltDown((modifiers & wxMOD_ALT) != 0);
    event.SetShiftDown((modifiers & wxMOD_SHIFT) != 0);
    event.SetTimestamp(time);
    List()->ProcessWindowEvent(event);
}

void CartuloWindow::PressShortcut(int key, bool alt, bool ctrl, int typed, unsigned hardware)
{
    wxKeyEvent event(wxEVT_CHAR_HOOK);
    event.m_keyCode = key;
    event.m_uniChar = typed ? typed : key;
    event.m_rawFlags = hardware;
    event.SetAltDown(alt);
    event.SetControlDown(ctrl);
    List()->ProcessWindowEvent(event);
    HandleQueuedEvents();
}

void CartuloWindow::Press(wxWindowID button)
{
    wxWindow *window = Panel()->FindWindow(button);
    ASSERT_TRUE(window) << "no button " << button;
    wxCommandEvent event(wxEVT_BUTTON, button);
    event.SetEventObject(window);
    window->ProcessWindowEvent(event);
    HandleQueuedEvents();
}

void CartuloWindow::Change(int file, const char *value)
{
    BibField *field = &Panel()->Files()->files[file]->entries->fields[0];
    free(field->value);
    field->value = Bib_CopyText(value, strlen(value));
    Panel()->SetModified(file);
}

void CartuloWindow::Run(int command)
{
    wxCommandEvent event(wxEVT_MENU, command);
    Panel()->ProcessWindowEvent(event);
}

// --- The program ---

class GuiTestApp : public wxApp
{
public:
    bool OnInit() override
    {
        SetExitOnFrameDelete(false);
        wxInitAllImageHandlers();
        CallAfter([this] {
            NoDialogs guard;
            guard.Register();
            m_result = RUN_ALL_TESTS();
            ExitMainLoop();
        });
        return true;
    }

    int OnRun() override
    {
        wxApp::OnRun();
        return m_result;
    }

    using wxApp::DeletePendingObjects;

protected:
    wxAppTraits *CreateTraits() override { return new MyAppTraits; }

private:
    int m_result = 1;
};

wxIMPLEMENT_APP_NO_MAIN(GuiTestApp);
wxDECLARE_APP(GuiTestApp);

void DeleteClosedWindows()
{
    wxGetApp().DeletePendingObjects();
}

int main(int argc, char **argv)
{
    testing::InitGoogleTest(&argc, argv);
    if (testing::GTEST_FLAG(list_tests))
        return RUN_ALL_TESTS();
    KeepRemarks();
    Log_SetUpToolkit();
    return wxEntry(argc, argv);
}

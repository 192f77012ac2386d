// tests/gui/GuiTest.h - tests of the windows, inside the running event loop.
//
// Every dialog that a test opens is answered by what it expects in wxTEST_DIALOG; any other one
// fails the test and is cancelled, so that none can wait for a user.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <ostream>
#include <string>
#include <typeinfo>
#include <vector>

#include <wx/config.h>
#include <wx/msgdlg.h>
#include <wx/weakref.h>

#include "app/MyFrame.h"
#include "tests/support/KeepEnvironment.h"
#include "tests/support/TempFolder.h"
#include "ui/Messages.h"

// Reports through GoogleTest.
class GuiTestHook;
#define wxTEST_DIALOG_HOOK_CLASS GuiTestHook
#include <wx/testing.h>

class GuiTestHook : public wxTestingModalHook
{
public:
    using wxTestingModalHook::wxTestingModalHook;

protected:
    int Enter(wxDialog *dialog) override;
    void ReportFailure(const wxString &message) override;
};

// A message box with this caption and text; `button` closes it. `style`, unless it is 0, tells its
// buttons and icon.
class ExpectBox : public wxExpectModalBase<wxMessageDialog, ExpectBox>
{
public:
    ExpectBox(const wxString &caption, const wxString &text, int button, long style = 0);

protected:
    int OnInvoked(wxMessageDialog *dialog) const override;
    wxString GetDefaultDescription() const override;

private:
    wxString m_caption, m_text;
    int m_button;
    long m_style;
};

// The loading-messages window with this heading; `text` (may be null) receives its text.
class ExpectMessages : public wxExpectModalBase<Cartulo_Messages, ExpectMessages>
{
public:
    explicit ExpectMessages(const wxString &heading, wxString *text = nullptr);

protected:
    int OnInvoked(Cartulo_Messages *dialog) const override;
    wxString GetDefaultDescription() const override;

private:
    wxString m_heading;
    wxString *m_text;
};

// A window of the program: `steps` use it instead of a user, and `result` is what it returns then,
// or 0 for what the last PressOK in it came to.
template <class Dialog> class UseDialog : public wxExpectModalBase<Dialog, UseDialog<Dialog>>
{
public:
    explicit UseDialog(std::function<void(Dialog &)> steps, int result = 0)
        : m_steps(steps), m_result(result)
    {
    }

protected:
    int OnInvoked(Dialog *dialog) const override
    {
        m_steps(*dialog);
        int result = m_result ? m_result : dialog->GetReturnCode();
        return result ? result : int(wxID_CANCEL);
    }

    wxString GetDefaultDescription() const override { return typeid(Dialog).name(); }

private:
    std::function<void(Dialog &)> m_steps;
    int m_result;
};

// In a dialog that is not modal; true when that closes it.
bool PressOK(wxDialog &dialog);

// Does something while a message box is open, and answers it. Closes the messages window.
class WhileBoxIsOpen : public wxModalDialogHook
{
public:
    WhileBoxIsOpen(const std::function<void()> &action, int answer)
        : m_action(action), m_answer(answer)
    {
        Register();
    }

    int boxes = 0;

protected:
    int Enter(wxDialog *dialog) override;
    void Exit(wxDialog *) override {}

private:
    std::function<void()> m_action;
    int m_answer;
};

// While one lives, dialogs of the program are really shown.
class AllowDialogs
{
public:
    AllowDialogs();
    ~AllowDialogs();
};

// Lets the program run until the condition holds; false when it does not within the deadline, which
// leaves a busy machine all the time that it may need.
bool WaitFor(const std::function<bool()> &condition, int milliseconds = 30000);

// --- Real keys and clicks, as the user's ---
//
// The system hands them to whichever window has the keyboard at that moment, and a window that has
// just opened, or has just come back from under a dialog, has it a little later. So everything here
// names its window and waits first.

// Waits until keys reach this window: a frame or dialog that is active, or a control that has the
// focus in an active one.
bool WaitForKeys(wxWindow *window);

void SendKey(wxWindow *window, int key, int modifiers = 0);
void SendText(wxWindow *window, const char *text);
void Click(wxWindow *control); // in its middle

// One message of the program, as it would be written.
struct LogLine {
    std::string text;
    int level;

    bool operator==(const LogLine &o) const { return text == o.text && level == o.level; }
};
void PrintTo(const LogLine &line, std::ostream *out);

// The messages since the last call or the last ForgetLog that begin with `start`.
std::vector<LogLine> TakeLog(const std::string &start);
void ForgetLog();

void HandleQueuedEvents();
void DeleteClosedWindows(); // as the event loop does when it is idle

// The first child of this kind; null for none.
template <class Control> Control *FirstChild(const wxWindow *window)
{
    for (wxWindow *child : window->GetChildren())
        if (Control *control = dynamic_cast<Control *>(child))
            return control;
    return nullptr;
}

// A window on files of a temporary folder.
class CartuloWindow : public testing::Test
{
protected:
    struct Field {
        wxString label, value;
        bool operator==(const Field &o) const { return label == o.label && value == o.value; }
    };

    void TearDown() override; // changes that are left are dropped

    // Opens the window with a command line, and waits until it is active. The configuration is a
    // file of the test's folder.
    void Open(const std::string &commandLine);
    void Close(); // as the user does, with the window deleted
    wxConfigBase *Config();

    Cartulo *Panel() const { return frame->Panel(); }
    class QListBox *List() const;
    class wxSearchCtrl *Search() const;
    wxScrolledWindow *EntryPane() const;
    std::vector<wxString> Rows() const;              // texts of the list
    std::vector<Field> ShownFields() const;          // rows of the entry pane
    wxString TextAfter(const wxString &label) const; // the static text that follows another one
    wxString Status() const;
    bool SaveEnabled() const;
    bool ToolEnabled(int id) const;
    bool IsShowing(wxWindowID id) const;

    void SearchFor(const wxString &text);
    void TypeIntoList(wxChar key, long time, int modifiers = 0);
    // A key as the frame sees it first. `typed` is the character that it types, where that is not
    // `key`; `hardware` is the number of the key on the keyboard.
    void PressShortcut(int key, bool alt, bool ctrl, int typed = 0, unsigned hardware = 0);
    void Press(wxWindowID button);
    void Run(int command); // at once, as keys do

    // Changes the first field of the first file's first entry.
    void Change(int file, const char *value);

    KeepEnvironment environment;
    TempFolder folder;
    CommandState state = {};
    wxWeakRef<MyFrame> frame;
};

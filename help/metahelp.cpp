// help/metahelp.cpp - the help program: shows the user's manual.

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <wx/app.h>
#include <wx/image.h>
#include <wx/msgdlg.h>

#include "base/Companion.h"
#include "base/Sys.h"
#include "base/Usage.h"
#include "help/HelpFrame.h"
#include "help/HelpPage.h"
#include "ui/Native.h"

static const char Usage[] = "Usage: metahelp [TOPIC]\n"
                            "\n"
                            "Shows the user's manual of Cartulo, which is the topic .QRL.Cartulo.\n"
                            "\n"
                            "  --help       show this text\n"
                            "  --version    show the version\n";

static const char NoManual[] = "The manual of Cartulo (manual.html) is not where it should be: in "
                               "the folder of this program, or in share/doc/cartulo.";

namespace
{

class HelpApp : public wxApp
{
public:
    HelpApp(const std::string &manual, const char *topic) : m_manual(manual), m_topic(topic) {}

    bool OnInit() override;
    int OnRun() override { return GetTopWindow() ? wxApp::OnRun() : 0; } // no second window

private:
    std::string m_manual; // "" when there is none
    const char *m_topic;
};

} // namespace

// Under which the window of this screen is found again.
static std::string WindowName()
{
    const char *screen = getenv("DISPLAY");
    return std::string("metahelp-") + (screen ? screen : "");
}

bool HelpApp::OnInit()
{
    if (m_manual.empty()) {
        wxMessageBox(NoManual, "Cartulo", wxOK | wxICON_ERROR);
        return false;
    }
    std::string name = WindowName();
    long running = FindFrame(name.c_str());
    if (running != 0) {
        Native_BringForward(running);
        return true;
    }
    wxInitAllImageHandlers();
    HelpFrame *frame = new HelpFrame(m_manual, Help_Notice(m_topic));
    RegisterFrame(name.c_str(), Native_WindowHandle(frame));
    frame->wxFrame::Show();
    return true;
}

// "" when it is missing or cannot be read.
static std::string ReadManual()
{
    std::string path = Help_FindManual(Sys_ModulePath());
    FILE *stream = path.empty() ? nullptr : Sys_OpenRegular(path.c_str());
    if (!stream)
        return std::string();
    size_t length = 0;
    char *text = Sys_ReadAll(stream, &length);
    fclose(stream);
    std::string manual(text ? text : "", text ? length : 0);
    free(text);
    return manual;
}

int main(int argc, char **argv)
{
    int answered = Usage_Answer(argc, argv, Usage, "metahelp " CARTULO_VERSION "\n");
    if (answered >= 0)
        return answered;
    std::string manual = ReadManual();
    if (manual.empty())
        fprintf(stderr, "metahelp: %s\n", NoManual);
    wxApp::SetInstance(new HelpApp(manual, argc > 1 ? argv[1] : ""));
    int status = wxEntry(argc, argv);
    return manual.empty() ? 1 : status;
}

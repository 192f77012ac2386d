// app/MyApp.cpp - the application object: start-up order and exit.

#include "app/MyApp.h"

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include <wx/config.h>
#include <wx/filename.h>
#include <wx/image.h>
#include <wx/msgdlg.h>
#include <wx/stdpaths.h>
#include <wx/utils.h>

#include "app/Ipc.h"
#include "app/IpcServer.h"
#include "app/LogGui.h"
#include "base/Companion.h"
#include "base/Log.h"
#include "base/Sys.h"
#include "base/Usage.h"
#include "encoding/Encoding.h"
#include "ui/Native.h"

wxBEGIN_EVENT_TABLE(MyApp, wxApp)
    EVT_ACTIVATE_APP(MyApp::OnActivateApp)
wxEND_EVENT_TABLE()

enum { HAND_OVER_TIME = 10000, HAND_OVER_PAUSE = 100 }; // milliseconds

static const char Usage[] =
    "Usage: cartulo [options] [BIB files]\n"
    "\n"
    "Shows the entries of all named BibTeX databases in one searchable list.\n"
    "The extension .bib may be left out. A second start with the same -dFOLDER/ hands its files\n"
    "over to the first one.\n"
    "\n"
    "  -dFOLDER/    folder, with its slash and from / on, that relative file names start from; as\n"
    "               the first option, it makes the start one that is handed over\n"
    "  -eNAME       code page of the files, like -eCP1251; CP65001 is UTF-8, and CP1252 for files\n"
    "               that are not; without it, what cartulo.ini names\n"
    "  -i           forget the files named so far\n"
    "  -wWINDOW/SERVICE\n"
    "               window and service of the editor that \\cite commands go to\n"
    "  --help       show this text\n"
    "  --version    show the version\n"
    "\n"
    "CARTULO_LOG=LEVEL[:FILE] in the environment shows what the program does: from LEVEL 1\n"
    "(everything) to 5 (errors only), by default 4, on standard error or at the end of FILE.\n";

MyApp::MyApp(int argc, char **argv) : m_argumentCount(argc), m_arguments(argv) {}

wxAppTraits *MyApp::CreateTraits()
{
    return new MyAppTraits;
}

// Without the parser's messages a broken file would look clean and be overwritten.
bool MyApp::CheckParser()
{
    if (Bib_SelfTest())
        return true;
    const char *text = "The messages of the BibTeX parser do not reach this program, so it could "
                       "damage BIB files.\nCartulo was built or installed wrongly and ends now.";
    fprintf(stderr, "cartulo: %s\n", text);
    wxMessageBox(text, "Cartulo", wxOK | wxICON_ERROR);
    return false;
}

// The arguments as a command line; null, shown to the user, when it is too long.
const char *MyApp::BuildLine()
{
    std::vector<std::string> quoted;
    for (int i = 0; i < m_argumentCount; ++i)
        quoted.push_back(Command_QuoteArgument(m_arguments[i]));
    std::vector<const char *> arguments;
    for (const std::string &argument : quoted)
        arguments.push_back(argument.c_str());
    const char *line = BuildCommandLine(int(arguments.size()), arguments.data());
    if (!line)
        wxMessageBox("The command line is too long. Name fewer BIB files.", "Cartulo",
                     wxOK | wxICON_WARNING);
    return line;
}

// False when another process serves the same folder. The lock ends with the process, however that
// ends, so nothing is left to be cleaned up. Where it can't be made, the program runs alone.
bool MyApp::TakeInstance(const std::string &name)
{
    SysReason why = {};
    char *path = Sys_PrivatePath(name.c_str(), ".lock", &why);
    m_instanceLock = path ? Sys_LockFile(path, &why) : 0;
    free(path);
    if (m_instanceLock == 0 && !why.isTaken)
        AppLog("ERROR: No instance lock: ", why.text);
    return m_instanceLock != 0 || !why.isTaken;
}

bool MyApp::IsFirst()
{
    std::string name = "Quarlo-" + m_start.instance + "-" + Sys_LoginName();
    TNSMessage("INFO: Cartulo::Single ", name.c_str(), TNS_LIFECYCLE);
    return TakeInstance(name) || !HandOver(name);
}

// To the first instance, which may still be loading its files. False when that one has ended
// instead, so that this is now the first.
bool MyApp::HandOver(const std::string &name)
{
    const char *commandLine = BuildLine(); // the whole line again, as the log shows
    int32_t end = Sys_Milliseconds() + HAND_OVER_TIME;
    long window = FindFrame(m_start.instance.c_str());
    if (window != 0)
        Native_BringForward(window);
    for (;;) {
        handedOver = SendCommand(m_service.c_str(), commandLine);
        if (handedOver)
            return true;
        if (TakeInstance(name))
            return false;
        if (Sys_TimeLeft(end) == 0)
            break;
        wxMilliSleep(HAND_OVER_PAUSE);
    }
    fprintf(stderr,
            "cartulo: the running Cartulo does not answer; these files were not opened: %s\n",
            commandLine);
    return true;
}

void MyApp::OpenConfig()
{
    wxStandardPaths &paths = wxStandardPaths::Get();
    paths.SetFileLayout(wxStandardPaths::FileLayout_XDG);
    wxFileName::Mkdir(paths.GetUserConfigDir(), 0700, wxPATH_MKDIR_FULL);
    wxConfigBase::Get();
}

static char *FindBib(const char *name)
{
    return TNSearch("bib", name);
}

static int HandToService(const char *service, const char *text)
{
    return SendCommand(service, text);
}

static void LogControl(const char *word)
{
    const char *answer = TNSFind(word);
    AppLog("TNS Control: ", answer ? answer : "");
}

bool MyApp::OnInit()
{
    AppLog("Cartulo::OnInit --- ", "Start");
    LogControl("!NoMake");
    LogControl("!AutoDownload=OFF");
    Enc_Select("CP1252");
    AppLog("Cartulo::OnInit --- ", "Command_Line");
    const char *commandLine = BuildLine();
    if (!commandLine || !CheckParser())
        return false;
    m_start = Command_StartUp(commandLine);
    m_service = "/tmp/Quarlo-DDE-" + m_start.instance;
    if (!m_start.baseFolder.empty() && !IsFirst())
        return false;
    wxInitAllImageHandlers();
    AppLog("Cartulo::OnInit --- ", "Names");
    SetVendorName("Quarlo");
    SetAppName("Cartulo");
    AppLog("Cartulo::OnInit --- ", "pConfig");
    OpenConfig();
    AppLog("Cartulo::OnInit --- ", "Frame ...");
    strcpy(m_state.baseFolder, m_start.baseFolder.c_str());
    m_state.findBib = FindBib;
    m_state.sendCommand = HandToService;
    m_frame = new MyFrame("Quarlo Cartulo", m_start.commandLine, &m_state);
    Publish(Native_WindowHandle(m_frame));
    m_frame->Show();
    return true;
}

// Other processes find the window by the instance's name, and those that this one starts by the
// environment variable.
void MyApp::Publish(long window)
{
    RegisterFrame(m_start.instance.c_str(), window);
    wxSetEnv("QUARLOSTERWINDOW", wxString::Format("%ld", window));
    m_server = StartCommandServer(m_service.c_str(), m_frame);
}

int MyApp::OnExit()
{
    TNSMessage("INFO: MyApp:OnExit ", "Begin", TNS_LIFECYCLE);
    delete wxConfigBase::Set(nullptr); // writes it
    Sys_UnlockFile(m_instanceLock);
    delete m_server;
    TNSMessage("INFO: MyApp:OnExit ", "End", TNS_LIFECYCLE);
    return wxApp::OnExit();
}

void MyApp::OnActivateApp(wxActivateEvent &event)
{
    bool autoSave = !m_frame || m_frame->AutoSave();
    TNSMessage(autoSave ? "INFO: Cartulo is now+ " : "INFO: Cartulo is now- ",
               // Misspelt, stands so.
               event.GetActive() ? "Activated" : "Disactivated", TNS_LIFECYCLE);
    if (m_frame)
        m_frame->OnActivation(event.GetActive());
    event.Skip();
}

int main(int argc, char **argv)
{
    int answered = Usage_Answer(argc, argv, Usage, "cartulo " CARTULO_VERSION "\n");
    if (answered >= 0)
        return answered;
    Sys_FillStandard();
    Sys_SurviveFailedWrites();
    if (!wxGetEnv("GDK_BACKEND", nullptr))
        wxSetEnv("GDK_BACKEND", "x11,*"); // other programs can name and raise our window there
    Log_SetUpToolkit();
    wxApp::SetInstance(new MyApp(argc, argv));
    int status = wxEntry(argc, argv);
    return MyApp::HasHandedOver() ? 0
                                  : status; // the toolkit calls a start without window a failure
}

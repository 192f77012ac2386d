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

#include "app/Companion.h"
#include "app/Log.h"
#include "app/LogGui.h"
#include "app/Native.h"
#include "encoding/Encoding.h"
#include "store/Ascii.h"
#include "store/Sys.h"

wxBEGIN_EVENT_TABLE(MyApp, wxApp)
    EVT_ACTIVATE_APP(MyApp::OnActivateApp)
wxEND_EVENT_TABLE()

static const char Usage[] =
    "Usage: cartulo [options] [BIB files]\n"
    "\n"
    "Shows the entries of all named BibTeX databases in one searchable list.\n"
    "The extension .bib may be left out.\n"
    "\n"
    "  -dFOLDER/    folder that relative file names start from (first, with the slash)\n"
    "  -eNAME       code page of the files, like -eCP1251; without it CP1252\n"
    "  -i           forget the files named so far\n"
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

// The command line for the frame; null, shown to the user, when it is too long. A first argument
// "-dFOLDER" sets the base folder and is taken off.
const char *MyApp::TakeCommandLine()
{
    std::vector<std::string> quoted;
    for (int i = 0; i < m_argumentCount; ++i)
        quoted.push_back(Command_QuoteArgument(m_arguments[i]));
    std::vector<const char *> arguments;
    for (const std::string &argument : quoted)
        arguments.push_back(argument.c_str());
    const char *line = BuildCommandLine(int(arguments.size()), arguments.data());
    if (!line) {
        wxMessageBox("The command line is too long. Name fewer BIB files.", "Cartulo",
                     wxOK | wxICON_WARNING);
        return nullptr;
    }
    char first[TOKEN_SIZE];
    const char *rest = NextToken(line, first, sizeof first);
    if (!rest || Ascii_CompareN(first, "-d", 2) != 0)
        return line;
    if (strlen(first + 2) >= sizeof m_state.baseFolder)
        return line; // the panel says that it is too long
    strcpy(m_state.baseFolder, first + 2);
    return rest;
}

void MyApp::OpenConfig()
{
    wxStandardPaths &paths = wxStandardPaths::Get();
    paths.SetFileLayout(wxStandardPaths::FileLayout_XDG);
    wxFileName::Mkdir(paths.GetUserConfigDir(), 0700, wxPATH_MKDIR_FULL);
    wxConfigBase::Get();
}

bool MyApp::OnInit()
{
    AppLog("Cartulo::OnInit --- ", "Start");
    Enc_Select("CP1252");
    AppLog("Cartulo::OnInit --- ", "Command_Line");
    const char *commandLine = TakeCommandLine();
    if (!commandLine || !CheckParser())
        return false;
    wxInitAllImageHandlers();
    AppLog("Cartulo::OnInit --- ", "Names");
    SetVendorName("Quarlo");
    SetAppName("Cartulo");
    AppLog("Cartulo::OnInit --- ", "pConfig");
    OpenConfig();
    AppLog("Cartulo::OnInit --- ", "Frame ...");
    m_frame = new MyFrame("Quarlo Cartulo", commandLine, &m_state);
    // Programs that this one starts find its window so.
    wxSetEnv("QUARLOSTERWINDOW", wxString::Format("%ld", Native_WindowHandle(m_frame)));
    m_frame->Show();
    return true;
}

int MyApp::OnExit()
{
    TNSMessage("INFO: MyApp:OnExit ", "Begin", TNS_LIFECYCLE);
    delete wxConfigBase::Set(nullptr); // writes it
    TNSMessage("INFO: MyApp:OnExit ", "End", TNS_LIFECYCLE);
    return wxApp::OnExit();
}

void MyApp::OnActivateApp(wxActivateEvent &event)
{
    TNSMessage("INFO: Cartulo is now+ ", event.GetActive() ? "Activated" : "Disactivated",
               TNS_LIFECYCLE);
    if (!event.GetActive() && m_frame)
        m_frame->OnDeactivation();
    event.Skip();
}

// Answers that need no display. 1 when that was all.
static int AnswerWithoutDisplay(int argc, char **argv)
{
    for (int i = 1; i < argc; ++i) {
        if (strcmp(argv[i], "--help") == 0)
            return fputs(Usage, stdout), 1;
        if (strcmp(argv[i], "--version") == 0)
            return puts("cartulo " CARTULO_VERSION), 1;
    }
    return 0;
}

int main(int argc, char **argv)
{
    if (AnswerWithoutDisplay(argc, argv))
        return fflush(stdout) == 0 ? 0 : 1;
    Sys_SurviveFailedWrites();
    if (!wxGetEnv("GDK_BACKEND", nullptr))
        wxSetEnv("GDK_BACKEND", "x11,*"); // other programs can name and raise our window there
    Log_SetUpToolkit();
    wxApp::SetInstance(new MyApp(argc, argv));
    return wxEntry(argc, argv);
}

// bench/window_bench.cpp - what the windows cost, and whether they can be kept from working. Needs
// a display:
//
//   scripts/with-display.sh cartulo_window_bench [starts] [seconds [attack]]   default 15, 5, all
//
// First the time from the start of the program, with a file of 1,000 entries, to its first paint,
// against a frame of the toolkit without contents; as a ratio of the medians. Then how long the
// event loop of a window leaves the user waiting while clients of the command channel are up to
// no good, for some seconds each.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <string>
#include <vector>

#include <sys/wait.h>
#include <unistd.h>

#include <wx/app.h>
#include <wx/evtloop.h>
#include <wx/fileconf.h>
#include <wx/image.h>
#include <wx/timer.h>

#include "app/Ipc.h"
#include "app/IpcServer.h"
#include "app/LogGui.h"
#include "app/MyFrame.h"
#include "base/Sys.h"
#include "bench/Attacks.h"
#include "bench/Library.h"
#include "bench/Ratios.h"
#include "bench/StartUp.h"
#include "encoding/Encoding.h"
#include "store/BibStore.h"
#include "ui/Cartulo.h"

namespace
{

enum { ENTRIES = 1000 };

std::string Folder;
std::string Library;
int Starts = 15;
double Seconds = 5;
std::string Only; // part of the name of the attacks that are tried

// --- Start-up ---

const char Program[] = "cartulo to its first paint";
const char Reference[] = "an empty frame to its first paint";

void StartProgram(benchmark::State &state, const std::vector<std::string> &command)
{
    for (auto step : state) {
        double milliseconds = TimeToFirstPaint(command, Folder + "/start");
        if (milliseconds == 0)
            state.SkipWithError("the program did not paint");
        state.SetIterationTime(milliseconds / 1000);
    }
}

void RegisterStart(const char *name, const std::vector<std::string> &command)
{
    auto function = [command](benchmark::State &state) { StartProgram(state, command); };
    benchmark::RegisterBenchmark(name, function)
        ->Unit(benchmark::kMillisecond)
        ->UseManualTime()
        ->Iterations(1);
}

// Both in turns, so that a machine that is busy for a while treats them alike. The first start of
// each only fills the caches.
bool MeasureStarts()
{
    std::vector<std::string> program = {CARTULO_PROGRAM, Library}, reference = {EMPTY_FRAME};
    TimeToFirstPaint(reference, Folder + "/start");
    TimeToFirstPaint(program, Folder + "/start");
    for (int i = 0; i < Starts; ++i) {
        RegisterStart(Reference, reference);
        RegisterStart(Program, program);
    }
    Ratios ratios;
    benchmark::RunSpecifiedBenchmarks(&ratios);
    ratios.Print();
    printf("\n");
    ratios.PrintRatio("start of cartulo with 1,000 entries / of an empty frame", Program,
                      Reference);
    printf("\n");
    fflush(stdout);
    return ratios.Count(Program) == size_t(Starts) && ratios.Count(Reference) == size_t(Starts);
}

// --- The event loop ---

double Milliseconds(clockid_t clock)
{
    struct timespec time;
    clock_gettime(clock, &time);
    return double(time.tv_sec) * 1e3 + double(time.tv_nsec) / 1e6;
}

// Takes the times between two steps.
class Pace
{
public:
    explicit Pace(clockid_t clock) : m_clock(clock) {}

    void Start(const std::string &name)
    {
        m_name = name;
        m_last = Milliseconds(m_clock);
    }

    void Step()
    {
        double now = Milliseconds(m_clock);
        m_times.Add(m_name, now - m_last);
        m_last = now;
    }

    void Print(const char *heading) const
    {
        printf("%s\n", heading);
        m_times.Print();
        printf("\n");
    }

    double Longest() const
    {
        double longest = 0;
        for (const Attack &attack : Attacks)
            longest = std::max(longest, m_times.Maximum(attack.name));
        return longest;
    }

private:
    clockid_t m_clock;
    Ratios m_times;
    std::string m_name;
    double m_last = 0;
};

// What the user has to wait for.
struct Paces {
    Pace turns{CLOCK_MONOTONIC};
    Pace work{CLOCK_THREAD_CPUTIME_ID}; // in a turn; the rest is waiting, or other processes
    Pace drawings{CLOCK_MONOTONIC};
};

// Lets a window draw without pause, and watches the turns of the event loop. A turn ends when the
// loop is idle: all input, timers and drawing that were due had their part in it.
class LoopWatch : public wxTimer
{
public:
    LoopWatch(wxWindow *window, Paces *paces, const std::string &name)
        : m_window(window), m_paces(paces)
    {
        for (Pace *pace : {&paces->turns, &paces->work, &paces->drawings})
            pace->Start(name);
        wxTheApp->Bind(wxEVT_IDLE, &LoopWatch::OnIdle, this);
        m_window->Bind(wxEVT_PAINT, &LoopWatch::OnPaint, this);
        Start(1);
    }
    ~LoopWatch() override
    {
        wxTheApp->Unbind(wxEVT_IDLE, &LoopWatch::OnIdle, this);
        m_window->Unbind(wxEVT_PAINT, &LoopWatch::OnPaint, this);
    }

private:
    void Notify() override { wxWakeUpIdle(); }

    void OnIdle(wxIdleEvent &event)
    {
        m_paces->turns.Step();
        m_paces->work.Step();
        m_window->Refresh();
        event.Skip();
    }

    void OnPaint(wxPaintEvent &event)
    {
        m_paces->drawings.Step();
        event.Skip();
    }

    wxWindow *m_window;
    Paces *m_paces;
};

// Ends the event loop when it is time.
class Deadline : public wxTimer
{
public:
    Deadline(wxEventLoopBase *loop, double seconds) : m_loop(loop)
    {
        StartOnce(int(seconds * 1000));
    }

private:
    void Notify() override { m_loop->Exit(); }

    wxEventLoopBase *m_loop;
};

void RunLoop(double seconds)
{
    wxEventLoop loop;
    Deadline deadline(&loop, seconds);
    loop.Run();
}

class WindowUnderAttack : public wxApp
{
public:
    bool OnInit() override;
    int OnRun() override;
    int OnExit() override;

private:
    void Measure(const Attack &attack);
    void PrintPaces() const;
    bool ServesStill();

    MyFrame *m_frame = nullptr; // the toolkit destroys it
    MyServer *m_server = nullptr;
    CommandState m_state = {};
    Victim m_victim;
    Paces m_paces;
    bool m_failed = false;
};

bool WindowUnderAttack::OnInit()
{
    wxInitAllImageHandlers();
    Enc_Select("CP1252");
    wxConfigBase::Set(new wxFileConfig("Cartulo", "Quarlo", Folder + "/Cartulo.conf"));
    m_frame = new MyFrame("Quarlo Cartulo", Library.c_str(), &m_state);
    m_frame->Show();
    std::string service = Folder + "/service";
    m_server = StartCommandServer(service.c_str(), m_frame);
    m_victim = {service, Ipc_SocketPath(service.c_str()), Library};
    return m_server != nullptr;
}

int WindowUnderAttack::OnRun()
{
    RunLoop(1); // the window comes up
    for (const Attack &attack : Attacks)
        if (std::string(attack.name).find(Only) != std::string::npos)
            Measure(attack);
    PrintPaces();
    m_frame->Close(true);
    return m_failed ? 1 : 0;
}

void WindowUnderAttack::PrintPaces() const
{
    printf("The window while clients of the command channel send ...\n\n");
    m_paces.turns.Print("Time between two turns of the event loop");
    m_paces.work.Print("What the program itself had to do in it");
    m_paces.drawings.Print("Time between two drawings of the panel");
    const char format[] = "%-60s %6.1f\n";
    printf(format, "longest time between two turns (ms), goal 100", m_paces.turns.Longest());
    printf(format, "most that the program had to do in one (ms)", m_paces.work.Longest());
}

// What they leave behind has to be dealt with, too.
void WindowUnderAttack::Measure(const Attack &attack)
{
    LoopWatch watch(m_frame->Panel(), &m_paces, attack.name);
    std::vector<pid_t> processes = Attacks_Start(attack, m_victim);
    RunLoop(Seconds);
    Attacks_Stop(processes);
    if (!ServesStill()) {
        fprintf(stderr, "The server does not answer any more after: %s\n", attack.name);
        m_failed = true;
    }
    Attacks_Await(processes);
}

// Whether somebody else is served now.
bool WindowUnderAttack::ServesStill()
{
    int status = -1;
    pid_t process = Attacks_StartHonestClient(m_victim);
    while (waitpid(process, &status, WNOHANG) == 0)
        RunLoop(0.05);
    return status == 0;
}

int WindowUnderAttack::OnExit()
{
    delete m_server;
    delete wxConfigBase::Set(nullptr);
    return wxApp::OnExit();
}

bool Prepare()
{
    char name[] = "/tmp/cartulo-bench-XXXXXX";
    if (!mkdtemp(name))
        return false;
    Folder = name;
    Library = Folder + "/library.bib";
    setenv("XDG_RUNTIME_DIR", name, 1);
    setenv("CARTULO_LOG", ("4:" + Folder + "/log").c_str(), 1);
    return Library_Write(Library, ENTRIES) > 0;
}

} // namespace

int main(int argc, char **argv)
{
    if (argc > 1)
        Starts = atoi(argv[1]);
    if (argc > 2)
        Seconds = atof(argv[2]);
    if (argc > 3)
        Only = argv[3];
    if (!Prepare())
        return 1;
    int count = 1;
    benchmark::Initialize(&count, argv);
    bool started = Starts == 0 || MeasureStarts();

    Sys_SurviveFailedWrites();
    Log_SetUpToolkit();
    wxApp::SetInstance(new WindowUnderAttack);
    int status = wxEntry(count, argv);
    std::filesystem::remove_all(Folder);
    return started ? status : 1;
}

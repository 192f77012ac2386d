// base/SysChild-posix.cpp - child processes that work for this one, for POSIX systems.

#include "base/Sys-posix.h"
#include "base/Sys.h"

#include <cerrno>
#include <clocale>
#include <csignal>
#include <cstdio>
#include <cstdlib>

#include <dlfcn.h>
#include <fcntl.h>
#include <locale.h>
#include <poll.h>
#include <stdio_ext.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

// The child's side; unused in the parent.
static int ToParent = -1;
static void (*CrashHandler)() = nullptr;
static volatile sig_atomic_t Writing = 0;
static volatile sig_atomic_t TimeIsUp = 0;

static const int CrashSignals[] = {SIGABRT, SIGBUS, SIGFPE, SIGILL, SIGSEGV, SIGSYS, SIGXCPU};

// The hard limit, at which the system ends the child without a word, leaves time for the handler.
static void LimitResources(int cpuSeconds)
{
    struct rlimit cpu = {static_cast<rlim_t>(cpuSeconds), static_cast<rlim_t>(cpuSeconds) + 5};
    struct rlimit core = {0, 0};
    setrlimit(RLIMIT_CPU, &cpu);
    setrlimit(RLIMIT_CORE, &core);
}

// What the parser prints when it gives up would only confuse: the parent tells the user.
static void SilenceErrors()
{
    int null = open("/dev/null", O_WRONLY | O_CLOEXEC);
    if (null >= 0)
        dup2(null, STDERR_FILENO);
}

// When memory runs out, the system shall end the child and not the editor with its unsaved work.
static void VolunteerForLackOfMemory()
{
    int score = open("/proc/self/oom_score_adj", O_WRONLY | O_CLOEXEC);
    if (score < 0)
        return;
    ssize_t written = write(score, "1000", 4);
    static_cast<void>(written); // refused: then all is as it was
    close(score);
}

int Sys_OpenPipe(int ends[2])
{
    if (pipe2(ends, O_CLOEXEC) != 0)
        return 0;
    ends[0] = Sys_MoveOffStandard(ends[0]);
    ends[1] = Sys_MoveOffStandard(ends[1]);
    if (ends[0] >= 0 && ends[1] >= 0)
        return 1;
    int reason = errno;
    close(ends[0]); // one may be -1
    close(ends[1]);
    errno = reason;
    return 0;
}

void Sys_KeepEndedChildren()
{
    struct sigaction action;
    if (sigaction(SIGCHLD, nullptr, &action) == 0 && action.sa_handler == SIG_IGN)
        signal(SIGCHLD, SIG_DFL);
}

// A copy of this process has the task and its input; the name is not needed.
[[noreturn]] static void BecomeChild(int toParent, const SysTask *task, const SysInput *input,
                                     int cpuSeconds)
{
    ToParent = toParent;
    signal(SIGPIPE, SIG_IGN);
    SilenceErrors();
    LimitResources(cpuSeconds);
    VolunteerForLackOfMemory();
    task->run(input);
    Sys_LeaveChild(0);
}

int Sys_StartChild(SysChild *child, const SysTask *task, const SysInput *input, int cpuSeconds,
                   SysReason *why)
{
    int ends[2];
    if (!Sys_OpenPipe(ends))
        return Sys_TellWhy(why);
    Sys_KeepEndedChildren();
    fcntl(ends[1], F_SETPIPE_SZ, 1 << 20); // fewer switches between the two; it may be refused
    fflush(nullptr); // else the child would hold, and perhaps write, unwritten lines of ours
    pid_t pid = fork();
    if (pid < 0) {
        Sys_TellWhy(why);
        close(ends[0]);
        close(ends[1]);
        return 0;
    }
    if (pid == 0) {
        close(ends[0]);
        BecomeChild(ends[1], task, input, cpuSeconds);
    }
    close(ends[1]);
    child->pid = pid;
    child->pipe = ends[0];
    child->ended = 0;
    return 1;
}

long Sys_ReadChild(SysChild *child, void *buffer, size_t size, int seconds)
{
    struct pollfd wait = {child->pipe, POLLIN, 0};
    int ready;
    do {
        ready = poll(&wait, 1, seconds * 1000);
    } while (ready < 0 && errno == EINTR);
    if (ready <= 0)
        return -1;
    ssize_t got;
    do {
        got = read(child->pipe, buffer, size);
    } while (got < 0 && errno == EINTR);
    child->ended = got == 0;
    return got;
}

SysChildEnd Sys_EndChild(SysChild *child)
{
    int status = 0;
    close(child->pipe);
    if (!child->ended)
        kill(child->pid, SIGKILL);
    pid_t reaped;
    do {
        reaped = waitpid(child->pid, &status, 0);
    } while (reaped < 0 && errno == EINTR);
    if (reaped < 0)
        return SYS_CHILD_CRASHED;
    if (WIFSIGNALED(status))
        return WTERMSIG(status) == SIGXCPU ? SYS_CHILD_TIME_LIMIT : SYS_CHILD_CRASHED;
    return WEXITSTATUS(status) == 0 ? SYS_CHILD_DONE : SYS_CHILD_LEFT;
}

// The time limit may strike in the middle of a write, when nobody knows what the parent has got
// already: then the signal waits for the end of that write.
int Sys_WriteParent(const void *data, size_t size)
{
    const char *next = static_cast<const char *>(data);
    Writing = 1;
    while (size > 0) {
        ssize_t written = write(ToParent, next, size);
        if (written < 0 && errno == EINTR)
            continue;
        if (written < 0)
            break;
        next += written;
        size -= static_cast<size_t>(written);
    }
    Writing = 0;
    if (TimeIsUp) {
        TimeIsUp = 0;
        raise(SIGXCPU);
    }
    return size == 0;
}

void Sys_LeaveChild(int status)
{
    _exit(status);
}

static void OnCrashSignal(int number)
{
    if (number == SIGXCPU && Writing) {
        TimeIsUp = 1;
        return;
    }
    signal(number, SIG_DFL);
    CrashHandler();
    raise(number);
}

void Sys_OnChildCrash(void (*handler)())
{
    static const size_t size = 64 * 1024;
    CrashHandler = handler;
    stack_t stack = {};
    stack.ss_sp = malloc(size); // for the life of the child
    stack.ss_size = size;
    if (stack.ss_sp)
        sigaltstack(&stack, nullptr);
    sigset_t handled;
    sigemptyset(&handled);
    for (int number : CrashSignals) {
        sigaddset(&handled, number);
        struct sigaction action = {};
        action.sa_handler = OnCrashSignal;
        action.sa_flags = SA_ONSTACK | SA_NODEFER;
        sigaction(number, &action, nullptr);
    }
    sigprocmask(SIG_UNBLOCK, &handled, nullptr); // the parent may have blocked them
}

FILE *Sys_OpenText(const char *text, size_t length)
{
    FILE *stream = fmemopen(const_cast<char *>(text), length, "r");
    if (!stream)
        return nullptr;
    setvbuf(stream, nullptr, _IOFBF, 64 * 1024);
    __fsetlocking(stream, FSETLOCKING_BYCALLER); // one thread only: halves the time of getc
    return stream;
}

void Sys_UsePlainLocale()
{
    locale_t plain = newlocale(LC_ALL_MASK, "C", nullptr);
    if (plain)
        uselocale(plain);
}

void *Sys_ReplacedFunction(const char *name)
{
    return dlsym(RTLD_NEXT, name);
}

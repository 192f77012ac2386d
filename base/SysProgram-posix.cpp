// base/SysProgram-posix.cpp - other programs, and files in folders, for POSIX systems.

#include "base/Sys-posix.h"
#include "base/Sys.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <string>
#include <vector>

#include <dirent.h>
#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

static const size_t LARGEST_OUTPUT = 1 << 20;
static const size_t MOST_FOLDERS = 10000;

// --- Programs ---

namespace
{

struct Run {
    pid_t pid;
    int pipe; // what the program writes
    int32_t start;
    int milliseconds;
    std::string output;
};

} // namespace

// Streams: nothing to read, our pipe, nowhere.
static void SetStreams(posix_spawn_file_actions_t *actions, int output)
{
    posix_spawn_file_actions_init(actions);
    posix_spawn_file_actions_addopen(actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_adddup2(actions, output, STDOUT_FILENO);
    posix_spawn_file_actions_addopen(actions, STDERR_FILENO, "/dev/null", O_WRONLY, 0);
}

// A group of its own, so that what the program starts can be ended with it; and none of the signal
// settings of ours, which would be inherited.
static void SetAttributes(posix_spawnattr_t *attributes)
{
    sigset_t none, ours;
    sigemptyset(&none);
    sigemptyset(&ours);
    for (int number : {SIGPIPE, SIGXFSZ, SIGCHLD})
        sigaddset(&ours, number);
    posix_spawnattr_init(attributes);
    posix_spawnattr_setpgroup(attributes, 0);
    posix_spawnattr_setsigmask(attributes, &none);
    posix_spawnattr_setsigdefault(attributes, &ours);
    posix_spawnattr_setflags(attributes, POSIX_SPAWN_SETPGROUP | POSIX_SPAWN_SETSIGMASK |
                                             POSIX_SPAWN_SETSIGDEF);
}

static int Spawn(pid_t *pid, const char *const *argv, int output)
{
    posix_spawn_file_actions_t actions;
    posix_spawnattr_t attributes;
    SetStreams(&actions, output);
    SetAttributes(&attributes);
    int error =
        posix_spawnp(pid, argv[0], &actions, &attributes, const_cast<char **>(argv), environ);
    posix_spawnattr_destroy(&attributes);
    posix_spawn_file_actions_destroy(&actions);
    errno = error;
    return error == 0;
}

static int Start(Run *run, const char *const *argv)
{
    int ends[2];
    if (!Sys_OpenPipe(ends))
        return 0;
    Sys_KeepEndedChildren();
    fcntl(ends[0], F_SETFL, O_NONBLOCK);
    int ok = Spawn(&run->pid, argv, ends[1]);
    int reason = errno;
    close(ends[1]);
    if (!ok)
        close(ends[0]);
    run->pipe = ends[0];
    errno = reason;
    return ok;
}

static int HasEnded(pid_t pid)
{
    siginfo_t info = {};
    int result = waitid(P_PID, static_cast<id_t>(pid), &info, WEXITED | WNOHANG | WNOWAIT);
    return result != 0 || info.si_pid == pid;
}

// Takes what is there. 0 when it is too much.
static int TakeOutput(Run *run)
{
    char block[16 * 1024];
    while (run->pipe >= 0 && run->output.size() <= LARGEST_OUTPUT) {
        ssize_t got = read(run->pipe, block, sizeof block);
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0 && errno == EAGAIN)
            return 1;
        if (got > 0) {
            run->output.append(block, static_cast<size_t>(got));
            continue;
        }
        close(run->pipe);
        run->pipe = -1;
    }
    return run->output.size() <= LARGEST_OUTPUT;
}

// The end of the output says nothing about the end of the program: it may close its output early,
// and something that it has started may keep it open. So both are looked at, again and again.
static int WaitForEnd(Run *run)
{
    static const int step = 10; // milliseconds
    for (;;) {
        int ended = HasEnded(run->pid); // before the last look at the output
        if (!TakeOutput(run))
            return 0;
        if (ended)
            return 1;
        int left = run->milliseconds - (Sys_Milliseconds() - run->start);
        if (left <= 0)
            return 0;
        struct pollfd wait = {run->pipe, POLLIN, 0};
        poll(&wait, 1, std::min(left, step));
    }
}

// 1 with the status with which the program left by itself.
static int Reap(pid_t pid, int *status)
{
    int how;
    pid_t reaped;
    do {
        reaped = waitpid(pid, &how, 0);
    } while (reaped < 0 && errno == EINTR);
    if (reaped < 0 || !WIFEXITED(how))
        return 0;
    *status = WEXITSTATUS(how);
    return 1;
}

char *Sys_RunForOutput(const char *const *argv, int milliseconds, int *status)
{
    Run run = {0, -1, Sys_Milliseconds(), milliseconds, std::string()};
    if (!Start(&run, argv))
        return nullptr;
    int ok = WaitForEnd(&run);
    if (!ok)
        kill(-run.pid, SIGKILL); // it is not reaped yet: the number is still its own
    if (run.pipe >= 0)
        close(run.pipe);
    ok = Reap(run.pid, status) && ok;
    return ok ? strdup(run.output.c_str()) : nullptr;
}

int Sys_IsProgram(const char *path)
{
    struct stat status;
    return stat(path, &status) == 0 && S_ISREG(status.st_mode) && access(path, X_OK) == 0;
}

// --- Folders ---

static int IsFile(const std::string &path)
{
    struct stat status;
    return stat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode);
}

static int IsFolder(const std::string &path, unsigned char type)
{
    struct stat status;
    if (type != DT_UNKNOWN)
        return type == DT_DIR;
    return lstat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
}

// In the order of their names, so that the answer does not depend on the disk's.
static std::vector<std::string> FoldersIn(const std::string &folder)
{
    std::vector<std::string> folders;
    DIR *stream = opendir(folder.c_str());
    if (!stream)
        return folders;
    while (const dirent *entry = readdir(stream)) {
        std::string path = folder + "/" + entry->d_name;
        if (strcmp(entry->d_name, ".") != 0 && strcmp(entry->d_name, "..") != 0 &&
            IsFolder(path, entry->d_type))
            folders.push_back(path);
    }
    closedir(stream);
    std::sort(folders.begin(), folders.end());
    return folders;
}

char *Sys_FindFile(const char *folder, const char *name, int deep)
{
    std::deque<std::string> waiting = {folder};
    for (size_t looked = 0; !waiting.empty() && looked < MOST_FOLDERS; ++looked) {
        std::string path = waiting.front() + "/" + name;
        if (IsFile(path))
            return strdup(path.c_str());
        if (deep && waiting.size() < MOST_FOLDERS)
            for (const std::string &below : FoldersIn(waiting.front()))
                waiting.push_back(below);
        waiting.pop_front();
    }
    return nullptr;
}

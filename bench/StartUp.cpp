// bench/StartUp.cpp - how long a program takes to show its window.
#include "bench/StartUp.h"

#include <chrono>
#include <csignal>
#include <cstdlib>
#include <filesystem>

#include <fcntl.h>
#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

using Clock = std::chrono::steady_clock;

enum { LONGEST_START = 30000 }; // milliseconds
static const char FirstPaint[] = "OnPaint First\n";

static double MillisecondsSince(Clock::time_point start)
{
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

// In the child. The program finds none of the user's settings, and leaves none.
[[noreturn]] static void Become(const std::vector<std::string> &command, const std::string &folder,
                                int standardError)
{
    for (const char *name : {"HOME", "TMPDIR", "XDG_CONFIG_HOME", "XDG_DATA_HOME", "XDG_CACHE_HOME",
                             "XDG_RUNTIME_DIR"})
        setenv(name, folder.c_str(), 1);
    setenv("CARTULO_LOG", "2", 1);
    dup2(standardError, STDERR_FILENO);
    std::vector<char *> words;
    for (const std::string &word : command)
        words.push_back(const_cast<char *>(word.c_str()));
    words.push_back(nullptr);
    execv(words[0], words.data());
    _exit(127);
}

static double WaitForFirstPaint(int output, Clock::time_point start)
{
    std::string text;
    char block[4096];
    while (text.find(FirstPaint) == text.npos) {
        struct pollfd poller = {output, POLLIN, 0};
        int left = LONGEST_START - int(MillisecondsSince(start));
        if (left <= 0 || poll(&poller, 1, left) <= 0)
            return 0;
        ssize_t count = read(output, block, sizeof block);
        if (count <= 0)
            return 0;
        text.append(block, static_cast<size_t>(count));
    }
    return MillisecondsSince(start);
}

double TimeToFirstPaint(const std::vector<std::string> &command, const std::string &folder)
{
    int ends[2];
    if (!std::filesystem::create_directory(folder) || pipe2(ends, O_CLOEXEC) != 0)
        return 0;
    Clock::time_point start = Clock::now();
    pid_t process = fork();
    if (process == 0)
        Become(command, folder, ends[1]);
    close(ends[1]);
    double milliseconds = process > 0 ? WaitForFirstPaint(ends[0], start) : 0;
    close(ends[0]);
    if (process > 0) {
        kill(process, SIGKILL);
        waitpid(process, nullptr, 0);
    }
    std::filesystem::remove_all(folder);
    return milliseconds;
}

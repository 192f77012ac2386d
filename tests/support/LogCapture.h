// tests/support/LogCapture.h - what the program logs, for tests to look at.
#pragma once

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <string>

#include <sys/wait.h>
#include <unistd.h>

// Runs `body` in a child process with CARTULO_LOG=setting (null: not set) and returns what it wrote
// to standard error. The program reads the setting at its first message: the caller must not have
// logged yet.
inline std::string LogOf(const char *setting, const std::function<void()> &body)
{
    FILE *captured = tmpfile();
    fflush(nullptr);
    pid_t child = fork();
    if (child == 0) {
        dup2(fileno(captured), STDERR_FILENO);
        if (setting)
            setenv("CARTULO_LOG", setting, 1);
        else
            unsetenv("CARTULO_LOG");
        body();
        _exit(0);
    }
    int status = -1;
    waitpid(child, &status, 0);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << "the child died";

    std::string text;
    rewind(captured);
    for (int c; (c = fgetc(captured)) != EOF;)
        text += static_cast<char>(c);
    fclose(captured);
    return text;
}

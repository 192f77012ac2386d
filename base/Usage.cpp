// base/Usage.cpp - what a program answers on its standard output, without a display.

#include "base/Usage.h"

#include <cstdio>
#include <cstring>

// Null when the argument asks for nothing.
static const char *AnswerTo(const char *argument, const char *usage, const char *version)
{
    if (strcmp(argument, "--help") == 0 || strcmp(argument, "-h") == 0)
        return usage;
    return strcmp(argument, "--version") == 0 ? version : nullptr;
}

int Usage_Answer(int argc, char **argv, const char *usage, const char *version)
{
    for (int i = 1; i < argc; ++i) {
        const char *answer = AnswerTo(argv[i], usage, version);
        if (answer)
            return fputs(answer, stdout) >= 0 && fflush(stdout) == 0 ? 0 : 1;
    }
    return -1;
}

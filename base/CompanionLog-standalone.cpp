// base/CompanionLog-standalone.cpp - the log of a program that runs on its own.
#include "base/Companion.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace
{

struct Sink {
    FILE *stream;
    long lowest; // level that is shown
};

const long DEFAULT_LEVEL = TNS_WARNING;
const int LEVEL_FLAGS = 256;

} // namespace

// The number in front of a ':' or the end.
static long ParseLevel(const char *text)
{
    char *end;
    long level = strtol(text, &end, 10);
    return end != text && (*end == 0 || *end == ':') ? level : DEFAULT_LEVEL;
}

// Standard error where no file is named or it cannot be opened.
static FILE *OpenStream(const char *path)
{
    // "e": programs that we start do not inherit it.
    FILE *stream = *path ? fopen(path, "ae") : nullptr;
    if (!stream)
        return stderr;
    setvbuf(stream, nullptr, _IONBF, 0);
    return stream;
}

static Sink OpenSink()
{
    const char *setting = getenv("CARTULO_LOG");
    if (!setting)
        return {stderr, DEFAULT_LEVEL};
    const char *colon = strchr(setting, ':');
    return {OpenStream(colon ? colon + 1 : ""), ParseLevel(setting)};
}

// Control characters become blanks: a message is one line, and text of a file must not steer the
// terminal that shows the log.
static char *PutText(char *out, const char *text)
{
    for (; *text; ++text) {
        unsigned char c = static_cast<unsigned char>(*text);
        *out++ = c < ' ' || c == 127 ? ' ' : *text;
    }
    return out;
}

void TNSMessage(const char *prefix, const char *text, int level)
{
    static const Sink sink = OpenSink();
    if ((level & ~LEVEL_FLAGS) < sink.lowest)
        return;
    char *line = static_cast<char *>(malloc(strlen(prefix) + strlen(text) + 1));
    if (!line)
        return;
    char *end = PutText(PutText(line, prefix), text);
    *end++ = '\n';
    // The stream has no buffer: one write, so that lines of several processes do not mix.
    fwrite(line, 1, static_cast<size_t>(end - line), sink.stream);
    free(line);
}

// tests/fuzz/fuzz_command_line.cpp - any bytes as a command line, and as the arguments of one.
//
// An argument comes back as a token of the joined line, but for these:
// - an empty one, which leaves nothing in the line;
// - one that holds a control character, where a token ends, or both kinds of quote;
// - one that begins with a quote, or holds a double quote and a blank: its own quotes count.
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "session/CommandLine.h"
#include "tests/fuzz/Demand.h"

static void CheckTokens(const std::string &line, size_t size)
{
    const char *end = line.c_str() + strlen(line.c_str());
    const char *at = line.c_str();
    std::string out(size + 1, '#'); // one byte more than is ours
    while (const char *next = NextToken(at, out.data(), size)) {
        DEMAND(next >= at && next <= end);
        DEMAND(strlen(out.c_str()) < size);
        DEMAND(out[size] == '#');
        if (next == at)
            return; // a byte of 128 or more, where a caller stops
        at = next;
    }
    DEMAND(out[0] == 0);
}

static int ComesBack(const std::string &argument)
{
    if (argument.empty() || argument.size() >= TOKEN_SIZE)
        return 0;
    for (char c : argument)
        if (c >= 1 && c < 32)
            return 0;
    if (argument[0] == '"' || argument[0] == '\'')
        return 0;
    int quotes = argument.find('"') != argument.npos;
    int apostrophes = argument.find('\'') != argument.npos;
    int blanks = argument.find(' ') != argument.npos;
    return !(quotes && (blanks || apostrophes));
}

static void CheckLine(const char *line, const std::vector<std::string> &arguments)
{
    char token[TOKEN_SIZE];
    for (const std::string &argument : arguments) {
        line = NextToken(line, token, sizeof token);
        DEMAND(line);
        DEMAND(argument == token);
    }
    DEMAND(!NextToken(line, token, sizeof token));
}

// The pieces between NULs.
static std::vector<std::string> Split(const std::string &text)
{
    std::vector<std::string> pieces;
    for (size_t start = 0; start <= text.size();) {
        pieces.push_back(text.c_str() + start);
        start += pieces.back().size() + 1;
    }
    return pieces;
}

static void CheckArguments(const std::vector<std::string> &arguments)
{
    std::vector<std::string> quoted;
    std::vector<const char *> vector = {"cartulo"};
    int all = 1;
    size_t length = 0;
    for (const std::string &argument : arguments) {
        quoted.push_back(Command_QuoteArgument(argument.c_str()));
        all &= ComesBack(argument);
        length += quoted.back().size() + 1;
    }
    for (const std::string &argument : quoted)
        vector.push_back(argument.c_str());
    const char *line = BuildCommandLine(static_cast<int>(vector.size()), vector.data());
    DEMAND(line ? strlen(line) < COMMAND_LINE_SIZE : length + 2 * arguments.size() > 1000);
    if (line && all)
        CheckLine(line, arguments);
}

extern "C" int LLVMFuzzerInitialize(int *, char ***)
{
    setenv("CARTULO_LOG", "6", 0);
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string text(reinterpret_cast<const char *>(data), size);
    for (size_t room : {1, 2, 7, 512})
        CheckTokens(text, room);
    CheckArguments(Split(text));
    return 0;
}

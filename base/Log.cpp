// base/Log.cpp - the program's trace lines.
#include "base/Log.h"

#include <cstring>

#include "base/Companion.h"

static const size_t LINE_LENGTH = 511; // without the NUL

static bool StartsWith(const char *text, const char *word)
{
    return strncmp(text, word, strlen(word)) == 0;
}

// A warning gets 3 and an error 4, one step below what direct calls of TNSMessage use, so that the
// detail of a failure ranks below the line that says what failed.
static int LevelOf(const char *line)
{
    if (StartsWith(line, "Run") || StartsWith(line, "Open") || StartsWith(line, "Launch"))
        return TNS_LIFECYCLE;
    if (strstr(line, "WARNING"))
        return TNS_ACTION;
    if (strstr(line, "ERROR"))
        return TNS_WARNING;
    return TNS_TRACE;
}

// Adds as much of the text as fits; the rest of a long one is not even read. Returns the length.
static size_t Append(char *line, size_t length, const char *text)
{
    while (*text && length < LINE_LENGTH)
        line[length++] = *text++;
    return length;
}

void AppLog(const char *first, const char *second)
{
    char line[LINE_LENGTH + 1];
    size_t length = Append(line, 0, first);
    if (second)
        length = Append(line, length, second);
    line[length] = 0;
    TNSMessage("Cartulo: ", line, LevelOf(line));
}

uint32_t Log_Character(uint32_t character)
{
    bool isControl = character < ' ' || (character >= 0x7F && character < 0xA0);
    bool isSurrogate = character >= 0xD800 && character <= 0xDFFF;
    return isControl || isSurrogate ? ' ' : character;
}

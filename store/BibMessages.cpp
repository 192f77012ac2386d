// store/BibMessages.cpp - the parser's messages: counted, logged, kept with their file.

#include "store/BibStore.h"

#include <cstdlib>
#include <cstring>
#include <string>

#include "base/Log.h"

BibFile *BibCurrentFile = nullptr;

enum Counted { NOT_COUNTED, AS_WARNING, AS_ERROR };

struct MessageClass {
    const char *word;
    Counted counted;
};

static const MessageClass Classes[] = {
    {"INFO", NOT_COUNTED},     {"WARNING", AS_WARNING},      {"WARNING", AS_WARNING},
    {"WARNING", AS_WARNING},   {"ERROR", AS_ERROR},          {"SYNTAX ERROR", AS_ERROR},
    {"FATAL ERROR", AS_ERROR}, {"INTERNAL ERROR", AS_ERROR},
};
static const int ClassCount = sizeof Classes / sizeof Classes[0];

static void Count(BibFile *file, Counted counted)
{
    if (counted == AS_WARNING)
        ++file->warningCount;
    else if (counted == AS_ERROR)
        ++file->errorCount;
}

// Room is kept for the line's end and the NUL.
static void Append(BibFile *file, const char *prefix, const char *message)
{
    if (!file->messages)
        file->messages = static_cast<char *>(calloc(BIB_MESSAGES_SIZE, 1));
    if (!file->messages)
        return;
    size_t used = strlen(file->messages);
    if (used + strlen(prefix) + strlen(message) >= BIB_MESSAGES_SIZE - 4) {
        // Misspelt, stands so.
        AppLog("WARNIG: ", "Too many errors/warnings, forget last messages.");
        return;
    }
    snprintf(file->messages + used, BIB_MESSAGES_SIZE - used, "%s%s\r\n", prefix, message);
}

void Bib_ReportMessage(const char *, int errorClass, const char *, int line, const char *, int,
                       const char *message)
{
    if (errorClass < 0 || errorClass >= ClassCount)
        errorClass = ClassCount - 1;
    const MessageClass *row = &Classes[errorClass];
    std::string prefix = std::string(row->word) + ": line " + std::to_string(line) + ": ";
    if (BibCurrentFile)
        Count(BibCurrentFile, row->counted);
    AppLog(prefix.c_str(), message);
    if (BibCurrentFile)
        Append(BibCurrentFile, prefix.c_str(), message);
}

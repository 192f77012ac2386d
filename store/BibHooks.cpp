// store/BibHooks.cpp - functions of the parser library that this program replaces.
//
// The library calls them through the dynamic symbol table, so they must be exported from the
// executable, and no other library may use their names. They stand in one object with
// BibHooks_Listen: nothing calls them by name, so out of a static library the linker takes them
// only with that, which the loading child calls.

#include "store/BibHooks.h"

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <btparse.h>

#include "base/Sys.h"
#include "store/BibStore.h"

extern "C" {
// The lexer's state, exported by the library.
extern int zzline;
extern char *zzlextext;

// The library's own, replaced below.
void report_error(bt_errclass errclass, char *filename, int line, char *item_desc, int item,
                  char *fmt, va_list arglist);
void zzerrstd(const char *text);
char *strlwr(char *text);
void zzmode(int mode) noexcept;
void comment();
}

static const BibListener *Listener = nullptr;

void BibHooks_Listen(const BibListener *listener)
{
    Listener = listener;
}

static void Report(const char *className, int errorClass, const char *fileName, int line,
                   const char *itemDescription, int itemNumber, const char *message)
{
    if (Listener)
        Listener->message(errorClass, line, message);
    else
        Bib_ReportMessage(className, errorClass, fileName, line, itemDescription, itemNumber,
                          message);
}

static const char *const ClassNames[] = {"notification", "warning",       "warning",
                                         "warning",      "error",         "syntax error",
                                         "fatal error",  "internal error"};

// Syntax errors arrive with text of the file as their format, but for one.
static void FormatMessage(char *message, size_t size, int errorClass, const char *format,
                          va_list arguments)
{
    static const char fieldName[] = "invalid field name \"%s\"";
    if (errorClass == BTERR_SYNTAX && strncmp(format, fieldName, sizeof fieldName - 1) != 0)
        snprintf(message, size, "%s", format);
    else
        vsnprintf(message, size, format, arguments);
}

#define REPLACES_LIBRARY extern "C" __attribute__((visibility("default"), used))

REPLACES_LIBRARY void report_error(bt_errclass errclass, char *filename, int line, char *item_desc,
                                   int item, char *fmt, va_list arglist)
{
    char message[1024];
    FormatMessage(message, sizeof message, errclass, fmt, arglist);
    Report(ClassNames[errclass], errclass, filename, line, item_desc, item, message);
    if (errclass == BTERR_USAGEERR)
        exit(1);
    if (errclass == BTERR_INTERNAL)
        abort();
}

// A character that begins no token; the library would print a line and drop it.
REPLACES_LIBRARY void zzerrstd(const char *)
{
    char message[1024];
    snprintf(message, sizeof message, "invalid token (text was \"%s\")", zzlextext);
    Report("error", BTERR_LEXERR, nullptr, zzline, nullptr, -1, message);
}

// The library would turn types, field names and names of abbreviations to lower case.
REPLACES_LIBRARY char *strlwr(char *text)
{
    return text;
}

// The library's own, which still have to do their work. Looked up before any child is started.
template <class Function> static Function *Replaced(const char *name)
{
    return reinterpret_cast<Function *>(Sys_ReplacedFunction(name));
}
static void (*const OriginalMode)(int) = Replaced<void(int)>("zzmode");
static void (*const OriginalComment)() = Replaced<void()>("comment");

// The lexer enters an item, a string in it, or leaves it.
REPLACES_LIBRARY void zzmode(int mode) noexcept
{
    if (Listener)
        Listener->mode(mode);
    OriginalMode(mode);
}

// A comment line, which the library drops.
REPLACES_LIBRARY void comment()
{
    if (Listener)
        Listener->comment(zzline);
    OriginalComment();
}

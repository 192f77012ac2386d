// session/CommandLine.cpp - carries out command lines: tokens, options, file names.
#include "session/CommandLine.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "base/Ascii.h"
#include "base/Companion.h"
#include "base/Log.h"
#include "base/Paths.h"
#include "base/Sys.h"
#include "encoding/Encoding.h"

// --- Building a line and taking it apart ---

static std::string JoinArguments(int argc, const char *const *argv)
{
    std::string line;
    for (int i = 1; i < argc; ++i) {
        const char *quote = strchr(argv[i], ' ') ? "\"" : "";
        line += i > 1 ? " " : "";
        line += quote;
        line += argv[i];
        line += quote;
    }
    return line;
}

const char *BuildCommandLine(int argc, const char *const *argv)
{
    static char buffer[COMMAND_LINE_SIZE];
    std::string line = JoinArguments(argc, argv);
    if (line.size() >= sizeof buffer) {
        AppLog("ERROR: Command line too long: ", line.c_str());
        return nullptr;
    }
    memcpy(buffer, line.c_str(), line.size() + 1);
    TNSMessage("INFO: Command_Line - ", buffer, TNS_LIFECYCLE);
    return buffer;
}

static bool HoldsHighByte(const char *text)
{
    for (; *text; ++text)
        if (static_cast<signed char>(*text) < 0)
            return true;
    return false;
}

std::string Command_Quote(const char *text)
{
    for (const char *quote : {"\"", "'"})
        if (!strchr(text, *quote))
            return std::string(quote) + text + quote;
    return "";
}

std::string Command_QuoteArgument(const char *argument)
{
    if (!HoldsHighByte(argument) || strchr(argument, ' '))
        return argument;
    std::string quoted = Command_Quote(argument);
    return quoted.empty() ? argument : quoted;
}

static const char *SkipBlanks(const char *text)
{
    for (; *text; ++text) {
        int c = static_cast<signed char>(*text);
        if (c < 1 || c > 32)
            break;
    }
    return text;
}

static const char *SkipWord(const char *text)
{
    while (static_cast<signed char>(*text) > 32)
        ++text;
    return text;
}

static const char *SkipUntil(const char *text, char quote)
{
    while (*text && *text != quote)
        ++text;
    return text;
}

static void CopyCut(char *out, size_t size, const char *text, size_t length)
{
    if (length >= size)
        length = size - 1;
    memcpy(out, text, length);
    out[length] = 0;
}

const char *NextToken(const char *text, char *out, size_t size)
{
    *out = 0;
    if (!text)
        return nullptr;
    const char *start = SkipBlanks(text);
    if (!*start)
        return nullptr;
    bool quoted = *start == '"' || *start == '\'';
    const char *end = quoted ? SkipUntil(start + 1, *start) : SkipWord(start);
    start += quoted;
    CopyCut(out, size, start, static_cast<size_t>(end - start));
    if (quoted && *end)
        ++end;
    return SkipBlanks(end);
}

// --- The start of the program ---

// The first option, which may be a capital letter, too.
static bool IsBaseFolder(const char *token)
{
    return Ascii_CompareN(token, "-d", 2) == 0;
}

StartUp Command_StartUp(const char *commandLine)
{
    StartUp start = {"Cartulo", "", commandLine};
    char first[TOKEN_SIZE];
    const char *rest = NextToken(commandLine, first, sizeof first);
    if (!rest || !IsBaseFolder(first))
        return start;
    start.baseFolder = first + 2;
    if (start.baseFolder.size() >= BASE_FOLDER_SIZE) {
        start.baseFolder.clear(); // the panel says that it is too long
        return start;
    }
    start.instance += "-" + start.baseFolder;
    std::replace(start.instance.begin(), start.instance.end(), '\\', '/');
    start.commandLine = rest;
    return start;
}

// --- File names ---

static bool IsAbsolute(const char *token)
{
    return *token == '/' || (*token && (token[1] == ':' || token[1] == '\\'));
}

static int ResolveAbsolute(const char *token, std::string *path)
{
    *path = token;
    if (!Path_HasBibEnding(*path))
        *path += ".bib";
    AppLog("Check: ", path->c_str());
    return Sys_FileExists(path->c_str());
}

// The environment's answer for a name that is not in the base folder.
static int AskEnvironment(const CommandState *state, const char *token, std::string *path)
{
    char *answer = state->findBib ? state->findBib(token) : nullptr;
    if (!answer)
        return 0;
    *path = answer;
    free(answer);
    return 1;
}

// The token takes the place of what follows the last separator of the base folder. Unlike an
// absolute name, one that has any dot gets no ending.
static int ResolveRelative(const CommandState *state, const char *token, std::string *path)
{
    *path = state->baseFolder;
    path->erase(path->find_last_of("/\\") + 1); // npos + 1 is 0
    *path += token;
    if (!strchr(token, '.'))
        *path += ".bib";
    AppLog("Check: ", path->c_str());
    return Sys_FileExists(path->c_str()) || AskEnvironment(state, token, path);
}

int Command_ResolveName(const CommandState *state, const char *token, std::string *path)
{
    return IsAbsolute(token) ? ResolveAbsolute(token, path) : ResolveRelative(state, token, path);
}

// --- One command line ---

namespace
{

struct Command {
    BibFileSet *set; // what is open afterwards
    CommandState *state;
    BibFileSet previous; // what was open before; lends its records only
    CommandResult result;
};

} // namespace

// With what an earlier command line has taken off the list.
static void MoveToPrevious(Command *command)
{
    BibFileSet *set = command->set;
    FileSet_TakeBack(set);
    command->previous.files = set->files;
    command->previous.count = set->count;
    set->files = nullptr;
    set->count = 0;
    for (int i = 0; i < command->previous.count; ++i)
        command->previous.files[i]->inUse = 0;
}

static bool IsListed(const BibFileSet *set, const BibFile *file)
{
    for (int i = 0; i < set->count; ++i)
        if (set->files[i] == file)
            return true;
    return false;
}

// Saves a file that leaves the list, with one of the two functions for that. When it fails the file
// goes back on, so that the user can act.
static bool SaveOrKeep(Command *command, BibFile *file, int (*save)(BibFileSet *, BibFile *))
{
    if (!file->modified || save(command->set, file))
        return true;
    FileSet_Append(command->set, file);
    FileSet_AppendError(command->set,
                        "ERROR: The file '%s' could not be saved (%s), it stays open\n", file->path,
                        Bib_SaveReason());
    ++command->result.errors;
    return false;
}

// Option d.
static void SetBaseFolder(Command *command, const char *folder)
{
    CommandState *state = command->state;
    size_t length = strlen(folder);
    if (length < sizeof state->baseFolder) {
        memcpy(state->baseFolder, folder, length + 1);
        return;
    }
    // Cut, it would be another folder, with other files.
    AppLog("ERROR: Base folder too long: ", folder);
    FileSet_AppendError(command->set, "ERROR: The folder name '%s' is too long\n", folder);
    ++command->result.errors;
}

// Of those that were put aside.
static void DropListed(BibFileSet *set)
{
    auto isListed = [set](const BibFile *file) { return IsListed(set, file); };
    BibFile **end = set->aside + set->asideCount;
    set->asideCount = static_cast<int>(std::remove_if(set->aside, end, isListed) - set->aside);
}

// Option i. The files that leave the list here are not closed.
static void EmptyList(Command *command)
{
    BibFileSet *set = command->set;
    BibFile **files = set->files;
    int count = set->count;
    set->files = nullptr;
    set->count = 0;
    for (int i = 0; i < count; ++i)
        if (!IsListed(set, files[i])) // else it is here twice and could not be saved
            SaveOrKeep(command, files[i], FileSet_SaveOne);
    for (int i = 0; i < count; ++i)
        FileSet_PutAside(set, files[i]);
    free(files);
}

// Option w: "window", "window:number", "window/service" or "window:number/service".
static void SetCompanion(CommandState *state, const char *rest)
{
    const char *slash = strchr(rest, '/');
    const char *colon = strchr(rest, ':');
    bool hasNumber = colon && (!slash || colon < slash);
    state->companionWindow = static_cast<uint32_t>(strtoll(rest, nullptr, 10));
    state->companionNumber = hasNumber ? static_cast<uint32_t>(strtoll(colon + 1, nullptr, 10)) : 0;
    if (slash)
        CopyCut(state->companionService, sizeof state->companionService, slash + 1,
                strlen(slash + 1));
}

static void UpdateForms(BibFile *const *files, int count)
{
    for (int i = 0; i < count; ++i)
        Bib_UpdateForm(files[i]);
}

// Option e. A name that is not known leaves the code page as it is, and letters may look wrong.
static void SelectEncoding(Command *command, const char *name)
{
    const BibFileSet *previous = &command->previous, *set = command->set;
    if (Enc_Select(name)) {
        UpdateForms(previous->files, previous->count);
        // One that could not be saved is in the new list alone.
        UpdateForms(set->files, set->count);
        return;
    }
    FileSet_AppendError(command->set,
                        "ERROR: There is no code page '%s' (UTF-8 is called CP65001), %s stays "
                        "selected\n",
                        name, Enc_Label(Enc_Current()));
    ++command->result.errors;
}

static void TakeOption(Command *command, const char *token)
{
    switch (token[1]) {
    case 'a':
    case 'b':
        break;
    case 'd':
        SetBaseFolder(command, token + 2);
        break;
    case 'e':
        SelectEncoding(command, token + 2);
        break;
    case 'i':
        EmptyList(command);
        break;
    case 'w':
        SetCompanion(command->state, token + 2);
        break;
    default:
        AppLog("Unknown argument: ", token);
    }
}

static void CloseFile(Command *command, BibFile *file)
{
    AppLog("Close Unused Bib file: ", file->path);
    if (!SaveOrKeep(command, file, FileSet_SaveLast))
        return;
    Sys_UnlockFile(file->lockHandle);
    Bib_FreeFile(file);
    ++command->result.changes;
}

// Closes what was open before and has not been named: all of it, or with a `path` the file that is
// there. One that is listed twice is closed once.
static void CloseUnused(Command *command, const char *path)
{
    BibFileSet *previous = &command->previous;
    for (int i = 0; i < previous->count;) {
        BibFile *file = previous->files[i];
        if (file->inUse || (path && !Sys_SameFile(file->path, path))) {
            ++i;
            continue;
        }
        BibFile **end = previous->files + previous->count;
        previous->count =
            static_cast<int>(std::remove(previous->files, end, file) - previous->files);
        CloseFile(command, file);
    }
}

// Under any of its names; null for none.
static BibFile *FindAside(const BibFileSet *set, const char *path)
{
    for (int i = 0; i < set->asideCount; ++i)
        if (Sys_SameFile(set->aside[i]->path, path))
            return set->aside[i];
    return nullptr;
}

// Only what was open before this command line counts, and what it has put aside: a new file that it
// names twice is loaded twice.
static bool Reuse(Command *command, const char *path)
{
    const BibFileSet *previous = &command->previous;
    int found = FileSet_Find(previous, path);
    BibFile *file = found >= 0 ? previous->files[found] : FindAside(command->set, path);
    if (!file)
        return false;
    file->inUse = 1;
    FileSet_Append(command->set, file);
    AppLog("Reused Bib file: ", file->path);
    return true;
}

static void Load(Command *command, const char *path)
{
    // Open under another name, it may have changes to save, and it holds the lock.
    CloseUnused(command, path);
    int before = command->set->count;
    command->result.errors += FileSet_Open(command->set, path);
    command->result.changes += command->set->count - before;
}

static void TakeFile(Command *command, const char *token)
{
    std::string path;
    if (!Command_ResolveName(command->state, token, &path)) {
        AppLog("ERROR: Can't locate Bib-file: ", token);
        FileSet_AppendError(command->set, "ERROR: The file '%s' not found\n", token);
        ++command->result.errors;
        return;
    }
    if (!Reuse(command, path.c_str()))
        Load(command, path.c_str());
}

static void RefuseRest(Command *command, const char *rest)
{
    AppLog("ERROR: Command line not understood from: ", rest);
    FileSet_AppendError(command->set,
                        "ERROR: The command line was not understood from '%s' on; names with "
                        "such characters must stand in quotes\n",
                        rest);
    ++command->result.errors;
}

static void TakeTokens(Command *command, const char *line)
{
    char token[TOKEN_SIZE];
    line = SkipBlanks(line);
    const char *first = line;
    while (const char *next = NextToken(line, token, sizeof token)) {
        if (next == line) {
            RefuseRest(command, line);
            return;
        }
        if (line == first && IsBaseFolder(token))
            SetBaseFolder(command, token + 2);
        else if (*token == '-')
            TakeOption(command, token);
        else
            TakeFile(command, token);
        line = next;
    }
}

static bool SameList(const BibFileSet *a, const BibFileSet *b)
{
    if (a->count != b->count)
        return false;
    for (int i = 0; i < a->count; ++i)
        if (a->files[i] != b->files[i])
            return false;
    return true;
}

static CommandResult RefuseLongLine(BibFileSet *set, const char *line)
{
    if (line) // else BuildCommandLine has logged it
        AppLog("ERROR: Command line too long: ", line);
    FileSet_AppendError(set,
                        "ERROR: The command line is longer than %d characters, nothing of it was "
                        "carried out\n",
                        COMMAND_LINE_SIZE - 1);
    return {1, 0};
}

CommandResult Command_Process(BibFileSet *set, CommandState *state, const char *commandLine)
{
    if (!commandLine || strlen(commandLine) >= COMMAND_LINE_SIZE)
        return RefuseLongLine(set, commandLine);
    Command command = {set, state, {}, {}};
    MoveToPrevious(&command);
    AppLog("Command: ", commandLine);
    TakeTokens(&command, commandLine);
    CloseUnused(&command, nullptr);
    DropListed(set);
    // Rows name their file by its place in the list, which reuse alone can change.
    if (command.result.changes == 0 && !SameList(set, &command.previous))
        command.result.changes = 1;
    free(command.previous.files);
    return command.result;
}

// session/CommandLine.h - the command line: tokens, options, file names, and the set of open files.
//
// A command line replaces the set of open files: files that it names again stay as they are, new
// ones are loaded, the others are saved when modified and closed.
#pragma once

#include <string>

#include "session/FileSet.h"

enum { COMMAND_LINE_SIZE = 1024, BASE_FOLDER_SIZE = 256, TOKEN_SIZE = 512 };

// What options set, beyond the files. One for the process.
struct CommandState {
    char baseFolder[BASE_FOLDER_SIZE];           // relative names are resolved against it
    uint32_t companionWindow;                    // -w
    uint32_t companionNumber;                    // -w; not read
    char companionService[BASE_FOLDER_SIZE + 1]; // -w; "" for none
    // Answers TNSearch("bib", ...): malloc'd path or null. Null: nothing more is found.
    char *(*findBib)(const char *name);
    // Hands a command line to a service, like that of the companion: 1, or 0 when nobody took it.
    // Null: nobody is there.
    int (*sendCommand)(const char *service, const char *text);
};

struct CommandResult {
    int errors;  // above 0: the messages window opens
    int changes; // above 0: rows and layout are out of date
};

// The arguments from the second on, joined by blanks; one that holds a blank is put in double
// quotes. Null, logged, when the line does not fit in COMMAND_LINE_SIZE bytes. Static buffer.
const char *BuildCommandLine(int argc, const char *const *argv);

// The text in quotes of a kind that it does not hold; "" when it holds both kinds.
std::string Command_Quote(const char *text);

// Puts quotes around an argument that holds a byte of 128 or more and no blank, as the tokenizer
// would cut it there: with ' when it holds ". One that holds both kinds cannot be expressed and
// stays as it is.
std::string Command_QuoteArgument(const char *argument);

// What a second start has in common with a first one: a start whose first argument is "-dFOLDER"
// serves that folder alone.
struct StartUp {
    std::string instance;    // "Cartulo", or "Cartulo-FOLDER" with forward slashes
    std::string baseFolder;  // "" unless the instance is a folder's
    const char *commandLine; // for the panel, part of the line; null when the line is too long
};
StartUp Command_StartUp(const char *commandLine);

// Copies the next token to `out` (at most size - 1 bytes) and returns where the following one
// starts, null when there was none. Blanks separate; a token may stand in quotes of either kind.
// Bytes compare as signed, so an unquoted token ends at a byte of 128 or more; at such a byte the
// token is empty and the pointer does not move. `text` may be null.
const char *NextToken(const char *text, char *out, size_t size);

// The path that a file name on the command line means. 1 when it exists.
int Command_ResolveName(const CommandState *state, const char *token, std::string *path);

// Carries out one command line. What is wrong with it goes to the set's load errors and is counted.
//
// A line that does not fit in COMMAND_LINE_SIZE bytes, or null, as BuildCommandLine gives for one,
// is refused as a whole. Where the tokenizer gets no further, the rest is refused.
//
// No changes are lost: a file that cannot be saved stays open, at the end of the list. Files that
// the option -i takes off the list are saved and stay locked until the next command line.
CommandResult Command_Process(BibFileSet *set, CommandState *state, const char *commandLine);

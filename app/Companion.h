// app/Companion.h - services of the TeX environment around the program.
// Companion-standalone.cpp serves a program that runs on its own.
#pragma once

// Levels of TNSMessage.
enum {
    TNS_TRACE = 1,
    TNS_LIFECYCLE = 2, // start-up, exit, command lines
    TNS_ACTION = 3,    // what the user did
    TNS_WARNING = 4,
    TNS_ERROR = 5,
    TNS_ASSERT = 260 // a toolkit assertion: 4 with the flag 256
};

// The one sink of all diagnostics: writes prefix and text as one line. The environment variable
// CARTULO_LOG=level[:file] names the lowest level that is shown (default 4) and a file that is
// appended to instead of standard error. Never fails toward the caller.
void TNSMessage(const char *prefix, const char *text, int level);

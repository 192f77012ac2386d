// base/Companion.h - services of the TeX environment around the program.
// CompanionLog-standalone.cpp (TNSMessage) and Companion-standalone.cpp (the others) serve a
// program that runs on its own. Texts are 8-bit, paths as the system has them.
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

// The full path of a file, malloc'd; null for none, and for a name with a '/'. `category` is one of
//   "bib"      a BIB file by its name, as typed or with ".bib" added: asks kpsewhich, whose answer
//              holds; where there is no working one, looks through the parts of the environment
//              variable BIBINPUTS (separated by colons; "//" at the end of a part: the folders
//              below, too; an empty part: the current folder)
//   "Icon"     the picture of a tool, by its name without ending
//   "Logo"     a picture of a program, by the program's name
//   "Program"  a program of the environment
// The last three look through the folders that the key of the category's name in section "Search"
// lists (TNSValue; separated by colons), then the user's own, then those installed with this
// program:
//   "Logo"     $XDG_DATA_HOME/cartulo, ../share/cartulo from the executable (../../share/cartulo
//              from one in libexec/cartulo), the resources that the program was built with
//   "Icon"     icons in each of these
//   "Program"  $XDG_DATA_HOME/cartulo/bin, the folder of the executable, ../libexec/cartulo from
//              it, then PATH
// Pictures end in .svg, .png, .xpm, .bmp or .gif; the first of these holds. Relative folders in
// settings and in PATH do not count.
char *TNSearch(const char *category, const char *name);

// A setting of the environment, malloc'd, at most 4095 bytes; null for none. Read afresh each time
// from the file Cartulo/environment.ini in the user's configuration folder.
char *TNSValue(const char *section, const char *key);

// The text of a control word; null for none. Nothing controls a program that runs on its own.
const char *TNSFind(const char *word);

// Makes a window known to the user's processes under a name, until this process ends. The window
// is the handle by which other programs name it; the last call for a name holds, whichever process
// made it.
void RegisterFrame(const char *instance, long window);

// The window of a living process that is known under that name; 0 for none.
long FindFrame(const char *instance);

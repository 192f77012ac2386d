// ui/PreambleText.h - the preamble of a file, as the text of a control and back.
//
// In the store each piece of a preamble ends with CR LF, and a line feed belongs to the piece that
// it stands in. The control is filled with the same characters, and adds a line feed for each
// Enter.
#pragma once

#include <string>
#include <vector>

#include "encoding/Encoding.h"
#include "session/FileSet.h"

extern int CurrentPreamble; // index of the file that the window showed last

// The index to begin with: the remembered one, or the last file's. -1 without files.
int Preamble_FitFile(const BibFileSet *set, int index);

// The last one of the files of this name; -1 for none.
int Preamble_FindFile(const BibFileSet *set, const char *baseName);

// What an edit makes of a preamble.
struct PreambleEdit {
    std::string text;        // as the store keeps it
    std::vector<int> places; // of each old piece, maybe changed: its index now; -1 for none
    std::wstring touched;    // what was typed in pieces that are not what they were
    std::string replaced;    // the old pieces that are not there any more
};

// `typed` is what the control holds that was filled with `stored`. The ends of pieces stay; a line
// feed outside braces ends a piece, one inside is part of it. Pieces that were not touched, and
// copies of them, keep their bytes.
PreambleEdit Preamble_Read(const std::wstring &typed, const char *stored,
                           const EncodingRecord *encoding);

// Why the text would make the file one that can't be read any more, for the user; "" when it would
// not.
std::string Preamble_CheckMarks(const std::string &text);

// Why the text can't be stored, for the user; "" when it is short enough.
std::string Preamble_CheckSize(const std::string &text);

// A piece that can't be written as BibTeX.
struct PreambleFault {
    std::string piece;  // store text
    const char *reason; // static text
};
std::vector<PreambleFault> Preamble_Check(const std::string &text);

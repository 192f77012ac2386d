#include "ui/PreambleText.h"

#include <algorithm>
#include <cstring>

#include "ui/Values.h"

int CurrentPreamble = 0;

// --- Files ---

int Preamble_FitFile(const BibFileSet *set, int index)
{
    return std::min(index, set->count - 1);
}

int Preamble_FindFile(const BibFileSet *set, const char *baseName)
{
    int file = set->count - 1;
    while (file >= 0 && strcmp(set->files[file]->baseName, baseName) != 0)
        --file;
    return file;
}

// --- Pieces ---

// They end at a CR; a line feed right after it belongs to the end.
static std::vector<std::string> SplitPieces(const std::string &text)
{
    std::vector<std::string> pieces;
    for (size_t at = 0; at < text.size();) {
        size_t end = std::min(text.find('\r', at), text.size());
        pieces.push_back(text.substr(at, end - at));
        at = end + (text.compare(end, 2, "\r\n") == 0 ? 2 : 1);
    }
    return pieces;
}

// --- Reading ---

static int Deepen(int depth, wchar_t c) // the depth of braces behind a character
{
    if (c == L'}')
        return std::max(depth - 1, 0);
    return depth + (c == L'{');
}

// The pieces of what was typed, each without its end.
static std::vector<std::wstring> TypedPieces(const std::wstring &typed)
{
    std::vector<std::wstring> pieces;
    std::wstring piece;
    int depth = 0;
    for (size_t at = 0; at < typed.size(); ++at) {
        bool isEnd = typed.compare(at, 2, L"\r\n") == 0;
        at += isEnd;
        bool isEnter = typed[at] == L'\r' || typed[at] == L'\n';
        if (!isEnter || (depth > 0 && !isEnd)) {
            piece += isEnter ? L'\n' : typed[at];
            depth = Deepen(depth, typed[at]);
        } else {
            pieces.push_back(piece);
            piece.clear();
            depth = 0;
        }
    }
    if (!piece.empty())
        pieces.push_back(piece);
    return pieces;
}

// Takes the first of the old pieces that is shown like this one. False for none.
static bool TakeOld(std::vector<std::string> *old, const std::wstring &piece, std::string *bytes)
{
    auto isShownSo = [&](const std::string &stored) { return Value_Show(stored.c_str()) == piece; };
    auto found = std::find_if(old->begin(), old->end(), isShownSo);
    if (found == old->end())
        return false;
    *bytes = *found;
    old->erase(found);
    return true;
}

PreambleEdit Preamble_Read(const std::wstring &typed, const char *stored)
{
    PreambleEdit edit;
    std::vector<std::string> old = SplitPieces(stored);
    std::vector<std::wstring> pieces;
    if (typed.find_first_not_of(L"\r\n") != typed.npos)
        pieces = TypedPieces(typed);
    for (const std::wstring &piece : pieces) {
        std::string bytes;
        if (!TakeOld(&old, piece, &bytes)) {
            bytes = Value_Read(piece);
            edit.touched += piece + L'\n';
        }
        edit.text += bytes + "\r\n";
    }
    for (const std::string &piece : old)
        edit.replaced += piece;
    return edit;
}

// --- Checking and storing ---

std::string Preamble_CheckSize(const std::string &text)
{
    const size_t most = BIB_PREAMBLE_SIZE - 1;
    if (text.size() <= most)
        return "";
    return "The preamble of a file can have " + std::to_string(most) +
           " bytes, with two for the end of each piece.\nThis one has " +
           std::to_string(text.size()) + ", " + std::to_string(text.size() - most) +
           " too many.\n\nShorten it to continue.";
}

std::vector<PreambleFault> Preamble_Check(const std::string &text)
{
    std::vector<PreambleFault> faults;
    for (const std::string &piece : SplitPieces(text))
        if (const char *reason = Value_Check(piece.c_str()))
            faults.push_back({piece, reason});
    return faults;
}

std::string Preamble_CheckMarks(const std::string &text)
{
    std::vector<std::string> pieces = SplitPieces(text);
    if (std::none_of(pieces.begin(), pieces.end(), Value_HasBadMarks))
        return "";
    return "The marks of an abbreviation must be a pair around the name of one.\n"
           "Else the file could not be read any more.\n\nFix it to continue.";
}

void Preamble_Store(BibFile *file, const std::string &text)
{
    memcpy(file->preamble, text.c_str(), text.size() + 1);
}

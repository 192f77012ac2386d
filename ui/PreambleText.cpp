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

static int Deepen(int depth, char c) // the depth of braces behind a character
{
    if (c == '}')
        return std::max(depth - 1, 0);
    return depth + (c == '{');
}

static std::string EndLast(const std::string &text)
{
    bool isEnded = text.size() >= 2 && text.compare(text.size() - 2, 2, "\r\n") == 0;
    return isEnded ? text : text + "\r\n";
}

std::string Preamble_Read(const std::wstring &typed)
{
    std::string text = Value_Read(typed), read;
    if (text.find_first_not_of("\r\n") == text.npos)
        return "";
    int depth = 0;
    for (size_t at = 0; at < text.size(); ++at) {
        bool isEnd = text.compare(at, 2, "\r\n") == 0;
        at += isEnd;
        bool isEnter = text[at] == '\r' || text[at] == '\n';
        if (!isEnter || (depth > 0 && !isEnd)) {
            read += isEnter ? '\n' : text[at];
            depth = Deepen(depth, text[at]);
        } else {
            read += "\r\n";
            depth = 0;
        }
    }
    return EndLast(read);
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

void Preamble_Store(BibFile *file, const std::string &text)
{
    memcpy(file->preamble, text.c_str(), text.size() + 1);
}

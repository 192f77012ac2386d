// ui/PreambleText.cpp - the preamble of a file, as the text of a control and back.
#include "ui/PreambleText.h"

#include <algorithm>
#include <cstring>

#include "session/FieldCheck.h"
#include "session/Values.h"

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

// A piece of the stored preamble.
struct OldPiece {
    std::string bytes;
    std::wstring shown;
    bool isKept;
    int place; // index of the typed piece that it is, or became; -1 for none
};

static std::vector<OldPiece> OldPieces(const char *stored, const EncodingRecord *encoding)
{
    std::vector<OldPiece> pieces;
    for (const std::string &bytes : SplitPieces(stored))
        pieces.push_back({bytes, Value_Show(bytes.c_str(), encoding), false, -1});
    return pieces;
}

// The old piece for each typed one that is shown like it; null for none. What stands before and
// behind all changes comes first; in between, an old one serves again only when no other is left.
static std::vector<OldPiece *> MatchPieces(const std::vector<std::wstring> &typed,
                                           std::vector<OldPiece> *old)
{
    std::vector<OldPiece *> matches(typed.size());
    auto take = [&](size_t i, OldPiece *piece) {
        if (!piece->isKept)
            piece->place = static_cast<int>(i);
        piece->isKept = true;
        matches[i] = piece;
    };
    size_t first = 0, same = 0, most = std::min(typed.size(), old->size());
    for (; first < most && typed[first] == (*old)[first].shown; ++first)
        take(first, &(*old)[first]);
    for (; same < most - first &&
           typed[typed.size() - same - 1] == (*old)[old->size() - same - 1].shown;
         ++same)
        take(typed.size() - same - 1, &(*old)[old->size() - same - 1]);
    for (bool mayServeAgain : {false, true})
        for (size_t i = first; i < typed.size() - same; ++i)
            for (OldPiece &piece : *old)
                if (!matches[i] && piece.shown == typed[i] && (mayServeAgain || !piece.isKept))
                    take(i, &piece);
    return matches;
}

// A typed piece that is new, and stands where an old one is missing, is what became of that.
static void PlaceEdited(std::vector<OldPiece> *old, const std::vector<OldPiece *> &matches)
{
    size_t next = 0;
    for (OldPiece &piece : *old) {
        if (piece.isKept)
            next = static_cast<size_t>(piece.place) + 1;
        else if (next < matches.size() && !matches[next])
            piece.place = static_cast<int>(next++);
    }
}

PreambleEdit Preamble_Read(const std::wstring &typed, const char *stored,
                           const EncodingRecord *encoding)
{
    PreambleEdit edit;
    std::vector<OldPiece> old = OldPieces(stored, encoding);
    std::vector<std::wstring> pieces;
    if (typed.find_first_not_of(L"\r\n") != typed.npos)
        pieces = TypedPieces(typed);
    std::vector<OldPiece *> matches = MatchPieces(pieces, &old);
    PlaceEdited(&old, matches);
    for (size_t i = 0; i < pieces.size(); ++i) {
        if (!matches[i])
            edit.touched += pieces[i] + L'\n';
        edit.text += (matches[i] ? matches[i]->bytes : Value_Read(pieces[i], encoding)) + "\r\n";
    }
    for (const OldPiece &piece : old) {
        edit.places.push_back(piece.place);
        if (!piece.isKept)
            edit.replaced += piece.bytes;
    }
    return edit;
}

// --- Checking ---

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
    for (const std::string &piece : SplitPieces(text)) {
        FieldFacts field = {};
        field.value = piece;
        field.isChanged = true;
        if (const char *reason = FieldCheck_Refusal(field))
            faults.push_back({piece, reason});
    }
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

// ui/StringRules.cpp - decisions of the window for abbreviations that need no window.
#include "ui/StringRules.h"

#include <algorithm>
#include <iterator>

enum { LONGEST_REPEAT = 1000 }; // milliseconds between two presses by a key that is held down

int CurrentStringSource = STRINGS_OF_ALL_FILES;

// --- Sources ---

int Strings_FitSource(const StringSources *sources, int source)
{
    if (sources->set->count == 1)
        return 0;
    bool isThere = source < sources->set->count && source >= -Strings_FirstFile(sources);
    return isThere ? source : STRINGS_OF_ALL_FILES;
}

BibFile *Strings_WritableFile(const StringSources *sources, int source)
{
    if (source < 0 || source >= sources->set->count)
        return nullptr;
    BibFile *file = sources->set->files[source];
    return file->readOnly ? nullptr : file;
}

// --- Lines ---

LineChange Strings_Compare(const std::vector<StringLine> &before,
                           const std::vector<StringLine> &after)
{
    auto start = std::mismatch(before.begin(), before.end(), after.begin(), after.end());
    auto end = std::mismatch(before.rbegin(), std::make_reverse_iterator(start.first),
                             after.rbegin(), std::make_reverse_iterator(start.second));
    return {static_cast<size_t>(start.first - before.begin()),
            static_cast<size_t>(end.first.base() - start.first),
            static_cast<size_t>(end.second.base() - start.second)};
}

// --- Commands ---

static const StringCommand Commands[] = {
    {'A', ID_STRING_ADD, "Add New String ..."},
    {'D', ID_STRING_REMOVE, "Delete String ..."},
    {'E', ID_STRING_EDIT, "Edit String ..."},
};

const StringCommand *Strings_FindCommand(int key)
{
    for (const StringCommand &command : Commands)
        if (command.key == key)
            return &command;
    return nullptr;
}

// The release may go to another window, so a press counts again after a while.
bool Strings_IsHeld(int32_t *last, int32_t now)
{
    const int32_t before = *last;
    *last = now;
    return before != 0 && now - before < LONGEST_REPEAT;
}

// session/Changes.cpp - every change of the records of an open file.
#include "session/Changes.h"

#include <cstdlib>
#include <cstring>
#include <utility>
#include <vector>

#include "base/Log.h"
#include "session/EntryRules.h"
#include "store/BibOutside.h"
#include "store/BibRecords.h"

// --- What all have in common ---

static int Done(const BibFileSet *set, BibFile *file)
{
    ++file->modified;
    if (set && set->changed)
        set->changed(set->boxOwner);
    return 1;
}

void Change_Count(const BibFileSet *set, BibFile *file)
{
    Done(set, file);
}

// What has left its file. Nobody can ask for it back.
static void GiveUp(BibEntry *entry)
{
    Bib_FreeEntry(entry);
}

static void GiveUp(BibString *string)
{
    Bib_FreeString(string);
}

static void GiveUp(char *text)
{
    free(text);
}

static char *CopyText(const char *text)
{
    return Bib_CopyText(text, strlen(text));
}

// --- Entries ---

BibEntry *Change_AddEntry(const BibFileSet *set, BibFile *file, const char *key,
                          const char *typeName, const char *specs, const BibEntry *parent)
{
    char *parentKey = parent ? CopyText(parent->key) : nullptr;
    bool complete = parentKey || !parent;
    BibEntry *entry = complete ? Bib_NewEntry(file, key, typeName, specs, 0) : nullptr;
    if (!entry) {
        free(parentKey);
        return nullptr;
    }
    if (parentKey && Bib_FindField(entry, "crossref") == 0)
        std::swap(entry->fields[0].value, parentKey);
    free(parentKey);
    Done(set, file);
    return entry;
}

BibEntry *Change_MakeEntry(const BibEntry *like, int type, const BibField *fields, int count)
{
    char *key = CopyText(like->key);
    BibEntry *entry = Bib_AllocEntry(count);
    bool complete = key && entry;
    for (int i = 0; i < count; ++i)
        complete = complete && fields[i].value;
    if (!complete) {
        for (int i = 0; i < count; ++i)
            free(fields[i].value);
        free(key);
        free(entry);
        return nullptr;
    }
    entry->type = type;
    entry->key = key;
    entry->reserved = like->reserved;
    for (int i = 0; i < count; ++i)
        entry->fields[i] = fields[i];
    return entry;
}

int Change_ReplaceEntry(const BibFileSet *set, BibFile *file, BibEntry *old, BibEntry *entry)
{
    BibEntry **link = Bib_FindLink(file, old);
    if (!link) {
        AppLog("ERROR: Can't locate our entry inside BIB-file data");
        return 0;
    }
    Outside_MoveEntry(file, old, entry);
    entry->next = old->next;
    *link = entry;
    GiveUp(old);
    return Done(set, file);
}

int Change_SetType(const BibFileSet *set, BibFile *file, BibEntry *entry, int type)
{
    entry->type = type;
    return Done(set, file);
}

// A text of a record, and what it shall be.
struct NewText {
    char **place;
    char *text; // heap; null when memory is out
};

static std::vector<NewText> RenamedTexts(BibFile *file, BibEntry *entry, const char *key)
{
    std::vector<NewText> texts = {{&entry->key, CopyText(key)}};
    for (BibEntry *other = file->entries; other && other != entry; other = other->next) {
        int reference = Entry_FindReference(other, entry->key);
        if (reference >= 0)
            texts.push_back({&other->fields[reference].value, CopyText(key)});
    }
    return texts;
}

int Change_RenameEntry(const BibFileSet *set, BibFile *file, BibEntry *entry, const char *key)
{
    AppLog("Fix crossref's on the entry: ", entry->key);
    std::vector<NewText> texts = RenamedTexts(file, entry, key);
    bool complete = true;
    for (const NewText &text : texts)
        complete = complete && text.text;
    for (NewText &text : texts) {
        if (complete)
            std::swap(*text.place, text.text);
        GiveUp(text.text);
    }
    return complete ? Done(set, file) : 0;
}

int Change_RemoveEntry(const BibFileSet *set, BibFile *file, BibEntry *entry)
{
    BibEntry **link = Bib_FindLink(file, entry);
    if (!link) {
        AppLog("DELETEENTRY: ", "Current entry not found.");
        return 0;
    }
    Outside_HandOnEntry(file, entry);
    *link = entry->next;
    GiveUp(entry);
    return Done(set, file);
}

// --- Abbreviations ---

// The pointer of the file's list that leads to the abbreviation; with null, its last one.
static BibString **FindLink(BibFile *file, const BibString *string)
{
    BibString **link = &file->strings;
    while (*link && *link != string)
        link = &(*link)->next;
    return link;
}

int Change_AddString(const BibFileSet *set, BibFile *file, const char *name, const char *value)
{
    BibString *string = static_cast<BibString *>(Bib_Alloc(sizeof(BibString)));
    char *nameCopy = CopyText(name);
    char *valueCopy = CopyText(value);
    if (!string || !nameCopy || !valueCopy) {
        free(string);
        free(nameCopy);
        free(valueCopy);
        return 0;
    }
    *string = {nullptr, nameCopy, valueCopy};
    *FindLink(file, nullptr) = string;
    return Done(set, file);
}

int Change_SetString(const BibFileSet *set, BibFile *file, BibString *string, const char *value)
{
    char *copy = CopyText(value);
    if (!copy)
        return 0;
    std::swap(string->value, copy);
    GiveUp(copy);
    return Done(set, file);
}

int Change_RemoveString(const BibFileSet *set, BibFile *file, BibString *string)
{
    BibString **link = FindLink(file, string);
    if (!*link) {
        AppLog("ERROR: Can't locate the string inside BIB-file data: ", string->name);
        return 0;
    }
    Outside_HandOnString(file, string);
    *link = string->next;
    GiveUp(string);
    return Done(set, file);
}

// --- The preamble ---

int Change_SetPreamble(const BibFileSet *set, BibFile *file, const char *text, const int *places,
                       int count)
{
    size_t length = strlen(text);
    if (length >= BIB_PREAMBLE_SIZE) {
        AppLog("ERROR: Preamble too long in ", file->path);
        return 0;
    }
    Outside_MovePieces(file, places, count);
    memcpy(file->preamble, text, length + 1);
    return Done(set, file);
}

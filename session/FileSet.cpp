// session/FileSet.cpp - the open files of a run.

#include "session/FileSet.h"

#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <string>

#include "base/Ascii.h"
#include "base/Log.h"
#include "base/Sys.h"

// --- The set ---

static void AppendFile(BibFile ***files, int *count, BibFile *file)
{
    size_t size = (static_cast<size_t>(*count) + 1) * sizeof **files;
    BibFile **larger = static_cast<BibFile **>(realloc(*files, size));
    if (!larger) {
        fprintf(stderr, "Can't allocate %d bytes\n", static_cast<int>(size));
        exit(1);
    }
    *files = larger;
    larger[(*count)++] = file;
}

void FileSet_Append(BibFileSet *set, BibFile *file)
{
    AppendFile(&set->files, &set->count, file);
}

void FileSet_PutAside(BibFileSet *set, BibFile *file)
{
    AppendFile(&set->aside, &set->asideCount, file);
}

void FileSet_TakeBack(BibFileSet *set)
{
    for (int i = 0; i < set->asideCount; ++i)
        FileSet_Append(set, set->aside[i]);
    free(set->aside);
    set->aside = nullptr;
    set->asideCount = 0;
}

static void AppendText(char **heapText, const std::string &more)
{
    size_t length = *heapText ? strlen(*heapText) : 0;
    char *text = static_cast<char *>(realloc(*heapText, length + more.size() + 1));
    if (!text)
        return;
    *heapText = text;
    memcpy(text + length, more.c_str(), more.size() + 1);
}

static std::string Format(const char *format, va_list arguments)
{
    va_list again;
    va_copy(again, arguments);
    int length = vsnprintf(nullptr, 0, format, arguments);
    std::string text(static_cast<size_t>(length) + 1, '\0');
    vsnprintf(text.data(), text.size(), format, again);
    va_end(again);
    text.pop_back();
    return text;
}

void FileSet_AppendError(BibFileSet *set, const char *format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    AppendText(&set->loadErrors, Format(format, arguments));
    va_end(arguments);
}

// 1 when the record at `index` stands further up in the list as well.
static int IsRepeated(const BibFileSet *set, int index)
{
    for (int i = 0; i < index; ++i)
        if (set->files[i] == set->files[index])
            return 1;
    return 0;
}

static void ClearSaveErrors(BibFileSet *set)
{
    free(set->saveErrors);
    set->saveErrors = nullptr;
}

void FileSet_Free(BibFileSet *set)
{
    FileSet_TakeBack(set);
    for (int i = set->count - 1; i >= 0; --i) {
        if (IsRepeated(set, i))
            continue;
        Sys_UnlockFile(set->files[i]->lockHandle);
        Bib_FreeFile(set->files[i]);
    }
    free(set->files);
    free(set->loadErrors);
    ClearSaveErrors(set);
    set->files = nullptr;
    set->loadErrors = nullptr;
    set->count = 0;
}

int FileSet_EntryCount(const BibFileSet *set)
{
    int count = 0;
    for (int i = 0; i < set->count; ++i)
        for (const BibEntry *entry = set->files[i]->entries; entry; entry = entry->next)
            ++count;
    return count;
}

static int IsModified(const BibFileSet *set, int index)
{
    return set->files[index]->modified != 0 && !IsRepeated(set, index);
}

int FileSet_ModifiedCount(const BibFileSet *set)
{
    int count = 0;
    for (int i = 0; i < set->count; ++i)
        count += IsModified(set, i);
    return count;
}

// Paths that differ in case name one file when the system says so, or cannot say.
static int IsSamePath(const char *a, const char *b)
{
    if (strcmp(a, b) == 0)
        return 1;
    if (Ascii_Compare(a, b) != 0)
        return 0;
    return Sys_SameFile(a, b) || (!Sys_FileExists(a) && !Sys_FileExists(b));
}

int FileSet_Find(const BibFileSet *set, const char *path)
{
    for (int i = 0; i < set->count; ++i)
        if (IsSamePath(set->files[i]->path, path))
            return i;
    return -1;
}

// --- Opening and locking ---

// What the user reads when the lock of `path` was not to be had.
static std::string LockFailureText(const char *path, const SysReason &why)
{
    return std::string("File: `") + path + "'\n" + why.text;
}

static void ReportLockFailure(const BibFileSet *set, const char *caption, const std::string &text)
{
    if (set->box)
        set->box(set->boxOwner, caption, text.c_str());
    AppLog("ERROR: ", text.c_str());
}

// A file with errors is never written back: what the parser dropped would be lost.
static void Protect(BibFile *file)
{
    file->readOnlyByErrors = 1;
    file->readOnly = 1;
    Sys_UnlockFile(file->lockHandle);
    file->lockHandle = 0;
}

// Loads and appends; the lock goes to the record or is released.
static int Load(BibFileSet *set, const char *path, int lock, int readOnly)
{
    AppLog("Loading: ", path);
    BibFile *file = Bib_LoadFile(path);
    if (!file) {
        FileSet_AppendError(set, "ERROR: The file '%s' not found\n", path);
        Sys_UnlockFile(lock);
        return 1;
    }
    file->lockHandle = lock;
    if (readOnly)
        file->readOnly = 1;
    FileSet_Append(set, file);
    if (file->errorCount != 0 && !file->readOnly)
        Protect(file);
    return file->errorCount;
}

int FileSet_Open(BibFileSet *set, const char *path)
{
    if (!Sys_IsWritable(path))
        return Load(set, path, 0, 0);
    // Named a second time in one run: only the first record may be edited.
    if (Sys_IsLockedHere(path))
        return Load(set, path, 0, 1);
    SysReason why = {};
    int lock = Sys_LockFile(path, &why);
    if (lock != 0)
        return Load(set, path, lock, 0);
    std::string text = LockFailureText(path, why);
    ReportLockFailure(set, "Openning BIB file", text); // misspelt, stands so
    FileSet_AppendError(set, "ERROR: %s\n", text.c_str());
    return 1;
}

// --- Saving ---

static int SaveRecord(BibFileSet *set, BibFile *file, int isLast)
{
    int wasLocked = file->lockHandle != 0;
    Sys_UnlockFile(file->lockHandle);
    file->lockHandle = 0;
    int saved = Bib_SaveFile(file);
    if (!saved)
        AppendText(&set->saveErrors,
                   "File: `" + std::string(file->path) + "'\n" + Bib_SaveReason() + "\n");
    if (!wasLocked || (saved && isLast))
        return saved;
    SysReason why = {};
    file->lockHandle = Sys_LockFile(file->path, &why);
    if (file->lockHandle == 0)
        ReportLockFailure(set, "ReLocking BIB file", LockFailureText(file->path, why)); // stands so
    return saved;
}

int FileSet_SaveOne(BibFileSet *set, BibFile *file)
{
    ClearSaveErrors(set);
    return SaveRecord(set, file, 0);
}

int FileSet_SaveLast(BibFileSet *set, BibFile *file)
{
    ClearSaveErrors(set);
    return SaveRecord(set, file, 1);
}

int FileSet_SaveAll(BibFileSet *set)
{
    ClearSaveErrors(set);
    int modified = 0;
    int failed = 0;
    for (int i = 0; i < set->count; ++i) {
        if (!IsModified(set, i))
            continue;
        ++modified;
        failed += !SaveRecord(set, set->files[i], 0);
    }
    return modified > 0 && failed == 0;
}

std::string FileSet_ModifiedPaths(const BibFileSet *set)
{
    std::string text;
    for (int i = 0; i < set->count; ++i)
        if (IsModified(set, i))
            text += std::string(set->files[i]->path) + "\n";
    return text;
}

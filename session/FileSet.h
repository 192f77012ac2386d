// session/FileSet.h - the open files of a run: find, lock, count, save all.
// The set owns its records; a record that is listed twice is closed and freed once.
#pragma once

#include <string>

#include "store/BibStore.h"

struct BibFileSet {
    BibFile **files; // heap, `count` pointers, in the order of the command line
    int count;
    BibFile **aside;  // heap, `asideCount` pointers: open files that a command line has taken off
    int asideCount;   // the list; the next one lists them again or closes them
    char *loadErrors; // heap: what could not be opened, for the messages window; null when nothing
    char *saveErrors; // heap: what the last of the FileSet_Save functions could not write, one
                      // "File: `path'\nreason\n" each; null when it wrote everything
    // Shows a warning with an OK button and returns when it is closed. Null: only the log.
    void (*box)(void *owner, const char *caption, const char *text);
    // Told after each change of an open file (Changes.h); what was taken away is freed by then.
    // Null: nobody.
    void (*changed)(void *owner);
    void *boxOwner; // of both
};

void FileSet_Append(BibFileSet *set, BibFile *file);
void FileSet_PutAside(BibFileSet *set, BibFile *file); // the caller takes it off the list
void FileSet_TakeBack(BibFileSet *set);                // lists all that were put aside, at the end
void FileSet_AppendError(BibFileSet *set, const char *format, ...)
    __attribute__((format(printf, 2, 3))); // to loadErrors
void FileSet_Free(BibFileSet *set);        // unlocks and frees every file; saves nothing

int FileSet_EntryCount(const BibFileSet *set);    // as many as the list has rows
int FileSet_ModifiedCount(const BibFileSet *set); // files with unsaved changes

// The index of the first file that is at `path` ignoring case; -1 for none. Two paths that differ
// in case and are two files on this system are different.
int FileSet_Find(const BibFileSet *set, const char *path);

// Opens the file at `path`: takes the lock when the file is writable, loads it, appends it, and
// makes it read-only when it has errors. A file that this process holds locked already is loaded
// as a read-only second record, without a word. Returns the number of errors to count; what went
// wrong is in loadErrors, in the file's messages and in the log.
int FileSet_Open(BibFileSet *set, const char *path);

// Unlocks, writes and locks one file again. 1, or 0 when the write failed. A failed lock is
// shown and logged, and leaves the file saved and unlocked.
int FileSet_SaveOne(BibFileSet *set, BibFile *file);

// The same for a file that is closed next: once it is saved, it stays unlocked.
int FileSet_SaveLast(BibFileSet *set, BibFile *file);

// Saves every modified file. -1 is never returned here: the question is the panel's.
// 0 when nothing was modified or a write failed, 1 when all were saved.
int FileSet_SaveAll(BibFileSet *set);

// The paths of the files with unsaved changes, one a line.
std::string FileSet_ModifiedPaths(const BibFileSet *set);

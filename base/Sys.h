// base/Sys.h - what the program asks of the operating system.
//
// Includes no system header. The section on files, and those on errors, time and the executable,
// are in SysFiles-posix.cpp, the others in the file of their name: SysPlaces, SysNote, SysProgram,
// SysSocket and SysChild.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>

// --- Errors and the executable ---

// Why a call failed. Functions that can fail for many reasons take one as their last argument and
// fill it when they fail, and only then; null: nobody wants to know. What is called later leaves it
// alone.
struct SysReason {
    char text[256]; // in the system's words, for the user
    int isTaken;    // somebody else holds the lock (Sys_LockFile)
};

const char *Sys_LastErrorText();     // the system's text for the last error, to be asked right
                                     // after it; static buffer. Our own code uses SysReason
char *Sys_ToBackslashes(char *path); // every '/' becomes '\', in place; null stays null
const char *Sys_ModulePath();        // full path of the executable, at most 260 characters

// --- Files ---

int Sys_FileExists(const char *path);           // 1 also for folders and devices
int Sys_IsWritable(const char *path);           // 1 when it exists and may be written
int Sys_SameFile(const char *a, const char *b); // 1 when both exist and are one file

// A number that changes when the file is written or replaced; 0 when there is no such file, or
// when it is not a regular one.
uint64_t Sys_FileStamp(const char *path);
uint64_t Sys_StreamStamp(FILE *stream);

// Opens a regular file for reading; anything else (folder, device, pipe) fails without waiting.
// Null on failure.
FILE *Sys_OpenRegular(const char *path, SysReason *why = nullptr);

// Reads the rest of a stream. A malloc'd buffer with one spare byte behind `*length` bytes, or
// null when reading fails or memory is out.
char *Sys_ReadAll(FILE *stream, size_t *length, SysReason *why = nullptr);

// Writes to a stream, which may keep a part in its buffer. 1, or 0 when something is lost.
int Sys_WriteStream(FILE *stream, const void *data, size_t size, SysReason *why = nullptr);

// Opens `path` (created when missing) and shuts other writers out; readers stay welcome.
// Returns a handle, never 0; on failure 0.
int Sys_LockFile(const char *path, SysReason *why = nullptr);
void Sys_UnlockFile(int handle);        // 0 is ignored
int Sys_IsLockedHere(const char *path); // 1 when this process holds the lock of that file

// Keeps the contents of `path`, which will be replaced, under a second name: by a link, or by a
// copy where the file system has no links or `copy` is on another one. Of a symbolic link the
// target is kept. Never replaces anything: fails when `copy` exists. 1 or 0.
int Sys_KeepCopy(const char *path, const char *copy, SysReason *why = nullptr);

int Sys_RemoveFile(const char *path, SysReason *why = nullptr); // 1 or 0

// Writing to a closed pipe or beyond a size limit fails like any other write from now on, instead
// of ending the process with all that is not saved. Call once, at the start.
void Sys_SurviveFailedWrites();

// Gives a process that was started without standard input, output or error the null device for
// it, so that no other file takes the number and gets what is printed. Call once, before all else.
void Sys_FillStandard();

// Replacing a file in one step: new contents go to a temporary file in the same folder, and
// Sys_CommitReplace puts it in place of the path (of its target, when it is a symbolic link)
// after it reached the disk, with the old file's mode and, where allowed, owner. Until then, and
// when anything fails, the path is untouched.
struct SysReplace {
    FILE *stream;    // write here; ours
    char *target;    // heap: the file that will be replaced
    char *temporary; // heap
};

// 1, or 0 with nothing to clean up.
int Sys_StartReplace(SysReplace *replace, const char *path, SysReason *why = nullptr);

// Frees. 1, or 0 with the path untouched: also for an earlier write that failed, but why it did was
// known then only (Sys_WriteStream).
int Sys_CommitReplace(SysReplace *replace, SysReason *why = nullptr);

void Sys_CancelReplace(SysReplace *replace); // frees; removes the temporary file

// --- Time and places ---

int32_t Sys_Milliseconds();                       // a tick count for differences
int Sys_TimeLeft(int32_t end);                    // ticks until then; 0 when that is over
int Sys_CurrentFolder(char *buffer, size_t size); // 1, or 0 when it does not fit

// Where the user's programs keep files; malloc'd.
char *Sys_ConfigFolder(); // $XDG_CONFIG_HOME, else ~/.config
char *Sys_DataFolder();   // $XDG_DATA_HOME, else ~/.local/share

// The path by which the user's processes meet under `name`, a text of any form: a file named by a
// number made of it, with `ending`, in a folder that nobody else can enter
// ($XDG_RUNTIME_DIR/quarlo, else one in the temporary folder). malloc'd; null when there is no such
// folder and none can be made.
char *Sys_PrivatePath(const char *name, const char *ending, SysReason *why = nullptr);

// Leaves a text for the user's other processes at `path`; it stands while this process lives,
// however that ends, and not for children that outlive it. It takes the place of an older text in
// one step, also of another process's. 1 or 0.
int Sys_PostNote(const char *path, const char *text, SysReason *why = nullptr);

// The text there; malloc'd, at most 4 KiB. Null for none, or when its process has ended.
char *Sys_ReadNote(const char *path);

const char *Sys_LoginName(); // of the user; a number when the account has no name

// --- Other programs ---

// Runs a program and waits for its end, for `milliseconds` at most: then it is ended. `argv` ends
// with null; a name without a slash is looked for in PATH; no shell is involved. The program reads
// nothing, and what it writes to standard error is dropped. Returns its output, malloc'd, with the
// status it left with; null when it could not be started, crashed, or was ended: with all that it
// had started, also for an output of more than 1 MiB.
char *Sys_RunForOutput(const char *const *argv, int milliseconds, int *status);

int Sys_IsProgram(const char *path); // 1 when it is a file that may be started

// --- Folders ---

// The path of the first file called `name` in `folder`, and with `deep` in the folders below it,
// nearest first; malloc'd, null for none. Links to folders are not followed, and a bounded number
// of folders is looked at.
char *Sys_FindFile(const char *folder, const char *name, int deep);

// --- Local sockets: byte streams between the processes of one user ---
// A socket is a number above 2; it never waits, and started programs do not inherit it.

// Listens at `path` (mode 0600). A socket file that nobody serves is replaced; any other file is
// left alone. Some 250 peers may wait to be accepted; further ones try again until their deadline.
// 0 on failure.
int Sys_ListenLocal(const char *path, SysReason *why = nullptr);

// The next peer that waits; 0 for none. A peer of another user is turned away.
int Sys_AcceptLocal(int listener);

// Connects to who serves `path`, within `milliseconds`. 0 on failure. A server of another user is
// not trusted.
int Sys_ConnectLocal(const char *path, int milliseconds, SysReason *why = nullptr);

// The count of bytes; 0 when nothing can be read or written now, -1 when the other side is gone.
long Sys_Receive(int socket, void *buffer, size_t size);
long Sys_Send(int socket, const void *data, size_t size);

// 1 when it can be read (written) within `milliseconds`, or has failed.
int Sys_WaitReadable(int socket, int milliseconds);
int Sys_WaitWritable(int socket, int milliseconds);

// Says that nothing more will be sent, and waits for the other side to end: 1 when it did and had
// read everything, 0 when it broke off before, -1 when it has not ended within `milliseconds`. What
// it still sends is dropped.
int Sys_FinishSending(int socket, int milliseconds);

void Sys_CloseSocket(int socket);
void Sys_CloseListener(int listener, const char *path); // removes the socket file, if it is ours

// --- A child process that works for this one ---

// What a child is given: all that it may know of this process, since a system that can't copy one
// starts the program again. Whatever else a task needs, what is selected or set, goes into `bytes`.
struct SysInput {
    const void *bytes; // a block of any form, but without pointers: the child may have a copy of it
    size_t size;
    FILE *stream; // the child reads it, from where it stands; nobody else does, and it stays open,
                  // up to Sys_EndChild. Null for none
};

// What a child can do, by name: a program that is started again gets `--child NAME`, and turns to
// that row of its table before anything else.
struct SysTask {
    const char *name;
    void (*run)(const SysInput *input);
};

struct SysChild {
    int pid;
    int pipe;  // what the child writes
    int ended; // the pipe's end was read: the child is leaving
};

enum SysChildEnd {
    SYS_CHILD_DONE,      // left with status 0
    SYS_CHILD_LEFT,      // left with another status
    SYS_CHILD_CRASHED,   // ended by a signal
    SYS_CHILD_TIME_LIMIT // used up its CPU time
};

// Runs the task in a process of its own, with at most `cpuSeconds` of CPU time and no core file.
// It has no other thread and leaves when the task returns. 1, or 0 with the reason. The block may
// be freed after that.
int Sys_StartChild(SysChild *child, const SysTask *task, const SysInput *input, int cpuSeconds,
                   SysReason *why);

// What the child wrote next: the count of bytes, 0 at the end, -1 when nothing came for `seconds`.
long Sys_ReadChild(SysChild *child, void *buffer, size_t size, int seconds);

// Ends the child if it still runs, and waits for it.
SysChildEnd Sys_EndChild(SysChild *child);

// In the child.
int Sys_WriteParent(const void *data, size_t size);  // 1, or 0 when the parent is gone
[[noreturn]] void Sys_LeaveChild(int status);        // at once: no exit handlers, no flushing
void Sys_OnChildCrash(void (*handler)());            // runs on a stack of its own, then the child
                                                     // ends as it would have
FILE *Sys_OpenText(const char *text, size_t length); // a stream over memory, for one thread
void Sys_UsePlainLocale();                           // letters and cases are ASCII's

// --- Libraries ---

// The function of a library that one of this program with the same name has replaced.
void *Sys_ReplacedFunction(const char *name);

// base/SysNote-posix.cpp - texts that stand while their process lives, for POSIX systems.
//
// The process holds a record lock on the file, which the system takes away when the process ends,
// whatever ends it. Here this lock is better than that of flock: children do not inherit it. What
// it costs is that closing any descriptor of the file drops it, so a process never opens a note of
// its own a second time.

#include "base/Sys-posix.h"
#include "base/Sys.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

static const size_t LONGEST_NOTE = 4096;

namespace
{

struct Note {
    std::string path;
    int fd;
    pid_t owner; // a forked child has a copy of the list, but not the locks
};

} // namespace

static std::vector<Note> Notes;

static int IsOpenAt(int fd, const char *path)
{
    struct stat opened, named;
    return fstat(fd, &opened) == 0 && lstat(path, &named) == 0 && opened.st_dev == named.st_dev &&
           opened.st_ino == named.st_ino;
}

// The descriptor of our own note that stands at the path; -1 for none.
static int OwnNote(const char *path)
{
    for (const Note &note : Notes)
        if (note.owner == getpid() && IsOpenAt(note.fd, path))
            return note.fd;
    return -1;
}

static struct flock WholeFile(short type)
{
    struct flock lock = {};
    lock.l_type = type;
    lock.l_whence = SEEK_SET;
    return lock;
}

static int LockAndWrite(int fd, const char *text)
{
    struct flock lock = WholeFile(F_WRLCK);
    size_t length = strlen(text);
    if (length > LONGEST_NOTE)
        return Sys_FailWith(EFBIG);
    if (fcntl(fd, F_SETLK, &lock) != 0)
        return 0;
    ssize_t written = write(fd, text, length);
    if (written >= 0 && written < static_cast<ssize_t>(length))
        return Sys_FailWith(ENOSPC); // a part of it has found room
    return written >= 0;
}

static void Remember(const char *path, int fd)
{
    for (Note &note : Notes)
        if (note.path == path) {
            close(note.fd); // another file by now
            note.fd = fd;
            note.owner = getpid();
            return;
        }
    Notes.push_back({path, fd, getpid()});
}

// The file is complete and locked before it gets its name, so that nobody sees it otherwise.
int Sys_PostNote(const char *path, const char *text, SysReason *why)
{
    std::string temporary = std::string(path) + "." + std::to_string(getpid());
    unlink(temporary.c_str()); // of a process that had our number
    int fd = Sys_MoveOffStandard(
        open(temporary.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC | O_NOFOLLOW, 0600));
    if (fd < 0)
        return Sys_TellWhy(why);
    if (LockAndWrite(fd, text) && rename(temporary.c_str(), path) == 0) {
        Remember(path, fd);
        return 1;
    }
    Sys_TellWhy(why);
    int reason = errno;
    unlink(temporary.c_str());
    close(fd);
    return Sys_FailWith(reason);
}

static char *ReadText(int fd)
{
    char text[LONGEST_NOTE + 1];
    ssize_t length = pread(fd, text, LONGEST_NOTE, 0);
    if (length < 0)
        return nullptr;
    text[length] = 0;
    return strdup(text);
}

static int IsLockedByAnother(int fd)
{
    struct flock lock = WholeFile(F_RDLCK);
    return fcntl(fd, F_GETLK, &lock) == 0 && lock.l_type != F_UNLCK;
}

// Sets `*stands` when another process holds the note; its text then.
static char *ReadOpened(int fd, int *stands)
{
    *stands = IsLockedByAnother(fd);
    return *stands ? ReadText(fd) : nullptr;
}

char *Sys_ReadNote(const char *path)
{
    int own = OwnNote(path);
    if (own >= 0)
        return ReadText(own);
    // A note that was replaced between opening it and looking at its lock says nothing.
    int stands = 0, replaced = 1;
    char *text = nullptr;
    for (int attempt = 0; attempt < 100 && !stands && replaced; ++attempt) {
        int fd = open(path, O_RDONLY | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY);
        if (fd < 0)
            return nullptr;
        text = ReadOpened(fd, &stands);
        replaced = !IsOpenAt(fd, path);
        close(fd);
    }
    return text;
}

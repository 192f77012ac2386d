// base/SysFiles-posix.cpp - files, locks, time and places, for POSIX systems.

#include "base/Sys-posix.h"
#include "base/Sys.h"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <string>
#include <vector>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

// Descriptors of the locks that this process holds.
static std::vector<int> LockHandles;

int Sys_FailWith(int error)
{
    errno = error;
    return 0;
}

void Sys_CloseQuietly(int fd)
{
    int reason = errno;
    close(fd);
    errno = reason;
}

int Sys_MoveOffStandard(int fd)
{
    if (fd < 0 || fd > STDERR_FILENO)
        return fd;
    int other = fcntl(fd, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    Sys_CloseQuietly(fd);
    return other;
}

static void RemoveQuietly(const char *path)
{
    int reason = errno;
    unlink(path);
    errno = reason;
}

// --- Errors and places ---

int Sys_TellWhy(SysReason *why)
{
    int error = errno;
    if (why) {
        const char *text =
            error == ETXTBSY ? "The file is in use by another program" : strerror(error);
        snprintf(why->text, sizeof why->text, "%s", text);
        why->isTaken = 0;
    }
    return Sys_FailWith(error);
}

const char *Sys_LastErrorText()
{
    static SysReason last;
    Sys_TellWhy(&last);
    return last.text;
}

char *Sys_ToBackslashes(char *path)
{
    for (char *at = path; at && *at; ++at)
        if (*at == '/')
            *at = '\\';
    return path;
}

const char *Sys_ModulePath()
{
    static char path[260 + 1];
    if (path[0] == 0) {
        ssize_t length = readlink("/proc/self/exe", path, sizeof path - 1);
        path[length > 0 ? length : 0] = 0;
    }
    return path;
}

int32_t Sys_Milliseconds()
{
    struct timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    uint64_t ticks = static_cast<uint64_t>(now.tv_sec) * 1000 + now.tv_nsec / 1000000;
    return static_cast<int32_t>(static_cast<uint32_t>(ticks));
}

int Sys_TimeLeft(int32_t end)
{
    int32_t left = end - Sys_Milliseconds();
    return left > 0 ? left : 0;
}

int Sys_CurrentFolder(char *buffer, size_t size)
{
    return getcwd(buffer, size) != nullptr;
}

// --- Questions about files ---

int Sys_FileExists(const char *path)
{
    struct stat status;
    return stat(path, &status) == 0;
}

int Sys_IsWritable(const char *path)
{
    return access(path, W_OK) == 0;
}

static int IsSame(const struct stat *a, const struct stat *b)
{
    return a->st_dev == b->st_dev && a->st_ino == b->st_ino;
}

int Sys_SameFile(const char *a, const char *b)
{
    struct stat first, second;
    return stat(a, &first) == 0 && stat(b, &second) == 0 && IsSame(&first, &second);
}

static int IsOpenAt(int fd, const char *path)
{
    struct stat opened, named;
    return fstat(fd, &opened) == 0 && stat(path, &named) == 0 && IsSame(&opened, &named);
}

int Sys_RemoveFile(const char *path, SysReason *why)
{
    return unlink(path) == 0 || Sys_TellWhy(why);
}

static uint64_t Stamp(const struct stat *status)
{
    if (!S_ISREG(status->st_mode))
        return 0;
    uint64_t stamp = SYS_HASH_OF_NOTHING;
    for (uint64_t word :
         {uint64_t(status->st_dev), uint64_t(status->st_ino), uint64_t(status->st_size),
          uint64_t(status->st_mtim.tv_sec), uint64_t(status->st_mtim.tv_nsec)})
        stamp = Sys_HashMore(stamp, word);
    return stamp ? stamp : 1;
}

uint64_t Sys_FileStamp(const char *path)
{
    struct stat status;
    return stat(path, &status) == 0 ? Stamp(&status) : 0;
}

uint64_t Sys_StreamStamp(FILE *stream)
{
    struct stat status;
    return fstat(fileno(stream), &status) == 0 ? Stamp(&status) : 0;
}

// --- Reading ---

// 1 when the mode is that of a regular file, else 0 with the reason in errno.
static int IsRegular(mode_t mode)
{
    if (S_ISREG(mode))
        return 1;
    return Sys_FailWith(S_ISDIR(mode) ? EISDIR : ENOTSUP);
}

// A descriptor, or -1 with the reason in errno. O_NONBLOCK: a pipe without a partner must not hang
// the program; it means nothing for regular files.
static int OpenRegular(const char *path, int flags)
{
    int fd = Sys_MoveOffStandard(open(path, flags | O_CLOEXEC | O_NOCTTY | O_NONBLOCK, 0666));
    if (fd < 0)
        return -1;
    struct stat status;
    if (fstat(fd, &status) == 0 && IsRegular(status.st_mode))
        return fd;
    Sys_CloseQuietly(fd);
    return -1;
}

FILE *Sys_OpenRegular(const char *path, SysReason *why)
{
    int fd = OpenRegular(path, O_RDONLY);
    FILE *stream = fd < 0 ? nullptr : fdopen(fd, "r");
    if (!stream)
        Sys_TellWhy(why);
    if (!stream && fd >= 0)
        Sys_CloseQuietly(fd);
    return stream;
}

// What the stream should still hold, when it is a file.
static size_t ExpectedLength(FILE *stream)
{
    struct stat status;
    off_t position = ftello(stream);
    if (fstat(fileno(stream), &status) != 0 || position < 0 || status.st_size < position)
        return 0;
    return static_cast<size_t>(status.st_size - position);
}

// Null, with the reason in errno, on failure.
static char *ReadAll(FILE *stream, size_t *length)
{
    size_t size = ExpectedLength(stream) + 1; // one more, so that the first read meets the end
    size_t used = 0;
    char *text = static_cast<char *>(malloc(size + 1));
    errno = text ? EIO : ENOMEM; // where the stream has failed before and says nothing now
    while (text) {
        used += fread(text + used, 1, size - used, stream);
        if (used < size)
            break;
        size *= 2;
        char *larger = static_cast<char *>(realloc(text, size + 1));
        if (!larger)
            free(text);
        text = larger;
    }
    if (text && ferror(stream)) {
        free(text);
        return nullptr;
    }
    *length = used;
    return text;
}

char *Sys_ReadAll(FILE *stream, size_t *length, SysReason *why)
{
    char *text = ReadAll(stream, length);
    if (!text)
        Sys_TellWhy(why);
    return text;
}

// --- Locks ---
//
// flock, because its lock belongs to the open descriptor. The classic record lock of fcntl would
// be dropped as soon as any descriptor of the file is closed, as after loading it.

static int OpenForLock(const char *path)
{
    // O_CREAT only where it is needed: in a folder like /tmp the system refuses it for files of
    // other users, even when they may be written.
    int fd = OpenRegular(path, O_RDWR);
    if (fd < 0 && errno == ENOENT)
        fd = OpenRegular(path, O_RDWR | O_CREAT);
    return fd;
}

// A file system without locks is not a reason to keep the user from the file: 1 then, too.
static int LockDescriptor(int fd)
{
    if (flock(fd, LOCK_EX | LOCK_NB) == 0 || errno == ENOLCK || errno == ENOTSUP || errno == ENOSYS)
        return 1;
    if (errno == EWOULDBLOCK)
        errno = ETXTBSY;
    return 0;
}

static int LockFile(const char *path)
{
    // A file that another program replaced between opening and locking is the wrong one.
    for (int attempt = 0; attempt < 10; ++attempt) {
        int fd = OpenForLock(path);
        if (fd < 0)
            return 0;
        if (!LockDescriptor(fd)) {
            Sys_CloseQuietly(fd);
            return 0;
        }
        if (IsOpenAt(fd, path)) {
            LockHandles.push_back(fd);
            return fd;
        }
        close(fd);
    }
    return Sys_FailWith(ETXTBSY);
}

int Sys_LockFile(const char *path, SysReason *why)
{
    int handle = LockFile(path);
    if (handle == 0)
        Sys_TellWhy(why);
    if (handle == 0 && why)
        why->isTaken = errno == ETXTBSY;
    return handle;
}

void Sys_UnlockFile(int handle)
{
    if (handle == 0)
        return;
    LockHandles.erase(std::remove(LockHandles.begin(), LockHandles.end(), handle),
                      LockHandles.end());
    flock(handle, LOCK_UN); // closing is not enough while a child holds a copy
    close(handle);
}

int Sys_IsLockedHere(const char *path)
{
    for (int handle : LockHandles)
        if (IsOpenAt(handle, path))
            return 1;
    return 0;
}

// --- Replacing a file, and keeping the old one ---

void Sys_SurviveFailedWrites()
{
    signal(SIGPIPE, SIG_IGN);
    signal(SIGXFSZ, SIG_IGN);
}

void Sys_FillStandard()
{
    int fd;
    do
        fd = open("/dev/null", O_RDWR);
    while (fd >= 0 && fd <= STDERR_FILENO);
    if (fd >= 0)
        close(fd);
}

// With the '/' at its end; "" for the current folder.
static std::string FolderOf(const char *path)
{
    const char *slash = strrchr(path, '/');
    return slash ? std::string(path, slash + 1) : std::string();
}

// Names that were added or changed reach the disk. Not every file system can; none fails for it.
static void SyncFolder(const char *path)
{
    std::string folder = FolderOf(path);
    int fd = open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (fd < 0)
        return;
    fsync(fd);
    close(fd);
}

// Some file systems have nothing to sync and say EINVAL.
static int SyncFile(int fd)
{
    return fsync(fd) == 0 || errno == EINVAL;
}

// The mode and, where the system allows it, the owner and the group. Where the group cannot be
// kept, the file's new group gets no more than everybody.
static void KeepPermissions(int fd, const struct stat *old)
{
    mode_t mode = old->st_mode & 07777;
    struct stat now;
    if (fstat(fd, &now) != 0)
        return;
    int kept = now.st_uid == old->st_uid && now.st_gid == old->st_gid;
    if (!kept && fchown(fd, old->st_uid, old->st_gid) != 0 && now.st_gid != old->st_gid &&
        fchown(fd, static_cast<uid_t>(-1), old->st_gid) != 0)
        mode = (mode & ~static_cast<mode_t>(070)) | ((mode & 07) << 3);
    // A file system without modes may refuse; the contents matter more.
    if (fchmod(fd, mode) != 0)
        return;
}

static int WriteAll(int fd, const char *data, size_t size)
{
    while (size > 0) {
        ssize_t written = write(fd, data, size);
        if (written < 0 && errno == EINTR)
            continue;
        if (written < 0)
            return 0;
        data += written;
        size -= static_cast<size_t>(written);
    }
    return 1;
}

static int CopyBytes(int from, int to)
{
    char block[16 * 1024];
    for (;;) {
        ssize_t got = read(from, block, sizeof block);
        if (got == 0)
            return 1;
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0 || !WriteAll(to, block, static_cast<size_t>(got)))
            return 0;
    }
}

static int CopyDescriptor(int from, int to)
{
    struct stat old;
    if (fstat(from, &old) != 0 || !CopyBytes(from, to))
        return 0;
    KeepPermissions(to, &old);
    return SyncFile(to);
}

static int CopyFile(const char *path, const char *copy)
{
    int from = OpenRegular(path, O_RDONLY);
    if (from < 0)
        return 0;
    int to = Sys_MoveOffStandard(open(copy, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600));
    if (to < 0) {
        Sys_CloseQuietly(from);
        return 0;
    }
    int ok = CopyDescriptor(from, to);
    Sys_CloseQuietly(from);
    if (close(to) != 0)
        ok = 0;
    if (!ok)
        RemoveQuietly(copy);
    return ok;
}

// The reasons for which the file may still be copied: no links here, or another file system.
static int IsLinkRefused(int error)
{
    return error == EPERM || error == ENOTSUP || error == ENOSYS || error == EMLINK ||
           error == EXDEV;
}

int Sys_KeepCopy(const char *path, const char *copy, SysReason *why)
{
    if (linkat(AT_FDCWD, path, AT_FDCWD, copy, AT_SYMLINK_FOLLOW) != 0 &&
        (!IsLinkRefused(errno) || !CopyFile(path, copy)))
        return Sys_TellWhy(why);
    SyncFolder(copy);
    return 1;
}

static int ReadLink(const char *path, std::string *text)
{
    char buffer[PATH_MAX];
    ssize_t length = readlink(path, buffer, sizeof buffer);
    if (length < 0)
        return 0;
    text->assign(buffer, static_cast<size_t>(length));
    return 1;
}

// The file that a chain of symbolic links leads to, which need not exist. "" when it has no end.
static std::string LinkTarget(const char *path)
{
    std::string target = path;
    std::string next;
    for (int links = 0; ReadLink(target.c_str(), &next); ++links) {
        if (links == 40) {
            errno = ELOOP;
            return std::string();
        }
        target = next[0] == '/' ? next : FolderOf(target.c_str()) + next;
    }
    return target;
}

// 1 when a new file may take the target's place, with the mode to create it with.
static int MayReplace(const char *target, mode_t *mode)
{
    struct stat old;
    if (stat(target, &old) != 0) {
        *mode = 0666;
        return errno == ENOENT;
    }
    *mode = 0600; // closed to others until it has the old file's mode
    // The folder alone decides about renaming; the file's own protection must count as well.
    return IsRegular(old.st_mode) && access(target, W_OK) == 0;
}

// A new file in the target's folder. Its name is short and its own, so that it is possible
// whatever the target's name is.
static int OpenTemporary(const char *target, mode_t mode, std::string *name)
{
    std::string start = FolderOf(target) + ".cartulo-" + std::to_string(getpid()) + "-";
    for (int n = 0; n < 100; ++n) {
        *name = start + std::to_string(n);
        int fd = open(name->c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode);
        if (fd >= 0 || errno != EEXIST)
            return Sys_MoveOffStandard(fd);
    }
    return -1;
}

static int StartReplace(SysReplace *replace, const char *path)
{
    *replace = {};
    mode_t mode;
    std::string temporary;
    std::string target = LinkTarget(path);
    if (target.empty() || !MayReplace(target.c_str(), &mode))
        return 0;
    int fd = OpenTemporary(target.c_str(), mode, &temporary);
    if (fd < 0)
        return 0;
    replace->target = strdup(target.c_str());
    replace->temporary = strdup(temporary.c_str());
    replace->stream = fdopen(fd, "w");
    if (replace->stream && replace->target && replace->temporary)
        return 1;
    if (!replace->stream)
        Sys_CloseQuietly(fd);
    RemoveQuietly(temporary.c_str());
    Sys_CancelReplace(replace);
    return 0;
}

int Sys_StartReplace(SysReplace *replace, const char *path, SysReason *why)
{
    return StartReplace(replace, path) || Sys_TellWhy(why);
}

int Sys_WriteStream(FILE *stream, const void *data, size_t size, SysReason *why)
{
    return fwrite(data, 1, size, stream) == size || Sys_TellWhy(why);
}

// What is still in the stream's buffer, and what was lost before: nobody knows why by now.
static int FlushStream(FILE *stream)
{
    if (fflush(stream) != 0)
        return 0;
    return !ferror(stream) || Sys_FailWith(EIO);
}

static int FinishTemporary(SysReplace *replace)
{
    struct stat old;
    int fd = fileno(replace->stream);
    int ok = FlushStream(replace->stream);
    if (ok && stat(replace->target, &old) == 0)
        KeepPermissions(fd, &old);
    ok = ok && SyncFile(fd);
    int reason = errno;
    int closed = fclose(replace->stream) == 0;
    replace->stream = nullptr;
    return ok ? closed : Sys_FailWith(reason);
}

int Sys_CommitReplace(SysReplace *replace, SysReason *why)
{
    if (!FinishTemporary(replace) || rename(replace->temporary, replace->target) != 0) {
        Sys_CancelReplace(replace);
        return Sys_TellWhy(why);
    }
    SyncFolder(replace->target);
    free(replace->temporary); // it is the target now
    replace->temporary = nullptr;
    Sys_CancelReplace(replace);
    return 1;
}

void Sys_CancelReplace(SysReplace *replace)
{
    int reason = errno;
    if (replace->stream)
        fclose(replace->stream);
    if (replace->temporary)
        unlink(replace->temporary);
    free(replace->target);
    free(replace->temporary);
    *replace = {};
    errno = reason;
}

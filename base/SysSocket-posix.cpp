// base/SysSocket-posix.cpp - byte streams between the user's processes, for POSIX systems.

#include "base/Sys-posix.h"
#include "base/Sys.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <string>
#include <vector>

#include <fcntl.h>
#include <poll.h>
#include <sys/file.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

namespace
{

// The socket file that a listener made.
struct Listener {
    int socket;
    dev_t device;
    ino_t file;
};

const int LOCK_TIME = 500; // milliseconds
const int PAUSE = 5;       // milliseconds between two tries
const int QUEUE = 256;     // clients that a listener lets wait

std::vector<Listener> Listeners;

} // namespace

// 0, with the reason in errno, when the path is too long for the system, or empty: that would be
// an address outside of the file system, open to everybody.
static int MakeAddress(sockaddr_un *address, const char *path)
{
    if (*path == 0)
        return Sys_FailWith(EINVAL);
    if (strlen(path) >= sizeof address->sun_path)
        return Sys_FailWith(ENAMETOOLONG);
    *address = {};
    address->sun_family = AF_UNIX;
    strcpy(address->sun_path, path);
    return 1;
}

static const sockaddr *Plain(const sockaddr_un *address)
{
    return reinterpret_cast<const sockaddr *>(address);
}

// -1, with the reason in errno, on failure.
static int OpenSocket()
{
    return Sys_MoveOffStandard(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
}

static int IsOwnUser(int socket)
{
    ucred other;
    socklen_t size = sizeof other;
    if (getsockopt(socket, SOL_SOCKET, SO_PEERCRED, &other, &size) != 0)
        return 0;
    return other.uid == geteuid() || Sys_FailWith(EACCES);
}

// --- Listening ---

// Shuts others out of what is decided about the socket files of a folder; no file is left behind.
// -1, with the reason in errno, on failure: somebody may hold the lock for long where the folder is
// everybody's.
static int LockFolderOf(const char *path)
{
    const char *slash = strrchr(path, '/');
    std::string folder = slash ? std::string(path, slash + 1) : ".";
    int fd = Sys_MoveOffStandard(open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    int32_t end = Sys_Milliseconds() + LOCK_TIME;
    while (fd >= 0 && flock(fd, LOCK_EX | LOCK_NB) != 0) {
        if (errno != EWOULDBLOCK)
            return fd; // no locks on this file system
        if (Sys_TimeLeft(end) == 0) {
            Sys_CloseQuietly(fd);
            return -1;
        }
        poll(nullptr, 0, PAUSE);
    }
    return fd;
}

// Closing is not enough while a child process holds a copy.
static void UnlockFolder(int fd)
{
    int reason = errno;
    flock(fd, LOCK_UN);
    close(fd);
    errno = reason;
}

static int IsServed(const sockaddr_un *address)
{
    int probe = OpenSocket();
    if (probe < 0)
        return 1; // nobody knows
    int refused = connect(probe, Plain(address), sizeof *address) != 0 && errno == ECONNREFUSED;
    close(probe);
    return !refused;
}

// Removes a dead socket file of ours. 0, with the reason in errno, when the path stays taken.
static int ClearPath(const sockaddr_un *address)
{
    struct stat status;
    if (lstat(address->sun_path, &status) != 0)
        return errno == ENOENT;
    if (!S_ISSOCK(status.st_mode))
        return Sys_FailWith(EEXIST);
    if (status.st_uid != geteuid())
        return Sys_FailWith(EACCES);
    if (IsServed(address))
        return Sys_FailWith(EADDRINUSE);
    return unlink(address->sun_path) == 0;
}

// The mode of the socket becomes that of its file. Those that have given up meanwhile stay in the
// queue, and have to be heard before all others: so it is not as long as it might be.
static int Bind(int socket, const sockaddr_un *address)
{
    struct stat status;
    if (fchmod(socket, 0600) != 0 || bind(socket, Plain(address), sizeof *address) != 0)
        return 0;
    if (listen(socket, QUEUE) != 0 || lstat(address->sun_path, &status) != 0) {
        int reason = errno;
        unlink(address->sun_path);
        return Sys_FailWith(reason);
    }
    Listeners.push_back({socket, status.st_dev, status.st_ino});
    return 1;
}

// 0, with the reason in errno, on failure.
static int Listen(const char *path)
{
    sockaddr_un address;
    if (!MakeAddress(&address, path))
        return 0;
    int folder = LockFolderOf(path);
    if (folder < 0)
        return 0;
    int socket = ClearPath(&address) ? OpenSocket() : -1;
    if (socket >= 0 && !Bind(socket, &address)) {
        Sys_CloseQuietly(socket);
        socket = -1;
    }
    UnlockFolder(folder);
    return socket < 0 ? 0 : socket;
}

int Sys_ListenLocal(const char *path, SysReason *why)
{
    int socket = Listen(path);
    return socket != 0 ? socket : Sys_TellWhy(why);
}

int Sys_AcceptLocal(int listener)
{
    for (;;) {
        int peer =
            Sys_MoveOffStandard(accept4(listener, nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK));
        if (peer < 0 && (errno == EINTR || errno == ECONNABORTED))
            continue;
        if (peer < 0)
            return 0;
        if (IsOwnUser(peer))
            return peer;
        close(peer);
    }
}

static int IsFileOf(const Listener &listener, const char *path)
{
    struct stat status;
    return lstat(path, &status) == 0 && status.st_dev == listener.device &&
           status.st_ino == listener.file;
}

void Sys_CloseListener(int listener, const char *path)
{
    auto found = std::find_if(Listeners.begin(), Listeners.end(),
                              [=](const Listener &item) { return item.socket == listener; });
    int folder = LockFolderOf(path);
    if (found != Listeners.end()) {
        if (IsFileOf(*found, path))
            unlink(path);
        Listeners.erase(found);
    }
    close(listener);
    if (folder >= 0)
        UnlockFolder(folder);
}

// --- Connecting ---

// A server whose queue is full may have room a moment later.
static int Connect(int socket, const sockaddr_un *address, int milliseconds)
{
    int32_t end = Sys_Milliseconds() + milliseconds;
    while (connect(socket, Plain(address), sizeof *address) != 0) {
        if (errno == EINTR)
            continue;
        if (errno != EAGAIN)
            return 0;
        if (Sys_TimeLeft(end) == 0)
            return Sys_FailWith(ETIMEDOUT);
        poll(nullptr, 0, PAUSE);
    }
    return 1;
}

int Sys_ConnectLocal(const char *path, int milliseconds, SysReason *why)
{
    sockaddr_un address;
    int socket = MakeAddress(&address, path) ? OpenSocket() : -1;
    if (socket < 0)
        return Sys_TellWhy(why);
    if (Connect(socket, &address, milliseconds) && IsOwnUser(socket))
        return socket;
    Sys_CloseQuietly(socket);
    return Sys_TellWhy(why);
}

// --- Reading and writing ---

// What the system answers, as Sys_Receive and Sys_Send say it.
static long Outcome(ssize_t count)
{
    if (count >= 0)
        return count;
    return errno == EAGAIN || errno == EWOULDBLOCK || errno == EINTR ? 0 : -1;
}

long Sys_Receive(int socket, void *buffer, size_t size)
{
    ssize_t got = recv(socket, buffer, size, MSG_DONTWAIT);
    return got == 0 && size > 0 ? -1 : Outcome(got);
}

long Sys_Send(int socket, const void *data, size_t size)
{
    return Outcome(send(socket, data, size, MSG_DONTWAIT | MSG_NOSIGNAL));
}

static int Wait(int socket, short events, int milliseconds)
{
    int32_t end = Sys_Milliseconds() + milliseconds;
    for (;;) {
        pollfd wait = {socket, events, 0};
        int ready = poll(&wait, 1, Sys_TimeLeft(end));
        if (ready >= 0 || errno != EINTR)
            return ready > 0;
    }
}

int Sys_WaitReadable(int socket, int milliseconds)
{
    return Wait(socket, POLLIN, milliseconds);
}

int Sys_WaitWritable(int socket, int milliseconds)
{
    return Wait(socket, POLLOUT, milliseconds);
}

int Sys_FinishSending(int socket, int milliseconds)
{
    char dropped[512];
    int32_t end = Sys_Milliseconds() + milliseconds;
    shutdown(socket, SHUT_WR);
    while (Wait(socket, POLLIN, Sys_TimeLeft(end))) {
        ssize_t got = recv(socket, dropped, sizeof dropped, MSG_DONTWAIT);
        if (got == 0)
            return 1;
        if (Outcome(got) < 0)
            return 0;
        if (Sys_TimeLeft(end) == 0)
            break;
    }
    return -1;
}

void Sys_CloseSocket(int socket)
{
    close(socket);
}

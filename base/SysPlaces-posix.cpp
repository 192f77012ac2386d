// base/SysPlaces-posix.cpp - the user's folders, for POSIX systems.

#include "base/Sys-posix.h"
#include "base/Sys.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

static std::string HomeFolder()
{
    const char *home = getenv("HOME");
    if (home && *home)
        return home;
    const passwd *user = getpwuid(getuid());
    return user ? user->pw_dir : "/";
}

// Relative folders in these variables do not count.
static char *XdgFolder(const char *variable, const char *belowHome)
{
    const char *folder = getenv(variable);
    return strdup(folder && *folder == '/' ? folder : (HomeFolder() + belowHome).c_str());
}

char *Sys_ConfigFolder()
{
    return XdgFolder("XDG_CONFIG_HOME", "/.config");
}

char *Sys_DataFolder()
{
    return XdgFolder("XDG_DATA_HOME", "/.local/share");
}

// 1 when the folder is ours alone; made when it is missing.
static int TakeFolder(const std::string &path)
{
    struct stat state;
    if (mkdir(path.c_str(), 0700) != 0 && errno != EEXIST)
        return 0;
    if (lstat(path.c_str(), &state) != 0)
        return 0;
    if (S_ISDIR(state.st_mode) && state.st_uid == getuid() && (state.st_mode & 077) == 0)
        return 1;
    errno = EACCES;
    return 0;
}

// "" where there is none. A program that was started as another user may have been left that one's
// variable: then the temporary folder has to do.
static std::string PrivateFolder()
{
    const char *runtime = getenv("XDG_RUNTIME_DIR");
    std::string folder = std::string(runtime ? runtime : "") + "/quarlo";
    if (runtime && *runtime == '/' && TakeFolder(folder))
        return folder;
    const char *temporary = getenv("TMPDIR");
    folder = temporary && *temporary == '/' ? temporary : "/tmp";
    folder += "/quarlo-" + std::to_string(getuid());
    return TakeFolder(folder) ? folder : std::string();
}

static uint64_t Hash(const char *text)
{
    uint64_t hash = SYS_HASH_OF_NOTHING;
    for (; *text; ++text)
        hash = Sys_HashMore(hash, static_cast<unsigned char>(*text));
    return hash;
}

char *Sys_PrivatePath(const char *name, const char *ending, SysReason *why)
{
    std::string folder = PrivateFolder();
    if (folder.empty()) {
        Sys_TellWhy(why);
        return nullptr;
    }
    char number[17];
    snprintf(number, sizeof number, "%016llx", static_cast<unsigned long long>(Hash(name)));
    return strdup((folder + "/" + number + ending).c_str());
}

const char *Sys_LoginName()
{
    static char number[16];
    const passwd *user = getpwuid(getuid());
    if (user && *user->pw_name)
        return user->pw_name;
    snprintf(number, sizeof number, "%u", static_cast<unsigned>(getuid()));
    return number;
}

// base/Sys-posix.h - shared by the files that implement Sys.h on POSIX systems.
#pragma once

#include <cstdint>

struct SysReason;

// Puts what errno says into the reason, when somebody wants to know; errno stays as it is. 0.
int Sys_TellWhy(SysReason *why);

// FNV-1a, 64 bits: the hash of what came before and of `value`, a byte or a larger number.
const uint64_t SYS_HASH_OF_NOTHING = 14695981039346656037u;
inline uint64_t Sys_HashMore(uint64_t hash, uint64_t value)
{
    return (hash ^ value) * 1099511628211u;
}

int Sys_FailWith(int error);     // leaves the reason in errno; 0
void Sys_CloseQuietly(int file); // leaves errno alone

// Moves a descriptor off 0 to 2 and returns the new one; others, and -1, come back as they are. -1
// on failure, with the reason in errno and the old one closed.
//
// A program may be started without its standard streams. A file of the user's that is opened then
// must not take their place: it would get the lines of the log. And 0 stands for "no lock".
int Sys_MoveOffStandard(int fd);

// A pipe whose ends are above 2 and not inherited by started programs. 1, or 0 with the reason in
// errno.
int Sys_OpenPipe(int ends[2]);

// Whoever started this program may have left it a setting by which children vanish when they end:
// then nobody can tell how, and their numbers may be somebody else's. Call before starting one.
void Sys_KeepEndedChildren();

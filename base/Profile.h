// base/Profile.h - reading INI files, with the rules of the private profiles that such files were
// written for.
//
// "[section]" lines head their lines; "key=value" lines set keys; lines whose first character is
// ';' are comments; blanks around sections, keys and values do not count. Names compare without
// regard to letter case; the first section of a name, and in it the first line of a key, hold.
// Lines keep their order. The file is read at every call; one that is missing, unreadable or larger
// than 1 MiB is empty. Buffers hold `size` bytes, with the end.
#pragma once

#include <cstddef>

// The value of a key, without the pair of quotes around it if there is one, else `fallback` (null:
// ""), cut to the buffer. Returns its length there.
size_t Profile_GetString(const char *section, const char *key, const char *fallback, char *buffer,
                         size_t size, const char *path);

// The same for several keys of one section, with one look at the file: the value of keys[i] goes to
// buffers + i * size.
void Profile_GetStrings(const char *section, const char *const *keys, int count,
                        const char *fallback, char *buffers, size_t size, const char *path);

// The lines of a section as "key=value", quotes and lines without '=' as they stand, each ended by
// a 0, the last by two. Returns the length without the last 0; size - 2 when it had to be cut.
size_t Profile_GetSection(const char *section, char *buffer, size_t size, const char *path);

// The names of all sections in the same form, each once.
size_t Profile_GetSectionNames(char *buffer, size_t size, const char *path);

// base/Ascii.h - comparison and search that ignore the case of the ASCII letters only.
// The C library's own depend on the locale; keys and names must not.
#pragma once

#include <cstddef>

inline unsigned char Ascii_Lower(unsigned char c)
{
    return c >= 'A' && c <= 'Z' ? c + ('a' - 'A') : c;
}

// Like strcmp and strncmp: negative, 0 or positive; bytes count as unsigned.
inline int Ascii_Compare(const char *a, const char *b)
{
    for (;; ++a, ++b) {
        int d = Ascii_Lower(*a) - Ascii_Lower(*b);
        if (d != 0 || *a == 0)
            return d;
    }
}

inline int Ascii_CompareN(const char *a, const char *b, size_t n)
{
    for (; n > 0; ++a, ++b, --n) {
        int d = Ascii_Lower(*a) - Ascii_Lower(*b);
        if (d != 0 || *a == 0)
            return d;
    }
    return 0;
}

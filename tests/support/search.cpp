// tests/support/search.cpp - prints the answer of TNSearch, as a program sees it that is installed
// where this one is copied to: search CATEGORY NAME
#include <cstdio>
#include <cstdlib>

#include "base/Companion.h"

int main(int argc, char **argv)
{
    char *path = argc == 3 ? TNSearch(argv[1], argv[2]) : nullptr;
    puts(path ? path : "none");
    free(path);
    return 0;
}

// tests/lost_hook.cpp - this program is linked so that the parser library keeps its own error
// report: the self-test must notice. The library prints to standard error, so a file's errors would
// be lost.
#include <cstdio>

#include "store/BibStore.h"

int main()
{
    Bib_Initialize();
    int passed = Bib_SelfTest();
    printf("the self-test %s without the hook\n", passed ? "passed" : "failed");
    return passed;
}

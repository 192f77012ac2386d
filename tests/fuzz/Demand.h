// tests/fuzz/Demand.h - what a fuzz entry point insists on.
#pragma once

#include <cstdio>
#include <cstdlib>

// Ends the process when the condition does not hold; the driver, or libFuzzer, keeps the input.
#define DEMAND(condition)                                                                          \
    do {                                                                                           \
        if (!(condition)) {                                                                        \
            fprintf(stderr, "%s:%d: not so: %s\n", __FILE__, __LINE__, #condition);                \
            abort();                                                                               \
        }                                                                                          \
    } while (0)

// bench/Library.cpp - a large BIB file, always the same.
#include "bench/Library.h"

#include <cstdint>
#include <cstdio>

static const char *const Words[] = {
    "analysis",  "of",         "graphs",   "and",      "the",         "theory",  "for",
    "large",     "networks",   "with",     "random",   "matrices",    "on",      "convergence",
    "a",         "method",     "discrete", "linear",   "Banach",      "spaces",  "spectral",
    "bounds",    "in",         "dynamics", "Bayesian", "models",      "inverse", "problems",
    "numerical", "adaptive",   "sparse",   "grids",    "G{\\\"o}del", "type",    "numbers",
    "{TeX}",     "typesetting"};
static const char *const Names[] = {"Abel, Niels",  "B{\\'e}zout, E.", "Cantor, Georg",
                                    "Dirac, P.",    "Erd{\\H o}s, P.", "Fermi, E.",
                                    "Gauss, C. F.", "Hopf, H.",        "Ito, K.",
                                    "Jacobi, C.",   "Knuth, D. E."};
static const char *const Months[] = {"jan", "feb", "mar", "apr", "may", "jun",
                                     "jul", "aug", "sep", "oct", "nov", "dec"};

// A linear congruential generator, so that every run and every machine gets the same file.
static uint32_t Next(uint32_t *state)
{
    *state = *state * 1664525u + 1013904223u;
    return *state >> 8;
}

template <size_t N> static const char *Pick(const char *const (&list)[N], uint32_t *state)
{
    return list[Next(state) % N];
}

static std::string Sentence(int words, uint32_t *state)
{
    std::string text = Pick(Words, state);
    while (--words > 0)
        text += std::string(" ") + Pick(Words, state);
    return text;
}

static std::string Authors(uint32_t *state)
{
    std::string text = Pick(Names, state);
    for (uint32_t more = Next(state) % 3; more > 0; --more)
        text += std::string(" and ") + Pick(Names, state);
    return text;
}

static std::string Entry(int number, uint32_t *state)
{
    uint32_t page = Next(state) % 900;
    return "@article{key" + std::to_string(Next(state) % 1000) + "-" + std::to_string(number) +
           ",\n  author = {" + Authors(state) + "},\n  title = {" + Sentence(9, state) +
           "},\n  journal = \"Journal of " + Sentence(3, state) +
           "\",\n  year = " + std::to_string(1900 + Next(state) % 125) +
           ",\n  month = " + Pick(Months, state) +
           ",\n  volume = " + std::to_string(Next(state) % 99) + ",\n  pages = {" +
           std::to_string(page) + "--" + std::to_string(page + 12) + "},\n  doi = {10.1000/" +
           std::to_string(Next(state)) + "},\n  abstract = {" + Sentence(31, state) + "}\n}\n\n";
}

size_t Library_Write(const std::string &path, int entries)
{
    FILE *stream = fopen(path.c_str(), "w");
    if (!stream)
        return 0;
    uint32_t state = 1;
    size_t bytes = 0;
    for (int i = 0; i < entries; ++i) {
        std::string entry = Entry(i, &state);
        bytes += fwrite(entry.data(), 1, entry.size(), stream);
    }
    return fclose(stream) == 0 ? bytes : 0;
}

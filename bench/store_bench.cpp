// bench/store_bench.cpp - what the store costs, as ratios against a plain reference in the same
// run.
//
//   cartulo_bench [entries]      default 100000, about 54 MB
//
// Minimum, median, average and maximum of the repetitions are printed for every measurement, then
// the ratios of the medians, and the peak memory of a load against the file's size.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include <btparse.h>
#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include "bench/Library.h"
#include "bench/Ratios.h"
#include "store/BibStore.h"
#include "ui/EntryIndex.h"

namespace
{

std::string Folder;
std::string Library;
size_t LibraryBytes;
BibFile *Loaded;
std::string Text; // the library's bytes

const char Absent[] = "qzxqzx";
const char Needle[] = "converGence";

// --- Measurements ---

void ParserAlone(benchmark::State &state)
{
    for (auto step : state) {
        FILE *stream = fopen(Library.c_str(), "r");
        boolean status;
        while (AST *ast = bt_parse_entry(stream, Library.data(), BTO_NOSTORE, &status))
            bt_free_ast(ast);
        fclose(stream);
    }
}

void Load(benchmark::State &state)
{
    for (auto step : state) {
        BibFile *file = Bib_LoadFile(Library.c_str());
        state.PauseTiming();
        Bib_FreeFile(file);
        state.ResumeTiming();
    }
}

void WriteAndSync(benchmark::State &state)
{
    std::string saved = Folder + "/saved.bib";
    std::ifstream stream(saved, std::ios::binary);
    std::string bytes{std::istreambuf_iterator<char>(stream), {}};
    for (auto step : state) {
        int copy = open((Folder + "/copy.bib").c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        if (write(copy, bytes.data(), bytes.size()) != static_cast<ssize_t>(bytes.size()))
            state.SkipWithError("the disk is full");
        fsync(copy);
        close(copy);
    }
}

void Save(benchmark::State &state)
{
    for (auto step : state)
        if (!Bib_SaveFile(Loaded))
            state.SkipWithError("not saved");
}

void Memmem(benchmark::State &state)
{
    for (auto step : state)
        benchmark::DoNotOptimize(memmem(Text.data(), Text.size(), Absent, strlen(Absent)));
}

void BuildIndex(benchmark::State &state, const char *filter)
{
    for (auto step : state) {
        IndexItem *index = nullptr;
        benchmark::DoNotOptimize(EntryIndex_Build(&index, &Loaded, 1, filter));
        free(index);
    }
}

int CompareTexts(const void *a, const void *b)
{
    return strcmp(*static_cast<char *const *>(a), *static_cast<char *const *>(b));
}

void SortKeys(benchmark::State &state)
{
    for (auto step : state) {
        std::vector<const char *> keys;
        for (BibEntry *entry = Loaded->entries; entry; entry = entry->next)
            keys.push_back(entry->key);
        qsort(keys.data(), keys.size(), sizeof keys[0], CompareTexts);
        benchmark::DoNotOptimize(keys.data());
    }
}

// --- Memory ---

long PeakOfThisProcess()
{
    struct rusage usage;
    getrusage(RUSAGE_SELF, &usage);
    return usage.ru_maxrss * 1024;
}

// Loads in a fresh process: what this process grew by at its peak, and the loading child's peak,
// less what both had before.
double LoadMemory()
{
    int ends[2];
    if (pipe(ends) != 0)
        return 0;
    fflush(stdout);
    pid_t process = fork();
    if (process == 0) {
        long before = PeakOfThisProcess();
        BibFile *file = Bib_LoadFile(Library.c_str());
        struct rusage children;
        getrusage(RUSAGE_CHILDREN, &children);
        long bytes = PeakOfThisProcess() - before + children.ru_maxrss * 1024 - before;
        ssize_t written = write(ends[1], &bytes, sizeof bytes);
        _exit(file && written == sizeof bytes ? 0 : 1);
    }
    long bytes = 0;
    if (read(ends[0], &bytes, sizeof bytes) != sizeof bytes)
        bytes = 0;
    waitpid(process, nullptr, 0);
    close(ends[0]);
    close(ends[1]);
    return static_cast<double>(bytes);
}

// --- Run ---

void Register(const char *name, void (*function)(benchmark::State &))
{
    benchmark::RegisterBenchmark(name, function)
        ->Unit(benchmark::kMillisecond)
        ->UseRealTime()
        ->Iterations(1)
        ->Repetitions(7);
}

void RegisterAll()
{
    Register("parser alone", ParserAlone);
    Register("load", Load);
    Register("save", Save);
    Register("write and sync", WriteAndSync);
    Register("memmem", Memmem);
    Register("filter, absent", [](benchmark::State &state) { BuildIndex(state, Absent); });
    Register("filter, found", [](benchmark::State &state) { BuildIndex(state, Needle); });
    Register("index", [](benchmark::State &state) { BuildIndex(state, ""); });
    Register("sort keys", SortKeys);
}

int Prepare(int entries)
{
    char name[] = "/tmp/cartulo-bench-XXXXXX";
    if (!mkdtemp(name))
        return 0;
    Folder = name;
    Library = Folder + "/library.bib";
    LibraryBytes = Library_Write(Library, entries);
    std::ifstream stream(Library, std::ios::binary);
    Text.assign(std::istreambuf_iterator<char>(stream), {});
    printf("%d entries, %.1f MB\n\n", entries, static_cast<double>(LibraryBytes) / 1e6);
    return LibraryBytes > 0;
}

// Saves go to a path of their own.
int LoadForTheRest()
{
    Loaded = Bib_LoadFile(Library.c_str());
    if (!Loaded)
        return 0;
    std::string path = Folder + "/saved.bib";
    free(Loaded->path);
    Loaded->path = Bib_CopyText(path.c_str(), path.size());
    BibBackupMode = -1;
    return Bib_SaveFile(Loaded);
}

} // namespace

int main(int argc, char **argv)
{
    Bib_Initialize();
    for (bt_metatype metatype : {BTE_MACRODEF, BTE_REGULAR, BTE_COMMENT, BTE_PREAMBLE})
        bt_set_stringopts(metatype, 0);
    if (!Prepare(argc > 1 ? atoi(argv[1]) : 100000))
        return 1;
    double memory = LoadMemory();
    if (!LoadForTheRest())
        return 1;

    Ratios ratios;
    int count = 1;
    benchmark::Initialize(&count, argv);
    RegisterAll();
    benchmark::RunSpecifiedBenchmarks(&ratios);
    ratios.Print();
    printf("\n");
    ratios.PrintRatio("load / the parser alone on the same file", "load", "parser alone");
    ratios.PrintRatio("save / write and fsync of the same bytes", "save", "write and sync");
    ratios.PrintRatio("filter, text absent / memmem over the same bytes", "filter, absent",
                      "memmem");
    ratios.PrintRatio("filter, text found / memmem over the same bytes", "filter, found", "memmem");
    ratios.PrintRatio("index of all entries / qsort of the bare keys", "index", "sort keys");
    printf("%-60s %6.2f\n", "peak memory of a load / the file's size",
           memory / static_cast<double>(LibraryBytes));

    Bib_FreeFile(Loaded);
    std::filesystem::remove_all(Folder);
    return 0;
}

// tests/fuzz/driver.cpp - runs a fuzz entry point without libFuzzer: over seeds and their
// mutations.
//
//     fuzz_load [-l] [-n COUNT] [-s SEED] FILE_OR_FOLDER...
//
// First every file, or with -l every line of them, as it is, then COUNT mutations (default 200).
// The same seed (default 1) gives the same mutations. An input that ends or hangs its process is
// kept as "crash-SEED-NUMBER" in the current folder, and the driver goes on and fails at the end.
//
// Inputs run in a process of their own, a few at a time, because name tables only grow.
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <vector>

#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

extern "C" int LLVMFuzzerInitialize(int *argc, char ***argv);
extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size);

static const size_t BATCH = 40;
static const unsigned SECONDS = 60;  // of real time that one input may take
static const size_t LARGEST = 20000; // bytes; longer seeds run as they are only

static const char *const Tokens[] = {
    "@",
    "{",
    "}",
    "(",
    ")",
    "\"",
    "#",
    ",",
    "=",
    "%",
    "\n",
    "\r",
    "\r\n",
    "\t",
    " ",
    "\\",
    "'",
    "@article{k,",
    "@misc{",
    "@string{",
    "@comment{",
    "@preamble{",
    "@comment(",
    "@string(",
    "title = ",
    " = {a b}",
    "crossref = {x},",
    "author = ",
    " # ",
    " # jan",
    "1999",
    "{}",
    "\"\"",
    ",\n}\n",
    "\2",
    "\5",
    "\2jan\5",
    "%s%n",
    "%",
    "\xEF\xBB\xBF",
    "\xFF",
    "\xC3\xBC",
    "-d",
    "-w1:2/S",
    "-i",
    "'\"",
    "{\\\"o}",
    "\x7F",
    "@{",
    "}}",
    "{{",
    "\x01",
    "~",
    "&",
    "[",
    "^",
    "`",
};

// --- Mutations ---

namespace
{

class Mutator
{
public:
    Mutator(const std::vector<std::string> &seeds, unsigned seed) : m_seeds(seeds), m_random(seed)
    {
    }

    std::string Next()
    {
        std::string text = Seed();
        for (size_t i = 0, count = 1 + Below(4); i < count; ++i)
            Change(&text);
        return text;
    }

private:
    const std::vector<std::string> &m_seeds;
    std::mt19937 m_random; // the same numbers everywhere, unlike the library's distributions

    size_t Below(size_t limit) { return limit > 0 ? m_random() % limit : 0; }
    const std::string &Seed() { return m_seeds[Below(m_seeds.size())]; }

    std::string Piece(const std::string &text)
    {
        size_t start = Below(text.size() + 1);
        return text.substr(start, Below(std::min<size_t>(text.size() - start + 1, 200)));
    }

    void Change(std::string *text)
    {
        size_t at = Below(text->size() + 1);
        switch (Below(8)) {
        case 0: // flip
            if (at < text->size())
                (*text)[at] = static_cast<char>((*text)[at] ^ (1 << Below(8)));
            break;
        case 1: // any byte
            if (at < text->size())
                (*text)[at] = static_cast<char>(Below(256));
            break;
        case 2: // remove
            text->erase(at, 1 + Below(20));
            break;
        case 3: // splice
            text->insert(at, Piece(Seed()));
            break;
        case 4: // repeat
            text->insert(at, Piece(*text));
            break;
        case 5: // cut
            text->resize(at);
            break;
        default:
            text->insert(at, Tokens[Below(sizeof Tokens / sizeof Tokens[0])]);
        }
    }
};

} // namespace

// --- Running ---

static size_t *Current; // shared with the process that runs a batch: which input it is at

[[noreturn]] static void RunBatch(const std::vector<std::string> &inputs)
{
    for (; *Current < inputs.size(); ++*Current) {
        alarm(SECONDS);
        const std::string &text = inputs[*Current];
        // A copy of just its size, so that a sanitizer sees what reads behind it.
        std::vector<uint8_t> bytes(text.begin(), text.end());
        LLVMFuzzerTestOneInput(bytes.data(), bytes.size());
    }
    exit(0); // removes the scratch folder
}

static void Keep(const std::string &text, const std::string &name)
{
    std::ofstream(name, std::ios::binary) << text;
    printf("%s: %zu bytes\n", name.c_str(), text.size());
}

// Returns how many inputs ended or hung their process.
static int RunAll(const std::vector<std::string> &inputs, const std::string &name)
{
    int failures = 0;
    *Current = 0;
    while (*Current < inputs.size()) {
        fflush(nullptr);
        pid_t child = fork();
        if (child == 0)
            RunBatch(inputs);
        int status = -1;
        if (child < 0 || waitpid(child, &status, 0) != child)
            return failures + 1;
        if (status == 0)
            break;
        ++failures;
        size_t failed = std::min(*Current, inputs.size() - 1); // at the very end: a leak
        Keep(inputs[failed], name + std::to_string(failed));
        *Current = failed + 1;
    }
    return failures;
}

static int RunSeeds(const std::vector<std::string> &seeds)
{
    int failures = 0;
    for (size_t done = 0; done < seeds.size(); done += BATCH) {
        size_t end = std::min(done + BATCH, seeds.size());
        failures += RunAll(
            {seeds.begin() + static_cast<long>(done), seeds.begin() + static_cast<long>(end)},
            "crash-seed-" + std::to_string(done) + "-");
    }
    return failures;
}

static int RunMutations(const std::vector<std::string> &seeds, unsigned seed, size_t count)
{
    Mutator mutator(seeds, seed);
    int failures = 0;
    for (size_t done = 0; done < count; done += BATCH) {
        std::vector<std::string> inputs;
        while (inputs.size() < std::min(BATCH, count - done))
            inputs.push_back(mutator.Next());
        std::string name = "crash-" + std::to_string(seed) + "-" + std::to_string(done) + "-";
        failures += RunAll(inputs, name);
    }
    return failures;
}

// --- Seeds ---

static void AddFile(std::vector<std::string> *seeds, const std::filesystem::path &path)
{
    std::ifstream stream(path, std::ios::binary);
    seeds->emplace_back(std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>());
}

// In place of the files their lines.
static std::vector<std::string> Lines(const std::vector<std::string> &files)
{
    std::vector<std::string> lines;
    for (const std::string &text : files)
        for (size_t start = 0, end; start < text.size(); start = end + 1) {
            end = std::min(text.find('\n', start), text.size());
            lines.push_back(text.substr(start, end - start));
        }
    return lines;
}

static void AddSeeds(std::vector<std::string> *seeds, const std::filesystem::path &path)
{
    if (!std::filesystem::is_directory(path)) {
        AddFile(seeds, path);
        return;
    }
    std::vector<std::filesystem::path> files(std::filesystem::directory_iterator(path), {});
    std::sort(files.begin(), files.end());
    for (const std::filesystem::path &file : files)
        AddFile(seeds, file);
}

int main(int argc, char **argv)
{
    size_t count = 200;
    unsigned seed = 1;
    std::vector<std::string> seeds;
    bool byLine = false;
    for (int option; (option = getopt(argc, argv, "ln:s:")) != -1;)
        if (option == 'l')
            byLine = true;
        else if (option == 'n')
            count = strtoul(optarg, nullptr, 10);
        else
            seed = static_cast<unsigned>(strtoul(optarg, nullptr, 10));
    for (int i = optind; i < argc; ++i)
        AddSeeds(&seeds, argv[i]);
    if (byLine)
        seeds = Lines(seeds);
    if (seeds.empty()) {
        fprintf(stderr, "%s: no seed files\n", argv[0]);
        return 1;
    }
    Current = static_cast<size_t *>(
        mmap(nullptr, sizeof *Current, PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0));
    LLVMFuzzerInitialize(&argc, &argv);
    int failures = RunSeeds(seeds);
    seeds.erase(std::remove_if(seeds.begin(), seeds.end(),
                               [](const std::string &text) { return text.size() > LARGEST; }),
                seeds.end());
    failures += RunMutations(seeds, seed, count);
    printf("%zu mutations of %zu seeds, %d failures\n", count, seeds.size(), failures);
    return failures > 0;
}

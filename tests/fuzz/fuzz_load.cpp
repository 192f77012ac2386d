// tests/fuzz/fuzz_load.cpp - any bytes as a BIB file: loaded, saved, and loaded again.
//
// What loads without an error must come back from a save. The exceptions:
// - Two `crossref` fields in one entry change places with every load.
// - The bytes 0x02 and 0x05 are the store's marks of an abbreviation. Where a file holds them
//   itself, what is saved is something else; the file must not harm the process, that is all.
#include <cstdint>
#include <cstring>

#include "tests/fuzz/Demand.h"
#include "tests/fuzz/Records.h"

static int HoldsMarks(const uint8_t *data, size_t size)
{
    return size > 0 && (memchr(data, BIB_OPEN_ABBREVIATION, size) ||
                        memchr(data, BIB_CLOSE_ABBREVIATION, size));
}

static void CheckSecondSave(BibFile *again, const std::string &saved)
{
    std::string path = ScratchFolder() + "/second.bib";
    BibFile *third = SaveAndLoad(again, path);
    DEMAND(ReadFile(path) == saved);
    Bib_FreeFile(third);
}

static void CheckSaving(BibFile *file)
{
    std::string path = ScratchFolder() + "/first.bib";
    BibFile *again = SaveAndLoad(file, path);
    DEMAND(again->errorCount == 0);
    if (!HasTwoCrossrefs(file)) {
        DEMAND(DescribeRecords(file) == DescribeRecords(again));
        CheckSecondSave(again, ReadFile(path));
    }
    Bib_FreeFile(again);
}

extern "C" int LLVMFuzzerInitialize(int *, char ***)
{
    setenv("CARTULO_LOG", "6", 0); // thousands of broken files: no trace of each
    ScratchFolder();
    Bib_Initialize();
    DEMAND(Bib_SelfTest());
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string path = ScratchFolder() + "/input.bib";
    WriteFile(path, data, size);
    BibFile *file = Bib_LoadFile(path.c_str());
    DEMAND(file);
    DescribeRecords(file);
    DEMAND(file->errorCount + file->warningCount == 0 || file->messages);
    if (file->errorCount == 0 && !HoldsMarks(data, size))
        CheckSaving(file);
    Bib_FreeFile(file);
    return 0;
}

// tests/fuzz/fuzz_items.cpp - any bytes as what a loading child sends whose memory is damaged.
//
// Whatever comes, only whole items are stored, and the records hold together. The first byte says
// where another one is changed, so that items which are right but for that come up often.
#include <algorithm>
#include <cstdint>
#include <cstring>

#include "store/BibItem.h"
#include "store/BibRecords.h"
#include "tests/fuzz/Demand.h"
#include "tests/fuzz/Records.h"

static void AddNumber(std::string *bytes, uint32_t number)
{
    bytes->append(reinterpret_cast<const char *>(&number), sizeof number);
}

// The lines of `text` as the texts of an item.
static std::string MakeItem(const std::string &text)
{
    std::string texts;
    int count = 0;
    for (size_t start = 0; start <= text.size(); ++count) {
        size_t end = std::min(text.find('\n', start), text.size());
        AddNumber(&texts, static_cast<uint32_t>(end - start));
        texts.append(text, start, end - start);
        texts += '\0';
        start = end + 1;
    }
    std::string item;
    AddNumber(&item, static_cast<uint32_t>(sizeof(BibItemHeader) + texts.size()));
    AddNumber(&item, count % 2 ? BIB_ITEM_PREAMBLE : BIB_ITEM_ENTRY);
    AddNumber(&item, 1);
    AddNumber(&item, static_cast<uint32_t>(count % 2 ? count - 1 : count / 2 - 1));
    return item + texts;
}

static void StoreAll(const char *bytes, size_t length)
{
    BibFile *file = static_cast<BibFile *>(calloc(1, sizeof *file));
    DEMAND(file);
    file->path = Bib_CopyText("items", 5);
    file->baseName = Bib_CopyText("items", 5);
    BibCurrentFile = file;
    for (size_t taken = 0;;) {
        long size = BibItem_Size(bytes + taken, length - taken);
        if (size <= 0)
            break;
        DEMAND(static_cast<size_t>(size) <= length - taken);
        BibItem_Store(file, bytes + taken);
        taken += static_cast<size_t>(size);
    }
    DescribeRecords(file);
    Bib_FreeFile(file);
}

extern "C" int LLVMFuzzerInitialize(int *, char ***)
{
    setenv("CARTULO_LOG", "6", 0);
    Bib_Initialize();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    if (size < 2)
        return 0;
    StoreAll(reinterpret_cast<const char *>(data), size);
    std::string item = MakeItem(std::string(reinterpret_cast<const char *>(data + 2), size - 2));
    StoreAll(item.data(), item.size());
    item[data[0] % item.size()] = static_cast<char>(data[1]);
    StoreAll(item.data(), item.size());
    return 0;
}

// tests/bib_item_test.cpp - items as bytes, and the records that are built of them.
#include "store/BibItem.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include <sys/resource.h>
#include <unistd.h>

#include "store/BibRecords.h"
#include "tests/support/LoadText.h"
#include "tests/support/LogCapture.h"

namespace
{

std::string Text(const std::string &text)
{
    uint32_t length = static_cast<uint32_t>(text.size());
    return std::string(reinterpret_cast<const char *>(&length), sizeof length) + text +
           std::string(1, '\0');
}

std::string Item(int kind, int number, const std::string &texts)
{
    BibItemHeader header = {static_cast<uint32_t>(sizeof header + texts.size()), kind, 1, number};
    return std::string(reinterpret_cast<const char *>(&header), sizeof header) + texts;
}

long Size(const std::string &item)
{
    std::vector<char> bytes(item.begin(), item.end()); // a sanitizer guards its end
    return BibItem_Size(bytes.data(), bytes.size());
}

std::string WithSize(std::string item, uint32_t size)
{
    memcpy(&item[0], &size, sizeof size);
    return item;
}

const std::string Entry =
    Item(BIB_ITEM_ENTRY, 1, Text("misc") + Text("key") + Text("a") + Text("b"));

} // namespace

TEST(BibItemSize, IsThatOfAWholeItem)
{
    EXPECT_EQ(static_cast<long>(Entry.size()), Size(Entry));
    EXPECT_EQ(static_cast<long>(Entry.size()), Size(Entry + "more"));
    EXPECT_LT(0, Size(Item(BIB_ITEM_MESSAGE, 5, Text("message"))));
    EXPECT_LT(0, Size(Item(BIB_ITEM_ENTRY, 0, Text("misc") + Text(""))));
    EXPECT_LT(0, Size(Item(BIB_ITEM_STRINGS, 2, Text("a") + Text("x") + Text("b") + Text("y"))));
    EXPECT_LT(0, Size(Item(BIB_ITEM_PREAMBLE, 1, Text("preamble") + Text("x"))));
    EXPECT_LT(0, Size(Item(BIB_ITEM_COMMENT, 0, "")));
    EXPECT_LT(0, Size(Item(BIB_ITEM_OUTSIDE, 0, Text("text"))));
    EXPECT_LT(0, Size(Item(BIB_ITEM_DROPPED, 0, "")));
    EXPECT_LT(0, Size(Item(BIB_ITEM_FORM, BIB_FORM_ALL, "")));
    EXPECT_LT(0, Size(Item(BIB_ITEM_STRANGE, 0, "")));
    EXPECT_LT(0, Size(Item(BIB_ITEM_END, BIB_END_EARLY, "")));
}

TEST(BibItemSize, IsZeroAsLongAsBytesAreMissing)
{
    for (size_t length = 0; length < Entry.size(); ++length)
        EXPECT_EQ(0, Size(Entry.substr(0, length)));
}

TEST(BibItemSize, RefusesAnItemSmallerThanItsHeader)
{
    for (uint32_t size = 0; size < sizeof(BibItemHeader); ++size)
        EXPECT_EQ(-1, Size(WithSize(Entry, size)));
}

TEST(BibItemSize, RefusesTextsThatDoNotFillTheItem)
{
    for (size_t size = sizeof(BibItemHeader); size < Entry.size(); ++size)
        EXPECT_EQ(-1, Size(WithSize(Entry, static_cast<uint32_t>(size))));
    EXPECT_EQ(-1, Size(WithSize(Entry + "x", static_cast<uint32_t>(Entry.size() + 1))));
}

TEST(BibItemSize, RefusesATextThatIsLongerThanItsItem)
{
    for (uint32_t length : {4u, 1000u, 0x7FFFFFFFu, 0xFFFFFFFFu}) {
        std::string texts = Text("abc");
        memcpy(&texts[0], &length, sizeof length);
        EXPECT_EQ(-1, Size(Item(BIB_ITEM_COMMENT, 1, texts))) << length;
    }
}

TEST(BibItemSize, RefusesATextWithoutItsEnd)
{
    std::string texts = Text("abc");
    texts.back() = 'd';
    EXPECT_EQ(-1, Size(Item(BIB_ITEM_COMMENT, 1, texts)));
}

TEST(BibItemSize, RefusesAWrongNumberOfTexts)
{
    for (int number : {0, 2, 1000000, 0x7FFFFFFF, -1, -0x7FFFFFFF})
        EXPECT_EQ(-1, Size(Item(BIB_ITEM_COMMENT, number, Text("abc")))) << number;
    for (int number : {-2, -1, 0, 2, 0x7FFFFFFF})
        EXPECT_EQ(-1, Size(Item(BIB_ITEM_ENTRY, number, Entry.substr(sizeof(BibItemHeader)))))
            << number;
    EXPECT_EQ(-1, Size(Item(BIB_ITEM_ENTRY, -1, "")));
}

TEST(BibItemSize, RefusesAnUnknownKind)
{
    for (int kind : {-1, BIB_ITEM_END + 1, 0x7FFFFFFF})
        EXPECT_EQ(-1, Size(Item(kind, 0, "")));
}

TEST(BibItemStore, LogsAnItemThatItDoesNotKnow)
{
    auto logOf = [](int metatype) {
        return LogOf(nullptr, [metatype] {
            BibFile file = {};
            if (BibItem_Store(&file, Item(BIB_ITEM_STRANGE, metatype, "").data()) != BIB_STORED ||
                file.entries || file.errorCount)
                _exit(1);
        });
    };
    EXPECT_EQ("Cartulo: ERROR: There is unknown entry in BIB-file\n", logOf(0));
    EXPECT_EQ("Cartulo: ERROR: There is strange entry in BIB-file\n", logOf(5));
}

#ifndef __SANITIZE_ADDRESS__ // which needs all address space
// A part of the value would look like all of it, and a save would write that.
TEST(BibItemStore, RefusesAnEntryThatDoesNotFitInMemory)
{
    Bib_Initialize();
    std::string value(256 * 1024 * 1024, 'v');
    std::string texts = Text("misc") + Text("key") + Text("a") + Text(value);
    std::string items[] = {
        Item(BIB_ITEM_ENTRY, 1, texts), Item(BIB_ITEM_STRINGS, 1, Text("a") + Text(value)),
        Item(BIB_ITEM_COMMENT, 1, Text(value)), Item(BIB_ITEM_OUTSIDE, 0, Text(value))};
    BibFile *file = LoadText("");
    struct rlimit limit;
    getrlimit(RLIMIT_AS, &limit);
    struct rlimit low = {4096, limit.rlim_max}; // nothing more than there is
    setrlimit(RLIMIT_AS, &low);
    BibStored stored[3];
    for (int i = 0; i < 3; ++i)
        stored[i] = BibItem_Store(file, items[i].data());
    setrlimit(RLIMIT_AS, &limit);
    for (BibStored one : stored)
        EXPECT_EQ(BIB_NO_MEMORY, one);
    EXPECT_EQ(nullptr, file->entries);
    EXPECT_EQ(nullptr, file->strings);
    EXPECT_EQ(nullptr, file->comments);
    Bib_FreeFile(file);
}
#endif

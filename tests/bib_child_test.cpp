// tests/bib_child_test.cpp - the loading child, and what it knows of the editor.
#include "store/BibChild.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include <btparse.h>

#include "encoding/Encoding.h"
#include "store/BibStore.h"

namespace
{

struct Item {
    BibItemHeader header;
    std::vector<std::string> texts;
};

Item Read(const char *bytes, size_t size)
{
    BibItemReader reader = BibItem_Open(bytes);
    Item item = {reader.header, {}};
    while (reader.next < bytes + size)
        item.texts.push_back(BibItem_NextText(&reader));
    return item;
}

// What the child sends that is given this block and stream.
std::vector<Item> RunParser(const BibItems &block, FILE *stream = nullptr)
{
    SysChild child;
    const SysInput input = {block.bytes, block.length, stream};
    EXPECT_EQ(1, Sys_StartChild(&child, &BibTasks[BIB_TASK_PARSE], &input, 10, nullptr));
    std::string sent;
    char buffer[1000];
    long got;
    while ((got = Sys_ReadChild(&child, buffer, sizeof buffer, 30)) > 0)
        sent.append(buffer, static_cast<size_t>(got));
    Sys_EndChild(&child);
    std::vector<Item> items;
    for (long size; (size = BibItem_Size(sent.data(), sent.size())) > 0; sent.erase(0, size))
        items.push_back(Read(sent.data(), static_cast<size_t>(size)));
    EXPECT_EQ("", sent);
    return items;
}

std::vector<Item> Parse(const BibParseJob &job)
{
    BibItems block = BibJob_Pack(&job);
    std::vector<Item> items = RunParser(block);
    BibItems_Free(&block);
    return items;
}

std::vector<Item> OfKind(const std::vector<Item> &items, BibItemKind kind)
{
    std::vector<Item> found;
    for (const Item &item : items) {
        if (item.header.kind == kind)
            found.push_back(item);
    }
    return found;
}

// The value of the only field of the only entry.
std::string Value(const std::vector<Item> &items)
{
    std::vector<Item> entries = OfKind(items, BIB_ITEM_ENTRY);
    return entries.size() == 1 && entries[0].texts.size() == 4 ? entries[0].texts[3] : "no value";
}

int End(const std::vector<Item> &items)
{
    return items.empty() || items.back().header.kind != BIB_ITEM_END ? -1
                                                                     : items.back().header.number;
}

} // namespace

// What is selected in this process is the other one each time.
TEST(BibChild, KnowsTheEncodingFromItsJob)
{
    const char *text = "@misc{k, a = {\xC3\xA4}, b = {\xE4}}\n";
    ASSERT_EQ(1, Enc_Select("CP1252"));
    std::vector<Item> told = OfKind(Parse({"CP65001", "path", text, 0}), BIB_ITEM_MESSAGE);
    ASSERT_EQ(1u, told.size());
    EXPECT_EQ("this is no UTF-8 any more, so the whole file is taken for CP1252", told[0].texts[0]);
    ASSERT_EQ(1, Enc_Select("CP65001"));
    EXPECT_EQ(0u, OfKind(Parse({"CP1252", "path", text, 0}), BIB_ITEM_MESSAGE).size());
}

// The parser of this process is set to the other ones each time.
TEST(BibChild, KnowsTheOptionsForStringsFromItsJob)
{
    const char *text = "@misc{k, a = {x   y}}\n";
    bt_set_stringopts(BTE_REGULAR, 0);
    EXPECT_EQ("x y", Value(Parse({"CP1252", "path", text, BTO_COLLAPSE})));
    bt_set_stringopts(BTE_REGULAR, BTO_COLLAPSE);
    EXPECT_EQ("x   y", Value(Parse({"CP1252", "path", text, 0})));
}

// Nobody has done it in this process. The library looks an abbreviation up in its table.
TEST(BibChild, SetsUpTheParserLibraryItself)
{
    std::vector<Item> items = Parse({"CP1252", "path", "@misc{k, a = jan}\n", BTO_EXPAND});
    EXPECT_EQ(BIB_END_OF_FILE, End(items));
}

TEST(BibChild, UsesTheBlockAlone)
{
    std::string encoding = "CP65001", path = "path", text = "@misc{k, a = {\xC3\xA4 \xE4}}\n";
    const BibParseJob job = {encoding.c_str(), path.c_str(), text.c_str(), 0};
    BibItems block = BibJob_Pack(&job);
    EXPECT_EQ(block.room, block.length); // it never had to grow, which may end the process
    encoding.assign(encoding.size(), '-');
    path.assign(path.size(), '-');
    text.assign(text.size(), '-');
    std::vector<Item> items = RunParser(block);
    BibItems_Free(&block);
    EXPECT_EQ("\xC3\xA4 \xE4", Value(items));
    EXPECT_EQ(1u, OfKind(items, BIB_ITEM_MESSAGE).size());
}

TEST(BibChild, ReadsTheStreamAndNotThePath)
{
    FILE *stream = tmpfile();
    fputs("@misc{k, a = {streamed}}\n", stream);
    rewind(stream);
    const BibParseJob job = {"CP1252", "/nonexistent/refs.bib", nullptr, 0};
    BibItems block = BibJob_Pack(&job);
    EXPECT_EQ("streamed", Value(RunParser(block, stream)));
    BibItems_Free(&block);
    fclose(stream);
}

// A system that starts the program again looks for the name.
TEST(BibChild, HasATableOfNamedTasks)
{
    EXPECT_STREQ("parse", BibTasks[BIB_TASK_PARSE].name);
    EXPECT_EQ(nullptr, BibTasks[BIB_TASK_PARSE + 1].name);
}

// tests/round_trip_test.cpp - what was loaded is what a save writes: real files, loaded, saved, and
// loaded again.
#include "store/BibStore.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <string>

#include "base/Ascii.h"
#include "tests/support/LoadText.h"
#include "tests/support/OutsideLines.h"
#include "tests/support/TempFolder.h"

namespace
{

namespace fs = std::filesystem;

// Every record as text, in order; no file name and no messages.
std::string Describe(const BibFile *file)
{
    std::string text;
    for (BibComment *comment = file->comments; comment; comment = comment->next)
        text += "comment " + std::string(comment->text) + "\n";
    text += "preamble " + std::string(file->preamble) + "\n";
    for (BibString *string = file->strings; string; string = string->next)
        text += "string " + std::string(string->name) + " = " + string->value + "\n";
    for (BibEntry *entry = file->entries; entry; entry = entry->next) {
        text += "entry " + std::string(BibTypeTable[entry->type]) + " " + entry->key + "\n";
        for (int i = 0; i < entry->fieldCount; ++i)
            text += "  " + FieldName(entry->fields[i]) + " = " + entry->fields[i].value + "\n";
    }
    return text;
}

int HasTwoCrossrefs(const BibFile *file)
{
    for (BibEntry *entry = file->entries; entry; entry = entry->next) {
        int count = 0;
        for (int i = 0; i < entry->fieldCount; ++i)
            count += Ascii_Compare(FieldName(entry->fields[i]).c_str(), "crossref") == 0;
        if (count > 1)
            return 1;
    }
    return 0;
}

class RoundTrip : public testing::Test
{
protected:
    TempFolder folder;
    size_t outside = 0; // kinds of items with lines that were compared

    void SetUp() override
    {
        setenv("CARTULO_LOG", "6", 1);
        Bib_Initialize();
    }

    BibFile *SaveTo(BibFile *file, const char *name)
    {
        std::string path = folder.Path(name);
        free(file->path);
        file->path = Bib_CopyText(path.c_str(), path.size());
        file->readOnly = 0;
        file->modified = 1;
        EXPECT_EQ(1, Bib_SaveFile(file));
        EXPECT_EQ(0, file->modified);
        return Bib_LoadFile(path.c_str());
    }

    void Check(BibFile *file)
    {
        BibFile *again = SaveTo(file, "first.bib");
        ASSERT_NE(nullptr, again);
        EXPECT_EQ(0, again->errorCount) << Messages(again);
        if (!HasTwoCrossrefs(file)) {
            EXPECT_EQ(Describe(file), Describe(again));
            BibFile *third = SaveTo(again, "second.bib");
            EXPECT_TRUE(folder.Read("first.bib") == folder.Read("second.bib"));
            Bib_FreeFile(third);
        }
        Bib_FreeFile(again);
    }

    // The lines outside the items, each before the item of its kind that it stood before.
    void CheckOutside(const std::string &original)
    {
        OutsideLines before(original), after(folder.Read("first.bib"));
        for (const auto &[kind, lines] : before.lines)
            EXPECT_THAT(after.lines[kind], testing::ElementsAreArray(lines)) << kind;
        outside += before.lines.size();
    }

    void CheckFolder(const fs::path &corpus)
    {
        int clean = 0;
        for (const auto &item : fs::directory_iterator(corpus)) {
            if (item.path().extension() != ".bib")
                continue;
            SCOPED_TRACE(item.path());
            BibFile *file = Bib_LoadFile(item.path().c_str());
            ASSERT_NE(nullptr, file);
            if (file->errorCount == 0) {
                ++clean;
                Check(file);
                CheckOutside(TempFolder::ReadFile(item.path()));
            }
            Bib_FreeFile(file);
        }
        EXPECT_LT(2, clean) << "no BIB files in " << corpus;
        EXPECT_LT(0u, outside);
    }
};

} // namespace

TEST_F(RoundTrip, KeepsTheRecordsOfRealFiles)
{
    CheckFolder(TEST_DATA "/corpus");
}

// A larger collection of real files, where the environment names one.
TEST_F(RoundTrip, KeepsTheRecordsOfALargerCorpus)
{
    const char *corpus = getenv("CARTULO_CORPUS");
    CheckFolder(corpus ? corpus : TEST_DATA "/corpus");
}

TEST_F(RoundTrip, KeepsEveryKindOfValue)
{
    BibFile *file = LoadText("@comment{a {nested} comment}\n@comment{}\n"
                             "@preamble{{\\def\\a{x}} # \"\\def\\b{y}\"}\n"
                             "@string{ACM = {x}, i = ACM # { and } # jan}\n"
                             "@misc{k, a = {}, b = \"\", c = 12, d = {12}, e = {x} # m # {y} # 3,\n"
                             "  f = m # n, g = { padded }, h = {\\\"{o} \xE4 {\"}quoted{\"}},\n"
                             "  i = {two\n   lines}}\n@misc{fieldless,}\n"
                             "@inbook{c, title = {t}, crossref = {k}, note = {n}}\n");
    EXPECT_EQ(0, file->errorCount) << Messages(file);
    Check(file);
    Bib_FreeFile(file);
}

// tests/bib_store_test.cpp - name tables and entries.
#include "store/BibStore.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include <sys/resource.h>

#include "tests/support/LoadText.h"
#include "tests/support/LogCapture.h"

namespace
{

class BibStore : public testing::Test
{
protected:
    void SetUp() override { Bib_Initialize(); }
};

class BibNewEntry : public BibStore
{
protected:
    BibFile *file = nullptr;

    void SetUp() override
    {
        BibStore::SetUp();
        file = LoadText("@misc{old, title = {x}}\n");
    }
    void TearDown() override { Bib_FreeFile(file); }

    std::string FieldNames(const BibEntry *entry)
    {
        std::string names;
        for (int i = 0; i < entry->fieldCount; ++i)
            names += FieldName(entry->fields[i]) + " ";
        return names;
    }
};

const char Specs[] = "author=*\0note=\0*x=*\0nonsense\0";

} // namespace

TEST_F(BibStore, StartsWithTheFixedTypes)
{
    ASSERT_EQ(4, BibTypeCount);
    EXPECT_STREQ("** UNKNOWN **", BibTypeTable[0]);
    EXPECT_STREQ("COMMENT", BibTypeTable[1]);
    EXPECT_STREQ("PREAMBLE", BibTypeTable[2]);
    EXPECT_STREQ("STRING", BibTypeTable[3]);
    EXPECT_EQ(0, BibFieldCount);
}

TEST_F(BibStore, KeepsTheFirstSpellingOfAType)
{
    int index = Bib_TypeIndex("Article");
    EXPECT_EQ(4, index);
    EXPECT_EQ(index, Bib_TypeIndex("article"));
    EXPECT_EQ(index, Bib_TypeIndex("ARTICLE"));
    EXPECT_STREQ("Article", BibTypeTable[index]);
}

TEST_F(BibStore, TakesAMissingTypeNameForUnknown)
{
    EXPECT_EQ(0, Bib_TypeIndex(""));
    EXPECT_EQ(0, Bib_TypeIndex(nullptr));
    EXPECT_EQ(4, BibTypeCount);
}

TEST_F(BibStore, ComparesNamesByTheirAsciiLettersOnly)
{
    EXPECT_NE(Bib_FieldIndex("stra\xC4"), Bib_FieldIndex("stra\xE4"));
    EXPECT_EQ(Bib_FieldIndex("TITLE"), Bib_FieldIndex("title"));
}

TEST_F(BibStore, EndsTheProcessAtThe129thType)
{
    for (int i = 4; i < 128; ++i)
        EXPECT_EQ(i, Bib_TypeIndex(("type" + std::to_string(i)).c_str()));
    EXPECT_EQ(1, Bib_HasTypeRoom("TYPE77"));
    EXPECT_EQ(0, Bib_HasTypeRoom("another"));
    EXPECT_EXIT(Bib_TypeIndex("another"), testing::ExitedWithCode(1), "^Type Table full \n$");
}

TEST_F(BibStore, EndsTheProcessAtThe513thField)
{
    for (int i = 0; i < 512; ++i)
        EXPECT_EQ(i, Bib_FieldIndex(("field" + std::to_string(i)).c_str()));
    EXPECT_EQ(1, Bib_HasFieldRoom("FIELD400"));
    EXPECT_EQ(1, Bib_IsFieldKnown("FIELD400"));
    EXPECT_EQ(0, Bib_IsFieldKnown("another"));
    EXPECT_EQ(0, Bib_HasFieldRoom("another"));
    EXPECT_EXIT(Bib_FieldIndex("another"), testing::ExitedWithCode(1),
                "^Field Table full at adding field: `another'\n$");
}

TEST_F(BibNewEntry, TakesMandatoryFieldsOnly)
{
    BibEntry *entry = Bib_NewEntry(file, "new", "Book", Specs, 0);
    EXPECT_EQ("author ", FieldNames(entry));
    EXPECT_STREQ("", entry->fields[0].value);
}

TEST_F(BibNewEntry, TakesAllFieldsOnRequest)
{
    BibEntry *entry = Bib_NewEntry(file, "new", "Book", Specs, 1);
    EXPECT_EQ("author note ", FieldNames(entry));
}

TEST_F(BibNewEntry, GoesToTheHeadOfTheList)
{
    BibEntry *entry = Bib_NewEntry(file, "new", "Book", Specs, 0);
    EXPECT_EQ(entry, file->entries);
    EXPECT_STREQ("old", entry->next->key);
    EXPECT_STREQ("new", entry->key);
    EXPECT_STREQ("Book", BibTypeTable[entry->type]);
}

TEST_F(BibNewEntry, MayHaveNoFields)
{
    BibEntry *entry = Bib_NewEntry(file, "new", "Book", "\0", 1);
    EXPECT_EQ(0, entry->fieldCount);
    EXPECT_EQ(0, Bib_EntryContains(entry, "x"));
    EXPECT_EQ(0, Bib_EntryContains(entry, ""));
}

TEST_F(BibNewEntry, LogsEachItemAndEachFieldThatItTakes)
{
    EXPECT_EQ("Cartulo: Adding Entry: new\n"
              "Cartulo: Count: author=*\n"
              "Cartulo: Count: note=\n"
              "Cartulo: Count: *x=*\n"
              "Cartulo: Count: nonsense\n"
              "Cartulo: Adding empty field: author\n",
              LogOf("1", [this] { Bib_NewEntry(file, "new", "Book", Specs, 0); }));
}

#ifndef __SANITIZE_ADDRESS__ // which needs all address space
TEST_F(BibStore, TellsHowMuchMemoryThereIsNot)
{
    EXPECT_EQ("Can't allocate 16000032 bytes\n", LogOf("6", [] {
                  struct rlimit limit;
                  getrlimit(RLIMIT_AS, &limit);
                  limit.rlim_cur = 4096; // nothing more than there is
                  setrlimit(RLIMIT_AS, &limit);
                  if (Bib_AllocEntry(1000000))
                      _exit(1);
              }));
}
#endif

TEST_F(BibStore, FindsTheFirstFieldOfAName)
{
    BibFile *file = LoadText("@misc{k, note = {a}, title = {b}, Note = {c}}\n@misc{none}\n");
    EXPECT_EQ(0, Bib_FindField(file->entries, "NOTE"));
    EXPECT_EQ(1, Bib_FindField(file->entries, "title"));
    EXPECT_EQ(-1, Bib_FindField(file->entries, "year"));
    EXPECT_EQ(-1, Bib_FindField(file->entries->next, "note"));
    Bib_FreeFile(file);
}

TEST_F(BibStore, FindsWhatLeadsToAnEntry)
{
    BibFile *file = LoadText("@misc{a, note = {x}}\n@misc{b, note = {x}}\n");
    BibFile *other = LoadText("@misc{a, note = {x}}\n");
    EXPECT_EQ(&file->entries, Bib_FindLink(file, file->entries));
    EXPECT_EQ(&file->entries->next, Bib_FindLink(file, file->entries->next));
    EXPECT_EQ(nullptr, Bib_FindLink(file, other->entries));
    Bib_FreeFile(file);
    Bib_FreeFile(other);
}

TEST_F(BibStore, FindsTextInValuesIgnoringCase)
{
    BibFile *file =
        LoadText("@misc{Knuth, title = {The Art of Computer Programming}, year = 1968}");
    for (const char *text : {"the art", "PROGRAMMING", "1968", "6", "g", "Computer P", ""})
        EXPECT_EQ(1, Bib_EntryContains(file->entries, text)) << text;
    for (const char *text : {"knuth", "title", "programmings", "1969", "art  of", "gX"})
        EXPECT_EQ(0, Bib_EntryContains(file->entries, text)) << text;
    Bib_FreeFile(file);
}

TEST_F(BibStore, FindsTextBehindAFalseStart)
{
    BibFile *file = LoadText("@misc{k, a = {aAaAab}, b = {\xC4\xE4}}");
    EXPECT_EQ(1, Bib_EntryContains(file->entries, "AAB"));
    EXPECT_EQ(1, Bib_EntryContains(file->entries, "\xC4\xE4"));
    EXPECT_EQ(0, Bib_EntryContains(file->entries, "\xE4\xC4"));
    Bib_FreeFile(file);
}

// --- The form of a file ---

TEST(BibUpdateForm, SeesEveryTextThatCanBeEdited)
{
    Bib_Initialize();
    for (const char *text : {"@preamble{{\xFC}}", "@string{a\xFC = {b}}", "@string{a = {\xFC}}",
                             "@misc{a\xFC,}", "@misc\xFC{a,}", "@misc{a, b\xFC = {c}}",
                             "@misc{a, b = {\xFC}}", "@misc{a,}@misc{b, c = {d}, e = {\xFC}}"}) {
        BibFile *file = LoadText(text);
        EXPECT_EQ(BIB_FORM_CODE_PAGE, file->form) << text;
        file->form = BIB_FORM_CRLF; // as if it had been edited
        Bib_UpdateForm(file);
        EXPECT_EQ(BIB_FORM_CODE_PAGE | BIB_FORM_CRLF, file->form) << text;
        Bib_FreeFile(file);
    }
}

TEST(BibUpdateForm, NeverTakesAFileForUtf8ThatWasNot)
{
    Bib_Initialize();
    BibFile *file = LoadText("% \xFC\n@misc{a, b = {c}}\n");
    Bib_UpdateForm(file);
    EXPECT_EQ(BIB_FORM_CODE_PAGE, file->form);
    file->form = 0;
    Bib_UpdateForm(file);
    EXPECT_EQ(0, file->form);
    Bib_FreeFile(file);
}

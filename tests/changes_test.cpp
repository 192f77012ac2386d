// tests/changes_test.cpp - changes of open files: what they do, and that they count.
#include "session/Changes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <string>
#include <vector>

#include "session/EntryRules.h"
#include "session/Schema.h"
#include "tests/support/OpenFiles.h"

using testing::ElementsAre;

namespace
{

class Changes : public OpenFiles
{
protected:
    void SetUp() override
    {
        OpenFiles::SetUp();
        set.changed = [](void *owner) { ++static_cast<Changes *>(owner)->told; };
        set.boxOwner = this;
    }

    static std::vector<std::string> StringNames(const BibFile *file)
    {
        std::vector<std::string> names;
        for (const BibString *string = file->strings; string; string = string->next)
            names.push_back(string->name);
        return names;
    }

    // Carries out a change that shall succeed; it counts once, for that file, and is told once.
    void ExpectCounted(const BibFile *file, const std::function<bool()> &change)
    {
        int modified = file->modified, before = told;
        EXPECT_TRUE(change());
        EXPECT_EQ(modified + 1, file->modified);
        EXPECT_EQ(before + 1, told);
    }

    int told = 0;
};

using AddedEntry = Changes;
using RenamedEntry = Changes;
using RemovedEntry = Changes;
using ChangedStrings = Changes;

const std::string Talks = "@misc{Griske84, note = {Talk}}\n";
const std::string Books = "@book{Ost77, title = {East}}\n";

// Children before their parent, one child behind it, and one whose parent is another entry.
const std::string Family = "@inbook{first, crossref = {PARENT}}\n"
                           "@inbook{second, pages = {7}, crossref = {parent}}\n"
                           "@inbook{stranger, crossref = {parents}}\n"
                           "@book{lonely, title = {L}}\n"
                           "@book{parent, title = {P}}\n"
                           "@inbook{last, crossref = {parent}}\n";

TEST_F(Changes, AreCountedAndTold)
{
    BibFile *file = Open("a.bib", "@string{s = {S}}\n" + Talks), *other = Open("b.bib", Books);
    ExpectCounted(file, [&] { return Change_AddEntry(&set, file, "n", "misc", "\0", nullptr); });
    ExpectCounted(file, [&] { return Change_RenameEntry(&set, file, file->entries, "m"); });
    ExpectCounted(file, [&] { return Change_SetType(&set, file, file->entries, 4); });
    BibEntry *made = Change_MakeEntry(file->entries, 4, nullptr, 0);
    EXPECT_EQ(3, file->modified); // it is not in the file yet
    ExpectCounted(file, [&] { return Change_ReplaceEntry(&set, file, file->entries, made); });
    ExpectCounted(file, [&] { return Change_RemoveEntry(&set, file, file->entries); });
    ExpectCounted(file, [&] { return Change_AddString(&set, file, "t", "T"); });
    ExpectCounted(file, [&] { return Change_SetString(&set, file, file->strings, "U"); });
    ExpectCounted(file, [&] { return Change_RemoveString(&set, file, file->strings); });
    ExpectCounted(file, [&] { return Change_SetPreamble(&set, file, "p\r\n", nullptr, 0); });
    Change_Count(&set, file);
    EXPECT_EQ(10, file->modified);
    EXPECT_EQ(0, other->modified);
    EXPECT_EQ(10, told);
}

TEST_F(Changes, AreNotCountedWhenTheyFail)
{
    BibFile *file = Open("a.bib", "@string{s = {S}}\n" + Talks);
    BibFile *other = Open("b.bib", "@string{o = {O}}\n" + Books);
    BibEntry *made = Change_MakeEntry(other->entries, 4, nullptr, 0);
    EXPECT_EQ(0, Change_ReplaceEntry(&set, file, other->entries, made));
    EXPECT_EQ(0, Change_RemoveEntry(&set, file, other->entries));
    EXPECT_EQ(0, Change_RemoveString(&set, file, other->strings));
    EXPECT_EQ(0, Change_SetPreamble(&set, file, std::string(8192, 'x').c_str(), nullptr, 0));
    Bib_FreeEntry(made);
    EXPECT_EQ(0, file->modified);
    EXPECT_EQ(0, other->modified);
    EXPECT_EQ(0, told);
    EXPECT_EQ("Griske84 ", Keys(file));
    EXPECT_EQ("Ost77 ", Keys(other));
    EXPECT_THAT(StringNames(other), ElementsAre("o"));
    EXPECT_STREQ("", file->preamble);
}

TEST_F(Changes, NeedNobodyToTell)
{
    BibFile *file = Open("a.bib", Talks);
    EXPECT_EQ(1, Change_RenameEntry(nullptr, file, file->entries, "m"));
    EXPECT_EQ(1, file->modified);
    EXPECT_EQ(0, told);
}

// --- Entries ---

TEST_F(AddedEntry, IsNotMadeOfMissingValues)
{
    BibFile *file = Open("a.bib", Talks);
    const BibField fields[] = {{file->entries->fields[0].name, 0, Bib_CopyText("x", 1)},
                               {file->entries->fields[0].name, 0, nullptr}};
    EXPECT_EQ(nullptr, Change_MakeEntry(file->entries, 4, fields, 2)); // and takes over the value
}

TEST_F(AddedEntry, HasTheMandatoryFieldsOfItsType)
{
    BibFile *file = Open("a.bib", Talks);
    std::string ini = folder.Write("types.ini", "[talk]\n*=A talk\nauthor=*editor\neditor=*author\n"
                                                "note=\nTitle=*\n");
    char specs[2048];
    Schema_FieldSpecs(ini.c_str(), "talk", specs, sizeof specs);
    ASSERT_EQ("", Entry_CheckType("talk", specs));
    BibEntry *entry = Change_AddEntry(&set, file, "new1", "talk", specs, nullptr);
    EXPECT_EQ(entry, file->entries);
    EXPECT_EQ("@talk{new1,\n\tauthor = {},\n\teditor = {},\n\tTitle = {}\n}\n"
              "@misc{Griske84,\n\tnote = {Talk}\n}\n",
              Saved(file, "a.bib"));
}

TEST_F(AddedEntry, HasNoFieldsWhereItsTypeIsNotDescribed)
{
    BibFile *file = Open("a.bib", Talks);
    char specs[2048];
    Schema_FieldSpecs(folder.Path("none.ini").c_str(), "misc", specs, sizeof specs);
    ASSERT_EQ("", Entry_CheckType("misc", specs));
    EXPECT_EQ(0, Change_AddEntry(&set, file, "new1", "misc", specs, nullptr)->fieldCount);
    EXPECT_EQ("new1 Griske84 ", Keys(file));
}

TEST_F(AddedEntry, RefersToItsParent)
{
    BibFile *file = Open("a.bib", Family);
    ASSERT_EQ("", Entry_CheckType("inbook", Entry_ChildSpecs));
    BibEntry *entry =
        Change_AddEntry(&set, file, "child", "inbook", Entry_ChildSpecs, Find(file, "parent"));
    ASSERT_EQ(1, entry->fieldCount);
    EXPECT_STREQ("crossref", BibFieldTable[entry->fields[0].name]);
    EXPECT_STREQ("parent", entry->fields[0].value);
    EXPECT_NE(Find(file, "parent")->key, entry->fields[0].value);
    EXPECT_EQ("child first second stranger lonely parent last ", Keys(file));
}

TEST_F(AddedEntry, RefersToNothingWhereItsFirstFieldIsAnother)
{
    BibFile *file = Open("a.bib", Talks);
    const char specs[] = "title=*\0crossref=*\0";
    BibEntry *entry = Change_AddEntry(&set, file, "child", "misc", specs, file->entries);
    EXPECT_STREQ("", entry->fields[0].value);
    EXPECT_STREQ("", entry->fields[1].value);
}

TEST_F(RenamedEntry, TakesTheChildrenBeforeItAlong)
{
    BibFile *file = Open("a.bib", Family);
    BibFile *other = Open("b.bib", "@inbook{away, crossref = {parent}}\n");
    EXPECT_EQ(1, Change_RenameEntry(&set, file, Find(file, "parent"), "mother"));
    EXPECT_EQ("@inbook{first,\n\tcrossref = {mother}\n}\n"
              "@inbook{second,\n\tcrossref = {mother},\n\tpages = 7\n}\n"
              "@inbook{stranger,\n\tcrossref = {parents}\n}\n"
              "@book{lonely,\n\ttitle = {L}\n}\n"
              "@book{mother,\n\ttitle = {P}\n}\n"
              "@inbook{last,\n\tcrossref = {parent}\n}\n",
              Saved(file, "a.bib"));
    EXPECT_STREQ("parent", other->entries->fields[0].value);
}

TEST_F(RenamedEntry, LogsTheReferencesThatItLooksAt)
{
    BibFile *file = Open("a.bib", Family);
    log.Lines();
    EXPECT_EQ(1, Change_RenameEntry(&set, file, Find(file, "parent"), "mother"));
    EXPECT_THAT(log.Lines(), ElementsAre("Fix crossref's on the entry: parent", "crossref= PARENT",
                                         "crossref= parent", "crossref= parents"));
}

TEST_F(RenamedEntry, MayBeTheFirstOfItsFile)
{
    BibFile *file = Open("a.bib", Family);
    EXPECT_EQ(1, Change_RenameEntry(&set, file, file->entries, "firstborn"));
    EXPECT_EQ("firstborn second stranger lonely parent last ", Keys(file));
    EXPECT_STREQ("PARENT", file->entries->fields[0].value);
}

// Loading puts the last one first.
TEST_F(RenamedEntry, ChangesTheFirstReferenceOfAnEntryOnly)
{
    BibFile *file = Open("a.bib", "@misc{child, crossref = {a}, crossref = {b}}\n"
                                  "@misc{a, note = 1}\n@misc{b, note = 1}\n");
    const BibField *fields = file->entries->fields;
    EXPECT_EQ(1, Change_RenameEntry(&set, file, Find(file, "a"), "c"));
    EXPECT_STREQ("b", fields[0].value);
    EXPECT_STREQ("a", fields[1].value);
    EXPECT_EQ(1, Change_RenameEntry(&set, file, Find(file, "b"), "d"));
    EXPECT_STREQ("d", fields[0].value);
    EXPECT_STREQ("a", fields[1].value);
}

TEST_F(RemovedEntry, LeavesTheOthersAsTheyWere)
{
    BibFile *file = Open("a.bib", Family);
    EXPECT_EQ(1, Change_RemoveEntry(&set, file, Find(file, "lonely")));
    EXPECT_EQ("first second stranger parent last ", Keys(file));
    EXPECT_EQ(1, Change_RemoveEntry(&set, file, Find(file, "first")));
    EXPECT_EQ("second stranger parent last ", Keys(file));
    EXPECT_EQ(1, Change_RemoveEntry(&set, file, Find(file, "last")));
    EXPECT_EQ("@inbook{second,\n\tcrossref = {parent},\n\tpages = 7\n}\n"
              "@inbook{stranger,\n\tcrossref = {parents}\n}\n"
              "@book{parent,\n\ttitle = {P}\n}\n",
              Saved(file, "a.bib"));
}

TEST_F(RemovedEntry, HasToBeOfTheFile)
{
    BibFile *file = Open("a.bib", Talks), *other = Open("b.bib", Books);
    log.Lines();
    EXPECT_EQ(0, Change_RemoveEntry(&set, file, other->entries));
    EXPECT_THAT(log.Lines(), ElementsAre("DELETEENTRY: Current entry not found."));
    EXPECT_EQ("Griske84 ", Keys(file));
    EXPECT_EQ("Ost77 ", Keys(other));
}

// --- Abbreviations ---

TEST_F(ChangedStrings, GetsNewOnesAtItsEnd)
{
    BibFile *file = Open("b.bib", "@string{b = {B}}\n");
    EXPECT_EQ(1, Change_AddString(&set, file, "a", "A \2b\5"));
    EXPECT_EQ(1, Change_AddString(&set, file, "c", ""));
    EXPECT_THAT(StringNames(file), ElementsAre("b", "a", "c"));
    EXPECT_STREQ("A \2b\5", file->strings->next->value);
    BibFile *empty = Open("c.bib", "");
    EXPECT_EQ(1, Change_AddString(&set, empty, "a", "A"));
    EXPECT_THAT(StringNames(empty), ElementsAre("a"));
}

TEST_F(ChangedStrings, LosesAnyOfItsOwn)
{
    BibFile *file = Open("d.bib", "@string{a = {A}}\n@string{b = {B}}\n@string{c = {C}}\n");
    EXPECT_EQ(1, Change_RemoveString(&set, file, file->strings->next));
    EXPECT_THAT(StringNames(file), ElementsAre("a", "c"));
    EXPECT_EQ(1, Change_RemoveString(&set, file, file->strings));
    EXPECT_EQ(1, Change_RemoveString(&set, file, file->strings));
    EXPECT_EQ(nullptr, file->strings);
}

TEST_F(ChangedStrings, TakesAnotherValue)
{
    BibFile *file = Open("e.bib", "@string{a = {A}}\n");
    EXPECT_EQ(1, Change_SetString(&set, file, file->strings, "Another"));
    EXPECT_STREQ("Another", file->strings->value);
}

// --- The preamble ---

TEST_F(Changes, FillTheBufferOfThePreamble)
{
    BibFile *file = Open("a.bib", "@preamble{{a}}\n");
    EXPECT_EQ(1, Change_SetPreamble(&set, file, std::string(8191, 'x').c_str(), nullptr, 0));
    EXPECT_EQ(8191u, strlen(file->preamble));
    EXPECT_EQ(1, Change_SetPreamble(&set, file, "b\r\n", nullptr, 0));
    EXPECT_STREQ("b\r\n", file->preamble);
}

} // namespace

// tests/entry_rules_test.cpp - which keys, types and files entries may have.
#include "session/EntryRules.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "encoding/Encoding.h"
#include "session/Schema.h"
#include "tests/support/OpenFiles.h"

using testing::ElementsAre;
using testing::HasSubstr;

namespace
{

using EntryFiles = OpenFiles;
using EntryKeys = OpenFiles;
using NewEntry = OpenFiles;
using ReferredEntry = OpenFiles;

const std::string Talks = "@misc{Griske84, note = {Talk}}\n";
const std::string Books = "@book{Ost77, title = {East}}\n";

// Children before their parent, one child behind it, and one whose parent is another entry.
const std::string Family = "@inbook{first, crossref = {PARENT}}\n"
                           "@inbook{second, pages = {7}, crossref = {parent}}\n"
                           "@inbook{stranger, crossref = {parents}}\n"
                           "@book{lonely, title = {L}}\n"
                           "@book{parent, title = {P}}\n"
                           "@inbook{last, crossref = {parent}}\n";

} // namespace

// --- Files ---

TEST_F(EntryFiles, AreTheWritableOnesInTheirOrder)
{
    Open("a.bib", Talks);
    Open("b.bib", Books)->readOnly = 1;
    Open("c.bib", "");
    EXPECT_THAT(Entry_WritableFiles(&set), ElementsAre(0, 2));
}

TEST_F(EntryFiles, CountOnceWhereTheyAreListedTwice)
{
    BibFile *file = Open("a.bib", Talks);
    FileSet_Append(&set, file);
    EXPECT_THAT(Entry_WritableFiles(&set), ElementsAre(0));
}

TEST_F(EntryFiles, AreCalledByTheirBaseNames)
{
    Open("refs.bib", Talks);
    Open("R&D.2020.bib", Books);
    std::vector<int> files = Entry_WritableFiles(&set);
    EXPECT_EQ("refs", Entry_FileLabel(&set, files, 0));
    EXPECT_EQ("R&D", Entry_FileLabel(&set, files, 1));
}

TEST_F(EntryFiles, AreToldApartByTheirPathsWhereNeeded)
{
    Open("refs.2020.bib", Talks);
    Open("Refs.2021.bib", Books);
    Open(".bib", "");
    std::vector<int> files = Entry_WritableFiles(&set);
    EXPECT_EQ("refs (" + folder.Path("refs.2020.bib") + ")", Entry_FileLabel(&set, files, 0));
    EXPECT_EQ("Refs (" + folder.Path("Refs.2021.bib") + ")", Entry_FileLabel(&set, files, 1));
    EXPECT_EQ(" (" + folder.Path(".bib") + ")", Entry_FileLabel(&set, files, 2));
}

TEST_F(EntryFiles, HoldParentsThatHaveNoneThemselves)
{
    BibFile *file = Open("a.bib", Family);
    EXPECT_TRUE(Entry_MayBeParent(file, Find(file, "parent")));
    EXPECT_FALSE(Entry_MayBeParent(file, Find(file, "second")));
    EXPECT_FALSE(Entry_MayBeParent(file, nullptr));
    EXPECT_FALSE(Entry_MayBeParent(nullptr, nullptr));
    file->readOnly = 1;
    EXPECT_FALSE(Entry_MayBeParent(file, Find(file, "parent")));
}

// --- Keys ---

TEST_F(EntryKeys, AreCheckedForNewEntries)
{
    BibFile *talks = Open("talks.bib", Talks), *books = Open("books.bib", Books);
    struct {
        const char *key;
        const BibFile *target;
        KeyVerdict verdict;
    } const rows[] = {{"new1", talks, KEY_OK},
                      {"", talks, KEY_EMPTY},
                      {"", nullptr, KEY_EMPTY},
                      {"a{b", talks, KEY_BAD_CHARS},
                      {"a#b", nullptr, KEY_BAD_CHARS},
                      {"Griske84'", talks, KEY_BAD_CHARS},
                      {"a\\b", talks, KEY_UNWRITABLE},
                      {"a\x7F", talks, KEY_UNWRITABLE},
                      {"84", talks, KEY_OK},
                      {"M\xFCller", talks, KEY_OK},
                      {"new1", nullptr, KEY_NO_FILE},
                      {"Griske84", talks, KEY_TAKEN},
                      {"gRISKE84", talks, KEY_TAKEN},
                      {"Griske8", talks, KEY_OK},
                      {"griske84", books, KEY_TAKEN_ELSEWHERE},
                      {"ost77", talks, KEY_TAKEN_ELSEWHERE}};
    for (const auto &row : rows)
        EXPECT_EQ(row.verdict, Entry_CheckNewKey(&set, row.target, {row.key, true})) << row.key;
}

TEST_F(EntryKeys, AreRefusedForEveryCharacterOfTheBlacklist)
{
    BibFile *file = Open("a.bib", "");
    for (char c : std::string("\"#%'(),={} ")) {
        std::string key = std::string("a") + c + "b";
        EXPECT_EQ(KEY_BAD_CHARS, Entry_CheckNewKey(&set, file, {key.c_str(), true})) << key;
        Bib_StripKeyChars(key.data());
        EXPECT_EQ(KEY_OK, Entry_CheckNewKey(&set, file, {key.c_str(), true})) << key;
    }
}

TEST_F(EntryKeys, OfAFileThatIsListedTwiceAreNotTakenElsewhere)
{
    BibFile *file = Open("a.bib", Talks);
    FileSet_Append(&set, file);
    EXPECT_EQ(KEY_OK, Entry_CheckNewKey(&set, file, {"new1", true}));
    EXPECT_EQ(KEY_TAKEN, Entry_CheckNewKey(&set, file, {"Griske84", true}));
}

TEST_F(EntryKeys, AreCheckedForRenamedEntries)
{
    BibFile *talks = Open("talks.bib", Talks + "@misc{other, note = {N}}\n");
    Open("books.bib", Books);
    const BibEntry *entry = Find(talks, "Griske84");
    struct {
        const char *key;
        KeyVerdict verdict;
    } const rows[] = {{"new1", KEY_OK},       {"", KEY_EMPTY},
                      {"a=b", KEY_BAD_CHARS}, {"a\\b", KEY_UNWRITABLE},
                      {"Griske84", KEY_SAME}, {"griske84", KEY_TAKEN},
                      {"OTHER", KEY_TAKEN},   {"ost77", KEY_TAKEN_ELSEWHERE}};
    for (const auto &row : rows)
        EXPECT_EQ(row.verdict, Entry_CheckRename(&set, talks, entry, {row.key, true})) << row.key;
}

TEST_F(EntryKeys, AreRefusedForCharactersThatTheCodePageLacks)
{
    BibFile *file = Open("a.bib", "@misc{\xFF, note = {N}}\n");
    EXPECT_EQ(KEY_EMPTY, Entry_CheckNewKey(&set, file, {"", false}));
    for (const char *key : {"\xFF", "\xFF{", "\\", "b"}) {
        EXPECT_EQ(KEY_MISFIT, Entry_CheckNewKey(&set, file, {key, false}));
        EXPECT_EQ(KEY_MISFIT, Entry_CheckRename(&set, file, file->entries, {key, false}));
    }
}

// --- New entries ---

TEST_F(NewEntry, NeedsAType)
{
    EXPECT_THAT(Entry_CheckType("", ""), HasSubstr("no type"));
    EXPECT_THAT(Entry_CheckType("my type", ""), HasSubstr("`my type'"));
    EXPECT_THAT(Entry_CheckType("1type", ""), HasSubstr("`1type'"));
}

TEST_F(NewEntry, NeedsFieldsThatCanBeWritten)
{
    EXPECT_THAT(Entry_CheckType("misc", "title=*\0end page=*\0"), HasSubstr("`end page'"));
    EXPECT_EQ("", Entry_CheckType("misc", "title=*\0end page=\0*x y=*\0=*\0"));
}

TEST_F(NewEntry, NeedsRoomForTheNamesOfItsFields)
{
    const char specs[] = "new1=*\0new2=*\0F7=*\0note=\0";
    for (int i = 0; i < BIB_FIELD_LIMIT - 2; ++i)
        Bib_FieldIndex(("f" + std::to_string(i)).c_str());
    EXPECT_EQ("", Entry_CheckType("misc", specs));
    Bib_FieldIndex("one more");
    EXPECT_THAT(Entry_CheckType("misc", specs), HasSubstr("too many different names"));
    EXPECT_EQ("", Entry_CheckType("misc", "new1=*\0F7=*\0"));
    EXPECT_EQ(BIB_FIELD_LIMIT - 1, BibFieldCount);
}

TEST_F(NewEntry, NeedsRoomForItsType)
{
    for (int i = BibTypeCount; i < BIB_TYPE_LIMIT; ++i)
        Bib_TypeIndex(("t" + std::to_string(i)).c_str());
    EXPECT_EQ("", Entry_CheckType("T100", ""));
    EXPECT_THAT(Entry_CheckType("more", ""), HasSubstr("`more'"));
}

// --- References ---

TEST_F(ReferredEntry, IsReferredToByTheEntriesBeforeIt)
{
    BibFile *file = Open("a.bib", Family);
    Open("b.bib", "@inbook{away, crossref = {lonely}}\n");
    EXPECT_EQ("`first', `second'", Entry_Referrers(file, Find(file, "parent")));
    EXPECT_EQ("", Entry_Referrers(file, Find(file, "lonely")));
    EXPECT_EQ("", Entry_Referrers(file, Find(file, "first")));
}

TEST_F(ReferredEntry, IsNotHeldByAReferenceOfItsOwn)
{
    BibFile *file = Open("a.bib", "@misc{self, crossref = {self}}\n");
    EXPECT_EQ("", Entry_Referrers(file, file->entries));
}

TEST_F(ReferredEntry, LogsTheReferencesThatItLooksAt)
{
    BibFile *file = Open("a.bib", Family);
    log.Lines();
    Entry_Referrers(file, Find(file, "lonely"));
    EXPECT_THAT(log.Lines(),
                ElementsAre("crossref= PARENT", "crossref= parent", "crossref= parents"));
}

// --- Files in several encodings ---

TEST_F(EntryKeys, AreComparedAcrossEncodings)
{
    Enc_Select("CP65001");
    BibFile *utf8 = Open("a.bib", "@misc{M\xC3\xBCller,}\n");
    BibFile *other = Open("b.bib", "@misc{\xD6sterreich,}\n");
    auto check = [this](const wchar_t *key, const BibFile *target) {
        return Entry_CheckNewKey(&set, target, Name_Read(key, Bib_Encoding(target)));
    };
    EXPECT_EQ(KEY_TAKEN_ELSEWHERE, check(L"m\u00FCller", other));
    EXPECT_EQ(KEY_TAKEN, check(L"m\u00FCller", utf8));
    EXPECT_EQ(KEY_TAKEN_ELSEWHERE, check(L"\u00D6sterreich", utf8));
    EXPECT_EQ(KEY_OK, check(L"\u0416", utf8));
    EXPECT_EQ(KEY_MISFIT, check(L"\u0416", other));
    EXPECT_EQ(KEY_OK, check(L"Muller", other));
}

TEST_F(EntryKeys, AreComparedWithoutTheLettersThatAnEncodingLacks)
{
    Enc_Select("CP65001");
    BibFile *utf8 = Open("a.bib", "@misc{a,}\n");
    Open("b.bib", "@misc{\xFF,}\n");
    EXPECT_EQ(KEY_OK, Entry_CheckNewKey(&set, utf8, Name_Read(L"\u0416", &EncodingUtf8)));
    EXPECT_EQ(KEY_TAKEN_ELSEWHERE,
              Entry_CheckNewKey(&set, utf8, Name_Read(L"\u00FF", &EncodingUtf8)));
}

TEST_F(NewEntry, HasNamesInTheEncodingOfItsFile)
{
    Enc_Select("CP65001");
    BibFile *utf8 = Open("a.bib", "@misc{a,}\n");
    BibFile *other = Open("b.bib", "@misc{b, x = {\xFC}}\n");
    const char name[] = "B\xC3\xBC"
                        "cher";
    const char specs[] = "t\xC3\xADtulo=*\0year=*\0";
    EntryType type = Entry_TypeFor(utf8, name, specs);
    EXPECT_EQ(name, type.name);
    EXPECT_EQ(std::string(specs, sizeof specs), type.specs);
    type = Entry_TypeFor(other, name, specs);
    EXPECT_EQ("B\xFC"
              "cher",
              type.name);
    EXPECT_EQ(std::string("t\xEDtulo=*\0year=*\0\0", 17), type.specs);
    EXPECT_EQ("", type.reason);
}

TEST_F(NewEntry, IsRefusedForNamesThatItsFileCannotHave)
{
    Enc_Select("CP65001");
    BibFile *utf8 = Open("a.bib", "@misc{a,}\n");
    BibFile *other = Open("b.bib", "@misc{b, x = {\xFC}}\n");
    for (auto [name, specs] : {std::pair("\xD0\x96", "\0"), std::pair("misc", "\xD0\x96=*\0")}) {
        EXPECT_EQ("", Entry_TypeFor(utf8, name, specs).reason) << name;
        EXPECT_EQ("The type or one of its fields has letters that can't be stored in CP1252.",
                  Entry_TypeFor(other, name, specs).reason)
            << name;
    }
    EXPECT_EQ("There is no type for the entry: the list of entry types can't be found.",
              Entry_TypeFor(utf8, "", "").reason);
}

TEST_F(EntryKeys, ShareTypesThatTheirFilesCanHave)
{
    Enc_Select("CP65001");
    BibFile *utf8 = Open("a.bib", "@misc{a,}\n");
    BibFile *other = Open("b.bib", "@gr\xF6\xDF{b, x = {\xFC}}\n");
    std::string reason;
    auto typeIn = [&](const BibFile *file, int type) { return Entry_TypeIn(file, type, &reason); };
    int type = Bib_TypeIndex("B\xC3\xBC"
                             "cher");
    EXPECT_EQ(type, typeIn(utf8, type));
    EXPECT_STREQ("B\xFC"
                 "cher",
                 BibTypeTable[typeIn(other, type)]);
    EXPECT_EQ(type, typeIn(utf8, typeIn(other, type)));
    EXPECT_EQ("", reason);
    EXPECT_EQ(-1, typeIn(other, Bib_TypeIndex("\xD0\x96")));
    EXPECT_THAT(reason, HasSubstr("letters that can't be stored in CP1252"));
    EXPECT_EQ(-1, typeIn(utf8, Bib_TypeIndex("my type")));
    EXPECT_EQ("An entry of the type `my type' can't be written to a BIB file.", reason);
    while (BibTypeCount < BIB_TYPE_LIMIT)
        Bib_TypeIndex(("T" + std::to_string(BibTypeCount)).c_str());
    int foreign = other->entries->type;
    EXPECT_EQ(foreign, typeIn(other, foreign));
    EXPECT_EQ("", reason);
    EXPECT_EQ(-1, typeIn(utf8, foreign));
    EXPECT_NE("", reason);
}

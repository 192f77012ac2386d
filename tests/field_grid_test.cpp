// tests/field_grid_test.cpp - the rows of the entry pane: filled, edited, compared, built.
#include "session/Changes.h"
#include "ui/FieldGrid.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cctype>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include <sys/resource.h>

#include "encoding/Encoding.h"
#include "session/KnownStrings.h"
#include "tests/support/LoadText.h"
#include "tests/support/TempFolder.h"

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

using Lines = std::vector<std::string>;

// Of what a test types and expects: UTF-8, with \n, \t and \xNN for characters.
std::wstring Wide(const std::string &text)
{
    std::wstring wide = Enc_Decode(text.c_str(), &EncodingUtf8);
    for (size_t at = 0; (at = wide.find(L'\\', at)) != wide.npos; ++at) {
        wchar_t next = wide[at + 1];
        if (next == L'n' || next == L't')
            wide.replace(at, 2, 1, next == L'n' ? L'\n' : L'\t');
        else if (next == L'x')
            wide.replace(at, 4, 1, std::stoi(wide.substr(at + 2, 2), nullptr, 16));
    }
    return wide;
}

std::string Utf8(const std::wstring &wide)
{
    std::string text;
    char bytes[ENC_LONGEST];
    for (wchar_t c : wide)
        text.append(bytes, Enc_PutUtf8(bytes, static_cast<uint32_t>(c)));
    return text;
}

// "key=value" of each row, in parentheses when it is inherited.
Lines Rows(const FieldGrid &grid)
{
    Lines rows;
    for (int i = 0; i < grid.count; ++i) {
        const GridRow &row = grid.rows[i];
        std::string text = row.key + "=" + Utf8(row.text);
        rows.push_back(row.inherited ? "(" + text + ")" : text);
    }
    return rows;
}

BibEntry *FindEntry(const BibFile *file, const std::string &key)
{
    BibEntry *entry = file->entries;
    while (entry && key != entry->key)
        entry = entry->next;
    return entry;
}

class Grid : public testing::Test
{
protected:
    FieldGrid grid = {};
    BibFile *file = nullptr;

    void SetUp() override
    {
        setenv("CARTULO_LOG", "9", 1);
        Bib_Initialize();
    }
    void TearDown() override
    {
        if (file)
            Bib_FreeFile(file);
    }

    // Loads the text and shows one of its entries.
    void Show(const std::string &text, const std::string &key)
    {
        if (file)
            Bib_FreeFile(file);
        file = LoadText(text);
        EXPECT_EQ(0, file->errorCount) << Messages(file);
        Grid_Fill(&grid, FindEntry(file, key), Enc_Current());
    }

    void Type(int row, const std::string &text) { grid.rows[row].text = Wide(text); }
    std::string Losses() { return Utf8(Grid_Losses(&grid, nullptr)); }
};

std::string Fields(int count) // "f1 = 1, f2 = 2, ..."
{
    std::string text;
    for (int i = 1; i <= count; ++i)
        text += "f" + std::to_string(i) + " = " + std::to_string(i) + ", ";
    return text;
}

const char Family[] = "@misc{before, note = {n}}\n"
                      "@inbook{child, title = {own}, crossref = {PARENT}, pages = 7}\n"
                      "@book{parent, title = {theirs}, year = 1999, month = jan}\n";

} // namespace

// --- Showing ---

TEST_F(Grid, ShowsOwnFieldsAndThenInheritedOnes)
{
    Show(Family, "child");
    EXPECT_THAT(Rows(grid), ElementsAre("crossref=PARENT", "title=own", "pages=7", "(year=1999)",
                                        "(month=«jan»)"));
    EXPECT_EQ(FindEntry(file, "parent"), grid.parent);
    EXPECT_EQ(FindEntry(file, "child"), grid.entry);
    EXPECT_THAT(Grid_HiddenFields(&grid), IsEmpty());
    EXPECT_TRUE(grid.rows[0].crossref);
    EXPECT_FALSE(grid.rows[1].crossref);
}

TEST_F(Grid, ShowsAnEntryWithoutFields)
{
    Show("@misc{k,}", "k");
    EXPECT_THAT(Rows(grid), IsEmpty());
    EXPECT_EQ(nullptr, grid.parent);
}

TEST_F(Grid, InheritsFromNoEntryBefore)
{
    Show("@book{p, year = 1}\n@inbook{k, crossref = {p}}\n", "k");
    EXPECT_THAT(Rows(grid), ElementsAre("crossref=p"));
    EXPECT_EQ(nullptr, grid.parent);
}

TEST_F(Grid, InheritsFromNoOtherFile)
{
    BibFile *other = LoadText("@book{p, year = 1}\n");
    Show("@inbook{k, crossref = {p}}\n", "k");
    EXPECT_EQ(nullptr, grid.parent);
    Bib_FreeFile(other);
}

TEST_F(Grid, DoesNotInheritFromItself)
{
    Show("@inbook{k, crossref = {k}}\n", "k");
    EXPECT_EQ(nullptr, grid.parent);
}

TEST_F(Grid, InheritsFromTheFirstOfTwoEntriesBehind)
{
    Show("@inbook{k, crossref = {p}}\n@book{p, year = 1}\n@book{P, year = 2}\n", "k");
    EXPECT_THAT(Rows(grid), ElementsAre("crossref=p", "(year=1)"));
}

TEST_F(Grid, InheritsOverOneStepOnly)
{
    Show("@inbook{k, crossref = {p}}\n@book{p, year = 1, crossref = {q}}\n@book{q, note = 2}\n",
         "k");
    EXPECT_THAT(Rows(grid), ElementsAre("crossref=p", "(year=1)"));
}

TEST_F(Grid, StopsAtSixteenRowsWithInheritedFields)
{
    Show("@inbook{k, crossref = {p}, " + Fields(12) +
             "}\n@book{p, a = 1, f3 = 3, b = 2, c = 3, "
             "d = 4}\n",
         "k");
    ASSERT_EQ(GRID_ROWS, grid.count);
    EXPECT_EQ("c", grid.rows[15].key);
    EXPECT_TRUE(grid.rows[15].inherited);
    EXPECT_EQ("1 more inherited field is not shown.", Grid_HiddenText(&grid));
}

TEST_F(Grid, CountsFieldsThatFindNoRow)
{
    Show("@misc{k, " + Fields(16) + "}", "k");
    EXPECT_EQ(GRID_ROWS, grid.count);
    EXPECT_THAT(Grid_HiddenFields(&grid), IsEmpty());
    Show("@misc{k, " + Fields(19) + "}", "k");
    EXPECT_EQ(GRID_ROWS, grid.count);
    EXPECT_EQ(3u, Grid_HiddenFields(&grid).size());
}

TEST_F(Grid, ForgetsTheEntryWhenItIsCleared)
{
    Show(Family, "child");
    Grid_Clear(&grid);
    EXPECT_EQ(0, grid.count);
    EXPECT_EQ(nullptr, grid.entry);
    EXPECT_EQ(nullptr, grid.parent);
}

TEST_F(Grid, TellsOfFieldsThatFoundNoRow)
{
    Show(Family, "child");
    EXPECT_EQ("", Grid_HiddenText(&grid));
    Show("@misc{k, " + Fields(17) + "}", "k");
    EXPECT_EQ("1 more field is not shown.", Grid_HiddenText(&grid));
    Show("@misc{k, crossref = {p}, " + Fields(17) + "}\n@misc{p, f3 = 3, note = {a}}", "k");
    EXPECT_EQ("2 more fields are not shown. 1 more inherited field is not shown.",
              Grid_HiddenText(&grid));
    std::vector<HiddenField> hidden = Grid_HiddenFields(&grid);
    ASSERT_EQ(3u, hidden.size());
    EXPECT_EQ("f16", hidden[0].key);
    EXPECT_FALSE(hidden[0].inherited);
    EXPECT_EQ("note", hidden[2].key);
    EXPECT_TRUE(hidden[2].inherited);
    Grid_Clear(&grid);
    EXPECT_EQ("", Grid_HiddenText(&grid));
}

// --- Editing ---

TEST_F(Grid, AddsARowAtTheEnd)
{
    Show("@misc{k, note = {a}}", "k");
    int row = -1;
    EXPECT_EQ(GRID_ADDED, Grid_Add(&grid, "title", &row));
    EXPECT_EQ(1, row);
    EXPECT_THAT(Rows(grid), ElementsAre("note=a", "title="));
}

TEST_F(Grid, AddsNoKeyTwice)
{
    Show("@misc{k, Journal = {a}}", "k");
    int row = -1;
    EXPECT_EQ(GRID_EXISTS, Grid_Add(&grid, "journal", &row));
    EXPECT_EQ(-1, row);
    EXPECT_EQ(1, grid.count);
}

TEST_F(Grid, AddsNoKeyOfAFieldWithoutARow)
{
    Show("@misc{k, " + Fields(17) + "}", "k");
    int row = -1;
    EXPECT_EQ(GRID_EXISTS, Grid_Add(&grid, "F17", &row));
    EXPECT_EQ(GRID_FULL, Grid_Add(&grid, "f18", &row));
    EXPECT_EQ(-1, row);
}

TEST_F(Grid, OverridesAnInheritedRowWhereItStands)
{
    Show(Family, "child");
    int row = -1;
    EXPECT_EQ(GRID_OVERRIDDEN, Grid_Add(&grid, "Month", &row));
    EXPECT_EQ(4, row);
    EXPECT_THAT(Rows(grid), ElementsAre("crossref=PARENT", "title=own", "pages=7", "(year=1999)",
                                        "month=«jan»"));
    EXPECT_EQ(GRID_EXISTS, Grid_Add(&grid, "month", &row));
}

TEST_F(Grid, OverridesNoKeyThatARenamedRowHas)
{
    Show(Family, "child");
    Grid_Rename(&grid, 1, "year");
    int row = -1;
    EXPECT_EQ(GRID_EXISTS, Grid_Add(&grid, "year", &row));
    EXPECT_EQ(GRID_REMOVED, Grid_Remove(&grid, 1)); // the inherited one is shown already
    EXPECT_THAT(Rows(grid),
                ElementsAre("crossref=PARENT", "pages=7", "(year=1999)", "(month=«jan»)"));
}

TEST_F(Grid, LetsTheUserTypeACrossrefThatIsNew)
{
    Show("@misc{k, note = {a}}", "k");
    int row = -1;
    EXPECT_EQ(GRID_ADDED, Grid_Add(&grid, "crossref", &row));
    EXPECT_FALSE(grid.rows[row].crossref);
}

TEST_F(Grid, MovesRowsUpWhenOneIsRemoved)
{
    Show(Family, "child");
    EXPECT_EQ(GRID_REMOVED, Grid_Remove(&grid, 2));
    EXPECT_THAT(Rows(grid),
                ElementsAre("crossref=PARENT", "title=own", "(year=1999)", "(month=«jan»)"));
}

TEST_F(Grid, KeepsWhatWasTypedInRowsThatMoveUp)
{
    Show("@misc{k, a = 1, b = 2, c = 3}", "k");
    Type(2, "typed");
    EXPECT_EQ(GRID_REMOVED, Grid_Remove(&grid, 0));
    EXPECT_THAT(Rows(grid), ElementsAre("b=2", "c=typed"));
}

TEST_F(Grid, RemovesTheOnlyRow)
{
    Show("@misc{k, note = {a}}", "k");
    EXPECT_EQ(GRID_REMOVED, Grid_Remove(&grid, 0));
    EXPECT_THAT(Rows(grid), IsEmpty());
    EXPECT_EQ(GRID_NO_ROW, Grid_Remove(&grid, 0));
}

TEST_F(Grid, TurnsARowOfTheTargetsIntoAnInheritedOne)
{
    Show(Family, "child");
    Type(1, "typed");
    EXPECT_EQ(GRID_INHERITED, Grid_Remove(&grid, 1));
    EXPECT_THAT(Rows(grid), ElementsAre("crossref=PARENT", "(title=theirs)", "pages=7",
                                        "(year=1999)", "(month=«jan»)"));
    EXPECT_EQ(grid.rows[1].text, grid.rows[1].filled);
}

TEST_F(Grid, RemovesNoRowBeyondTheStoredFields)
{
    Show("@misc{k, a = 1, b = 2}", "k");
    int row;
    Grid_Add(&grid, "c", &row);
    EXPECT_EQ(GRID_NO_ROW, Grid_Remove(&grid, 2));
    EXPECT_EQ(GRID_NO_ROW, Grid_Remove(&grid, 3));
    EXPECT_EQ(GRID_NO_ROW, Grid_Remove(&grid, -1));
    EXPECT_EQ(GRID_REMOVED, Grid_Remove(&grid, 0));
    EXPECT_EQ(GRID_REMOVED, Grid_Remove(&grid, 1)); // the added one has moved into reach
    EXPECT_THAT(Rows(grid), ElementsAre("b=2"));
}

TEST_F(Grid, ComparesANewNameWithShownValues)
{
    Show(Family, "child");
    EXPECT_FALSE(Grid_MayRename(&grid, "OWN"));
    EXPECT_FALSE(Grid_MayRename(&grid, "1999")); // of an inherited row
    EXPECT_FALSE(Grid_MayRename(&grid, "7"));
    EXPECT_TRUE(Grid_MayRename(&grid, "pages")); // a key
    EXPECT_TRUE(Grid_MayRename(&grid, "ow"));
    Type(1, "typed");
    EXPECT_TRUE(Grid_MayRename(&grid, "own"));
    EXPECT_FALSE(Grid_MayRename(&grid, "Typed"));
}

TEST_F(Grid, KeepsTheValueOfARenamedRow)
{
    Show("@misc{k, a = 1}", "k");
    Grid_Rename(&grid, 0, "b");
    EXPECT_THAT(Rows(grid), ElementsAre("b=1"));
}

// --- Committing ---

TEST_F(Grid, AsksWithNumbers)
{
    GridChanges changes = {true, 1, 0, 12};
    EXPECT_EQ("There are changes in this entry:\n\n"
              "\tmodified type: \tYES\n"
              "\tadded fields: \t1\n"
              "\tmodified fields: \t0\n"
              "\tremoved fields: \t12\n"
              "\nDo you want to accept these changes ?",
              Grid_Question(&changes));
    changes = {false, 0, 3, 0};
    EXPECT_THAT(Grid_Question(&changes), testing::HasSubstr("\tmodified type: \tNO\n"));
    EXPECT_THAT(Grid_Question(&changes), testing::HasSubstr("\tmodified fields: \t3\n"));
}

TEST_F(Grid, TakesEachKindOfChangeForOne)
{
    for (GridChanges one : {GridChanges{true, 0, 0, 0}, GridChanges{false, 1, 0, 0},
                            GridChanges{false, 0, 1, 0}, GridChanges{false, 0, 0, 1}})
        EXPECT_TRUE(Grid_HasChanges(&one));
    GridChanges none = {};
    EXPECT_FALSE(Grid_HasChanges(&none));
}

TEST_F(Grid, EntersNoNameWhenItCompares)
{
    Show("@misc{k, note = {a}}", "k");
    int row;
    Grid_Add(&grid, "quitenew", &row);
    int before = BibFieldCount;
    EXPECT_EQ(1, Grid_Compare(&grid, grid.entry->type).added);
    EXPECT_EQ(before, BibFieldCount);
}

TEST_F(Grid, EndsItsQuestionAboutLossesWithOne)
{
    Show("@misc{k, note = {\xAB x}}", "k");
    EXPECT_EQ("", Losses());
    Type(0, "« Ж");
    EXPECT_EQ("`note': Ж can't be stored in CP1252 and would become ÿ.\n"
              "`note': « and » will mark an abbreviation, not stand as text.\n"
              "\nDo you want to accept these changes anyway ?",
              Losses());
}

// They may have been copied from there.
TEST_F(Grid, AsksAboutGuillemetsThatStandInAnotherField)
{
    const char *const question = "`note': « and » will mark an abbreviation, not stand as "
                                 "text.\n";
    Show("@misc{k, note = {a}, title = {\xAB x}}", "k");
    Type(0, "« x");
    EXPECT_THAT(Losses(), testing::StartsWith(question));
    Show("@misc{k, note = {a}, crossref = {p}}\n@misc{p, title = {x \xBB}}", "k");
    Type(1, "«jan»");
    EXPECT_THAT(Losses(), testing::StartsWith(question));
    Show("@misc{k, " + Fields(16) + "note = {\xAB}}", "k");
    Type(0, "«jan»");
    EXPECT_THAT(Losses(), testing::StartsWith("`f1': « and »"));
    Show("@misc{k, note = {a}, title = jan}", "k");
    Type(0, "«jan»");
    EXPECT_EQ("", Losses());
}

TEST_F(Grid, NamesSomeOfManyLostCharacters)
{
    Show("@misc{k, note = {a}}", "k");
    Type(0, "абвгдежзийклмнопрстуфхцчшщ");
    EXPECT_THAT(Losses(), testing::StartsWith("`note': а б в г д е ж з и й к л м н о п р с т у ... "
                                              "can't be stored in CP1252 and would become ÿ.\n"));
}

TEST_F(Grid, KeepsTheStoredValueOfALockedRow)
{
    Show("@misc{k, note = {very long}}", "k");
    grid.rows[0].locked = true;
    Type(0, "very");
    GridChanges changes = Grid_Compare(&grid, grid.entry->type);
    EXPECT_FALSE(Grid_HasChanges(&changes));
    BibEntry *entry = Grid_Build(&grid, grid.entry->type);
    EXPECT_STREQ("very long", entry->fields[0].value);
    Bib_FreeEntry(entry);
}

TEST_F(Grid, ChecksNoInheritedRow)
{
    Show("@inbook{k, crossref = {p}}\n@book{p, note = {a}}\n", "k");
    grid.rows[1].stored = "}";
    EXPECT_EQ(nullptr, Grid_CheckRow(&grid, 1));
    grid.rows[1].inherited = false;
    EXPECT_STREQ("Unbalanced braces (extra `}')", Grid_CheckRow(&grid, 1));
}

TEST_F(Grid, HasRoomForAsManyNamesAsTheTable)
{
    Show("@misc{k, note = {a}}", "k");
    while (BibFieldCount < BIB_FIELD_LIMIT - 2)
        Bib_FieldIndex(("name" + std::to_string(BibFieldCount)).c_str());
    int row;
    Grid_Add(&grid, "new1", &row);
    Grid_Add(&grid, "name100", &row);
    EXPECT_TRUE(Grid_HasRoom(&grid));
    Grid_Add(&grid, "new2", &row);
    EXPECT_TRUE(Grid_HasRoom(&grid));
    Grid_Add(&grid, "new3", &row);
    EXPECT_FALSE(Grid_HasRoom(&grid));
    Grid_Rename(&grid, row, "NEW1"); // which needs its room only once
    EXPECT_TRUE(Grid_HasRoom(&grid));
    BibEntry *entry = Grid_Build(&grid, grid.entry->type);
    EXPECT_EQ(BIB_FIELD_LIMIT, BibFieldCount);
    EXPECT_TRUE(Grid_HasRoom(&grid));
    Bib_FreeEntry(entry);
}

TEST_F(Grid, CopiesTheWordsThatTravelWithFields)
{
    Show("@misc{k, " + Fields(17) + "}", "k");
    BibEntry *old = file->entries;
    old->reserved = 77;
    for (int i = 0; i < old->fieldCount; ++i)
        old->fields[i].companion = 100 + i;
    Grid_Fill(&grid, old, Enc_Current());
    Grid_Remove(&grid, 0);
    int row;
    Grid_Add(&grid, "new", &row);
    BibEntry *entry = Grid_Build(&grid, old->type);
    EXPECT_EQ(77, entry->reserved);
    ASSERT_EQ(17, entry->fieldCount);
    EXPECT_EQ(101, entry->fields[0].companion);
    EXPECT_EQ(115, entry->fields[14].companion);
    EXPECT_EQ(0, entry->fields[15].companion); // new
    EXPECT_EQ(116, entry->fields[16].companion);
    Bib_FreeEntry(entry);
}

TEST_F(Grid, ReplacesNoEntryOfAnotherFile)
{
    BibFile *other = LoadText("@misc{x, note = {a}}\n");
    Show("@misc{k, note = {a}}\n", "k");
    BibEntry *entry = Grid_Build(&grid, grid.entry->type);
    EXPECT_EQ(0, Change_ReplaceEntry(nullptr, other, file->entries, entry));
    EXPECT_STREQ("x", other->entries->key);
    EXPECT_STREQ("k", file->entries->key);
    EXPECT_EQ(1, Change_ReplaceEntry(nullptr, file, file->entries, entry));
    EXPECT_EQ(entry, file->entries);
    Bib_FreeFile(other);
}

#ifndef __SANITIZE_ADDRESS__ // which needs all address space
TEST_F(Grid, BuildsNothingWithoutMemory)
{
    Show("@misc{k, a = 1, b = 2, c = 3}", "k");
    grid.rows[1].text = std::wstring(64 * 1024 * 1024, L'x');
    struct rlimit limit;
    getrlimit(RLIMIT_AS, &limit);
    struct rlimit low = {4096, limit.rlim_max}; // nothing more than there is
    setrlimit(RLIMIT_AS, &low);
    BibEntry *entry = Grid_Build(&grid, grid.entry->type);
    setrlimit(RLIMIT_AS, &limit);
    EXPECT_EQ(nullptr, entry);
    EXPECT_EQ(3, file->entries->fieldCount);
}
#endif

TEST_F(Grid, TellsOfAbbreviationsThatNobodyKnows)
{
    Show("@misc{k, title = {Old} # known, note = {n}}", "k");
    BibFileSet set = {};
    set.files = &file;
    set.count = 1;
    TempFolder folder;
    StringSources sources = Strings_Sources(&set, folder.Path("none.ini"));
    Type(0, "Old «known» «jan»");
    Type(1, "n");
    EXPECT_EQ(L"", Grid_Losses(&grid, &sources));
    Type(1, "«Welt» «Leute»");
    EXPECT_EQ(L"`note': no abbreviation \u00ABWelt\u00BB, \u00ABLeute\u00BB is known. As text, "
              L"quotation marks are typed in another way, like << and >>.\n"
              L"\nDo you want to accept these changes anyway ?",
              Grid_Losses(&grid, &sources));
}

TEST_F(Grid, KnowsTheLettersOfItsFile)
{
    Enc_Select("CP65001");
    Show("@misc{k, \xFC = {\xE4}}", "k");
    Grid_Fill(&grid, file->entries, Bib_Encoding(file));
    EXPECT_THAT(Rows(grid), ElementsAre("\xFC=ä"));
    EXPECT_FALSE(Grid_MayRename(&grid, "\xE4")); // the name and a value are the same
    Type(0, "Ж");
    EXPECT_EQ("`ü': Ж can't be stored in CP1252 and would become ÿ.\n"
              "\nDo you want to accept these changes anyway ?",
              Losses());
}

// --- The table of commits ---

namespace
{

struct Case {
    std::string title;
    std::string source; // the file
    Lines edits;
    Lines commit; // what it says
    std::string saved;
};

std::ostream &operator<<(std::ostream &out, const Case &one)
{
    return out << one.title;
}

std::string Bytes(std::string text) // \xNN
{
    for (size_t at; (at = text.find("\\x")) != text.npos && isxdigit(text[at + 2]);)
        text.replace(at, 4, 1, static_cast<char>(std::stoi(text.substr(at + 2, 2), nullptr, 16)));
    return text;
}

void TakeLine(Case *one, const std::string &part, const std::string &line)
{
    if (part == "edits")
        one->edits.push_back(line);
    else if (part == "commit")
        one->commit.push_back(line);
    else
        (part == "saved" ? one->saved : one->source) += Bytes(line) + "\n";
}

std::vector<Case> ReadCases(const std::string &path)
{
    std::vector<Case> cases;
    std::ifstream stream(path);
    std::string part;
    for (std::string line; std::getline(stream, line);) {
        if (line.compare(0, 4, "=== ") == 0) {
            cases.push_back({line.substr(4), "", {}, {}, ""});
            part = "source";
        } else if (line.compare(0, 4, "--- ") == 0) {
            part = line.substr(4);
        } else if (!cases.empty()) {
            TakeLine(&cases.back(), part, line);
        }
    }
    for (Case &one : cases) // the empty line between two
        if (one.saved.size() > 1 && one.saved.compare(one.saved.size() - 2, 2, "\n\n") == 0)
            one.saved.pop_back();
    return cases;
}

std::string TestName(const testing::TestParamInfo<Case> &info)
{
    std::string name;
    bool isStart = true;
    for (char c : info.param.title) {
        if (isalnum(c))
            name += isStart ? static_cast<char>(toupper(c)) : c;
        isStart = c == ' ';
    }
    return name;
}

class GridCommit : public Grid, public testing::WithParamInterface<Case>
{
protected:
    int type = 0;
    Lines said; // what the commit has to say
    TempFolder folder;

    void Fill(BibEntry *entry)
    {
        ASSERT_NE(nullptr, entry);
        Grid_Fill(&grid, entry, Enc_Current());
        type = entry->type;
    }

    int Row(const std::string &name)
    {
        int row = grid.count - 1;
        if (isdigit(name[0]))
            row = std::stoi(name);
        else
            while (row >= 0 && grid.rows[row].key != name)
                --row;
        EXPECT_TRUE(row >= 0 && row < grid.count) << name;
        return row;
    }

    void Add(const std::string &key)
    {
        static const char *const results[] = {"", ": overridden", ": full", ": exists"};
        int row;
        GridAdd result = Grid_Add(&grid, key.c_str(), &row);
        if (result != GRID_ADDED)
            said.push_back("add " + key + results[result]);
    }

    void Remove(const std::string &name)
    {
        GridRemove result = Grid_Remove(&grid, Row(name));
        EXPECT_NE(GRID_NO_ROW, result) << name;
        if (result == GRID_INHERITED)
            said.push_back("remove " + name + ": inherited");
    }

    void Rename(const std::string &name, const std::string &key)
    {
        if (Grid_MayRename(&grid, key.c_str()))
            Grid_Rename(&grid, Row(name), key.c_str());
        else
            said.push_back("rename " + name + ": taken");
    }

    void Cut(const std::string &name) // as a window does it
    {
        GridRow &row = grid.rows[Row(name)];
        row.locked = true;
        row.filled = row.text = row.filled.substr(0, 4);
    }

    void Edit(const std::string &line)
    {
        std::istringstream words(line);
        std::string command, first, rest;
        words >> command >> first;
        words.ignore();
        std::getline(words, rest);
        if (command == "entry")
            Fill(FindEntry(file, first));
        else if (command == "encoding")
            Reselect(first);
        else if (command == "set")
            Type(Row(first), rest);
        else if (command == "cut")
            Cut(first);
        else if (command == "add")
            Add(first);
        else if (command == "remove")
            Remove(first);
        else if (command == "rename")
            Rename(first, rest);
        else if (command == "type")
            type = Bib_TypeIndex(first.c_str());
        else
            ADD_FAILURE() << line;
    }

    void Reselect(const std::string &encoding)
    {
        Enc_Select(encoding.c_str());
        Fill(file->entries);
    }

    void Say(const GridChanges &changes)
    {
        std::string text = changes.type ? " type" : "";
        auto add = [&text](const char *word, int count) {
            if (count != 0)
                text += std::string(" ") + word + " " + std::to_string(count);
        };
        add("added", changes.added);
        add("modified", changes.modified);
        add("removed", changes.removed);
        said.push_back(text.empty() ? "nothing" : text.substr(1));
    }

    void SayLosses()
    {
        std::istringstream losses(Losses());
        for (std::string line; std::getline(losses, line) && !line.empty();)
            said.push_back("asks " + line);
    }

    bool CheckRows()
    {
        bool good = true;
        for (int i = 0; i < grid.count; ++i)
            if (const char *reason = Grid_CheckRow(&grid, i)) {
                said.push_back("refuses " + grid.rows[i].key + ": " + reason);
                good = false;
            }
        return good;
    }

    // As the panel does it, with Yes to every question.
    void Commit()
    {
        GridChanges changes = Grid_Compare(&grid, type);
        Say(changes);
        if (!Grid_HasChanges(&changes))
            return;
        BibEntry *old = FindEntry(file, grid.entry->key);
        if (Grid_ChangesOnlyType(&changes)) {
            old->type = type;
            return;
        }
        SayLosses();
        if (!CheckRows())
            return;
        ASSERT_TRUE(Grid_HasRoom(&grid));
        EXPECT_EQ(1, Change_ReplaceEntry(nullptr, file, old, Grid_Build(&grid, type)));
    }

    // The file's bytes; it must load without a fault.
    std::string Save()
    {
        std::string path = folder.Path("saved.bib");
        free(file->path);
        file->path = Bib_CopyText(path.c_str(), path.size());
        file->readOnly = 0;
        EXPECT_EQ(1, Bib_SaveFile(file));
        BibFile *again = Bib_LoadFile(path.c_str());
        EXPECT_EQ(0, again->errorCount + again->warningCount) << Messages(again);
        Bib_FreeFile(again);
        return folder.Read("saved.bib");
    }
};

} // namespace

TEST_P(GridCommit, WritesWhatTheCaseSays)
{
    file = LoadText(GetParam().source);
    ASSERT_EQ(0, file->errorCount) << Messages(file);
    Fill(file->entries);
    for (const std::string &line : GetParam().edits)
        Edit(line);
    Commit();
    EXPECT_EQ(GetParam().commit, said);
    EXPECT_EQ(GetParam().saved, Save());
}

INSTANTIATE_TEST_SUITE_P(Field, GridCommit, testing::ValuesIn(ReadCases(TEST_DATA "/commits.test")),
                         TestName);

TEST(GridCommitTable, HasEveryPartOfEachCase)
{
    std::vector<Case> cases = ReadCases(TEST_DATA "/commits.test");
    EXPECT_LT(30u, cases.size());
    for (const Case &one : cases) {
        EXPECT_NE("", one.source) << one.title;
        EXPECT_FALSE(one.commit.empty()) << one.title;
        EXPECT_NE("", one.saved) << one.title;
    }
}

TEST(GridCheckNewName, LooksAtTheValuesThatAreShown)
{
    FieldGrid grid = {};
    grid.count = 2;
    grid.encoding = Enc_Current();
    grid.rows[0].key = "note";
    grid.rows[0].text = L"Title";
    grid.rows[1].key = "year";
    grid.rows[1].text = L"1999";
    EXPECT_EQ(NAME_TAKEN, Grid_CheckNewName(&grid, {"title", true}));
    EXPECT_EQ(NAME_OK, Grid_CheckNewName(&grid, {"year", true}));
    EXPECT_EQ(NAME_UNWRITABLE, Grid_CheckNewName(&grid, {"1999", true}));
    EXPECT_EQ(NAME_EMPTY, Grid_CheckNewName(&grid, {"", true}));
    EXPECT_EQ(NAME_BAD_CHARS, Grid_CheckNewName(&grid, {"ti{tle", true}));
}

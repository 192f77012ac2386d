// tests/cartulo_ini_test.cpp - the INI file that the program comes with.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "base/Ascii.h"
#include "base/Profile.h"
#include "encoding/Encoding.h"
#include "session/FileSet.h"
#include "session/Schema.h"
#include "store/BibStore.h"
#include "tests/support/LoadText.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TempFolder.h"
#include "ui/Commands.h"

namespace
{

using std::string;
using Strings = std::vector<string>;
using StringSet = std::set<string>;
using testing::IsSupersetOf;
using testing::Not;

const char Ini[] = DEFAULT_INI;

// What the program's buffers take, with the end.
enum {
    SECTION_NAMES_LIMIT = 2046,
    TYPE_LIMIT = 2048,
    SET_NAMES_LIMIT = 1024,
    SET_NAME_LIMIT = 64,
    SET_LIMIT = 4096
};

Strings Items(const char *list)
{
    Strings items;
    for (; *list; list += items.back().size() + 1)
        items.push_back(list);
    return items;
}

// The bytes of the items in a buffer that holds them all.
size_t SizeOf(const Strings &items)
{
    size_t size = 1;
    for (const string &item : items)
        size += item.size() + 1;
    return size;
}

Strings SectionNames()
{
    std::vector<char> buffer(1 << 16);
    Profile_GetSectionNames(buffer.data(), buffer.size(), Ini);
    return Items(buffer.data());
}

Strings Section(const string &name)
{
    std::vector<char> buffer(1 << 16);
    Profile_GetSection(name.c_str(), buffer.data(), buffer.size(), Ini);
    return Items(buffer.data());
}

Strings Types()
{
    Strings types;
    for (const string &name : SectionNames())
        if (name[0] != '*' && name != "Preamble" && name != "String")
            types.push_back(name);
    return types;
}

string KeyOf(const string &line)
{
    return line.substr(0, line.find('='));
}

string ValueOf(const string &line)
{
    return line.substr(line.find('=') + 1);
}

// The lines that name fields.
Strings FieldLines(const string &type)
{
    Strings lines = Section(type);
    lines.erase(
        std::remove_if(lines.begin(), lines.end(), [](auto &line) { return line[0] == '*'; }),
        lines.end());
    return lines;
}

// "key" or "key|alternative" for each mandatory field.
StringSet Mandatory(const string &type)
{
    StringSet fields;
    for (const string &line : FieldLines(type)) {
        string value = ValueOf(line);
        if (value[0] == '*')
            fields.insert(KeyOf(line) + (value.size() > 1 ? "|" : "") + value.substr(1));
    }
    return fields;
}

StringSet Others(const string &type)
{
    StringSet fields;
    for (const string &line : FieldLines(type))
        if (ValueOf(line)[0] != '*')
            fields.insert(KeyOf(line));
    return fields;
}

StringSet Words(const string &text)
{
    std::istringstream stream(text);
    StringSet words;
    for (string word; stream >> word;)
        words.insert(word);
    return words;
}

// "a|b" stands for two fields of which one is enough.
StringSet WithBothWays(const StringSet &words)
{
    StringSet all = words;
    for (const string &word : words) {
        size_t bar = word.find('|');
        if (bar != string::npos)
            all.insert(word.substr(bar + 1) + "|" + word.substr(0, bar));
    }
    return all;
}

struct TypeRule {
    const char *type;
    const char *required;
    const char *optional;
};

// From the description of the database format that comes with BibTeX.
const TypeRule BibTeXTypes[] = {
    {"article", "author title journal year", "volume number pages month note"},
    {"book", "author|editor title publisher year",
     "volume number series address edition month note"},
    {"booklet", "title", "author howpublished address month year note"},
    {"conference", "author title booktitle year",
     "editor volume number series pages address month organization publisher note"},
    {"inbook", "author|editor title chapter|pages publisher year",
     "volume number series type address edition month note"},
    {"incollection", "author title booktitle publisher year",
     "editor volume number series type chapter pages address edition month note"},
    {"inproceedings", "author title booktitle year",
     "editor volume number series pages address month organization publisher note"},
    {"manual", "title", "author organization address edition month year note"},
    {"mastersthesis", "author title school year", "type address month note"},
    {"misc", "", "author title howpublished month year note"},
    {"phdthesis", "author title school year", "type address month note"},
    {"proceedings", "title year",
     "editor volume number series address month organization publisher note"},
    {"techreport", "author title institution year", "type number address month note"},
    {"unpublished", "author title note", "month year"}};

// From the manual of biblatex; audio, software, standard and video are misc to its styles.
const TypeRule BiblatexTypes[] = {
    {"audio", "author|editor title date|year", "howpublished type organization location month"},
    {"bookinbook", "author title booktitle date|year", "bookauthor editor publisher location"},
    {"collection", "editor title date|year", "edition volume series publisher location"},
    {"dataset", "author|editor title date|year", "type version number publisher"},
    {"electronic", "author|editor title date|year url|doi", "version organization urldate eprint"},
    {"inreference", "author title booktitle date|year", "editor volume pages publisher"},
    {"mvbook", "author title date|year", "volumes editor publisher location"},
    {"mvcollection", "editor title date|year", "volumes publisher location"},
    {"mvproceedings", "title date|year", "editor eventtitle venue volumes organization"},
    {"mvreference", "editor title date|year", "volumes publisher location"},
    {"online", "author|editor title date|year url|doi", "version organization urldate eprint"},
    {"patent", "author title number date|year", "holder type location version"},
    {"periodical", "editor title date|year", "issuetitle volume number issue series issn"},
    {"reference", "editor title date|year", "edition volume series publisher location"},
    {"report", "author title type institution date|year", "number version location pages"},
    {"set", "entryset", ""},
    {"software", "author|editor title date|year", "version howpublished organization"},
    {"standard", "title date|year", "author organization institution number type edition"},
    {"suppbook", "author title booktitle date|year", "bookauthor editor publisher location"},
    {"suppcollection", "author title booktitle date|year", "editor publisher location"},
    {"suppperiodical", "author title journaltitle|journal date|year", "volume number issue pages"},
    {"thesis", "author title type institution date|year", "location pagetotal"},
    {"video", "author|editor title date|year", "howpublished type organization location month"},
    {"www", "author|editor title date|year url|doi", "version organization urldate eprint"},
    {"xdata", "", "publisher location institution"}};

// Every field that the rule names.
StringSet FieldsOf(const TypeRule &rule)
{
    string text = string(rule.required) + " " + rule.optional;
    std::replace(text.begin(), text.end(), '|', ' ');
    return Words(text);
}

void CheckType(const TypeRule &rule)
{
    SCOPED_TRACE(rule.type);
    EXPECT_EQ(WithBothWays(Words(rule.required)), Mandatory(rule.type));
    EXPECT_THAT(Others(rule.type), IsSupersetOf(Words(rule.optional)));
}

// --- The file ---

TEST(DefaultIni, NamesTheApplication)
{
    EXPECT_EQ("Cartulo", ValueOf(Section("Preamble").at(0)));
}

TEST(DefaultIni, SelectsUtf8)
{
    BibFileSet set = {};
    EXPECT_EQ(1, Schema_SelectEncoding(Ini, &set));
    EXPECT_EQ(&EncodingUtf8, Enc_Current());
}

// A second section of a name, and what stands before the first, would never be read.
TEST(DefaultIni, HasNoLineThatIsNeverRead)
{
    std::ifstream stream(Ini);
    Strings heads;
    size_t lines = 0;
    for (string line; std::getline(stream, line);) {
        EXPECT_GE(100u, line.size()) << line;
        if (line[0] == '[')
            heads.push_back(line.substr(1, line.size() - 2));
        else if (!line.empty() && line[0] != ';')
            ++lines;
    }
    EXPECT_EQ(heads, SectionNames());
    for (const string &name : heads)
        lines -= Section(name).size();
    EXPECT_EQ(0u, lines);
}

TEST(DefaultIni, LeavesHalfOfTheBuffersToTheUser)
{
    EXPECT_GE(SECTION_NAMES_LIMIT / 2, SizeOf(SectionNames()));
    for (const string &type : Types())
        EXPECT_GE(TYPE_LIMIT / 2, SizeOf(Section(type))) << type;
}

TEST(DefaultIni, HasNoKeyTwiceInASection)
{
    for (const string &name : SectionNames()) {
        StringSet keys;
        for (string line : Section(name)) {
            ASSERT_NE(string::npos, line.find('=')) << line;
            std::transform(line.begin(), line.end(), line.begin(), Ascii_Lower);
            EXPECT_TRUE(keys.insert(KeyOf(line)).second) << name << ": " << line;
        }
    }
}

// --- Entry types ---

TEST(DefaultIni, HasTheTypesOfBibTeX)
{
    for (const TypeRule &rule : BibTeXTypes)
        CheckType(rule);
}

TEST(DefaultIni, HasTheTypesOfBiblatex)
{
    for (const TypeRule &rule : BiblatexTypes)
        CheckType(rule);
}

TEST(DefaultIni, HasNoTypeWithoutARule)
{
    Strings ruled;
    for (const TypeRule &rule : BibTeXTypes)
        ruled.push_back(rule.type);
    for (const TypeRule &rule : BiblatexTypes)
        ruled.push_back(rule.type);
    EXPECT_EQ(ruled, Types());
}

TEST(DefaultIni, NamesTheFieldsOfBibTeXFirst)
{
    for (const TypeRule &rule : BibTeXTypes) {
        StringSet described = FieldsOf(rule);
        for (const string &line : FieldLines(rule.type)) {
            if (described.empty())
                break;
            EXPECT_EQ(1u, described.erase(KeyOf(line))) << rule.type << ": " << line;
        }
        EXPECT_THAT(described, testing::IsEmpty()) << rule.type;
    }
}

// The aliases of a type differ from it in their descriptions only.
TEST(DefaultIni, HasTheSameFieldsInAliases)
{
    EXPECT_EQ(FieldLines("online"), FieldLines("electronic"));
    EXPECT_EQ(FieldLines("online"), FieldLines("www"));
    EXPECT_EQ(FieldLines("inproceedings"), FieldLines("conference"));
}

TEST(DefaultIni, OffersTheTypesOfBibTeXFirst)
{
    Bib_Initialize();
    Schema_RegisterTypes(Ini);
    int index = BIB_FIXED_TYPES;
    for (const TypeRule &rule : BibTeXTypes)
        EXPECT_STREQ(rule.type, BibTypeTable[index++]);
    EXPECT_EQ(BIB_FIXED_TYPES + Types().size(), static_cast<size_t>(BibTypeCount));
}

TEST(DefaultIni, DescribesEveryTypeInALine)
{
    for (const string &type : Types()) {
        string description = Schema_Description(Ini, type.c_str());
        EXPECT_NE("Custom Entry Type", description) << type;
        EXPECT_EQ('.', description.back()) << type;
        EXPECT_GE(100u, description.size()) << type;
        string help = Command_HelpText(Ini, type.c_str(), true);
        string end = "' entry is for " + description;
        ASSERT_LE(end.size(), help.size());
        EXPECT_EQ(end, help.substr(help.size() - end.size())) << "cut";
    }
}

TEST(DefaultIni, MarksFieldsWithKnownSignsOnly)
{
    for (const string &type : Types()) {
        const Strings lines = FieldLines(type);
        EXPECT_FALSE(lines.empty()) << type;
        for (const string &line : lines) {
            string value = ValueOf(line);
            EXPECT_TRUE(value.empty() || value == "!" || value[0] == '*') << type << ": " << line;
        }
    }
}

// They count as one missing field only when their lines follow each other.
TEST(DefaultIni, NamesAlternativesOnTheLinesOfEachOther)
{
    int pairs = 0;
    for (const string &type : Types()) {
        const Strings lines = FieldLines(type);
        for (size_t i = 0; i < lines.size(); ++i) {
            string value = ValueOf(lines[i]);
            if (value[0] != '*' || value == "*")
                continue;
            string other = value.substr(1) + "=*" + KeyOf(lines[i]);
            bool before = i > 0 && lines[i - 1] == other;
            bool behind = i + 1 < lines.size() && lines[i + 1] == other;
            EXPECT_TRUE(before || behind) << type << ": " << lines[i];
            ++pairs;
        }
    }
    EXPECT_LT(20, pairs);
}

TEST(DefaultIni, HasTheCommonFieldsInEveryType)
{
    StringSet common =
        Words("doi url urldate eprint archiveprefix primaryclass eprinttype eprintclass "
              "isbn issn language keywords abstract annote file note key");
    for (const string &type : Types()) {
        for (const string &field : common) {
            FieldClass fieldClass = Schema_FieldClasses(Ini, type.c_str(), {field.c_str()})[0];
            EXPECT_TRUE(fieldClass == FIELD_OPTIONAL || fieldClass == FIELD_MANDATORY)
                << type << ": " << field;
        }
        EXPECT_THAT(Section(type), IsSupersetOf({"crossref=!", "xref=!", "xdata=!"})) << type;
    }
}

TEST(DefaultIni, TellsWhatANewEntryNeeds)
{
    EXPECT_EQ("There are missed mandatory fields: `author'/`editor', `title', `publisher', and "
              "`year'.",
              Schema_Advise(Ini, "book", {}).note);
    EXPECT_EQ(
        "There is missed mandatory field: `chapter'/`pages'.",
        Schema_Advise(Ini, "inbook",
                      {{"editor", false}, {"title", false}, {"publisher", true}, {"year", true}})
            .note);
    EXPECT_EQ(
        "There is missed mandatory field: `url'/`doi'.",
        Schema_Advise(Ini, "online", {{"author", false}, {"title", false}, {"date", false}}).note);
    EXPECT_EQ("", Schema_Advise(Ini, "misc", {}).note);
}

// --- With the store ---

string SpecsOf(const string &type)
{
    string specs(TYPE_LIMIT, 0);
    Schema_FieldSpecs(Ini, type.c_str(), specs.data(), specs.size());
    return specs;
}

// An entry with every field of the type.
void AddFullEntry(BibFile *file, const string &type)
{
    BibEntry *entry =
        Bib_NewEntry(file, ("full-" + type).c_str(), type.c_str(), SpecsOf(type).c_str(), 1);
    ASSERT_NE(nullptr, entry);
    for (int i = 0; i < entry->fieldCount; ++i) {
        free(entry->fields[i].value);
        entry->fields[i].value = Bib_CopyText("x", 1);
    }
}

TEST(DefaultIni, HasOnlyTypesAndFieldsThatCanBeWritten)
{
    TempFolder folder;
    string path = folder.Write("full.bib", "");
    Bib_Initialize();
    BibFile *file = Bib_LoadFile(path.c_str());
    for (const string &type : Types())
        AddFullEntry(file, type);
    EXPECT_EQ(1, Bib_SaveFile(file));
    Bib_FreeFile(file);

    file = Bib_LoadFile(path.c_str());
    EXPECT_EQ(0, file->errorCount + file->warningCount) << Messages(file);
    Strings types = Types();
    for (const BibEntry *entry = file->entries; entry; entry = entry->next) {
        ASSERT_FALSE(types.empty());
        EXPECT_EQ(types.back(), BibTypeTable[entry->type]);
        StringSet listed, read; // a save puts crossref first
        for (const string &line : FieldLines(types.back()))
            listed.insert(KeyOf(line));
        for (int i = 0; i < entry->fieldCount; ++i)
            read.insert(FieldName(entry->fields[i]));
        EXPECT_EQ(listed, read) << types.back();
        types.pop_back();
    }
    EXPECT_THAT(types, testing::IsEmpty());
    Bib_FreeFile(file);
}

TEST(DefaultIni, LeavesRoomForTheNamesOfRealFiles)
{
    Bib_Initialize();
    string log = LogOf(nullptr, [] { Schema_RegisterTypes(Ini); });
    EXPECT_THAT(log, Not(testing::HasSubstr("ERROR")));
    Schema_RegisterTypes(Ini);
    for (const string &type : Types())
        for (const string &line : FieldLines(type)) {
            ASSERT_EQ(1, Bib_HasFieldRoom(KeyOf(line).c_str()));
            Bib_FieldIndex(KeyOf(line).c_str());
        }
    for (const auto &item : std::filesystem::directory_iterator(TEST_DATA "/corpus"))
        if (item.path().extension() == ".bib")
            Bib_FreeFile(Bib_LoadFile(item.path().c_str()));
    EXPECT_GE(BIB_TYPE_LIMIT / 2, BibTypeCount);
    EXPECT_GE(BIB_FIELD_LIMIT / 2, BibFieldCount);
}

// --- Abbreviations ---

TEST(DefaultIni, NamesSetsOfAbbreviations)
{
    const Strings lines = Section("String");
    EXPECT_GE(SET_NAMES_LIMIT / 2, SizeOf(lines));
    Strings sets;
    for (const string &line : lines) {
        sets.push_back(ValueOf(line));
        EXPECT_GT(SET_NAME_LIMIT, sets.back().size());
        EXPECT_EQ('*', sets.back()[0]) << "would be an entry type";
    }
    Strings sections;
    for (const string &name : SectionNames())
        if (name[0] == '*')
            sections.push_back(name);
    EXPECT_EQ(sections, sets);
}

TEST(DefaultIni, HasAbbreviationsThatCanBeWritten)
{
    Bib_Initialize();
    for (const string &set : Section("String")) {
        const Strings lines = Section(ValueOf(set));
        EXPECT_LE(12u, lines.size()) << set;
        EXPECT_GE(SET_LIMIT / 2, SizeOf(lines)) << set;
        string text;
        for (const string &line : lines) {
            EXPECT_STREQ(nullptr, Bib_CheckValue(ValueOf(line).c_str())) << line;
            EXPECT_NE('"', ValueOf(line)[0]) << line;
            text += "@string{" + KeyOf(line) + " = {" + ValueOf(line) + "}}\n";
        }
        BibFile *file = LoadText(text);
        EXPECT_EQ(0, file->errorCount + file->warningCount) << Messages(file);
        size_t count = 0;
        for (const BibString *string = file->strings; string; string = string->next)
            EXPECT_EQ(KeyOf(lines.at(count++)), string->name);
        EXPECT_EQ(lines.size(), count);
        Bib_FreeFile(file);
    }
}

TEST(DefaultIni, HasTheMonthsThatTheStylesDefine)
{
    const char *const months[] = {"jan", "feb", "mar", "apr", "may", "jun",
                                  "jul", "aug", "sep", "oct", "nov", "dec"};
    Strings lines = Section("*Months");
    ASSERT_EQ(std::size(months), lines.size());
    for (size_t i = 0; i < lines.size(); ++i)
        EXPECT_EQ(months[i], KeyOf(lines[i]));
}

// --- Limits ---

// What the comments of the file promise: `size` bytes of lines, with an end for each.
TEST(DefaultIni, TellsHowMuchOfASectionIsRead)
{
    TempFolder folder;
    for (size_t size : {2047, 2048}) {
        string last(size - 1000 - 2, 'b'); // and '=', and the end
        string path = folder.Write("full.ini", "[t]\n" + string(998, 'a') + "=\n" + last + " =\n");
        const Strings proposals = Schema_Advise(path.c_str(), "t", {}).proposals;
        EXPECT_EQ(size == 2047, proposals.size() == 2 && proposals.back() == last);
    }
}

TEST(DefaultIni, TellsHowManySectionNamesAreRead)
{
    TempFolder folder;
    Bib_Initialize();
    for (size_t size : {2045, 2046}) {
        string last(size - 1000 - 1, size % 2 ? 'b' : 'c'); // and the end
        string path = folder.Write("full.ini", "[" + string(999, 'a') + "]\n[" + last + "]\n");
        Schema_RegisterTypes(path.c_str());
        EXPECT_EQ(size == 2045, BibTypeTable[BibTypeCount - 1] == last);
    }
}

} // namespace

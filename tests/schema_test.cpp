// tests/schema_test.cpp - the INI file of entry types.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "encoding/Encoding.h"
#include "session/FileSet.h"
#include "session/Schema.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TempFolder.h"

TEST(SchemaIniPath, ReplacesTheEndingOfTheFileName)
{
    EXPECT_EQ("/opt/cartulo.ini", Schema_IniPath("/opt/cartulo.bin"));
    EXPECT_EQ("C:\\prog\\cartulo.ini", Schema_IniPath("C:\\prog\\cartulo.exe"));
}

TEST(SchemaIniPath, LeavesFoldersAlone)
{
    EXPECT_EQ("/home/u/.local/bin/cartulo.ini", Schema_IniPath("/home/u/.local/bin/cartulo"));
    EXPECT_EQ("C:\\a.b\\cartulo.ini", Schema_IniPath("C:\\a.b\\cartulo"));
    EXPECT_EQ("cartulo.ini", Schema_IniPath("cartulo"));
}

TEST(SchemaFindIni, PrefersTheUsersOwn)
{
    TempFolder folder;
    setenv("XDG_CONFIG_HOME", folder.Path().c_str(), 1);
    std::string beside = Schema_IniPath(Sys_ModulePath());
    EXPECT_EQ(beside, Schema_FindIni()); // there is none yet
    ASSERT_EQ(0, system(("mkdir '" + folder.Path() + "/Cartulo'").c_str()));
    std::string own = folder.Write("Cartulo/cartulo.ini", "[Preamble]\n");
    EXPECT_EQ(own, Schema_FindIni());
}

class SchemaFile : public testing::Test
{
protected:
    SchemaFile() { Bib_Initialize(); }

    TempFolder folder;
};

TEST_F(SchemaFile, NamesTheApplication)
{
    std::string ini = folder.Write("a.ini", "[Preamble]\nAppName = My Cards\n");
    EXPECT_EQ("My Cards", Schema_ApplicationName(ini.c_str()));
    std::string other = folder.Write("b.ini", "[Other]\nAppName = My Cards\n");
    EXPECT_EQ("Cartulo", Schema_ApplicationName(other.c_str()));
    EXPECT_EQ("Cartulo", Schema_ApplicationName("/no/such/file"));
}

TEST_F(SchemaFile, SelectsItsEncoding)
{
    BibFileSet set = {};
    Enc_Select("CP1251");
    std::string without = folder.Write("a.ini", "[Preamble]\nAppName = x\nEncoding =\n");
    EXPECT_EQ(1, Schema_SelectEncoding(without.c_str(), &set));
    EXPECT_EQ(1, Schema_SelectEncoding("/no/such/file", &set));
    EXPECT_STREQ("CP1251", Enc_Current()->name);
    std::string ini = folder.Write("b.ini", "[preamble]\nencoding = cp65001\n");
    EXPECT_EQ(1, Schema_SelectEncoding(ini.c_str(), &set));
    EXPECT_EQ(&EncodingUtf8, Enc_Current());
    EXPECT_EQ(nullptr, set.loadErrors);
    FileSet_Free(&set);
}

TEST_F(SchemaFile, TellsOfAnEncodingThatIsNotKnown)
{
    BibFileSet set = {};
    std::string ini = folder.Write("a.ini", "[Preamble]\nEncoding=UTF-8\n");
    EXPECT_EQ(0, Schema_SelectEncoding(ini.c_str(), &set));
    EXPECT_STREQ("CP1252", Enc_Current()->name);
    EXPECT_EQ(
        "ERROR: The file '" + ini +
            "' names the encoding 'UTF-8', which is not known (UTF-8 is called CP65001); CP1252 "
            "stays selected\n",
        std::string(set.loadErrors));
    FileSet_Free(&set);
}

TEST_F(SchemaFile, CutsNoLetterInTwo)
{
    Enc_Select("CP65001");
    std::string letters;
    for (int i = 0; i < 700; ++i)
        letters += "\xC3\xBC";
    for (std::string start : {"", "x"}) {
        std::string ini = folder.Write("a.ini", "[misc]\n* = " + start + letters + "\n");
        std::string text = Schema_Description(ini.c_str(), "misc");
        EXPECT_TRUE(Enc_IsUtf8(text.data(), text.size()));
        EXPECT_EQ(1022u + start.size(), text.size());
    }
}

TEST_F(SchemaFile, KeepsTheLettersOfACutTextInACodePage)
{
    std::string ini = folder.Write("a.ini", "[misc]\n* = \xFC" + std::string(2000, 'x') + "\n");
    EXPECT_EQ("\xFC" + std::string(1022, 'x'), Schema_Description(ini.c_str(), "misc"));
}

TEST_F(SchemaFile, RegistersItsEntryTypes)
{
    std::string ini = folder.Write("a.ini", "[Preamble]\nAppName = x\n[Article]\nauthor = *\n"
                                            "[*Months]\njan = January\n[book]\n[String]\n");
    Schema_RegisterTypes(ini.c_str());
    ASSERT_EQ(BIB_FIXED_TYPES + 2, BibTypeCount);
    EXPECT_STREQ("Article", BibTypeTable[BIB_FIXED_TYPES]);
    EXPECT_STREQ("book", BibTypeTable[BIB_FIXED_TYPES + 1]);
}

TEST_F(SchemaFile, LeavesOutTypesWithoutRoom)
{
    std::string text;
    for (int i = 0; i < BIB_TYPE_LIMIT + 3; ++i)
        text += "[t" + std::to_string(i) + "]\n";
    std::string ini = folder.Write("a.ini", text);
    std::string log = LogOf(nullptr, [&] { Schema_RegisterTypes(ini.c_str()); });
    Schema_RegisterTypes(ini.c_str());
    EXPECT_EQ(BIB_TYPE_LIMIT, BibTypeCount);
    EXPECT_NE(std::string::npos, log.find("ERROR: No room for the entry type: t124")) << log;
}

// --- Fields ---

using testing::ElementsAre;
using testing::IsEmpty;

static const char *const Types = "[article]\n"
                                 "* = a paper.\n"
                                 "author = *\n"
                                 "journal = *\n"
                                 "volume =\n"
                                 "doi = digits\n"
                                 "crossref = *\n"
                                 "xref = !\n"
                                 "odd = # of it\n"
                                 "quoted = \"*\"\n"
                                 "[other]\n"
                                 "number = *\n";

class SchemaFieldClass : public SchemaFile
{
protected:
    FieldClass Of(const char *key, const char *type = "article")
    {
        return Schema_FieldClasses(ini.c_str(), type, {key})[0];
    }

    std::string ini = folder.Write("a.ini", Types);
};

TEST_F(SchemaFieldClass, FollowsTheFirstCharacterOfTheValue)
{
    EXPECT_EQ(FIELD_MANDATORY, Of("author"));
    EXPECT_EQ(FIELD_OPTIONAL, Of("volume"));
    EXPECT_EQ(FIELD_OPTIONAL, Of("doi"));
    EXPECT_EQ(FIELD_CROSSREF, Of("xref"));
    EXPECT_EQ(FIELD_UNKNOWN, Of("odd"));
    EXPECT_EQ(FIELD_MANDATORY, Of("quoted"));
}

TEST_F(SchemaFieldClass, IsUnknownForWhatTheTypeDoesNotList)
{
    EXPECT_EQ(FIELD_UNKNOWN, Of("number"));
    EXPECT_EQ(FIELD_MANDATORY, Of("number", "other"));
    EXPECT_EQ(FIELD_UNKNOWN, Of("author", "other"));
    EXPECT_EQ(FIELD_UNKNOWN, Of("author", "missing"));
}

TEST_F(SchemaFieldClass, IsItsOwnForCrossrefWhateverTheFileSays)
{
    EXPECT_EQ(FIELD_CROSSREF, Of("crossref"));
    EXPECT_EQ(FIELD_CROSSREF, Of("CrossRef", "other"));
    EXPECT_EQ(FIELD_CROSSREF, Of("crossref", "missing"));
}

TEST_F(SchemaFieldClass, IgnoresLetterCase)
{
    EXPECT_EQ(FIELD_MANDATORY, Of("AUTHOR", "Article"));
}

TEST_F(SchemaFieldClass, CountsAtOnceWhenTheFileChanges)
{
    EXPECT_EQ(FIELD_UNKNOWN, Of("note"));
    folder.Write("a.ini", "[article]\nnote=\n");
    EXPECT_EQ(FIELD_OPTIONAL, Of("note"));
}

TEST_F(SchemaFieldClass, IsToldOfSeveralFieldsAtOnce)
{
    EXPECT_THAT(Schema_FieldClasses(ini.c_str(), "article", {"doi", "note", "Author", "crossref"}),
                ElementsAre(FIELD_OPTIONAL, FIELD_UNKNOWN, FIELD_MANDATORY, FIELD_CROSSREF));
    EXPECT_THAT(Schema_FieldClasses(ini.c_str(), "article", {}), IsEmpty());
}

TEST_F(SchemaFile, DescribesTypes)
{
    std::string ini = folder.Write("a.ini", Types);
    EXPECT_EQ("a paper.", Schema_Description(ini.c_str(), "Article"));
    EXPECT_EQ("Custom Entry Type", Schema_Description(ini.c_str(), "other"));
    EXPECT_EQ("Custom Entry Type", Schema_Description(ini.c_str(), "missing"));
    EXPECT_EQ("Custom Entry Type", Schema_Description("/no/such/file", "article"));
}

// The items of a buffer as Bib_NewEntry reads them.
static std::vector<std::string> Items(const char *buffer)
{
    std::vector<std::string> items;
    for (; *buffer; buffer += items.back().size() + 1)
        items.push_back(buffer);
    return items;
}

TEST_F(SchemaFile, HandsOutTheLinesOfAType)
{
    std::string ini = folder.Write("a.ini", "[a]\n*=x\nauthor = *editor\nword\nnote=\n[b]\n");
    char buffer[2048];
    Schema_FieldSpecs(ini.c_str(), "A", buffer, sizeof buffer);
    EXPECT_THAT(Items(buffer), ElementsAre("*=x", "author=*editor", "word", "note="));
    Schema_FieldSpecs(ini.c_str(), "b", buffer, sizeof buffer);
    EXPECT_THAT(Items(buffer), IsEmpty());
    Schema_FieldSpecs(ini.c_str(), "a", buffer, 10);
    EXPECT_THAT(Items(buffer), ElementsAre("*=x", "auth"));
}

TEST_F(SchemaFile, HandsOutNoMoreThanTwoKiB)
{
    std::string text = "[a]\n";
    for (int i = 0; i < 500; ++i)
        text += "number" + std::to_string(100 + i) + "=*\n"; // 12 bytes as read
    std::string ini = folder.Write("a.ini", text);
    std::vector<char> buffer(4096, '~');
    Schema_FieldSpecs(ini.c_str(), "a", buffer.data(), buffer.size());
    std::vector<std::string> items = Items(buffer.data());
    ASSERT_EQ(171u, items.size());
    EXPECT_EQ("number269=*", items[169]);
    EXPECT_EQ("number", items[170]);
    EXPECT_EQ(std::string("\0\0~", 3), std::string(&buffer[2046], 3));
}

// --- Advice ---

class SchemaAdvise : public SchemaFile
{
protected:
    void Write(const std::string &section) { ini = folder.Write("a.ini", "[t]\n" + section); }

    // Rows as "key", or "(key)" for an inherited one.
    SchemaAdvice Of(const std::vector<std::string> &rows, const char *type = "t")
    {
        std::vector<SchemaRow> records;
        for (const std::string &row : rows) {
            bool inherited = row[0] == '(';
            records.push_back({inherited ? row.substr(1, row.size() - 2) : row, inherited});
        }
        return Schema_Advise(ini.c_str(), type, records);
    }

    std::string Note(const std::vector<std::string> &rows) { return Of(rows).note; }

    std::string ini = folder.Path("missing.ini");
};

TEST_F(SchemaAdvise, ProposesTheFieldsThatAreNotShownInTheFilesOrder)
{
    Write("*=x\nyear=*\nauthor=\n*note=*\nword\nxref=!\nvolume=1\n=*\n");
    EXPECT_THAT(Of({}).proposals, ElementsAre("year", "author", "xref", "volume"));
    EXPECT_THAT(Of({"Author", "other"}).proposals, ElementsAre("year", "xref", "volume"));
    EXPECT_THAT(Of({"volume", "year", "xref", "author"}).proposals, IsEmpty());
}

TEST_F(SchemaAdvise, ProposesInheritedFieldsToo)
{
    Write("author=*\nyear=*\nnote=\n");
    SchemaAdvice advice = Of({"author", "(year)", "(note)"});
    EXPECT_THAT(advice.proposals, ElementsAre("year", "note"));
    EXPECT_EQ("", advice.note);
    EXPECT_EQ(-1, advice.selected);
}

TEST_F(SchemaAdvise, GoesByTheFirstRowOfAKey)
{
    Write("note=\n");
    EXPECT_THAT(Of({"note", "(note)"}).proposals, IsEmpty());
    EXPECT_THAT(Of({"(note)", "note"}).proposals, ElementsAre("note"));
}

TEST_F(SchemaAdvise, SelectsTheFirstMissingField)
{
    Write("doi=\nauthor=*\nyear=*\n");
    EXPECT_EQ(1, Of({}).selected);
    EXPECT_EQ(1, Of({"author"}).selected);
    EXPECT_EQ(0, Of({"doi"}).selected);
    EXPECT_EQ(2, Of({"(author)"}).selected);
    EXPECT_EQ(-1, Of({"author", "year"}).selected);
}

TEST_F(SchemaAdvise, JoinsTheMissingFieldsToANote)
{
    Write("a=*\nb=*\nn=\nc=*\nd=*\n");
    EXPECT_EQ("", Note({"a", "b", "c", "d"}));
    EXPECT_EQ("There is missed mandatory field: `c'.", Note({"a", "b", "d"}));
    EXPECT_EQ("There are missed mandatory fields: `a' and `d'.", Note({"b", "c"}));
    EXPECT_EQ("There are missed mandatory fields: `a', `c', and `d'.", Note({"b"}));
    EXPECT_EQ("There are missed mandatory fields: `a', `b', `c', and `d'.", Note({}));
}

TEST_F(SchemaAdvise, IsContentWithAnAlternative)
{
    Write("author=*editor\neditor=*author\n");
    EXPECT_EQ("", Note({"editor"}));
    EXPECT_EQ("", Note({"author"}));
    EXPECT_EQ("", Note({"EDITOR"}));
    EXPECT_EQ("", Note({"(author)"}));
    EXPECT_THAT(Of({"editor"}).proposals, ElementsAre("author"));
    EXPECT_THAT(Of({"(author)"}).proposals, ElementsAre("author", "editor"));
}

TEST_F(SchemaAdvise, CountsAPairOfAlternativesOnce)
{
    Write("author=*Editor\neditor=*AUTHOR\nyear=*\n");
    SchemaAdvice advice = Of({"year"});
    EXPECT_EQ("There is missed mandatory field: `author'/`editor'.", advice.note);
    EXPECT_THAT(advice.proposals, ElementsAre("author", "editor"));
    EXPECT_EQ(0, advice.selected);
    EXPECT_EQ("There are missed mandatory fields: `author'/`editor' and `year'.", Note({}));
}

TEST_F(SchemaAdvise, CountsAlternativesTwiceWithAnotherMissingBetweenThem)
{
    Write("author=*editor\nyear=*\neditor=*author\n");
    EXPECT_EQ("There is missed mandatory field: `author'/`editor'.", Note({"year"}));
    EXPECT_EQ("There are missed mandatory fields: `author', `year', and `editor'.", Note({}));
}

TEST_F(SchemaAdvise, JoinsOnlyWhatNamesTheFieldBefore)
{
    Write("a=*b\nb=*\nc=*b\nd=*a\n");
    EXPECT_EQ("There are missed mandatory fields: `a', `b'/`c', and `d'.", Note({}));
    EXPECT_EQ("There is missed mandatory field: `b'.", Note({"a", "c"}));
}

TEST_F(SchemaAdvise, TakesAnAlternativeThatTheTypeDoesNotList)
{
    Write("year=*date\n");
    EXPECT_EQ("", Note({"date"}));
    EXPECT_EQ("There is missed mandatory field: `year'.", Note({}));
}

TEST_F(SchemaAdvise, HasNothingToSayOnATypeWithoutASection)
{
    for (const char *type : {"unknown", "t"}) { // there is no file yet
        SchemaAdvice advice = Of({"author"}, type);
        EXPECT_THAT(advice.proposals, IsEmpty());
        EXPECT_EQ("", advice.note);
        EXPECT_EQ(-1, advice.selected);
    }
    Write("author=*\n");
    EXPECT_EQ("", Of({}, "unknown").note);
    EXPECT_NE("", Of({}, "T").note);
}

TEST_F(SchemaAdvise, EndsWhereTheSectionIsCut)
{
    std::string filler = "* = " + std::string(2000, 'x') + "\n"; // 2003 bytes as read
    Write(filler + "volume=\ntitle=*\npublisher=*\nyear=*\n");
    SchemaAdvice advice = Of({});
    EXPECT_THAT(advice.proposals, ElementsAre("volume", "title", "publisher", "year"));

    filler.insert(4, 16, 'x'); // room for "publisher=*", not for what follows
    Write(filler + "volume=\ntitle=*\npublisher=*editor\nyear=*\n");
    advice = Of({});
    EXPECT_THAT(advice.proposals, ElementsAre("volume", "title", "publisher"));
    EXPECT_EQ("There are missed mandatory fields: `title' and `publisher'.", advice.note);
    EXPECT_EQ(Of({"editor"}).note, advice.note) << "the alternative was cut off";

    filler.insert(4, 2, 'x'); // no room for the sign
    Write(filler + "volume=\ntitle=*\npublisher=*editor\nyear=*\n");
    EXPECT_THAT(Of({}).proposals, ElementsAre("volume", "title"));
}

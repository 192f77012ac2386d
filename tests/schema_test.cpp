#include <gtest/gtest.h>

#include <cstdlib>

#include "store/BibStore.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TempFolder.h"
#include "ui/Schema.h"

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

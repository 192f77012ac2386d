// tests/paths_test.cpp - what paths and file names say without asking the system.

#include "base/Paths.h"

#include <gtest/gtest.h>

TEST(PathParent, IsWithoutTheLastPart)
{
    EXPECT_EQ("/usr/bin", Path_Parent("/usr/bin/cartulo"));
    EXPECT_EQ("/usr", Path_Parent("/usr/bin"));
    EXPECT_EQ("folder", Path_Parent("folder/name"));
    EXPECT_EQ("folder", Path_Parent("folder/"));
}

TEST(PathParent, IsNothingAtTheTop)
{
    EXPECT_EQ("", Path_Parent("/usr"));
    EXPECT_EQ("", Path_Parent("/"));
    EXPECT_EQ("", Path_Parent("name"));
    EXPECT_EQ("", Path_Parent(""));
}

TEST(PathHasBibEnding, IgnoresLetterCase)
{
    for (const char *name : {"refs.bib", "refs.BIB", "refs.Bib", "/folder/refs.bib", "a.bib.bib"})
        EXPECT_EQ(1, Path_HasBibEnding(name)) << name;
}

TEST(PathHasBibEnding, IsFalseForOtherNames)
{
    for (const char *name : {"", "bib", "refsbib", "refs.bib~", "refs.bi", "refs.bib/"})
        EXPECT_EQ(0, Path_HasBibEnding(name)) << name;
}

TEST(PathHasBibEnding, NeedsANameBefore)
{
    EXPECT_EQ(0, Path_HasBibEnding(".bib"));
    EXPECT_EQ(1, Path_HasBibEnding("a.bib"));
}

#include <gtest/gtest.h>

#include "encoding/Encoding.h"
#include "ui/FieldKeys.h"

TEST(FieldKeyCheckNewName, LooksAtTheValuesThatAreShown)
{
    FieldGrid grid = {};
    grid.count = 2;
    grid.encoding = Enc_Current();
    grid.rows[0].key = "note";
    grid.rows[0].text = L"Title";
    grid.rows[1].key = "year";
    grid.rows[1].text = L"1999";
    EXPECT_EQ(NAME_TAKEN, FieldKey_CheckNewName(&grid, {"title", true}));
    EXPECT_EQ(NAME_OK, FieldKey_CheckNewName(&grid, {"year", true}));
    EXPECT_EQ(NAME_UNWRITABLE, FieldKey_CheckNewName(&grid, {"1999", true}));
    EXPECT_EQ(NAME_EMPTY, FieldKey_CheckNewName(&grid, {"", true}));
    EXPECT_EQ(NAME_BAD_CHARS, FieldKey_CheckNewName(&grid, {"ti{tle", true}));
}

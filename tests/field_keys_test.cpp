#include <gtest/gtest.h>

#include "ui/FieldKeys.h"

TEST(FieldKeyCheckNew, TellsWhatIsWrong)
{
    const struct {
        const char *key;
        FieldKeyVerdict verdict;
    } rows[] = {{"author", FIELD_KEY_OK},      {"date-added", FIELD_KEY_OK},
                {"x_1", FIELD_KEY_OK},         {"", FIELD_KEY_EMPTY},
                {"1st", FIELD_KEY_UNWRITABLE}, {"a\\b", FIELD_KEY_UNWRITABLE},
                {"1{st", FIELD_KEY_BAD_CHARS}};
    for (const auto &row : rows)
        EXPECT_EQ(row.verdict, FieldKey_CheckNew({row.key, true})) << row.key;
}

TEST(FieldKeyCheckNew, RefusesEveryForbiddenCharacter)
{
    for (char c : std::string("\"#%'(),={} "))
        EXPECT_EQ(FIELD_KEY_BAD_CHARS, FieldKey_CheckNew({std::string("a") + c, true})) << c;
}

TEST(FieldKeyCheckNewName, LooksAtTheValuesThatAreShown)
{
    FieldGrid grid = {};
    grid.count = 2;
    grid.rows[0].key = "note";
    grid.rows[0].text = L"Title";
    grid.rows[1].key = "year";
    grid.rows[1].text = L"1999";
    EXPECT_EQ(FIELD_KEY_TAKEN, FieldKey_CheckNewName(&grid, {"title", true}));
    EXPECT_EQ(FIELD_KEY_OK, FieldKey_CheckNewName(&grid, {"year", true}));
    EXPECT_EQ(FIELD_KEY_UNWRITABLE, FieldKey_CheckNewName(&grid, {"1999", true}));
    EXPECT_EQ(FIELD_KEY_EMPTY, FieldKey_CheckNewName(&grid, {"", true}));
    EXPECT_EQ(FIELD_KEY_BAD_CHARS, FieldKey_CheckNewName(&grid, {"ti{tle", true}));
}

TEST(FieldKeyCheckNew, TellsOfCharactersThatTheCodePageLacksBeforeBadOnes)
{
    EXPECT_EQ(FIELD_KEY_MISFIT, FieldKey_CheckNew({"\xFF"
                                                   "anr",
                                                   false}));
    EXPECT_EQ(FIELD_KEY_EMPTY, FieldKey_CheckNew({"", false}));
    EXPECT_EQ(FIELD_KEY_MISFIT, FieldKey_CheckNew({"\xFF{", false}));
}

// tests/string_rules_test.cpp - decisions of the window for abbreviations.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tests/support/LoadedStrings.h"
#include "ui/StringRules.h"

using Lines = std::vector<std::string>;

// --- Sources ---

using StringRulesSources = LoadedStrings;

static const char TwoLists[] = "[String]\nMonths = *Months\nOther = *Other\n"
                               "[*Months]\njan = January\n[*Other]\nx = y\n";

TEST_F(StringRulesSources, BeginWithTheOnlyFile)
{
    Load("");
    StringSources sources = Read(TwoLists);
    for (int remembered : {-3, -1, 0, 7})
        EXPECT_EQ(0, Strings_FitSource(&sources, remembered)) << remembered;
}

TEST_F(StringRulesSources, BeginWithTheRememberedOneWhileItIsThere)
{
    StringSources none = Read(TwoLists);
    EXPECT_EQ(STRINGS_OF_ALL_FILES, Strings_FitSource(&none, 0));
    Load("");
    Load("");
    StringSources sources = Read(TwoLists);
    for (int there : {-3, -2, -1, 0, 1})
        EXPECT_EQ(there, Strings_FitSource(&sources, there));
    for (int gone : {-4, -100, 2, 100})
        EXPECT_EQ(STRINGS_OF_ALL_FILES, Strings_FitSource(&sources, gone)) << gone;
}

TEST_F(StringRulesSources, CanBeChangedWhenTheyAreAWritableFile)
{
    BibFile *writable = Load("@string{a = {A}}\n");
    Load("@string{a = {A}}\n")->readOnly = 1;
    StringSources sources = Read(TwoLists);
    EXPECT_EQ(writable, Strings_WritableFile(&sources, 0));
    for (int source : {-3, -2, -1, 1, 2})
        EXPECT_EQ(nullptr, Strings_WritableFile(&sources, source)) << source;
}

// --- Lines ---

static std::vector<StringLine> WithEncoding(const Lines &texts)
{
    std::vector<StringLine> lines;
    for (const std::string &text : texts)
        lines.push_back({text, Enc_Current()});
    return lines;
}

static std::string Compare(const Lines &before, const Lines &after)
{
    LineChange change = Strings_Compare(WithEncoding(before), WithEncoding(after));
    return std::to_string(change.first) + " -" + std::to_string(change.removed) + " +" +
           std::to_string(change.added);
}

TEST(StringsCompare, FindsTheRowsThatChanged)
{
    EXPECT_EQ("0 -0 +0", Compare({}, {}));
    EXPECT_EQ("0 -0 +2", Compare({}, {"a", "b"}));
    EXPECT_EQ("2 -0 +1", Compare({"a", "b"}, {"a", "b", "c"}));
    EXPECT_EQ("1 -1 +0", Compare({"a", "b", "c"}, {"a", "c"}));
    EXPECT_EQ("1 -1 +1", Compare({"a", "b", "c"}, {"a", "B", "c"}));
    EXPECT_EQ("2 -1 +0", Compare({"a", "a", "a"}, {"a", "a"}));
    EXPECT_EQ("0 -2 +0", Compare({"a", "b"}, {}));
    EXPECT_EQ("2 -0 +0", Compare({"a", "b"}, {"a", "b"}));
}

TEST(StringsCompare, TakesOtherLettersForAChange)
{
    LineChange change =
        Strings_Compare({{"\xC3\xBC", Enc_Current()}}, {{"\xC3\xBC", &EncodingUtf8}});
    EXPECT_EQ(0u, change.first);
    EXPECT_EQ(1u, change.removed);
    EXPECT_EQ(1u, change.added);
}

// --- Commands ---

TEST(StringsFindCommand, KnowsThreeLetters)
{
    const struct {
        int key, id;
        const char *label;
    } rows[] = {{'A', 6003, "Add New String ..."},
                {'D', 6004, "Delete String ..."},
                {'E', 6005, "Edit String ..."}};
    for (const auto &row : rows) {
        const StringCommand *command = Strings_FindCommand(row.key);
        ASSERT_TRUE(command);
        EXPECT_EQ(row.id, command->id);
        EXPECT_STREQ(row.label, command->label);
    }
    for (int key : {0, int('B'), int('a'), 27})
        EXPECT_EQ(nullptr, Strings_FindCommand(key)) << key;
}

TEST(StringsIsHeld, TellsRepeatsFromPresses)
{
    int32_t last = 0;
    EXPECT_FALSE(Strings_IsHeld(&last, 1000));
    for (int32_t repeat : {1660, 1700, 1740})
        EXPECT_TRUE(Strings_IsHeld(&last, repeat)) << repeat;
    EXPECT_FALSE(Strings_IsHeld(&last, 2740)); // the release went elsewhere
    last = 0;                                  // released
    EXPECT_FALSE(Strings_IsHeld(&last, 2800));
}

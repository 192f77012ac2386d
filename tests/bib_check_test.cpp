// tests/bib_check_test.cpp - what a value and a key may hold.
#include "store/BibStore.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <functional>
#include <string>

#include "base/Ascii.h"
#include "tests/support/LoadText.h"

static std::string Verdict(const char *value)
{
    const char *message = Bib_CheckValue(value);
    return message ? message : "fine";
}

static std::string Stripped(std::string key)
{
    EXPECT_EQ(1, Bib_StripKeyChars(key.data()));
    return key.c_str();
}

TEST(BibCheckValue, AcceptsNothing)
{
    EXPECT_EQ("fine", Verdict(""));
}

TEST(BibCheckValue, AcceptsBalancedBraces)
{
    EXPECT_EQ("fine", Verdict("{a}b{c}"));
    EXPECT_EQ("fine", Verdict("{{}{{a}}}"));
}

TEST(BibCheckValue, RefusesAnExtraBrace)
{
    EXPECT_EQ("Unbalanced braces (extra `}')", Verdict("a}"));
    EXPECT_EQ("Unbalanced braces (extra `}')", Verdict("}{"));
    EXPECT_EQ("Unbalanced braces (extra `}')", Verdict("{a}}{"));
}

TEST(BibCheckValue, RefusesAnOpenBrace)
{
    EXPECT_EQ("Unbalanced braces (too few closing braces)", Verdict("{{a}"));
    EXPECT_EQ("Unbalanced braces (too few closing braces)", Verdict("\2jan\5{"));
}

TEST(BibCheckValue, AcceptsAbbreviationsBesideText)
{
    EXPECT_EQ("fine", Verdict("\2jan\5"));
    EXPECT_EQ("fine", Verdict("{A}\2jan\5\2feb\5 \"#%'(),=\""));
}

TEST(BibCheckValue, AcceptsAnAbbreviationWithoutAName)
{
    EXPECT_EQ("fine", Verdict("\2\5"));
}

TEST(BibCheckValue, RefusesAnAbbreviationInsideBraces)
{
    EXPECT_EQ("Abbreviation can't be appeared inside braces", Verdict("{x\2m\5}"));
}

TEST(BibCheckValue, RefusesAnAbbreviationInsideAnAbbreviation)
{
    EXPECT_EQ("Recursive Abbreviation is imposible", Verdict("\2a\2b\5\5"));
}

TEST(BibCheckValue, RefusesEveryKeyCharacterInAnAbbreviation)
{
    EXPECT_EQ("Invalid char in abbreviation", Verdict("\2a b\5"));
    for (char c : std::string("\"#%'(),={} ")) {
        std::string value = std::string("\2a") + c + "b\5";
        EXPECT_EQ("Invalid char in abbreviation", Verdict(value.c_str())) << c;
    }
}

TEST(BibCheckValue, AcceptsOtherCharactersInAnAbbreviation)
{
    EXPECT_EQ("fine", Verdict("\2a-b:c\\@!$&*+./;<>?[]^_`|~\t\xFF\5"));
}

TEST(BibCheckValue, RefusesAnOpenAbbreviation)
{
    EXPECT_EQ("Unclosed abbreviation", Verdict("\2jan"));
    EXPECT_EQ("Unclosed abbreviation", Verdict("{a}\2"));
}

TEST(BibCheckValue, RefusesALoneClosingMark)
{
    EXPECT_EQ("Closing Abbreviation without an opening", Verdict("\5"));
    EXPECT_EQ("Closing Abbreviation without an opening", Verdict("\2jan\5\5"));
    EXPECT_EQ("Closing Abbreviation without an opening", Verdict("{\5}"));
}

TEST(BibStripKeyChars, RemovesTheElevenCharacters)
{
    EXPECT_EQ("Smith2001a", Stripped("Smith, 2001 (a)"));
    EXPECT_EQ("ab", Stripped("a\"#%'(),={} b"));
    EXPECT_EQ("", Stripped("{} "));
    EXPECT_EQ("", Stripped(""));
}

TEST(BibStripKeyChars, KeepsEverythingElse)
{
    EXPECT_EQ("a:b/c-d\\e@f\tg\xE4", Stripped("a:b/c-d\\e@f\tg\xE4"));
}

// --- Keys and names, against what the parser reads back ---

namespace
{

using Source = std::function<std::string(const std::string &)>;
using Reader = std::function<std::string(const BibEntry *)>;

std::string KeySource(const std::string &key)
{
    return "@misc{" + key + ",\n\tnote = {x}\n}\n";
}

std::string BareKeySource(const std::string &key)
{
    return "@misc{" + key + ",\n}\n";
}

std::string FieldSource(const std::string &name)
{
    return "@misc{k,\n\t" + name + " = {x},\n\tyear = 1\n}\n";
}

std::string UseSource(const std::string &name)
{
    return "@misc{k,\n\tnote = {a} # " + name + " # {b},\n\tyear = 1\n}\n";
}

std::string StringSource(const std::string &name)
{
    return "@STRING{" + name + " = {x}}\n";
}

std::string EntryKey(const BibEntry *entry)
{
    return entry->key;
}

std::string FirstField(const BibEntry *entry)
{
    return FieldName(entry->fields[0]);
}

std::string UsedName(const BibEntry *entry)
{
    std::string value = entry->fields[0].value;
    return value.substr(2, value.size() - 4);
}

// 1 when the text has no fault and what is behind it was read too.
int LoadsCleanly(const BibFile *file)
{
    const BibEntry *last = file->entries;
    while (last && last->next)
        last = last->next;
    return file->errorCount + file->warningCount == 0 && last && strcmp(last->key, "last") == 0;
}

int ReadsBack(const std::string &name, const Source &source, const Reader &read)
{
    BibFile *file = LoadText(source(name) + "@misc{last,}\n");
    int isSame = LoadsCleanly(file) && file->entries->next &&
                 Ascii_Compare(name.c_str(), read(file->entries).c_str()) == 0;
    Bib_FreeFile(file);
    return isSame;
}

int StringReadsBack(const std::string &name)
{
    BibFile *file = LoadText(StringSource(name) + "@misc{last,}\n");
    int isSame = LoadsCleanly(file) && file->strings && name == file->strings->name;
    Bib_FreeFile(file);
    return isSame;
}

// Each byte in one place of a name.
class BibNames : public testing::TestWithParam<std::pair<const char *, const char *>>
{
protected:
    void SetUp() override
    {
        setenv("CARTULO_LOG", "9", 1);
        Bib_Initialize();
    }

    void ForEach(const std::function<void(const std::string &)> &check)
    {
        for (int c = 1; c < 256; ++c) {
            SCOPED_TRACE(c);
            check(GetParam().first + std::string(1, static_cast<char>(c)) + GetParam().second);
        }
    }
};

} // namespace

TEST_P(BibNames, AreKeysWhenTheParserReadsThemAsKeys)
{
    ForEach([](const std::string &key) {
        EXPECT_EQ(ReadsBack(key, KeySource, EntryKey), Bib_IsKey(key.c_str()));
        EXPECT_EQ(ReadsBack(key, BareKeySource, EntryKey), Bib_IsKey(key.c_str()));
    });
}

TEST_P(BibNames, AreNamesWhenTheParserReadsThemAsFields)
{
    ForEach([](const std::string &name) {
        EXPECT_EQ(ReadsBack(name, FieldSource, FirstField), Bib_IsName(name.c_str()));
    });
}

TEST_P(BibNames, AreNamesWhenTheParserReadsThemAsDefinitions)
{
    ForEach([](const std::string &name) {
        EXPECT_EQ(StringReadsBack(name), Bib_IsName(name.c_str()));
    });
}

// Of those that begin with a digit, the parser reads some, but nothing can define them.
TEST_P(BibNames, AreNoNamesWhenTheParserReadsNoUseOfThem)
{
    ForEach([](const std::string &name) {
        int isNumber = name[0] >= '0' && name[0] <= '9';
        if (!isNumber)
            EXPECT_EQ(ReadsBack(name, UseSource, UsedName), Bib_IsName(name.c_str()));
        else
            EXPECT_EQ(0, Bib_IsName(name.c_str()));
    });
}

INSTANTIATE_TEST_SUITE_P(Alone, BibNames, testing::Values(std::pair("", "")));
INSTANTIATE_TEST_SUITE_P(AtTheFront, BibNames, testing::Values(std::pair("", "b")));
INSTANTIATE_TEST_SUITE_P(Inside, BibNames, testing::Values(std::pair("a", "b")));
INSTANTIATE_TEST_SUITE_P(AtTheEnd, BibNames, testing::Values(std::pair("a", "")));

TEST(BibIsKey, TellsKeys)
{
    for (const char *key : {"Griske84", "1984", "a@b", "@misc", "comment", "~", "M\xFCller:x/y-z+"})
        EXPECT_TRUE(Bib_IsKey(key)) << key;
    for (const char *key : {"", "a b", "a\\b", "a{b", "a\tb", "\2", "a\x7F"})
        EXPECT_FALSE(Bib_IsKey(key)) << key;
}

TEST(BibIsName, WantsNoDigitAtTheFront)
{
    for (const char *name : {"jan", "a1", "-1", "crossref", "string", "\xFF"})
        EXPECT_TRUE(Bib_IsName(name)) << name;
    for (const char *name : {"", "1", "12", "1a", "a b", "a\\"})
        EXPECT_FALSE(Bib_IsName(name)) << name;
}

TEST(BibHasBadKeyChars, IsTrueForWhatIsStripped)
{
    for (int c = 1; c < 256; ++c) {
        std::string key = {'a', static_cast<char>(c), 'b'}, stripped = key;
        Bib_StripKeyChars(stripped.data());
        EXPECT_EQ(key != stripped.c_str(), Bib_HasBadKeyChars(key.c_str()) != 0) << c;
    }
    EXPECT_EQ(0, Bib_HasBadKeyChars(""));
}

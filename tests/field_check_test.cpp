// tests/field_check_test.cpp - the rules for fields.
#include "session/FieldCheck.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <set>
#include <string>

#include "encoding/Encoding.h"
#include "session/KnownStrings.h"

// --- The table ---

TEST(FieldRules, EitherRefuseOrWarn)
{
    std::set<std::string> ids;
    for (const FieldRule *rule = FieldRules; rule < FieldRules + FieldRuleCount; ++rule) {
        EXPECT_TRUE(ids.insert(rule->id).second) << rule->id;
        EXPECT_TRUE(rule->applies) << rule->id;
        EXPECT_NE(rule->refuses == nullptr, rule->warns == nullptr) << rule->id;
    }
}

// --- What refuses ---

static const char *Refusal(const char *value)
{
    FieldFacts field = {};
    field.value = value;
    field.isChanged = true;
    return FieldCheck_Refusal(field);
}

TEST(FieldCheckRefusal, AcceptsWhatCanBeReadBack)
{
    for (const char *value : {"", "1999", "{a}b", "\2jan\5", "a \2x_1\5\2y\5"})
        EXPECT_EQ(nullptr, Refusal(value)) << value;
}

TEST(FieldCheckRefusal, RefusesNamesThatTheParserDoesNotRead)
{
    EXPECT_STREQ("Unclosed abbreviation", Refusal("\2jan"));
    for (const char *value : {"\2\5", "\0021st\5", "a\2b\\c\5", "\2ok\5\2\001\5"})
        EXPECT_THAT(Refusal(value), testing::StartsWith("The name of an abbreviation")) << value;
}

TEST(FieldCheckRefusal, LooksAtTheSyntaxAloneOfWhatWasLoaded)
{
    FieldFacts field = {};
    field.value = "\0021st\5";
    EXPECT_EQ(nullptr, FieldCheck_Refusal(field));
    field.value = "a}";
    EXPECT_STREQ("Unbalanced braces (extra `}')", FieldCheck_Refusal(field));
}

TEST(FieldCheckRefusal, LooksAtNewNames)
{
    FieldFacts field = {};
    field.name = "1st";
    EXPECT_EQ(nullptr, FieldCheck_Refusal(field)); // it was there before
    field.isNew = true;
    EXPECT_STREQ(FieldCheck_NameText, FieldCheck_Refusal(field));
    field.name = "first";
    EXPECT_EQ(nullptr, FieldCheck_Refusal(field));
}

// --- What warns ---

static FieldFacts Typed(const wchar_t *name, const std::wstring &text, const char *stored,
                        bool textGuillemets, const EncodingRecord *encoding)
{
    FieldFacts field = {};
    field.isChanged = true;
    field.label = name;
    field.text = text;
    field.stored = stored;
    field.textGuillemets = textGuillemets;
    field.encoding = encoding;
    return field;
}

static std::wstring Warnings(const wchar_t *name, const std::wstring &text, const char *stored,
                             bool textGuillemets, const EncodingRecord *encoding)
{
    return FieldCheck_Warnings(Typed(name, text, stored, textGuillemets, encoding));
}

TEST(FieldCheckWarnings, NamesEachCharacterOnce)
{
    EXPECT_EQ(L"", Warnings(L"a", L"M\u00FCller \u00ABjan\u00BB", "", false, Enc_Current()));
    EXPECT_EQ(L"`a': \u0142 \u0416 U+0085 can't be stored in CP1252 and would become \u00FF.\n",
              Warnings(L"a", L"\u0142\u0416\u0142\u0085", "", false, Enc_Current()));
}

TEST(FieldCheckWarnings, TellsOfGuillemetsWhereTextHadThem)
{
    EXPECT_EQ(L"`a': \u00AB and \u00BB will mark an abbreviation, not stand as text.\n",
              Warnings(L"a", L"\u00ABjan\u00BB", "", true, Enc_Current()));
    EXPECT_EQ(L"", Warnings(L"a", L"jan", "", true, Enc_Current()));
}

TEST(FieldCheckWarnings, TellsOfCharactersThatStandForOtherBytes)
{
    EXPECT_EQ(L"",
              Warnings(L"a", L"M\u00FCller", "\253M\374ller\273 \2jan\5", false, Enc_Current()));
    Enc_Select("CP20127");
    EXPECT_EQ(L"`a': CP20127 shows bytes of the old value as C <, and they would become just "
              L"that.\n",
              Warnings(L"a", L"MC<llerQ", "M\303\274ller", false, Enc_Current()));
    EXPECT_EQ(L"", Warnings(L"a", L"clean", "M\303\274ller", false, Enc_Current()));
    EXPECT_EQ(L"", Warnings(L"a", L"MC<ller", "plain", false, Enc_Current()));
}

TEST(FieldCheckWarnings, InUtf8LoseOnlyWhatIsNoCharacter)
{
    EXPECT_EQ(L"", Warnings(L"a", L"xyz", "\xC2\xABxy", false, &EncodingUtf8));
    EXPECT_EQ(L"", Warnings(L"a", L"\u0142\u0416\U0001F600 \u0301", "M\xC3\xBCller \xC2\xAB", false,
                            &EncodingUtf8));
    EXPECT_EQ(L"`a': U+0002 can't be stored in UTF-8 and would become \u00AB.\n",
              Warnings(L"a", L"x\x02", "", false, &EncodingUtf8));
    EXPECT_EQ(L"`a': \u00AB and \u00BB will mark an abbreviation, not stand as text.\n",
              Warnings(L"a", L"\u00ABtext\u00BB", "", true, &EncodingUtf8));
}

TEST(FieldCheckWarnings, NameUnknownAbbreviationsWhereTheKnownOnesAreKnown)
{
    BibFileSet set = {};
    StringSources sources = {&set, "", {}};
    FieldFacts field = Typed(L"a", L"\u00ABjan\u00BB \u00ABacm\u00BB", "", false, Enc_Current());
    EXPECT_EQ(L"", FieldCheck_Warnings(field));
    field.sources = &sources;
    EXPECT_EQ(0u,
              FieldCheck_Warnings(field).find(L"`a': no abbreviation \u00ABacm\u00BB is known"));
    field.filled = field.text;
    EXPECT_EQ(L"", FieldCheck_Warnings(field));
}

TEST(FieldCheckWarnings, AreOnlyForWhatTheUserTyped)
{
    FieldFacts field = Typed(L"a", L"\u0416 \u00AB", "", true, Enc_Current());
    field.isChanged = false;
    EXPECT_EQ(L"", FieldCheck_Warnings(field));
}

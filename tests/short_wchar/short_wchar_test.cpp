// tests/short_wchar/short_wchar_test.cpp - display text where wchar_t has 16 bits.
//
// A program of its own, compiled with -fshort-wchar together with the units that look at characters
// (see Runtime.cpp). GoogleTest was compiled without: wide texts go to its macros as
// std::u16string.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "encoding/Encoding.h"
#include "session/Names.h"
#include "session/Values.h"
#include "tests/support/LoadText.h"
#include "tests/support/LogCapture.h"
#include "ui/EntryIndex.h"
#include "ui/SearchText.h"

static_assert(sizeof(wchar_t) == 2);

using namespace std::string_literals;

namespace
{

std::wstring Wide(const std::u16string &units)
{
    return {units.begin(), units.end()};
}

std::u16string Units(const std::wstring &text)
{
    return {text.begin(), text.end()};
}

std::string Encode(const std::u16string &units, const EncodingRecord *encoding)
{
    return Enc_Encode(Wide(units).c_str(), encoding);
}

const EncodingRecord *Cp1252()
{
    const EncodingRecord *row = EncodingTable;
    while (strcmp(row->name, "CP1252") != 0)
        ++row;
    return row;
}

// The first and the last of two units, faces, letters of CJK extension B, and the last of one unit.
const struct {
    const char *bytes;
    std::u16string units;
} Texts[] = {
    {"\xF0\x90\x80\x80", {0xD800, 0xDC00}},
    {"\xF4\x8F\xBF\xBF", {0xDBFF, 0xDFFF}},
    {"\xF0\x9F\x98\x80", {0xD83D, 0xDE00}},
    {"a\xF0\x9F\x98\x80\xF0\x9F\x98\x81z", {'a', 0xD83D, 0xDE00, 0xD83D, 0xDE01, 'z'}},
    {"\xF0\xA0\x80\x80\xF0\xAA\x9B\x96", {0xD840, 0xDC00, 0xD869, 0xDED6}},
    {"\xEF\xBF\xBF\xED\x9F\xBF\xEE\x80\x80", {0xFFFF, 0xD7FF, 0xE000}},
    {"M\xC3\xBCller \xE2\x82\xAC", {'M', 0xFC, 'l', 'l', 'e', 'r', ' ', 0x20AC}},
    {"\x02\xF0\x9F\x98\x80\x05\xF0\xA0\x80\x80", {0xAB, 0xD83D, 0xDE00, 0xBB, 0xD840, 0xDC00}},
};

} // namespace

// --- Conversions ---

TEST(Utf16Text, IsThatOfTheCompiler)
{
    EXPECT_EQ(u"\U0001F600\U0002A6D6", Units(L"\U0001F600\U0002A6D6"));
}

TEST(Utf16Text, IsConvertedThereAndBack)
{
    for (const auto &[bytes, units] : Texts) {
        EXPECT_EQ(units, Units(Enc_Decode(bytes, &EncodingUtf8))) << bytes;
        EXPECT_EQ(bytes, Encode(units, &EncodingUtf8));
    }
}

TEST(Utf16Text, HasTheReplacementCharacterForHalfAPair)
{
    const std::string replaced = "\xEF\xBF\xBD", face = "\xF0\x9F\x98\x80";
    EXPECT_EQ(replaced, Encode({0xD83D}, &EncodingUtf8));
    EXPECT_EQ(replaced, Encode({0xDE00}, &EncodingUtf8));
    EXPECT_EQ(replaced + "x", Encode({0xD83D, 'x'}, &EncodingUtf8));
    EXPECT_EQ(replaced + "\x02", Encode({0xD83D, 0xAB}, &EncodingUtf8));
    EXPECT_EQ(replaced + replaced, Encode({0xDE00, 0xD83D}, &EncodingUtf8));
    EXPECT_EQ(replaced + face + replaced, Encode({0xD83D, 0xD83D, 0xDE00, 0xDE00}, &EncodingUtf8));
    for (char16_t c : Units(Enc_Decode("\xED\xA0\xBD\xED\xB8\x80", &EncodingUtf8)))
        EXPECT_EQ(0xFFFD, c); // a pair in UTF-8 is none
}

TEST(Utf16Text, HasOneByteInACodePageForACharacterThatThisLacks)
{
    const std::u16string units = {'a', 0xD83D, 0xDE00, 0xAB, 0xD83D, 0xFC};
    EXPECT_EQ("a\xFF\x02\xFF\xFC", Encode(units, Cp1252()));
    std::vector<char> buffer(units.size() + 1, '#');
    EXPECT_STREQ("a\xFF\x02\xFF\xFC", Enc_FromUnicode(buffer.data(), Wide(units).c_str()));
    EXPECT_EQ("\xFF", Encode({0xD800, 0xDC41}, Cp1252())); // U+10041 is no A
}

TEST(Utf16Text, IsShownFromACodePage)
{
    std::wstring text;
    EXPECT_EQ(u"\u00ABM\u00FCller\u20AC\u00BB", Units(Enc_ToUnicode(text, "\2M\xFCller\x80\5")));
}

TEST(Utf16Text, FitsIntoTheBufferThatIsAskedFor)
{
    for (const std::u16string &one : {u"x"s, u"\u20AC"s, u"\U0001F600"s}) {
        std::u16string units;
        for (int i = 0; i < 100; ++i)
            units += one;
        std::vector<char> buffer(units.size() * ENC_LONGEST + 1, '#');
        Enc_EncodeTo(buffer.data(), Wide(units).c_str(), &EncodingUtf8);
        EXPECT_LT(strlen(buffer.data()), buffer.size());
        EXPECT_EQ(units, Units(Enc_Decode(buffer.data(), &EncodingUtf8)));
    }
}

TEST(Utf16Text, IsLoggedWithWholeCharacters)
{
    const std::string face = "\xF0\x9F\x98\x80";
    EXPECT_EQ("Cartulo: strconv in: a" + face + "\xEF\xBF\xBD\nCartulo: strconv out: x\n",
              LogOf("1", [] {
                  Enc_LogConversion(Wide({'a', 0xD83D, 0xDE00, 0xD83D}).c_str(), "x");
              }));
    std::wstring text;
    std::string faces;
    for (int i = 0; i < 200; ++i)
        text += L"\U0001F600";
    for (size_t i = 0; i < 499 / face.size(); ++i)
        faces += face;
    std::string log = LogOf("1", [&] { Enc_LogConversion(text.c_str(), ""); });
    EXPECT_EQ(0u, log.find("Cartulo: strconv in: " + faces)) << log;
}

TEST(Utf16Text, IsHeldAsCharacters)
{
    for (uint32_t c : {0x1F600u, 0x20000u, 0x2A6D6u, 0x10FFFFu, 0xFFFFu, 0xABu})
        EXPECT_TRUE(Enc_Holds(c, &EncodingUtf8)) << c;
    for (uint32_t c : {0xD83Du, 0xDE00u, 0x110000u, 2u})
        EXPECT_FALSE(Enc_Holds(c, &EncodingUtf8)) << c;
    for (uint32_t c : {0x1F600u, 0x10041u, 0xD83Du})
        EXPECT_FALSE(Enc_Holds(c, Cp1252())) << c;
}

TEST(Utf16Text, IsRecoded)
{
    Enc_Select("CP65001");
    EXPECT_EQ("\2x\5\xFF\xFF",
              Enc_Recode("\2x\5\xF0\x9F\x98\x80\xF0\xA0\x80\x80", &EncodingUtf8, Cp1252()));
    EXPECT_EQ("\2\xC3\xBC\5", Enc_Recode("\2\xFC\5", Cp1252(), &EncodingUtf8));
    std::string recoded;
    EXPECT_FALSE(Enc_TryRecode("\xF0\x9F\x98\x80", &EncodingUtf8, Cp1252(), &recoded));
    EXPECT_TRUE(Enc_TryRecode("M\xC3\xBCller", &EncodingUtf8, Cp1252(), &recoded));
}

// --- Values and names ---

TEST(Utf16Value, IsReadAndShown)
{
    for (const auto &[bytes, units] : Texts) {
        EXPECT_EQ(bytes, Value_Read(Wide(units), &EncodingUtf8));
        EXPECT_EQ(units, Units(Value_Show(bytes, &EncodingUtf8)));
    }
    EXPECT_FALSE(Value_HoldsGuillemets("\2jan\5\xF0\x9F\x98\x80", &EncodingUtf8));
    EXPECT_TRUE(Value_HoldsGuillemets("\xF0\x9F\x98\x80\xC2\xAB", &EncodingUtf8));
}

TEST(Utf16Value, NamesEachLostCharacterOnce)
{
    const std::wstring text = L"\U0001F600a\U0001F601\U0001F600\u0416\U00020000\x85";
    EXPECT_EQ(u"`a': \U0001F600 \U0001F601 \u0416 \U00020000 U+0085 can't be stored in CP1252 and "
              u"would become \u00FF.\n",
              Units(Value_LostText(L"a", text, Cp1252())));
}

TEST(Utf16Value, LosesNothingInUtf8ButHalfAPair)
{
    EXPECT_EQ(u"", Units(Value_LostText(L"a", L"\U0001F600\U0002A6D6", &EncodingUtf8)));
    EXPECT_EQ(u"`a': "s + char16_t(0xD83D) +
                  u" can't be stored in UTF-8 and would become \uFFFD.\n",
              Units(Value_LostText(L"a", Wide({'x', 0xD83D, 'y', 0xD83D}), &EncodingUtf8)));
}

TEST(Utf16Value, NamesTwentyLostCharacters)
{
    std::u16string text, named;
    for (char16_t i = 0; i < 21; ++i) {
        text += {0xD83D, static_cast<char16_t>(0xDE00 + i)};
        if (i < 20)
            named += (i > 0 ? u" "s : u""s) + text.substr(2 * i, 2);
    }
    EXPECT_EQ(u"`a': " + named + u" ... can't be stored in CP1252 and would become \u00FF.\n",
              Units(Value_LostText(L"a", Wide(text), Cp1252())));
}

TEST(Utf16Name, IsReadAndChecked)
{
    TypedName name = Name_Read(L" a\U0001F600\U00020000 ", &EncodingUtf8);
    EXPECT_EQ("a\xF0\x9F\x98\x80\xF0\xA0\x80\x80", name.text);
    EXPECT_TRUE(name.fits);
    EXPECT_EQ(NAME_OK, Name_Check(name));
    name = Name_Read(L"a\U0001F600", Cp1252());
    EXPECT_EQ("a\xFF", name.text);
    EXPECT_FALSE(name.fits);
    EXPECT_EQ(NAME_MISFIT, Name_Check(name));
    EXPECT_FALSE(Name_Read(Wide({'a', 0xDE00}).c_str(), &EncodingUtf8).fits);
    EXPECT_FALSE(Name_Read(L"\U0001F600\u00AB", &EncodingUtf8).fits);
}

// --- Search ---

namespace
{

class Utf16Search : public testing::Test
{
protected:
    Utf16Search()
    {
        Bib_Initialize();
        Enc_Select("CP65001");
    }

    // In the only value of a file.
    static bool Finds(const wchar_t *typed, const std::string &value)
    {
        BibFile *file = LoadText("@misc{k, x = {" + value + "}}\n");
        SearchText search = Search_For(Value_Read(typed, Enc_Current()).c_str(), file);
        bool found = Search_Finds(&search, file->entries);
        Bib_FreeFile(file);
        return found;
    }
};

} // namespace

TEST_F(Utf16Search, FindsACharacterOfTwoUnits)
{
    EXPECT_TRUE(Finds(L"\U0001F600", "a \xF0\x9F\x98\x80 b"));
    EXPECT_TRUE(Finds(L"A \U00020000B", "a \xF0\xA0\x80\x80"
                                        "b"));
    EXPECT_FALSE(Finds(L"\U0001F600", "a \xF0\x9F\x98\x81 b")); // the same first unit
    EXPECT_TRUE(Finds(L"\U00010428", "\xF0\x90\x90\x80"));      // Deseret, in capitals
    EXPECT_TRUE(Finds(L"\u00ABjan\u00BB \U0001F600", "a} # jan # { \xF0\x9F\x98\x80"));
}

TEST_F(Utf16Search, FindsNothingInAFileThatCannotHoldTheCharacter)
{
    EXPECT_FALSE(Finds(L"\U0001F600", "\xFF\xFF\xFC"));
    EXPECT_TRUE(Finds(L"\u00FC", "\xFF\xFF\xFC"));
}

// --- Type-ahead ---

namespace
{

const uint32_t FACE = 0x1F600, HAN = 0x20000;

class Utf16TypeAhead : public testing::Test
{
protected:
    void Load(const std::vector<std::string> &keys)
    {
        Bib_Initialize();
        Enc_Select("CP65001");
        std::string text;
        for (const std::string &key : keys)
            text += "@misc{" + key + ",}\n";
        file = LoadText(text);
        EXPECT_EQ(0, file->errorCount) << Messages(file);
        count = EntryIndex_Build(&index, &file, 1, nullptr);
    }
    ~Utf16TypeAhead() override
    {
        free(index);
        Bib_FreeFile(file);
    }

    TypeAheadVerdict Press(uint32_t key)
    {
        TypeAheadVerdict verdict =
            TypeAhead_Key(&state, key, false, now += 10, selection, index, count, &file, 1);
        if (verdict == TYPE_AHEAD_ROW)
            selection = state.lastFound;
        return verdict;
    }
    std::string Selected() const { return index[selection].entry->key; }
    std::u16string Typed() const { return Units(state.prefix); }

    BibFile *file = nullptr;
    IndexItem *index = nullptr;
    int count = 0, selection = 0;
    int32_t now = 5000;
    TypeAhead state;
};

} // namespace

TEST_F(Utf16TypeAhead, FindsACharacterOfTwoUnits)
{
    Load({"a",
          "x\xF0\x9F\x98\x80"
          "1",
          "x\xF0\x9F\x98\x81"
          "1",
          "\xF0\xA0\x80\x80"});
    for (uint32_t key : {uint32_t('x'), 0x1F601u, uint32_t('1')})
        EXPECT_EQ(TYPE_AHEAD_ROW, Press(key)) << key;
    EXPECT_EQ("x\xF0\x9F\x98\x81"
              "1",
              Selected());
    EXPECT_EQ(u"x\U0001F6011", Typed());
    selection = 0; // start over
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(HAN));
    EXPECT_EQ("\xF0\xA0\x80\x80", Selected());
}

TEST_F(Utf16TypeAhead, TakesOffBothUnitsOfACharacterThatMatchesNothing)
{
    Load({"a", "x\xF0\x9F\x98\x80"});
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(HAN));
    EXPECT_EQ(u"", Typed());
    EXPECT_EQ(TYPE_AHEAD_ROW, Press('x'));
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(0x1F601)); // the same first unit
    EXPECT_EQ(u"x", Typed());
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(0xF600)); // what a unit would keep of it
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(FACE));
    EXPECT_EQ(u"x\U0001F600", Typed());
}

TEST_F(Utf16TypeAhead, MatchesNothingInAFileThatCannotHoldTheCharacter)
{
    Load({"a", "\xFF", "\xF6\xFF"});
    EXPECT_EQ(TYPE_AHEAD_NO_ROW, Press(FACE));
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(0xF6));
    EXPECT_EQ("\xF6\xFF", Selected());
}

TEST_F(Utf16TypeAhead, CountsCharactersForItsLimit)
{
    std::string key;
    for (int i = 0; i < 40; ++i)
        key += "\xF0\x9F\x98\x80";
    Load({key});
    for (int i = 0; i < TYPE_AHEAD_LIMIT; ++i)
        ASSERT_EQ(TYPE_AHEAD_ROW, Press(FACE)) << i;
    EXPECT_EQ(2u * TYPE_AHEAD_LIMIT, state.prefix.size());
    EXPECT_EQ(TYPE_AHEAD_ROW, Press(FACE));
    EXPECT_EQ(u"\U0001F600", Typed());
}

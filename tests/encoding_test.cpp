// tests/encoding_test.cpp - code pages and UTF-8, to and from Unicode.
#include "tests/support/LogCapture.h"

#include <algorithm>
#include <fstream>
#include <vector>

#include "encoding/Encoding.h"
#include "store/BibStore.h"

namespace
{

std::wstring ToUnicode(const std::string &text)
{
    std::wstring out = L"what was there before";
    EXPECT_EQ(&out, &Enc_ToUnicode(out, text.c_str()));
    return out;
}

// With a buffer of exactly the size that is asked for.
std::string FromUnicode(const std::wstring &text)
{
    std::vector<char> buffer(text.size() + 1, '#');
    EXPECT_EQ(buffer.data(), Enc_FromUnicode(buffer.data(), text.c_str()));
    return buffer.data();
}

const EncodingRecord *Row(const std::string &name)
{
    const EncodingRecord *row = EncodingTable;
    while (row->name && name != row->name)
        ++row;
    return row;
}

bool IsPrivateUse(uint32_t codePoint)
{
    return codePoint >= 0xE000 && codePoint <= 0xF8FF;
}

// See scripts/make_codepage_digests.py.
std::string CanonicalText(const uint32_t *map)
{
    std::string text;
    for (unsigned byte = 0; byte < 256; ++byte) {
        char line[32];
        if (IsPrivateUse(map[byte]))
            snprintf(line, sizeof line, "%02X private\n", byte);
        else
            snprintf(line, sizeof line, "%02X %04X\n", byte, map[byte]);
        text += line;
    }
    return text;
}

uint64_t Fnv1a64(const std::string &text)
{
    uint64_t digest = 0xCBF29CE484222325;
    for (unsigned char byte : text)
        digest = (digest ^ byte) * 0x100000001B3;
    return digest;
}

// The byte that a code point must be stored as, by the plain search.
int ByteFor(const uint32_t *map, uint32_t codePoint)
{
    if (codePoint == 0xAB)
        return 0x02;
    if (codePoint == 0xBB)
        return 0x05;
    for (int byte = 0; byte <= 254; ++byte) {
        if (map[byte] == codePoint)
            return byte;
    }
    return 255;
}

std::string OneByte(int byte)
{
    return std::string(1, static_cast<char>(byte));
}

const char *const NAMES[][2] = {
    {"CP1250", "ANSI - Central European"},
    {"CP1251", "ANSI - Cyrillic"},
    {"CP1252", "ANSI - Latin I"},
    {"CP1253", "ANSI - Greek"},
    {"CP1254", "ANSI - Turkish"},
    {"CP1255", "ANSI - Hebrew"},
    {"CP1256", "ANSI - Arabic"},
    {"CP1257", "ANSI - Baltic"},
    {"CP1258", "ANSI - Vietnamese"},
    {"CP437", "OEM - United States"},
    {"CP737", "OEM - Greek (formerly 437G)"},
    {"CP775", "OEM - Baltic"},
    {"CP850", "OEM - Multilingual Latin I"},
    {"CP852", "OEM - Latin II"},
    {"CP855", "OEM - Cyrillic (primarily Russian)"},
    {"CP857", "OEM - Turkish"},
    {"CP860", "OEM - Portuguese"},
    {"CP861", "OEM - Icelandic"},
    {"CP862", "OEM - Hebrew"},
    {"CP863", "OEM - Canadian-French"},
    {"CP864", "OEM - Arabic"},
    {"CP865", "OEM - Nordic"},
    {"CP866", "OEM - Russian"},
    {"CP869", "OEM - Modern Greek"},
    {"CP708", "Arabic - ASMO 708"},
    {"CP720", "Arabic - Transparent ASMO"},
    {"CP28591", "ISO 8859-1 Latin I"},
    {"CP28592", "ISO 8859-2 Central Europe"},
    {"CP28594", "ISO 8859-4 Baltic"},
    {"CP28595", "ISO 8859-5 Cyrillic"},
    {"CP28596", "ISO 8859-6 Arabic"},
    {"CP28597", "ISO 8859-7 Greek"},
    {"CP28598", "ISO 8859-8 Hebrew"},
    {"CP28599", "ISO 8859-9 Latin 5"},
    {"CP28605", "ISO 8859-15 Latin 9, Thai"},
    {"CP38598", "ISO 8859-8 Hebrew"},
    {"CP10000", "MAC - Roman"},
    {"CP10004", "MAC - Arabic"},
    {"CP10005", "MAC - Hebrew"},
    {"CP10006", "MAC - Greek I"},
    {"CP10007", "MAC - Cyrillic"},
    {"CP10010", "MAC - Romania"},
    {"CP10017", "MAC - Ukraine"},
    {"CP10021", "MAC - Thai"},
    {"CP10029", "MAC - Latin II"},
    {"CP10079", "MAC - Icelandic"},
    {"CP10081", "MAC - Turkish"},
    {"CP10082", "MAC - Croatia"},
    {"CP20127", "US-ASCII (7-bit)"},
    {"CP20866", "Russian - KOI8-R"},
    {"CP21866", "Ukrainian (KOI8-U)"},
};

} // namespace

TEST(EncodingTable, ListsTheCodePagesInOrder)
{
    const EncodingRecord *row = EncodingTable;
    for (const auto &names : NAMES) {
        ASSERT_TRUE(row->name) << "no row for " << names[0];
        EXPECT_STREQ(names[0], row->name);
        EXPECT_STREQ(names[1], row->displayName);
        ++row;
    }
    EXPECT_EQ(nullptr, row->name);
    EXPECT_EQ(51, row - EncodingTable);
}

TEST(EncodingTable, AgreesWithASecondSource)
{
    std::ifstream digests(TEST_DATA "/codepages.fnv1a64");
    std::string name;
    uint64_t digest;
    int count = 0;
    for (const EncodingRecord *row = EncodingTable; row->name; ++row, ++count) {
        ASSERT_TRUE(digests >> name >> std::hex >> digest) << "no digest for " << row->name;
        EXPECT_EQ(name, row->name);
        EXPECT_EQ(digest, Fnv1a64(CanonicalText(row->map))) << row->name;
    }
    EXPECT_EQ(51, count);
    EXPECT_FALSE(digests >> name) << "no row for " << name;
}

TEST(EncodingTable, MapsUndefinedBytesToThemselves)
{
    for (int byte : {0x81, 0x8D, 0x8F, 0x90, 0x9D})
        EXPECT_EQ(uint32_t(byte), Row("CP1252")->map[byte]);
    for (int byte : {0x7F, 0x90, 0x9F, 0xFC, 0xFD, 0xFE, 0xFF})
        EXPECT_EQ(uint32_t(byte), Row("CP10021")->map[byte]);
}

TEST(EncodingTable, HasTheVariantsOfTheSystem)
{
    for (int byte = 0; byte < 256; ++byte)
        EXPECT_EQ(uint32_t(byte & 0x7F), Row("CP20127")->map[byte]);
    EXPECT_EQ(0x2126u, Row("CP10000")->map[0xBD]);
    EXPECT_EQ(0x045Eu, Row("CP21866")->map[0xAE]);
    EXPECT_EQ(0x040Eu, Row("CP21866")->map[0xBE]);
}

TEST(EncodingTable, KnowsWellKnownLetters)
{
    EXPECT_EQ(0x20ACu, Row("CP1252")->map[0x80]);
    EXPECT_EQ(0x0416u, Row("CP1251")->map[0xC6]);
    EXPECT_EQ(0x00E4u, Row("CP437")->map[0x84]);
    EXPECT_EQ(0x20ACu, Row("CP28605")->map[0xA4]);
    EXPECT_EQ(0x0416u, Row("CP20866")->map[0xF6]);
}

TEST(EncodingTable, HasOneMapForBothHebrewOrders)
{
    for (int byte = 0; byte < 256; ++byte)
        EXPECT_EQ(Row("CP28598")->map[byte], Row("CP38598")->map[byte]);
}

TEST(EncodingTable, KeepsTheAsciiBytes)
{
    for (const EncodingRecord *row = EncodingTable; row->name; ++row) {
        for (uint32_t byte = 0; byte < 0x80; ++byte)
            EXPECT_EQ(byte, row->map[byte]) << row->name;
    }
}

TEST(EncSelect, IsNotNeededForCP1252)
{
    EXPECT_STREQ("CP1252", Enc_Current()->name);
}

TEST(EncSelect, ComesAfterAConversionToo)
{
    EXPECT_EQ("\x80", FromUnicode(L"\u20AC")); // before anything was selected
    Enc_Select("CP28605");
    EXPECT_EQ("\xA4", FromUnicode(L"\u20AC"));
}

TEST(EncSelect, FindsEveryRow)
{
    for (const EncodingRecord *row = EncodingTable; row->name; ++row) {
        Enc_Select(row->name);
        EXPECT_EQ(row, Enc_Current());
    }
}

TEST(EncSelect, IgnoresLetterCase)
{
    Enc_Select("cp1251");
    EXPECT_STREQ("CP1251", Enc_Current()->name);
    Enc_Select("cP437");
    EXPECT_STREQ("CP437", Enc_Current()->name);
}

TEST(EncSelect, KeepsTheCodePageOnAnUnknownName)
{
    Enc_Select("CP1251");
    for (const char *name : {"UTF-8", "", "CP125", "CP12510", "1252", " CP1252"}) {
        Enc_Select(name);
        EXPECT_STREQ("CP1251", Enc_Current()->name) << name;
        EXPECT_EQ(L"\u0416", ToUnicode("\xC6"));
        EXPECT_EQ("\xC6", FromUnicode(L"\u0416"));
    }
}

TEST(EncSelect, LogsTheNameThatWasAskedFor)
{
    EXPECT_EQ("Cartulo: INFO: Selecting Encoding: cp1251\n",
              LogOf("1", [] { Enc_Select("cp1251"); }));
    EXPECT_EQ("", LogOf("2", [] { Enc_Select("cp1251"); }));
}

TEST(EncSelect, LogsAnUnknownNameAsAnError)
{
    EXPECT_EQ("Cartulo: ERROR: Can't select unknown encoding: UTF-8\n",
              LogOf("4", [] { Enc_Select("UTF-8"); }));
}

TEST(EncSelect, ForgetsTheCodePageBefore)
{
    Enc_Select("CP1251");
    EXPECT_EQ("\xC6", FromUnicode(L"\u0416"));
    Enc_Select("CP1252");
    EXPECT_EQ("\xFF", FromUnicode(L"\u0416"));
    EXPECT_EQ(L"\u00C6", ToUnicode("\xC6"));
}

TEST(EncToUnicode, ShowsAbbreviationMarksAsGuillemets)
{
    Enc_Select("CP1252");
    EXPECT_EQ(L"1\u00ABjan\u00BB\u00E4", ToUnicode("1\x02jan\x05\xE4"));
}

TEST(EncToUnicode, ShowsMarksInEveryCodePage)
{
    for (const EncodingRecord *row = EncodingTable; row->name; ++row) {
        Enc_Select(row->name);
        EXPECT_EQ(L"\u00AB\u00BB", ToUnicode("\x02\x05")) << row->name;
    }
}

TEST(EncToUnicode, GivesTheCodePointOfEveryByte)
{
    for (const EncodingRecord *row = EncodingTable; row->name; ++row) {
        Enc_Select(row->name);
        for (int byte = 1; byte < 256; ++byte) {
            wchar_t expected = byte == 2 ? 0xAB : byte == 5 ? 0xBB : wchar_t(row->map[byte]);
            EXPECT_EQ(std::wstring(1, expected), ToUnicode(OneByte(byte))) << row->name << byte;
        }
    }
}

TEST(EncToUnicode, KeepsAByteThatMeansU0000)
{
    Enc_Select("CP20127");
    EXPECT_EQ(std::wstring(L"a\0b", 3), ToUnicode("a\x80"
                                                  "b"));
}

TEST(EncToUnicode, GivesNothingForAnEmptyText)
{
    EXPECT_EQ(L"", ToUnicode(""));
}

TEST(EncFromUnicode, StoresGuillemetsAsAbbreviationMarks)
{
    Enc_Select("CP1252");
    EXPECT_EQ("1\x02jan\x05\xE4", FromUnicode(L"1\u00ABjan\u00BB\u00E4"));
}

TEST(EncFromUnicode, TurnsALiteralGuillemetIntoAMark)
{
    Enc_Select("CP1252");
    EXPECT_EQ(L"\u00AB", ToUnicode("\xAB"));
    EXPECT_EQ("\x02", FromUnicode(ToUnicode("\xAB")));
    EXPECT_EQ("\x05", FromUnicode(ToUnicode("\xBB")));
}

TEST(EncFromUnicode, StoresWhatTheCodePageLacksAsByteFF)
{
    Enc_Select("CP1252");
    EXPECT_EQ("a\xFF"
              "b",
              FromUnicode(L"a\u0416b"));
    EXPECT_EQ("\xFF\xFF\xFF", FromUnicode(L"\uFFFD\U0001F600\U0010FFFF"));
    const wchar_t noCharacters[] = {wchar_t(0xD800), wchar_t(0x110000), wchar_t(-1), 0};
    EXPECT_EQ("\xFF\xFF\xFF", FromUnicode(noCharacters));
}

TEST(EncFromUnicode, StoresTheCharacterOfByteFF)
{
    Enc_Select("CP1252");
    EXPECT_EQ("\xFF", FromUnicode(L"\u00FF"));
}

TEST(EncFromUnicode, TakesTheSmallestOfSeveralBytes)
{
    Enc_Select("CP20127");
    EXPECT_EQ("A\x7F", FromUnicode(L"A\u007F")); // 41 and C1; 7F and FF
    EXPECT_EQ("\x02", FromUnicode(L"\u0002"));
}

TEST(EncFromUnicode, DoesNotConfuseACodePointWithItsLowByte)
{
    Enc_Select("CP1252");
    EXPECT_EQ("\xFF\xFF", FromUnicode(L"\u0141\U00010041"));
}

TEST(EncFromUnicode, FindsTheByteOfThePlainSearch)
{
    for (const EncodingRecord *row = EncodingTable; row->name; ++row) {
        Enc_Select(row->name);
        std::wstring text;
        std::string expected;
        for (const EncodingRecord *other = EncodingTable; other->name; ++other) {
            for (int byte = 1; byte < 256; ++byte) {
                if (other->map[byte] == 0)
                    continue;
                text += wchar_t(other->map[byte]);
                expected += OneByte(ByteFor(row->map, other->map[byte]));
            }
        }
        EXPECT_EQ(expected, FromUnicode(text)) << row->name;
    }
}

TEST(EncFromUnicode, GivesBackEveryByteThatIsAloneWithItsMeaning)
{
    int bytes = 0;
    for (const EncodingRecord *row = EncodingTable; row->name; ++row) {
        Enc_Select(row->name);
        for (int byte = 1; byte < 256; ++byte) {
            uint32_t codePoint = row->map[byte];
            bool alone = std::count(row->map, row->map + 256, codePoint) == 1;
            if (!alone || codePoint == 0xAB || codePoint == 0xBB)
                continue;
            ++bytes;
            EXPECT_EQ(OneByte(byte), FromUnicode(ToUnicode(OneByte(byte)))) << row->name << byte;
        }
    }
    EXPECT_GT(bytes, 50 * 200);
}

TEST(EncHolds, WhatComesBackAsItWas)
{
    for (wchar_t c : {L'a', L'\u00E4', L'\u20AC', L'\u00FF', L'\u00AB', L'\u00BB', L'\t'})
        EXPECT_TRUE(Enc_Holds(c, Enc_Current())) << int(c);
    for (wchar_t c : {L'\u0436', L'\U0001F600', L'\x02', L'\x05'}) // the last two are marks there
        EXPECT_FALSE(Enc_Holds(c, Enc_Current())) << int(c);
    Enc_Select("CP1251");
    EXPECT_TRUE(Enc_Holds(L'\u0436', Enc_Current()));
    EXPECT_FALSE(Enc_Holds(L'\u00FF', Enc_Current()));
}

TEST(EncFromUnicode, LogsTheTextAndTheResult)
{
    // Display text as UTF-8, store text as it is, but control characters as blanks.
    EXPECT_EQ("Cartulo: strconv in: a\u00E4\u00AB\u20AC\U0001F600\n"
              "Cartulo: strconv out: a\xE4 \x80\xFF\n",
              LogOf("1", [] { FromUnicode(L"a\u00E4\u00AB\u20AC\U0001F600"); }));
    EXPECT_EQ("", LogOf("2", [] { FromUnicode(L"a"); }));
}

TEST(EncFromUnicode, LogsWhatIsNoCharacterAsTheReplacementCharacter)
{
    const wchar_t text[] = {wchar_t(0xD800), wchar_t(0xDFFF), wchar_t(0x110000), 0};
    EXPECT_EQ("Cartulo: strconv in: \uFFFD\uFFFD\uFFFD\nCartulo: strconv out: \xFF\xFF\xFF\n",
              LogOf("1", [&] { FromUnicode(text); }));
}

TEST(EncFromUnicode, LogsTheStartOfALongText)
{
    std::wstring text(100000, L'x');
    EXPECT_EQ("Cartulo: strconv in: " + std::string(499, 'x') +
                  "\nCartulo: strconv out: " + std::string(498, 'x') + "\n",
              LogOf("1", [&] { EXPECT_EQ(text.size(), FromUnicode(text).size()); }));
}

TEST(EncToUnicode, LogsNothing)
{
    EXPECT_EQ("", LogOf("1", [] { ToUnicode("a\x81\xFF"); }));
}

// --- Single characters ---

TEST(EncWide, IsTakenAndPutCharacterByCharacter)
{
    const std::u32string characters = U"a\u00AB\u20AC\uFFFF\U00010000\U0001F600\U0010FFFF";
    std::wstring text;
    for (char32_t c : characters)
        Enc_AppendWide(&text, c);
    EXPECT_EQ(L"a\u00AB\u20AC\uFFFF\U00010000\U0001F600\U0010FFFF", text);
    std::u32string taken;
    for (const wchar_t *at = text.c_str(); *at;)
        taken += Enc_NextWide(&at);
    EXPECT_EQ(characters, taken);
}

TEST(EncJoinSurrogates, JoinsPairsOnly)
{
    EXPECT_EQ(0x10000u, Enc_JoinSurrogates(0xD800, 0xDC00));
    EXPECT_EQ(0x1F600u, Enc_JoinSurrogates(0xD83D, 0xDE00));
    EXPECT_EQ(0x10FFFFu, Enc_JoinSurrogates(0xDBFF, 0xDFFF));
    for (auto [first, second] : {std::pair(0xDE00u, 0xD83Du),
                                 {0xD83Du, 0xD83Du},
                                 {0xD83Du, 0u},
                                 {0xD83Du, 0xE000u},
                                 {0xD7FFu, 0xDC00u},
                                 {0x1D83Du, 0xDE00u}})
        EXPECT_EQ(0u, Enc_JoinSurrogates(first, second)) << first << " " << second;
}

TEST(EncIsCharacter, LeavesOutSurrogatesAndWhatIsBeyond)
{
    for (uint32_t c : {0u, 0x41u, 0xD7FFu, 0xE000u, 0xFFFFu, 0x1F600u, 0x10FFFFu})
        EXPECT_TRUE(Enc_IsCharacter(c)) << c;
    for (uint32_t c : {0xD800u, 0xDFFFu, 0x110000u, 0xFFFFFFFFu})
        EXPECT_FALSE(Enc_IsCharacter(c)) << c;
}

// --- UTF-8 ---

namespace
{

class EncUtf8 : public testing::Test
{
protected:
    EncUtf8() { Enc_Select("CP65001"); }

    static std::string Encode(const std::wstring &text)
    {
        return Enc_Encode(text.c_str(), &EncodingUtf8);
    }
};

// Of 1, 2, 3 and 4 bytes, right-to-left, combining, private, and no characters at all by now.
const std::pair<const char *, std::wstring> Utf8Texts[] = {
    {"", L""},
    {"plain", L"plain"},
    {"M\xC3\xBCller", L"M\u00FCller"},
    {"\xD0\x96\xE2\x82\xAC", L"\u0416\u20AC"},
    {"\xF0\x9F\x98\x80", L"\U0001F600"},
    {"\xD7\xA9\xD7\x9C\xE2\x80\x8F", L"\u05E9\u05DC\u200F"},
    {"e\xCC\x81", L"e\u0301"},
    {"\xEE\x80\x80\xF4\x8F\xBF\xBF", L"\uE000\U0010FFFF"},
    {"\xEF\xBF\xBE\xEF\xB7\x90", std::wstring(1, 0xFFFE) + wchar_t(0xFDD0)},
    {"\x02jan\x05\x01\x7F", L"\u00ABjan\u00BB\x01\x7F"},
};

} // namespace

TEST(EncSelect, KnowsUtf8ByItsCodePage)
{
    Enc_Select("cp65001");
    EXPECT_EQ(&EncodingUtf8, Enc_Current());
    EXPECT_STREQ("CP65001", Enc_Current()->name);
    EXPECT_STREQ("UTF-8", Enc_Label(Enc_Current()));
    Enc_Select("UTF-8");
    EXPECT_EQ(&EncodingUtf8, Enc_Current());
    Enc_Select("CP1251");
    EXPECT_STREQ("CP1251", Enc_Label(Enc_Current()));
    EXPECT_EQ(Row("CP65001")->name, nullptr) << "it is a row of the table";
}

TEST_F(EncUtf8, LeavesThePlainConversionsInTheDefaultPage)
{
    Enc_Select("CP1251");
    Enc_Select("CP65001");
    EXPECT_EQ(L"\u00FC\u20AC\u00AB", ToUnicode("\xFC\x80\x02"));
    EXPECT_EQ("\xFC\x80\x02\xFF", FromUnicode(L"\u00FC\u20AC\u00AB\u0416"));
}

TEST_F(EncUtf8, ConvertsThereAndBack)
{
    for (const auto &[bytes, text] : Utf8Texts) {
        EXPECT_EQ(text, Enc_Decode(bytes, &EncodingUtf8)) << bytes;
        EXPECT_EQ(bytes, Encode(text));
    }
}

TEST_F(EncUtf8, ShowsLiteralGuillemetsLikeMarks)
{
    EXPECT_EQ(L"\u00ABa\u00BB", Enc_Decode("\xC2\xAB"
                                           "a\xC2\xBB",
                                           &EncodingUtf8));
    EXPECT_EQ("\x02"
              "a\x05",
              Encode(L"\u00ABa\u00BB"));
}

TEST_F(EncUtf8, ReplacesWhatIsNoCharacter)
{
    EXPECT_EQ(L"a\uFFFDb", Enc_Decode("a\xFF"
                                      "b",
                                      &EncodingUtf8));
    EXPECT_EQ(L"a\uFFFD", Enc_Decode("a\xE2\x82", &EncodingUtf8)); // cut off
    EXPECT_EQ("a\xEF\xBF\xBD", Encode(std::wstring(L"a") + wchar_t(0xD800)));
    EXPECT_EQ("\xEF\xBF\xBD", Encode(std::wstring(1, 0x110000)));
}

TEST_F(EncUtf8, HoldsAllCharactersButMarks)
{
    for (wchar_t c : {L'a', L'\u0436', L'\U0001F600', L'\uE000', L'\u00AB', L'\t'})
        EXPECT_TRUE(Enc_Holds(c, &EncodingUtf8)) << int(c);
    for (int c : {0x02, 0x05, 0xD800, 0xDFFF, 0x110000})
        EXPECT_FALSE(Enc_Holds(c, &EncodingUtf8)) << c;
}

TEST_F(EncUtf8, IsFoundInValidTextOnly)
{
    for (const auto &[bytes, text] : Utf8Texts)
        EXPECT_TRUE(Enc_IsUtf8(bytes, strlen(bytes))) << bytes;
    for (std::string text : {"\xFC", "\x80", "\xC3", "\xC0\x80", "\xE0\x80\x80", "\xED\xA0\x80",
                             "\xF4\x90\x80\x80", "\xF8\x88\x80\x80\x80", "\xE2\x82"})
        for (std::string before : {"", "a", "abcdefg", "abcdefgh", "abcdefghi\xC3\xBC"})
            for (std::string after : {"", "z", "abcdefghijklmnop"}) {
                std::string whole = before + text + after;
                EXPECT_FALSE(Enc_IsUtf8(whole.data(), whole.size())) << whole;
            }
    EXPECT_TRUE(Enc_IsUtf8("\xC3\xBC\xFF", 2)); // up to the length
}

TEST_F(EncUtf8, IsTheEncodingOfEachFileThatWasFoundSo)
{
    BibFile utf8 = {}, other = {};
    other.form = BIB_FORM_CODE_PAGE | BIB_FORM_CRLF;
    EXPECT_EQ(&EncodingUtf8, Bib_Encoding(&utf8));
    EXPECT_EQ(Row("CP1252"), Bib_Encoding(&other));
    Enc_Select("CP1251");
    EXPECT_EQ(Row("CP1251"), Bib_Encoding(&utf8));
    EXPECT_EQ(Row("CP1251"), Bib_Encoding(&other));
}

TEST_F(EncUtf8, IsTheEncodingOfATextThatIsValid)
{
    EXPECT_EQ(&EncodingUtf8, Enc_OfText("M\xC3\xBCller"));
    EXPECT_EQ(&EncodingUtf8, Enc_OfText(""));
    EXPECT_EQ(Row("CP1252"), Enc_OfText("M\xFCller"));
    Enc_Select("CP1251");
    EXPECT_EQ(Row("CP1251"), Enc_OfText("M\xC3\xBCller"));
}

TEST_F(EncUtf8, IsRecodedToAndFromTheDefaultPage)
{
    const EncodingRecord *page = Row("CP1252");
    EXPECT_EQ("M\xFCller \x02", Enc_Recode("M\xC3\xBCller \x02", &EncodingUtf8, page));
    EXPECT_EQ("M\xC3\xBCller \x02", Enc_Recode("M\xFCller \x02", page, &EncodingUtf8));
    EXPECT_EQ("\xFF", Enc_Recode("\xD0\x96", &EncodingUtf8, page));
    EXPECT_EQ("\xC2\xAB", Enc_Recode("\xC2\xAB", &EncodingUtf8, &EncodingUtf8)); // untouched
}

TEST_F(EncUtf8, IsRecodedWithAWordOnWhatDoesNotComeBack)
{
    const EncodingRecord *page = Row("CP1252");
    std::string recoded = "old";
    EXPECT_TRUE(Enc_TryRecode("M\xC3\xBCller \x02", &EncodingUtf8, page, &recoded));
    EXPECT_EQ("M\xFCller \x02", recoded);
    EXPECT_TRUE(Enc_TryRecode("M\xFCller \x02", page, &EncodingUtf8, &recoded));
    EXPECT_EQ("M\xC3\xBCller \x02", recoded);
    EXPECT_FALSE(Enc_TryRecode("a\xD0\x96", &EncodingUtf8, page, &recoded));
    EXPECT_EQ("a\xFF", recoded);
    EXPECT_FALSE(Enc_TryRecode("\xC2\xAB", &EncodingUtf8, page, &recoded)); // a mark there
    EXPECT_EQ("\x02", recoded);
    EXPECT_FALSE(Enc_TryRecode("\xFC", &EncodingUtf8, page, &recoded)); // no text in UTF-8
    EXPECT_TRUE(Enc_TryRecode("\xFC", page, page, &recoded));
    EXPECT_EQ("\xFC", recoded);
    EXPECT_TRUE(Enc_TryRecode("", &EncodingUtf8, page, &recoded));
    EXPECT_EQ("", recoded);
}

TEST_F(EncUtf8, IsSearchedWithoutTheCaseOfAnyLetter)
{
    auto contains = [](const char *text, const char *search) {
        return Enc_Utf8Contains(text, Enc_FoldUtf8(search)) != 0;
    };
    EXPECT_TRUE(contains("M\xC3\xBCLLER", "m\xC3\x9Cller"));
    EXPECT_TRUE(
        contains("\xD0\x9F\xD1\x80\xD0\xB8\xD0\xB2\xD0\xB5\xD1\x82", "\xD0\xBF\xD0\xA0\xD0\x98"));
    EXPECT_TRUE(contains("\xCE\xA3 \xCF\x82", "\xCF\x83 \xCF\x83")); // sigma, also at the end
    EXPECT_TRUE(contains("aab\xC3\xBC", "AB\xC3\x9C"));
    EXPECT_TRUE(contains("\xF0\x90\x90\x80", "\xF0\x90\x90\xA8")); // Deseret
    EXPECT_FALSE(contains("Muller", "m\xC3\xBCller"));
    EXPECT_FALSE(contains("M\xC3\xBC", "m\xC3\xBCller"));
    EXPECT_FALSE(contains("", "\xC3\xBC"));
    EXPECT_TRUE(contains("", ""));
    EXPECT_TRUE(contains("\xE2\x84\xAA", "k")); // the sign for kelvin
}

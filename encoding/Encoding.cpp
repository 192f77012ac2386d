// encoding/Encoding.cpp - selecting an encoding and converting with it.
#include "encoding/Encoding.h"

#include <algorithm>
#include <cstring>
#include <cwchar>

#include <unicode/uchar.h>
#include <unicode/utf16.h>
#include <unicode/utf8.h>

#include "base/Ascii.h"
#include "base/Log.h"

static const uint32_t CODE_POINTS = 0x10000; // no code page reaches beyond
static const unsigned char NO_BYTE = 255;
static const uint32_t REPLACEMENT = 0xFFFD;
static const char DefaultPage[] = "CP1252"; // also of what is no UTF-8

const EncodingRecord EncodingUtf8 = {"CP65001", "UTF-8", nullptr};

static const EncodingRecord *selected; // null until the first use
static const EncodingRecord *page;     // the code page in use
static unsigned char pageBytes[CODE_POINTS];

// --- Selecting ---

// Makes the row the page in use. Where two bytes have one meaning, the smaller one is written back.
static void UsePage(const EncodingRecord *row)
{
    memset(pageBytes, NO_BYTE, sizeof pageBytes);
    for (int byte = 254; byte >= 0; --byte)
        pageBytes[row->map[byte]] = static_cast<unsigned char>(byte);
    page = row;
}

static const EncodingRecord *FindRow(const char *name)
{
    for (const EncodingRecord *row = EncodingTable; row->name; ++row) {
        if (Ascii_Compare(row->name, name) == 0)
            return row;
    }
    return nullptr;
}

static const EncodingRecord *Find(const char *name)
{
    return Ascii_Compare(EncodingUtf8.name, name) == 0 ? &EncodingUtf8 : FindRow(name);
}

static void Use(const EncodingRecord *encoding)
{
    selected = encoding;
    UsePage(encoding->map ? encoding : FindRow(DefaultPage));
}

int Enc_Select(const char *name)
{
    const EncodingRecord *encoding = Find(name);
    if (!encoding) {
        AppLog("ERROR: Can't select unknown encoding: ", name);
        return 0;
    }
    Use(encoding);
    AppLog("INFO: Selecting Encoding: ", name);
    return 1;
}

const EncodingRecord *Enc_Current()
{
    if (!selected)
        Use(FindRow(DefaultPage));
    return selected;
}

static const EncodingRecord *CurrentPage()
{
    Enc_Current();
    return page;
}

const char *Enc_Label(const EncodingRecord *encoding)
{
    return encoding == &EncodingUtf8 ? encoding->displayName : encoding->name;
}

const EncodingRecord *Enc_For(int isUtf8)
{
    if (Enc_Current() != &EncodingUtf8)
        return selected;
    return isUtf8 ? &EncodingUtf8 : page;
}

const EncodingRecord *Enc_OfText(const char *text)
{
    return Enc_For(Enc_IsUtf8(text, strlen(text)));
}

// --- Characters of display text ---

static const bool HAS_PAIRS = sizeof(wchar_t) == 2;

uint32_t Enc_JoinSurrogates(uint32_t first, uint32_t second)
{
    bool isPair = U16_IS_LEAD(first) && U16_IS_TRAIL(second);
    return isPair ? static_cast<uint32_t>(U16_GET_SUPPLEMENTARY(first, second)) : 0;
}

uint32_t Enc_NextWide(const wchar_t **at)
{
    uint32_t c = static_cast<uint32_t>(*(*at)++);
    uint32_t joined = HAS_PAIRS ? Enc_JoinSurrogates(c, static_cast<uint32_t>(**at)) : 0;
    if (joined == 0)
        return c;
    ++*at;
    return joined;
}

void Enc_AppendWide(std::wstring *text, uint32_t character)
{
    if (HAS_PAIRS && character > 0xFFFF) {
        *text += static_cast<wchar_t>(U16_LEAD(character));
        character = U16_TRAIL(character);
    }
    *text += static_cast<wchar_t>(character);
}

int Enc_IsCharacter(uint32_t character)
{
    return character <= 0x10FFFF && !U_IS_SURROGATE(character);
}

// --- To Unicode ---

static uint32_t ToCharacter(const uint32_t *map, unsigned char byte)
{
    switch (byte) {
    case ENC_OPEN_MARK:
        return ENC_SHOWN_OPEN;
    case ENC_CLOSE_MARK:
        return ENC_SHOWN_CLOSE;
    default:
        return map[byte];
    }
}

static void DecodePage(std::wstring *out, const char *text, const uint32_t *map)
{
    out->reserve(strlen(text));
    for (; *text; ++text)
        Enc_AppendWide(out, ToCharacter(map, static_cast<unsigned char>(*text)));
}

// The next character of UTF-8 text that ends with a NUL; U+FFFD for bytes that are none.
static uint32_t NextCharacter(const char **at)
{
    int32_t i = 0;
    UChar32 c;
    U8_NEXT(*at, i, -1, c);
    *at += i;
    return c < 0 ? REPLACEMENT : static_cast<uint32_t>(c);
}

static void DecodeUtf8(std::wstring *out, const char *text)
{
    out->reserve(strlen(text));
    while (*text) {
        uint32_t c = NextCharacter(&text);
        Enc_AppendWide(out, c == ENC_OPEN_MARK    ? ENC_SHOWN_OPEN
                            : c == ENC_CLOSE_MARK ? ENC_SHOWN_CLOSE
                                                  : c);
    }
}

std::wstring &Enc_ToUnicode(std::wstring &out, const char *text)
{
    out.clear();
    DecodePage(&out, text, CurrentPage()->map);
    return out;
}

std::wstring Enc_Decode(const char *text, const EncodingRecord *encoding)
{
    std::wstring out;
    if (encoding->map)
        DecodePage(&out, text, encoding->map);
    else
        DecodeUtf8(&out, text);
    return out;
}

// --- From Unicode ---

static unsigned char FindByte(const uint32_t *map, uint32_t c)
{
    const uint32_t *end = map + NO_BYTE;
    return static_cast<unsigned char>(std::find(map, end, c) - map);
}

static unsigned char ToByte(uint32_t c, const EncodingRecord *encoding)
{
    switch (c) {
    case ENC_SHOWN_OPEN:
        return ENC_OPEN_MARK;
    case ENC_SHOWN_CLOSE:
        return ENC_CLOSE_MARK;
    }
    if (encoding != page)
        return FindByte(encoding->map, c);
    return c < CODE_POINTS ? pageBytes[c] : NO_BYTE;
}

size_t Enc_PutUtf8(char *out, uint32_t character)
{
    if (!Enc_IsCharacter(character))
        character = REPLACEMENT;
    size_t length = 0;
    U8_APPEND_UNSAFE(out, length, character);
    return length;
}

// Only as much of the text as a line of the log has room for.
static void LogInput(const wchar_t *text)
{
    char line[512];
    size_t length = 0;
    while (*text && length + ENC_LONGEST < sizeof line)
        length += Enc_PutUtf8(line + length, Enc_NextWide(&text));
    line[length] = 0;
    AppLog("strconv in: ", line);
}

void Enc_LogConversion(const wchar_t *in, const char *out)
{
    LogInput(in);
    AppLog("strconv out: ", out);
}

char *Enc_FromUnicode(char *buffer, const wchar_t *text)
{
    const EncodingRecord *current = CurrentPage();
    char *out = buffer;
    for (const wchar_t *at = text; *at;)
        *out++ = static_cast<char>(ToByte(Enc_NextWide(&at), current));
    *out = 0;
    Enc_LogConversion(text, buffer);
    return buffer;
}

static size_t PutCharacter(char *out, uint32_t c, const EncodingRecord *encoding)
{
    if (!encoding->map && c != ENC_SHOWN_OPEN && c != ENC_SHOWN_CLOSE)
        return Enc_PutUtf8(out, c);
    *out = static_cast<char>(ToByte(c, encoding));
    return 1;
}

char *Enc_EncodeTo(char *buffer, const wchar_t *text, const EncodingRecord *encoding)
{
    char *out = buffer;
    while (*text)
        out += PutCharacter(out, Enc_NextWide(&text), encoding);
    *out = 0;
    return buffer;
}

std::string Enc_Encode(const wchar_t *text, const EncodingRecord *encoding)
{
    std::string bytes(wcslen(text) * ENC_LONGEST + 1, 0);
    bytes.resize(strlen(Enc_EncodeTo(bytes.data(), text, encoding)));
    return bytes;
}

int Enc_Holds(uint32_t character, const EncodingRecord *encoding)
{
    if (encoding->map)
        return ToCharacter(encoding->map, ToByte(character, encoding)) == character;
    bool isMark = character == ENC_OPEN_MARK || character == ENC_CLOSE_MARK;
    return Enc_IsCharacter(character) && !isMark;
}

std::string Enc_Recode(const char *text, const EncodingRecord *from, const EncodingRecord *to)
{
    return from == to ? text : Enc_Encode(Enc_Decode(text, from).c_str(), to);
}

int Enc_TryRecode(const char *text, const EncodingRecord *from, const EncodingRecord *to,
                  std::string *recoded)
{
    *recoded = Enc_Recode(text, from, to);
    return Enc_Recode(recoded->c_str(), to, from) == text;
}

// --- UTF-8 ---

// How many ASCII characters the text begins with.
static size_t AsciiLength(const char *text, size_t length)
{
    const uint64_t highBits = 0x8080808080808080;
    size_t i = 0;
    for (uint64_t word; i + sizeof word <= length; i += sizeof word) {
        memcpy(&word, text + i, sizeof word);
        if (word & highBits)
            break;
    }
    while (i < length && U8_IS_SINGLE(text[i]))
        ++i;
    return i;
}

size_t Enc_Utf8Length(const char *text, size_t length)
{
    size_t i = AsciiLength(text, length);
    while (i < length) {
        size_t next = i;
        UChar32 c;
        U8_NEXT(text, next, length, c);
        if (c < 0)
            return i;
        i = next + AsciiLength(text + next, length - next);
    }
    return i;
}

int Enc_IsUtf8(const char *text, size_t length)
{
    return Enc_Utf8Length(text, length) == length;
}

std::string Enc_CutTo(size_t size, std::string text)
{
    if (text.size() < size)
        return text;
    text.resize(size);
    size_t valid = Enc_Utf8Length(text.data(), size);
    if (size - valid < ENC_LONGEST)
        text.resize(valid);
    return text;
}

// Neither other letters nor marks: most values are like that.
static bool IsPlain(const char *text)
{
    size_t length = strlen(text);
    return AsciiLength(text, length) == length && !strpbrk(text, "\2\5");
}

int Enc_NeedsFolding(const char *text, const EncodingRecord *encoding)
{
    return encoding == &EncodingUtf8 && !IsPlain(text);
}

// Marks are found like the guillemets that they are shown as.
static char32_t FoldCase(uint32_t c)
{
    if (c == ENC_OPEN_MARK || c == ENC_CLOSE_MARK)
        return c == ENC_OPEN_MARK ? ENC_SHOWN_OPEN : ENC_SHOWN_CLOSE;
    if (c < 0x80)
        return Ascii_Lower(static_cast<unsigned char>(c));
    return static_cast<char32_t>(u_foldCase(static_cast<UChar32>(c), U_FOLD_CASE_DEFAULT));
}

std::u32string Enc_FoldUtf8(const char *text)
{
    std::u32string folded;
    while (*text)
        folded += FoldCase(NextCharacter(&text));
    return folded;
}

int Enc_Utf8BeginsWith(const char *text, const std::u32string &folded)
{
    for (char32_t c : folded)
        if (!*text || FoldCase(NextCharacter(&text)) != c)
            return 0;
    return 1;
}

int Enc_Utf8Contains(const char *text, const std::u32string &folded)
{
    bool isPlain = std::all_of(folded.begin(), folded.end(), [](char32_t c) { return c < 0x80; });
    if (!isPlain && IsPlain(text))
        return 0;
    for (; *text; NextCharacter(&text))
        if (Enc_Utf8BeginsWith(text, folded))
            return 1;
    return folded.empty();
}

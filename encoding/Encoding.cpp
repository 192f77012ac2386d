// encoding/Encoding.cpp - selecting a code page and converting with it.
#include "encoding/Encoding.h"

#include <cstring>

#include "app/Log.h"
#include "store/Ascii.h"
#include "store/BibStore.h"

static const wchar_t SHOWN_OPEN = 0xAB;  // of BIB_OPEN_ABBREVIATION
static const wchar_t SHOWN_CLOSE = 0xBB; // of BIB_CLOSE_ABBREVIATION

static const uint32_t CODE_POINTS = 0x10000; // no code page reaches beyond
static const unsigned char NO_BYTE = 255;

static const EncodingRecord *current; // null until the first use
static unsigned char currentBytes[CODE_POINTS];

// Makes the row current. Where two bytes have one meaning, the smaller one is written back.
static void Use(const EncodingRecord *row)
{
    memset(currentBytes, NO_BYTE, sizeof currentBytes);
    for (int byte = 254; byte >= 0; --byte)
        currentBytes[row->map[byte]] = static_cast<unsigned char>(byte);
    current = row;
}

static const EncodingRecord *FindRow(const char *name)
{
    for (const EncodingRecord *row = EncodingTable; row->name; ++row) {
        if (Ascii_Compare(row->name, name) == 0)
            return row;
    }
    return nullptr;
}

void Enc_Select(const char *name)
{
    const EncodingRecord *row = FindRow(name);
    if (!row) {
        AppLog("ERROR: Can't select unknown encoding: ", name);
        return;
    }
    Use(row);
    AppLog("INFO: Selecting Encoding: ", name);
}

const EncodingRecord *Enc_Current()
{
    if (!current)
        Use(FindRow("CP1252"));
    return current;
}

static wchar_t ToCharacter(const uint32_t *map, unsigned char byte)
{
    switch (byte) {
    case BIB_OPEN_ABBREVIATION:
        return SHOWN_OPEN;
    case BIB_CLOSE_ABBREVIATION:
        return SHOWN_CLOSE;
    default:
        return static_cast<wchar_t>(map[byte]);
    }
}

std::wstring &Enc_ToUnicode(std::wstring &out, const char *text)
{
    const uint32_t *map = Enc_Current()->map;
    out.clear();
    out.reserve(strlen(text));
    for (; *text; ++text)
        out += ToCharacter(map, static_cast<unsigned char>(*text));
    return out;
}

static unsigned char ToByte(wchar_t character)
{
    switch (character) {
    case SHOWN_OPEN:
        return BIB_OPEN_ABBREVIATION;
    case SHOWN_CLOSE:
        return BIB_CLOSE_ABBREVIATION;
    }
    uint32_t c = static_cast<uint32_t>(character);
    return c < CODE_POINTS ? currentBytes[c] : NO_BYTE;
}

// One character as UTF-8; what is none becomes U+FFFD. Returns the count of bytes, at most 4.
static size_t PutUtf8(char *out, uint32_t c)
{
    if (c < 0x80) {
        *out = static_cast<char>(c);
        return 1;
    }
    if (c > 0x10FFFF || (c >= 0xD800 && c <= 0xDFFF))
        c = 0xFFFD;
    size_t length = c < 0x800 ? 2 : c < 0x10000 ? 3 : 4;
    for (size_t i = length - 1; i > 0; --i, c >>= 6)
        out[i] = static_cast<char>(0x80 | (c & 0x3F));
    out[0] = static_cast<char>((0xF00 >> length & 0xFF) | c);
    return length;
}

// Only as much of the text as a line of the log has room for.
static void LogInput(const wchar_t *text)
{
    char line[512];
    size_t length = 0;
    for (; *text && length + 4 < sizeof line; ++text)
        length += PutUtf8(line + length, static_cast<uint32_t>(*text));
    line[length] = 0;
    AppLog("strconv in: ", line);
}

char *Enc_FromUnicode(char *buffer, const wchar_t *text)
{
    LogInput(text);
    Enc_Current();
    char *out = buffer;
    for (; *text; ++text)
        *out++ = static_cast<char>(ToByte(*text));
    *out = 0;
    AppLog("strconv out: ", buffer);
    return buffer;
}

int Enc_Holds(wchar_t character)
{
    const uint32_t *map = Enc_Current()->map;
    return ToCharacter(map, ToByte(character)) == character;
}

// encoding/Encoding.h - store text (8-bit, in one code page) to and from Unicode.
//
// One code page is selected for the whole process. The abbreviation marks of the store, bytes 0x02
// and 0x05, are shown as U+00AB and U+00BB, whatever the code page.
#pragma once

#include <cstdint>
#include <string>

struct EncodingRecord {
    const char *name;        // "CP1252": what Enc_Select matches
    const char *displayName; // "ANSI - Latin I"
    const uint32_t *map;     // 256 code points by byte; an undefined byte stands for itself
};

// 51 rows and a last one whose name is null.
extern const EncodingRecord EncodingTable[];

// Selects the row with this name, ignoring case. An unknown name is logged and changes nothing.
void Enc_Select(const char *name);

// The selected row; CP1252 until the first Enc_Select.
const EncodingRecord *Enc_Current();

// Store text to display text. Returns `out`.
std::wstring &Enc_ToUnicode(std::wstring &out, const char *text);

// Display text to store text, into a buffer of at least one byte per character and a NUL. A
// character outside the code page becomes byte 0xFF. Returns `buffer`.
char *Enc_FromUnicode(char *buffer, const wchar_t *text);

// 1 when the store gives a character back as it was put there.
int Enc_Holds(wchar_t character);

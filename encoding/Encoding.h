// encoding/Encoding.h - store text (8-bit) to and from Unicode.
//
// One encoding is selected for the whole process: a code page, in which every text is then, or
// UTF-8. While UTF-8 is selected, a text is in UTF-8 or in CP1252, as it was found to be; that of a
// file's texts is decided for the whole file (Bib_Encoding in store/BibStore.h).
//
// The abbreviation marks of the store, bytes 0x02 and 0x05, are shown as guillemets, whatever the
// encoding.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

enum { ENC_LONGEST = 4 }; // bytes of a character in any encoding

enum { ENC_OPEN_MARK = 2, ENC_CLOSE_MARK = 5 }; // the store's marks of abbreviations

// What the marks are shown as.
const wchar_t ENC_SHOWN_OPEN = 0xAB, ENC_SHOWN_CLOSE = 0xBB;

struct EncodingRecord {
    const char *name;        // "CP1252": what Enc_Select matches
    const char *displayName; // "ANSI - Latin I"
    const uint32_t *map; // 256 code points by byte; an undefined byte stands for itself. Null for
                         // UTF-8
};

// 51 code pages and a last row whose name is null.
extern const EncodingRecord EncodingTable[];

extern const EncodingRecord EncodingUtf8; // "CP65001"; no row of the table

// Selects the code page with this name, or UTF-8, ignoring case. 1, or 0 for an unknown name, which
// is logged and changes nothing.
int Enc_Select(const char *name);

// What is selected; CP1252 until the first Enc_Select.
const EncodingRecord *Enc_Current();

// For people: "CP1252", "UTF-8".
const char *Enc_Label(const EncodingRecord *encoding);

// --- Characters of display text ---
//
// A character beyond U+FFFF takes two wchar_t where these have 16 bits: a pair of surrogates. What
// looks at single characters takes them with the first two functions.

// The character that begins at `*at`, and a step behind it. Not at the end of a text. A surrogate
// without its other half is what it is.
uint32_t Enc_NextWide(const wchar_t **at);

// Puts a character behind the text.
void Enc_AppendWide(std::wstring *text, uint32_t character);

// The character that a pair of surrogates stands for; 0 when the two are none.
uint32_t Enc_JoinSurrogates(uint32_t first, uint32_t second);

// 1 when it can be one: neither a surrogate nor beyond U+10FFFF.
int Enc_IsCharacter(uint32_t character);

// --- In the selected code page; in CP1252 while UTF-8 is selected ---

// Store text to display text. Returns `out`.
std::wstring &Enc_ToUnicode(std::wstring &out, const char *text);

// Display text to store text, into a buffer of at least one byte per wchar_t and a NUL. A
// character outside the code page becomes byte 0xFF. Returns `buffer`.
char *Enc_FromUnicode(char *buffer, const wchar_t *text);

// What Enc_FromUnicode logs; the conversions below log nothing.
void Enc_LogConversion(const wchar_t *in, const char *out);

// --- In any encoding ---

// That of a text: the selected one; while that is UTF-8, it depends on what was found.
const EncodingRecord *Enc_For(int isUtf8);

// The same for a text that belongs to no file, or to several: names of types, the INI file.
const EncodingRecord *Enc_OfText(const char *text);

// Store text to display text. Bytes that are no UTF-8 become U+FFFD there.
std::wstring Enc_Decode(const char *text, const EncodingRecord *encoding);

// Display text to store text. A character that the encoding lacks becomes byte 0xFF in a code page,
// and U+FFFD in UTF-8.
std::string Enc_Encode(const wchar_t *text, const EncodingRecord *encoding);

// The same, into a buffer of ENC_LONGEST bytes per wchar_t and a NUL. Returns `buffer`.
char *Enc_EncodeTo(char *buffer, const wchar_t *text, const EncodingRecord *encoding);

// 1 when the store gives a character back as it was put there.
int Enc_Holds(uint32_t character, const EncodingRecord *encoding);

// Store text in another encoding; see Enc_Encode for what that lacks.
std::string Enc_Recode(const char *text, const EncodingRecord *from, const EncodingRecord *to);

// The same, with 0 when that lacks a character: `recoded` does not come back as it was.
int Enc_TryRecode(const char *text, const EncodingRecord *from, const EncodingRecord *to,
                  std::string *recoded);

// --- UTF-8 ---

// How much of the text is valid: without surrogates. ASCII is.
size_t Enc_Utf8Length(const char *text, size_t length);
int Enc_IsUtf8(const char *text, size_t length); // 1 when all of it is

// A text that is, or may have been, cut to `size` bytes to fit, is cut to them: not in the middle
// of a character.
std::string Enc_CutTo(size_t size, std::string text);

// One character as UTF-8; what is none becomes U+FFFD. Returns the count of bytes.
size_t Enc_PutUtf8(char *out, uint32_t character);

// 0 when a search for the text may compare bytes: in a code page, or when it is ASCII. Then it
// finds ASCII letters only.
int Enc_NeedsFolding(const char *text, const EncodingRecord *encoding);

// The characters of a UTF-8 text for a search: without differences of case, and with guillemets for
// marks.
std::u32string Enc_FoldUtf8(const char *text);

// 1 when the folded UTF-8 text contains the folded characters, or begins with them.
int Enc_Utf8Contains(const char *text, const std::u32string &folded);
int Enc_Utf8BeginsWith(const char *text, const std::u32string &folded);

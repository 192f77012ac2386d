// store/BibStore.cpp - name tables and entries.

#include "store/BibStore.h"

#include <cstdlib>
#include <cstring>
#include <string>

#include <btparse.h>

#include "base/Ascii.h"
#include "base/Log.h"
#include "encoding/Encoding.h"

char *BibTypeTable[BIB_TYPE_LIMIT];
int BibTypeCount = 0;
char *BibFieldTable[BIB_FIELD_LIMIT];
int BibFieldCount = 0;

static_assert(BIB_OPEN_ABBREVIATION == int(ENC_OPEN_MARK) &&
              BIB_CLOSE_ABBREVIATION == int(ENC_CLOSE_MARK));

int BibBackupMode = 2;
const int BibLockFiles = 0;
const int BibStringOptions = 0;

// A name table with a hash over the lower-cased names, since every field of a file is looked up.
struct NameTable {
    char **names;
    int *count;
    int limit;
    const char *fullMessage;            // printf format; may take the name
    int16_t slots[2 * BIB_FIELD_LIMIT]; // index + 1; 0: free; linear probing
};

static NameTable Types = {BibTypeTable, &BibTypeCount, BIB_TYPE_LIMIT, "Type Table full \n", {}};
static NameTable Fields = {
    BibFieldTable, &BibFieldCount, BIB_FIELD_LIMIT, "Field Table full at adding field: `%s'\n", {}};

static const uint32_t SlotCount = 2 * BIB_FIELD_LIMIT;

static uint32_t HashName(const char *name)
{
    uint32_t hash = 2166136261u; // FNV-1a
    for (; *name; ++name)
        hash = (hash ^ Ascii_Lower(static_cast<unsigned char>(*name))) * 16777619u;
    return hash;
}

// The slot of `name`, or the free slot where it belongs.
static int16_t *FindSlot(NameTable *table, const char *name)
{
    uint32_t slot = HashName(name) % SlotCount;
    while (table->slots[slot] && Ascii_Compare(table->names[table->slots[slot] - 1], name) != 0)
        slot = (slot + 1) % SlotCount;
    return &table->slots[slot];
}

static int IndexOf(NameTable *table, const char *name)
{
    int16_t *slot = FindSlot(table, name);
    if (*slot)
        return *slot - 1;
    if (*table->count == table->limit) {
        fprintf(stderr, table->fullMessage, name);
        exit(1);
    }
    int index = (*table->count)++;
    table->names[index] = Bib_CopyText(name, strlen(name));
    *slot = static_cast<int16_t>(index + 1);
    return index;
}

static int HasRoom(NameTable *table, const char *name)
{
    return *table->count < table->limit || *FindSlot(table, name) != 0;
}

void Bib_Initialize()
{
    bt_initialize();
    for (const char *name : {"** UNKNOWN **", "COMMENT", "PREAMBLE", "STRING"})
        IndexOf(&Types, name);
}

int Bib_TypeIndex(const char *name)
{
    return name && *name ? IndexOf(&Types, name) : 0;
}

int Bib_FieldIndex(const char *name)
{
    return IndexOf(&Fields, name);
}

int Bib_HasTypeRoom(const char *name)
{
    return !name || !*name || HasRoom(&Types, name);
}

int Bib_HasFieldRoom(const char *name)
{
    return HasRoom(&Fields, name);
}

int Bib_IsFieldKnown(const char *name)
{
    return *FindSlot(&Fields, name) != 0;
}

void *Bib_Alloc(size_t size)
{
    void *block = malloc(size);
    if (!block)
        fprintf(stderr, "Can't allocate %d bytes\n", static_cast<int>(size));
    return block;
}

char *Bib_CopyText(const char *text, size_t length)
{
    char *copy = static_cast<char *>(Bib_Alloc(length + 1));
    if (!copy)
        return nullptr;
    memcpy(copy, text, length);
    copy[length] = 0;
    return copy;
}

BibEntry *Bib_AllocEntry(int fieldCount)
{
    size_t size = (static_cast<size_t>(fieldCount) + 2) * sizeof(BibField);
    BibEntry *entry = static_cast<BibEntry *>(Bib_Alloc(size));
    if (!entry)
        return nullptr;
    memset(static_cast<void *>(entry), 0, size);
    entry->fieldCount = fieldCount;
    return entry;
}

// The length of the field name in an item of a new entry's field list; 0 when it is not taken.
static size_t TakenName(const char *item, int allFields)
{
    const char *equals = strchr(item, '=');
    if (*item == '*' || !equals)
        return 0;
    return allFields || equals[1] == '*' ? static_cast<size_t>(equals - item) : 0;
}

BibEntry *Bib_NewEntry(BibFile *file, const char *key, const char *typeName, const char *fieldSpecs,
                       int allFields)
{
    AppLog("Adding Entry: ", key);
    int count = 0;
    for (const char *item = fieldSpecs; *item; item += strlen(item) + 1) {
        AppLog("Count: ", item);
        count += TakenName(item, allFields) > 0;
    }
    BibEntry *entry = Bib_AllocEntry(count);
    if (!entry)
        return nullptr;
    BibField *field = entry->fields;
    for (const char *item = fieldSpecs; *item; item += strlen(item) + 1) {
        size_t length = TakenName(item, allFields);
        if (length == 0)
            continue;
        std::string name(item, length);
        AppLog("Adding empty field: ", name.c_str());
        field->name = Bib_FieldIndex(name.c_str());
        field->value = Bib_CopyText("", 0);
        ++field;
    }
    entry->type = Bib_TypeIndex(typeName);
    entry->key = Bib_CopyText(key, strlen(key));
    entry->next = file->entries;
    file->entries = entry;
    return entry;
}

void Bib_FreeEntry(BibEntry *entry)
{
    for (int i = 0; i < entry->fieldCount; ++i)
        free(entry->fields[i].value);
    free(entry->key);
    free(entry);
}

int Bib_FindField(const BibEntry *entry, const char *name)
{
    for (int i = 0; i < entry->fieldCount; ++i)
        if (Ascii_Compare(BibFieldTable[entry->fields[i].name], name) == 0)
            return i;
    return -1;
}

BibEntry **Bib_FindLink(BibFile *file, const BibEntry *entry)
{
    BibEntry **link = &file->entries;
    while (*link && *link != entry)
        link = &(*link)->next;
    return *link ? link : nullptr;
}

// `first` is the text's first letter, `other` the same in the other case.
static int ValueContains(const char *value, const char *text, size_t length, char first, char other)
{
    const char stops[] = {first, other, 0};
    for (const char *at = strpbrk(value, stops); at; at = strpbrk(at + 1, stops))
        if (Ascii_CompareN(at, text, length) == 0)
            return 1;
    return 0;
}

static char OtherCase(char c)
{
    char lower = static_cast<char>(Ascii_Lower(static_cast<unsigned char>(c)));
    if (lower != c)
        return lower;
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}

int Bib_EntryContains(const BibEntry *entry, const char *text)
{
    size_t length = strlen(text);
    if (length == 0)
        return entry->fieldCount > 0;
    for (int i = 0; i < entry->fieldCount; ++i)
        if (ValueContains(entry->fields[i].value, text, length, text[0], OtherCase(text[0])))
            return 1;
    return 0;
}

// --- Files ---

const EncodingRecord *Bib_Encoding(const BibFile *file)
{
    return Enc_For(!(file->form & BIB_FORM_CODE_PAGE));
}

BibOrigin *Bib_Origin(BibFile *file)
{
    if (file->origin)
        return file->origin;
    file->origin = static_cast<BibOrigin *>(Bib_Alloc(sizeof(BibOrigin)));
    if (file->origin)
        *file->origin = {};
    return file->origin;
}

static int IsUtf8(const char *text)
{
    return Enc_IsUtf8(text, strlen(text));
}

static int IsEntryUtf8(const BibEntry *entry)
{
    int isUtf8 = IsUtf8(entry->key) && IsUtf8(BibTypeTable[entry->type]);
    for (int i = 0; isUtf8 && i < entry->fieldCount; ++i)
        isUtf8 = IsUtf8(BibFieldTable[entry->fields[i].name]) && IsUtf8(entry->fields[i].value);
    return isUtf8;
}

void Bib_UpdateForm(BibFile *file)
{
    int isUtf8 = IsUtf8(file->preamble);
    for (const BibString *string = file->strings; isUtf8 && string; string = string->next)
        isUtf8 = IsUtf8(string->name) && IsUtf8(string->value);
    for (const BibEntry *entry = file->entries; isUtf8 && entry; entry = entry->next)
        isUtf8 = IsEntryUtf8(entry);
    if (!isUtf8)
        file->form |= BIB_FORM_CODE_PAGE;
}

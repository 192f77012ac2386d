#include "ui/FieldKeys.h"

#include <algorithm>
#include <cstring>
#include <cwchar>
#include <vector>

#include "app/Ids.h"
#include "encoding/Encoding.h"

const char FieldKey_BadCharsText[] = "Specified field key includes wrong characters.\n"
                                     "We will remove them from key and continue.";
const char FieldKey_UnwritableText[] = "A field of this name can't be written to a BIB file.\n"
                                       "It must begin with a letter, and go on with letters, "
                                       "digits and a few signs like - and _.";
const char FieldKey_TakenText[] = "Field with specified key is already exists.";

std::string FieldKey_Typed(const wchar_t *typed)
{
    std::vector<char> narrow(wcslen(typed) + 1);
    std::string key = Enc_FromUnicode(narrow.data(), typed);
    key.erase(std::remove_if(key.begin(), key.end(), [](unsigned char c) { return c <= 32; }),
              key.end());
    return key;
}

FieldKeyVerdict FieldKey_CheckNew(const char *key)
{
    if (!*key)
        return FIELD_KEY_EMPTY;
    if (strpbrk(key, "\"#%'(),={} "))
        return FIELD_KEY_BAD_CHARS;
    return Bib_IsName(key) ? FIELD_KEY_OK : FIELD_KEY_UNWRITABLE;
}

FieldKeyVerdict FieldKey_CheckNewName(const FieldGrid *grid, const char *name)
{
    FieldKeyVerdict verdict = FieldKey_CheckNew(name);
    if (verdict == FIELD_KEY_OK && !Grid_MayRename(grid, name))
        return FIELD_KEY_TAKEN;
    return verdict;
}

int FieldKey_RowToRemove(int id, int focusedRow, int storedFields)
{
    if (id >= ID_REMOVE_ROW && id < ID_REMOVE_ROW_END)
        return id - ID_REMOVE_ROW;
    if (id != ID_REMOVE_FIELD)
        return -1;
    return focusedRow >= 0 ? focusedRow : storedFields;
}

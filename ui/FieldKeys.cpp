#include "ui/FieldKeys.h"

const char FieldKey_BadCharsText[] = "Specified field key includes wrong characters.\n"
                                     "We will remove them from key and continue.";
const char FieldKey_UnwritableText[] = "A field of this name can't be written to a BIB file.\n"
                                       "It must not begin with a digit, and hold no backslash "
                                       "or control character.";
const char FieldKey_TakenText[] = "Field with specified key is already exists.";

FieldKeyVerdict FieldKey_CheckNew(const TypedKey &key)
{
    if (key.text.empty())
        return FIELD_KEY_EMPTY;
    if (!key.fits)
        return FIELD_KEY_MISFIT;
    if (Bib_HasBadKeyChars(key.text.c_str()))
        return FIELD_KEY_BAD_CHARS;
    return Bib_IsName(key.text.c_str()) ? FIELD_KEY_OK : FIELD_KEY_UNWRITABLE;
}

FieldKeyVerdict FieldKey_CheckNewName(const FieldGrid *grid, const TypedKey &name)
{
    FieldKeyVerdict form = FieldKey_CheckNew(name);
    if (form != FIELD_KEY_OK)
        return form;
    return Grid_MayRename(grid, name.text.c_str()) ? FIELD_KEY_OK : FIELD_KEY_TAKEN;
}

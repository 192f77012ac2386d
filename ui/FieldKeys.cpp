#include "ui/FieldKeys.h"

const char FieldKey_BadCharsText[] = "Specified field key includes wrong characters.\n"
                                     "We will remove them from key and continue.";
const char FieldKey_UnwritableText[] = "A field of this name can't be written to a BIB file.\n"
                                       "It must not begin with a digit, and hold no backslash "
                                       "or control character.";
const char FieldKey_TakenText[] = "Field with specified key is already exists.";

NameVerdict FieldKey_CheckNewName(const FieldGrid *grid, const TypedName &name)
{
    NameVerdict form = Name_Check(name);
    if (form != NAME_OK)
        return form;
    return Grid_MayRename(grid, name.text.c_str()) ? NAME_OK : NAME_TAKEN;
}

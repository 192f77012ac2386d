// session/EntryRules.cpp - what may be added, renamed and removed.
#include "session/EntryRules.h"

#include <algorithm>
#include <cstring>

#include "base/Ascii.h"
#include "base/Log.h"
#include "encoding/Encoding.h"
#include "session/FieldCheck.h"

// --- Fields ---

static int FindCrossref(const BibEntry *entry)
{
    return Bib_FindField(entry, "crossref");
}

// --- Where a new entry may go ---

static bool Lists(const BibFileSet *set, const std::vector<int> &files, const BibFile *file)
{
    return std::any_of(files.begin(), files.end(), [&](int i) { return set->files[i] == file; });
}

std::vector<int> Entry_WritableFiles(const BibFileSet *set)
{
    std::vector<int> files;
    for (int i = 0; i < set->count; ++i)
        if (!set->files[i]->readOnly && !Lists(set, files, set->files[i]))
            files.push_back(i);
    return files;
}

std::string Entry_FileLabel(const BibFileSet *set, const std::vector<int> &files, int file)
{
    std::string name = set->files[file]->baseName;
    auto isNamesake = [&](int other) {
        return other != file && Ascii_Compare(set->files[other]->baseName, name.c_str()) == 0;
    };
    if (!name.empty() && std::none_of(files.begin(), files.end(), isNamesake))
        return name;
    return name + " (" + set->files[file]->path + ")";
}

bool Entry_MayBeParent(const BibFile *file, const BibEntry *entry)
{
    return file && entry && !file->readOnly && FindCrossref(entry) < 0;
}

// --- Keys ---

static int HasKey(const BibFile *file, const char *key)
{
    for (const BibEntry *entry = file->entries; entry; entry = entry->next)
        if (Ascii_Compare(entry->key, key) == 0)
            return 1;
    return 0;
}

static KeyVerdict CheckForm(const TypedName &key)
{
    if (key.text.empty())
        return KEY_EMPTY;
    if (!key.fits)
        return KEY_MISFIT;
    if (Bib_HasBadKeyChars(key.text.c_str()))
        return KEY_BAD_CHARS;
    return Bib_IsKey(key.text.c_str()) ? KEY_OK : KEY_UNWRITABLE;
}

// `key` is text of `file`.
static bool HasKeyOf(const BibFile *other, const char *key, const BibFile *file)
{
    const EncodingRecord *from = Bib_Encoding(file), *to = Bib_Encoding(other);
    std::string recoded;
    return Enc_TryRecode(key, from, to, &recoded) && HasKey(other, recoded.c_str());
}

static KeyVerdict CheckFree(const BibFileSet *set, const BibFile *file, const char *key)
{
    if (HasKey(file, key))
        return KEY_TAKEN;
    for (int i = 0; i < set->count; ++i)
        if (set->files[i] != file && HasKeyOf(set->files[i], key, file))
            return KEY_TAKEN_ELSEWHERE;
    return KEY_OK;
}

KeyVerdict Entry_CheckNewKey(const BibFileSet *set, const BibFile *target, const TypedName &key)
{
    KeyVerdict form = CheckForm(key);
    if (form != KEY_OK)
        return form;
    return target ? CheckFree(set, target, key.text.c_str()) : KEY_NO_FILE;
}

// An old key that could not be written may stay: that changes nothing.
KeyVerdict Entry_CheckRename(const BibFileSet *set, const BibFile *file, const BibEntry *entry,
                             const TypedName &key)
{
    KeyVerdict form = CheckForm(key);
    if (form != KEY_OK && form != KEY_UNWRITABLE)
        return form;
    if (key.text == entry->key)
        return KEY_SAME;
    return form == KEY_OK ? CheckFree(set, file, key.text.c_str()) : form;
}

// --- Types ---

// A name that files share, as text of one file. False when its encoding lacks a letter.
static bool Recode(const BibFile *file, const char *name, std::string *recoded)
{
    const EncodingRecord *from = Enc_OfText(name), *to = Bib_Encoding(file);
    return Enc_TryRecode(name, from, to, recoded) != 0;
}

static std::vector<std::string> MandatoryFields(const char *specs)
{
    std::vector<std::string> names;
    for (const char *item = specs; *item; item += strlen(item) + 1) {
        const char *equals = strchr(item, '=');
        if (*item != '*' && equals && equals != item && equals[1] == '*')
            names.emplace_back(item, equals);
    }
    return names;
}

std::string Entry_CheckType(const char *typeName, const char *specs)
{
    if (!*typeName)
        return "There is no type for the entry: the list of entry types can't be found.";
    if (!Bib_IsName(typeName) || !Bib_HasTypeRoom(typeName))
        return std::string("An entry of the type `") + typeName +
               "' can't be written to a BIB file.";
    int newNames = 0;
    for (const std::string &name : MandatoryFields(specs)) {
        FieldFacts field = {};
        field.name = name;
        field.isNew = true;
        if (FieldCheck_Refusal(field))
            return std::string("The type `") + typeName + "' asks for the field `" + name +
                   "', which can't be written to a BIB file.";
        newNames += !Bib_IsFieldKnown(name.c_str());
    }
    if (newNames > BIB_FIELD_LIMIT - BibFieldCount)
        return "There are too many different names of fields in all open files.\n\n"
               "Close some of the files, or choose another type.";
    return "";
}

EntryType Entry_TypeFor(const BibFile *file, const char *typeName, const char *specs)
{
    EntryType type;
    bool fits = Recode(file, typeName, &type.name);
    for (const char *item = specs; *item; item += strlen(item) + 1) {
        std::string recoded;
        fits = Recode(file, item, &recoded) && fits;
        type.specs += recoded + '\0';
    }
    type.specs += '\0';
    type.reason = Entry_CheckType(type.name.c_str(), type.specs.c_str());
    if (!fits)
        type.reason = std::string("The type or one of its fields has letters that can't be stored "
                                  "in ") +
                      Enc_Label(Bib_Encoding(file)) + ".";
    return type;
}

int Entry_TypeIn(const BibFile *file, int type, std::string *reason)
{
    EntryType there = Entry_TypeFor(file, BibTypeTable[type], "");
    *reason = there.reason;
    return reason->empty() ? Bib_TypeIndex(there.name.c_str()) : -1;
}

// --- New entries ---

const char Entry_ChildSpecs[] = "crossref=*\0";

// --- References ---

int Entry_FindReference(const BibEntry *entry, const char *key)
{
    int crossref = FindCrossref(entry);
    if (crossref < 0)
        return -1;
    const char *value = entry->fields[crossref].value;
    AppLog("crossref= ", value);
    return Ascii_Compare(value, key) == 0 ? crossref : -1;
}

std::string Entry_Referrers(const BibFile *file, const BibEntry *entry)
{
    std::string keys;
    for (const BibEntry *other = file->entries; other && other != entry; other = other->next)
        if (Entry_FindReference(other, entry->key) >= 0)
            keys += std::string(keys.empty() ? "`" : ", `") + other->key + "'";
    return keys;
}

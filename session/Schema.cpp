// session/Schema.cpp - the INI file that describes the entry types and their fields.
#include "session/Schema.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "base/Ascii.h"
#include "base/Log.h"
#include "base/Profile.h"
#include "base/Sys.h"
#include "encoding/Encoding.h"
#include "store/BibStore.h"

// Of buffers, in bytes with the end: what does not fit is not read.
enum { SECTION_NAMES_SIZE = 2046, VALUE_SIZE = 64, NAME_SIZE = 256, HELP_SIZE = 1024 };

// The length of the path up to the separator of its last name, with it.
static size_t FolderLength(const std::string &path)
{
    return path.find_last_of("/\\") + 1; // npos + 1 is 0
}

std::string Schema_IniPath(const char *modulePath)
{
    std::string path = modulePath;
    size_t dot = path.rfind('.');
    if (dot != std::string::npos && dot > FolderLength(path))
        path.erase(dot);
    return path + ".ini";
}

static std::string UserIni()
{
    char *folder = Sys_ConfigFolder();
    std::string path = folder ? std::string(folder) + "/Cartulo/cartulo.ini" : "";
    free(folder);
    return path;
}

std::string Schema_FindIni()
{
    std::string module = Sys_ModulePath();
    std::string beside = Schema_IniPath(module.c_str());
    std::string installed = module.substr(0, FolderLength(module)) + "../share/cartulo/cartulo.ini";
    for (const std::string &path : {UserIni(), beside, installed})
        if (Sys_FileExists(path.c_str()))
            return path;
    return beside;
}

std::string Schema_ApplicationName(const char *ini)
{
    char name[NAME_SIZE];
    Profile_GetString("Preamble", "AppName", "Cartulo", name, sizeof name, ini);
    return name;
}

int Schema_SelectEncoding(const char *ini, BibFileSet *set)
{
    char name[NAME_SIZE];
    Profile_GetString("Preamble", "Encoding", "", name, sizeof name, ini);
    if (!*name)
        return 1;
    if (Enc_Select(name))
        return 1;
    FileSet_AppendError(set,
                        "ERROR: The file '%s' names the encoding '%s', which is not known (UTF-8 "
                        "is called CP65001); %s stays selected\n",
                        ini, name, Enc_Label(Enc_Current()));
    return 0;
}

void Schema_RegisterTypes(const char *ini)
{
    char names[SECTION_NAMES_SIZE];
    Profile_GetSectionNames(names, sizeof names, ini);
    for (const char *name = names; *name; name += strlen(name) + 1) {
        if (*name == '*')
            continue;
        if (Bib_HasTypeRoom(name))
            Bib_TypeIndex(name);
        else
            AppLog("ERROR: No room for the entry type: ", name);
    }
}

// --- Fields ---

static FieldClass ClassOf(const char *key, const char *value)
{
    if (Ascii_Compare(key, "crossref") == 0)
        return FIELD_CROSSREF;
    switch (*value) {
    case '!':
        return FIELD_CROSSREF;
    case '#':
        return FIELD_UNKNOWN;
    case '*':
        return FIELD_MANDATORY;
    default:
        return FIELD_OPTIONAL;
    }
}

std::vector<FieldClass> Schema_FieldClasses(const char *ini, const char *type,
                                            const std::vector<const char *> &keys)
{
    std::vector<char> values(keys.size() * VALUE_SIZE);
    Profile_GetStrings(type, keys.data(), static_cast<int>(keys.size()), "#", values.data(),
                       VALUE_SIZE, ini);
    std::vector<FieldClass> classes;
    for (size_t i = 0; i < keys.size(); ++i)
        classes.push_back(ClassOf(keys[i], &values[i * VALUE_SIZE]));
    return classes;
}

std::string Schema_Description(const char *ini, const char *type)
{
    char description[HELP_SIZE];
    Profile_GetString(type, "*", "Custom Entry Type", description, sizeof description, ini);
    return Enc_CutTo(HELP_SIZE - 1, description);
}

void Schema_FieldSpecs(const char *ini, const char *type, char *buffer, size_t size)
{
    Profile_GetSection(type, buffer, std::min<size_t>(size, SCHEMA_SECTION_SIZE), ini);
}

// --- Advice ---

namespace
{

// A field of a type.
struct FieldSpec {
    std::string key;
    bool mandatory;
    std::string alternative; // the field that does instead; "" for none
};

} // namespace

// False for a line that names no field.
static bool ParseSpec(const char *line, FieldSpec *spec)
{
    const char *equals = strchr(line, '=');
    if (*line == '*' || !equals || equals == line)
        return false;
    spec->key.assign(line, equals);
    spec->mandatory = equals[1] == '*';
    spec->alternative = spec->mandatory ? equals + 2 : "";
    return true;
}

static const SchemaRow *FindRow(const std::vector<SchemaRow> &rows, const std::string &key)
{
    for (const SchemaRow &row : rows)
        if (Ascii_Compare(row.key.c_str(), key.c_str()) == 0)
            return &row;
    return nullptr;
}

static std::string Quote(const std::string &key)
{
    return "`" + key + "'";
}

// Two fields of which one is enough count once when their lines follow each other.
static void AddMissing(std::vector<std::string> *missing, const FieldSpec &spec)
{
    bool pair = !missing->empty() && !spec.alternative.empty() &&
                Ascii_Compare(missing->back().c_str(), Quote(spec.alternative).c_str()) == 0;
    if (pair)
        missing->back() += "/" + Quote(spec.key);
    else
        missing->push_back(Quote(spec.key));
}

static void AdviseField(SchemaAdvice *advice, std::vector<std::string> *missing,
                        const FieldSpec &spec, const std::vector<SchemaRow> &rows)
{
    const SchemaRow *row = FindRow(rows, spec.key);
    if (row && !row->inherited)
        return;
    advice->proposals.push_back(spec.key);
    if (row || !spec.mandatory)
        return;
    if (!spec.alternative.empty() && FindRow(rows, spec.alternative))
        return;
    if (missing->empty())
        advice->selected = static_cast<int>(advice->proposals.size()) - 1;
    AddMissing(missing, spec);
}

static std::string Note(const std::vector<std::string> &missing)
{
    if (missing.empty())
        return "";
    if (missing.size() == 1)
        return "There is missed mandatory field: " + missing[0] + ".";     // stands so
    std::string note = "There are missed mandatory fields: " + missing[0]; // stands so
    if (missing.size() == 2)
        return note + " and " + missing[1] + ".";
    for (size_t i = 1; i + 1 < missing.size(); ++i)
        note += ", " + missing[i];
    return note + ", and " + missing.back() + ".";
}

SchemaAdvice Schema_Advise(const char *ini, const char *type, const std::vector<SchemaRow> &rows)
{
    char specs[SCHEMA_SECTION_SIZE];
    Schema_FieldSpecs(ini, type, specs, sizeof specs);
    SchemaAdvice advice = {{}, -1, ""};
    std::vector<std::string> missing;
    FieldSpec spec;
    for (const char *line = specs; *line; line += strlen(line) + 1)
        if (ParseSpec(line, &spec))
            AdviseField(&advice, &missing, spec, rows);
    advice.note = Note(missing);
    return advice;
}

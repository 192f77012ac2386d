// session/Schema.h - the INI file that describes the entry types and their fields.
//
// The program's own name and one section for each entry type; sections whose names begin with '*'
// hold other things. Read afresh at each use: what the user changes in it counts at once.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "session/FileSet.h"

// "/usr/bin/cartulo" gives "/usr/bin/cartulo.ini": the ending of the file name is replaced.
std::string Schema_IniPath(const char *modulePath);

// The INI file that holds: the user's own in the configuration folder, else the one beside the
// executable, else the one installed with it. The second when there is none of them.
std::string Schema_FindIni();

std::string Schema_ApplicationName(const char *ini); // "Cartulo" unless the file has another

// Selects the encoding that the file names, if it names one. Returns 0, with a line in the set's
// load errors, for one that is not known.
int Schema_SelectEncoding(const char *ini, BibFileSet *set);

// Makes the entry types of the file known to the store. A type for which the store has no room is
// left out, and logged.
void Schema_RegisterTypes(const char *ini);

// --- Fields ---

enum FieldClass {
    FIELD_CROSSREF, // `crossref` itself, and fields that the file marks like it
    FIELD_UNKNOWN,  // not in the type's section
    FIELD_MANDATORY,
    FIELD_OPTIONAL
};

// One for each key, in their order, with one look at the file.
std::vector<FieldClass> Schema_FieldClasses(const char *ini, const char *type,
                                            const std::vector<const char *> &keys);

// "Custom Entry Type" for a type without a section or description.
std::string Schema_Description(const char *ini, const char *type);

enum { SCHEMA_SECTION_SIZE = 2048 }; // bytes; what does not fit is not read

// The lines of a type's section as Bib_NewEntry wants them; the last ends with two 0.
void Schema_FieldSpecs(const char *ini, const char *type, char *buffer, size_t size);

// A shown row, as far as the schema is concerned.
struct SchemaRow {
    std::string key;
    bool inherited;
};

struct SchemaAdvice {
    std::vector<std::string> proposals; // keys for "Add Field:", in the file's order
    int selected;                       // index of the first missing one; -1 for none
    std::string note;                   // "There is missed mandatory field: ...", or ""
};
SchemaAdvice Schema_Advise(const char *ini, const char *type, const std::vector<SchemaRow> &rows);

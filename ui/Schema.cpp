#include "ui/Schema.h"

#include <cstdlib>
#include <cstring>

#include "app/Log.h"
#include "store/BibStore.h"
#include "store/Profile.h"
#include "store/Sys.h"

enum { SECTION_NAMES_SIZE = 2046, NAME_SIZE = 256 };

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

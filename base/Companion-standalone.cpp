// base/Companion-standalone.cpp - the TeX environment's services for a program that runs on its
// own: its files are looked for where TeX and the system keep them, its settings come from an INI
// file, and its windows are named by notes that end with their process.
#include "base/Companion.h"

#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "base/Paths.h"
#include "base/Profile.h"
#include "base/Sys.h"

using Folders = std::vector<std::string>;

static const int TEX_MILLISECONDS = 3000;
static const size_t LONGEST_VALUE = 4096;
static const char *const PictureEndings[] = {".svg", ".png", ".xpm", ".bmp", ".gif"};

// The text of a malloc'd string, which is freed; "" for null.
static std::string TakeText(char *text)
{
    std::string copy = text ? text : "";
    free(text);
    return copy;
}

// The parts between the colons, empty ones too; none for null.
static Folders SplitList(const char *list)
{
    Folders parts;
    while (list) {
        const char *colon = strchr(list, ':');
        parts.push_back(colon ? std::string(list, colon) : list);
        list = colon ? colon + 1 : nullptr;
    }
    return parts;
}

// What is found in a relative folder would depend on where the program was started.
static void AppendAbsolute(Folders *folders, const char *list)
{
    for (const std::string &folder : SplitList(list))
        if (folder[0] == '/')
            folders->push_back(folder);
}

static void AppendSetting(Folders *folders, const char *category)
{
    char *list = TNSValue("Search", category);
    AppendAbsolute(folders, list);
    free(list);
}

static std::string UserFolder()
{
    return TakeText(Sys_DataFolder()) + "/cartulo";
}

static std::string ProgramFolder()
{
    return Path_Parent(Sys_ModulePath());
}

static const char HelperFolder[] = "/libexec/cartulo";

// Where the program is installed, as an editor in "bin" or as a helper of it.
static std::string PrefixFolder()
{
    std::string folder = ProgramFolder();
    size_t length = strlen(HelperFolder);
    if (folder.size() >= length &&
        folder.compare(folder.size() - length, length, HelperFolder) == 0)
        return folder.substr(0, folder.size() - length);
    return Path_Parent(folder);
}

// --- BIB files ---

static char *FullPath(const std::string &path)
{
    char folder[4096];
    if (path[0] == '/')
        return strdup(path.c_str());
    if (!Sys_CurrentFolder(folder, sizeof folder))
        return nullptr;
    size_t start = path.compare(0, 2, "./") == 0 ? 2 : 0;
    return strdup((std::string(folder) + "/" + path.substr(start)).c_str());
}

// 1 when TeX is installed and has answered, if only that there is no such file.
static int AskTeX(const char *name, std::string *path)
{
    const char *const argv[] = {"kpsewhich", "-format=bib", "--", name, nullptr};
    int status;
    char *output = Sys_RunForOutput(argv, TEX_MILLISECONDS, &status);
    if (!output)
        return 0;
    std::string line(output, strcspn(output, "\r\n"));
    free(output);
    if (status != 0)
        return status == 1; // others are those of a broken installation
    *path = line;
    return Sys_FileExists(line.c_str());
}

// One part of BIBINPUTS: "" is the current folder, and "//" at the end adds the folders below.
static char *FindInPart(std::string folder, const std::string &name)
{
    int deep = folder.size() >= 2 && folder.compare(folder.size() - 2, 2, "//") == 0;
    while (folder.size() > 1 && folder.back() == '/')
        folder.pop_back();
    if (folder.empty())
        folder = ".";
    char *path = Sys_FindFile(folder.c_str(), name.c_str(), deep);
    if (!path && !Path_HasBibEnding(name))
        path = Sys_FindFile(folder.c_str(), (name + ".bib").c_str(), deep);
    return path;
}

static char *FindBib(const char *name)
{
    std::string path;
    if (AskTeX(name, &path))
        return path.empty() ? nullptr : FullPath(path);
    for (const std::string &part : SplitList(getenv("BIBINPUTS"))) {
        path = TakeText(FindInPart(part, name));
        if (!path.empty())
            return FullPath(path);
    }
    return nullptr;
}

// --- Pictures and programs ---

// The last folder is that of a program which is run from where it was built.
static Folders ResourceFolders()
{
    return {UserFolder(), PrefixFolder() + "/share/cartulo", CARTULO_RESOURCES};
}

static char *FindPicture(const Folders &folders, const std::string &name)
{
    for (const std::string &folder : folders)
        for (const char *ending : PictureEndings) {
            char *path = Sys_FindFile(folder.c_str(), (name + ending).c_str(), 0);
            if (path)
                return path;
        }
    return nullptr;
}

static char *FindIcon(const char *name)
{
    Folders folders;
    AppendSetting(&folders, "Icon");
    for (const std::string &folder : ResourceFolders())
        folders.push_back(folder + "/icons");
    return FindPicture(folders, name);
}

static char *FindLogo(const char *name)
{
    Folders folders;
    AppendSetting(&folders, "Logo");
    for (const std::string &folder : ResourceFolders())
        folders.push_back(folder);
    return FindPicture(folders, name);
}

static char *FindProgram(const char *name)
{
    Folders folders;
    AppendSetting(&folders, "Program");
    folders.push_back(UserFolder() + "/bin");
    folders.push_back(ProgramFolder());
    folders.push_back(PrefixFolder() + HelperFolder);
    AppendAbsolute(&folders, getenv("PATH"));
    for (const std::string &folder : folders) {
        std::string path = folder + "/" + name;
        if (Sys_IsProgram(path.c_str()))
            return strdup(path.c_str());
    }
    return nullptr;
}

char *TNSearch(const char *category, const char *name)
{
    static const struct {
        const char *category;
        char *(*find)(const char *name);
    } finders[] = {
        {"bib", FindBib}, {"Icon", FindIcon}, {"Logo", FindLogo}, {"Program", FindProgram}};

    if (*name == 0 || strchr(name, '/'))
        return nullptr;
    for (const auto &finder : finders)
        if (strcmp(finder.category, category) == 0)
            return finder.find(name);
    return nullptr;
}

// --- Settings ---

char *TNSValue(const char *section, const char *key)
{
    static const char none[] = "\n"; // no value holds a line break
    char value[LONGEST_VALUE];
    std::string path = TakeText(Sys_ConfigFolder()) + "/Cartulo/environment.ini";
    Profile_GetString(section, key, none, value, sizeof value, path.c_str());
    return strcmp(value, none) == 0 ? nullptr : strdup(value);
}

const char *TNSFind(const char *)
{
    return nullptr;
}

// --- Windows ---

static char *FramePath(const char *instance, SysReason *why)
{
    return Sys_PrivatePath(instance, ".frame", why);
}

void RegisterFrame(const char *instance, long window)
{
    SysReason why = {};
    char *path = FramePath(instance, &why);
    if (!path || !Sys_PostNote(path, std::to_string(window).c_str(), &why))
        TNSMessage("WARNING: RegisterFrame ", why.text, TNS_WARNING);
    free(path);
}

long FindFrame(const char *instance)
{
    char *path = FramePath(instance, nullptr);
    std::string text = TakeText(path ? Sys_ReadNote(path) : nullptr);
    free(path);
    char *end;
    long window = strtol(text.c_str(), &end, 10);
    return *end == 0 ? window : 0;
}

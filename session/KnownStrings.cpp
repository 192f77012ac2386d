// session/KnownStrings.cpp - the abbreviations that are known.
#include "session/KnownStrings.h"

#include <cstring>
#include <set>

#include "base/Ascii.h"
#include "base/Profile.h"
#include "encoding/Encoding.h"

// Of buffers, in bytes with the end: what does not fit is not read.
enum { NAMES_SIZE = 1024, SECTION_NAME_SIZE = 64, LIST_SIZE = 4096 };

// --- Sources ---

static std::vector<std::string> ReadSection(const char *section, size_t size, const char *ini)
{
    std::vector<char> buffer(size);
    Profile_GetSection(section, buffer.data(), size, ini);
    std::vector<std::string> lines;
    for (const char *line = buffer.data(); *line; line += strlen(line) + 1)
        lines.push_back(line);
    return lines;
}

StringSources Strings_Sources(const BibFileSet *set, const std::string &ini)
{
    StringSources sources = {set, ini, {}};
    for (const std::string &line : ReadSection("String", NAMES_SIZE, ini.c_str())) {
        size_t equals = line.find('=');
        if (equals != line.npos)
            sources.lists.push_back(line.substr(0, equals));
    }
    return sources;
}

int Strings_FirstFile(const StringSources *sources)
{
    return static_cast<int>(sources->lists.size()) + 1;
}

// --- Lines ---

static std::string Line(const std::string &key, const std::string &value)
{
    return key + " = " + value;
}

static std::vector<StringLine> ListLines(const std::string &list, const char *ini)
{
    char section[SECTION_NAME_SIZE];
    Profile_GetString("String", list.c_str(), "", section, sizeof section, ini);
    std::vector<StringLine> lines;
    for (const std::string &line : ReadSection(section, LIST_SIZE, ini)) {
        size_t equals = line.find('=');
        bool isPair = equals != line.npos;
        lines.push_back({isPair ? Line(line.substr(0, equals), line.substr(equals + 1)) : line,
                         Enc_OfText(line.c_str())});
    }
    return lines;
}

static void AppendLines(std::vector<StringLine> *lines, const BibFile *file)
{
    for (const BibString *string = file->strings; string; string = string->next)
        lines->push_back({Line(string->name, string->value), Bib_Encoding(file)});
}

std::vector<StringLine> Strings_Lines(const StringSources *sources, int source)
{
    if (source < STRINGS_OF_ALL_FILES)
        return ListLines(sources->lists[source + Strings_FirstFile(sources)], sources->ini.c_str());
    std::vector<StringLine> lines;
    for (int i = 0; i < sources->set->count; ++i)
        if (source == i || source == STRINGS_OF_ALL_FILES)
            AppendLines(&lines, sources->set->files[i]);
    return lines;
}

bool StringLine::operator==(const StringLine &other) const
{
    return text == other.text && encoding == other.encoding;
}

std::string Strings_KeyOf(const StringLine &line)
{
    return line.text.substr(0, line.text.find(' '));
}

// --- Names in texts ---

using Names = std::set<std::wstring>;

static std::wstring Lower(std::wstring name)
{
    for (wchar_t &c : name)
        if (c < 128)
            c = Ascii_Lower(static_cast<unsigned char>(c));
    return name;
}

static bool IsName(const std::wstring &name)
{
    return Bib_IsName(Enc_Encode(name.c_str(), &EncodingUtf8).c_str()) != 0;
}

// With the guillemets around each. What can't be a name is refused anyway.
static std::vector<std::wstring> NamesIn(const std::wstring &text)
{
    std::vector<std::wstring> names;
    size_t open = text.npos; // of the last one that may begin a name
    for (size_t at = 0; at < text.size(); ++at) {
        if (text[at] == ENC_SHOWN_OPEN)
            open = at;
        if (text[at] != ENC_SHOWN_CLOSE)
            continue;
        if (open != text.npos && IsName(text.substr(open + 1, at - open - 1)))
            names.push_back(text.substr(open, at + 1 - open));
        open = text.npos;
    }
    return names;
}

static Names KnownNames(const StringSources *sources)
{
    Names known;
    for (const wchar_t *month : {L"jan", L"feb", L"mar", L"apr", L"may", L"jun", L"jul", L"aug",
                                 L"sep", L"oct", L"nov", L"dec"})
        known.insert(month);
    for (int source = -Strings_FirstFile(sources); source <= STRINGS_OF_ALL_FILES; ++source)
        for (const StringLine &line : Strings_Lines(sources, source))
            known.insert(Lower(Enc_Decode(Strings_KeyOf(line).c_str(), line.encoding)));
    return known;
}

static std::vector<std::wstring> UnknownNames(const StringSources *sources,
                                              const std::wstring &text, const std::wstring &before)
{
    Names known;
    std::vector<std::wstring> unknown;
    for (const std::wstring &name : NamesIn(text)) {
        if (before.find(name) != before.npos)
            continue;
        if (known.empty())
            known = KnownNames(sources);
        if (known.insert(Lower(name.substr(1, name.size() - 2))).second)
            unknown.push_back(name);
    }
    return unknown;
}

// The first ones, and no more of each than fits in a box.
static std::wstring ListNames(const std::vector<std::wstring> &names)
{
    const size_t most = 5, longest = 40;
    std::wstring list;
    for (size_t i = 0; i < names.size() && i < most; ++i)
        list += (i > 0 ? L", " : L"") +
                (names[i].size() > longest ? names[i].substr(0, longest) + L"..." : names[i]);
    return names.size() > most ? list + L", ..." : list;
}

std::wstring Strings_UnknownIn(const StringSources *sources, const std::wstring &name,
                               const std::wstring &text, const std::wstring &before)
{
    std::vector<std::wstring> unknown = UnknownNames(sources, text, before);
    if (unknown.empty())
        return L"";
    return L"`" + name + L"': no abbreviation " + ListNames(unknown) +
           L" is known. As text, quotation marks are typed in another way, like << and >>.\n";
}

// --- One file's abbreviations ---

static bool GoesBy(const BibString *string, const char *key)
{
    return Ascii_Compare(string->name, key) == 0;
}

BibString *String_Find(const BibFile *file, int row, const char *key)
{
    BibString *first = nullptr;
    for (BibString *string = file->strings; string; string = string->next, --row) {
        if (!GoesBy(string, key))
            continue;
        if (row == 0)
            return string;
        if (!first)
            first = string;
    }
    return first;
}

NameVerdict String_CheckNewKey(const BibFile *file, const TypedName &key)
{
    NameVerdict form = Name_Check(key);
    if (form != NAME_OK)
        return form;
    return String_Find(file, 0, key.text.c_str()) ? NAME_TAKEN : NAME_OK;
}

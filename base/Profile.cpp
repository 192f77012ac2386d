// base/Profile.cpp - reading INI files.
//
// By hand: the libraries for INI files join sections of one name, let the last line of a key hold,
// or take '#' for a comment too.

#include "base/Profile.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <string_view>

#include "base/Ascii.h"
#include "base/Sys.h"

using Text = std::string_view;

static const size_t LARGEST_FILE = 1 << 20;

namespace
{

// A buffer that is filled with texts, each ended by a 0.
struct TextList {
    char *buffer;
    size_t size;
    size_t used;
    int cut; // a text did not fit
};

} // namespace

static int ReadFile(const char *path, std::string *text)
{
    FILE *stream = Sys_OpenRegular(path);
    if (!stream)
        return 0;
    char block[16 * 1024];
    size_t got;
    while (text->size() <= LARGEST_FILE && (got = fread(block, 1, sizeof block, stream)) > 0)
        text->append(block, got);
    int ok = !ferror(stream) && text->size() <= LARGEST_FILE;
    fclose(stream);
    return ok;
}

static std::string ReadProfile(const char *path)
{
    std::string text;
    if (!ReadFile(path, &text))
        return std::string();
    if (text.compare(0, 3, "\xEF\xBB\xBF") == 0)
        text.erase(0, 3);
    std::replace(text.begin(), text.end(), '\0', ' '); // it would end a text in the buffer
    return text;
}

static int IsBlank(char c)
{
    return static_cast<unsigned char>(c) <= ' ';
}

static Text Trim(Text text)
{
    while (!text.empty() && IsBlank(text.front()))
        text.remove_prefix(1);
    while (!text.empty() && IsBlank(text.back()))
        text.remove_suffix(1);
    return text;
}

static int IsSame(Text text, const char *name)
{
    return text.size() == strlen(name) && Ascii_CompareN(text.data(), name, text.size()) == 0;
}

// Takes the next line that is neither blank nor a comment. 0 at the end.
static int NextLine(Text *rest, Text *line)
{
    while (!rest->empty()) {
        size_t end = std::min(rest->find('\n'), rest->size() - 1);
        *line = Trim(rest->substr(0, end + 1));
        rest->remove_prefix(end + 1);
        if (!line->empty() && line->front() != ';')
            return 1;
    }
    return 0;
}

// 1 when the line heads a section.
static int IsHead(Text line, Text *name)
{
    size_t close = line.find(']');
    if (line.front() != '[' || close == Text::npos)
        return 0;
    *name = Trim(line.substr(1, close - 1));
    return 1;
}

// Takes the next line of the section that `rest` is in. 0 at the section's end.
static int NextLineOfSection(Text *rest, Text *line)
{
    Text name;
    return NextLine(rest, line) && !IsHead(*line, &name);
}

// What follows the section's head; empty when there is no such section.
static Text FindSection(Text rest, const char *section)
{
    Text line, name;
    while (NextLine(&rest, &line))
        if (IsHead(line, &name) && IsSame(name, section))
            return rest;
    return Text();
}

static int SplitLine(Text line, Text *key, Text *value)
{
    size_t equals = line.find('=');
    if (equals == Text::npos)
        return 0;
    *key = Trim(line.substr(0, equals));
    *value = Trim(line.substr(equals + 1));
    return 1;
}

static int FindValue(Text rest, const char *wanted, Text *value)
{
    Text line, key;
    while (NextLineOfSection(&rest, &line))
        if (SplitLine(line, &key, value) && IsSame(key, wanted))
            return 1;
    return 0;
}

static Text WithoutQuotes(Text value)
{
    int quoted = value.size() >= 2 && (value.front() == '"' || value.front() == '\'') &&
                 value.front() == value.back();
    return quoted ? value.substr(1, value.size() - 2) : value;
}

static size_t CopyValue(Text section, const char *key, const char *fallback, char *buffer,
                        size_t size)
{
    Text value;
    if (FindValue(section, key, &value))
        value = WithoutQuotes(value);
    else
        value = fallback ? fallback : "";
    size_t length = value.copy(buffer, size - 1);
    buffer[length] = 0;
    return length;
}

size_t Profile_GetString(const char *section, const char *key, const char *fallback, char *buffer,
                         size_t size, const char *path)
{
    if (size == 0)
        return 0;
    std::string text = ReadProfile(path);
    return CopyValue(FindSection(text, section), key, fallback, buffer, size);
}

void Profile_GetStrings(const char *section, const char *const *keys, int count,
                        const char *fallback, char *buffers, size_t size, const char *path)
{
    if (size == 0)
        return;
    std::string text = ReadProfile(path);
    Text lines = FindSection(text, section);
    for (int i = 0; i < count; ++i)
        CopyValue(lines, keys[i], fallback, buffers + static_cast<size_t>(i) * size, size);
}

// The last byte of the buffer is kept for the end of the list.
static void AppendBytes(TextList *list, Text bytes)
{
    size_t room = list->size - 1 - list->used;
    list->cut = list->cut || bytes.size() > room;
    list->used += bytes.copy(list->buffer + list->used, room);
}

static void AppendLine(TextList *list, Text line)
{
    Text key, value;
    if (SplitLine(line, &key, &value)) {
        AppendBytes(list, key);
        AppendBytes(list, "=");
        line = value;
    }
    AppendBytes(list, line);
    AppendBytes(list, Text("", 1));
}

static size_t EndList(TextList *list)
{
    if (list->cut) // the last text ends where the list does
        list->used = list->size - 2;
    list->buffer[list->used] = 0;
    list->buffer[list->size - 1] = 0;
    if (list->used + 1 < list->size)
        list->buffer[list->used + 1] = 0;
    return list->used;
}

// Two zeros are the least that a list takes.
static int StartList(TextList *list, char *buffer, size_t size)
{
    *list = {buffer, size, 0, 0};
    if (size >= 2)
        return 1;
    if (size == 1)
        buffer[0] = 0;
    return 0;
}

size_t Profile_GetSection(const char *section, char *buffer, size_t size, const char *path)
{
    TextList list;
    if (!StartList(&list, buffer, size))
        return 0;
    std::string text = ReadProfile(path);
    Text line, rest = FindSection(text, section);
    while (!list.cut && NextLineOfSection(&rest, &line))
        AppendLine(&list, line);
    return EndList(&list);
}

static int HasText(const TextList *list, Text text)
{
    for (size_t at = 0; at < list->used; at += strlen(list->buffer + at) + 1)
        if (IsSame(text, list->buffer + at))
            return 1;
    return 0;
}

size_t Profile_GetSectionNames(char *buffer, size_t size, const char *path)
{
    TextList list;
    if (!StartList(&list, buffer, size))
        return 0;
    std::string text = ReadProfile(path);
    Text line, name, rest = text;
    while (!list.cut && NextLine(&rest, &line))
        if (IsHead(line, &name) && !name.empty() && !HasText(&list, name)) {
            AppendBytes(&list, name);
            AppendBytes(&list, Text("", 1));
        }
    return EndList(&list);
}

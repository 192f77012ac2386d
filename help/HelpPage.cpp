// help/HelpPage.cpp - which manual the help program shows, as what page, and where a text is in it.

#include "help/HelpPage.h"

#include <cstring>

#include "base/Ascii.h"
#include "base/Paths.h"
#include "base/Sys.h"

static const char MANUAL[] = "manual.html";
static const char TOPIC[] = ".QRL.Cartulo";

std::string Help_FindManual(const char *program)
{
    std::string folder = Path_Parent(program);
    std::string path = folder + "/" + MANUAL;
    while (!Sys_FileExists(path.c_str())) {
        if (folder.empty())
            return std::string();
        folder = Path_Parent(folder);
        path = folder + "/share/doc/cartulo/" + MANUAL;
    }
    return path;
}

static std::string Escape(const char *text)
{
    std::string escaped;
    for (; *text; ++text) {
        if (*text == '<')
            escaped += "&lt;";
        else if (*text == '&')
            escaped += "&amp;";
        else
            escaped += *text;
    }
    return escaped;
}

std::string Help_Notice(const char *topic)
{
    if (*topic == 0 || strcmp(topic, TOPIC) == 0)
        return std::string();
    return "There is no help on the topic \"" + Escape(topic) +
           "\". This is the manual of Cartulo.";
}

static std::string TitleOf(const std::string &manual)
{
    size_t start = manual.find("<h1>");
    size_t end = manual.find("</h1>");
    if (start == std::string::npos || end == std::string::npos || end < start)
        return "Cartulo";
    return manual.substr(start + 4, end - start - 4);
}

std::string Help_Page(const std::string &manual, const HelpColours &colours,
                      const std::string &notice)
{
    std::string page = "<html><head><title>" + TitleOf(manual) + "</title></head><body bgcolor=\"" +
                       colours.background + "\" text=\"" + colours.text + "\" link=\"" +
                       colours.link + "\">\n";
    if (!notice.empty())
        page += "<p><b>" + notice + "</b></p><hr>\n";
    return page + manual + "</body></html>\n";
}

int Help_IsWebAddress(const char *address)
{
    for (const char *start : {"http://", "https://", "mailto:"})
        if (Ascii_CompareN(address, start, strlen(start)) == 0)
            return 1;
    return 0;
}

static int IsBlank(char c)
{
    return c == ' ' || c == '\t' || c == '\n' || c == '\r';
}

// Runs of blanks become one; none at the start.
static void AppendText(std::string *all, const std::string &text)
{
    for (char c : text) {
        if (!IsBlank(c))
            *all += c;
        else if (!all->empty() && all->back() != ' ')
            *all += ' ';
    }
}

static std::string Trim(const std::string &text)
{
    std::string trimmed;
    AppendText(&trimmed, text);
    if (!trimmed.empty() && trimmed.back() == ' ')
        trimmed.pop_back();
    return trimmed;
}

// The word that holds the character at `at`; starts[i] is where word i starts.
static int WordAt(const std::vector<size_t> &starts, size_t at)
{
    int word = 0;
    while (word + 1 < int(starts.size()) && starts[word + 1] <= at)
        ++word;
    return word;
}

HelpPlace Help_FindText(const std::vector<std::string> &words, const std::string &text, int start)
{
    std::string all;
    std::vector<size_t> starts;
    for (const std::string &word : words) {
        starts.push_back(all.size());
        AppendText(&all, word);
    }
    std::string wanted = Trim(text);
    if (wanted.empty())
        return {-1, -1};
    size_t from = start >= 0 && start < int(starts.size()) ? starts[start] : 0;
    size_t at = all.find(wanted, from);
    if (at == std::string::npos)
        at = all.find(wanted);
    if (at == std::string::npos)
        return {-1, -1};
    return {WordAt(starts, at), WordAt(starts, at + wanted.size() - 1)};
}

// tests/support/OutsideLines.h - what stands outside the items of a BIB file, found without the
// program's own parser. For files without errors.
#pragma once

#include <algorithm>
#include <cctype>
#include <map>
#include <set>
#include <string>
#include <vector>

class OutsideLines
{
public:
    // By the kind of the item that follows ("comment", "preamble", "string", "entry", "end"): the
    // non-blank lines that stand outside items, and "@key" for each entry, in order.
    std::map<std::string, std::vector<std::string>> lines;

    explicit OutsideLines(const std::string &text) : m_text(text)
    {
        size_t start = 0;
        for (size_t at = FindItem(0); at != m_text.npos; at = FindItem(start)) {
            std::string kind = KindAt(at);
            AddLines(kind, start, at);
            if (kind == "entry")
                lines[kind].push_back("@" + KeyAt(at));
            start = SkipItem(at);
        }
        AddLines("end", start, m_text.size());
    }

private:
    static bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; }

    bool StartsComment(size_t at) const
    {
        return m_text[at] == '%' && (at == 0 || IsBlank(m_text[at - 1]) || m_text[at - 1] == '}');
    }

    size_t LineEnd(size_t at) const { return std::min(m_text.find('\n', at), m_text.size()); }

    size_t FindItem(size_t at) const
    {
        for (; at < m_text.size(); ++at) {
            if (StartsComment(at))
                at = LineEnd(at);
            else if (m_text[at] == '@')
                return at;
        }
        return m_text.npos;
    }

    std::string KindAt(size_t at) const
    {
        std::string name;
        for (++at; at < m_text.size() && (isalpha((unsigned char)m_text[at]) || m_text[at] == ' ');
             ++at)
            if (m_text[at] != ' ')
                name += static_cast<char>(tolower(m_text[at]));
        static const std::set<std::string> others = {"comment", "preamble", "string"};
        return others.count(name) ? name : "entry";
    }

    std::string KeyAt(size_t at) const
    {
        size_t open = m_text.find_first_of("{(", at) + 1;
        while (IsBlank(m_text[open]))
            ++open;
        return m_text.substr(open, m_text.find_first_of(", \t\r\n})", open) - open);
    }

    size_t SkipItem(size_t at) const
    {
        at = m_text.find_first_of("{(", at);
        const bool inBrackets = m_text[at] == '(';
        int depth = 1 - inBrackets;
        bool inQuotes = false;
        for (++at; at < m_text.size(); ++at) {
            const bool isTop = depth == 1 - inBrackets && !inQuotes;
            if (isTop && StartsComment(at))
                at = LineEnd(at);
            else if (depth == 1 - inBrackets && m_text[at] == '"')
                inQuotes = !inQuotes;
            else if (m_text[at] == '{')
                ++depth;
            else if (m_text[at] == '}' && --depth == 0 && !inBrackets)
                return at + 1;
            else if (m_text[at] == ')' && isTop && inBrackets)
                return at + 1;
        }
        return at;
    }

    void AddLines(const std::string &kind, size_t start, size_t end)
    {
        while (start < end) {
            size_t lineEnd = std::min(LineEnd(start), end);
            std::string line = m_text.substr(start, lineEnd - start);
            while (!line.empty() && line.back() == '\r')
                line.pop_back();
            bool isMark = line == "\xEF\xBB\xBF";
            if (!isMark && line.find_first_not_of(" \t") != line.npos)
                lines[kind].push_back(line);
            start = lineEnd + 1;
        }
    }

    const std::string m_text;
};

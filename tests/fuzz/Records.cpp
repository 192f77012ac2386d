// tests/fuzz/Records.cpp - BIB files out of bytes, and their records as text.
#include "tests/fuzz/Records.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>

#include <unistd.h>

#include "base/Ascii.h"
#include "tests/fuzz/Demand.h"

namespace
{

class Scratch
{
public:
    Scratch() : m_owner(getpid()) { DEMAND(mkdtemp(m_path.data())); }
    ~Scratch()
    {
        if (m_owner == getpid())
            std::filesystem::remove_all(m_path);
    }
    const std::string &Path() const { return m_path; }

private:
    std::string m_path = "/tmp/cartulo-fuzz-XXXXXX";
    pid_t m_owner;
};

} // namespace

const std::string &ScratchFolder()
{
    static const Scratch scratch;
    return scratch.Path();
}

void WriteFile(const std::string &path, const void *data, size_t size)
{
    FILE *stream = fopen(path.c_str(), "w");
    DEMAND(stream);
    DEMAND(size == 0 || fwrite(data, 1, size, stream) == size);
    DEMAND(fclose(stream) == 0);
}

std::string ReadFile(const std::string &path)
{
    std::string text;
    FILE *stream = fopen(path.c_str(), "r");
    DEMAND(stream);
    char block[64 * 1024];
    while (size_t got = fread(block, 1, sizeof block, stream))
        text.append(block, got);
    fclose(stream);
    return text;
}

static std::string DescribeEntry(const BibEntry *entry)
{
    std::string text = std::string("entry ") + BibTypeTable[entry->type] + " " + entry->key + "\n";
    for (int i = 0; i < entry->fieldCount; ++i)
        text += std::string("  ") + BibFieldTable[entry->fields[i].name] + " = " +
                entry->fields[i].value + "\n";
    return text;
}

// What stands before one item is one text.
static std::string DescribeOutside(const BibFile *file)
{
    std::string text = file->form & BIB_FORM_MARK ? "mark\n" : "";
    const BibOutside *last = nullptr;
    for (const BibOutside *at = file->origin ? file->origin->outside : nullptr; at; at = at->next) {
        if (!last || last->item != at->item || last->piece != at->piece || last->place != at->place)
            text += "outside " + std::to_string(at->place) + " " + std::to_string(at->piece) + "\n";
        text += std::string(at->text) + "\n";
        last = at;
    }
    return text;
}

std::string DescribeRecords(const BibFile *file)
{
    std::string text = DescribeOutside(file);
    for (const BibComment *comment = file->comments; comment; comment = comment->next)
        text += std::string("comment ") + comment->text + "\n";
    text += std::string("preamble ") + file->preamble + "\n";
    for (const BibString *string = file->strings; string; string = string->next)
        text += std::string("string ") + string->name + " = " + string->value + "\n";
    for (const BibEntry *entry = file->entries; entry; entry = entry->next)
        text += DescribeEntry(entry);
    return text;
}

int HasTwoCrossrefs(const BibFile *file)
{
    for (const BibEntry *entry = file->entries; entry; entry = entry->next) {
        int count = 0;
        for (int i = 0; i < entry->fieldCount; ++i)
            count += Ascii_Compare(BibFieldTable[entry->fields[i].name], "crossref") == 0;
        if (count > 1)
            return 1;
    }
    return 0;
}

BibFile *SaveAndLoad(BibFile *file, const std::string &path)
{
    unlink(path.c_str());
    free(file->path);
    file->path = Bib_CopyText(path.c_str(), path.size());
    file->modified = 1;
    DEMAND(Bib_SaveFile(file));
    DEMAND(!file->modified);
    BibFile *again = Bib_LoadFile(path.c_str());
    DEMAND(again);
    return again;
}

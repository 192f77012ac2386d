// tests/fuzz/fuzz_value.cpp - any bytes as a value: what the check accepts can be written and read.
//
// A written value comes back equal, but for these:
// - A line end (CR, LF or CR LF) comes back as a blank, and so does a tab, a vertical tab or a form
//   feed in some places, as behind a line end.
// - The name of an abbreviation is written bare. One that is empty, all digits, or holds a control
//   character, a backslash or DEL does not come back; the check looks for the key characters only.
//   Such values must not harm the process, that is all.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "tests/fuzz/Demand.h"
#include "tests/fuzz/Records.h"

// What the parser takes for a name, as far as the check lets it pass.
static int IsName(const std::string &text)
{
    size_t digits = 0;
    for (char c : text) {
        if ((c > 0 && c <= 32) || c == '\\' || c == 127)
            return 0;
        digits += c >= '0' && c <= '9';
    }
    return digits < text.size();
}

static int HoldsOnlyNames(const std::string &value)
{
    for (size_t open = value.find('\2'); open != value.npos; open = value.find('\2', open + 1)) {
        size_t close = value.find('\5', open);
        if (!IsName(value.substr(open + 1, close - open - 1)))
            return 0;
    }
    return 1;
}

static std::string WithPlainBlanks(const std::string &value)
{
    std::string text;
    for (size_t i = 0; i < value.size(); ++i)
        if (value[i] != '\r' || value[i + 1] != '\n')
            text += strchr("\t\n\v\f\r", value[i]) ? ' ' : value[i];
    return text;
}

static void WriteEntry(const std::string &path, const std::string &value)
{
    FILE *stream = fopen(path.c_str(), "w");
    DEMAND(stream);
    fputs("@misc{key, before = 1, field = ", stream);
    Bib_WriteValue(value.c_str(), stream);
    fputs(", after = {text}}\n", stream);
    DEMAND(fclose(stream) == 0);
}

static void CheckEntry(const BibFile *file, const std::string &value)
{
    DEMAND(file->errorCount == 0);
    DEMAND(file->entries && !file->entries->next);
    DEMAND(file->entries->fieldCount == 3);
    const BibField *fields = file->entries->fields;
    DEMAND(strcmp(fields[0].value, "1") == 0);
    DEMAND(WithPlainBlanks(value) == WithPlainBlanks(fields[1].value));
    DEMAND(strcmp(fields[2].value, "text") == 0);
}

extern "C" int LLVMFuzzerInitialize(int *, char ***)
{
    setenv("CARTULO_LOG", "6", 0);
    ScratchFolder();
    Bib_Initialize();
    DEMAND(Bib_SelfTest());
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string value(reinterpret_cast<const char *>(data), size);
    value.resize(strlen(value.c_str()));
    std::string path = ScratchFolder() + "/value.bib";
    WriteEntry(path, value);
    if (Bib_CheckValue(value.c_str()))
        return 0;
    BibFile *file = Bib_LoadFile(path.c_str());
    DEMAND(file);
    if (HoldsOnlyNames(value))
        CheckEntry(file, value);
    Bib_FreeFile(file);
    return 0;
}

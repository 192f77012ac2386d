// tests/support/LoadText.h - BIB files out of literals.
#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include <unistd.h>

#include "store/BibStore.h"

// Writes `text` to a temporary file and loads it. The caller frees the record; the file is gone.
inline BibFile *LoadText(const std::string &text)
{
    char path[] = "/tmp/cartulo-test-XXXXXX.bib";
    int descriptor = mkstemps(path, 4);
    EXPECT_EQ(static_cast<ssize_t>(text.size()), write(descriptor, text.data(), text.size()));
    close(descriptor);
    BibFile *file = Bib_LoadFile(path);
    unlink(path);
    return file;
}

inline std::string FieldName(const BibField &field)
{
    return BibFieldTable[field.name];
}

inline std::string Messages(const BibFile *file)
{
    return file->messages ? file->messages : "";
}

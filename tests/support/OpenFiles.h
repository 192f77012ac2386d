// tests/support/OpenFiles.h - tests of the files that are open, in a folder of their own.
#pragma once

#include <gtest/gtest.h>

#include <string>

#include "session/FileSet.h"
#include "tests/support/LogWatch.h"
#include "tests/support/TempFolder.h"

class OpenFiles : public testing::Test
{
protected:
    void SetUp() override { Bib_Initialize(); }
    void TearDown() override { FileSet_Free(&set); }

    BibFile *Open(const std::string &name, const std::string &text)
    {
        int errors = FileSet_Open(&set, folder.Write(name, text).c_str());
        EXPECT_EQ(0, errors) << name;
        return set.files[set.count - 1];
    }

    std::string Saved(BibFile *file, const std::string &name)
    {
        EXPECT_EQ(1, FileSet_SaveOne(&set, file));
        return folder.Read(name);
    }

    static BibEntry *Find(const BibFile *file, const std::string &key)
    {
        for (BibEntry *entry = file->entries; entry; entry = entry->next)
            if (key == entry->key)
                return entry;
        ADD_FAILURE() << "no entry " << key;
        return nullptr;
    }

    static std::string Keys(const BibFile *file)
    {
        std::string keys;
        for (const BibEntry *entry = file->entries; entry; entry = entry->next)
            keys += std::string(entry->key) + " ";
        return keys;
    }

    LogWatch log; // before anything is logged
    TempFolder folder;
    BibFileSet set = {};
};

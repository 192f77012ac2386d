// tests/support/LoadedStrings.h - tests of abbreviations, of loaded files and of an INI file.
#pragma once

#include <gtest/gtest.h>

#include <string>

#include "session/FileSet.h"
#include "session/KnownStrings.h"
#include "tests/support/LoadText.h"
#include "tests/support/TempFolder.h"

class LoadedStrings : public testing::Test
{
protected:
    LoadedStrings() { Bib_Initialize(); }
    ~LoadedStrings() override { FileSet_Free(&set); }

    BibFile *Load(const std::string &text)
    {
        BibFile *file = LoadText(text);
        FileSet_Append(&set, file);
        return file;
    }

    StringSources Read(const std::string &ini)
    {
        return Strings_Sources(&set, folder.Write("a.ini", ini));
    }

    TempFolder folder;
    BibFileSet set = {};
};

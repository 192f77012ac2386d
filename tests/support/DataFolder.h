// tests/support/DataFolder.h - a folder that is the user's own data folder while it lives.
#pragma once

#include "tests/support/TempFolder.h"

class DataFolder : public TempFolder
{
public:
    DataFolder()
    {
        if (const char *before = getenv("XDG_DATA_HOME"))
            m_before = before;
        setenv("XDG_DATA_HOME", Path().c_str(), 1);
        std::filesystem::create_directories(Path("cartulo/icons"));
    }
    ~DataFolder()
    {
        if (m_before.empty())
            unsetenv("XDG_DATA_HOME");
        else
            setenv("XDG_DATA_HOME", m_before.c_str(), 1);
    }

private:
    std::string m_before;
};

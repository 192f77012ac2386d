// tests/support/KeepEnvironment.h - puts the variables that a test sets back at its end.
#pragma once

#include <cstdlib>
#include <map>
#include <set>
#include <string>

class KeepEnvironment
{
public:
    KeepEnvironment()
    {
        for (const char *name : {"PATH", "XDG_CONFIG_HOME", "XDG_DATA_HOME", "XDG_RUNTIME_DIR"})
            if (const char *value = getenv(name))
                m_values[name] = value;
            else
                m_unset.insert(name);
    }
    ~KeepEnvironment()
    {
        for (const auto &[name, value] : m_values)
            setenv(name.c_str(), value.c_str(), 1);
        for (const std::string &name : m_unset)
            unsetenv(name.c_str());
    }
    KeepEnvironment(const KeepEnvironment &) = delete;
    KeepEnvironment &operator=(const KeepEnvironment &) = delete;

private:
    std::map<std::string, std::string> m_values;
    std::set<std::string> m_unset;
};

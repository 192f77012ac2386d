// tests/support/TempFolder.h - a folder of its own for a test; gone with all it holds at the end.
#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <string>

class TempFolder
{
public:
    explicit TempFolder(const std::string &parent = "/tmp")
    {
        std::string name = parent + "/cartulo-test-XXXXXX";
        EXPECT_NE(nullptr, mkdtemp(name.data()));
        m_path = name;
    }
    ~TempFolder() { std::filesystem::remove_all(m_path); }
    TempFolder(const TempFolder &) = delete;
    TempFolder &operator=(const TempFolder &) = delete;

    std::string Path(const std::string &name) const { return m_path + "/" + name; }
    const std::string &Path() const { return m_path; }

    // Returns the path.
    std::string Write(const std::string &name, const std::string &text) const
    {
        std::ofstream(Path(name), std::ios::binary) << text;
        return Path(name);
    }

    static std::string ReadFile(const std::string &path)
    {
        std::ifstream stream(path, std::ios::binary);
        return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
    }

    std::string Read(const std::string &name) const { return ReadFile(Path(name)); }

    // Of everything in the folder, hidden files too.
    std::set<std::string> Names() const
    {
        std::set<std::string> names;
        for (const auto &entry : std::filesystem::directory_iterator(m_path))
            names.insert(entry.path().filename().string());
        return names;
    }

private:
    std::string m_path;
};

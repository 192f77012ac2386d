// tests/support/LogWatch.h - the lines that the program logs while a test looks on.
//
// The program reads its log setting at the first message, so the first LogWatch of a process has to
// come before that.
#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <string>
#include <vector>

#include <unistd.h>

#include "base/Log.h"

class LogWatch
{
public:
    LogWatch()
    {
        static const std::string path = OpenLog();
        m_stream.open(path);
        m_stream.seekg(0, std::ios::end);
    }

    // What was logged since the last call, without "Cartulo: ".
    std::vector<std::string> Lines()
    {
        std::vector<std::string> lines;
        m_stream.clear();
        for (std::string line; std::getline(m_stream, line);)
            lines.push_back(line.substr(line.find(": ") + 2));
        return lines;
    }

private:
    static std::string OpenLog()
    {
        char path[] = "/tmp/cartulo-log-XXXXXX";
        int descriptor = mkstemp(path);
        setenv("CARTULO_LOG", (std::string("1:") + path).c_str(), 1);
        AppLog("Open log");
        std::ifstream stream(path);
        EXPECT_NE(EOF, stream.peek()) << "something was logged before";
        static std::string removed = path;
        atexit([] { unlink(removed.c_str()); });
        close(descriptor);
        return path;
    }

    std::ifstream m_stream;
};

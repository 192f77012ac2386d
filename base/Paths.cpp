// base/Paths.cpp - what paths and file names say without asking the system.

#include "base/Paths.h"

#include "base/Ascii.h"

std::string Path_Parent(const std::string &path)
{
    size_t slash = path.rfind('/');
    return slash == std::string::npos ? std::string() : path.substr(0, slash);
}

int Path_HasBibEnding(const std::string &name)
{
    return name.size() > 4 && Ascii_Compare(name.c_str() + name.size() - 4, ".bib") == 0;
}

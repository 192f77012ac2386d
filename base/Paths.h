// base/Paths.h - what paths and file names say without asking the system.
#pragma once

#include <string>

// Without the last part and the '/' before it; "" for "/name", and when that part is all.
std::string Path_Parent(const std::string &path);

// 1 for a name in front of ".bib", in letters of any case.
int Path_HasBibEnding(const std::string &name);

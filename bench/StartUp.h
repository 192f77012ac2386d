// bench/StartUp.h - how long a program takes to show its window.
#pragma once

#include <string>
#include <vector>

// Starts a program, waits until it says on standard error that it paints for the first time, and
// ends it. `folder` gets its configuration, and is emptied after it. Returns the milliseconds from
// the start to that line, or 0 when the program left, or took too long.
double TimeToFirstPaint(const std::vector<std::string> &command, const std::string &folder);

// bench/Library.h - a large BIB file, always the same.
#pragma once

#include <string>

// Writes `entries` entries of about 540 bytes each to `path`. Returns the bytes written.
size_t Library_Write(const std::string &path, int entries);

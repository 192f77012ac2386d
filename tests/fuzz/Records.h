// tests/fuzz/Records.h - BIB files out of bytes, and their records as text.
#pragma once

#include <cstddef>
#include <string>

#include "store/BibStore.h"

// Where the files of this process are written; removed when it ends.
const std::string &ScratchFolder();

void WriteFile(const std::string &path, const void *data, size_t size);
std::string ReadFile(const std::string &path);

// Every record in order, each name by its table; equal texts mean equal records. Reads all memory
// that the record owns, so that a sanitizer sees what is wrong with it.
std::string DescribeRecords(const BibFile *file);

// 1 when an entry has more than one `crossref`: each load moves the last one to the front.
int HasTwoCrossrefs(const BibFile *file);

// Saves the records to another path and loads that.
BibFile *SaveAndLoad(BibFile *file, const std::string &path);

// base/Usage.h - what a program answers on its standard output, without a display.
#pragma once

// Answers --help (-h) with `usage` and --version with `version`. Returns the status to end the
// program with, or -1 when nothing of that was asked.
int Usage_Answer(int argc, char **argv, const char *usage, const char *version);

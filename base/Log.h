// base/Log.h - the program's trace lines.
#pragma once

// One line to TNSMessage (base/Companion.h) with the prefix "Cartulo: ": both texts joined and cut
// to 511 bytes. The level follows the text: 2 when it starts with "Run", "Open" or "Launch",
// else 3 when it holds "WARNING", else 4 when it holds "ERROR", else 1.
void AppLog(const char *first, const char *second = nullptr);

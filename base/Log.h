// base/Log.h - the program's trace lines.
#pragma once

#include <cstdint>

// One line to TNSMessage (base/Companion.h) with the prefix "Cartulo: ": both texts joined and cut
// to 511 bytes. The level follows the text: 2 when it starts with "Run", "Open" or "Launch",
// else 3 when it holds "WARNING", else 4 when it holds "ERROR", else 1.
void AppLog(const char *first, const char *second = nullptr);

// What stands for a character in the log: itself, or a blank for a control character, a surrogate
// or 0, which would end or spoil the line.
uint32_t Log_Character(uint32_t character);

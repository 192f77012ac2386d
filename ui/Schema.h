// ui/Schema.h - the INI file that describes the entry types and their fields.
//
// The program's own name and one section for each entry type; sections whose names begin with '*'
// hold other things. Read afresh at each use: what the user changes in it counts at once.
#pragma once

#include <string>

// "/usr/bin/cartulo" gives "/usr/bin/cartulo.ini": the ending of the file name is replaced.
std::string Schema_IniPath(const char *modulePath);

// The INI file that holds: the user's own in the configuration folder, else the one beside the
// executable, else the one installed with it. The second when there is none of them.
std::string Schema_FindIni();

std::string Schema_ApplicationName(const char *ini); // "Cartulo" unless the file has another

// Makes the entry types of the file known to the store. A type for which the store has no room is
// left out, and logged.
void Schema_RegisterTypes(const char *ini);

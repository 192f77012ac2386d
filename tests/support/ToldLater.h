// tests/support/ToldLater.h - why something failed, asked after other calls have failed.
#pragma once

#include <cerrno>
#include <string>

#include "base/Sys.h"

// The text of a reason, which does not depend on what was called since it was given.
inline std::string ToldLater(const SysReason &why)
{
    Sys_FileExists("/no/such/folder");
    errno = EDOM;
    return why.text;
}

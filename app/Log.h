// app/Log.h - the program's trace lines, for other authors; our own code includes base/Log.h.
#pragma once

#include "base/Log.h" // IWYU pragma: export

// app/Companion.h - services of the TeX environment, for other authors; our own code includes
// base/Companion.h.
#pragma once

#include "base/Companion.h" // IWYU pragma: export

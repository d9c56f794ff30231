#pragma once

// The platform's class for a failed call of the operating system, under one name.

#if defined(_WIN32)
#include "exSysErrorWindows.h"
#else
#include "exSysErrorPosix.h"
#endif

namespace Orv {

#if defined(_WIN32)
using ExSysError = ExSysErrorWindows;
#else
using ExSysError = ExSysErrorPosix;
#endif

}  // namespace Orv

#pragma once

// The platform's classes of this module's memory, under one name each.

#if defined(_WIN32)
#include "daArenaPoolWinNT.h"
#include "daMemoryMapWindows.h"
#else
#include "daArenaPoolPosix.h"
#include "daMemoryMapPosix.h"
#endif

namespace Orv {

#if defined(_WIN32)
using DaArenaPoolNative = DaArenaPoolWinNT;
using DaMemoryMapNative = DaMemoryMapWindows;
#else
using DaArenaPoolNative = DaArenaPoolPosix;
using DaMemoryMapNative = DaMemoryMapPosix;
#endif

}  // namespace Orv

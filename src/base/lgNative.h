#pragma once

// The platform's classes behind the log, each under one name.

#if defined(_WIN32)
#include "lgFileWindows.h"
#include "lgSystemWindows.h"
#include "lgWakeupWindows.h"
#else
#include "lgFilePosix.h"
#include "lgSystemPosix.h"
#include "lgWakeupPosix.h"
#endif

namespace Orv {

#if defined(_WIN32)
using LgFile = LgFileWindows;
using LgSystem = LgSystemWindows;
using LgWakeup = LgWakeupWindows;
#else
using LgFile = LgFilePosix;
using LgSystem = LgSystemPosix;
using LgWakeup = LgWakeupPosix;
#endif

}  // namespace Orv

#pragma once

// The platform's class behind PeriodicTimer.

#include "periodicTimer.h"

#if defined(_WIN32)
#include "periodicTimerWindows.h"
#else
#include "periodicTimerPosix.h"
#endif

namespace Orv {

#if defined(_WIN32)
class PeriodicTimer::Native : public PeriodicTimerWindows {};
#else
class PeriodicTimer::Native : public PeriodicTimerPosix {};
#endif

}  // namespace Orv

#pragma once

// The platform's class behind WakeableSleeper.

#include "wakeableSleeper.h"

#if defined(_WIN32)
#include "wakeableSleeperWindows.h"
#else
#include "wakeableSleeperPosix.h"
#endif

namespace Orv {

#if defined(_WIN32)
class WakeableSleeper::Native : public WakeableSleeperWindows {};
#else
class WakeableSleeper::Native : public WakeableSleeperPosix {};
#endif

}  // namespace Orv

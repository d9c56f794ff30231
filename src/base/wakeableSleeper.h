#pragma once

#include <memory>

#include "baseApi.h"
#include "dtTimeMark.h"

namespace Orv {

/// A sleep until a moment, which another thread can end: for a thread that keeps appointments.
///
/// As exact as the system's best timer, on Windows a high-resolution one where there is one. For
/// ticks at a steady rate take PeriodicTimer.
///
/// - Threads: one thread sleeps; any thread may wake it. A wake() that finds nobody asleep ends the
///   next sleep; several count as one.
class ORV_BASE_API WakeableSleeper {
public:
    WakeableSleeper();
    ~WakeableSleeper();

    WakeableSleeper(const WakeableSleeper&) = delete;
    WakeableSleeper& operator=(const WakeableSleeper&) = delete;

    /// Sleeps until the deadline has come or somebody wakes the thread.
    void sleepUntil(const DtTimeMark& deadline);

    void wake();

private:
    class Native;  // WakeableSleeperPosix or WakeableSleeperWindows, see wakeableSleeperNative.h

    std::unique_ptr<Native> _native;  // never null
};

}  // namespace Orv

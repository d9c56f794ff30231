#pragma once

#include "dtTimeMark.h"
#include "waitableTimerWindows.h"

namespace Orv {

/// WakeableSleeper over a waitable timer and an event.
class WakeableSleeperWindows {
public:
    WakeableSleeperWindows();
    ~WakeableSleeperWindows();

    WakeableSleeperWindows(const WakeableSleeperWindows&) = delete;
    WakeableSleeperWindows& operator=(const WakeableSleeperWindows&) = delete;

    void sleepUntil(const DtTimeMark& deadline);
    void wake();

private:
    WaitableTimerWindows _timer;
    void* _woken;  // HANDLE of an auto-reset event, never null
};

}  // namespace Orv

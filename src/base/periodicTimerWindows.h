#pragma once

#include <mutex>

#include "dtTimeMark.h"
#include "waitableTimerWindows.h"

namespace Orv {

/// A sleep until a moment that another thread can end.
class PeriodicTimerWindows {
public:
    PeriodicTimerWindows();
    ~PeriodicTimerWindows();

    PeriodicTimerWindows(const PeriodicTimerWindows&) = delete;
    PeriodicTimerWindows& operator=(const PeriodicTimerWindows&) = delete;

    /// Sleeps, with the lock released, until the deadline or a wake(); may also end without either.
    void waitUntil(std::unique_lock<std::mutex>& lock, const DtTimeMark& deadline);
    void wake();  ///< Called with the lock held.

private:
    WaitableTimerWindows _timer;
    void* _woken;  // HANDLE of an auto-reset event, never null
};

}  // namespace Orv

#pragma once

#include <condition_variable>
#include <mutex>

#include "dtTimeMark.h"

namespace Orv {

/// A sleep until a moment that another thread can end.
class PeriodicTimerPosix {
public:
    /// Sleeps, with the lock released, until the deadline or a wake(); may also end without either.
    void waitUntil(std::unique_lock<std::mutex>& lock, const DtTimeMark& deadline);
    void wake();  ///< Called with the lock held.

private:
    std::condition_variable _woken;
};

}  // namespace Orv

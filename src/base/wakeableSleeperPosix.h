#pragma once

#include <condition_variable>
#include <mutex>

#include "dtTimeMark.h"

namespace Orv {

/// WakeableSleeper over a condition variable that waits by the monotonic clock.
class WakeableSleeperPosix {
public:
    void sleepUntil(const DtTimeMark& deadline);
    void wake();

private:
    std::mutex _lock;
    std::condition_variable _woken;
    bool _isWoken = false;
};

}  // namespace Orv

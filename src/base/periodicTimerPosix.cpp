#include "periodicTimerPosix.h"

#include <chrono>

namespace Orv {

void PeriodicTimerPosix::waitUntil(std::unique_lock<std::mutex>& lock, const DtTimeMark& deadline) {
    using Clock = std::chrono::steady_clock;
    // A wait of the kernel with an absolute deadline on the monotonic clock, which marks count.
    const Clock::time_point until{std::chrono::nanoseconds(deadline.getNanoseconds())};
    _woken.wait_until(lock, until);
}

void PeriodicTimerPosix::wake() {
    _woken.notify_all();
}

}  // namespace Orv

#include "wakeableSleeperPosix.h"

#include <chrono>

namespace Orv {

void WakeableSleeperPosix::sleepUntil(const DtTimeMark& deadline) {
    using Clock = std::chrono::steady_clock;
    // A wait of the kernel with an absolute deadline on the monotonic clock, which marks count.
    const Clock::time_point until{std::chrono::nanoseconds(deadline.getNanoseconds())};
    std::unique_lock lock(_lock);
    _woken.wait_until(lock, until, [this] { return _isWoken; });
    _isWoken = false;
}

void WakeableSleeperPosix::wake() {
    const std::lock_guard guard(_lock);
    _isWoken = true;
    _woken.notify_one();
}

}  // namespace Orv

#include "lgWakeupPosix.h"

namespace Orv {

void LgWakeupPosix::wait() noexcept {
    while (!_isSet.exchange(false, std::memory_order_acquire)) {
        _isSet.wait(false, std::memory_order_relaxed);
    }
}

void LgWakeupPosix::wake() noexcept {
    _isSet.store(true, std::memory_order_release);
    _isSet.notify_one();
}

}  // namespace Orv

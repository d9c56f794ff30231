#pragma once

#include <atomic>

namespace Orv {

/// Wakes the one thread that waits; a call that comes first is kept.
class LgWakeupPosix {
public:
    void wait() noexcept;
    void wake() noexcept;

private:
    std::atomic<bool> _isSet{false};
};

}  // namespace Orv

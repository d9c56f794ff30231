#pragma once

#include <atomic>
#include <cstdint>
#include <iosfwd>

#include "assertions.h"
#include "lkFutexPosix.h"

namespace Orv {

/// LkRecLock over a futex.
class LkRecLockPosix {
public:
    explicit LkRecLockPosix(const char* name) noexcept : _name(name) {}

    bool lock() {
        static_cast<void>(_futex.lock(LkFutexPosix::TRUST_OWNER));
        _holder.store(LkThreadIdPosix::getCurrent(), std::memory_order_relaxed);
        return true;
    }

    void unlock() {
        ORV_ASSERT_TEXT(_futex.isHeldByCaller(), "isHeldByCaller()");
        _holder.store(0, std::memory_order_relaxed);
        static_cast<void>(_futex.unlock());
    }

    bool isLocked() const noexcept { return _futex.isHeld(); }
    bool isLockedByThread() const noexcept { return _futex.isHeldByCaller(); }
    const char* getName() const noexcept { return _name; }
    void dump(std::ostream&) const;

private:
    const char* _name;
    LkFutexPosix _futex;
    std::atomic<std::uint32_t> _holder{0};  // for dump(); none from the first unlock on
};

}  // namespace Orv

#pragma once

#include <iosfwd>

#include "lkFutexPosix.h"

namespace Orv {

/// LkMutex over a futex. Its waiters look for an owner that has ended.
class LkMutexPosix {
public:
    explicit LkMutexPosix(const char* name) noexcept : _name(name) {}

    /// @throws SysAssertionFailed if the owner has ended; the mutex is free then.
    bool lock() {
        if (!_futex.lock(LkFutexPosix::WATCH_OWNER)) [[unlikely]]
            failAbandoned();
        return true;
    }

    /// @throws LkEx::ExDeadLock if the caller holds the mutex; what lock() throws.
    bool spinLock(unsigned tries);

    bool tryLock() noexcept { return _futex.tryLock(); }  ///< False also for the owner.

    /// @throws SysAssertionFailed if the caller does not hold the mutex.
    void unlock() {
        if (!_futex.unlock()) [[unlikely]]
            failNotOwner();
    }

    /// For waits, which release the mutex once and must hold it again in the end, whoever has ended
    /// holding it.
    void relock() { static_cast<void>(_futex.lock(LkFutexPosix::WATCH_OWNER)); }

    bool isHeldOnceByCaller() const noexcept {
        return _futex.isHeldByCaller() && _futex.getDepth() == 1;
    }
    bool isLocked() const noexcept { return _futex.isHeld(); }
    bool isLockedByThread() const noexcept { return isLocked(); }
    const char* getName() const noexcept { return _name; }
    void dump(std::ostream&) const;

private:
    const char* _name;
    LkFutexPosix _futex;

    [[noreturn]] void failAbandoned();
    [[noreturn]] static void failNotOwner();
};

}  // namespace Orv

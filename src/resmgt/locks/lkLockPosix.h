#pragma once

#include <iosfwd>

#include "assertions.h"
#include "lkFutexPosix.h"

namespace Orv {

/// LkLock over a futex.
class LkLockPosix {
public:
    explicit LkLockPosix(const char* name) noexcept : _name(name) {}

    bool lock() { return _futex.lock(LkFutexPosix::TRUST_OWNER); }
    void unlock() { ORV_ASSERT_TEXT(_futex.unlock(), "isHeldByCaller()"); }

    bool isLocked() const noexcept { return _futex.isHeld(); }
    bool isLockedByThread() const noexcept { return isLocked(); }
    const char* getName() const noexcept { return _name; }
    void dump(std::ostream&) const;

private:
    const char* _name;
    LkFutexPosix _futex;
};

}  // namespace Orv

#pragma once

#include <iosfwd>

#include "lkGuard.h"
#include "lkInPlace.h"
#include "resmgtApi.h"
#include "threadSafety.h"

namespace Orv {

/// Mutual exclusion for short sections that never wait: the lightest lock. Where waits are needed
/// take LkMutex, where sections nest LkRecLock.
///
/// Take and release it with an LkGuard. Locking it again on the same thread does no harm, but is a
/// habit for LkRecLock.
///
/// - Threads: any thread may take it, the one that took it releases it. It may be destroyed as soon
///   as the last who wanted it has it and has released it.
/// - Errors: releasing it without holding it is an assertion, and leaves the holder alone.
class ORV_RESMGT_API ORV_CAPABILITY("mutex") LkLock {
public:
    class Native;  // LkLockPosix or LkLockWindows

    /// @param name  shown by dump(); borrowed, must outlive the lock.
    explicit LkLock(const char* name);
    ~LkLock();

    LkLock(const LkLock&) = delete;
    LkLock& operator=(const LkLock&) = delete;

    bool isLocked() const noexcept;          ///< By any thread; a snapshot.
    bool isLockedByThread() const noexcept;  ///< Same as isLocked().

    const char* getName() const noexcept;
    void dump(std::ostream&) const;

private:
    template <class T>
    friend class LkGuard;

    mutable LkInPlace<Native, 64> _native;

    bool lock() const ORV_ACQUIRE();
    void unlock() const ORV_RELEASE();
};

}  // namespace Orv

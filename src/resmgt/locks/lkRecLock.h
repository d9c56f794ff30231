#pragma once

#include <iosfwd>

#include "lkGuard.h"
#include "lkInPlace.h"
#include "resmgtApi.h"
#include "threadSafety.h"

namespace Orv {

class LkMutexAttr;

/// Mutual exclusion for short sections that never wait and may nest: its owner takes it again and
/// owes as many unlocks.
///
/// Take and release it with an LkGuard.
///
/// - Threads: any thread may take it, the one that took it releases it. It may be destroyed as soon
///   as the last who wanted it has it and has released it.
/// - Errors: releasing it without holding it is an assertion, and leaves the holder alone.
class ORV_RESMGT_API ORV_CAPABILITY("mutex") LkRecLock {
public:
    class Native;  // LkRecLockPosix or LkRecLockWindows

    /// @param name  shown by dump(); borrowed, must outlive the lock.
    explicit LkRecLock(const char* name);
    LkRecLock(const char* name, const LkMutexAttr&);
    ~LkRecLock();

    LkRecLock(const LkRecLock&) = delete;
    LkRecLock& operator=(const LkRecLock&) = delete;

    bool isLocked() const noexcept;          ///< By any thread; a snapshot.
    bool isLockedByThread() const noexcept;  ///< By the calling thread.

    const char* getName() const noexcept;

    /// The recorded holder is 0 from the first unlock on, also while the count is above zero.
    void dump(std::ostream&) const;

private:
    template <class T>
    friend class LkGuard;

    mutable LkInPlace<Native, 64> _native;

    bool lock() const ORV_ACQUIRE();
    void unlock() const ORV_RELEASE();
};

}  // namespace Orv

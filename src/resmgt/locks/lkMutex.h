#pragma once

#include <iosfwd>

#include "lkGuard.h"
#include "lkInPlace.h"
#include "resmgtApi.h"
#include "threadSafety.h"

namespace Orv {

class LkMutexAttr;

/// Mutual exclusion, for sections that may wait: the lock that condition variables and pulses take.
/// For short sections that never wait LkLock and LkRecLock are lighter on Windows.
///
/// Take and release it with an LkGuard. Its owner may take it again and then owes as many unlocks;
/// TRY refuses that, SPIN calls it a deadlock.
///
/// - Threads: any thread may take it, the one that took it releases it. It may be destroyed as soon
///   as the last who wanted it has it and has released it.
/// - Errors: releasing it without holding it is an assertion, and leaves the holder alone.
///   Destroying a held one is an assertion. If its holder has ended, the next to lock it gets an
///   assertion, on Linux within about a second; after that the mutex is free.
class ORV_RESMGT_API ORV_CAPABILITY("mutex") LkMutex {
public:
    class Native;  // LkMutexPosix or LkMutexWindows

    /// @param name  shown by dump() and in errors; borrowed, must outlive the mutex.
    explicit LkMutex(const char* name);
    LkMutex(const char* name, const LkMutexAttr&);
    ~LkMutex() noexcept(false);

    LkMutex(const LkMutex&) = delete;
    LkMutex& operator=(const LkMutex&) = delete;

    bool isLocked() const noexcept;          ///< By any thread; a snapshot.
    bool isLockedByThread() const noexcept;  ///< Same as isLocked().

    const char* getName() const noexcept;
    void dump(std::ostream&) const;

    /// What the library's own waits need; no use to applications.
    Native& getImp() const noexcept;

private:
    template <class T>
    friend class LkGuard;

    mutable LkInPlace<Native, 32> _native;

    bool lock() const ORV_ACQUIRE();
    bool spinLock(unsigned tries) const ORV_ACQUIRE();
    bool tryLock() const ORV_TRY_ACQUIRE(true);
    void unlock() const ORV_RELEASE();
};

}  // namespace Orv

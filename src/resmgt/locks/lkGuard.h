#pragma once

#include <exception>

#include "assertions.h"
#include "threadSafety.h"

namespace Orv {

enum LkTryTag { TRY };    ///< For LkGuard: take the lock only if it is free.
enum LkSpinTag { SPIN };  ///< For LkGuard: look a number of times before sleeping.

/// Holds a lock for a scope: `const LkGuard guard(_mutex);`
///
/// Locks are taken and released through guards alone. The type is that of the lock, const for locks
/// with one way to hold them; left out, it is the const one.
///
/// - Threads: one guard is used by one thread, and destroyed by the one that made it.
/// - Errors: what the lock's own operations throw; while the stack unwinds the destructor traces
/// it.
template <class T>
class [[nodiscard]] ORV_SCOPED_CAPABILITY LkGuard {
public:
    /// Blocks until the lock is held.
    explicit LkGuard(T& lock) ORV_ACQUIRE(lock);

    /// Does not block; see isLocked(). The thread-safety analysis takes the lock for held.
    LkGuard(T& lock, LkTryTag) ORV_ACQUIRE(lock);

    /// Tries up to @p tries times, 0 being very many, within a few microseconds, and then blocks.
    /// @throws LkEx::ExDeadLock if the caller holds the lock.
    LkGuard(T& lock, LkSpinTag, unsigned tries) ORV_ACQUIRE(lock);

    ~LkGuard() noexcept(false) ORV_RELEASE_GENERIC();

    LkGuard(const LkGuard&) = delete;
    LkGuard& operator=(const LkGuard&) = delete;

    void unlock() ORV_RELEASE_GENERIC();  ///< Gives the lock up before the guard goes.
    void lock() ORV_ACQUIRE();            ///< Takes it again; blocks until it is held.

    bool isLocked() const noexcept { return _isLocked; }  ///< Whether this guard holds the lock.
    T& getLock() const noexcept { return _lock; }

private:
    T& _lock;
    bool _isLocked;
};

template <class T>
LkGuard(T&) -> LkGuard<const T>;
template <class T>
LkGuard(T&, LkTryTag) -> LkGuard<const T>;
template <class T>
LkGuard(T&, LkSpinTag, unsigned) -> LkGuard<const T>;

}  // namespace Orv

#include "lkGuard.imp"

#pragma once

#include "lkWaitQueue.h"

namespace Orv {

class LkCondVarAttr;
class LkMutexAttr;

/// Counting semaphore whose wait may have a time-out.
///
/// Waiters are served in the order they came. Where no time-out is needed, LkUnnamedSema does the
/// same; across processes use LkNamedSema.
///
/// - Threads: every member by any thread; the thread whose wait has returned may destroy it at
///   once, while post() has not returned yet.
/// - Memory: what was written before post() is visible to the thread whose wait it ends.
class ORV_RESMGT_API LkSema {
public:
    /// Asserts that @p initialCount is at most 2147483647.
    /// @param name  for diagnostics; borrowed, must outlive the semaphore.
    explicit LkSema(const char* name, unsigned initialCount = 0);

    /// The attributes are those of the lock and the condition variable that a semaphore is said to
    /// be made of; no attribute has an effect on either platform.
    LkSema(const char* name, unsigned initialCount, const LkMutexAttr&, const LkCondVarAttr&);

    void post();  ///< Asserts if the count is 2147483647 already.
    void wait();  ///< Blocks, without limit, until it has taken one from the count.

    /// Like wait(), but gives up after @p seconds and leaves the count alone.
    [[nodiscard]] bool timedWait(double seconds);
    [[nodiscard]] bool tryWait();  ///< Takes one from the count if that is not 0.

    bool isValid() const noexcept { return true; }  ///< As of all semaphores.
    const char* getName() const noexcept { return _name; }

private:
    LkWaitQueue _queue;
    const char* _name;
};

}  // namespace Orv

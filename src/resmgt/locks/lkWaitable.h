#pragma once

#include "lkGuard.h"
#include "lkMutex.h"
#include "resmgtApi.h"

namespace Orv {

/// What a thread can wait for while it holds an LkMutex.
///
/// The wait releases the mutex and holds it again on return, in every outcome. Waits may return
/// early: look at your own condition again, in a loop.
///
/// - Threads: any number may wait; the caller holds the mutex, exactly once.
/// - Errors: a mutex that the caller does not hold, or holds more than once, is an assertion before
///   anything is released. A wait that throws holds the mutex all the same.
class ORV_RESMGT_API LkWaitable {
public:
    virtual ~LkWaitable();

    void wait(const LkMutex& mutex) ORV_REQUIRES(mutex) { performWait(mutex); }
    void wait(const LkGuard<const LkMutex>& guard) { performWait(guard.getLock()); }

    /// Gives up after @p seconds, rounded to whole milliseconds; 0 and less only looks.
    /// @return false if the time ran out.
    bool timedWait(const LkMutex& mutex, double seconds) ORV_REQUIRES(mutex) {
        return performTimedWait(mutex, seconds);
    }
    bool timedWait(const LkGuard<const LkMutex>& guard, double seconds) {
        return performTimedWait(guard.getLock(), seconds);
    }

protected:
    virtual void performWait(const LkMutex& mutex) = 0;
    virtual bool performTimedWait(const LkMutex& mutex, double seconds) = 0;
};

}  // namespace Orv

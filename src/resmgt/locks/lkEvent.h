#pragma once

#include <iosfwd>

#include "lkWaitQueue.h"

namespace Orv {

/// Manual-reset event: threads pass while it is set and wait while it is not.
///
/// Announces a lasting state ("device ready"). To hand out items one by one use LkSema; to wait
/// for a condition guarded by a mutex use LkCondVar or LkPulse.
///
/// - Threads: every member may be called by any thread; destroy it only when nobody waits. A
///   thread whose wait has returned may do that at once, while set() has not returned yet.
/// - Memory: what was written before set() is visible to every thread that a wait lets through.
class ORV_RESMGT_API LkEvent {
public:
    /// @param name  shown by dump(); borrowed, must outlive the event.
    LkEvent(const char* name, bool initiallySet) noexcept;

    void set() noexcept;    ///< Releases all waiting threads, also if reset() follows at once.
    void reset() noexcept;  ///< Later arrivals wait; threads already released still pass.
    void wait();            ///< Blocks, without limit, until the event is set.

    /// Like wait(), but gives up after @p seconds (rounded to whole milliseconds).
    /// @return true if the event was set, false if the time ran out.
    [[nodiscard]] bool timedWait(double seconds);

    const char* getName() const noexcept { return _name; }
    void dump(std::ostream& stream) const;

private:
    LkWaitQueue _queue;
    const char* _name;
};

}  // namespace Orv

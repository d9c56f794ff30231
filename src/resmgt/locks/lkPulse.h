#pragma once

#include <iosfwd>

#include "lkWaitQueue.h"
#include "lkWaitable.h"

namespace Orv {

/// Wake-up that is remembered: a pulse that finds nobody waiting lets a later wait pass.
///
/// WAKE_ONE counts: each pulse ends one wait, in the order they came. WAKE_ALL lasts: once pulsed,
/// it ends all present and later waits until its owner re-arms it with reset(), which it does with
/// the mutex held when it is about to wait again:
///
///     while (!isReady()) {
///         _pulse.reset();
///         _pulse.wait(guard);
///     }
///
/// - Threads: every member by any thread. A thread that was released may destroy the pulse at once,
///   while pulse() has not returned yet.
class ORV_RESMGT_API LkPulse : public LkWaitable {
public:
    enum WakeType { WAKE_ONE = 0, WAKE_ALL = 1 };

    /// @param name  shown by dump(); borrowed, must outlive the pulse.
    LkPulse(const char* name, WakeType wakeType) noexcept;

    /// Needs no mutex. Asserts if 2147483647 pulses of WAKE_ONE are pending.
    void pulse();

    /// Forgets pulses that are pending. Threads that a pulse has released pass all the same, even
    /// if they have not run since.
    void reset() noexcept;

    WakeType getWakeType() const noexcept { return _wakeType; }
    const char* getName() const noexcept { return _name; }
    void dump(std::ostream& stream) const;

protected:
    void performWait(const LkMutex& mutex) override;
    bool performTimedWait(const LkMutex& mutex, double seconds) override;

private:
    LkWaitQueue _queue;
    const char* _name;
    WakeType _wakeType;
};

}  // namespace Orv

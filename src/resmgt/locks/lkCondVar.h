#pragma once

#include <iosfwd>

#include "lkWaitQueue.h"
#include "lkWaitable.h"

namespace Orv {

class LkCondVarAttr;

/// Condition variable: threads wait until another one says that a condition may hold now.
///
/// Signals are not remembered: change the condition under the mutex, and test it there before each
/// wait. Where they are to be remembered take LkPulse, for a lasting state without a mutex LkEvent.
///
/// - Threads: every member by any thread. Waiters are released in the order they came; a released
///   one may destroy the condition variable at once, while signal() has not returned yet.
class ORV_RESMGT_API LkCondVar : public LkWaitable {
public:
    /// @param name  shown by dump(); borrowed, must outlive the condition variable.
    explicit LkCondVar(const char* name) noexcept;
    LkCondVar(const char* name, const LkCondVarAttr&) noexcept;

    /// Releases the thread that has waited longest, if any, and never one that comes later. Needs
    /// no mutex.
    void signal() noexcept;

    /// Releases every thread that waits now: its wait returns true, also if its time is just
    /// running out. They take the mutex one by one. The caller holds the mutex that they wait with.
    void broadcast() noexcept;

    const char* getName() const noexcept { return _name; }
    void dump(std::ostream& stream) const;

protected:
    void performWait(const LkMutex& mutex) override;
    bool performTimedWait(const LkMutex& mutex, double seconds) override;

private:
    LkWaitQueue _queue;
    const char* _name;
};

}  // namespace Orv

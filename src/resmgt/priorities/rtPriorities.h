#pragma once

#include <iosfwd>

#include "priority.h"
#include "resmgtApi.h"

namespace Orv {

/// The three fixed priorities of a process to which all others are related: "BaseLine" (16) for
/// ordinary work, "RealTime" (32) for what must keep time, "Interrupt" (48) for what serves
/// devices.
///
/// - Threads: as Priority.
/// - Ownership: owns the three priorities; the manager must outlive it.
class ORV_RESMGT_API RtPriorities {
public:
    static constexpr int BASE_LINE = 16;
    static constexpr int REAL_TIME = 32;
    static constexpr int INTERRUPT = 48;

    /// Asserts that the three are in order.
    /// @throws PriorityEx if the manager's relations contradict themselves already.
    explicit RtPriorities(PriorityMgr&);

    Priority& getBaseLine() noexcept { return _baseLinePriority; }
    Priority& getRealTime() noexcept { return _realTimePriority; }
    Priority& getInterrupt() noexcept { return _interruptPriority; }

    static const char* getScopeName() noexcept { return "rt-process-scope"; }

    void dump(std::ostream&) const;

private:
    Priority _baseLinePriority;
    Priority _realTimePriority;
    Priority _interruptPriority;
};

}  // namespace Orv

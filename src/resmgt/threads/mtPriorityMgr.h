#pragma once

#include <atomic>
#include <optional>

#include "priorityMgr.h"
#include "resmgtApi.h"
#include "rtPriorities.h"

namespace Orv {

/// The priorities of the process's threads: numbers from 0 to 63, which come to levels 2 to 6.
///
///     number              level
///     below BaseLine      2
///     BaseLine to 23      3
///     24 to 31            4
///     from RealTime on    5
///     from Interrupt on   6
///
/// A thread that is tied to none of the three, directly or through others, stays at level 3. One
/// for the process, never destroyed.
///
/// - Threads: as PriorityMgr.
class ORV_RESMGT_API MtPriorityMgr : public PriorityMgr {
public:
    static constexpr int LOWEST = 0;
    static constexpr int HIGHEST = 63;

    static MtPriorityMgr& getInstance();

    /// "BaseLine", "RealTime" and "Interrupt", to which threads are related.
    RtPriorities& getRtPriorities() noexcept { return _rtPriorities; }

    static int toLevel(int number, bool isTied) noexcept;

    /// The level of a thread's priority, for whoever cannot fail on a contradiction: that is traced,
    /// once until it is solved, and there is no level then.
    std::optional<int> findLevel(const Priority& priority) noexcept;

private:
    MtPriorityMgr();

    RtPriorities _rtPriorities;
    std::atomic<bool> _isContradictionTraced{false};
};

}  // namespace Orv

#include "mtPriorityMgr.h"

#include "assertions.h"
#include "mtThreadLevels.h"

namespace Orv {

MtPriorityMgr& MtPriorityMgr::getInstance() {
    static auto* const mgr = new MtPriorityMgr;
    return *mgr;
}

MtPriorityMgr::MtPriorityMgr()
    : PriorityMgr("MtPriorityMgr", LOWEST, HIGHEST), _rtPriorities(*this) {}

int MtPriorityMgr::toLevel(int number, bool isTied) noexcept {
    constexpr int upperHalf = (RtPriorities::BASE_LINE + RtPriorities::REAL_TIME) / 2;
    if (!isTied) return MtThreadLevels::NORMAL_LEVEL;
    if (number < RtPriorities::BASE_LINE) return 2;
    if (number < upperHalf) return 3;
    if (number < RtPriorities::REAL_TIME) return 4;
    if (number < RtPriorities::INTERRUPT) return 5;
    return 6;
}

std::optional<int> MtPriorityMgr::findLevel(const Priority& priority) noexcept {
    try {
        const int number = priority.getPriority();
        _isContradictionTraced.store(false, std::memory_order_relaxed);
        return toLevel(number, priority.isTied());
    } catch (...) {
        if (!_isContradictionTraced.exchange(true, std::memory_order_relaxed)) {
            Assertions::traceCurrentException("finding the priorities of threads");
        }
        return std::nullopt;
    }
}

}  // namespace Orv

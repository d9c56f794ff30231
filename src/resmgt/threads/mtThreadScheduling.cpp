// MtThread's part in scheduling: levels, classes and processors.
#include <optional>

#include "envIntVar.h"
#include "lkAdaptiveWait.h"
#include "mtNative.h"
#include "mtPriorityMgr.h"
#include "mtThread.h"
#include "mtThreadLevels.h"
#include "mtThreadMgr.h"
#include "mtThreadMgrImpPrivate.h"
#include "trace.h"

namespace Orv {

void MtThread::setPriorityLevel(int level) {
    static_cast<void>(MtThreadLevels::toThreadPriority(level));  // which refuses all others
    bool isApplied = true;
    {
        const LkGuard guard(_lock);
        _isLevelByHand = true;
        _level = level;
        isApplied = applyLevelNoLock();
    }
    if (!isApplied) traceLevelRefusal(_name);
}

int MtThread::getPriorityLevel() const {
    const LkGuard guard(_lock);
    const LkGuard endGuard(_endLock);
    return isAliveNoLock() ? _native->readLevel(_level) : _level;
}

int MtThread::getBasePriority() const {
    return MtThreadLevels::toBasePriority(MtThreadMgr::get().imp().getProcessClass(),
                                          getPriorityLevel());
}

/// Takes the level of the thread's priority, also while another thread is telling it a new one.
void MtThread::followLevel() {
    std::optional<int> level, before;
    while ((level = MtPriorityMgr::getInstance().findLevel(_priority)) && level != before) {
        followPriority(*level);
        before = level;
    }
}

void MtThread::followPriority(int level) {
    bool isApplied = true;
    {
        const LkGuard guard(_lock);
        if (_isLevelByHand || _level == level) return;
        _level = level;
        isApplied = applyLevelNoLock();
    }
    if (!isApplied) traceLevelRefusal(_name);
}

/// @return false if the system refuses the level.
bool MtThread::applyLevelNoLock() {
    const LkGuard endGuard(_endLock);
    return !isAliveNoLock() || _native->applyLevel(_level, MtThreadMgr::get().isRealTime());
}

/// @return whether the thread is in that class now; true if it does not run.
bool MtThread::applyClass(bool isRealTime) {
    const LkGuard guard(_lock);
    const LkGuard endGuard(_endLock);
    if (!isAliveNoLock()) return true;
    static_cast<void>(_native->applyLevel(_level, isRealTime));
    return _native->isRealTime() == isRealTime;
}

void MtThread::setProcessorNb(int number) {
    const LkGuard guard(_lock);
    _processorNb = number;
    const LkGuard endGuard(_endLock);
    if (!isProcessorPlaceable(number) || !isAliveNoLock()) return;
    _native->setProcessor(number);
    LkAdaptiveWait::forgetPlacement();
}

void MtThread::placeAtStart() {
    static EnvIntVar runOn("ORV_RUNON", 1);
    if (_processorNb < 0 || _processorNb >= MtThreadMgr::get().getNbProcessors()) return;
    runOn.refresh();
    if (runOn.getValue() != 0) _native->setProcessor(_processorNb);
}

int MtThread::getProcessorNb() const {
    const LkGuard guard(_lock);
    return _processorNb;
}

bool MtThread::isProcessorPlaceable(int number) const {
    return MtThreadNative::IS_PLACEABLE && number >= ANY_PROCESSOR &&
           number < MtThreadMgr::get().getNbProcessors();
}

void MtThread::traceLevelRefusal(const LiString& thread) {
    static constinit std::atomic<bool> isTraced{false};
    if (isTraced.exchange(true, std::memory_order_relaxed)) return;
    ORV_TRACE(TraceLevel::getMain()) << "The system refuses thread \"" << thread
                                     << "\" its level for want of rights; it runs at a lower one. "
                                        "Further refusals are not told.";
}

}  // namespace Orv

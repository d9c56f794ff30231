#include <algorithm>
#include <ostream>

#include "assertions.h"
#include "envIntVar.h"
#include "lkAdaptiveWait.h"
#include "mtEx.h"
#include "mtThread.h"
#include "mtThreadFactory.h"
#include "mtThreadGroup.h"
#include "mtThreadMgrImpPrivate.h"
#include "mtUtil.h"
#include "trace.h"

namespace Orv {

MtThreadMgrImp::MtThreadMgrImp() : _nbProcessors(MtUtil::getNbProcessors()) {}

MtThreadMgrImp::~MtThreadMgrImp() noexcept(false) {
    const LkGuard guard(_lock);
    ORV_ASSERT_IN_DESTRUCTOR_TEXT(_threads.getSize() == 0, "_threads.size() == 0");
    ORV_ASSERT_IN_DESTRUCTOR_TEXT(_groups.empty(), "_groups.size() == 0");
}

// Threads

MtThread& MtThreadMgrImp::createMainThread(MtThreadFactory& factory) {
    const LkGuard guard(_lock);
    const bool first = _mainThread == nullptr;
    ORV_ASSERT(first);
    _mainThread = factory.createMainThread().release();
    return *_mainThread;
}

/// All are asked before the first is waited for.
std::vector<LiString> MtThreadMgrImp::stopThreads(double seconds) {
    const LkTimeLimit limit(seconds);
    const auto isToStop = [](const MtThread& thread) {
        return thread.isRunning() && !thread.isMainThread() && !thread.isCurrentThread();
    };
    _threads.forEach([&](MtThread& thread) {
        if (!isToStop(thread)) return;
        try {
            thread.requestStop();
        } catch (...) {
            Assertions::traceCurrentException("asking a thread to stop");
        }
    });
    std::vector<LiString> names;
    _threads.forEach([&](MtThread& thread) {
        std::uint64_t run = 0;
        if (isToStop(thread) && !thread.waitForEnd(limit, run)) names.push_back(thread.getName());
    });
    return names;
}

// Groups

void MtThreadMgrImp::add(MtThreadGroup& group) {
    const LkGuard guard(_lock);
    ORV_ASSERT_TEXT(findNoLock(&group) == nullptr, "findNoLock( group ) == 0");
    _groups.push_back(&group);
}

void MtThreadMgrImp::remove(MtThreadGroup& group) {
    const LkGuard guard(_lock);
    ORV_ASSERT_TEXT(findNoLock(&group) == &group, "findNoLock( group ) == group");
    std::erase(_groups, &group);
}

MtThreadGroup* MtThreadMgrImp::findNoLock(const MtThreadGroup* group) const {
    const auto found = std::find(_groups.begin(), _groups.end(), group);
    return found != _groups.end() ? *found : nullptr;
}

void MtThreadMgrImp::setNbProcessors(int number) {
    ORV_ASSERT(number > 0);
    const LkGuard guard(_lock);
    _nbProcessors = number;
    for (MtThreadGroup* const group : std::vector(_groups)) {
        if (findNoLock(group) != nullptr) group->performNbProcessorsChanged(number);
    }
}

// Real time. A thread that starts takes the class from the flag, under its own lock; so the flag
// changes first, and then threads are gone through.

void MtThreadMgrImp::setRealTime(bool isOn) {
    static EnvIntVar noRealTime("ORV_THREAD_NO_REALTIME", 0);
    const LkGuard guard(_lock);
    noRealTime.refresh();
    if (noRealTime.getValue() != 0 || isOn == isRealTime()) return;
    if (!isOn) return disableRealTimeNoLock();
    try {
        enableRealTimeNoLock();
    } catch (const MtEx::ExRealTimeNotEnabled&) {
        if (MtThreadMgr::getRealTimeParam() == MtThreadMgr::REAL_TIME_REQUIRED) throw;
    }
}

void MtThreadMgrImp::enableRealTimeNoLock() {
    _native.enableRealTime();
    _isRealTime = true;
    try {
        if (!applyClassNoLock()) _native.throwNotEnabled();
    } catch (...) {
        disableRealTimeNoLock();
        throw;
    }
}

void MtThreadMgrImp::disableRealTimeNoLock() {
    _isRealTime = false;
    _native.disableRealTime();
    static_cast<void>(applyClassNoLock());
}

/// @return whether all threads are in the process's class now.
bool MtThreadMgrImp::applyClassNoLock() {
    bool isApplied = true;
    _threads.forEachLocked([&](MtThread& thread) {
        if (!thread.applyClass(isRealTime())) isApplied = false;
    });
    LkAdaptiveWait::forgetPlacement();
    return isApplied;
}

MtThreadLevels::ProcessClass MtThreadMgrImp::getProcessClass() const {
    return _native.getProcessClass(isRealTime());
}

void MtThreadMgrImp::dump(std::ostream& stream) const {
    stream << "Threads:\n";
    _threads.forEachLocked([&](const MtThread& thread) {
        stream << "  ";
        thread.dump(stream);
    });
}

}  // namespace Orv

#pragma once

#include <atomic>
#include <iosfwd>
#include <memory>
#include <vector>

#include "lkRecLock.h"
#include "mtNative.h"
#include "mtThreadListPrivate.h"
#include "mtThreadMgr.h"
#include "threadSafety.h"

namespace Orv {

/// What MtThreadMgr keeps: the threads, the groups, the main thread and the process's class.
///
/// Order of locks: this one, the list's, a thread's.
class MtThreadMgrImp {
public:
    MtThreadMgrImp();
    ~MtThreadMgrImp() noexcept(false);

    MtThreadMgrImp(const MtThreadMgrImp&) = delete;
    MtThreadMgrImp& operator=(const MtThreadMgrImp&) = delete;

    MtThreadList& getThreads() noexcept { return _threads; }
    std::vector<LiString> stopThreads(double seconds);

    void add(MtThreadGroup& group);
    void remove(MtThreadGroup& group);

    MtThread& createMainThread(MtThreadFactory& factory);
    MtThread* findMainThread() const noexcept { return _mainThread; }

    void setRealTime(bool isOn);
    bool isRealTime() const noexcept { return _isRealTime.load(std::memory_order_seq_cst); }
    MtThreadLevels::ProcessClass getProcessClass() const;

    int getNbProcessors() const noexcept { return _nbProcessors; }
    void setNbProcessors(int number);

    void dump(std::ostream& stream) const;

private:
    mutable LkRecLock _lock{"MtThreadMgr"};
    MtThreadMgrNative _native;
    MtThreadList _threads{"MtThreadMgr::threads"};
    std::vector<MtThreadGroup*> _groups ORV_GUARDED_BY(_lock);
    std::atomic<MtThread*> _mainThread{nullptr};
    std::atomic<int> _nbProcessors;
    std::atomic<bool> _isRealTime{false};

    MtThreadGroup* findNoLock(const MtThreadGroup* group) const ORV_REQUIRES(_lock);
    void enableRealTimeNoLock() ORV_REQUIRES(_lock);
    void disableRealTimeNoLock() ORV_REQUIRES(_lock);
    bool applyClassNoLock() ORV_REQUIRES(_lock);
};

}  // namespace Orv

#pragma once

#include <cstdint>
#include <limits>

#include "lkCondVar.h"
#include "lkMutex.h"
#include "mtAlarmHandleManipulator.h"
#include "mtAlarmManager.h"
#include "mtAlarmQueuePrivate.h"
#include "mtThread.h"
#include "priority.h"
#include "threadSafety.h"
#include "wakeableSleeper.h"

namespace Orv {

/// The alarms of a process and the thread that calls them.
///
/// Lock order: the manager's mutex, then a handle's lock.
class MtAlarmManagerImp final : public MtAlarmManager, private MtAlarmHandleManipulator {
public:
    MtAlarmManagerImp();
    ~MtAlarmManagerImp() override;

    bool registerAlarm(const RCShdPtr<MtAlarmHandle>& handle) override;
    void deregisterAlarm(const RCShdPtr<MtAlarmHandle>& handle) override;
    Priority& getPriority() noexcept override { return _priority; }
    void dump(std::ostream&) const override;

private:
    using Handle = RCShdPtr<MtAlarmHandle>;

    class MtAlarmThread;
    class Call;

    /// What the alarm thread does next.
    struct Step {
        enum Kind { END, SLEEP, CALL } kind;
        double seconds = 0;  // until when to sleep
        Handle handle = nullptr;
        bool isLate = false;
    };

    // When the alarm thread looks at the queue again, if it sleeps until then.
    static constexpr double NEVER = std::numeric_limits<double>::infinity();
    static constexpr double AWAKE = -NEVER;

    const LkMutex _mutex{"MtAlarmManager"};
    LkCondVar _waitCv{"MtAlarmMangerImp waitCv"};  // the thread waits while nothing is registered
    LkCondVar _deregCv{
        "MtAlarmMangerImp deregCv"};  // those wait who deregister what is being fired
    WakeableSleeper _sleeper;         // the thread sleeps until the next alarm

    MtAlarmQueue _queue ORV_GUARDED_BY(_mutex);
    double _wakeTime ORV_GUARDED_BY(_mutex) = AWAKE;
    bool _isStopping ORV_GUARDED_BY(_mutex) = false;

    Handle _fired ORV_GUARDED_BY(_mutex);             // empty if none is being fired
    bool _firesAgain ORV_GUARDED_BY(_mutex) = false;  // it keeps its place for another time
    bool _isLeaving ORV_GUARDED_BY(_mutex) = false;   // another thread deregisters it
    std::uint64_t _nbFirings ORV_GUARDED_BY(_mutex) = 0;

    Priority _priority;
    ObjPtr<MtThread> _thread;  // never null until the destructor

    void run();
    Step findNextStep();
    void sleepUntil(double seconds);
    void call(const Handle& handle, bool isLate);
    void finishFiring();

    void stop();
    void wakeNoLock() ORV_REQUIRES(_mutex);
    void leaveNoLock(MtAlarmHandle& handle) ORV_REQUIRES(_mutex);
    void awaitFiringEnd(const LkGuard<const LkMutex>& guard) ORV_REQUIRES(_mutex);
    bool hasThreadEnded() noexcept;
};

}  // namespace Orv

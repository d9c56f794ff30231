// Idle means idle: pools without work, alarms that are not due, threads that wait for requests, for
// tasks and for one another, each after an earlier round, use no processor.
#include <chrono>
#include <gtest/gtest.h>
#include <memory>
#include <thread>
#include <vector>

#include "cpuTime.h"
#include "gate.h"
#include "mtAlarmHandle.h"
#include "mtAlarmManagerImpPrivate.h"
#include "mtTaskPool.h"
#include "mtThread.h"
#include "mtThreadFactory.h"

namespace Orv {

namespace {

class CountingCallback : public MtAlarmHandle::Callback {
public:
    TestCounter nbCalls;

private:
    void performAlarm(const RCShdPtr<MtAlarmHandle>&, bool) override { nbCalls.add(); }
};

/// What waits in the threads' module, and a way to let all of it through.
class EveryWaitOfThreads {
public:
    EveryWaitOfThreads() { _pool.start(); }

    ~EveryWaitOfThreads() {
        MtAlarmManager::getInstance().deregisterAlarm(_alarm);
        _pool.stop();
    }

    /// Threads wait for the tag, for a task of it, with a time-out, and for a thread's end, while
    /// an alarm is due in half an hour, another manager has none, and of a pool's workers one is
    /// inside a task, one waits for that as a task may, and one has no work.
    void park() {
        _release = std::make_unique<Gate>();
        _requests.incRequestCount(_tag);
        Gate isTaken;
        _pool.submit(_taskTag, [&isTaken, gate = _release.get()] {
            isTaken.open();
            gate->wait();
        });
        isTaken.wait();
        _pool.submit(_helperTag, [this] { _pool.wait(_taskTag); });
        _thread = MtThreadFactory::getInstance().create(
            "waits", MtThreadFunction::create([gate = _release.get()] { gate->wait(); }));
        _thread->start();

        _waiters.emplace_back([this] { _requests.waitRequestCountZero(_tag); });
        _waiters.emplace_back(
            [this] { EXPECT_TRUE(_requests.timedWaitRequestCountZero(_tag, 1000)); });
        _waiters.emplace_back([this] { _pool.wait(_taskTag); });
        _waiters.emplace_back([this] { _thread->join(); });
        setAlarm(1800);
    }

    void letAllThrough() {
        MtAlarmManager::getInstance().deregisterAlarm(_alarm);
        setAlarm(0);
        EXPECT_TRUE(_callback.nbCalls.waitFor(++_nbRounds));
        const RCShdPtr<MtAlarmHandle> once = MtAlarmHandle::create();
        once->setCallback(&_callback);
        EXPECT_TRUE(_emptyManager.registerAlarm(once));
        EXPECT_TRUE(_callback.nbCalls.waitFor(++_nbRounds));
        _release->open();
        _requests.decRequestCount(_tag);
        for (std::thread& waiter : _waiters) waiter.join();
        _waiters.clear();
        _pool.wait(_helperTag);
    }

private:
    std::unique_ptr<Gate> _release;
    CountingCallback _callback;
    RCShdPtr<MtAlarmHandle> _alarm = MtAlarmHandle::create();
    MtRequestMgr _requests;
    const MtRequestTag _tag = _requests.acquireTag();  // the same ones in each round
    MtAlarmManagerImp _emptyManager;
    MtTaskPool _pool{"idle", 3};
    const MtRequestTag _taskTag = _pool.getRequestMgr().acquireTag();
    const MtRequestTag _helperTag = _pool.getRequestMgr().acquireTag();
    ObjPtr<MtThread> _thread;
    std::vector<std::thread> _waiters;
    int _nbRounds = 0;

    void setAlarm(double seconds) {
        _alarm->setCallback(&_callback);
        _alarm->setDuration(seconds);
        EXPECT_TRUE(MtAlarmManager::getInstance().registerAlarm(_alarm));
    }
};

TEST(ThreadWaits, leaveAnIdleProcessIdle) {
    EveryWaitOfThreads waits;
    waits.park();
    waits.letAllThrough();
    waits.park();
    // Those that have just come look for a short while before they sleep: what is asked for is one
    // whole second without work, not that the first one is.
    double used = 1;
    for (int second = 0; second < 5 && used >= 0.1; ++second) {
        const double before = getProcessCpuSeconds();
        std::this_thread::sleep_for(std::chrono::seconds(1));
        used = getProcessCpuSeconds() - before;
    }
    EXPECT_LT(used, 0.1);
    waits.letAllThrough();
}

}  // namespace

}  // namespace Orv

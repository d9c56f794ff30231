// Idle means idle: alarms that are far away or over, a pool without work and a request tag, each
// after an earlier round, use no processor.
#include <chrono>
#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "cpuTime.h"
#include "eventually.h"
#include "gate.h"
#include "mtAlarmManagerImpPrivate.h"
#include "mtTaskPool.h"

namespace Orv {

namespace {

class Counter : public MtAlarmHandle::Callback {
public:
    void performAlarm(const RCShdPtr<MtAlarmHandle>&, bool) override { nbCalls.add(); }

    TestCounter nbCalls;
};

TEST(PoolAndAlarms, leaveAnIdleProcessIdle) {
    Counter counter;
    MtAlarmManagerImp idle, waiting;
    RCShdPtr<MtAlarmHandle> soon = MtAlarmHandle::create();
    RCShdPtr<MtAlarmHandle> late = MtAlarmHandle::create();
    for (const auto& handle : {soon, late}) handle->setCallback(&counter);
    late->setDuration(1000);
    soon->setDuration(0.001);
    ASSERT_TRUE(idle.registerAlarm(soon));
    ASSERT_TRUE(waiting.registerAlarm(late));
    ASSERT_TRUE(counter.nbCalls.waitFor(1));

    MtTaskPool pool("pool", 2, 1);
    pool.start();
    MtRequestMgr& requests = pool.getRequestMgr();
    const MtRequestTag tag = requests.acquireTag();
    for (int i = 0; i < 20; ++i) pool.submit(tag, [] {});
    pool.wait(tag);

    // A worker that waits as a helper, a submitter without room, and two more that wait for the tag.
    const MtRequestTag open = requests.acquireTag();
    requests.incRequestCount(open);
    TestCounter nbThere;
    Gate mayEnd;
    pool.submit(tag, [&] {
        nbThere.add();
        mayEnd.wait();
    });
    pool.submit(tag, [&] {
        nbThere.add();
        pool.wait(open);
    });
    ASSERT_TRUE(nbThere.waitFor(2));
    std::vector<std::jthread> threads;
    threads.emplace_back([&] { pool.wait(tag); });
    threads.emplace_back([&] { requests.waitRequestCountZero(open); });

    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    const double before = getProcessCpuSeconds();
    std::this_thread::sleep_for(std::chrono::seconds(1));
    EXPECT_LT(getProcessCpuSeconds() - before, 0.1);
    requests.decRequestCount(open);
    mayEnd.open();
    threads.clear();
    waiting.deregisterAlarm(late);
}

}  // namespace

}  // namespace Orv

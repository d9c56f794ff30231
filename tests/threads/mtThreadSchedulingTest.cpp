// Levels that threads follow or are given by hand, and processors.
#include <gtest/gtest.h>
#include <memory>

#include "envVar.h"
#include "eventually.h"
#include "expectThrows.h"
#include "lgCollectingSink.h"
#include "mtEx.h"
#include "mtPriorityMgr.h"
#include "mtUtil.h"
#include "priorityRelation.h"
#include "threadTesting.h"

namespace Orv {

namespace {

RtPriorities& rt() {
    return MtPriorityMgr::getInstance().getRtPriorities();
}

TEST(MtThreadScheduling, levelsReadBackRunningOrNot) {
    const ErrandThread running;
    const ObjPtr<MtThread> idle = makeThread("idle", [](MtThread&) {});
    for (MtThread* const thread : {&*running, idle.get()}) {
        EXPECT_EQ(thread->getPriorityLevel(), 3);
        int lastBase = 0;
        for (int level = 0; level <= 6; ++level) {
            thread->setPriorityLevel(level);
            EXPECT_EQ(thread->getPriorityLevel(), level);
            EXPECT_GT(thread->getBasePriority(), lastBase);
            lastBase = thread->getBasePriority();
        }
        EXPECT_THROW(thread->setPriorityLevel(7), ProgramAborted);
        EXPECT_THROW(thread->setPriorityLevel(-1), ProgramAborted);
        EXPECT_EQ(thread->getPriorityLevel(), 6);
        thread->setPriorityLevel(3);
    }
    std::ostringstream text;
    running->dump(text);
    EXPECT_EQ(text.str(), "errand prio 3 NTprio 8 pol RR SYSTEM ex? no exception runon -1\n");
}

TEST(MtThreadScheduling, threadsFollowTheirPriorityFromTheirStartOn) {
    const ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create(
        "device", ObjPtr<MtThreadProtocol>(new ErrandProtocol));
    auto relation = std::make_unique<PriorityRelation>("device==rt", thread->getPriority(),
                                                       PriorityRelation::EQUAL, rt().getRealTime());
    thread->start();
    EXPECT_EQ(thread->getPriorityLevel(), 5);
    const auto follow = [&](Priority& other) {
        relation.reset();
        relation = std::make_unique<PriorityRelation>("device==other", thread->getPriority(),
                                                      PriorityRelation::EQUAL, other);
        MtPriorityMgr::getInstance().update();
    };
    follow(rt().getInterrupt());
    EXPECT_EQ(thread->getPriorityLevel(), 6);
    follow(rt().getBaseLine());
    EXPECT_EQ(thread->getPriorityLevel(), 3);
    relation.reset();
    MtPriorityMgr::getInstance().update();
    EXPECT_EQ(thread->getPriorityLevel(), 3);  // tied to nothing

    follow(rt().getRealTime());
    thread->setPriorityLevel(1);
    follow(rt().getInterrupt());
    EXPECT_EQ(thread->getPriorityLevel(), 1);  // set by hand
    thread->requestStop();
    thread->join();
    thread->start();
    EXPECT_EQ(thread->getPriorityLevel(), 1);
}

class MtThreadSchedulingLog : public LgLogTest {};

TEST_F(MtThreadSchedulingLog, aContradictionKeepsNoThreadFromStartingAndIsTracedOnce) {
    const ObjPtr<MtThread> thread = makeThread("startable", [](MtThread&) {});
    const ObjPtr<MtThread> other = makeThread("other", [](MtThread&) {});
    addSink();
    const auto start = [&] {
        thread->start();
        thread->join();
        registry.flush();
        return sink->takeTexts().size();
    };
    for (int round = 0; round < 2; ++round) {
        const PriorityRelation below("a<b", thread->getPriority(), PriorityRelation::LESS,
                                     other->getPriority());
        {
            const PriorityRelation above("b<a", other->getPriority(), PriorityRelation::LESS,
                                         thread->getPriority());
            EXPECT_EQ(start(), 1u);
            EXPECT_EQ(start(), 0u);
        }
        EXPECT_EQ(start(), 0u);  // solved
    }
}

TEST(MtThreadScheduling, prioritiesMayChangeWhileTheirThreadsStartAndGo) {
    std::atomic<bool> isOver{false};
    std::jthread solver([&] {
        while (!isOver) {
            const Priority passing("passing", MtPriorityMgr::getInstance());
            MtPriorityMgr::getInstance().update();
        }
    });
    for (int round = 0; round < 200; ++round) {
        const ObjPtr<MtThread> thread = makeThread("worker", [](MtThread& self) {
            const PriorityRelation relation("same", self.getPriority(), PriorityRelation::EQUAL,
                                            rt().getBaseLine());
            MtPriorityMgr::getInstance().update();
            self.getPriority().getPriority();
        });
        const PriorityRelation relation("above", rt().getBaseLine(),
                                        PriorityRelation::LESS_OR_EQUAL, thread->getPriority());
        thread->start();
        if (round % 2 == 0) thread->join();
    }
    isOver = true;
}

TEST(MtThreadScheduling, aProcessorThatThereIsNotFailsTheStartAndTheThreadStartsLater) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    const int nbProcessors = mgr.getNbProcessors();
    const ObjPtr<MtThread> thread = makeThread("placed", [](MtThread&) {});
    mgr.setNbProcessors(nbProcessors + 5);
    thread->setProcessorNb(nbProcessors + 4);
    expectAsserts("number < getNumber()", [&] { thread->start(); });
    EXPECT_FALSE(thread->isRunning());
    EXPECT_TRUE(thread->getThreadId().isNull());
    thread->join();
    mgr.setNbProcessors(nbProcessors);
    thread->start();  // the number is out of range now, and has no effect
    thread->join();
    EXPECT_EQ(thread->getProcessorNb(), nbProcessors + 4);
    EXPECT_FALSE(thread->isProcessorPlaceable(nbProcessors));
    EXPECT_FALSE(thread->isProcessorPlaceable(-2));
}

}  // namespace

}  // namespace Orv

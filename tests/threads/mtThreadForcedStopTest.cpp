// The last resort: threads that are ended where they stand.
#include <gtest/gtest.h>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "lkEvent.h"
#include "mtSpecificData.h"
#include "mtSpecificDataRegistry.h"
#include "threadTesting.h"

#if defined(ORV_TEST_SANITIZED)
/// What a thread that is ended by force had is lost: its log queue, its waiter (which a thread before it
/// may have made), and what its body made.
extern "C" const char* __lsan_default_suppressions() {
    return "leak:Orv::LgRegistry::registerThread\nleak:Orv::LkWaiterPool::take\n"
           "leak:MtThreadForcedStop_\n";
}
#endif

namespace Orv {

namespace {

// Threads that leave through the kernel are waited for in vain by the thread sanitizer's own join.
class MtThreadForcedStop : public testing::Test {
protected:
    void SetUp() override {
        if (IS_THREAD_SANITIZED) GTEST_SKIP() << "the sanitizer does not notice such an end";
    }
};

struct CountsDestructions {
    std::atomic<int>& nbDestroyed;
    ~CountsDestructions() { ++nbDestroyed; }
};

TEST_F(MtThreadForcedStop, isForThreadsThatAllowIt) {
    const ErrandThread errand;
    expectAsserts<ProgramAborted>("_cancelable is FALSE!!!", [&] { errand->forceStop(); });
    errand->setCancelable(true);
    errand.run([&] { expectAsserts("!isCurrentThread()", [&] { errand->forceStop(); }); });
    errand->setCancelable(false);
    expectAsserts<ProgramAborted>("_cancelable is FALSE!!!", [&] { errand->forceStop(); });
    const ObjPtr<MtThread> idle = makeThread("idle", [](MtThread&) {});
    idle->setCancelable(true);
    expectAsserts("isRunningNoLock()", [&] { idle->forceStop(); });
}

/// Neither a body that works nor one that waits runs anything more, and the object works on.
TEST_F(MtThreadForcedStop, endsTheThreadWithoutUnwindingAndItMayBeStartedAgain) {
    MtSpecificDataRegistry& registry = MtSpecificDataRegistry::getInstance();
    static std::atomic<int> nbDestroyed{0}, nbDeleted{0};
    struct Value {
        int* number = nullptr;
        ~Value() { ++nbDeleted; }
    };
    const MtSpecificData<Value> slot("slot");
    const std::size_t nbValuesBefore = registry.getNbValues();
    for (const bool doesWait : {true, false}) {
        LkEvent never("never", false);
        std::atomic<std::uint64_t> nbRounds{0};
        std::atomic<int> nbRuns{0};
        std::atomic<int> nbReady{0};
        const ObjPtr<MtThread> thread = makeThread("victim", [&](MtThread&) {
            const CountsDestructions onStack{nbDestroyed};
            EXPECT_EQ(slot.find(), nullptr) << "the value of an earlier thread";
            slot.get();
            if (nbRuns++ == 3) return;
            EXPECT_FALSE(never.timedWait(0.001));
            // From here on it takes nothing along: no lock of the C library, none of the test.
            ++nbReady;
            if (doesWait) never.wait();
            for (;;) ++nbRounds;
        });
        thread->setCancelable(true);
        for (int run = 1; run <= 3; ++run) {
            nbDestroyed = nbDeleted = 0;
            thread->start();
            ASSERT_TRUE(eventually("it is ready", [&] { return nbReady == run; }));
            EXPECT_TRUE(thread->forceStop());
            EXPECT_TRUE(thread->timedJoin(30));
            EXPECT_FALSE(thread->isRunning());
            const std::uint64_t nbRoundsAtEnd = nbRounds;
            EXPECT_EQ(registry.getNbValues(), nbValuesBefore);
            EXPECT_EQ(nbDestroyed, 0);
            EXPECT_EQ(nbDeleted, 0);
            EXPECT_EQ(nbRounds, nbRoundsAtEnd);
        }
        thread->start();
        thread->join();
        EXPECT_EQ(nbDestroyed, 1);
        EXPECT_EQ(nbDeleted, 1);
    }
}

TEST_F(MtThreadForcedStop, releasesThoseWhoJoinAlready) {
    std::atomic<int> nbReady{0};
    const ObjPtr<MtThread> thread = makeThread("victim", [&](MtThread&) {
        for (;;) nbReady = 1;
    });
    thread->setCancelable(true);
    thread->start();
    ASSERT_TRUE(eventually("it is ready", [&] { return nbReady == 1; }));
    TestCounter nbJoined;
    std::vector<std::jthread> joiners;
    for (int i = 0; i < 4; ++i) {
        joiners.emplace_back([&] {
            thread->join();
            nbJoined.add();
        });
    }
    thread->forceStop();
    EXPECT_TRUE(nbJoined.waitFor(4));
}

// The order must not reach a thread that has got the number or the stack of the victim.
TEST_F(MtThreadForcedStop, aThreadThatEndsByItselfMeanwhileTakesNobodyAlong) {
    for (int round = 0; round < 100; ++round) {
        std::atomic<bool> mayLeave{false};
        const ObjPtr<MtThread> victim = makeThread("victim", [&](MtThread&) {
            while (!mayLeave) continue;
        });
        victim->setCancelable(true);
        victim->start();
        mayLeave = true;
        victim->forceStop();
        victim->join();
        std::atomic<int> nbRun{0};
        const ObjPtr<MtThread> next = makeThread("next", [&](MtThread&) { ++nbRun; });
        next->start();
        next->join();
        EXPECT_EQ(nbRun, 1);
    }
}

}  // namespace

}  // namespace Orv

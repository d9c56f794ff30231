#include <gtest/gtest.h>

#include "expectThrows.h"
#include "gate.h"
#include "lkPulse.h"
#include "lkPulsePool.h"
#include "rcEx.h"
#include "waitTesting.h"

namespace Orv {

namespace {

/// A pulse with the mutex of its waiters.
struct Pulsed {
    LkMutex mutex{"mutex"};
    LkPulse pulse;

    explicit Pulsed(LkPulse::WakeType type = LkPulse::WAKE_ONE) : pulse("pulse", type) {}

    bool wait(double seconds) {
        const LkGuard guard(mutex);
        const bool result = pulse.timedWait(guard, seconds);
        EXPECT_TRUE(mutex.isLocked());
        return result;
    }
};

struct PulsedAll : Pulsed {
    PulsedAll() : Pulsed(LkPulse::WAKE_ALL) {}
};

TEST(LkPulse, ofWakeOneEndsAsManyWaitsAsItWasPulsed) {
    Pulsed one;
    one.pulse.pulse();
    one.pulse.pulse();
    EXPECT_EQ(dumpOf(one.pulse), "LkPulse \"pulse\" wakes one, pending 2, waiting 0");
    EXPECT_TRUE(one.wait(0));
    EXPECT_TRUE(one.wait(10));
    EXPECT_FALSE(one.wait(0));
    EXPECT_FALSE(one.wait(0.01));
    one.pulse.pulse();
    one.pulse.reset();
    EXPECT_FALSE(one.wait(0));
}

TEST(LkPulse, ofWakeAllEndsEveryWaitUntilItIsReset) {
    PulsedAll all;
    EXPECT_FALSE(all.wait(0.01));
    all.pulse.pulse();
    for (int i = 0; i < 3; ++i) EXPECT_TRUE(all.wait(i));
    all.pulse.reset();
    EXPECT_FALSE(all.wait(0));
}

TEST(LkPulse, ofWakeAllReleasesThoseWhoWaitedEvenIfItIsResetBeforeTheyRun) {
    constexpr int nbThreads = 16;
    PulsedAll all;
    TestCounter nbWaiting;
    TestCounter nbReleased;
    std::vector<std::jthread> threads;
    for (int i = 0; i < nbThreads; ++i) {
        threads.emplace_back([&] {
            const LkGuard guard(all.mutex);
            nbWaiting.add();
            all.pulse.wait(guard);
            nbReleased.add();
        });
    }
    ASSERT_TRUE(nbWaiting.waitFor(nbThreads));
    {
        const LkGuard guard(all.mutex);  // they have all released it, and are in the queue
        all.pulse.pulse();
        all.pulse.reset();
        EXPECT_FALSE(all.pulse.timedWait(all.mutex, 0));
    }
    EXPECT_TRUE(nbReleased.waitFor(nbThreads));
}

TEST(LkPulse, servesWaitersInTheOrderTheyCame) {
    Pulsed one;
    std::vector<int> order;
    std::vector<std::jthread> threads;
    for (int i = 0; i < 5; ++i) {
        Gate hasMutex;
        threads.emplace_back([&, i] {
            const LkGuard guard(one.mutex);
            hasMutex.open();
            one.pulse.wait(guard);
            order.push_back(i);
        });
        ASSERT_TRUE(hasMutex.wait());
        const LkGuard guard(one.mutex);  // free again once the thread is in the queue
    }
    for (std::jthread& thread : threads) {
        one.pulse.pulse();
        thread.join();
    }
    EXPECT_EQ(order, (std::vector{0, 1, 2, 3, 4}));
}

TEST(LkPulse, losesAndInventsNothingWherePulsesMeetTimeOuts) {
    Pulsed one;
    int nbMet = 0;
    for (int round = 0; round < 300; ++round) {
        std::atomic<bool> hasPulse{false};
        std::jthread waiter([&] { hasPulse = one.wait(0.001); });
        std::this_thread::sleep_for(std::chrono::microseconds(1000 + 10 * (round % 20)));
        one.pulse.pulse();
        waiter.join();
        nbMet += hasPulse;
        ASSERT_EQ(one.wait(0), !hasPulse) << "round " << round;
        ASSERT_FALSE(one.wait(0)) << "round " << round;
    }
    RecordProperty("waits that the pulse reached", nbMet);
}

TEST(LkPulse, losesNothingAmong64Threads) {
    Pulsed one;
    std::atomic<int> nbTaken{0};
    onThreads(64, [&](int thread) {
        for (int i = 0; i < 200; ++i) {
            if (thread % 2 == 0) {
                one.pulse.pulse();
            } else {
                const LkGuard guard(one.mutex);
                one.pulse.wait(guard);
                ++nbTaken;
            }
        }
    });
    EXPECT_EQ(nbTaken, 32 * 200);
    EXPECT_FALSE(one.wait(0));
}

TEST(LkPulse, givesTheMutexToOthersAlsoWhenItNeedNotWait) {
    PulsedAll all;
    all.pulse.pulse();
    bool isDone = false;
    Gate isLooping;
    std::jthread other([&] {
        isLooping.wait();
        const LkGuard guard(all.mutex);
        isDone = true;
    });
    const LkGuard guard(all.mutex);
    isLooping.open();
    // Nobody re-arms the pulse: each wait returns at once, and still the other one has its turn.
    while (!isDone) all.pulse.wait(guard);
    EXPECT_TRUE(isDone);
}

void waitWithoutHoldingTheMutexOnce(Pulsed& one, double seconds) ORV_NO_THREAD_SAFETY_ANALYSIS {
    EXPECT_THROW(one.pulse.timedWait(one.mutex, seconds), AssertionFailed);
    const LkGuard guard(one.mutex);
    const LkGuard again(one.mutex);
    EXPECT_THROW(one.pulse.timedWait(guard, seconds), AssertionFailed);
    EXPECT_TRUE(one.mutex.isLocked());
    std::jthread other([&]() ORV_NO_THREAD_SAFETY_ANALYSIS {
        EXPECT_THROW(one.pulse.timedWait(one.mutex, seconds), AssertionFailed);
        EXPECT_FALSE((LkGuard(one.mutex, TRY).isLocked()));
    });
}

TEST(LkPulse, assertsThatTheCallerHoldsTheMutexExactlyOnce) {
    for (const double seconds : {0.0, 10.0}) {
        Pulsed one;
        waitWithoutHoldingTheMutexOnce(one, seconds);
        EXPECT_EQ(dumpOf(one.pulse), "LkPulse \"pulse\" wakes one, pending 0, waiting 0");
    }
}

template <class Object>
class LkPulses : public testing::Test {};
using PulseTypes = testing::Types<Pulsed, PulsedAll>;
TYPED_TEST_SUITE(LkPulses, PulseTypes);

TYPED_TEST(LkPulses, mayBeDestroyedByTheThreadWhoseWaitHasReturned) {
    destroyAfterEachWait<TypeParam>(
        3000,
        [](TypeParam& object, auto publish) {
            const LkGuard guard(object.mutex);
            publish();
            object.pulse.wait(guard);
        },
        [](TypeParam& object) { object.pulse.pulse(); });
}

TEST(LkPulsePool, handsOutWhatWasRecycledAsIfItWereNew) {
    LkPulsePool pool;
    ObjPtr<LkPulse> pulse = pool.getPulse();
    LkPulse* const first = pulse.get();
    EXPECT_STREQ(first->getName(), "LkPulsePool_pulse");
    first->pulse();
    pool.recyclePulse(pulse);
    EXPECT_TRUE(pulse.isNull());
    EXPECT_THROW(pool.recyclePulse(pulse), RCEx::ExNullPtr);
    ObjPtr<LkPulse> again = pool.getPulse();
    EXPECT_EQ(again.get(), first);
    EXPECT_EQ(dumpOf(*again), "LkPulse \"LkPulsePool_pulse\" wakes all, pending 0, waiting 0");

    ObjPtr<LkPulse> foreign(new LkPulse("foreign", LkPulse::WAKE_ONE));
    expectAsserts("pulse wakes all", [&] { pool.recyclePulse(foreign); });
    EXPECT_FALSE(foreign.isNull());
}

TEST(LkPulsePool, givesEachPulseToOneOf64Threads) {
    LkPulsePool pool;
    std::atomic<int> nbTaken{0};
    onThreads(64, [&](int) {
        for (int i = 0; i < 100; ++i) {
            ObjPtr<LkPulse> pulse = pool.getPulse();
            nbTaken += dumpOf(*pulse).find("pending 0") != std::string::npos;
            pulse->pulse();
            pool.recyclePulse(pulse);
        }
    });
    EXPECT_EQ(nbTaken, 64 * 100);
}

}  // namespace

}  // namespace Orv

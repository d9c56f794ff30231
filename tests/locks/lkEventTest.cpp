#include <gtest/gtest.h>

#include "eventually.h"
#include "gate.h"
#include "lkEvent.h"
#include "waitTesting.h"

namespace Orv {

namespace {

bool waitForWaiters(const LkEvent& event, int nbWaiters) {
    const std::string text = "waiting " + std::to_string(nbWaiters);
    return eventually("the threads wait", [&] { return dumpOf(event).ends_with(text); });
}

TEST(LkEvent, letsThroughWhileItIsSetAndHoldsBackWhileItIsNot) {
    LkEvent event("door", true);
    event.wait();
    EXPECT_TRUE(event.timedWait(0));
    EXPECT_EQ(dumpOf(event), "LkEvent \"door\" set, waiting 0");
    event.reset();
    EXPECT_FALSE(event.timedWait(0));
    const auto start = std::chrono::steady_clock::now();
    EXPECT_FALSE(event.timedWait(0.02));
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(20));
    event.set();
    event.set();
    EXPECT_TRUE(event.timedWait(0));
    event.reset();
    EXPECT_EQ(dumpOf(event), "LkEvent \"door\" not set, waiting 0");
}

TEST(LkEvent, setFollowedAtOnceByResetReleasesEveryThreadThatWaited) {
    constexpr int nbRounds = 100;
    constexpr int nbThreads = 8;
    LkEvent event("door", false);
    TestCounter nbPassed;
    TestCounter nextRound;
    std::vector<std::jthread> threads;
    for (int i = 0; i < nbThreads; ++i) {
        threads.emplace_back([&] {
            for (int round = 0; round < nbRounds; ++round) {
                event.wait();
                nbPassed.add();
                if (!nextRound.waitFor(round + 1)) return;  // a quick one must not pass twice
            }
        });
    }
    for (int round = 0; round < nbRounds; ++round) {
        EXPECT_TRUE(waitForWaiters(event, nbThreads));
        event.set();
        event.reset();
        EXPECT_TRUE(nbPassed.waitFor((round + 1) * nbThreads));
        nextRound.add();
    }
    threads.clear();
    EXPECT_EQ(nbPassed.get(), nbRounds * nbThreads);
    EXPECT_FALSE(event.timedWait(0));
}

TEST(LkEvent, aWaitReturnsTrueExactlyIfASetReachedIt) {
    LkEvent event("door", false);
    for (int round = 0; round < 300; ++round) {
        bool hasPassed = false;
        std::jthread waiter([&] { hasPassed = event.timedWait(0.001); });
        std::this_thread::sleep_for(std::chrono::microseconds(1000 + 10 * (round % 20)));
        event.set();
        event.reset();
        waiter.join();
        // Whichever came first, nothing is left of either.
        ASSERT_FALSE(event.timedWait(0)) << "round " << round << ", passed " << hasPassed;
        ASSERT_EQ(dumpOf(event), "LkEvent \"door\" not set, waiting 0");
    }
}

TEST(LkEvent, isSeenWithWhatWasWrittenBeforeBy64Threads) {
    LkEvent event("door", false);
    int data = 0;
    std::atomic<int> nbRight{0};
    onThreads(64, [&](int thread) {
        if (thread == 0) {
            data = 42;
            event.set();
        } else {
            event.wait();
            nbRight += data == 42;
        }
    });
    EXPECT_EQ(nbRight, 63);
}

TEST(LkEvent, mayBeDestroyedByTheThreadWhoseWaitHasReturned) {
    struct Event : LkEvent {
        Event() : LkEvent("door", false) {}
    };
    destroyAfterEachWait<Event>(
        3000,
        [](Event& event, auto publish) {
            publish();
            event.wait();
        },
        [](Event& event) { event.set(); });
}

}  // namespace

}  // namespace Orv

#include <gtest/gtest.h>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "lkGate.h"
#include "lkGateKeeperGuard.h"
#include "rcEx.h"
#include "waitTesting.h"

namespace Orv {

namespace {

bool waitForReady(const LkGate& gate, int numReady) {
    const std::string text = "num ready: " + std::to_string(numReady) + "\n";
    return eventually("the threads stand at the gate",
                      [&] { return dumpOf(gate).find(text) != std::string::npos; });
}

TEST(LkGate, opensWhenAllHaveMetAndNotBefore) {
    LkGate gate("gate", 3, false);
    TestCounter nbThrough;
    std::vector<std::jthread> threads;
    for (int i = 1; i <= 2; ++i) {
        threads.emplace_back([&] {
            gate.ready();
            nbThrough.add();
        });
        ASSERT_TRUE(waitForReady(gate, i));
    }
    EXPECT_EQ(nbThrough.get(), 0);
    gate.ready();
    EXPECT_TRUE(nbThrough.waitFor(2));
    EXPECT_EQ(dumpOf(gate),
              "gate: gatekeeper: no, num gatees: 3\n"
              "Current state: num ready: 0\n"
              "Internal lock: LkMutex \"GateInternal\" holder " +
                  dumpOf(gate).substr(dumpOf(gate).find("holder ") + 7));
    EXPECT_NE(dumpOf(gate).find("\nGatekeeper sema: unused\n"), std::string::npos);
    EXPECT_FALSE(gate.isGateReady());
}

TEST(LkGate, keepsEightThreadsInStepOverAThousandRounds) {
    constexpr int nbThreads = 8;
    constexpr int nbRounds = 1000;
    LkGate gate("gate", nbThreads, false);
    std::atomic<int> nbArrived{0};
    std::atomic<int> nbOutOfStep{0};
    std::atomic<bool> isOver{false};
    std::atomic<int> nbObserved{0};
    std::vector<std::jthread> observers;
    for (int i = 0; i < 2; ++i) {
        observers.emplace_back([&] {
            while (!isOver) {
                gate.observeGateReady();
                ++nbObserved;
            }
        });
    }
    onThreads(nbThreads, [&](int) {
        for (int round = 1; round <= nbRounds; ++round) {
            ++nbArrived;
            gate.ready();
            // All of this round are here, and none of the one after the next.
            const int arrived = nbArrived;
            if (arrived < round * nbThreads || arrived > (round + 1) * nbThreads) ++nbOutOfStep;
        }
    });
    isOver = true;
    onThreads(nbThreads, [&](int) { gate.ready(); });  // for observers that wait again
    observers.clear();
    EXPECT_EQ(nbOutOfStep, 0);
    EXPECT_GE(nbObserved, 2);
}

TEST(LkGate, meets64Threads) {
    LkGate gate("gate", 64, false);
    int data = 0;
    std::atomic<int> nbRight{0};
    onThreads(64, [&](int thread) {
        for (int round = 0; round < 10; ++round) {
            if (thread == round) data = round + 1;
            gate.ready();
            nbRight += data == round + 1;
            gate.ready();
        }
    });
    EXPECT_EQ(nbRight, 64 * 10);
}

TEST(LkGate, holdsAllForTheGatekeeperOverManyRounds) {
    LkGate gate("gate", 2, true);
    std::atomic<int> nbThrough{0};
    std::vector<std::jthread> threads;
    for (int i = 0; i < 2; ++i) {
        threads.emplace_back([&] {
            for (int round = 0; round < 100; ++round) {
                gate.ready();
                ++nbThrough;
            }
        });
    }
    ASSERT_TRUE(eventually("both are ready", [&] { return gate.isGateReady(); }));
    EXPECT_TRUE(gate.isGateReady()) << "asking takes nothing away";
    EXPECT_NE(dumpOf(gate).find("gatekeeper: yes"), std::string::npos);
    EXPECT_NE(dumpOf(gate).find("Gatekeeper sema: set\n"), std::string::npos);
    expectAsserts("_numReady < _numGatees", [&] { gate.ready(); });
    gate.observeGateReady();
    for (int round = 0; round < 100; ++round) {
        const LkGateKeeperGuard guard(gate);
        ASSERT_FALSE(gate.isGateReady());
        ASSERT_EQ(nbThrough % 2, 0);
        ASSERT_EQ(nbThrough, 2 * round);
        gate.observeGateReady();  // full for as long as the guard lives
    }
    threads.clear();
    EXPECT_EQ(nbThrough, 200);
    EXPECT_NE(dumpOf(gate).find("Gatekeeper sema: not set\n"), std::string::npos);
}

TEST(LkGate, tellsObserversOfARoundThatIsOverWhenTheyRun) {
    LkGate gate("gate", 1, false);
    for (int round = 0; round < 200; ++round) {
        std::atomic<bool> hasSeen{false};
        std::jthread observer([&] {
            gate.observeGateReady();
            hasSeen = true;
        });
        // The observer may begin to wait at any moment; the next round reaches it at the latest.
        while (!hasSeen) gate.ready();
    }
}

TEST(LkGate, refusesWhatMakesNoSense) {
    expectAsserts("numGatees > 0", [] { LkGate gate("gate", 0, false); });
    expectAsserts("numGatees > 0", [] { LkGate gate("gate", -1, true); });
    LkGate open("gate", 1, false);
    expectAsserts("_useGateKeeper", [&] { const LkGateKeeperGuard guard(open); });
}

TEST(LkGate, aCopyTakesTheGateOver) {
    LkGate first("gate", 2, false);
    LkGate gate(first);
    EXPECT_THROW(first.ready(), RCEx::ExNullPtr);
    onThreads(2, [&](int) { gate.ready(); });
    EXPECT_STREQ(gate.getName(), "gate");
}

}  // namespace

}  // namespace Orv

#include <gtest/gtest.h>

#include "expectThrows.h"
#include "gate.h"
#include "lkCondVar.h"
#include "lkCondVarAttr.h"
#include "waitTesting.h"

namespace Orv {

namespace {

struct Shared {
    LkMutex mutex{"mutex"};
    LkCondVar condVar{"condition", LkCondVarAttr::getDefaultAttr()};
    bool isReady = false;

    bool wait(double seconds) {
        const LkGuard guard(mutex);
        return condVar.timedWait(guard, seconds);
    }
};

/// Threads that wait at the condition variable, each once.
class Waiters {
public:
    Waiters(Shared& shared, int nbThreads, double seconds) : _shared(shared) {
        for (int i = 0; i < nbThreads; ++i) {
            _threads.emplace_back([this, seconds] {
                const LkGuard guard(_shared.mutex);
                _nbWaiting.add();
                const bool result = _shared.condVar.timedWait(guard, seconds);
                _nbTrue += result;
                _nbReturned.add();
            });
        }
        EXPECT_TRUE(_nbWaiting.waitFor(nbThreads));
        const LkGuard guard(_shared.mutex);  // free once the last one is in the queue
    }

    void join() { _threads.clear(); }
    int getNbTrue() const { return _nbTrue; }
    TestCounter& getReturned() { return _nbReturned; }

private:
    Shared& _shared;
    TestCounter _nbWaiting;
    TestCounter _nbReturned;
    std::atomic<int> _nbTrue{0};
    std::vector<std::jthread> _threads;
};

TEST(LkCondVar, forgetsSignalsThatNobodyWaitsFor) {
    Shared shared;
    shared.condVar.signal();
    {
        const LkGuard guard(shared.mutex);
        shared.condVar.broadcast();
    }
    const auto start = std::chrono::steady_clock::now();
    EXPECT_FALSE(shared.wait(0.02));
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(20));
    EXPECT_FALSE(shared.wait(0));
    EXPECT_EQ(dumpOf(shared.condVar), "LkCondVar \"condition\" waiting 0");
}

TEST(LkCondVar, signalReleasesOneThreadAndNeverOneThatComesLater) {
    Shared shared;
    Waiters waiters(shared, 3, 1000);
    {
        const LkGuard guard(shared.mutex);
        shared.condVar.signal();
        shared.condVar.signal();
        // This wait begins while both signals are on their way to the others.
        EXPECT_FALSE(shared.condVar.timedWait(guard, 0.02));
    }
    EXPECT_TRUE(waiters.getReturned().waitFor(2));
    EXPECT_EQ(dumpOf(shared.condVar), "LkCondVar \"condition\" waiting 1");
    shared.condVar.signal();
    waiters.join();
    EXPECT_EQ(waiters.getNbTrue(), 3);
    EXPECT_FALSE(shared.wait(0.01));
}

TEST(LkCondVar, broadcastReleasesAllWhoWaitAndTheyHoldTheMutexInTurn) {
    Shared shared;
    Waiters waiters(shared, 64, 1000);
    {
        const LkGuard guard(shared.mutex);
        shared.condVar.broadcast();
        EXPECT_EQ(dumpOf(shared.condVar), "LkCondVar \"condition\" waiting 0");
        EXPECT_EQ(waiters.getNbTrue(), 0);  // the mutex is still held here
    }
    waiters.join();
    EXPECT_EQ(waiters.getNbTrue(), 64);
}

TEST(LkCondVar, broadcastThatMeetsTimeOutsLosesNobodyAndLeavesNothingBehind) {
    for (int round = 0; round < 60; ++round) {
        Shared shared;
        Waiters patient(shared, 2, 1000);
        Waiters hasty(shared, 4, 0.001);
        std::this_thread::sleep_for(std::chrono::microseconds(20 * (round % 50)));
        {
            const LkGuard guard(shared.mutex);
            shared.condVar.broadcast();
        }
        patient.join();
        hasty.join();
        ASSERT_EQ(patient.getNbTrue(), 2);
        ASSERT_FALSE(shared.wait(0.001)) << "round " << round;
    }
}

TEST(LkCondVar, signalThatMeetsATimeOutEndsThatWaitOrNone) {
    Shared shared;
    for (int round = 0; round < 300; ++round) {
        std::jthread waiter([&] { static_cast<void>(shared.wait(0.001)); });
        std::this_thread::sleep_for(std::chrono::microseconds(1000 + 10 * (round % 20)));
        shared.condVar.signal();
        shared.condVar.signal();
        waiter.join();
        ASSERT_FALSE(shared.wait(0)) << "round " << round;
        ASSERT_FALSE(shared.wait(0.001)) << "round " << round;
    }
}

TEST(LkCondVar, handsOverAmong64Threads) {
    Shared shared;
    int nbItems = 0;
    int nbTaken = 0;
    onThreads(64, [&](int thread) {
        for (int i = 0; i < 200; ++i) {
            const LkGuard guard(shared.mutex);
            if (thread % 2 == 0) {
                ++nbItems;
                shared.condVar.signal();
            } else {
                while (nbItems == 0) shared.condVar.wait(guard);
                --nbItems;
                ++nbTaken;
            }
        }
    });
    EXPECT_EQ(nbTaken, 32 * 200);
    EXPECT_EQ(nbItems, 0);
}

void waitWithTheMutexHeldNotAtAllOrTwice(Shared& shared) ORV_NO_THREAD_SAFETY_ANALYSIS {
    EXPECT_THROW(shared.condVar.wait(shared.mutex), AssertionFailed);
    const LkGuard guard(shared.mutex);
    const LkGuard again(shared.mutex);
    EXPECT_THROW(shared.condVar.wait(guard), AssertionFailed);
    EXPECT_TRUE(shared.mutex.isLocked());
}

TEST(LkCondVar, assertsThatTheCallerHoldsTheMutexExactlyOnce) {
    Shared shared;
    waitWithTheMutexHeldNotAtAllOrTwice(shared);
    EXPECT_EQ(dumpOf(shared.condVar), "LkCondVar \"condition\" waiting 0");
}

TEST(LkCondVar, mayBeDestroyedByAWaiterThatWasSignalledWithTheMutexHeld) {
    destroyAfterEachWait<Shared>(
        3000,
        [](Shared& shared, auto publish) {
            const LkGuard guard(shared.mutex);
            publish();
            while (!shared.isReady) shared.condVar.wait(guard);
        },
        [](Shared& shared) {
            const LkGuard guard(shared.mutex);
            shared.isReady = true;
            shared.condVar.signal();
        });
}

TEST(LkCondVar, mayBeDestroyedByAWaiterThatWasSignalledWithoutTheMutex) {
    destroyAfterEachWait<Shared>(
        3000,
        [](Shared& shared, auto publish) {
            const LkGuard guard(shared.mutex);
            publish();
            shared.condVar.wait(guard);
        },
        [](Shared& shared) {
            {
                const LkGuard guard(shared.mutex);
            }  // free once the thread is in the queue
            shared.condVar.signal();
        });
}

}  // namespace

}  // namespace Orv

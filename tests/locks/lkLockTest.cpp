#include "cpuTime.h"
#include "expectThrows.h"
#include "gate.h"
#include "lkLock.h"
#include "lkMutex.h"
#include "lkMutexAttr.h"
#include "lkRecLock.h"
#include "lkThreadId.h"
#include "lockTesting.h"

namespace Orv {

namespace {

/// What every lock promises, and the platform's class below it.
template <class Lock>
class AnyLock : public testing::Test {};

using AnyLocks =
    testing::Types<LkLock, LkRecLock, LkMutex, LkLockNative, LkRecLockNative, LkMutexNative>;
TYPED_TEST_SUITE(AnyLock, AnyLocks);

TYPED_TEST(AnyLock, letsOneThreadInAtATimeAndShowsItWhatTheOthersDid) {
    constexpr int nbThreads = 16;
    constexpr int nbRounds = 4000;
    TypeParam lock("shared");
    long count = 0;
    bool isInside = false;
    int nbMeetings = 0;
    std::vector<std::jthread> threads;
    for (int i = 0; i < nbThreads; ++i) {
        threads.emplace_back([&] {
            for (int round = 0; round < nbRounds; ++round) {
                whileHolding(lock, [&] {
                    if (std::exchange(isInside, true)) ++nbMeetings;
                    ++count;
                    isInside = false;
                });
            }
        });
    }
    threads.clear();
    EXPECT_EQ(count, long{nbThreads} * nbRounds);
    EXPECT_EQ(nbMeetings, 0);
    EXPECT_FALSE(lock.isLocked());
}

TYPED_TEST(AnyLock, sleepsWhileAnotherThreadHoldsIt) {
    constexpr int nbWaiters = 4;
    TypeParam lock("long");
    TestCounter ready;
    std::vector<std::jthread> waiters;
    whileHolding(lock, [&] {
        for (int i = 0; i < nbWaiters; ++i) {
            waiters.emplace_back([&] {
                ready.add();
                whileHolding(lock, [] {});
            });
        }
        ready.waitFor(nbWaiters);
        const double before = getProcessCpuSeconds();
        std::this_thread::sleep_for(std::chrono::milliseconds(400));
        EXPECT_LT(getProcessCpuSeconds() - before, 0.1);
    });
}

TYPED_TEST(AnyLock, takenAgainByItsOwnerNeedsAsManyUnlocks) {
    TypeParam lock("nested");
    bool isReleased = false;
    std::jthread other;
    whileHolding(lock, [&] {
        whileHolding(lock, [&] { whileHolding(lock, [] {}); });
        EXPECT_TRUE(lock.isLocked());
        other = std::jthread([&] { whileHolding(lock, [&] { EXPECT_TRUE(isReleased); }); });
        // Time for the other to get in, if the lock is free already.
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        isReleased = true;
    });
    other.join();
    EXPECT_FALSE(lock.isLocked());
}

TYPED_TEST(AnyLock, refusesToBeReleasedByAThreadThatDoesNotHoldIt) {
    TypeParam lock("foreign");
    if constexpr (requires { lock.unlock(); }) {
        EXPECT_THROW(lock.unlock(), AssertionEx);
    }
    whileHolding(lock, [&](auto& guard) {
        onAnotherThread([&] { EXPECT_THROW(release(guard), AssertionEx); });
        EXPECT_TRUE(guard.isLocked() && lock.isLocked());
        std::jthread other([&] { whileHolding(lock, [] {}); });
        std::this_thread::sleep_for(std::chrono::milliseconds(20));  // time to get in wrongly
        EXPECT_TRUE(lock.isLocked());
        release(guard);
        other.join();
        EXPECT_FALSE(lock.isLocked());
    });
}

TYPED_TEST(AnyLock, mayBeDestroyedByWhoeverWaitedForItWhileItsUnlockStillRuns) {
    constexpr int nbRounds = 3000;
    TypeParam* next = nullptr;
    TestCounter nbOffered;
    TestCounter nbTaken;
    std::jthread holder([&] {
        for (int round = 1; round <= nbRounds && nbOffered.waitFor(round); ++round) {
            whileHolding(*next, [&] {
                nbTaken.add();
                // Let the other fall asleep now and then; else it is still looking.
                if (round % 16 == 0) std::this_thread::sleep_for(std::chrono::microseconds(200));
            });
        }
    });
    for (int round = 1; round <= nbRounds; ++round) {
        const auto lock = std::make_unique<TypeParam>("mortal");
        next = lock.get();
        nbOffered.add();
        if (!nbTaken.waitFor(round)) break;
        whileHolding(*lock, [] {});
    }
    EXPECT_EQ(nbTaken.get(), nbRounds);
}

TEST(LkLock, printsItself) {
    std::ostringstream text;
    LkLock("queue").dump(text);
    EXPECT_EQ(text.str(), "Critical section \"queue");
}

template <class Lock>
class AnyRecLock : public testing::Test {};

using AnyRecLocks = testing::Types<LkRecLock, LkRecLockNative>;
TYPED_TEST_SUITE(AnyRecLock, AnyRecLocks);

template <class Lock>
std::string textOf(const Lock& lock) {
    std::ostringstream text;
    lock.dump(text);
    return text.str();
}

TYPED_TEST(AnyRecLock, countsItsLocksAndForgetsItsHolderAtTheFirstUnlock) {
    TypeParam lock("tree");
    const std::string self = std::to_string(LkThreadId(LkThreadId::CURRENT_THREAD).getNum());
    EXPECT_EQ(textOf(lock), "name tree holder 0 count 0");
    whileHolding(lock, [&] {
        whileHolding(lock,
                     [&] { EXPECT_EQ(textOf(lock), "name tree holder " + self + " count 2"); });
        EXPECT_EQ(textOf(lock), "name tree holder 0 count 1");
    });
    EXPECT_EQ(textOf(lock), "name tree holder 0 count 0");
}

TYPED_TEST(AnyRecLock, tellsItsHolderFromOtherThreads) {
    TypeParam lock("tree");
    EXPECT_FALSE(lock.isLocked() || lock.isLockedByThread());
    whileHolding(lock, [&] {
        EXPECT_TRUE(lock.isLocked() && lock.isLockedByThread());
        onAnotherThread([&] { EXPECT_TRUE(lock.isLocked() && !lock.isLockedByThread()); });
    });
    EXPECT_FALSE(lock.isLocked() || lock.isLockedByThread());
}

}  // namespace

}  // namespace Orv

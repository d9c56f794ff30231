#include "expectThrows.h"
#include "gate.h"
#include "lkEx.h"
#include "lkMutex.h"
#include "lkMutexAttr.h"
#include "lkThreadId.h"
#include "lockTesting.h"

namespace Orv {

namespace {

// How the platform's class names itself and the calls that failed.
#if defined(_WIN32)
constexpr const char* nativeName = "LkMutexWindows";
constexpr const char* abandonedText = "::WaitForSingleObject( _mutex, INFINITE ) == WAIT_OBJECT_0";
constexpr const char* notOwnerText = "::ReleaseMutex( _mutex )";
#else
constexpr const char* nativeName = "LkMutexPosix";
constexpr const char* abandonedText = "_futex.lock( WATCH_OWNER )";
constexpr const char* notOwnerText = "_futex.unlock()";
#endif

template <class Mutex>
class AnyMutex : public testing::Test {};

using AnyMutexes = testing::Types<LkMutex, LkMutexNative>;
TYPED_TEST_SUITE(AnyMutex, AnyMutexes);

TYPED_TEST(AnyMutex, isNotTriedInVainWithoutSayingSo) {
    TypeParam mutex("M");
    EXPECT_TRUE(isFreeToOthers(mutex));
    whileHolding(mutex, [&] {
        EXPECT_FALSE(isFreeToOthers(mutex));
        {
            const GuardOf<TypeParam> again(mutex, TRY);
            EXPECT_FALSE(again.isLocked());
        }
        EXPECT_TRUE(mutex.isLocked());
    });
    EXPECT_TRUE(isFreeToOthers(mutex));
    {
        const GuardOf<TypeParam> first(mutex, TRY);
        EXPECT_TRUE(first.isLocked() && mutex.isLocked());
        EXPECT_FALSE(isFreeToOthers(mutex));
    }
    EXPECT_FALSE(mutex.isLocked());
}

TYPED_TEST(AnyMutex, callsSpinningForOneselfADeadlockAndStaysHeldOnce) {
    TypeParam mutex("100% \"M\"");
    const std::string reason =
        std::string(nativeName) + " \"100% \"M\"\" deadlocked in thread 0x0 (self deadlock)";
    whileHolding(mutex, [&] {
        for (const unsigned tries : {0u, 1u, 7u}) {
            expectThrows<LkEx::ExDeadLock>(
                reason, [&] { const GuardOf<TypeParam> again(mutex, SPIN, tries); });
        }
        EXPECT_TRUE(mutex.isLocked());
        EXPECT_FALSE(isFreeToOthers(mutex));
    });
    EXPECT_TRUE(isFreeToOthers(mutex));
}

TYPED_TEST(AnyMutex, isHadBySpinningWhenItIsFreeAndWhenItBecomesSo) {
    TypeParam mutex("M");
    long count = 0;
    std::vector<std::jthread> threads;
    for (const unsigned tries : {0u, 1u, 2u, 1000u}) {
        threads.emplace_back([&mutex, &count, tries] {
            for (int round = 0; round < 5000; ++round) {
                const GuardOf<TypeParam> guard(mutex, SPIN, tries);
                ASSERT_TRUE(guard.isLocked());
                ++count;
            }
        });
    }
    threads.clear();
    EXPECT_EQ(count, 4 * 5000);
    EXPECT_TRUE(isFreeToOthers(mutex));
}

TYPED_TEST(AnyMutex, ofAThreadThatEndedIsAnErrorOnceAndThenFree) {
    TypeParam mutex("orphan");
    onAnotherThread([&] {
        takeForEver(mutex);
        takeForEver(mutex);
    });
    EXPECT_FALSE(isFreeToOthers(mutex));
    EXPECT_TRUE(mutex.isLocked());

    expectAsserts<SysAssertionFailed>(abandonedText, [&] { whileHolding(mutex, [] {}); });
    EXPECT_FALSE(mutex.isLocked());
    EXPECT_TRUE(isFreeToOthers(mutex));
    whileHolding(mutex, [&] {
        const GuardOf<TypeParam> again(mutex, TRY);
        EXPECT_FALSE(again.isLocked());
    });
    EXPECT_FALSE(mutex.isLocked());
}

TYPED_TEST(AnyMutex, ofAThreadThatEndedLetsEveryWaiterGoOn) {
    TypeParam mutex("orphan");
    std::atomic<int> nbErrors{0};
    std::vector<std::jthread> waiters;
    TestCounter ready;
    onAnotherThread([&] {
        takeForEver(mutex);
        for (int i = 0; i < 6; ++i) {
            waiters.emplace_back([&, usesSpin = i % 2 == 0] {
                ready.add();
                try {
                    if (usesSpin) {
                        const GuardOf<TypeParam> guard(mutex, SPIN, 3);
                    } else {
                        whileHolding(mutex, [] {});
                    }
                } catch (const SysAssertionFailed&) {
                    ++nbErrors;
                }
            });
        }
        ready.waitFor(6);
    });
    waiters.clear();
    EXPECT_EQ(nbErrors, 1);
    EXPECT_TRUE(isFreeToOthers(mutex));
}

TYPED_TEST(AnyMutex, saysWhichCallFailedWhenReleasedByAnotherThread) {
    TypeParam mutex("M");
    whileHolding(mutex, [&](auto& guard) {
        onAnotherThread(
            [&] { expectAsserts<SysAssertionFailed>(notOwnerText, [&] { release(guard); }); });
        EXPECT_FALSE(isFreeToOthers(mutex));
    });
    EXPECT_TRUE(isFreeToOthers(mutex));
}

TEST(LkMutexNative, toldToRelockHoldsItEvenAfterAThreadThatEnded) {
    LkMutexNative mutex("orphan");
    onAnotherThread([&] { takeForEver(mutex); });
    EXPECT_FALSE(mutex.isHeldOnceByCaller());
    mutex.relock();
    EXPECT_TRUE(mutex.isHeldOnceByCaller());
    EXPECT_FALSE(isFreeToOthers(mutex));
    mutex.lock();
    EXPECT_FALSE(mutex.isHeldOnceByCaller());
    mutex.unlock();
    EXPECT_TRUE(mutex.isHeldOnceByCaller());
    onAnotherThread([&] { EXPECT_FALSE(mutex.isHeldOnceByCaller()); });
    mutex.unlock();
    EXPECT_FALSE(mutex.isHeldOnceByCaller());
    EXPECT_TRUE(isFreeToOthers(mutex));
}

/// A mutex that its guard, destroyed after it, may still name.
struct DestroyedWhileHeld {
    alignas(LkMutex) std::byte room[sizeof(LkMutex)];
    LkMutex& mutex = *new (room) LkMutex("M");
};

TEST(LkMutex, destroyedWhileHeldIsAnAssertion) {
    DestroyedWhileHeld victim;
    takeForEver(victim.mutex);
    expectAsserts("!_isLocked", [&] { victim.mutex.~LkMutex(); });
}

TEST(LkMutex, destroyedWhileHeldDoesNotDisturbAnExceptionOnItsWay) {
    testing::internal::CaptureStderr();
    EXPECT_THROW(
        {
            LkMutex mutex("M");
            takeForEver(mutex);
            throw std::out_of_range("first");
        },
        std::out_of_range);
    EXPECT_THAT(testing::internal::GetCapturedStderr(), testing::HasSubstr("!_isLocked"));
}

TEST(LkMutex, printsItsNameAndHolder) {
    LkMutex mutex("M", LkMutexAttr::getDefaultAttr());
    const auto text = [&] {
        std::ostringstream stream;
        mutex.dump(stream);
        return stream.str();
    };
    EXPECT_EQ(text(), "LkMutex \"M\" holder 0 count 0");
    whileHolding(mutex, [&] {
        std::ostringstream expected;
        expected << "LkMutex \"M\" holder " << LkThreadId(LkThreadId::CURRENT_THREAD) << " count 1";
        EXPECT_EQ(text(), expected.str());
    });
    EXPECT_EQ(text(), "LkMutex \"M\" holder 0 count 0");
}

}  // namespace

}  // namespace Orv

#include <cmath>
#include <gtest/gtest.h>

#include "expectThrows.h"
#include "lkCondVarAttr.h"
#include "lkMutexAttr.h"
#include "lkNamedSema.h"
#include "lkSema.h"
#include "lkUnnamedSema.h"
#include "waitTesting.h"

namespace Orv {

namespace {

struct UnnamedSema : LkUnnamedSema {
    explicit UnnamedSema(unsigned count = 0) : LkUnnamedSema("test", count) {}
};

struct SleepingSema : LkUnnamedSema {
    explicit SleepingSema(unsigned count = 0) : LkUnnamedSema("test", count) {}
    void wait() { waitAsleep(); }
};

struct MutexSema : LkSema {
    explicit MutexSema(unsigned count = 0)
        : LkSema("test", count, LkMutexAttr::getDefaultAttr(), LkCondVarAttr::getDefaultAttr()) {}
};

struct NamelessSema : LkNamedSema {
    explicit NamelessSema(unsigned count = 0)
        : LkNamedSema(nullptr, count, LkSemaTypes::CREATE_OR_OPEN, "test") {}
};

template <class Sema>
class LkSemas : public testing::Test {};

using Semas = testing::Types<UnnamedSema, SleepingSema, MutexSema, NamelessSema>;
TYPED_TEST_SUITE(LkSemas, Semas);

TYPED_TEST(LkSemas, letsThroughAsManyAsWereCountedAndNoMore) {
    TypeParam sema(2);
    EXPECT_TRUE(sema.isValid());
    EXPECT_STREQ(sema.getName(), "test");
    EXPECT_TRUE(sema.tryWait());
    sema.wait();
    EXPECT_FALSE(sema.tryWait());
    sema.post();
    EXPECT_TRUE(sema.tryWait());
    EXPECT_FALSE(sema.tryWait());
}

TYPED_TEST(LkSemas, refusesAPostBeyondTheHighestCountWhole) {
    TypeParam sema(0x7FFFFFFF);
    EXPECT_THROW(sema.post(), AssertionEx);
    EXPECT_TRUE(sema.tryWait());
    sema.post();
    EXPECT_THROW(sema.post(), AssertionEx);
}

TYPED_TEST(LkSemas, losesAndInventsNothingAmong64Threads) {
    constexpr int nbRounds = 500;
    TypeParam sema;
    onThreads(64, [&](int thread) {
        for (int i = 0; i < nbRounds; ++i) thread % 2 == 0 ? sema.post() : sema.wait();
    });
    EXPECT_FALSE(sema.tryWait());
}

TYPED_TEST(LkSemas, guardsAResourceAmong64Threads) {
    TypeParam sema(1);
    int counter = 0;  // a race here is a fault of the semaphore
    onThreads(64, [&](int) {
        for (int i = 0; i < 200; ++i) {
            sema.wait();
            ++counter;
            sema.post();
        }
    });
    EXPECT_EQ(counter, 64 * 200);
}

TYPED_TEST(LkSemas, mayBeDestroyedByTheThreadWhoseWaitHasReturned) {
    destroyAfterEachWait<TypeParam>(
        3000,
        [](TypeParam& sema, auto publish) {
            publish();
            sema.wait();
        },
        [](TypeParam& sema) { sema.post(); });
}

TEST(LkUnnamedSema, withTooHighACountIsInvalidAndAsserts) {
    LkUnnamedSema sema("test", 0x80000000U);
    EXPECT_FALSE(sema.isValid());
    EXPECT_EQ(sema.getErrno(), LkSemaTypes::getCountError());
    expectAsserts("isValid()", [&] { sema.post(); });
    expectAsserts("isValid()", [&] { sema.wait(); });
    expectAsserts("isValid()", [&] { sema.waitAsleep(); });
    expectAsserts("result == WAIT_TIMEOUT", [&] { static_cast<void>(sema.tryWait()); });
    expectAsserts("initialCount <= LkWaitQueue::HIGHEST_COUNT",
                  [] { LkSema tooHigh("test", 0xFFFFFFFFU); });
}

TEST(LkSema, timedWaitGivesUpNotBeforeItsTimeAndLeavesTheCountAlone) {
    LkSema sema("test");
    const auto start = std::chrono::steady_clock::now();
    EXPECT_FALSE(sema.timedWait(0.03));
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(30));
    for (const double seconds : {0.0, -1.0, std::nan("")}) EXPECT_FALSE(sema.timedWait(seconds));
    sema.post();
    EXPECT_TRUE(sema.timedWait(-1.0));
    EXPECT_FALSE(sema.tryWait());
}

TEST(LkSema, losesNothingWherePostsMeetTimeOuts) {
    constexpr int nbPosts = 2000;
    LkSema sema("test");
    std::atomic<int> nbTaken{0};
    std::atomic<bool> isOver{false};
    std::vector<std::jthread> takers;
    for (int i = 0; i < 8; ++i) {
        takers.emplace_back([&] {
            while (!isOver) nbTaken += sema.timedWait(0.001);
        });
    }
    for (int i = 0; i < nbPosts; ++i) {
        sema.post();
        if (i % 4 == 0) std::this_thread::sleep_for(std::chrono::microseconds(950));
    }
    isOver = true;
    takers.clear();
    while (sema.tryWait()) ++nbTaken;
    EXPECT_EQ(nbTaken, nbPosts);
}

}  // namespace

}  // namespace Orv

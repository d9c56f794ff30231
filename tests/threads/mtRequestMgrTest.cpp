#include <atomic>
#include <gtest/gtest.h>
#include <optional>
#include <random>
#include <thread>
#include <vector>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "mtRequestMgr.h"

namespace Orv {

namespace {

TEST(MtRequestMgr, aCountOfZeroLetsThroughAtOnceAndOthersDoNotMatter) {
    MtRequestMgr mgr;
    const MtRequestTag idle = mgr.acquireTag();
    const MtRequestTag busy = mgr.acquireTag();
    mgr.incRequestCount(busy);
    mgr.waitRequestCountZero(idle);
    EXPECT_FALSE(mgr.timedWaitRequestCountZero(busy, 0));
    EXPECT_FALSE(mgr.timedWaitRequestCountZero(busy, 0.01));
    mgr.incRequestCount(busy);
    mgr.decRequestCount(busy);
    EXPECT_EQ(mgr.getRequestCount(busy), 1U);
    EXPECT_FALSE(mgr.timedWaitRequestCountZero(busy, 0)) << "one of two was served";
    mgr.decRequestCount(busy);
    EXPECT_TRUE(mgr.timedWaitRequestCountZero(busy, 0));
}

TEST(MtRequestMgr, theDecrementToZeroLetsAllWaitersGoRoundAfterRound) {
    constexpr int NB_WAITERS = 4;
    constexpr int NB_ROUNDS = 200;
    MtRequestMgr mgr;
    const MtRequestTag tag = mgr.acquireTag();
    std::atomic<int> nbEarly{0};
    for (int round = 0; round < NB_ROUNDS; ++round) {
        mgr.incRequestCount(tag);
        mgr.incRequestCount(tag);
        std::atomic<bool> isServed{false};
        TestCounter nbThere;
        std::vector<std::jthread> waiters;
        for (int i = 0; i < NB_WAITERS; ++i) {
            waiters.emplace_back([&] {
                nbThere.add();
                mgr.waitRequestCountZero(tag);
                if (!isServed) ++nbEarly;
            });
        }
        if (round % 2 == 0) nbThere.waitFor(NB_WAITERS);
        mgr.decRequestCount(tag);
        isServed = true;
        mgr.decRequestCount(tag);
    }
    EXPECT_EQ(nbEarly, 0);
}

TEST(MtRequestMgr, aWaiterPassesEvenIfTheCountHasRisenAgain) {
    MtRequestMgr mgr;
    const MtRequestTag tag = mgr.acquireTag();
    mgr.incRequestCount(tag);
    std::atomic<bool> isThrough{false};
    std::jthread waiter([&] {
        mgr.waitRequestCountZero(tag);
        isThrough = true;
    });
    // The count is 0 for an instant only: whoever was waiting then passes.
    eventually("the waiter is through", [&] {
        mgr.decRequestCount(tag);
        mgr.incRequestCount(tag);
        return isThrough.load();
    });
    waiter.join();
    EXPECT_EQ(mgr.getRequestCount(tag), 1U);
}

TEST(MtRequestMgr, aTagMayBeReleasedWhileItsWaitersAreLeaving) {
    MtRequestMgr mgr;
    for (int round = 0; round < 500; ++round) {
        MtRequestTag tag = mgr.acquireTag();
        mgr.incRequestCount(tag);
        std::vector<std::jthread> waiters;
        TestCounter nbThere;
        for (int i = 0; i < 2; ++i) {
            waiters.emplace_back([&mgr, &nbThere, copy = tag] {
                // One that comes only now may find the tag released.
                nbThere.add();
                try {
                    mgr.waitRequestCountZero(copy);
                } catch (const AssertionFailed& assertion) {
                    EXPECT_STREQ(assertion.getExpression(), "tag.isValid()");
                }
            });
        }
        ASSERT_TRUE(nbThere.waitFor(2));
        mgr.decRequestCount(tag);
        mgr.releaseTag(tag);
        tag = MtRequestTag();
    }
    EXPECT_EQ(mgr.getNbTags(), 0U);
}

TEST(MtRequestMgr, everyCopyOfAReleasedTagIsInvalid) {
    MtRequestMgr mgr;
    const MtRequestTag tag = mgr.acquireTag();
    const MtRequestTag copy = tag;
    const MtRequestTag other = mgr.acquireTag();
    EXPECT_TRUE(copy == tag);
    EXPECT_FALSE(copy == other);
    mgr.releaseTag(tag);
    EXPECT_FALSE(copy.isValid());
    EXPECT_TRUE(other.isValid());
    EXPECT_EQ(mgr.getNbTags(), 1U);
    expectAsserts("tag.isValid()", [&] { mgr.releaseTag(copy); });
    expectAsserts("tag.isValid()", [&] { mgr.incRequestCount(copy); });
    expectAsserts("tag.isValid()", [&] { mgr.decRequestCount(copy); });
    expectAsserts("tag.isValid()", [&] { mgr.waitRequestCountZero(copy); });
    expectAsserts("tag.isValid()", [&] { static_cast<void>(mgr.getRequestCount(copy)); });
    expectAsserts("tag.isValid()", [&] { mgr.incRequestCount(MtRequestTag()); });
    MtRequestMgr second;
    expectAsserts("tag.isValid()", [&] { second.incRequestCount(other); });
    EXPECT_EQ(mgr.getRequestCount(other), 0U) << "the mutex is free and nothing was counted";
}

TEST(MtRequestMgr, refusesToReleaseABusyTagAndToCountBelowZero) {
    MtRequestMgr mgr;
    const MtRequestTag tag = mgr.acquireTag();
    expectAsserts("(*tag._id).first > 0", [&] { mgr.decRequestCount(tag); });
    mgr.incRequestCount(tag);
    try {
        mgr.releaseTag(tag);
        ADD_FAILURE() << "nothing was asserted";
    } catch (const AssertionFailed& assertion) {
        EXPECT_STREQ(assertion.getExpression(), "(*tag._id).first == 0");
        EXPECT_STREQ(assertion.getFile(), "src/resmgt/mtRequestTag");
    }
    EXPECT_TRUE(tag.isValid());
    mgr.decRequestCount(tag);
    mgr.releaseTag(tag);
}

TEST(MtRequestMgr, tagsOutliveTheirManagerAsInvalidOnes) {
    auto mgr = std::make_optional<MtRequestMgr>();
    const MtRequestTag tag = mgr->acquireTag();
    mgr->incRequestCount(tag);
    mgr.reset();
    EXPECT_FALSE(tag.isValid());
}

TEST(MtRequestMgr, countsRightWhileManyThreadsCountAndWait) {
    constexpr int NB_THREADS = 8;
    constexpr int NB_REQUESTS = 2000;
    MtRequestMgr mgr;
    const MtRequestTag tag = mgr.acquireTag();
    std::atomic<bool> isOver{false};
    std::jthread waiter([&] {
        while (!isOver) mgr.waitRequestCountZero(tag);
    });
    std::vector<std::jthread> threads;
    for (int i = 0; i < NB_THREADS; ++i) {
        threads.emplace_back([&] {
            for (int k = 0; k < NB_REQUESTS; ++k) {
                mgr.incRequestCount(tag);
                mgr.decRequestCount(tag);
            }
        });
    }
    threads.clear();
    isOver = true;
    waiter.join();
    EXPECT_EQ(mgr.getRequestCount(tag), 0U);
}

}  // namespace

}  // namespace Orv

#include <atomic>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <stdexcept>
#include <thread>
#include <vector>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "mtEx.h"
#include "mtTaskPool.h"

namespace Orv {

namespace {

TEST(MtTaskPool, runsEveryTaskOnceAndAWaitSeesAllItsTagsTasksDone) {
    MtTaskPool pool("pool", 2, 8);
    pool.start();
    std::vector<std::jthread> clients;
    for (int client = 0; client < 4; ++client) {
        clients.emplace_back([&pool] {
            MtRequestMgr& requests = pool.getRequestMgr();
            const MtRequestTag tag = requests.acquireTag();
            for (int round = 0; round < 50; ++round) {
                std::vector<int> results(20, 0);
                for (int& result : results) pool.submit(tag, [&result] { ++result; });
                pool.wait(tag);
                for (const int result : results) ASSERT_EQ(result, 1);
            }
            requests.releaseTag(tag);
        });
    }
    clients.clear();
    EXPECT_EQ(pool.getRequestMgr().getNbTags(), 0U);
}

TEST(MtTaskPool, oneWorkerRunsTasksInTheOrderOfSubmission) {
    MtTaskPool pool("pool", 1, 4);
    pool.start();
    std::vector<int> order;
    for (int i = 0; i < 100; ++i) pool.submit(MtRequestTag(), [&order, i] { order.push_back(i); });
    pool.stop();  // waits for what is queued, counted or not
    ASSERT_EQ(order.size(), 100U);
    for (int i = 0; i < 100; ++i) EXPECT_EQ(order[i], i);
    expectAsserts("!task.isNull()", [&] { pool.submit(MtTask()); });
    expectAsserts("nbThreads > 0", [] { const MtTaskPool empty("empty", 0); });
}

TEST(MtTaskPool, aTaskThatThrowsCountsAsDone) {
    MtTaskPool pool("pool", 2);
    pool.start();
    const MtRequestTag tag = pool.getRequestMgr().acquireTag();
    std::atomic<int> nbRun{0};
    for (int i = 0; i < 20; ++i) {
        pool.submit(tag, [&nbRun, i] {
            ++nbRun;
            if (i % 4 == 0) throw std::runtime_error("task");
            if (i % 4 == 1) throw i;
        });
    }
    pool.wait(tag);
    EXPECT_EQ(nbRun, 20);
    EXPECT_NO_THROW(pool.stop());
}

TEST(MtTaskPool, letsGoOfTheWorkBeforeItCountsItAsDone) {
    MtTaskPool pool("pool", 1);
    pool.start();
    const MtRequestTag tag = pool.getRequestMgr().acquireTag();
    for (int round = 0; round < 200; ++round) {
        auto held = std::make_shared<int>(round);
        const std::weak_ptr<int> seen = held;
        pool.submit(tag, [held = std::move(held)] {});
        pool.wait(tag);
        ASSERT_TRUE(seen.expired());
    }
}

TEST(MtTaskPool, takesTasksOnlyWhileItRuns) {
    MtTaskPool pool("pool", 1);
    const MtRequestTag tag = pool.getRequestMgr().acquireTag();
    const auto expectRefused = [&] {
        expectThrows<MtEx::ExPoolStopped>("Thread pool \"pool\" is stopped.",
                                          [&] { pool.submit(tag, [] {}); });
        EXPECT_EQ(pool.getRequestMgr().getRequestCount(tag), 0U);
    };
    expectRefused();
    for (int run = 0; run < 2; ++run) {
        pool.start();
        std::atomic<bool> hasRun{false};
        pool.submit(tag, [&] { hasRun = true; });
        pool.wait(tag);
        EXPECT_TRUE(hasRun);
        pool.stop();
        expectRefused();
    }
}

TEST(MtTaskPool, stopDoesWhatIsQueuedAndLetsGoWhoWaitsForRoom) {
    MtTaskPool pool("pool", 1, 2);
    pool.start();
    const MtRequestTag tag = pool.getRequestMgr().acquireTag();
    Gate entered, mayGoOn;
    std::atomic<int> nbRun{0};
    std::atomic<int> nbRefused{0};
    pool.submit(tag, [&] {
        entered.open();
        mayGoOn.wait();
        try {
            pool.submit(tag, [&] { ++nbRun; });
        } catch (const MtEx::ExPoolStopped&) {
            ++nbRefused;
        }
        ++nbRun;
    });
    ASSERT_TRUE(entered.wait());
    for (int i = 0; i < 2; ++i) pool.submit(tag, [&] { ++nbRun; });
    std::vector<std::jthread> submitters;
    for (int i = 0; i < 3; ++i) {
        submitters.emplace_back(
            [&] { EXPECT_THROW(pool.submit(tag, [&] { ++nbRun; }), MtEx::ExPoolStopped); });
    }
    ASSERT_TRUE(eventually("three wait for room",
                           [&] { return pool.getRequestMgr().getRequestCount(tag) == 6; }));
    std::jthread stopper([&] { pool.stop(); });
    submitters.clear();
    EXPECT_EQ(nbRun, 0);
    mayGoOn.open();
    stopper.join();
    EXPECT_EQ(nbRun, 3);
    EXPECT_EQ(nbRefused, 1);
    EXPECT_EQ(pool.getRequestMgr().getRequestCount(tag), 0U);
}

TEST(MtTaskPool, whatItHasTakenIsDoneHoweverSoonItStops) {
    for (int round = 0; round < 100; ++round) {
        MtTaskPool pool("pool", 2, 4);
        std::atomic<int> nbTaken{0}, nbRun{0};
        std::vector<std::jthread> submitters;
        for (int i = 0; i < 2; ++i) {
            submitters.emplace_back([&] {
                for (int k = 0; k < 20; ++k) {
                    try {
                        pool.submit(MtRequestTag(), [&] { ++nbRun; });
                        ++nbTaken;
                    } catch (const MtEx::ExPoolStopped&) {
                        std::this_thread::yield();
                    }
                }
            });
        }
        for (int run = 0; run < 2; ++run) {
            pool.start();
            if (round % 2 == 0) std::this_thread::yield();
            pool.stop();
        }
        submitters.clear();
        ASSERT_EQ(nbRun, nbTaken);
    }
}

TEST(MtTaskPool, aWorkerRunsInPlaceWhatTheQueueHasNoRoomFor) {
    MtTaskPool pool("pool", 1, 1);
    pool.start();
    const MtRequestTag tag = pool.getRequestMgr().acquireTag();
    std::atomic<int> nbRun{0};
    std::function<void(int)> fork = [&](int depth) {
        ++nbRun;
        for (int i = 0; depth > 0 && i < 3; ++i)
            pool.submit(tag, [&fork, depth] { fork(depth - 1); });
    };
    pool.submit(tag, [&] { fork(4); });
    pool.wait(tag);
    EXPECT_EQ(nbRun, 1 + 3 + 9 + 27 + 81);
}

TEST(MtTaskPool, aWorkerThatWaitsRunsTasksMeanwhile) {
    for (const unsigned nbThreads : {1U, 2U}) {
        MtTaskPool pool("pool", nbThreads, 16);
        pool.start();
        MtRequestMgr& requests = pool.getRequestMgr();
        std::function<int(int)> fibonacci = [&](int n) {
            if (n < 2) return n;
            const MtRequestTag tag = requests.acquireTag();
            int left = 0;
            pool.submit(tag, [&] { left = fibonacci(n - 1); });
            const int right = fibonacci(n - 2);
            pool.wait(tag);
            requests.releaseTag(tag);
            return left + right;
        };
        const MtRequestTag tag = requests.acquireTag();
        int result = 0;
        pool.submit(tag, [&] { result = fibonacci(12); });
        pool.wait(tag);
        EXPECT_EQ(result, 144);
    }
}

TEST(MtTaskPool, aWorkerThatWaitsIsWokenForTasksThatComeLater) {
    MtTaskPool pool("pool", 1);
    pool.start();
    MtRequestMgr& requests = pool.getRequestMgr();
    const MtRequestTag outer = requests.acquireTag();
    const MtRequestTag inner = requests.acquireTag();
    for (int round = 0; round < 200; ++round) {
        requests.incRequestCount(inner);  // on behalf of a task that is on its way
        Gate entered;
        pool.submit(outer, [&] {
            entered.open();
            pool.wait(inner);
        });
        ASSERT_TRUE(entered.wait());
        if (round % 2 == 0) std::this_thread::yield();
        bool hasRun = false;
        pool.submit(inner, [&] {
            hasRun = true;
            requests.decRequestCount(inner);
        });
        pool.wait(outer);
        ASSERT_TRUE(hasRun);
    }
}

TEST(MtTaskPool, aTaskCannotWaitForItself) {
    MtTaskPool pool("pool", 1);
    pool.start();
    MtRequestMgr& requests = pool.getRequestMgr();
    const MtRequestTag outer = requests.acquireTag();
    const MtRequestTag inner = requests.acquireTag();
    std::atomic<int> nbAsserted{0};
    const auto waitInVain = [&](const MtRequestTag& tag) {
        expectAsserts("!runsUnder(tag, worker)", [&] { pool.wait(tag); });
        ++nbAsserted;
    };
    pool.submit(outer, [&] {
        waitInVain(outer);
        pool.submit(inner, [&] { waitInVain(outer); });  // it runs on top of the one that waits
        pool.wait(inner);
    });
    pool.wait(outer);
    EXPECT_EQ(nbAsserted, 2);
}

TEST(MtTaskPool, refusesATagThatWasReleased) {
    MtTaskPool pool("pool", 1);
    pool.start();
    const MtRequestTag tag = pool.getRequestMgr().acquireTag();
    pool.getRequestMgr().releaseTag(tag);
    expectAsserts("tag.isValid()", [&] { pool.submit(tag, [] {}); });
    expectAsserts("tag.isValid()", [&] { pool.wait(tag); });
    EXPECT_EQ(pool.getNbQueued(), 0U);
}

}  // namespace

}  // namespace Orv

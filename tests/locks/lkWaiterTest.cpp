#include <gtest/gtest.h>
#include <mutex>
#include <set>

#include "gate.h"
#include "lkWaiterPrivate.h"

namespace Orv {

namespace {

LkWaiter* getOwnWaiter() {
    const LkWaiter::Use use;
    return &*use;
}

TEST(LkWaiter, isTheSameForAllWaitsOfAThreadAndAnotherForEachThreadThatLives) {
    TestCounter nbHere;
    std::mutex mutex;
    std::set<LkWaiter*> waiters;
    std::vector<std::jthread> threads;
    for (int i = 0; i < 16; ++i) {
        threads.emplace_back([&] {
            LkWaiter* const waiter = getOwnWaiter();
            EXPECT_EQ(getOwnWaiter(), waiter);
            {
                const std::lock_guard guard(mutex);
                waiters.insert(waiter);
            }
            nbHere.add();
            nbHere.waitFor(16);
        });
    }
    threads.clear();
    EXPECT_EQ(waiters.size(), 16U);
}

TEST(LkWaiter, goesToAnotherThreadWhenItsOwnHasEnded) {
    std::set<LkWaiter*> waiters;
    for (int i = 0; i < 1000; ++i) {
        std::thread([&] { waiters.insert(getOwnWaiter()); }).join();
    }
    // A thread that is joined has not always been seen to end, so a few may be on their way back.
    EXPECT_LE(waiters.size(), 50U);
}

}  // namespace

}  // namespace Orv

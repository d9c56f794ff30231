#include <gtest/gtest.h>

#include "threadSlot.h"

namespace Orv {

namespace {

// The tests of a module that has none of its own: the slots of thread data and of waiting.
std::vector<int> told;
ThreadSlot* refilled = nullptr;

void tellFirst(void* value) noexcept {
    told.push_back(*static_cast<int*>(value));
}

/// Fills the slot that was told before, and its own once.
void tellSecond(void* value) noexcept {
    told.push_back(*static_cast<int*>(value));
    static int again = 3;
    if (*static_cast<int*>(value) == 2) {
        refilled->set(&again);
    }
}

TEST(ThreadSlot, tellsOwnersInOrderAndAgainWhatTheyFillAnewUntilTheThreadHasEnded) {
    static constinit ThreadSlot first(ThreadSlot::THREAD_DATA, tellFirst);
    static constinit ThreadSlot second(ThreadSlot::WAITS, tellSecond);
    static int one = 1, two = 2;
    refilled = &first;
    for (int round = 0; round < 3; ++round) {
        told.clear();
        std::jthread([] {
            EXPECT_EQ(first.get(), nullptr);
            EXPECT_FALSE(ThreadSlot::hasEnded());
            EXPECT_TRUE(second.set(&two));
            EXPECT_TRUE(first.set(&one));
            EXPECT_EQ(first.get(), &one);
        }).join();
        EXPECT_EQ(told, (std::vector<int>{1, 2, 3}));
    }
    told.clear();
    std::jthread([] {
        first.set(&one);
        first.set(nullptr);
    }).join();
    EXPECT_TRUE(told.empty());
    EXPECT_EQ(first.get(), nullptr);
}

}  // namespace

}  // namespace Orv

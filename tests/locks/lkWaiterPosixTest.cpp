#include <gtest/gtest.h>
#include <pthread.h>

#include "lkSema.h"

namespace Orv {

namespace {

void waitAtTheEnd(void* nbRight) {
    LkSema sema("sema");
    static_cast<std::atomic<int>*>(nbRight)->fetch_add(!sema.timedWait(0.001));
    std::jthread poster([&] { sema.post(); });
    static_cast<std::atomic<int>*>(nbRight)->fetch_add(sema.timedWait(1000));
}

// The destructors of keys run in the order of the keys: one runs before the thread has given its
// waiter back, and one after.
TEST(LkWaiter, isThereInTheLastDestructorsOfAThread) {
    std::atomic<int> nbRight{0};
    pthread_key_t before;
    pthread_key_t after;
    ASSERT_EQ(::pthread_key_create(&before, waitAtTheEnd), 0);
    EXPECT_FALSE(LkSema("sema").timedWait(0.001));  // takes its key at the latest here
    ASSERT_EQ(::pthread_key_create(&after, waitAtTheEnd), 0);
    for (int i = 0; i < 20; ++i) {
        std::jthread([&] {
            ::pthread_setspecific(before, &nbRight);
            ::pthread_setspecific(after, &nbRight);
            EXPECT_FALSE(LkSema("sema").timedWait(0.001));
        }).join();
    }
    EXPECT_EQ(nbRight, 20 * 2 * 2);
    ::pthread_key_delete(before);
    ::pthread_key_delete(after);
}

}  // namespace

}  // namespace Orv

#include <gtest/gtest.h>
#include <sched.h>
#include <thread>

#include "lkAdaptiveWait.h"

namespace Orv {

namespace {

bool mayLookNow() {
    LkAdaptiveWait::forgetPlacement();
    return LkAdaptiveWait::mayLook();
}

TEST(LkAdaptiveWait, doesNotLookOnAThreadThatIsPlacedOnOneProcessor) {
    std::jthread([] {
        cpu_set_t all;
        ASSERT_EQ(::sched_getaffinity(0, sizeof all, &all), 0);
        if (CPU_COUNT(&all) < 2) GTEST_SKIP() << "there is but one processor";
        EXPECT_TRUE(mayLookNow());
        cpu_set_t one;
        CPU_ZERO(&one);
        for (int cpu = 0; CPU_COUNT(&one) == 0; ++cpu) {
            if (CPU_ISSET(cpu, &all)) CPU_SET(cpu, &one);
        }
        ASSERT_EQ(::sched_setaffinity(0, sizeof one, &one), 0);
        EXPECT_FALSE(mayLookNow());
        LkAdaptiveWait wait;
        EXPECT_FALSE(wait.look([] {
            ADD_FAILURE() << "looked all the same";
            return true;
        }));
    }).join();
}

TEST(LkAdaptiveWait, doesNotLookInTheRealTimeClass) {
    std::jthread([] {
        const sched_param parameters{.sched_priority = 1};
        if (::sched_setscheduler(0, SCHED_RR, &parameters) != 0) {
            GTEST_SKIP() << "this process may not use the real-time class";
        }
        EXPECT_FALSE(mayLookNow());
        const sched_param normal{.sched_priority = 0};
        ASSERT_EQ(::sched_setscheduler(0, SCHED_OTHER, &normal), 0);
    }).join();
}

}  // namespace

}  // namespace Orv

#include <atomic>
#include <gtest/gtest.h>
#include <limits>
#include <thread>

#include "gate.h"
#include "wakeableSleeper.h"

namespace Orv {

namespace {

constexpr auto NEVER = DtTimeMark::fromNanoseconds(std::numeric_limits<std::int64_t>::max());

TEST(WakeableSleeper, sleepsUntilItsDeadlineAndNotLonger) {
    WakeableSleeper sleeper;
    for (const double seconds : {-1.0, 0.0, 0.0003, 0.02}) {
        const DtTimeMark deadline = DtTimeMark::now() + seconds;
        sleeper.sleepUntil(deadline);
        EXPECT_GE(DtTimeMark::now(), deadline) << seconds;
    }
}

TEST(WakeableSleeper, aWakeUpEndsTheSleepUnderWayOrTheNextOneAndNoOther) {
    WakeableSleeper sleeper;
    sleeper.wake();
    sleeper.wake();
    sleeper.sleepUntil(NEVER);
    const DtTimeMark deadline = DtTimeMark::now() + 0.01;
    sleeper.sleepUntil(deadline);
    EXPECT_GE(DtTimeMark::now(), deadline);
}

TEST(WakeableSleeper, noWakeUpIsLostBetweenSleeps) {
    constexpr int NB_ROUNDS = 2000;
    WakeableSleeper sleeper;
    std::atomic<int> nbAsked{0};
    TestCounter nbAnswered;
    std::jthread thread([&] {
        for (int nbSeen = 0; nbSeen < NB_ROUNDS;) {
            if (nbAsked == nbSeen) {
                sleeper.sleepUntil(NEVER);
                continue;
            }
            ++nbSeen;
            nbAnswered.add();
        }
    });
    for (int round = 1; round <= NB_ROUNDS; ++round) {
        ++nbAsked;
        sleeper.wake();
        ASSERT_TRUE(nbAnswered.waitFor(round));
    }
}

}  // namespace

}  // namespace Orv

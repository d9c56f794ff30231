#include <limits>

#include "assertions.h"
#include "periodicTimer.h"
#include "sleeper.h"

namespace Orv {

namespace {

TEST(PeriodicTimer, noTickComesBeforeItsTimeAndTheRateDoesNotDrift) {
    constexpr double INTERVAL = 0.002;
    PeriodicTimer timer(INTERVAL);
    const DtTimeMark before = DtTimeMark::now();
    timer.start();
    const DtTimeMark started = DtTimeMark::now();
    std::uint64_t tick = 0;
    std::uint64_t nbWaits = 0;
    while (tick < 50) {
        // Work between the ticks; a timer that counts from its wake-up falls behind by it.
        Sleeper::sleep(0.0005);
        const double nbPassed = (DtTimeMark::now() - started) / INTERVAL;
        const std::uint64_t next = timer.wait();
        ++nbWaits;
        ASSERT_GE(DtTimeMark::now(), before + static_cast<double>(next) * INTERVAL);
        ASSERT_GT(next, tick);
        ASSERT_GE(static_cast<double>(next), nbPassed - 1.0);
        tick = next;
    }
    EXPECT_EQ(nbWaits + timer.getNbLateTicks(), tick);
}

TEST(PeriodicTimer, aLateWaiterGetsTheLatestTickAtOnceAndTheLossIsCounted) {
    PeriodicTimer timer(0.001);
    const DtTimeMark before = DtTimeMark::now();
    timer.start();
    const DtTimeMark started = DtTimeMark::now();
    Sleeper::sleep(0.0105);
    const DtTimeMark asked = DtTimeMark::now();
    const std::uint64_t tick = timer.wait();
    EXPECT_GE(tick, 10U);
    EXPECT_GE(static_cast<double>(tick),
              (asked - started) / 0.001 - 1.0);  // the latest, not an old one
    EXPECT_LE(static_cast<double>(tick), (DtTimeMark::now() - before) / 0.001);
    EXPECT_EQ(timer.getNbLateTicks(), tick - 1);
    const std::uint64_t next = timer.wait();
    EXPECT_GT(next, tick);
    EXPECT_EQ(timer.getNbLateTicks(), next - 2);
}

TEST(PeriodicTimer, stopEndsAWaitUnderWayAndThoseToCome) {
    PeriodicTimer timer(1e6);
    EXPECT_EQ(timer.wait(), 0U);  // stands still until it is started
    for (int i = 0; i < 200; ++i) {
        timer.start();
        std::uint64_t tick = 1;
        std::jthread waiter([&] { tick = timer.wait(); });
        if (i % 2 == 0) Sleeper::sleep(0.0005);  // sometimes it sleeps already, sometimes not yet
        timer.stop();
        waiter.join();
        ASSERT_EQ(tick, 0U);
    }
    EXPECT_EQ(timer.wait(), 0U);
}

TEST(PeriodicTimer, aNewRateReachesAWaitUnderWay) {
    PeriodicTimer timer(1e6);
    timer.start();
    std::uint64_t tick = 0;
    std::jthread waiter([&] { tick = timer.wait(); });
    Sleeper::sleep(0.002);
    EXPECT_EQ(timer.setInterval(0.0001), 1e6);
    waiter.join();
    EXPECT_GE(tick, 1U);
    EXPECT_EQ(timer.getInterval(), 0.0001);
}

TEST(PeriodicTimer, aShorterRateMakesNoCrowdOfTicksDue) {
    PeriodicTimer timer(1000.0);
    timer.start();
    Sleeper::sleep(0.02);
    const DtTimeMark changed = DtTimeMark::now();
    timer.setInterval(1e-6);
    timer.setInterval(1000.0);
    // At most what passed between the two changes, not the 20,000 of the time before.
    const double passed = (DtTimeMark::now() - changed) / 1e-6 + 1.0;
    EXPECT_LE(static_cast<double>(timer.wait()), passed);
}

TEST(PeriodicTimer, ticksDueUnderTheOldRateStayDue) {
    PeriodicTimer timer(0.001);
    timer.start();
    Sleeper::sleep(0.0035);
    timer.setInterval(1e6);
    EXPECT_GE(timer.wait(), 3U);  // and not after a million seconds
}

TEST(PeriodicTimer, startingAgainCountsAfresh) {
    PeriodicTimer timer(0.0001);
    timer.start();
    Sleeper::sleep(0.01);
    timer.wait();
    timer.setInterval(1e6);
    const DtTimeMark begin = DtTimeMark::now();
    timer.start();
    timer.setInterval(0.0001);
    const std::uint64_t tick = timer.wait();
    EXPECT_LE(static_cast<double>(tick), (DtTimeMark::now() - begin) / 0.0001 + 1.0);
    EXPECT_EQ(timer.getNbLateTicks(), tick - 1);
}

TEST(PeriodicTimer, refusesIntervalsThatAreNone) {
    const double bad[] = {0.0, -1.0, 1e-7, std::numeric_limits<double>::infinity(),
                          std::numeric_limits<double>::quiet_NaN()};
    PeriodicTimer timer(1.0);
    for (const double interval : bad) {
        EXPECT_THROW(PeriodicTimer{interval}, AssertionFailed) << interval;
        EXPECT_THROW(timer.setInterval(interval), AssertionFailed) << interval;
    }
    EXPECT_EQ(timer.getInterval(), 1.0);
    timer.setInterval(1e300);  // further than the clock can count
    timer.start();
    const std::jthread stopper([&] { timer.stop(); });
    EXPECT_EQ(timer.wait(), 0U);
}

}  // namespace

}  // namespace Orv

#include <limits>

#include "dtTimeMark.h"
#include "sleeper.h"
#include "testLimits.h"

namespace Orv {

namespace {

TEST(Sleeper, neverEndsBeforeItsTime) {
    for (const double seconds : {1e-9, 1e-4, 0.0015, 0.02}) {
        const DtTimeMark begin = DtTimeMark::now();
        Sleeper::sleep(seconds);
        EXPECT_GE(DtTimeMark::now(), begin + seconds) << seconds;
    }
}

TEST(Sleeper, whatIsNoLengthOfTimeReturns) {
    const double lengths[] = {0.0, -0.0, -1.0, -std::numeric_limits<double>::infinity(),
                              std::numeric_limits<double>::quiet_NaN()};
    const DtTimeMark begin = DtTimeMark::now();
    for (const double seconds : lengths) Sleeper::sleep(seconds);
    Sleeper::sleepUntil(DtTimeMark());
    Sleeper::sleepUntil(DtTimeMark::fromNanoseconds(-1));
    Sleeper::sleepUntil(DtTimeMark::now());
    EXPECT_LT(DtTimeMark::now() - begin, getWaitLimitSeconds());
}

TEST(DtTimeMark, sumsStopAtTheEndsOfTheRange) {
    constexpr std::int64_t MAX = std::numeric_limits<std::int64_t>::max();
    constexpr std::int64_t MIN = std::numeric_limits<std::int64_t>::min();
    const DtTimeMark last = DtTimeMark::fromNanoseconds(MAX);
    const DtTimeMark first = DtTimeMark::fromNanoseconds(MIN);
    const double infinite = std::numeric_limits<double>::infinity();
    EXPECT_EQ(DtTimeMark::now() + infinite, last);
    EXPECT_EQ(DtTimeMark::now() + 1e300, last);
    EXPECT_EQ(DtTimeMark::now() - infinite, first);
    EXPECT_EQ(last + 1.0, last);
    EXPECT_EQ(first - 1.0, first);
    EXPECT_EQ(last.getNanosecondsSince(first), MAX);
    EXPECT_EQ(first.getNanosecondsSince(last), MIN);
    EXPECT_EQ(DtTimeMark::fromNanoseconds(5) + std::numeric_limits<double>::quiet_NaN(),
              DtTimeMark::fromNanoseconds(5));
}

TEST(DtTimeMark, countsWholeNanosecondsInBothDirections) {
    const DtTimeMark mark = DtTimeMark::fromNanoseconds(5'000'000'000);
    EXPECT_EQ((mark + 0.1).getNanoseconds(), 5'100'000'000);
    EXPECT_EQ((mark - 0.3).getNanoseconds(), 4'700'000'000);
    EXPECT_DOUBLE_EQ((mark + 0.25) - mark, 0.25);
    EXPECT_DOUBLE_EQ(mark - (mark + 0.25), -0.25);
    EXPECT_LT(mark, mark + 1e-9);
    EXPECT_LT(DtTimeMark(), DtTimeMark::now());
}

TEST(DtTimeMark, theClockNeverRunsBackwards) {
    DtTimeMark previous = DtTimeMark::now();
    for (int i = 0; i < 100000; ++i) {
        const DtTimeMark mark = DtTimeMark::now();
        ASSERT_GE(mark, previous);
        previous = mark;
    }
}

}  // namespace

}  // namespace Orv

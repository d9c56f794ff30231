#include <cmath>
#include <gtest/gtest.h>
#include <limits>

#include "lkTimeLimit.h"

namespace Orv {

namespace {

TEST(LkTimeLimit, roundsSecondsToMillisecondsAndCutsWhatNoSystemCanCount) {
    struct Row {
        int line;
        double seconds;
        std::uint32_t milliseconds;
    };
    constexpr double huge = std::numeric_limits<double>::infinity();
    constexpr Row rows[] = {
        {__LINE__, 0, 0},
        {__LINE__, 0.0004, 0},
        {__LINE__, 0.0005, 1},
        {__LINE__, 0.0015, 2},
        {__LINE__, 1.2344, 1234},
        {__LINE__, -0.0001, 0},
        {__LINE__, -huge, 0},
        {__LINE__, std::numeric_limits<double>::quiet_NaN(), 0},
        {__LINE__, 4294967.2939, 4294967294},
        {__LINE__, 4294967.2945, LkTimeLimit::LONGEST_MILLISECONDS},
        {__LINE__, 4294967.295, LkTimeLimit::LONGEST_MILLISECONDS},  // would be the infinite one
        {__LINE__, 4294967.296, LkTimeLimit::LONGEST_MILLISECONDS},  // would wrap around to 0
        {__LINE__, huge, LkTimeLimit::LONGEST_MILLISECONDS},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(LkTimeLimit::toMilliseconds(row.seconds), row.milliseconds)
            << "line " << row.line;
        const LkTimeLimit limit(row.seconds);
        EXPECT_FALSE(limit.isInfinite()) << "line " << row.line;
        EXPECT_EQ(limit.isZero(), row.milliseconds == 0) << "line " << row.line;
        EXPECT_LE(limit.getRemainingMilliseconds(), row.milliseconds) << "line " << row.line;
    }
    EXPECT_TRUE(LkTimeLimit().isInfinite());
    EXPECT_EQ(LkTimeLimit().getRemainingMilliseconds(), LkTimeLimit::INFINITE_MILLISECONDS);
}

}  // namespace

}  // namespace Orv

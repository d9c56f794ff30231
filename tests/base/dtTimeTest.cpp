#include <limits>

#include "assertions.h"
#include "dtRefTime.h"
#include "dtTime.h"
#include "dtTimeIndex.h"
#include "osDateUtil.h"

namespace Orv {

namespace {

constexpr std::int64_t MAX = std::numeric_limits<std::int64_t>::max();
constexpr std::int64_t MIN = std::numeric_limits<std::int64_t>::min();
constexpr double INFINITE = std::numeric_limits<double>::infinity();

TEST(DtTime, roundsToTheNanosecondAndStopsAtTheEnds) {
    struct Row {
        double seconds;
        std::int64_t nanoseconds;
    };
    const Row rows[] = {
        {1.5, 1'500'000'000}, {-0.1, -100'000'000}, {1.4e-9, 1},
        {1.6e-9, 2},          {-1.6e-9, -2},        {1e300, MAX},
        {-INFINITE, MIN},     {INFINITE, MAX},      {std::numeric_limits<double>::quiet_NaN(), 0},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(DtTime(row.seconds).getNanoseconds(), row.nanoseconds) << row.seconds;
    }
    EXPECT_EQ(DtTime(INFINITE) + DtTime(1), DtTime(INFINITE));
    EXPECT_EQ(DtTime(-INFINITE) - DtTime(1), DtTime(-INFINITE));
    EXPECT_EQ((-DtTime(-INFINITE)).getNanoseconds(), MAX);
    EXPECT_DOUBLE_EQ((DtTime(2.5) - DtTime(3.0)).getSeconds(), -0.5);
    EXPECT_LT(DtTime(-1), DtTime());
}

TEST(DtTimeIndex, refusesCountsBeyondItsRangeAndKeepsTheOld) {
    DtTimeIndex last = MAX;
    DtTimeIndex first = MIN;
    EXPECT_THROW(++last, AssertionFailed);
    EXPECT_THROW(--first, AssertionFailed);
    EXPECT_THROW(DtTimeIndex() - first, AssertionFailed);
    EXPECT_EQ(last, DtTimeIndex(MAX));
    EXPECT_EQ(first, DtTimeIndex(MIN));
    EXPECT_EQ(last + first, DtTimeIndex(-1));
    EXPECT_EQ(--last, DtTimeIndex(MAX - 1));
    EXPECT_EQ(++last - 7, DtTimeIndex(MAX - 7));
    std::ostringstream text;
    text << first << ' ' << DtTimeIndex(25);
    EXPECT_EQ(text.str(), "-9223372036854775808 25");
}

TEST(DtRefTime, turnsMarksIntoDatesAndBack) {
    const DtTimeMark mark = DtTimeMark::fromNanoseconds(1'000'000'000'000);
    const OsDateTypes::DateRep date = std::chrono::sys_days(std::chrono::year(2024) / 2 / 29);
    const DtRefTime reference(mark, date);
    const OsDateTypes::DateRep later = date + std::chrono::hours(48);
    EXPECT_EQ(reference.toDate(mark + 172800.0), later);
    EXPECT_EQ(reference.toMark(later), mark + 172800.0);
    EXPECT_EQ(reference.toDate(mark - 86400.0), date - std::chrono::hours(24));
    EXPECT_EQ(reference.toMark(date - std::chrono::hours(24)), mark - 86400.0);

    EXPECT_EQ(DtRefTime(mark, OsDateTypes::getLast()).toDate(mark + 1), OsDateTypes::getLast());
    EXPECT_EQ(DtRefTime(mark, OsDateTypes::getFirst()).toDate(mark - 1), OsDateTypes::getFirst());
    EXPECT_EQ(reference.toMark(OsDateTypes::getLast()).getNanoseconds(), MAX);
    EXPECT_EQ(reference.toMark(OsDateTypes::getFirst()).getNanoseconds(), MIN);
}

TEST(DtRefTime, nowLiesBetweenTheReadingsAroundIt) {
    const DtTimeMark before = DtTimeMark::now();
    const DtRefTime reference = DtRefTime::now();
    EXPECT_GE(reference.getMark(), before);
    EXPECT_LE(reference.getMark(), DtTimeMark::now());
    // A machine whose clock was never set still counts from 1970 on.
    EXPECT_GE(reference.getDate(), OsDateTypes::DateRep());
}

}  // namespace

}  // namespace Orv

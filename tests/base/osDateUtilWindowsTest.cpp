#include <windows.h>

#include "osDateUtil.h"

namespace Orv {

namespace {

// Against the system's own conversion with the rules in force, in the zone that the machine has.
TEST(OsDateUtil, agreesWithTheSystemOnLocalTimesOfThisYear) {
    const OsDateTypes::DateRep now = OsDateUtil::now();
    for (int hours = -4000; hours < 4000; hours += 7) {
        const OsDateTypes::DateRep date = now + std::chrono::hours(hours);
        const OsDateTypes::DateStruct fields =
            OsDateUtil::splitTime(date, OsDateTypes::TimeMode::LOCAL);
        constexpr std::int64_t TICKS_FROM_1601 = 116'444'736'000'000'000;
        ULARGE_INTEGER ticks;
        ticks.QuadPart = static_cast<ULONGLONG>(date.time_since_epoch().count() + TICKS_FROM_1601);
        const FILETIME time{ticks.LowPart, ticks.HighPart};
        SYSTEMTIME utc, local;
        ASSERT_TRUE(::FileTimeToSystemTime(&time, &utc));
        ASSERT_TRUE(::SystemTimeToTzSpecificLocalTime(nullptr, &utc, &local));
        ASSERT_EQ(fields.year, local.wYear) << hours;
        ASSERT_EQ(fields.month, local.wMonth) << hours;
        ASSERT_EQ(fields.day, local.wDay) << hours;
        ASSERT_EQ(fields.hour, local.wHour) << hours;
        ASSERT_EQ(fields.minute, local.wMinute) << hours;
        ASSERT_EQ(fields.weekday, local.wDayOfWeek) << hours;
    }
}

}  // namespace

}  // namespace Orv

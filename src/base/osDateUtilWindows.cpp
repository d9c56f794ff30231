#include <windows.h>

#include "assertions.h"
#include "osDateUtil.h"
#include "osError.h"

namespace Orv {

namespace {

constexpr std::int64_t TICKS_PER_SECOND = 10'000'000;
constexpr std::int64_t FILETIME_EPOCH_SECONDS = -11'644'473'600;     // 1601 begins, from 1970
constexpr std::int64_t CALENDAR_CYCLE_SECONDS = 146'097LL * 86'400;  // 400 years, whole weeks

SYSTEMTIME toSystemTime(std::int64_t filetimeSeconds) {
    ULARGE_INTEGER ticks;
    ticks.QuadPart = static_cast<ULONGLONG>(filetimeSeconds * TICKS_PER_SECOND);
    const FILETIME time{ticks.LowPart, ticks.HighPart};
    SYSTEMTIME fields;
    ORV_ASSERT_SYS(::FileTimeToSystemTime(&time, &fields) != 0, "::FileTimeToSystemTime()",
                   OsError::getLast());
    return fields;
}

std::int64_t toSeconds(const SYSTEMTIME& fields) {
    FILETIME time;
    ORV_ASSERT_SYS(::SystemTimeToFileTime(&fields, &time) != 0, "::SystemTimeToFileTime()",
                   OsError::getLast());
    const ULARGE_INTEGER ticks{{time.dwLowDateTime, time.dwHighDateTime}};
    return static_cast<std::int64_t>(ticks.QuadPart) / TICKS_PER_SECOND;
}

TIME_ZONE_INFORMATION rulesOf(WORD year) {
    TIME_ZONE_INFORMATION rules;
    ORV_ASSERT_SYS(::GetTimeZoneInformationForYear(year, nullptr, &rules) != 0,
                   "::GetTimeZoneInformationForYear()", OsError::getLast());
    return rules;
}

SYSTEMTIME toLocal(const SYSTEMTIME& utc, const TIME_ZONE_INFORMATION& rules) {
    SYSTEMTIME local;
    ORV_ASSERT_SYS(::SystemTimeToTzSpecificLocalTime(&rules, &utc, &local) != 0,
                   "::SystemTimeToTzSpecificLocalTime()", OsError::getLast());
    return local;
}

}  // namespace

OsDateUtil::Zone OsDateUtil::findLocalZone(std::int64_t utcSeconds) {
    // The system counts from 1601: earlier moments are taken whole cycles of the calendar later.
    std::int64_t seconds = utcSeconds - FILETIME_EPOCH_SECONDS;
    while (seconds < 86'400) seconds += CALENDAR_CYCLE_SECONDS;

    const SYSTEMTIME utc = toSystemTime(seconds);
    TIME_ZONE_INFORMATION rules = rulesOf(utc.wYear);
    SYSTEMTIME local = toLocal(utc, rules);
    if (local.wYear != utc.wYear) {  // around New Year the rules are those of the year shown
        rules = rulesOf(local.wYear);
        local = toLocal(utc, rules);
    }
    const int offset = static_cast<int>(toSeconds(local) - seconds);
    const int standardOffset = static_cast<int>(-(rules.Bias + rules.StandardBias) * 60);
    return {offset, offset != standardOffset, nullptr};
}

void OsDateUtil::setZone(std::tm& fields, const Zone& zone) noexcept {
    fields.tm_isdst = zone.isDaylightSaving ? 1 : 0;  // the C runtime knows name and offset
}

}  // namespace Orv

#include <ctime>

#include "osDateUtil.h"
#include "zoneScope.h"

namespace Orv {

namespace {

using DateRep = OsDateTypes::DateRep;
using DateStruct = OsDateTypes::DateStruct;
using TimeMode = OsDateTypes::TimeMode;

DateStruct fieldsOf(int year, int month, int day, int hour, int minute) {
    DateStruct fields;
    fields.year = year;
    fields.month = month;
    fields.day = day;
    fields.hour = hour;
    fields.minute = minute;
    return fields;
}

std::optional<DateRep> dateOf(std::optional<std::int64_t> unixSeconds) {
    if (!unixSeconds) return std::nullopt;
    return DateRep(std::chrono::seconds(*unixSeconds));
}

// The expected counts come from `TZ=ZONE date -d TEXT +%s`.
TEST(OsDateUtil, readsLocalTimesOfManyZones) {
    struct Row {
        const char* zone;
        DateStruct fields;
        std::optional<std::int64_t> seconds;
    };
    const Row rows[] = {
        {ZoneScope::BERLIN, fieldsOf(2022, 7, 1, 12, 0), 1656669600},
        {ZoneScope::BERLIN, fieldsOf(2022, 1, 1, 12, 0), 1641034800},
        {ZoneScope::BERLIN, fieldsOf(2022, 3, 27, 1, 59), 1648342740},
        {ZoneScope::BERLIN, fieldsOf(2022, 3, 27, 2, 0), std::nullopt},
        {ZoneScope::BERLIN, fieldsOf(2022, 3, 27, 2, 59), std::nullopt},
        {ZoneScope::BERLIN, fieldsOf(2022, 3, 27, 3, 0), 1648342800},
        {ZoneScope::BERLIN, fieldsOf(2022, 10, 30, 2, 30), 1667089800},  // the first of two
        {ZoneScope::BERLIN, fieldsOf(2022, 10, 30, 3, 0), 1667095200},
        {ZoneScope::NEW_YORK, fieldsOf(2022, 3, 13, 2, 30), std::nullopt},
        {ZoneScope::NEW_YORK, fieldsOf(2022, 11, 6, 1, 30), 1667712600},
        {ZoneScope::NEW_YORK, fieldsOf(2022, 11, 6, 2, 30), 1667719800},
        {ZoneScope::LORD_HOWE, fieldsOf(2022, 10, 2, 2, 15), std::nullopt},
        {ZoneScope::LORD_HOWE, fieldsOf(2022, 4, 3, 1, 45), 1648910700},
        {"XYZ12", fieldsOf(2022, 1, 1, 0, 0), 1641038400},
        {"XYZ-14", fieldsOf(2022, 1, 1, 0, 0), 1640944800},
        {"XYZ-14", fieldsOf(1, 1, 1, 0, 0), std::nullopt},       // still year 0 in UTC
        {"XYZ12", fieldsOf(9999, 12, 31, 12, 0), std::nullopt},  // already 10000 in UTC
    };
    for (const Row& row : rows) {
        const ZoneScope scope(row.zone);
        EXPECT_EQ(OsDateUtil::makeTime(row.fields, TimeMode::LOCAL), dateOf(row.seconds))
            << row.zone << ' ' << row.fields.year << '/' << row.fields.month << '/'
            << row.fields.day << ' ' << row.fields.hour << ':' << row.fields.minute;
    }
}

TEST(OsDateUtil, everyMinuteAroundAChangeOfClocksSurvivesLocalTime) {
    for (const char* const zone : {ZoneScope::BERLIN, ZoneScope::NEW_YORK, ZoneScope::LORD_HOWE}) {
        const ZoneScope scope(zone);
        constexpr std::int64_t BEGIN_2022 = 1640995200;
        for (std::int64_t seconds = BEGIN_2022; seconds < BEGIN_2022 + 366 * 86400;
             seconds += 450) {
            const DateRep date = *dateOf(seconds);
            const DateStruct fields = OsDateUtil::splitTime(date, TimeMode::LOCAL);
            ASSERT_EQ(OsDateUtil::makeTime(fields, TimeMode::LOCAL), date) << zone << seconds;
            const std::time_t moment = seconds;
            std::tm reference{};
            ASSERT_NE(::localtime_r(&moment, &reference), nullptr);
            ASSERT_EQ(fields.hour, reference.tm_hour) << zone << seconds;
            ASSERT_EQ(fields.minute, reference.tm_min) << zone << seconds;
            ASSERT_EQ(fields.yearDay, reference.tm_yday) << zone << seconds;
            ASSERT_EQ(fields.weekday, reference.tm_wday) << zone << seconds;
            ASSERT_EQ(fields.isDaylightSaving, reference.tm_isdst > 0) << zone << seconds;
        }
    }
}

TEST(OsDateUtil, formatsZoneNameAndOffset) {
    const ZoneScope scope(ZoneScope::BERLIN);
    char text[64];
    ASSERT_TRUE(
        OsDateUtil::format(text, sizeof text, "%H:%M %Z %z", *dateOf(1656669600), TimeMode::LOCAL));
    EXPECT_STREQ(text, "12:00 CEST +0200");
    ASSERT_TRUE(
        OsDateUtil::format(text, sizeof text, "%H:%M %Z %z", *dateOf(1656669600), TimeMode::UTC));
    EXPECT_STREQ(text, "10:00 UTC +0000");
}

}  // namespace

}  // namespace Orv

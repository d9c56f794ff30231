#include "liDate.h"
#include "zoneScope.h"

namespace Orv {

namespace {

using TimeMode = LiDate::TimeMode;

TEST(LiDate, localTextsSurviveInEveryZone) {
    const char* const zones[] = {
        "UTC0", ZoneScope::BERLIN, ZoneScope::NEW_YORK, ZoneScope::LORD_HOWE, "XYZ12", "XYZ-14"};
    const LiDate dates[] = {
        LiDate(1, 1, 2, 0, 0, 0.0, TimeMode::UTC),
        LiDate(1850, 6, 1, 12, 0, 0.25, TimeMode::UTC),
        LiDate(1969, 12, 31, 23, 59, 59.999, TimeMode::UTC),
        LiDate(2000, 2, 29, 12, 0, 0.0, TimeMode::UTC),
        LiDate(2022, 7, 1, 12, 0, 0.001, TimeMode::UTC),
        LiDate(9999, 12, 30, 12, 0, 0.0, TimeMode::UTC),
    };
    for (const char* const zone : zones) {
        const ZoneScope scope(zone);
        for (const LiDate& date : dates) {
            const LiString text = date.toString(TimeMode::LOCAL);
            EXPECT_EQ(LiDate(text), date) << zone << ' ' << text;
        }
    }
}

TEST(LiDate, localTimesFollowTheZone) {
    const LiDate date(2022, 7, 1, 10, 0, 0.5, TimeMode::UTC);
    struct Row {
        const char* zone;
        const char* expected;
        int hour;
    };
    const Row rows[] = {
        {ZoneScope::BERLIN, "2022/07/01 12:00:00.500 ", 12},
        {ZoneScope::NEW_YORK, "2022/07/01 06:00:00.500 ", 6},
        {ZoneScope::LORD_HOWE, "2022/07/01 20:30:00.500 ", 20},
        {"XYZ-14", "2022/07/02 00:00:00.500 ", 0},
    };
    for (const Row& row : rows) {
        const ZoneScope scope(row.zone);
        EXPECT_EQ(date.toString(TimeMode::LOCAL), row.expected) << row.zone;
        EXPECT_EQ(date.getLocalTime().hour, row.hour) << row.zone;
        EXPECT_EQ(date.toString(TimeMode::UTC), "2022/07/01 10:00:00.500 UTC") << row.zone;
    }
    const ZoneScope scope(ZoneScope::BERLIN);
    EXPECT_EQ(date.toString("%H:%M %Z"), "12:00 CEST");
}

TEST(LiDate, aLocalTimeThatTheClockLeavesOutIsNotRead) {
    const ZoneScope scope(ZoneScope::BERLIN);
    std::istringstream stream("2022/03/27 02:30:00");
    LiDate date;
    EXPECT_FALSE(stream >> date);
    stream.clear();
    stream.str("2022/03/27 03:00:00");
    EXPECT_TRUE(stream >> date);
    EXPECT_EQ(date, LiDate(2022, 3, 27, 1, 0, 0.0, TimeMode::UTC));
}

}  // namespace

}  // namespace Orv

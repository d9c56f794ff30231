#include <cmath>
#include <limits>

#include "assertions.h"
#include "osDateUtil.h"

namespace Orv {

namespace {

using DateRep = OsDateTypes::DateRep;
using DateStruct = OsDateTypes::DateStruct;
using TimeMode = OsDateTypes::TimeMode;

constexpr std::int64_t TICKS = OsDateTypes::TICKS_PER_SECOND;

DateStruct fieldsOf(int year, int month, int day, int hour = 0, int minute = 0,
                    double seconds = 0.0) {
    DateStruct fields;
    fields.year = year;
    fields.month = month;
    fields.day = day;
    fields.hour = hour;
    fields.minute = minute;
    fields.seconds = seconds;
    return fields;
}

DateRep dateOf(std::int64_t unixSeconds) {
    return DateRep(std::chrono::seconds(unixSeconds));
}

// The expected counts come from `date -u -d TEXT +%s`.
TEST(OsDateUtil, countsTheCalendarInUtc) {
    struct Row {
        DateStruct fields;
        std::int64_t seconds;
        int weekday, yearDay;
    };
    const Row rows[] = {
        {fieldsOf(1970, 1, 1), 0, 4, 0},
        {fieldsOf(1969, 12, 31, 23, 59, 59), -1, 3, 364},
        {fieldsOf(2000, 2, 29), 951782400, 2, 59},
        {fieldsOf(1900, 3, 1), -2203891200, 4, 59},
        {fieldsOf(2024, 12, 31, 12), 1735646400, 2, 365},
        {fieldsOf(2038, 1, 19, 3, 14, 8), 2147483648, 2, 18},
        {fieldsOf(1, 1, 1), -62135596800, 1, 0},
        {fieldsOf(9999, 12, 31, 23, 59, 59), 253402300799, 5, 364},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.seconds);
        const DateRep date = dateOf(row.seconds);
        EXPECT_EQ(OsDateUtil::makeTime(row.fields, TimeMode::UTC), date);
        const DateStruct fields = OsDateUtil::splitTime(date, TimeMode::UTC);
        EXPECT_EQ(fields.year, row.fields.year);
        EXPECT_EQ(fields.month, row.fields.month);
        EXPECT_EQ(fields.day, row.fields.day);
        EXPECT_EQ(fields.hour, row.fields.hour);
        EXPECT_EQ(fields.minute, row.fields.minute);
        EXPECT_EQ(fields.seconds, row.fields.seconds);
        EXPECT_EQ(fields.weekday, row.weekday);
        EXPECT_EQ(fields.yearDay, row.yearDay);
        EXPECT_EQ(fields.offsetSeconds, 0);
    }
}

TEST(OsDateUtil, refusesFieldsThatNameNoDate) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const double infinite = std::numeric_limits<double>::infinity();
    const DateStruct rows[] = {
        fieldsOf(2022, 0, 1),
        fieldsOf(2022, 13, 1),
        fieldsOf(2022, 258, 1),  // would be 2 in a byte
        fieldsOf(2022, 1, 0),
        fieldsOf(2022, 1, 32),
        fieldsOf(2022, 1, 257),
        fieldsOf(2022, 2, 30),
        fieldsOf(2023, 2, 29),
        fieldsOf(1900, 2, 29),
        fieldsOf(2022, 4, 31),
        fieldsOf(0, 12, 31),
        fieldsOf(-1, 1, 1),
        fieldsOf(10000, 1, 1),
        fieldsOf(std::numeric_limits<int>::max(), 1, 1),
        fieldsOf(std::numeric_limits<int>::min(), 1, 1),
        fieldsOf(2022, 1, 1, 24),
        fieldsOf(2022, 1, 1, -1),
        fieldsOf(2022, 1, 1, 0, 60),
        fieldsOf(2022, 1, 1, 0, -1),
        fieldsOf(2022, 1, 1, 0, 0, 60.0),
        fieldsOf(2022, 1, 1, 0, 0, -1e-9),
        fieldsOf(2022, 1, 1, 0, 0, nan),
        fieldsOf(2022, 1, 1, 0, 0, infinite),
        fieldsOf(2022, 1, 1, 0, 0, 1e300),
    };
    for (const DateStruct& row : rows) {
        for (const TimeMode mode : {TimeMode::UTC, TimeMode::LOCAL}) {
            EXPECT_EQ(OsDateUtil::makeTime(row, mode), std::nullopt)
                << row.year << '/' << row.month << '/' << row.day << ' ' << row.hour << ':'
                << row.minute << ':' << row.seconds;
        }
    }
}

TEST(OsDateUtil, secondsKeepTheirMillisecondAndStayBelowSixty) {
    for (int i = 0; i < 60000; ++i) {
        const std::optional<DateRep> date =
            OsDateUtil::makeTime(fieldsOf(1960, 1, 1, 0, 0, i / 1000.0), TimeMode::UTC);
        ASSERT_TRUE(date);
        ASSERT_EQ(OsDateUtil::getMilliseconds(*date), i % 1000) << i;
        ASSERT_EQ(OsDateUtil::splitTime(*date, TimeMode::UTC).seconds, i / 1000.0) << i;
    }
    for (const double almost : {59.9999, 59.9999999, std::nextafter(60.0, 0.0)}) {
        const std::optional<DateRep> date =
            OsDateUtil::makeTime(fieldsOf(9999, 12, 31, 23, 59, almost), TimeMode::UTC);
        ASSERT_TRUE(date) << almost;
        EXPECT_EQ(OsDateUtil::getMilliseconds(*date), 999) << almost;
    }
}

TEST(OsDateUtil, sumsAndDifferencesAreExactToTheTickAndStayInRange) {
    const DateRep date = dateOf(-1);
    EXPECT_EQ(OsDateUtil::addSeconds(date, 1.5), DateRep(OsDateTypes::Ticks(TICKS / 2)));
    EXPECT_EQ(OsDateUtil::addSeconds(date, -1e-7), date - OsDateTypes::Ticks(1));
    EXPECT_EQ(OsDateUtil::addSeconds(date, 315537897599.0 + 1), std::nullopt);
    EXPECT_EQ(OsDateUtil::addSeconds(OsDateTypes::getFirst(), 315537897599.0),
              OsDateTypes::getLast() - OsDateTypes::Ticks(TICKS - 1));
    EXPECT_EQ(OsDateUtil::addSeconds(OsDateTypes::getLast(), 1e-7), std::nullopt);
    EXPECT_EQ(OsDateUtil::addSeconds(OsDateTypes::getFirst(), -1e-7), std::nullopt);
    for (const double wild : {1e300, -1e300, std::numeric_limits<double>::infinity(),
                              std::numeric_limits<double>::quiet_NaN()}) {
        EXPECT_EQ(OsDateUtil::addSeconds(date, wild), std::nullopt) << wild;
    }
    EXPECT_DOUBLE_EQ(OsDateUtil::getDifference(dateOf(5), dateOf(-5)), 10.0);
    EXPECT_DOUBLE_EQ(OsDateUtil::getDifference(OsDateTypes::getFirst(), OsDateTypes::getLast()),
                     -315537897600.0);
}

TEST(OsDateUtil, refusesDatesBeyondItsYears) {
    char text[64];
    for (const DateRep& date :
         {OsDateTypes::getFirst() - OsDateTypes::Ticks(1),
          OsDateTypes::getLast() + OsDateTypes::Ticks(1), DateRep::min(), DateRep::max()}) {
        for (const TimeMode mode : {TimeMode::UTC, TimeMode::LOCAL}) {
            EXPECT_THROW(OsDateUtil::splitTime(date, mode), AssertionFailed);
            EXPECT_THROW((void)OsDateUtil::format(text, sizeof text, "%Y", date, mode),
                         AssertionFailed);
        }
    }
}

// Whatever the zone of the machine: what is taken apart can be put together again.
TEST(OsDateUtil, everyDateSurvivesLocalTime) {
    const std::int64_t first = OsDateTypes::getFirst().time_since_epoch().count() / TICKS;
    const std::int64_t last = OsDateTypes::getLast().time_since_epoch().count() / TICKS;
    constexpr std::int64_t STEPS = 2003;
    const std::int64_t step = (last - first - 4 * 86400) / STEPS;
    for (std::int64_t i = 0; i < STEPS; ++i) {
        const DateRep date = dateOf(first + 2 * 86400 + i * step) + OsDateTypes::Ticks(i);
        const DateStruct fields = OsDateUtil::splitTime(date, TimeMode::LOCAL);
        ASSERT_EQ(OsDateUtil::makeTime(fields, TimeMode::LOCAL), date) << i;
    }
    // The first and last hours lie in other years for other zones, but never fault.
    for (const DateRep& date : {OsDateTypes::getFirst(), OsDateTypes::getLast()}) {
        EXPECT_NO_THROW((void)OsDateUtil::splitTime(date, TimeMode::LOCAL));
    }
}

TEST(OsDateUtil, formatsWholeOrNotAtAll) {
    char text[8];
    const DateRep date = dateOf(951782400);
    const auto format = [&](const char* pattern) {
        return OsDateUtil::format(text, sizeof text, pattern, date, TimeMode::UTC);
    };
    EXPECT_EQ(format("%Y-%m"), 7U);
    EXPECT_STREQ(text, "2000-02");
    EXPECT_EQ(format("%Y-%m-"), std::nullopt);
    EXPECT_EQ(format(""), 0U);
    EXPECT_STREQ(text, "");
    EXPECT_EQ(format("100%%"), 4U);
    EXPECT_STREQ(text, "100%");
    EXPECT_EQ(format("%j %a"), 7U);
    EXPECT_STREQ(text, "060 Tue");
}

}  // namespace

}  // namespace Orv

#include <limits>

#include "assertions.h"
#include "liDate.h"
#include "osDateUtil.h"

namespace Orv {

namespace {

using TimeMode = LiDate::TimeMode;

std::string utcTextOf(const LiDate& date) {
    return std::string(date.toString(TimeMode::UTC).getText());
}

TEST(LiDate, writesItsFixedText) {
    struct Row {
        LiDate date;
        const char* expected;
    };
    const Row rows[] = {
        {LiDate(2022, 3, 4, 12, 0, 0.0, TimeMode::UTC), "2022/03/04 12:00:00.000 UTC"},
        {LiDate(1, 1, 1, 0, 0, 0.0, TimeMode::UTC), "0001/01/01 00:00:00.000 UTC"},
        {LiDate(9999, 12, 31, 23, 59, 59.9999, TimeMode::UTC), "9999/12/31 23:59:59.999 UTC"},
        {LiDate(1969, 12, 31, 23, 59, 59.9999, TimeMode::UTC), "1969/12/31 23:59:59.999 UTC"},
        {LiDate(2022, 3, 4, 12, 0, 59.99999999, TimeMode::UTC), "2022/03/04 12:00:59.999 UTC"},
        {LiDate(2022, 3, 4, 12, 0, 1.0019999, TimeMode::UTC), "2022/03/04 12:00:01.001 UTC"},
        {LiDate(2022, 3, 4, 12, 0, 59.001, TimeMode::UTC), "2022/03/04 12:00:59.001 UTC"},
        {LiDate(2000, 2, 29, 1, 2, 3.004, TimeMode::UTC), "2000/02/29 01:02:03.004 UTC"},
    };
    for (const Row& row : rows) EXPECT_EQ(utcTextOf(row.date), row.expected);
    const LiString local = LiDate().toString(TimeMode::LOCAL);
    EXPECT_EQ(local.getLength(), 24);
    EXPECT_EQ(local[23], ' ');
}

TEST(LiDate, readsWhatItsTextMayLookLike) {
    struct Row {
        const char* text;
        const char* expected;  // in UTC, null where the read fails
        bool isGoodAfterwards;
    };
    const Row rows[] = {
        {"2022/03/04 12:00:00.000 UTC", "2022/03/04 12:00:00.000 UTC", false},
        {"2022/03/04 12:00:00.000 UTC ", "2022/03/04 12:00:00.000 UTC", true},
        {"2022/03/04 12:00:00.000 UTC rest", "2022/03/04 12:00:00.000 UTC", true},
        {" \t\n2022 / 3 / 4   12 : 0 : 0 \n UTC\n", "2022/03/04 12:00:00.000 UTC", true},
        {"2022/3/4 12:0:1.5UTC", "2022/03/04 12:00:01.500 UTC", false},
        {"2022/03/0412:00:00 UTC", nullptr, false},  // 412 is no day
        {"2022/03/04T12:00:00 UTC", nullptr, false},
        {"2022/03/04 12:00:00 GMT", nullptr, false},
        {"2022/03/04 12:00:00 utc", nullptr, false},
        {"2022/03/04 12:00:00 UT", nullptr, false},
        {"2022/03/04 12:00:00 UTCX", nullptr, false},
        {"2022/03/04 12:00:00 UTCXY", nullptr, false},
        {"2022/03/04 12:00:00 UTC1 rest", nullptr, false},
        {"2022/03/04 12:00:00 +0100", nullptr, false},
        {"2022/03/04 12:00:00.000.000 UTC", nullptr, false},
        {"2022-03-04 12:00:00 UTC", nullptr, false},
        {"2022/03-04 12:00:00 UTC", nullptr, false},
        {"2022/03/04 12.00:00 UTC", nullptr, false},
        {"2022/03/04 12:00/00 UTC", nullptr, false},
        {"2022/03/04 12:00 UTC", nullptr, false},
        {"2022/03/04", nullptr, false},
        {"2022/", nullptr, false},
        {"", nullptr, false},
        {"   ", nullptr, false},
        {"yesterday", nullptr, false},
        {"2022/13/01 00:00:00 UTC", nullptr, false},
        {"2022/02/30 00:00:00 UTC", nullptr, false},
        {"2023/02/29 00:00:00 UTC", nullptr, false},
        {"1900/02/29 00:00:00 UTC", nullptr, false},
        {"2024/02/29 00:00:00 UTC", "2024/02/29 00:00:00.000 UTC", false},
        {"0/01/01 00:00:00 UTC", nullptr, false},
        {"-5/01/01 00:00:00 UTC", nullptr, false},
        {"10000/01/01 00:00:00 UTC", nullptr, false},
        {"99999999999/01/01 00:00:00 UTC", nullptr, false},
        {"2022/01/01 24:00:00 UTC", nullptr, false},
        {"2022/01/01 23:60:00 UTC", nullptr, false},
        {"2022/01/01 23:59:60 UTC", nullptr, false},
        {"2022/01/01 23:59:-1 UTC", nullptr, false},
        {"2022/01/01 23:59:nan UTC", nullptr, false},
        {"2022/01/01 23:59:1e999 UTC", nullptr, false},
        {"2022/01/01 23:59:5.9999e1 UTC", "2022/01/01 23:59:59.999 UTC", false},
        {"1969/07/20 20:17:40 UTC", "1969/07/20 20:17:40.000 UTC", false},
    };
    const LiDate before(1999, 9, 9, 9, 9, 9.0, TimeMode::UTC);
    for (const Row& row : rows) {
        SCOPED_TRACE(row.text);
        std::istringstream stream(row.text);
        LiDate date = before;
        stream >> date;
        EXPECT_EQ(stream.fail(), row.expected == nullptr);
        if (row.expected == nullptr) {
            EXPECT_EQ(date, before);
            EXPECT_THROW(LiDate{LiString(row.text)}, AssertionFailed);
        } else {
            EXPECT_EQ(stream.good(), row.isGoodAfterwards);
            EXPECT_EQ(utcTextOf(date), row.expected);
            EXPECT_EQ(LiDate(LiString(row.text)), date);
        }
    }
}

TEST(LiDate, withoutZoneWordTheTimeIsLocalAndTheStreamGood) {
    for (const char* const text : {"2022/07/04 12:30:15.25", "2022/07/04 12:30:15.25 \n"}) {
        std::istringstream stream(text);
        LiDate date;
        stream >> date;
        EXPECT_TRUE(stream.good());
        EXPECT_EQ(date, LiDate(2022, 7, 4, 12, 30, 15.25, TimeMode::LOCAL));
        EXPECT_EQ(date.toString(TimeMode::LOCAL), "2022/07/04 12:30:15.250 ");
    }
}

TEST(LiDate, aSequenceOfDatesIsReadOneByOne) {
    std::istringstream stream("2022/01/01 00:00:00 UTC 2022/01/02 00:00:00 UTC nonsense");
    LiDate first, second;
    stream >> first >> second;
    EXPECT_TRUE(stream.good());
    EXPECT_EQ(second - first, 86400.0);
    EXPECT_FALSE(stream >> first);
}

TEST(LiDate, everyMillisecondOfAMinuteSurvivesItsText) {
    const LiDate start(1955, 11, 5, 6, 15, 0.0, TimeMode::UTC);
    for (int i = 0; i < 60000; i += 61) {
        const LiDate date = start + i / 1000.0;
        for (const TimeMode mode : {TimeMode::UTC, TimeMode::LOCAL}) {
            ASSERT_EQ(LiDate(date.toString(mode)), date) << i;
        }
    }
}

TEST(LiDate, calculatesAndCompares) {
    const LiDate date(2024, 2, 28, 23, 59, 59.5, TimeMode::UTC);
    EXPECT_EQ(utcTextOf(date + 0.5), "2024/02/29 00:00:00.000 UTC");
    EXPECT_EQ(utcTextOf(1.0 + date), "2024/02/29 00:00:00.500 UTC");
    EXPECT_EQ(utcTextOf(date - 86400.0), "2024/02/27 23:59:59.500 UTC");
    EXPECT_EQ((date + 1.25) - date, 1.25);
    EXPECT_EQ(date - (date + 1.25), -1.25);
    EXPECT_EQ(LiDate::compare(date, date + 1), -1);
    EXPECT_EQ(LiDate::compare(date + 1, date), 1);
    EXPECT_EQ(LiDate::compare(date, date), 0);
    EXPECT_LT(date, date + 1e-7);
    LiDate moved = date;
    moved += 3600;
    moved -= 7200;
    EXPECT_EQ(utcTextOf(moved), "2024/02/28 22:59:59.500 UTC");
    const LiDate::DateStruct fields = moved.getUTCTime();
    EXPECT_EQ(fields.hour, 22);
    EXPECT_EQ(fields.seconds, 59.5);
}

TEST(LiDate, refusesWhatIsNoDateAndKeepsTheOld) {
    const LiDate before(2022, 1, 1, 0, 0, 0.0, TimeMode::UTC);
    LiDate date = before;
    EXPECT_THROW(date.set(2022, 2, 30, 0, 0, 0.0, TimeMode::UTC), AssertionFailed);
    EXPECT_THROW(date.set(2022, 13, 1, 0, 0, 0.0, TimeMode::LOCAL), AssertionFailed);
    for (const double wild : {1e12, -1e12, std::numeric_limits<double>::quiet_NaN(),
                              std::numeric_limits<double>::infinity()}) {
        EXPECT_THROW(date += wild, AssertionFailed) << wild;
        EXPECT_THROW(date -= wild, AssertionFailed) << wild;
        EXPECT_THROW(date.set(2022, 1, 1, 0, 0, wild, TimeMode::UTC), AssertionFailed) << wild;
    }
    EXPECT_THROW(LiDate{LiDate::DateRep::max()}, AssertionFailed);
    EXPECT_EQ(date, before);
    try {
        LiDate(2022, 2, 30, 0, 0, 0.0, TimeMode::UTC);
    } catch (const ExBase& exception) {
        EXPECT_STREQ(exception.getFile(), "src/resmgt/liDate");
    }
}

TEST(LiDate, strftimeTextsHaveAtMost255Characters) {
    const LiDate date(2022, 3, 4, 5, 6, 7.0, TimeMode::LOCAL);
    EXPECT_EQ(date.toString("%Y-%m-%d %H:%M:%S"), "2022-03-04 05:06:07");
    EXPECT_EQ(date.toString(""), "");
    EXPECT_THROW((void)date.toString(static_cast<const char*>(nullptr)), AssertionFailed);
    const std::string longest(255, '-');
    EXPECT_EQ(date.toString(longest.c_str()).getText(), longest);
    EXPECT_THROW((void)date.toString((longest + "-").c_str()), AssertionFailed);
    EXPECT_THROW((void)date.toString((longest.substr(3) + "%Y").c_str()), AssertionFailed);
    try {
        (void)date.toString(std::string(1000, 'x').c_str());
    } catch (const AssertionFailed& exception) {
        EXPECT_STREQ(exception.getFile(), "src/resmgt/liDate");
    }
}

TEST(LiDate, isThePresentUnlessToldOtherwise) {
    const LiDate::DateRep before = OsDateUtil::now();
    const LiDate first;
    const LiDate second = LiDate::now();
    // The clock may be set back meanwhile, but hardly by a day.
    EXPECT_LT(std::abs(first - LiDate(before)), 86400.0);
    EXPECT_LT(std::abs(second - first), 86400.0);
}

}  // namespace

}  // namespace Orv

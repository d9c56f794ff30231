#include <limits>

#include "liTimeCode.h"
#include "liTimeCodeFilm24.h"
#include "liTimeCodeNtscDf.h"
#include "liTimeCodeNtscNd.h"
#include "liTimeCodePal.h"

namespace Orv {

namespace {

constexpr std::int64_t MAX = std::numeric_limits<std::int64_t>::max();
constexpr std::int64_t MIN = std::numeric_limits<std::int64_t>::min();

/// A counter of timecode as a recorder has it: it goes one frame further at a time.
class Counter {
public:
    Counter(int framesPerSecond, bool isDropping)
        : _framesPerSecond(framesPerSecond), _isDropping(isDropping) {}

    void step() {
        if (++_frame < _framesPerSecond) return;
        _frame = 0;
        if (++_second < 60) return;
        _second = 0;
        ++_minute;
        if (_isDropping && _minute % 10 != 0) _frame = 2;
        if (_minute < 60) return;
        _minute = 0;
        if (++_hour == 24) _hour = 0;
    }

    std::string getText(char separator) const {
        char text[12] = "..:..:..:..";
        int position = 0;
        for (const int number : {_hour, _minute, _second, _frame}) {
            text[position++] = static_cast<char>('0' + number / 10);
            text[position++] = static_cast<char>('0' + number % 10);
            if (position < 11) text[position++] = separator;
        }
        return text;
    }

private:
    const int _framesPerSecond;
    const bool _isDropping;
    int _hour = 0, _minute = 0, _second = 0, _frame = 0;
};

struct Standard {
    RCShdPtr<LiTimeCode> timeCode;
    const char* shortName;
    const char* fullName;
    Rational editRate;
    int framesPerSecond;
    bool isDropping;
    std::int64_t framesPerDay;
};

std::vector<Standard> getStandards() {
    return {
        {LiTimeCodeFilm24::create(), "Film24", "Film 24 FPS", {24, 1}, 24, false, 2073600},
        {LiTimeCodePal::create(), "PAL", "PAL 25 FPS", {25, 1}, 25, false, 2160000},
        {LiTimeCodeNtscNd::create(),
         "NTSC ND",
         "NTSC Non-Drop Frame 29.97 FPS",
         {2997, 100},
         30,
         false,
         2592000},
        {LiTimeCodeNtscDf::create(),
         "NTSC DF",
         "NTSC Drop Frame 29.97 FPS",
         {2997, 100},
         30,
         true,
         2589408},
    };
}

TEST(LiTimeCode, everyFrameOfADayHasTheTextThatACounterShows) {
    for (const Standard& standard : getStandards()) {
        SCOPED_TRACE(standard.shortName);
        const char separator = standard.isDropping ? ';' : ':';
        Counter counter(standard.framesPerSecond, standard.isDropping);
        for (std::int64_t frame = 0; frame < standard.framesPerDay; ++frame) {
            ASSERT_EQ(standard.timeCode->getTimecode(frame).getText(), counter.getText(separator))
                << frame;
            counter.step();
        }
        // Here the counter stands at midnight again, and so do the frames.
        EXPECT_EQ(counter.getText(':'), "00:00:00:00");
        EXPECT_EQ(standard.timeCode->getTimecode(standard.framesPerDay),
                  standard.timeCode->getTimecode(0));
    }
}

TEST(LiTimeCode, tellsTheStandardsFigures) {
    for (const Standard& standard : getStandards()) {
        const LiTimeCode& timeCode = *standard.timeCode;
        EXPECT_EQ(timeCode.getShortName(), standard.shortName);
        EXPECT_EQ(timeCode.getFullName(), standard.fullName);
        EXPECT_EQ(timeCode.getEditRate(), standard.editRate);
        EXPECT_EQ(timeCode.getDropFlag(), standard.isDropping);
        EXPECT_EQ(timeCode.getFramesPerTCSecond(), DtTimeIndex(standard.framesPerSecond));
        EXPECT_EQ(timeCode.getFramesPerTC24h(), DtTimeIndex(standard.framesPerDay));
    }
}

TEST(LiTimeCode, framesOfOtherDaysHaveTheSameTimeOfDay) {
    for (const Standard& standard : getStandards()) {
        SCOPED_TRACE(standard.shortName);
        const LiTimeCode& timeCode = *standard.timeCode;
        const std::int64_t perDay = standard.framesPerDay;
        struct Row {
            std::int64_t frame, day, sameAs;
        };
        const Row rows[] = {
            {0, 0, 0},
            {perDay - 1, 0, perDay - 1},
            {perDay, 1, 0},
            {10 * perDay + 1800, 10, 1800},
            {-1, -1, perDay - 1},
            {-perDay, -1, 0},
            {-perDay - 1, -2, perDay - 1},
            {MAX, MAX / perDay, MAX % perDay},
            {MIN, MIN / perDay - 1, perDay + MIN % perDay},
        };
        for (const Row& row : rows) {
            EXPECT_EQ(timeCode.getDay(row.frame), row.day) << row.frame;
            EXPECT_EQ(timeCode.getTimecode(row.frame), timeCode.getTimecode(row.sameAs))
                << row.frame;
        }
    }
}

TEST(LiTimeCode, knownFramesHaveKnownTexts) {
    const RCShdPtr<LiTimeCode> dropping = LiTimeCodeNtscDf::create();
    const RCShdPtr<LiTimeCode> counting = LiTimeCodeNtscNd::create();
    EXPECT_EQ(dropping->getTimecode(1799), "00;00;59;29");
    EXPECT_EQ(dropping->getTimecode(1800), "00;01;00;02");
    EXPECT_EQ(dropping->getTimecode(17981), "00;09;59;29");
    EXPECT_EQ(dropping->getTimecode(17982), "00;10;00;00");
    EXPECT_EQ(dropping->getTimecode(2589407), "23;59;59;29");
    EXPECT_EQ(dropping->getTimecode(-1), "23;59;59;29");
    EXPECT_EQ(counting->getTimecode(1800), "00:01:00:00");
    EXPECT_EQ(LiTimeCodePal::create()->getTimecode(90061), "01:00:02:11");
}

TEST(LiTimeCode, genericTextTakesAnySeparatorWidthAndFill) {
    const RCShdPtr<LiTimeCode> timeCode = LiTimeCodePal::create();
    struct Row {
        std::int64_t frame;
        int width;
        char fill;
        const char* expected;
    };
    const Row rows[] = {
        {90061, 3, '_', "__1h__0m__2s_11"},
        {90061, 0, '0', "1h0m2s11"},
        {90061, -5, '0', "1h0m2s11"},
        {2160000 * 5, 2, '0', "120h00m00s00"},  // days are not taken off
        {MAX, 1, ' ', "102481911520608h37m12s7"},
        {-26, 2, ' ', " 0h 0m-1s-1"},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(timeCode->getGenericTimecode(row.frame, 'h', 'm', 's', row.width, row.fill),
                  row.expected)
            << row.frame << ' ' << row.width;
    }
}

}  // namespace

}  // namespace Orv

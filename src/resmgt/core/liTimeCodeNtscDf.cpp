#include "liTimeCodeNtscDf.h"

namespace Orv {

RCShdPtr<LiTimeCodeNtscDf> LiTimeCodeNtscDf::create() {
    return RCShdPtr<LiTimeCodeNtscDf>(new LiTimeCodeNtscDf);
}

LiTimeCodeNtscDf::LiTimeCodeNtscDf()
    : LiTimeCode("NTSC Drop Frame 29.97 FPS", "NTSC DF", Rational(2997, 100), 30, true) {}

LiString LiTimeCodeNtscDf::getTimecode(const DtTimeIndex& frame) const {
    constexpr std::int64_t FRAMES_PER_TEN_MINUTES = 17982;  // 10 * 60 * 30 less 9 * 2
    constexpr std::int64_t FRAMES_PER_MINUTE = 1798;        // of one that drops two
    const std::int64_t number = findFrameOfDay(frame);
    const std::int64_t blocks = number / FRAMES_PER_TEN_MINUTES;
    // The first minute of a block is two frames longer than the others; the two before them divide
    // towards zero, into that minute.
    const std::int64_t minutes = (number - FRAMES_PER_TEN_MINUTES * blocks - 2) / FRAMES_PER_MINUTE;
    return getGenericTimecode(number + 18 * blocks + 2 * minutes, ';', ';', ';', 2, '0');
}

DtTimeIndex LiTimeCodeNtscDf::getFramesPerTC24h() const {
    return 2589408;  // 24 * 6 blocks of 17982
}

}  // namespace Orv

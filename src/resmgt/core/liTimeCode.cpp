#include "liTimeCode.h"

#include <string>

namespace Orv {

LiTimeCode::LiTimeCode(const char* fullName, const char* shortName, const Rational& editRate,
                       const DtTimeIndex& framesPerTCSecond, bool dropFlag)
    : _fullName(fullName),
      _shortName(shortName),
      _editRate(editRate),
      _framesPerTCSecond(framesPerTCSecond),
      _dropFlag(dropFlag) {}

LiString LiTimeCode::getTimecode(const DtTimeIndex& frame) const {
    return getGenericTimecode(findFrameOfDay(frame), ':', ':', ':', 2, '0');
}

DtTimeIndex LiTimeCode::getFramesPerTC24h() const {
    return _framesPerTCSecond.getFrames() * 86400;
}

std::int64_t LiTimeCode::getDay(const DtTimeIndex& frame) const {
    const std::int64_t perDay = getFramesPerTC24h().getFrames();
    const std::int64_t number = frame.getFrames();
    return number >= 0 ? number / perDay : (number + 1) / perDay - 1;
}

std::int64_t LiTimeCode::findFrameOfDay(const DtTimeIndex& frame) const {
    const std::int64_t perDay = getFramesPerTC24h().getFrames();
    const std::int64_t rest = frame.getFrames() % perDay;
    return rest < 0 ? rest + perDay : rest;
}

LiString LiTimeCode::getGenericTimecode(const DtTimeIndex& frame, char separator1, char separator2,
                                        char separator3, int width, char fill) const {
    std::string text;
    const auto append = [&](std::int64_t number) {
        const std::string digits = std::to_string(number);
        const std::size_t wanted = width > 0 ? static_cast<std::size_t>(width) : 0;
        if (digits.size() < wanted) text.append(wanted - digits.size(), fill);
        text.append(digits);
    };
    const std::int64_t perSecond = _framesPerTCSecond.getFrames();
    const std::int64_t seconds = frame.getFrames() / perSecond;
    append(seconds / 3600);
    text.push_back(separator1);
    append(seconds % 3600 / 60);
    text.push_back(separator2);
    append(seconds % 60);
    text.push_back(separator3);
    append(frame.getFrames() % perSecond);
    return LiString(std::string_view(text));
}

}  // namespace Orv

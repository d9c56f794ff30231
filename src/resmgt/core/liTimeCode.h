#pragma once

#include <cstdint>

#include "dtTimeIndex.h"
#include "liString.h"
#include "lkCounter.h"
#include "rational.h"
#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

/// A standard of video timecode: turns the number of a frame into hours, minutes, seconds and
/// frames, from zero at midnight.
///
/// The standards are LiTimeCodeFilm24, LiTimeCodePal, LiTimeCodeNtscNd and LiTimeCodeNtscDf; each
/// makes its objects with create(). An object never changes.
///
/// - Threads: every member may be called by any thread.
class ORV_RESMGT_API LiTimeCode : public RCBase<LkCounter<long>> {
public:
    /// The frame's text, such as "01:00:02:11". Days follow one another: a frame of another day,
    /// also of one before the first, has the text of the same time of day.
    virtual LiString getTimecode(const DtTimeIndex& frame) const;

    virtual DtTimeIndex getFramesPerTC24h() const;  ///< Frames from one midnight to the next.

    /// The day that a frame belongs to, from 0; frame -1 is the last one of day -1.
    std::int64_t getDay(const DtTimeIndex& frame) const;

    /// Divides a number of frames by frames per timecode second, seconds and minutes, dropping
    /// none, and writes the four, each right-aligned in @p width characters.
    LiString getGenericTimecode(const DtTimeIndex& frame, char separator1, char separator2,
                                char separator3, int width, char fill) const;

    const LiString& getFullName() const noexcept { return _fullName; }
    const LiString& getShortName() const noexcept { return _shortName; }
    const Rational& getEditRate() const noexcept { return _editRate; }  ///< Frames per second.
    bool getDropFlag() const noexcept { return _dropFlag; }
    DtTimeIndex getFramesPerTCSecond() const noexcept { return _framesPerTCSecond; }

    LiTimeCode(const LiTimeCode&) = delete;
    LiTimeCode& operator=(const LiTimeCode&) = delete;

protected:
    LiTimeCode(const char* fullName, const char* shortName, const Rational& editRate,
               const DtTimeIndex& framesPerTCSecond, bool dropFlag);

    /// The number of the frame within its day.
    std::int64_t findFrameOfDay(const DtTimeIndex& frame) const;

private:
    const LiString _fullName;
    const LiString _shortName;
    const Rational _editRate;
    const DtTimeIndex _framesPerTCSecond;
    const bool _dropFlag;
};

}  // namespace Orv

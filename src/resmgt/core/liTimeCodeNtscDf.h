#pragma once

#include "liTimeCode.h"
#include "rcShdPtr.h"

namespace Orv {

/// Timecode of 29.97 frames per second that skips numbers, not frames, to keep up with the clock.
class ORV_RESMGT_API LiTimeCodeNtscDf : public LiTimeCode {
public:
    static RCShdPtr<LiTimeCodeNtscDf> create();

    /// Separated by semicolons, and of every minute but each tenth without its first two numbers,
    /// so that the text keeps up with the clock.
    LiString getTimecode(const DtTimeIndex& frame) const override;

    DtTimeIndex getFramesPerTC24h() const override;

private:
    LiTimeCodeNtscDf();
};

}  // namespace Orv

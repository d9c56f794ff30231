#pragma once

#include "liTimeCode.h"
#include "rcShdPtr.h"

namespace Orv {

/// Timecode of 29.97 frames per second that counts every frame, 30 to a second of the text: it
/// falls behind the clock by 3.6 seconds an hour.
class ORV_RESMGT_API LiTimeCodeNtscNd : public LiTimeCode {
public:
    static RCShdPtr<LiTimeCodeNtscNd> create();

private:
    LiTimeCodeNtscNd();
};

}  // namespace Orv

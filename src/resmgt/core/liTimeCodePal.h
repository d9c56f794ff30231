#pragma once

#include "liTimeCode.h"
#include "rcShdPtr.h"

namespace Orv {

/// Timecode of 25 frames per second.
class ORV_RESMGT_API LiTimeCodePal : public LiTimeCode {
public:
    static RCShdPtr<LiTimeCodePal> create();

private:
    LiTimeCodePal();
};

}  // namespace Orv

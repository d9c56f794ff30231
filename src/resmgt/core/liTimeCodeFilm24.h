#pragma once

#include "liTimeCode.h"
#include "rcShdPtr.h"

namespace Orv {

/// Timecode of film, 24 frames per second.
class ORV_RESMGT_API LiTimeCodeFilm24 : public LiTimeCode {
public:
    static RCShdPtr<LiTimeCodeFilm24> create();

private:
    LiTimeCodeFilm24();
};

}  // namespace Orv

#include "liTimeCodeNtscNd.h"

namespace Orv {

RCShdPtr<LiTimeCodeNtscNd> LiTimeCodeNtscNd::create() {
    return RCShdPtr<LiTimeCodeNtscNd>(new LiTimeCodeNtscNd);
}

LiTimeCodeNtscNd::LiTimeCodeNtscNd()
    : LiTimeCode("NTSC Non-Drop Frame 29.97 FPS", "NTSC ND", Rational(2997, 100), 30, false) {}

}  // namespace Orv

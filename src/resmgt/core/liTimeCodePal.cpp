#include "liTimeCodePal.h"

namespace Orv {

RCShdPtr<LiTimeCodePal> LiTimeCodePal::create() {
    return RCShdPtr<LiTimeCodePal>(new LiTimeCodePal);
}

LiTimeCodePal::LiTimeCodePal() : LiTimeCode("PAL 25 FPS", "PAL", Rational(25, 1), 25, false) {}

}  // namespace Orv

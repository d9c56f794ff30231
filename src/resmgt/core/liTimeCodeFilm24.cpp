#include "liTimeCodeFilm24.h"

namespace Orv {

RCShdPtr<LiTimeCodeFilm24> LiTimeCodeFilm24::create() {
    return RCShdPtr<LiTimeCodeFilm24>(new LiTimeCodeFilm24);
}

LiTimeCodeFilm24::LiTimeCodeFilm24()
    : LiTimeCode("Film 24 FPS", "Film24", Rational(24, 1), 24, false) {}

}  // namespace Orv

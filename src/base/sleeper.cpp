#include "sleeper.h"

#include "dtTimeMark.h"

namespace Orv {

void Sleeper::sleep(double seconds) {
    if (seconds > 0.0) {
        sleepUntil(DtTimeMark::now() + seconds);
    } else {
        yield();
    }
}

}  // namespace Orv

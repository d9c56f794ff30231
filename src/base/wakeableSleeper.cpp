#include "wakeableSleeper.h"

#include "wakeableSleeperNative.h"

namespace Orv {

WakeableSleeper::WakeableSleeper() : _native(std::make_unique<Native>()) {}

WakeableSleeper::~WakeableSleeper() = default;

void WakeableSleeper::sleepUntil(const DtTimeMark& deadline) {
    _native->sleepUntil(deadline);
}

void WakeableSleeper::wake() {
    _native->wake();
}

}  // namespace Orv

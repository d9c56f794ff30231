#include "seSourceClock.h"

#include "lkSingleton.h"

namespace Orv {

SeSourceClock& SeSourceClock::getInstance() {
    return LkSingleton<SeSourceClock>::getInstance();
}

ObjPtrRet<SeSourceClock> SeSourceClock::createInstance() {
    return ObjPtrRet<SeSourceClock>(new SeSourceClock("SeSourceClock", DEFAULT_SECONDS));
}

SeSourceClock::SeSourceClock(const LiString& name, double intervalSeconds)
    : SeSourceProtocol(name), _timer(intervalSeconds) {}

double SeSourceClock::setInterval(double seconds) {
    return _timer.setInterval(seconds);
}

void SeSourceClock::start() {
    _timer.start();
}

std::uint32_t SeSourceClock::waitForTick() {
    return static_cast<std::uint32_t>(_timer.wait());
}

void SeSourceClock::stop() {
    _timer.stop();
}

void SeSourceClock::cancelWait() {
    _timer.stop();
}

}  // namespace Orv

#include "lkPulse.h"

#include <ostream>

#include "assertions.h"

namespace Orv {

LkPulse::LkPulse(const char* name, WakeType wakeType) noexcept
    : _queue(wakeType == WAKE_ALL ? LkWaitQueue::Memory::LASTS : LkWaitQueue::Memory::COUNTS),
      _name(name),
      _wakeType(wakeType) {}

void LkPulse::pulse() {
    const bool hasRoom = _queue.release();  // a waiter may have destroyed the pulse by now
    ORV_ASSERT_TEXT(hasRoom, "pendingPulses < 2147483647");
}

void LkPulse::reset() noexcept {
    _queue.reset();
}

void LkPulse::performWait(const LkMutex& mutex) {
    ORV_ASSERT_TEXT(_queue.wait(mutex, LkTimeLimit()), "wait_internal( externalMutex, INFINITE )");
}

bool LkPulse::performTimedWait(const LkMutex& mutex, double seconds) {
    return _queue.wait(mutex, LkTimeLimit(seconds));
}

void LkPulse::dump(std::ostream& stream) const {
    stream << "LkPulse \"" << _name << "\" wakes " << (_wakeType == WAKE_ALL ? "all" : "one")
           << ", pending " << _queue.getNbReleases() << ", waiting " << _queue.getNbWaiters();
}

}  // namespace Orv

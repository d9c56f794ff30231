#include "lkEvent.h"

#include <ostream>

namespace Orv {

LkEvent::LkEvent(const char* name, bool initiallySet) noexcept
    : _queue(LkWaitQueue::Memory::LASTS, initiallySet ? 1 : 0), _name(name) {}

void LkEvent::set() noexcept {
    _queue.release();
}

void LkEvent::reset() noexcept {
    _queue.reset();
}

void LkEvent::wait() {
    _queue.wait(LkTimeLimit());
}

bool LkEvent::timedWait(double seconds) {
    return _queue.wait(LkTimeLimit(seconds));
}

void LkEvent::dump(std::ostream& stream) const {
    stream << "LkEvent \"" << _name << "\" " << (_queue.getNbReleases() > 0 ? "set" : "not set")
           << ", waiting " << _queue.getNbWaiters();
}

}  // namespace Orv

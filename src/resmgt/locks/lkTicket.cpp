#include "lkTicket.h"

#include "assertions.h"

namespace Orv {

void LkTicket::next() {
    const LkGuard guard(_mutex);
    _ticket.fetch_add(1, std::memory_order_release);
    _pulse.pulse();
}

bool LkTicket::waitForTicket(std::int64_t ticket) {
    const LkGuard guard(_mutex);
    ORV_ASSERT(ticket >= _ticket);
    bool hasWaited = false;
    while (_ticket.load(std::memory_order_relaxed) < ticket) {
        hasWaited = true;
        _pulse.reset();
        _pulse.wait(guard);
    }
    return hasWaited;
}

}  // namespace Orv

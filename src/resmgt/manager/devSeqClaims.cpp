#include <unordered_set>

#include "devSeqClaimsPrivate.h"
#include "lkLock.h"

namespace Orv {

namespace {

struct Claimed {
    LkLock lock{"DevSeqClaims"};
    std::unordered_set<const DevMDPrtcl*> devices ORV_GUARDED_BY(lock);
};

// Never destroyed: sequences may end while the process does.
Claimed& getClaimed() {
    static Claimed& claimed = *new Claimed;
    return claimed;
}

}  // namespace

bool DevSeqClaims::add(const Devices& devices) {
    Claimed& claimed = getClaimed();
    const LkGuard guard(claimed.lock);
    std::size_t nbAdded = 0;
    const auto undo = [&] {
        while (nbAdded > 0) claimed.devices.erase(devices[--nbAdded]);
    };
    try {
        while (nbAdded < devices.size() && claimed.devices.insert(devices[nbAdded]).second) {
            ++nbAdded;
        }
    } catch (...) {
        undo();
        throw;
    }
    if (nbAdded == devices.size()) return true;
    undo();
    return false;
}

void DevSeqClaims::remove(const DevMDPrtcl& device) noexcept {
    Claimed& claimed = getClaimed();
    const LkGuard guard(claimed.lock);
    claimed.devices.erase(&device);
}

}  // namespace Orv

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
    claimed.devices.reserve(claimed.devices.size() + devices.size());
    for (const DevMDPrtcl* const device : devices) {
        if (claimed.devices.contains(device)) return false;
    }
    std::unordered_set<const DevMDPrtcl*> added(devices.begin(), devices.end());
    claimed.devices.merge(added);  // moves what is there already: it cannot fail half-way
    return true;
}

void DevSeqClaims::remove(const DevMDPrtcl& device) noexcept {
    Claimed& claimed = getClaimed();
    const LkGuard guard(claimed.lock);
    claimed.devices.erase(&device);
}

}  // namespace Orv

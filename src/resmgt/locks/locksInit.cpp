#include "inPackageInit.h"
#include "lkSingletonState.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

/// Every package depends on this one, so the singletons go when nothing of the library works any
/// more.
class LocksPackage : public InPackageInit {
public:
    LocksPackage() : InPackageInit("locks", InInit<OrvInit::locks>::getType()) {
        registerPackage();
        addDependency(InInit<OrvInit::base>::getType());
    }

private:
    void performInitialize() override { LkSingletonState::reviveAll(); }
    void performShutdown() override { LkSingletonState::destroyAll(); }
};

const LocksPackage locksPackage;

}  // namespace

}  // namespace Orv

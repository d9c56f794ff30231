#include "inPackageInit.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::deviceManager, OrvInit::deviceProtocol, OrvInit::threadExtensions,
                     OrvInit::threads, OrvInit::containers, OrvInit::literals, OrvInit::smartPtrs,
                     OrvInit::locks, OrvInit::base>
    deviceManagerPackage("deviceManager");

const InPlainPackage<OrvInit::resmgt, OrvInit::memoryBuffers, OrvInit::syncEngine,
                     OrvInit::deviceManager, OrvInit::deviceProtocol, OrvInit::threadExtensions,
                     OrvInit::threads, OrvInit::xml, OrvInit::containers, OrvInit::literals,
                     OrvInit::smartPtrs, OrvInit::dynamicAllocation, OrvInit::locks, OrvInit::base>
    resmgtPackage("resmgt");

}  // namespace

const std::type_info& InInit<OrvInit::resmgt>::getType() noexcept {
    return typeid(OrvInit::resmgt);
}

}  // namespace Orv

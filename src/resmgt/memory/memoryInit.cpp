#include "inPackageInit.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::dynamicAllocation, OrvInit::base> dynamicAllocationPackage(
    "dynamicAllocation");

const InPlainPackage<OrvInit::memoryBuffers, OrvInit::literals, OrvInit::smartPtrs,
                     OrvInit::dynamicAllocation, OrvInit::locks, OrvInit::base>
    memoryBuffersPackage("memoryBuffers");

}  // namespace

}  // namespace Orv

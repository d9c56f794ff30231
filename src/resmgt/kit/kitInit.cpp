#include "inPackageInit.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::deviceProtocol, OrvInit::threadExtensions, OrvInit::threads,
                     OrvInit::containers, OrvInit::literals, OrvInit::smartPtrs, OrvInit::locks,
                     OrvInit::base>
    deviceProtocolPackage("deviceProtocol");

}  // namespace

}  // namespace Orv

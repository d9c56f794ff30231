#include "inPackageInit.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::syncEngine, OrvInit::threads, OrvInit::literals, OrvInit::locks,
                     OrvInit::smartPtrs, OrvInit::base>
    syncEnginePackage("syncEngine");

}  // namespace

}  // namespace Orv

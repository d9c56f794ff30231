#include "inPackageInit.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::threads, OrvInit::literals, OrvInit::smartPtrs, OrvInit::locks,
                     OrvInit::base>
    threadsPackage("threads");

const InPlainPackage<OrvInit::threadExtensions, OrvInit::threads, OrvInit::literals,
                     OrvInit::smartPtrs, OrvInit::locks, OrvInit::base>
    threadExtensionsPackage("threadExtensions");

}  // namespace

}  // namespace Orv

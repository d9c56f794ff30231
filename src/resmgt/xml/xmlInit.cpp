#include "inPackageInit.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::xml, OrvInit::containers, OrvInit::literals, OrvInit::smartPtrs,
                     OrvInit::locks, OrvInit::base>
    xmlPackage("xml");

}  // namespace

}  // namespace Orv

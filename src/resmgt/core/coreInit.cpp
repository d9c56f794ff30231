#include "inPackageInit.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::smartPtrs, OrvInit::locks, OrvInit::base> smartPtrsPackage(
    "smartPtrs");

const InPlainPackage<OrvInit::containers, OrvInit::smartPtrs, OrvInit::base> containersPackage(
    "containers");

const InPlainPackage<OrvInit::literals, OrvInit::smartPtrs, OrvInit::base> literalsPackage(
    "literals");

}  // namespace

}  // namespace Orv

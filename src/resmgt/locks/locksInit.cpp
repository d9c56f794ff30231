#include "inPackageInit.h"
#include "resmgtInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::locks, OrvInit::base> locksPackage("locks");

}  // namespace

}  // namespace Orv

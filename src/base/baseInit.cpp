#include "inPackageInit.h"

namespace Orv {

namespace {

const InPlainPackage<OrvInit::base> basePackage("base");

}  // namespace

}  // namespace Orv

#include "rcExUtil.h"

#include "rcEx.h"

namespace Orv {

void RCExUtil::throwExNullPtr() {
    throw RCEx::ExNullPtr("src/resmgt/rcExUtil", 30);
}

}  // namespace Orv

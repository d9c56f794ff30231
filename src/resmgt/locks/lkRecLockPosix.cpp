#include "lkRecLockPosix.h"

#include <ostream>

namespace Orv {

void LkRecLockPosix::dump(std::ostream& stream) const {
    stream << "name " << _name << " holder " << _holder.load(std::memory_order_relaxed) << " count "
           << _futex.getDepth();
}

}  // namespace Orv

#include "lkLockPosix.h"

#include <ostream>

namespace Orv {

void LkLockPosix::dump(std::ostream& stream) const {
    stream << "Critical section \"" << _name;
}

}  // namespace Orv

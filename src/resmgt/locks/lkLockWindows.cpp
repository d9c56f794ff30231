#include "lkLockWindows.h"

#include <ostream>

namespace Orv {

void LkLockWindows::dump(std::ostream& stream) const {
    stream << "Critical section \"" << _name;
}

}  // namespace Orv

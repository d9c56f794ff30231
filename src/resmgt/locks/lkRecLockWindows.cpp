#include "lkRecLockWindows.h"

#include <ostream>

#include "assertions.h"

namespace Orv {

bool LkRecLockWindows::lock() noexcept {
    _section.enter();
    _holder.store(::GetCurrentThreadId(), std::memory_order_relaxed);
    return true;
}

void LkRecLockWindows::unlock() {
    ORV_ASSERT_TEXT(_section.isHeldByCaller(), "isHeldByCaller()");
    _holder.store(0, std::memory_order_relaxed);
    _section.leave();
}

void LkRecLockWindows::dump(std::ostream& stream) const {
    stream << "name " << _name << " holder " << _holder.load(std::memory_order_relaxed) << " count "
           << _section.getDepth();
}

}  // namespace Orv

#include "lkCriticalSectionWindows.h"

#include "assertions.h"

namespace Orv {

namespace {

constexpr auto relaxed = std::memory_order_relaxed;

}  // namespace

void LkCriticalSectionWindows::enter() noexcept {
    ::EnterCriticalSection(&_section);
    _depth.store(_depth.load(relaxed) + 1, relaxed);
    _owner.store(::GetCurrentThreadId(), relaxed);
}

void LkCriticalSectionWindows::leave() {
    ORV_ASSERT(isHeldByCaller());
    const int depth = _depth.load(relaxed) - 1;
    if (depth == 0) _owner.store(0, relaxed);
    _depth.store(depth, relaxed);
    ::LeaveCriticalSection(&_section);
}

bool LkCriticalSectionWindows::isHeldByCaller() const noexcept {
    return _owner.load(relaxed) == ::GetCurrentThreadId();
}

}  // namespace Orv

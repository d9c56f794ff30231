#include "lkThreadIdPosix.h"

#include <unistd.h>

#include "lkThreadId.h"

namespace Orv {

constinit thread_local std::uint32_t LkThreadIdPosix::_current = 0;

std::uint32_t LkThreadIdPosix::ask() noexcept {
    return _current = static_cast<std::uint32_t>(::gettid());
}

void LkThreadId::setCurrentThread() noexcept {
    _number = LkThreadIdPosix::getCurrent();
}

}  // namespace Orv

#include <windows.h>

#include "lkThreadId.h"

namespace Orv {

void LkThreadId::setCurrentThread() noexcept {
    _number = ::GetCurrentThreadId();
}

}  // namespace Orv

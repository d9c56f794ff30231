#include "mtThreadFactoryPosix.h"

#include <unistd.h>

namespace Orv {

bool MtThreadFactoryPosix::isOnMainThread() noexcept {
    return ::gettid() == ::getpid();
}

}  // namespace Orv

#include <sched.h>

#include "lkAdaptiveWait.h"

namespace Orv {

bool LkAdaptiveWait::canCurrentThreadGain() noexcept {
    const int policy = ::sched_getscheduler(0) & ~SCHED_RESET_ON_FORK;
    if (policy == SCHED_FIFO || policy == SCHED_RR) return false;
    cpu_set_t processors;
    // The call fails where the machine has more processors than the set can hold.
    return ::sched_getaffinity(0, sizeof processors, &processors) != 0 ||
           CPU_COUNT(&processors) > 1;
}

}  // namespace Orv

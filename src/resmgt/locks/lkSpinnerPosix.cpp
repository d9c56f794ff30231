#include <sched.h>
#include <unistd.h>

#include "lkSpinner.h"

namespace Orv {

bool LkSpinner::hasSeveralProcessors() noexcept {
    static const bool result = [] {
        cpu_set_t set;
        // Fails where the machine has more processors than the set has room for.
        return ::sched_getaffinity(::getpid(), sizeof set, &set) != 0 || CPU_COUNT(&set) > 1;
    }();
    return result;
}

}  // namespace Orv

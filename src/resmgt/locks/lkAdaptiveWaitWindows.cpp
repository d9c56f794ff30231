#include <bit>
#include <windows.h>

#include "lkAdaptiveWait.h"

namespace Orv {

bool LkAdaptiveWait::canCurrentThreadGain() noexcept {
    if (::GetPriorityClass(::GetCurrentProcess()) == REALTIME_PRIORITY_CLASS) return false;
    GROUP_AFFINITY thread{};
    if (::GetThreadGroupAffinity(::GetCurrentThread(), &thread) &&
        std::popcount(static_cast<DWORD64>(thread.Mask)) <= 1) {
        return false;
    }
    DWORD_PTR process = 0;
    DWORD_PTR system = 0;
    return !::GetProcessAffinityMask(::GetCurrentProcess(), &process, &system) ||
           process == 0 ||  // the process runs in several processor groups
           std::popcount(static_cast<DWORD64>(process)) > 1;
}

}  // namespace Orv

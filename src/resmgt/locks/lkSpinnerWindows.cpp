#include <windows.h>

#include "lkSpinner.h"

namespace Orv {

bool LkSpinner::hasSeveralProcessors() noexcept {
    static const bool result = [] {
        DWORD_PTR ofProcess = 0;
        DWORD_PTR ofSystem = 0;
        // 0 stands for a process in several groups of processors.
        return !::GetProcessAffinityMask(::GetCurrentProcess(), &ofProcess, &ofSystem) ||
               ofProcess == 0 || (ofProcess & (ofProcess - 1)) != 0;
    }();
    return result;
}

}  // namespace Orv

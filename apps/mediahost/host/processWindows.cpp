#include <io.h>
// clang-format off: psapi.h needs what windows.h defines
#include <windows.h>
#include <psapi.h>
// clang-format on

#include "process.h"

namespace MediaHost::Process {

bool isTerminal() {
    return _isatty(1) != 0;
}

std::uint64_t getPeakBytes() {
    PROCESS_MEMORY_COUNTERS counters{};
    counters.cb = sizeof counters;
    if (::GetProcessMemoryInfo(::GetCurrentProcess(), &counters, sizeof counters) == 0) return 0;
    return counters.PeakWorkingSetSize;
}

double getProcessorSeconds() {
    FILETIME created{}, ended{}, kernel{}, user{};
    if (::GetProcessTimes(::GetCurrentProcess(), &created, &ended, &kernel, &user) == 0) return 0;
    const auto toSeconds = [](const FILETIME& time) {
        return (static_cast<double>(time.dwHighDateTime) * 4294967296.0 + time.dwLowDateTime) *
               1e-7;
    };
    return toSeconds(kernel) + toSeconds(user);
}

}  // namespace MediaHost::Process

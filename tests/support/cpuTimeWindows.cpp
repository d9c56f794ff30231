#include <cstdint>
#include <windows.h>

#include "cpuTime.h"

namespace Orv {

namespace {

double toSeconds(const FILETIME& time) {
    const std::uint64_t ticks = (std::uint64_t{time.dwHighDateTime} << 32) | time.dwLowDateTime;
    return static_cast<double>(ticks) * 100e-9;
}

}  // namespace

double getProcessCpuSeconds() {
    FILETIME created{}, ended{}, kernel{}, user{};
    ::GetProcessTimes(::GetCurrentProcess(), &created, &ended, &kernel, &user);
    return toSeconds(kernel) + toSeconds(user);
}

}  // namespace Orv

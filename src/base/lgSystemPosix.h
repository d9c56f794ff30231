#pragma once

#include <cstdint>
#include <ctime>

namespace Orv {

/// What the log asks the operating system.
class LgSystemPosix {
public:
    static std::uint64_t getThreadId() noexcept;  ///< Of the calling thread.

    /// Tells the calling thread from all others that run; faster than its id, never 0.
    static std::uint64_t getThreadToken() noexcept;

    static std::uint64_t getProcessId() noexcept;

    /// Has the handler called when the process exits, while other threads still run.
    static void callAtExit(void (*handler)()) noexcept;

    static void toUtc(std::time_t time, std::tm& utc) noexcept;
};

}  // namespace Orv

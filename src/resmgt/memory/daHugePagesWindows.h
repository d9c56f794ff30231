#pragma once

#include <cstdint>

namespace Orv {

/// Large pages of Windows: their size, and the right to have them.
class DaHugePagesWindows {
public:
    /// Switches the right to lock pages in memory on for this process, if the user has it.
    /// @return false, with the OS error set, if not.
    static bool enable() noexcept;

    /// @p size rounded up to whole large pages; 0 if the system has none or it does not fit.
    static std::uint64_t roundUp(std::uint64_t size) noexcept;
};

}  // namespace Orv

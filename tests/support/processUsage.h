#pragma once

#include <cstddef>

namespace Orv {

/// What this process holds at the moment; shows that nothing is left behind.
struct ProcessUsage {
    std::size_t nbHandles;  ///< Descriptors or handles of the system.
    std::size_t nbThreads;
    std::size_t nbHeapBytes;  ///< Allocated and not freed; 0 under a sanitizer.

    static ProcessUsage take();
};

}  // namespace Orv

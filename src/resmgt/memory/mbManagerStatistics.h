#pragma once

#include <cstdint>

#include "mbBufferStatistics.h"

namespace Orv {

/// How a manager's buffers are doing. Taken while threads work, the numbers may be some operations
/// apart.
///
/// A pool that is too small shows many reloads and evictions per hit, one in which too much is
/// locked at a time shows waiting threads.
struct MbManagerStatistics {
    std::uint64_t nbBuffers = 0;
    std::uint64_t nbLoaded = 0;    ///< Buffers with contents in memory, locked ones included.
    std::uint64_t nbLocked = 0;    ///< Buffers, not locks.
    std::uint64_t bytesInUse = 0;  ///< Of the budget, paddings included.
    std::uint64_t nbWaiting = 0;   ///< Threads that wait for room.
    MbBufferStatistics counts;     ///< Of all buffers, those that are gone included.
};

}  // namespace Orv

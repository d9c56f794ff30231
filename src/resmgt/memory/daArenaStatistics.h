#pragma once

#include <cstddef>
#include <cstdint>

namespace Orv {

/// How an arena is filled and how its free memory is cut up.
///
/// With no fragmentation at all largestFreeBlock equals freeBytes, and there is one free block.
struct DaArenaStatistics {
    std::uint64_t size = 0;              ///< Bytes in all.
    std::uint64_t freeBytes = 0;         ///< Bytes not handed out, paddings included.
    std::uint64_t largestFreeBlock = 0;  ///< Bytes; 0 when full.
    std::size_t nbFreeBlocks = 0;
    std::size_t nbAllocatedBlocks = 0;
};

}  // namespace Orv

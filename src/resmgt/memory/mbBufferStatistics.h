#pragma once

#include <cstdint>

namespace Orv {

/// What has happened to a buffer.
struct MbBufferStatistics {
    std::uint64_t nbHits = 0;       ///< Locks that found the contents in memory.
    std::uint64_t nbLoads = 0;      ///< First contents, asynchronous loads included.
    std::uint64_t nbReloads = 0;    ///< Contents brought back, asynchronously too.
    std::uint64_t nbEvictions = 0;  ///< Contents unloaded to make room.

    MbBufferStatistics& operator+=(const MbBufferStatistics& other) noexcept {
        nbHits += other.nbHits;
        nbLoads += other.nbLoads;
        nbReloads += other.nbReloads;
        nbEvictions += other.nbEvictions;
        return *this;
    }
};

}  // namespace Orv

#pragma once

#include <cstdint>

#include "mbBufferImp.h"

namespace Orv {

/// How a buffer's data lies in the block that its manager has found for it.
class MbRegionUtil {
public:
    /// The buffer's size with the most that its alignment can put before it.
    static std::uint64_t getTotalBytes(const MbBufferImp& buffer) noexcept {
        // At most 2^63 - 1 and 2^31 - 1, so the sum does not wrap around.
        return buffer.getAlignment().getRoundUpMax(1) +
               static_cast<std::uint64_t>(buffer.getSize());
    }

    /// Lays the data into a block of getTotalBytes(). These suffice, so nothing wraps around.
    static void place(MbBufferImp& buffer, void* block, std::uint64_t totalBytes) {
        auto* const start = static_cast<char*>(block);
        const auto address = static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(start));
        const std::uint64_t aligned = buffer.getAlignment().roundUpToAlignment(address);
        char* const data = start + (aligned - address);
        buffer.setRegion({start, data, data + buffer.getSize(), start + totalBytes});
    }
};

}  // namespace Orv

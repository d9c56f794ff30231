#pragma once

#include <cstdint>

namespace Orv {

/// The memory of a loaded buffer: a block from its manager, and in it the buffer's data.
struct MbRegion {
    char* blockStart = nullptr;  ///< Null: there is none.
    char* dataStart = nullptr;   ///< As the buffer's alignment wants it.
    char* dataEnd = nullptr;     ///< Behind the last byte, as blockEnd.
    char* blockEnd = nullptr;

    bool isNull() const noexcept { return blockStart == nullptr; }
    std::uint64_t getBlockBytes() const noexcept {
        return static_cast<std::uint64_t>(blockEnd - blockStart);
    }
};

}  // namespace Orv

#pragma once

#include <cstdint>

#include "resmgtApi.h"

namespace Orv {

/// Where an arena pool gets its one large block from.
///
/// DaMallocAllocator takes it from the C heap, DaMemoryMapAllocator from memory that has a name and
/// can be seen by other processes. Derive from it to carve up any other memory.
class ORV_RESMGT_API DaArenaAllocator {
public:
    virtual ~DaArenaAllocator();

    DaArenaAllocator(const DaArenaAllocator&) = delete;
    DaArenaAllocator& operator=(const DaArenaAllocator&) = delete;

    /// @param size  bytes, not 0.
    /// @return the block, never null.
    /// @throws ExSysError if the system does not give the memory.
    [[nodiscard]] virtual void* allocate(std::uint64_t size) = 0;

    /// Gives a block back. Never throws.
    /// @param block  from allocate() of this allocator; null does nothing.
    /// @param size   the size it was allocated with.
    virtual void deallocate(void* block, std::uint64_t size) = 0;

protected:
    DaArenaAllocator() = default;
};

}  // namespace Orv

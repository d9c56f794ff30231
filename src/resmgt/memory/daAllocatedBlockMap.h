#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "daBlock.h"

namespace Orv {

/// The blocks that an arena has handed out, by address.
///
/// A hash table with open addressing: an operation looks at a few neighbouring entries, whatever
/// the number of blocks. It grows in reserve() alone and never shrinks.
///
/// - Threads: the caller's lock.
class DaAllocatedBlockMap {
public:
    DaAllocatedBlockMap() = default;

    /// Makes sure that the map can hold @p nbBlocks without asking for memory.
    /// @throws std::bad_alloc, the map being unchanged.
    void reserve(std::size_t nbBlocks) {
        if (nbBlocks > _nbBlocksMax) grow(nbBlocks);
    }

    /// Adds a block whose address is not in the map and not 0; there must be room, see reserve().
    void insert(DaBlock block) noexcept;

    /// Takes the block at @p address out of the map.
    /// @return its length, or 0 if there is no such block.
    [[nodiscard]] std::uint64_t remove(std::uint64_t address) noexcept;

    std::size_t getNbBlocks() const noexcept { return _nbBlocks; }

private:
    std::vector<DaBlock> _slots;  // empty, or a power of two of them; address 0 marks a free one
    std::size_t _nbBlocks = 0;
    std::size_t _nbBlocksMax = 0;  // grows before there are more
    unsigned _shift = 0;           // from a hash of 64 bits to a slot

    void grow(std::size_t nbBlocks);
    std::size_t homeOf(std::uint64_t address) const noexcept;
    std::size_t next(std::size_t slot) const noexcept { return (slot + 1) & (_slots.size() - 1); }
};

}  // namespace Orv

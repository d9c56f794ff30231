#pragma once

#include <cstddef>
#include <cstdint>

#include "daBlockPrivate.h"
#include "daBookAllocatorPrivate.h"

namespace Orv {

/// The blocks that an arena has handed out, by address.
///
/// A hash table with open addressing: an operation looks at a few neighbouring entries, whatever
/// the number of blocks. It grows in reserve() alone and never shrinks.
///
/// - Threads: the caller's lock.
template <class Word>
class DaAllocatedBlockMap {
public:
    using Block = DaBlock<Word>;

    /// Makes sure that the map can hold @p nbBlocks without asking for memory.
    /// @throws std::bad_alloc, the map being unchanged.
    void reserve(std::size_t nbBlocks) {
        if (nbBlocks > _nbBlocksMax) grow(nbBlocks);
    }

    /// Adds a block whose address is not in the map; there must be room, see reserve().
    void insert(Block block) noexcept;

    /// Takes the block at @p address out of the map.
    /// @return its length, or 0 if there is no such block.
    [[nodiscard]] Word remove(Word address) noexcept;

    /// Starts to bring the block at @p address near, for a remove() that follows.
    void prefetch(Word address) const noexcept {
        if (!_slots.empty()) __builtin_prefetch(&_slots[homeOf(address)], 1);
    }

    std::size_t getNbBlocks() const noexcept { return _nbBlocks; }

private:
    DaBookVector<Block> _slots;  // none, or a power of two of them; length 0 marks a free one
    std::size_t _nbBlocks = 0;
    std::size_t _nbBlocksMax = 0;  // grows before there are more
    unsigned _shift = 0;           // from a hash of 64 bits to a slot

    void grow(std::size_t nbBlocks);
    std::size_t homeOf(Word address) const noexcept {
        // Multiplying by 2^64 over the golden ratio spreads addresses that lie in even steps.
        return static_cast<std::size_t>((address * std::uint64_t(0x9E3779B97F4A7C15)) >> _shift);
    }
    std::size_t next(std::size_t slot) const noexcept { return (slot + 1) & (_slots.size() - 1); }
};

extern template class DaAllocatedBlockMap<std::uint32_t>;
extern template class DaAllocatedBlockMap<std::uint64_t>;

}  // namespace Orv

#include <algorithm>
#include <bit>
#include <new>

#include "daAllocatedBlockMapPrivate.h"

namespace Orv {

namespace {

constexpr std::size_t NB_SLOTS_MIN = 16;

/// How full the table gets: a search then looks at two or three entries on average.
constexpr std::size_t maxLoadOf(std::size_t nbSlots) {
    return nbSlots / 4 * 3;
}

}  // namespace

template <class Word>
void DaAllocatedBlockMap<Word>::insert(Block block) noexcept {
    std::size_t slot = homeOf(block.address);
    while (_slots[slot].length != 0) slot = next(slot);
    _slots[slot] = block;
    ++_nbBlocks;
}

template <class Word>
Word DaAllocatedBlockMap<Word>::remove(Word address) noexcept {
    if (_slots.empty()) return 0;
    std::size_t hole = homeOf(address);
    while (_slots[hole].address != address || _slots[hole].length == 0) {
        if (_slots[hole].length == 0) return 0;
        hole = next(hole);
    }
    const Word length = _slots[hole].length;

    // Entries behind the hole that a search would now miss move up, so there are no tombstones.
    for (std::size_t slot = next(hole); _slots[slot].length != 0; slot = next(slot)) {
        const std::size_t mask = _slots.size() - 1;
        const std::size_t distance = (slot - homeOf(_slots[slot].address)) & mask;
        if (distance < ((slot - hole) & mask)) continue;
        _slots[hole] = _slots[slot];
        hole = slot;
    }
    _slots[hole] = {};
    --_nbBlocks;
    return length;
}

template <class Word>
void DaAllocatedBlockMap<Word>::grow(std::size_t nbBlocks) {
    std::size_t nbSlots = std::max(NB_SLOTS_MIN, _slots.size());
    while (maxLoadOf(nbSlots) < nbBlocks) {
        if (nbSlots > _slots.max_size() / 2) throw std::bad_alloc();
        nbSlots *= 2;
    }
    DaBookVector<Block> old(nbSlots);
    old.swap(_slots);
    _shift = 64 - static_cast<unsigned>(std::countr_zero(nbSlots));
    _nbBlocksMax = maxLoadOf(nbSlots);
    _nbBlocks = 0;
    for (const Block& block : old) {
        if (block.length != 0) insert(block);
    }
}

template class DaAllocatedBlockMap<std::uint32_t>;
template class DaAllocatedBlockMap<std::uint64_t>;

}  // namespace Orv

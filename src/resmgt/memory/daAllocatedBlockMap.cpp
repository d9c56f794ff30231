#include "daAllocatedBlockMap.h"

#include <algorithm>
#include <bit>
#include <new>

namespace Orv {

namespace {

constexpr std::size_t NB_SLOTS_MIN = 16;

/// How full the table gets: a search then looks at two or three entries on average.
constexpr std::size_t maxLoadOf(std::size_t nbSlots) {
    return nbSlots / 4 * 3;
}

}  // namespace

void DaAllocatedBlockMap::insert(DaBlock block) noexcept {
    std::size_t slot = homeOf(block.address);
    while (_slots[slot].address != 0) slot = next(slot);
    _slots[slot] = block;
    ++_nbBlocks;
}

std::uint64_t DaAllocatedBlockMap::remove(std::uint64_t address) noexcept {
    if (_slots.empty() || address == 0) return 0;
    std::size_t hole = homeOf(address);
    while (_slots[hole].address != address) {
        if (_slots[hole].address == 0) return 0;
        hole = next(hole);
    }
    const std::uint64_t length = _slots[hole].length;

    // Entries behind the hole that a search would now miss move up, so there are no tombstones.
    for (std::size_t slot = next(hole); _slots[slot].address != 0; slot = next(slot)) {
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

void DaAllocatedBlockMap::grow(std::size_t nbBlocks) {
    std::size_t nbSlots = std::max(NB_SLOTS_MIN, _slots.size());
    while (maxLoadOf(nbSlots) < nbBlocks) {
        if (nbSlots > _slots.max_size() / 2) throw std::bad_alloc();
        nbSlots *= 2;
    }
    std::vector<DaBlock> old(nbSlots);
    old.swap(_slots);
    _shift = 64 - static_cast<unsigned>(std::countr_zero(nbSlots));
    _nbBlocksMax = maxLoadOf(nbSlots);
    _nbBlocks = 0;
    for (const DaBlock& block : old) {
        if (block.address != 0) insert(block);
    }
}

std::size_t DaAllocatedBlockMap::homeOf(std::uint64_t address) const noexcept {
    // Multiplying by 2^64 over the golden ratio spreads addresses that lie in even steps.
    return static_cast<std::size_t>((address * 0x9E3779B97F4A7C15u) >> _shift);
}

}  // namespace Orv

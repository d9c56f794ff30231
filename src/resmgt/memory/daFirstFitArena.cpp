#include "daFirstFitArena.h"

#include <algorithm>
#include <bit>
#include <limits>
#include <ostream>

#include "assertions.h"
#include "formatText.h"

namespace Orv {

namespace {

constexpr std::uint64_t GRANULE = 8;  // block lengths are multiples of it

std::uint64_t addressOf(const void* pointer) noexcept {
    return reinterpret_cast<std::uintptr_t>(pointer);
}

unsigned long long wide(std::uint64_t number) {
    return number;
}

}  // namespace

DaFirstFitArena::DaFirstFitArena(void* base, std::uint64_t size, const char* name)
    : _name(name != nullptr ? name : "<Unnamed arena>"),
      _base(addressOf(base)),
      _size(size),
      _freeBytes(size) {
    ORV_ASSERT(base != nullptr);
    ORV_ASSERT(size > 0);
    ORV_ASSERT_TEXT(size - 1 <= std::numeric_limits<std::uint64_t>::max() - _base,
                    "base + size <= 2^64");
    giveBack({_base, _size});
}

void* DaFirstFitArena::allocate(std::uint64_t size, std::uint64_t alignment) {
    ORV_ASSERT(alignment == 0 || std::has_single_bit(alignment));
    if (size == 0) size = 1;
    const std::uint64_t length = (size + (GRANULE - 1)) & ~(GRANULE - 1);
    if (length < size || length > _freeBytes) return nullptr;

    // Every free block starts where the base is aligned to, up to a granule.
    if (alignment == 0 || (alignment <= GRANULE && _base % alignment == 0)) alignment = 1;
    const std::size_t alignmentNb = _freeBlocks.useAlignment(alignment);
    // Between two free blocks lies an allocated one, so deallocate() will find room for what it
    // makes free: whoever is short of memory can always give some back.
    const std::size_t nbAllocatedBlocks = _allocatedBlocks.getNbBlocks() + 1;
    _allocatedBlocks.reserve(nbAllocatedBlocks);
    _freeBlocks.reserve(nbAllocatedBlocks + 1);

    DaFreeBlockTree::Position position;
    if (!_freeBlocks.findFit(length, alignmentNb, position)) return nullptr;
    const std::uint64_t address = _freeBlocks.at(position).address;
    const std::uint64_t start = address + ((0 - address) & (alignment - 1));
    carve(position, {start, length});
    _allocatedBlocks.insert({start, length});
    _freeBytes -= length;
    return reinterpret_cast<void*>(static_cast<std::uintptr_t>(start));
}

void DaFirstFitArena::deallocate(void* block) {
    const std::uint64_t address = addressOf(block);
    const std::uint64_t length = _allocatedBlocks.remove(address);
    if (length == 0) {
        Assertions::throwAssertionFailed(ORV_FILE, 185, "blockEntry != _allocatedBlocks.end()");
    }
    giveBack({address, length});
    _freeBytes += length;
}

/// Takes a stretch out of the free block that contains it.
void DaFirstFitArena::carve(DaFreeBlockTree::Position& position, DaBlock taken) noexcept {
    const DaBlock whole = _freeBlocks.at(position);
    const DaBlock front{whole.address, taken.address - whole.address};
    const DaBlock back{taken.address + taken.length, whole.length - front.length - taken.length};
    if (front.length == 0 && back.length == 0) {
        _freeBlocks.erase(position);
    } else if (front.length == 0) {
        _freeBlocks.replace(position, back);
    } else {
        _freeBlocks.replace(position, front);
        if (back.length > 0) _freeBlocks.insertBehind(position, back);
    }
}

/// Adds a stretch to the free blocks, joined with those that it touches.
void DaFirstFitArena::giveBack(DaBlock block) noexcept {
    DaFreeBlockTree::Position before;
    const bool hasBefore = _freeBlocks.findBefore(block.address, before);
    DaFreeBlockTree::Position behind = before;
    const bool hasBehind = _freeBlocks.moveToNext(behind);

    const DaBlock left = hasBefore ? _freeBlocks.at(before) : DaBlock{};
    const DaBlock right = hasBehind ? _freeBlocks.at(behind) : DaBlock{};
    const bool joinsLeft = hasBefore && left.address + left.length == block.address;
    const bool joinsRight = hasBehind && block.address + block.length == right.address;

    if (joinsLeft && joinsRight) {
        _freeBlocks.replace(before, {left.address, left.length + block.length + right.length});
        _freeBlocks.erase(behind);
    } else if (joinsLeft) {
        _freeBlocks.replace(before, {left.address, left.length + block.length});
    } else if (joinsRight) {
        _freeBlocks.replace(behind, {block.address, block.length + right.length});
    } else {
        _freeBlocks.insertBehind(before, block);
    }
}

DaArenaStatistics DaFirstFitArena::getStatistics() const noexcept {
    std::uint64_t largestFreeBlock = 0;
    DaFreeBlockTree::Position position;
    _freeBlocks.findBefore(0, position);
    while (_freeBlocks.moveToNext(position)) {
        largestFreeBlock = std::max(largestFreeBlock, _freeBlocks.at(position).length);
    }
    return {_size, _freeBytes, largestFreeBlock, _freeBlocks.getNbBlocks(),
            _allocatedBlocks.getNbBlocks()};
}

void DaFirstFitArena::dump(std::ostream& stream) const {
    const DaArenaStatistics now = getStatistics();
    stream << "Arena: " << _name
           << formatText(" %llu bytes\n  nb alloc blk : %llu\n", wide(now.size),
                         wide(now.nbAllocatedBlocks))
           << formatText("  nb free blk  : %llu\n  free bytes   : %llu\n  largest free : %llu\n",
                         wide(now.nbFreeBlocks), wide(now.freeBytes), wide(now.largestFreeBlock));
}

void DaFirstFitArena::dumpFreeBlocks(std::ostream& stream) const {
    stream << "Arena: " << _name << "\n  free block map:\n";
    DaFreeBlockTree::Position position;
    _freeBlocks.findBefore(0, position);
    while (_freeBlocks.moveToNext(position)) {
        const DaBlock block = _freeBlocks.at(position);
        stream << formatText("    %8llu  %8llu\n", wide(block.address - _base), wide(block.length));
    }
}

}  // namespace Orv

#pragma once

#include <cstddef>
#include <cstdint>

#include "daAllocatedBlockMapPrivate.h"
#include "daBlockPrivate.h"
#include "daFreeBlockTreePrivate.h"

namespace Orv {

/// The books of an arena by first fit, in the arena's own unit: what is free, what is handed out.
///
/// Addresses count from the arena's start. DaFirstFitArena turns them into pointers and bytes.
///
/// - Threads: the caller's lock.
/// - Memory: asked for by allocate() alone and, in steady state, never.
template <class Word>
class DaBlockLedger {
public:
    static constexpr Word NONE = static_cast<Word>(-1);

    /// @param size    not 0.
    /// @param origin  what alignments count the arena's start as.
    /// @throws std::bad_alloc
    DaBlockLedger(Word size, Word origin);

    /// Hands out the lowest stretch of @p length that starts at an alignment.
    /// @param length  not 0.
    /// @param mask    the alignment, a power of two, less one.
    /// @return its address, or NONE if nothing fits.
    /// @throws std::bad_alloc, the ledger being unchanged.
    [[nodiscard]] Word allocate(Word length, Word mask);

    /// Hands out the stretch at this address, if it is free; else false.
    /// @throws std::bad_alloc, the ledger being unchanged.
    [[nodiscard]] bool allocateAt(Word address, Word length);

    /// Takes a block back, without asking for memory; false if none is handed out there.
    [[nodiscard]] bool deallocate(Word address) noexcept;

    Word getFreeLength() const noexcept { return _freeLength; }
    std::size_t getNbFreeBlocks() const noexcept { return _free.getNbBlocks(); }
    std::size_t getNbAllocatedBlocks() const noexcept { return _allocated.getNbBlocks(); }

    /// Calls @p visit with every free block, in address order.
    template <class Visit>
    void visitFreeBlocks(Visit visit) const {
        Position position;
        _free.findBefore(0, position);
        while (_free.moveToNext(position)) visit(_free.at(position));
    }

private:
    using Tree = DaFreeBlockTree<Word>;
    using Position = typename Tree::Position;
    using Block = DaBlock<Word>;

    Word _origin;
    Word _freeLength = 0;
    Tree _free;  // no two of them touch
    DaAllocatedBlockMap<Word> _allocated;

    void reserveForOneMore();
    void handOut(Position&, Block) noexcept;
    void giveBack(Position& before, bool hasBefore, Block) noexcept;
};

extern template class DaBlockLedger<std::uint32_t>;
extern template class DaBlockLedger<std::uint64_t>;

}  // namespace Orv

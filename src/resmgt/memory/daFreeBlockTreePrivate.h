#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "daBlockPrivate.h"
#include "daBookAllocatorPrivate.h"
#include "daNodeScanPrivate.h"

namespace Orv {

/// The free blocks of an arena in address order, which finds the first that a request fits into.
///
/// A B+ tree with its nodes in pools: an entry above the leaves knows the longest request that the
/// blocks below it can take. It knows that once for each alignment in use, since a block may be
/// long enough and, once its start is rounded up, too short. So a search goes straight down, and
/// every operation costs the logarithm of the number of blocks.
///
/// Addresses and lengths are counted in the unit of the arena, in words of 32 or 64 bits: half the
/// width is half the memory to look through.
///
/// - Threads: the caller's lock.
/// - Memory: asked for by reserve() and useAlignment() alone.
template <class Word>
class DaFreeBlockTree {
    static constexpr unsigned FANOUT = 32;          // entries of a node
    static constexpr unsigned NB_ENTRIES_MIN = 12;  // of a node other than the root
    static constexpr unsigned NB_LEVELS_MAX = 14;   // enough for 2^32 nodes
    using NodeIndex = std::uint32_t;
    using Entries = std::array<Word, FANOUT>;
    using Scan = DaNodeScan<Word, FANOUT>;

public:
    /// Where a block stands, or before the first one. Valid until a block is inserted or erased.
    class Position {
        friend DaFreeBlockTree;
        std::array<NodeIndex, NB_LEVELS_MAX> _node;  // the way from the leaf, level 0, to the root
        std::array<int, NB_LEVELS_MAX> _slot;        // -1 on level 0: before the first block
    };

    using Block = DaBlock<Word>;

    /// Without blocks.
    /// @param origin  what alignments count address 0 as.
    /// @throws std::bad_alloc
    explicit DaFreeBlockTree(Word origin);

    /// Makes sure that the tree can hold @p nbBlocks without asking for memory.
    /// @throws std::bad_alloc, the tree being unchanged.
    void reserve(std::size_t nbBlocks) {
        if (nbBlocks > _nbBlocksMax) grow(nbBlocks);
    }

    /// Prepares searches with an alignment; quick when it is in use already.
    /// @param mask  the alignment, a power of two, less one.
    /// @return the number that stands for it in searches.
    /// @throws std::bad_alloc, the tree being unchanged.
    std::size_t useAlignment(Word mask);

    /// The block of the lowest address that has @p size bytes behind its first aligned one.
    [[nodiscard]] bool findFit(Word size, std::size_t alignmentNb, Position&) const noexcept;

    /// The last block below @p address.
    /// @return false if there is none; the position is then before the first block.
    bool findBefore(Word address, Position&) const noexcept;

    [[nodiscard]] bool moveToNext(Position&) const noexcept;  ///< False, and unmoved, at the end.

    Block at(const Position& position) const noexcept {
        const Node& leaf = _leaves.nodes[position._node[0]];
        const auto slot = static_cast<unsigned>(position._slot[0]);
        return {leaf.address[slot], leaf.value[slot]};
    }

    /// Changes a block, which keeps its place in the order.
    void replace(const Position&, Block) noexcept;

    void insertBehind(Position&, Block) noexcept;  ///< There must be room, see reserve().
    void erase(const Position&) noexcept;

    std::size_t getNbBlocks() const noexcept { return _nbBlocks; }

private:
    struct alignas(128) Node {  // a pair of cache lines, or two
        Entries address;        // of the block, or of the first one below; all ones behind the last
        Entries value;  // length, or in inner nodes index of the one below; 0 behind the last
    };
    struct Pool {
        DaBookVector<Node> nodes;
        DaBookVector<std::uint8_t> counts;  // of entries, by node
        NodeIndex firstUnused;              // chain of nodes to use again, through value[0]
    };

    /// For one alignment, by inner node: the longest request that each entry can take.
    struct Column {
        Word mask;
        DaBookVector<Entries> fits;
    };

    Word _origin;
    Pool _leaves;
    Pool _inners;
    DaBookVector<Column> _columns;  // one for each alignment in use
    NodeIndex _root;
    unsigned _rootLevel = 0;
    std::size_t _nbBlocks = 0;
    std::size_t _nbBlocksMax = 0;

    void grow(std::size_t nbBlocks);
    Pool& poolOf(unsigned level) noexcept { return level > 0 ? _inners : _leaves; }
    Node& nodeAt(unsigned level, NodeIndex index) noexcept { return poolOf(level).nodes[index]; }
    std::uint8_t& countOf(unsigned level, NodeIndex index) noexcept {
        return poolOf(level).counts[index];
    }
    Word fitOf(Block block, Word mask) const noexcept {
        const Word padding = (Word(0) - (_origin + block.address)) & mask;
        return block.length > padding ? block.length - padding : 0;
    }
    NodeIndex takeNode(unsigned level) noexcept;
    void returnNode(unsigned level, NodeIndex) noexcept;
    Word summaryOf(const Column&, unsigned level, NodeIndex, unsigned except) const noexcept;
    void fillColumn(Column&, unsigned level, NodeIndex) const noexcept;
    void carryAddressUp(const Position&) noexcept;
    void carryFitUp(Column&, const Position&, Word fitBefore, Word fit) noexcept;
    void summarize(unsigned level, NodeIndex parent, unsigned slot) noexcept;
    void openEntry(unsigned level, NodeIndex, unsigned slot) noexcept;
    void closeEntries(unsigned level, NodeIndex, unsigned slot, unsigned nbEntries) noexcept;
    void copyEntries(unsigned level, NodeIndex from, unsigned slot, NodeIndex to, unsigned toSlot,
                     unsigned nbEntries) noexcept;
    void makeRoom(Position&, unsigned level) noexcept;
    void addRoot(Position&) noexcept;
    void mergeOrBalance(const Position&, unsigned level) noexcept;
    void dropRootsOfOne() noexcept;
};

extern template class DaFreeBlockTree<std::uint32_t>;
extern template class DaFreeBlockTree<std::uint64_t>;

}  // namespace Orv

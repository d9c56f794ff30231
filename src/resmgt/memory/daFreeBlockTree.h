#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "daBlock.h"

namespace Orv {

/// The free blocks of an arena in address order, which finds the first that a request fits into.
///
/// A B+ tree with its nodes in pools: an entry above the leaves knows the longest request that the
/// blocks below it can take. It knows that once for each alignment in use, since a block may be
/// long enough and, once its start is rounded up, too short. So a search goes straight down, and
/// every operation costs the logarithm of the number of blocks.
///
/// - Threads: the caller's lock.
/// - Memory: asked for by reserve() and useAlignment() alone.
class DaFreeBlockTree {
    static constexpr unsigned FANOUT = 16;         // entries of a node
    static constexpr unsigned NB_ENTRIES_MIN = 6;  // of a node other than the root
    static constexpr unsigned NB_LEVELS_MAX = 14;  // enough for 2^32 nodes
    using NodeIndex = std::uint32_t;
    using Entries = std::array<std::uint64_t, FANOUT>;

public:
    /// Where a block stands, or before the first one. Valid until a block is inserted or erased.
    class Position {
        friend class DaFreeBlockTree;
        std::array<NodeIndex, NB_LEVELS_MAX> _node;  // the way from the leaf, level 0, to the root
        std::array<int, NB_LEVELS_MAX> _slot;        // -1 on level 0: before the first block
    };

    DaFreeBlockTree();  ///< Without blocks. @throws std::bad_alloc

    /// Makes sure that the tree can hold @p nbBlocks without asking for memory.
    /// @throws std::bad_alloc, the tree being unchanged.
    void reserve(std::size_t nbBlocks) {
        if (nbBlocks > _nbBlocksMax) grow(nbBlocks);
    }

    /// Prepares searches with an alignment, a power of two; quick when it is known already.
    /// @return the number that stands for it in searches.
    /// @throws std::bad_alloc, the tree being unchanged.
    std::size_t useAlignment(std::uint64_t alignment);

    /// The block of the lowest address that has @p size bytes behind its first aligned one.
    [[nodiscard]] bool findFit(std::uint64_t size, std::size_t alignmentNb,
                               Position&) const noexcept;

    /// The last block below @p address.
    /// @return false if there is none; the position is then before the first block.
    bool findBefore(std::uint64_t address, Position&) const noexcept;

    [[nodiscard]] bool moveToNext(Position&) const noexcept;  ///< False, and unmoved, at the end.

    DaBlock at(const Position&) const noexcept;

    /// Changes a block, which keeps its place in the order.
    void replace(const Position&, DaBlock) noexcept;

    void insertBehind(Position&, DaBlock) noexcept;  ///< There must be room, see reserve().
    void erase(const Position&) noexcept;

    std::size_t getNbBlocks() const noexcept { return _nbBlocks; }

private:
    struct Node {
        Entries address;  // of the block, or of the first one below; the largest number behind them
        Entries value;    // a leaf's: length; else the index of the node below; 0 behind them
        unsigned count;
        NodeIndex nextUnused;
    };
    struct Pool {
        std::vector<Node> nodes;
        NodeIndex firstUnused;  // chain of nodes to use again
    };

    /// For one alignment, by inner node: the longest request that each entry can take.
    struct Column {
        std::uint64_t mask;  // the alignment less one
        std::vector<Entries> fits;
    };

    Pool _leaves;
    Pool _inners;
    std::vector<Column> _columns;  // one for each alignment in use
    NodeIndex _root;
    unsigned _rootLevel = 0;
    std::size_t _nbBlocks = 0;
    std::size_t _nbBlocksMax = 0;

    void grow(std::size_t nbBlocks);
    Node& nodeAt(unsigned level, NodeIndex) noexcept;
    NodeIndex takeNode(unsigned level) noexcept;
    void returnNode(unsigned level, NodeIndex) noexcept;
    std::uint64_t summaryOf(const Column&, unsigned level, NodeIndex) const noexcept;
    void fillColumn(Column&, unsigned level, NodeIndex) const noexcept;
    void carryAddressUp(const Position&) noexcept;
    void carryFitUp(Column&, const Position&, std::uint64_t fitBefore, std::uint64_t fit) noexcept;
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

}  // namespace Orv

#include <algorithm>
#include <cstring>
#include <limits>
#include <new>
#include <utility>

#include "daFreeBlockTreePrivate.h"

namespace Orv {

namespace {

constexpr std::uint32_t NO_NODE = std::numeric_limits<std::uint32_t>::max();

template <class Word>
constexpr Word NO_ADDRESS = std::numeric_limits<Word>::max();

template <class Entries>
void moveEntries(const Entries& from, unsigned slot, Entries& to, unsigned toSlot,
                 unsigned nbEntries) noexcept {
    std::memmove(to.data() + toSlot, from.data() + slot, nbEntries * sizeof to[0]);
}

/// Room for @p n elements, at least doubled, so that growing costs little on average.
template <class Vector>
void reserveAmortized(Vector& vector, std::size_t n) {
    if (n > vector.capacity()) vector.reserve(std::max(n, 2 * vector.capacity()));
}

}  // namespace

template <class Word>
DaFreeBlockTree<Word>::DaFreeBlockTree(Word origin)
    : _origin(origin), _leaves{{}, {}, NO_NODE}, _inners{{}, {}, NO_NODE} {
    reserve(1);
    _root = takeNode(0);
}

template <class Word>
void DaFreeBlockTree<Word>::grow(std::size_t nbBlocks) {
    // Every node but the root has NB_ENTRIES_MIN entries or more, on each level.
    const std::size_t nbLeaves = nbBlocks / NB_ENTRIES_MIN + 1;
    const std::size_t nbInners = nbLeaves / (NB_ENTRIES_MIN - 1) + 1;
    if (nbLeaves >= NO_NODE) throw std::bad_alloc();
    reserveAmortized(_leaves.nodes, nbLeaves);
    reserveAmortized(_leaves.counts, nbLeaves);
    reserveAmortized(_inners.nodes, nbInners);
    reserveAmortized(_inners.counts, nbInners);
    for (Column& column : _columns) reserveAmortized(column.fits, nbInners);
    _nbBlocksMax = nbLeaves * NB_ENTRIES_MIN - 1;
}

template <class Word>
std::size_t DaFreeBlockTree<Word>::useAlignment(Word mask) {
    for (std::size_t i = 0; i < _columns.size(); ++i) {
        if (_columns[i].mask == mask) return i;
    }
    Column column{mask, {}};
    column.fits.reserve(std::max(_inners.nodes.capacity(), std::size_t(1)));
    column.fits.resize(_inners.nodes.size());
    fillColumn(column, _rootLevel, _root);
    _columns.push_back(std::move(column));
    return _columns.size() - 1;
}

template <class Word>
void DaFreeBlockTree<Word>::fillColumn(Column& column, unsigned level,
                                       NodeIndex index) const noexcept {
    if (level == 0) return;
    const Node& node = _inners.nodes[index];
    for (unsigned i = 0; i < _inners.counts[index]; ++i) {
        const auto child = static_cast<NodeIndex>(node.value[i]);
        fillColumn(column, level - 1, child);
        column.fits[index][i] = summaryOf(column, level - 1, child, FANOUT);
    }
}

template <class Word>
bool DaFreeBlockTree<Word>::findFit(Word size, std::size_t alignmentNb,
                                    Position& position) const noexcept {
    const Column& column = _columns[alignmentNb];
    NodeIndex index = _root;
    for (unsigned level = _rootLevel; level > 0; --level) {
        const unsigned slot = Scan::firstAtLeast(column.fits[index], size);
        if (slot == FANOUT) return false;  // at the root only: below it there is one that fits
        position._node[level] = index;
        position._slot[level] = static_cast<int>(slot);
        index = static_cast<NodeIndex>(_inners.nodes[index].value[slot]);
    }
    const Node& leaf = _leaves.nodes[index];
    const Entries fits = Scan::fits(leaf.address, leaf.value, _origin, column.mask);
    const unsigned slot = Scan::firstAtLeast(fits, size);
    position._node[0] = index;
    position._slot[0] = static_cast<int>(slot);
    return slot < FANOUT;
}

template <class Word>
bool DaFreeBlockTree<Word>::findBefore(Word address, Position& position) const noexcept {
    const auto lastBelow = [address](const Node& node) {
        return static_cast<int>(Scan::countBelow(node.address, address)) - 1;
    };
    NodeIndex index = _root;
    for (unsigned level = _rootLevel; level > 0; --level) {
        const Node& node = _inners.nodes[index];
        const int slot = std::max(lastBelow(node), 0);
        position._node[level] = index;
        position._slot[level] = slot;
        index = static_cast<NodeIndex>(node.value[static_cast<unsigned>(slot)]);
    }
    const Node& leaf = _leaves.nodes[index];
    position._node[0] = index;
    position._slot[0] = lastBelow(leaf);
    return position._slot[0] >= 0;
}

template <class Word>
bool DaFreeBlockTree<Word>::moveToNext(Position& position) const noexcept {
    const auto isLast = [&](unsigned level) {
        const Pool& pool = level > 0 ? _inners : _leaves;
        return position._slot[level] + 1 >= pool.counts[position._node[level]];
    };
    unsigned level = 0;
    while (isLast(level)) {
        if (level == _rootLevel) return false;
        ++level;
    }
    ++position._slot[level];
    for (; level > 0; --level) {
        const auto slot = static_cast<unsigned>(position._slot[level]);
        const Node& node = _inners.nodes[position._node[level]];
        position._node[level - 1] = static_cast<NodeIndex>(node.value[slot]);
        position._slot[level - 1] = 0;
    }
    return true;
}

template <class Word>
void DaFreeBlockTree<Word>::replace(const Position& position, Block block) noexcept {
    Node& leaf = _leaves.nodes[position._node[0]];
    const auto slot = static_cast<unsigned>(position._slot[0]);
    const Block before{leaf.address[slot], leaf.value[slot]};
    for (Column& column : _columns) {
        carryFitUp(column, position, fitOf(before, column.mask), fitOf(block, column.mask));
    }
    leaf.address[slot] = block.address;
    leaf.value[slot] = block.length;
    carryAddressUp(position);
}

template <class Word>
void DaFreeBlockTree<Word>::insertBehind(Position& position, Block block) noexcept {
    makeRoom(position, 0);
    ++position._slot[0];
    openEntry(0, position._node[0], static_cast<unsigned>(position._slot[0]));
    replace(position, block);
    ++_nbBlocks;
}

template <class Word>
void DaFreeBlockTree<Word>::erase(const Position& position) noexcept {
    replace(position, {at(position).address, 0});
    closeEntries(0, position._node[0], static_cast<unsigned>(position._slot[0]), 1);
    carryAddressUp(position);
    --_nbBlocks;
    for (unsigned level = 0; level < _rootLevel; ++level) {
        if (countOf(level, position._node[level]) >= NB_ENTRIES_MIN) break;
        mergeOrBalance(position, level);  // may leave the node above with one entry less
    }
    dropRootsOfOne();
}

template <class Word>
typename DaFreeBlockTree<Word>::NodeIndex DaFreeBlockTree<Word>::takeNode(unsigned level) noexcept {
    Pool& pool = poolOf(level);
    NodeIndex index = pool.firstUnused;
    if (index != NO_NODE) {
        pool.firstUnused = static_cast<NodeIndex>(std::exchange(pool.nodes[index].value[0], 0));
        return index;
    }
    index = static_cast<NodeIndex>(pool.nodes.size());
    pool.nodes.emplace_back().address.fill(NO_ADDRESS<Word>);
    pool.counts.push_back(0);
    if (level > 0) {
        for (Column& column : _columns) column.fits.emplace_back();
    }
    return index;
}

template <class Word>
void DaFreeBlockTree<Word>::returnNode(unsigned level, NodeIndex index) noexcept {
    closeEntries(level, index, 0, countOf(level, index));
    Pool& pool = poolOf(level);
    pool.nodes[index].value[0] = std::exchange(pool.firstUnused, index);
}

/// The longest request that the entries of a node can take, but for one of them.
template <class Word>
Word DaFreeBlockTree<Word>::summaryOf(const Column& column, unsigned level, NodeIndex index,
                                      unsigned except) const noexcept {
    if (level > 0) return Scan::largest(column.fits[index], except);
    const Node& leaf = _leaves.nodes[index];
    return Scan::largest(Scan::fits(leaf.address, leaf.value, _origin, column.mask), except);
}

/// Tells the nodes above of the address of the position's block, if it is their first one.
template <class Word>
void DaFreeBlockTree<Word>::carryAddressUp(const Position& position) noexcept {
    const Word address = _leaves.nodes[position._node[0]].address[0];
    for (unsigned level = 1; level <= _rootLevel && position._slot[level - 1] == 0; ++level) {
        const auto slot = static_cast<unsigned>(position._slot[level]);
        _inners.nodes[position._node[level]].address[slot] = address;
    }
}

/// Tells the nodes above that the fit of the position's block is about to change, as far as they
/// feel it. An entry is written after its node was scanned: the other way round the processor's
/// wide loads would wait for the narrow store.
template <class Word>
void DaFreeBlockTree<Word>::carryFitUp(Column& column, const Position& position, Word fitBefore,
                                       Word fit) noexcept {
    Word* entry = nullptr;  // what the last step has found out to change
    for (unsigned level = 1; level <= _rootLevel; ++level) {
        Word& known =
            column.fits[position._node[level]][static_cast<unsigned>(position._slot[level])];
        Word fitAbove = std::max(fit, known);
        if (fit < known && fitBefore == known) {
            const auto slot = static_cast<unsigned>(position._slot[level - 1]);
            fitAbove = std::max(fit, summaryOf(column, level - 1, position._node[level - 1], slot));
        }
        if (entry != nullptr) *entry = fit;
        if (fitAbove == known) return;
        entry = &known;
        fitBefore = known;
        fit = fitAbove;
    }
    if (entry != nullptr) *entry = fit;
}

/// Brings an entry up to date with the node below it, which is on that level.
template <class Word>
void DaFreeBlockTree<Word>::summarize(unsigned level, NodeIndex parent, unsigned slot) noexcept {
    Node& node = _inners.nodes[parent];
    const auto child = static_cast<NodeIndex>(node.value[slot]);
    node.address[slot] = nodeAt(level, child).address[0];
    for (Column& column : _columns)
        column.fits[parent][slot] = summaryOf(column, level, child, FANOUT);
}

template <class Word>
void DaFreeBlockTree<Word>::copyEntries(unsigned level, NodeIndex from, unsigned slot, NodeIndex to,
                                        unsigned toSlot, unsigned nbEntries) noexcept {
    moveEntries(nodeAt(level, from).address, slot, nodeAt(level, to).address, toSlot, nbEntries);
    moveEntries(nodeAt(level, from).value, slot, nodeAt(level, to).value, toSlot, nbEntries);
    if (level == 0) return;
    for (Column& column : _columns) {
        moveEntries(column.fits[from], slot, column.fits[to], toSlot, nbEntries);
    }
}

/// Moves the entries from the slot on one further; the one at the slot takes no request.
template <class Word>
void DaFreeBlockTree<Word>::openEntry(unsigned level, NodeIndex index, unsigned slot) noexcept {
    copyEntries(level, index, slot, index, slot + 1, countOf(level, index) - slot);
    nodeAt(level, index).value[slot] = 0;
    ++countOf(level, index);
}

/// Removes entries; those behind them move up.
template <class Word>
void DaFreeBlockTree<Word>::closeEntries(unsigned level, NodeIndex index, unsigned slot,
                                         unsigned nbEntries) noexcept {
    Node& node = nodeAt(level, index);
    const unsigned end = slot + nbEntries;
    const unsigned newCount = countOf(level, index) - nbEntries;
    copyEntries(level, index, end, index, slot, newCount - slot);
    countOf(level, index) = static_cast<std::uint8_t>(newCount);
    std::fill_n(node.address.begin() + newCount, nbEntries, NO_ADDRESS<Word>);
    std::fill_n(node.value.begin() + newCount, nbEntries, Word(0));
    if (level == 0) return;
    for (Column& column : _columns) {
        std::fill_n(column.fits[index].begin() + newCount, nbEntries, Word(0));
    }
}

/// Splits the position's node on that level if it is full; the position follows its entry.
template <class Word>
void DaFreeBlockTree<Word>::makeRoom(Position& position, unsigned level) noexcept {
    const NodeIndex index = position._node[level];
    if (countOf(level, index) < FANOUT) return;
    if (level == _rootLevel) {
        addRoot(position);
    } else {
        makeRoom(position, level + 1);
    }
    constexpr unsigned HALF = FANOUT / 2;
    const NodeIndex parent = position._node[level + 1];
    const auto slot = static_cast<unsigned>(position._slot[level + 1]);
    const NodeIndex sibling = takeNode(level);
    copyEntries(level, index, HALF, sibling, 0, FANOUT - HALF);
    countOf(level, sibling) = FANOUT - HALF;
    closeEntries(level, index, HALF, FANOUT - HALF);
    openEntry(level + 1, parent, slot + 1);
    _inners.nodes[parent].value[slot + 1] = sibling;
    summarize(level, parent, slot);
    summarize(level, parent, slot + 1);

    if (position._slot[level] >= static_cast<int>(HALF)) {
        position._node[level] = sibling;
        position._slot[level] -= static_cast<int>(HALF);
        ++position._slot[level + 1];
    }
}

template <class Word>
void DaFreeBlockTree<Word>::addRoot(Position& position) noexcept {
    const NodeIndex root = takeNode(_rootLevel + 1);
    openEntry(_rootLevel + 1, root, 0);
    _inners.nodes[root].value[0] = _root;
    summarize(_rootLevel, root, 0);
    _root = root;
    ++_rootLevel;
    position._node[_rootLevel] = root;
    position._slot[_rootLevel] = 0;
}

/// Joins the position's node on that level, which has too few entries, with its neighbour, or
/// shares the neighbour's entries evenly if those are too many to be joined.
template <class Word>
void DaFreeBlockTree<Word>::mergeOrBalance(const Position& position, unsigned level) noexcept {
    const NodeIndex parent = position._node[level + 1];
    const auto slot = static_cast<unsigned>(position._slot[level + 1]);
    const unsigned leftSlot = slot > 0 ? slot - 1 : 0;
    const auto left = static_cast<NodeIndex>(_inners.nodes[parent].value[leftSlot]);
    const auto right = static_cast<NodeIndex>(_inners.nodes[parent].value[leftSlot + 1]);
    const unsigned nbLeft = countOf(level, left);
    const unsigned nbRight = countOf(level, right);
    const unsigned nbBoth = nbLeft + nbRight;

    if (nbBoth <= 2 * NB_ENTRIES_MIN) {
        copyEntries(level, right, 0, left, nbLeft, nbRight);
        countOf(level, left) = static_cast<std::uint8_t>(nbBoth);
        returnNode(level, right);
        closeEntries(level + 1, parent, leftSlot + 1, 1);
    } else if (nbLeft < nbRight) {
        const unsigned nbMoved = nbBoth / 2 - nbLeft;
        copyEntries(level, right, 0, left, nbLeft, nbMoved);
        countOf(level, left) = static_cast<std::uint8_t>(nbBoth / 2);
        closeEntries(level, right, 0, nbMoved);
        summarize(level, parent, leftSlot + 1);
    } else {
        const unsigned nbMoved = nbBoth / 2 - nbRight;
        copyEntries(level, right, 0, right, nbMoved, nbRight);
        copyEntries(level, left, nbLeft - nbMoved, right, 0, nbMoved);
        countOf(level, right) = static_cast<std::uint8_t>(nbBoth / 2);
        closeEntries(level, left, nbLeft - nbMoved, nbMoved);
        summarize(level, parent, leftSlot + 1);
    }
    summarize(level, parent, leftSlot);
}

template <class Word>
void DaFreeBlockTree<Word>::dropRootsOfOne() noexcept {
    while (_rootLevel > 0 && _inners.counts[_root] == 1) {
        const NodeIndex root = _root;
        _root = static_cast<NodeIndex>(_inners.nodes[root].value[0]);
        returnNode(_rootLevel, root);
        --_rootLevel;
    }
}

template class DaFreeBlockTree<std::uint32_t>;
template class DaFreeBlockTree<std::uint64_t>;

}  // namespace Orv

#include "daBlockLedgerPrivate.h"

namespace Orv {

template <class Word>
DaBlockLedger<Word>::DaBlockLedger(Word size, Word origin) : _origin(origin), _free(origin) {
    Position start;
    giveBack(start, _free.findBefore(0, start), {0, size});
}

template <class Word>
Word DaBlockLedger<Word>::allocate(Word length, Word mask) {
    if (length > _freeLength) return NONE;
    const std::size_t alignmentNb = _free.useAlignment(mask);
    reserveForOneMore();
    Position position;
    if (!_free.findFit(length, alignmentNb, position)) return NONE;
    const Word address = _free.at(position).address;
    const Word start = address + ((Word(0) - (_origin + address)) & mask);
    handOut(position, {start, length});
    return start;
}

template <class Word>
bool DaBlockLedger<Word>::allocateAt(Word address, Word length) {
    Position position;
    if (!_free.findBefore(address + 1, position)) return false;
    const Block whole = _free.at(position);
    const Word front = address - whole.address;
    if (front >= whole.length || length > whole.length - front) return false;
    reserveForOneMore();
    handOut(position, {address, length});
    return true;
}

template <class Word>
bool DaBlockLedger<Word>::deallocate(Word address) noexcept {
    _allocated.prefetch(address);  // arrives while the tree is searched
    Position before;
    const bool hasBefore = _free.findBefore(address, before);
    const Word length = _allocated.remove(address);
    if (length == 0) return false;
    giveBack(before, hasBefore, {address, length});
    return true;
}

/// Makes room for one more block, and for what its return may add to the free ones: between two of
/// these lies a block that is handed out, so whoever is short of memory can always give some back.
template <class Word>
void DaBlockLedger<Word>::reserveForOneMore() {
    const std::size_t nbBlocks = _allocated.getNbBlocks() + 1;
    _allocated.reserve(nbBlocks);
    _free.reserve(nbBlocks + 1);
}

/// Takes a stretch out of the free block at the position, which contains it.
template <class Word>
void DaBlockLedger<Word>::handOut(Position& position, Block block) noexcept {
    _allocated.insert(block);
    _freeLength -= block.length;

    const Block whole = _free.at(position);
    const Block front{whole.address, static_cast<Word>(block.address - whole.address)};
    const Block back{static_cast<Word>(block.address + block.length),
                     static_cast<Word>(whole.length - front.length - block.length)};
    if (front.length == 0 && back.length == 0) {
        _free.erase(position);
    } else if (front.length == 0) {
        _free.replace(position, back);
    } else {
        _free.replace(position, front);
        if (back.length > 0) _free.insertBehind(position, back);
    }
}

/// Adds a stretch to the free blocks, joined with those that it touches.
template <class Word>
void DaBlockLedger<Word>::giveBack(Position& before, bool hasBefore, Block block) noexcept {
    _freeLength += block.length;
    Position behind = before;
    const bool hasBehind = _free.moveToNext(behind);
    const Block left = hasBefore ? _free.at(before) : Block{};
    const Block right = hasBehind ? _free.at(behind) : Block{};
    const bool joinsLeft = hasBefore && left.address + left.length == block.address;
    const bool joinsRight = hasBehind && block.address + block.length == right.address;

    if (joinsLeft && joinsRight) {
        _free.replace(before, {left.address, left.length + block.length + right.length});
        _free.erase(behind);
    } else if (joinsLeft) {
        _free.replace(before, {left.address, left.length + block.length});
    } else if (joinsRight) {
        _free.replace(behind, {block.address, block.length + right.length});
    } else {
        _free.insertBehind(before, block);
    }
}

template class DaBlockLedger<std::uint32_t>;
template class DaBlockLedger<std::uint64_t>;

}  // namespace Orv

#include "mbUnloadLRU.h"

#include <algorithm>
#include <ostream>

#include "assertions.h"
#include "mbBufferIndexPrivate.h"

namespace Orv {

/// A list through an array: what was used last stands at the tail. Number 0 is head and tail.
class MbUnloadLRU::Books {
public:
    explicit Books(std::size_t nbBuffers) {
        _nodes.reserve(nbBuffers + 1);
        _nodes.push_back({});
        _index.reserve(nbBuffers);
    }

    bool append(MbBufferImp* buffer) {
        if (_index.find(buffer) != MbBufferIndex::NONE) return false;
        _index.reserve(_index.getNbBuffers() + 1);
        if (_free == 0) _nodes.push_back({});  // the last that may throw
        const std::uint32_t number =
            _free != 0 ? _free : static_cast<std::uint32_t>(_nodes.size() - 1);
        if (_free != 0) _free = _nodes[number].next;
        Node& end = _nodes[0];
        _nodes[number] = {buffer, end.previous, 0};
        _nodes[end.previous].next = number;
        end.previous = number;
        _index.insert(buffer, number);
        return true;
    }

    bool remove(MbBufferImp* buffer) noexcept {
        const std::uint32_t number = _index.remove(buffer);
        if (number == MbBufferIndex::NONE) return false;
        const Node node = _nodes[number];
        _nodes[node.previous].next = node.next;
        _nodes[node.next].previous = node.previous;
        _nodes[number].next = _free;
        _free = number;
        return true;
    }

    MbBufferImp* getFirst() const noexcept { return _nodes[_nodes[0].next].buffer; }
    std::size_t getNbBuffers() const noexcept { return _index.getNbBuffers(); }

private:
    struct Node {
        MbBufferImp* buffer = nullptr;
        std::uint32_t previous = 0;
        std::uint32_t next = 0;
    };

    DaBookVector<Node> _nodes;
    std::uint32_t _free = 0;  // first of the unused ones, linked by next
    MbBufferIndex _index;
};

MbUnloadLRU::MbUnloadLRU(int nbBuffers)
    : _books(std::make_unique<Books>(static_cast<std::size_t>(std::max(nbBuffers, 0)))) {}

MbUnloadLRU::~MbUnloadLRU() = default;

const char* MbUnloadLRU::getName() const {
    return "MbUnloadLRU";
}

void MbUnloadLRU::insertBuffer(MbBufferImp* buffer) {
    const bool isNew = _books->append(buffer);
    ORV_ASSERT(isNew);
}

void MbUnloadLRU::removeBuffer(MbBufferImp* buffer) {
    const bool wasInserted = _books->remove(buffer);
    ORV_ASSERT(wasInserted);
}

MbBufferImp* MbUnloadLRU::selectVictim() const {
    return _books->getFirst();
}

bool MbUnloadLRU::isEmpty() const {
    return _books->getNbBuffers() == 0;
}

void MbUnloadLRU::dump(std::ostream& stream) const {
    stream << "Nb loaded and unlocked buffers = " << _books->getNbBuffers() << '\n';
}

}  // namespace Orv

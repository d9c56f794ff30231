#include "mbUnloadRandom.h"

#include <algorithm>
#include <ostream>

#include "assertions.h"
#include "mbBufferIndexPrivate.h"
#include "rnNumRecUniformRng.h"

namespace Orv {

/// The buffers in an array without gaps, and where each of them stands.
class MbUnloadRandom::Books {
public:
    explicit Books(std::size_t nbBuffers) { _buffers.reserve(nbBuffers); }

    bool append(MbBufferImp* buffer) {
        if (_index.find(buffer) != MbBufferIndex::NONE) return false;
        _index.reserve(_buffers.size() + 1);
        _buffers.push_back(buffer);
        _index.insert(buffer, static_cast<std::uint32_t>(_buffers.size() - 1));
        return true;
    }

    bool remove(MbBufferImp* buffer) noexcept {
        const std::uint32_t number = _index.remove(buffer);
        if (number == MbBufferIndex::NONE) return false;
        MbBufferImp* const last = _buffers.back();
        _buffers.pop_back();
        if (last == buffer) return true;
        _buffers[number] = last;
        _index.setNumber(last, number);
        return true;
    }

    MbBufferImp* draw() noexcept {
        if (_buffers.empty()) return nullptr;
        constexpr double SCALE = 2147483647.0;
        const auto number = static_cast<std::int64_t>(_random.next() * SCALE);
        return _buffers[static_cast<std::size_t>(number) % _buffers.size()];
    }

    bool isEmpty() const noexcept { return _buffers.empty(); }

    void dump(std::ostream& stream) const {
        stream << "Random buffer container:";
        for (const MbBufferImp* const buffer : _buffers) stream << ' ' << keyOf(buffer);
        stream << "\nPair associative indexes :";
        for (const MbBufferImp* const buffer : _buffers) {
            stream << " (" << keyOf(buffer) << ", " << _index.find(buffer) << ')';
        }
        stream << '\n';
    }

private:
    static const void* keyOf(const MbBufferImp* buffer) { return buffer; }

    DaBookVector<MbBufferImp*> _buffers;
    MbBufferIndex _index;
    RnNumRecUniformRng<double> _random;
};

MbUnloadRandom::MbUnloadRandom(int nbBuffers)
    : _books(std::make_unique<Books>(static_cast<std::size_t>(std::max(nbBuffers, 0)))) {}

MbUnloadRandom::~MbUnloadRandom() = default;

const char* MbUnloadRandom::getName() const {
    return "MbUnloadRandom";
}

void MbUnloadRandom::insertBuffer(MbBufferImp* buffer) {
    const bool isNew = _books->append(buffer);
    ORV_ASSERT(isNew);
}

void MbUnloadRandom::removeBuffer(MbBufferImp* buffer) {
    const bool wasInserted = _books->remove(buffer);
    ORV_ASSERT(wasInserted);
}

MbBufferImp* MbUnloadRandom::selectVictim() const {
    return _books->draw();
}

bool MbUnloadRandom::isEmpty() const {
    return _books->isEmpty();
}

void MbUnloadRandom::dump(std::ostream& stream) const {
    _books->dump(stream);
}

}  // namespace Orv

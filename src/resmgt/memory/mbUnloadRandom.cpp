#include "mbUnloadRandom.h"

#include <algorithm>
#include <ostream>

#include "assertions.h"
#include "mbBufferNumbersPrivate.h"
#include "rnNumRecUniformRng.h"

namespace Orv {

/// The buffers' numbers in an array without gaps, and where in it each of them stands.
class MbUnloadRandom::Books {
public:
    explicit Books(std::size_t nbBuffers) : _numbers(nbBuffers) { _array.reserve(nbBuffers); }

    bool append(MbBufferImp* buffer) {
        if (_array.size() == _array.capacity()) _array.reserve(2 * _array.size() + 8);
        const std::uint32_t number = _numbers.insert(buffer);
        if (number == Numbers::NONE) return false;
        _numbers[number].place = static_cast<std::uint32_t>(_array.size());
        _array.push_back(number);
        return true;
    }

    bool remove(MbBufferImp* buffer) noexcept {
        const std::uint32_t number = _numbers.find(buffer);
        if (number == Numbers::NONE) return false;
        const std::uint32_t place = _numbers[number].place;
        const std::uint32_t last = _array.back();
        _array[place] = last;
        _numbers[last].place = place;
        _array.pop_back();
        _numbers.remove(number);
        return true;
    }

    bool has(MbBufferImp* buffer) const noexcept { return _numbers.find(buffer) != Numbers::NONE; }

    MbBufferImp* draw() noexcept {
        if (_array.empty()) return nullptr;
        constexpr double SCALE = 2147483647.0;
        const auto drawn = static_cast<std::int64_t>(_random.next() * SCALE);
        return _numbers.getBuffer(_array[static_cast<std::size_t>(drawn) % _array.size()]);
    }

    bool isEmpty() const noexcept { return _array.empty(); }

    void dump(std::ostream& stream) {
        stream << "Random buffer container:";
        for (const std::uint32_t number : _array) stream << ' ' << keyOf(number);
        stream << "\nPair associative indexes :";
        for (const std::uint32_t number : _array) {
            stream << " (" << keyOf(number) << ", " << _numbers[number].place << ')';
        }
        stream << '\n';
    }

private:
    struct Data {
        std::uint32_t place = 0;  // in the array
    };
    using Numbers = MbBufferNumbers<Data>;

    Numbers _numbers;
    DaBookVector<std::uint32_t> _array;
    RnNumRecUniformRng<double> _random;

    const void* keyOf(std::uint32_t number) const { return _numbers.getBuffer(number); }
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

void MbUnloadRandom::touchBuffer(MbBufferImp* buffer) {
    const bool wasInserted = _books->has(buffer);  // all that counts
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

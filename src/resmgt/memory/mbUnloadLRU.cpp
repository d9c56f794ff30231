#include "mbUnloadLRU.h"

#include <algorithm>
#include <ostream>

#include "assertions.h"
#include "mbBufferNumbersPrivate.h"

namespace Orv {

/// A ring through the records: what was used last stands before the head, which is no buffer's.
class MbUnloadLRU::Books {
public:
    explicit Books(std::size_t nbBuffers) : _numbers(nbBuffers) {}

    bool append(MbBufferImp* buffer) {
        const std::uint32_t number = _numbers.insert(buffer);
        if (number == Numbers::NONE) return false;
        link(number);
        return true;
    }

    bool touch(MbBufferImp* buffer) noexcept {
        const std::uint32_t number = _numbers.find(buffer);
        if (number == Numbers::NONE) return false;
        unlink(number);
        link(number);
        return true;
    }

    bool remove(MbBufferImp* buffer) noexcept {
        const std::uint32_t number = _numbers.find(buffer);
        if (number == Numbers::NONE) return false;
        unlink(number);
        _numbers.remove(number);
        return true;
    }

    MbBufferImp* getFirst() noexcept { return _numbers.getBuffer(_numbers[HEAD].next); }
    std::size_t getNbBuffers() const noexcept { return _numbers.getNbIn(); }

private:
    static constexpr std::uint32_t HEAD = 0;
    struct Links {
        std::uint32_t place = HEAD;  // behind the buffer of this number
        std::uint32_t next = HEAD;
    };
    using Numbers = MbBufferNumbers<Links>;

    Numbers _numbers;

    void link(std::uint32_t number) noexcept {
        const std::uint32_t last = _numbers[HEAD].place;
        _numbers[number] = {last, HEAD};
        _numbers[last].next = number;
        _numbers[HEAD].place = number;
    }

    void unlink(std::uint32_t number) noexcept {
        const Links links = _numbers[number];
        _numbers[links.place].next = links.next;
        _numbers[links.next].place = links.place;
    }
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

void MbUnloadLRU::touchBuffer(MbBufferImp* buffer) {
    const bool wasInserted = _books->touch(buffer);
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

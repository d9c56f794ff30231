#include "daFirstFitArena.h"

#include <algorithm>
#include <functional>
#include <limits>
#include <ostream>

#include "assertions.h"
#include "daBlockLedgerPrivate.h"
#include "formatText.h"

namespace Orv {

namespace {

constexpr std::uint64_t GRANULE = 8;  // block lengths are multiples of it

std::uint64_t addressOf(const void* pointer) noexcept {
    return reinterpret_cast<std::uintptr_t>(pointer);
}

void* pointerTo(std::uint64_t address) noexcept {
    return reinterpret_cast<void*>(static_cast<std::uintptr_t>(address));
}

unsigned long long wide(std::uint64_t number) {
    return number;
}

/// The base as a number, once it is known to be one that an arena can have.
std::uint64_t checkedBase(const void* base, std::uint64_t size) {
    ORV_ASSERT(base != nullptr);
    ORV_ASSERT(size > 0);
    ORV_ASSERT_TEXT(size - 1 <= std::numeric_limits<std::uint64_t>::max() - addressOf(base),
                    "base + size <= 2^64");
    return addressOf(base);
}

}  // namespace

/// The ledger behind an arena, whatever the unit and the width that it counts in.
class DaFirstFitArena::Books {
public:
    using Visit = std::function<void(std::uint64_t offset, std::uint64_t bytes)>;

    virtual ~Books() = default;

    virtual void* allocate(std::uint64_t bytes, std::uint64_t alignment) = 0;
    virtual bool deallocate(const void* block) noexcept = 0;
    virtual DaArenaStatistics getStatistics() const noexcept = 0;
    virtual void visitFreeBlocks(const Visit&) const = 0;

    static std::unique_ptr<Books> open(std::uint64_t base, std::uint64_t size);

private:
    template <class Word, std::uint64_t UNIT>
    class InUnits;
};

/// Books in units of so many bytes, of which base and size are whole multiples.
template <class Word, std::uint64_t UNIT>
class DaFirstFitArena::Books::InUnits final : public Books {
public:
    InUnits(std::uint64_t base, std::uint64_t size)
        : _base(base),
          _size(size),
          _ledger(static_cast<Word>(size / UNIT), static_cast<Word>(base / UNIT)) {}

    void* allocate(std::uint64_t bytes, std::uint64_t alignment) override {
        const auto length = static_cast<Word>(bytes / UNIT);
        const std::uint64_t mask = (alignment - 1) / UNIT;
        if (mask <= std::numeric_limits<Word>::max()) {
            const Word start = _ledger.allocate(length, static_cast<Word>(mask));
            return start == Ledger::NONE ? nullptr : pointerTo(_base + start * UNIT);
        }
        // One address of the arena, at the most, is aligned so far.
        const std::uint64_t offset = (0 - _base) & (alignment - 1);
        if (offset >= _size) return nullptr;
        const bool isFree = _ledger.allocateAt(static_cast<Word>(offset / UNIT), length);
        return isFree ? pointerTo(_base + offset) : nullptr;
    }

    bool deallocate(const void* block) noexcept override {
        const std::uint64_t offset = addressOf(block) - _base;
        return offset < _size && offset % UNIT == 0 &&
               _ledger.deallocate(static_cast<Word>(offset / UNIT));
    }

    DaArenaStatistics getStatistics() const noexcept override {
        Word largest = 0;
        _ledger.visitFreeBlocks([&](auto block) { largest = std::max(largest, block.length); });
        return {_size, _ledger.getFreeLength() * UNIT, largest * UNIT, _ledger.getNbFreeBlocks(),
                _ledger.getNbAllocatedBlocks()};
    }

    void visitFreeBlocks(const Visit& visit) const override {
        _ledger.visitFreeBlocks(
            [&](auto block) { visit(block.address * UNIT, block.length * UNIT); });
    }

private:
    using Ledger = DaBlockLedger<Word>;

    std::uint64_t _base;
    std::uint64_t _size;
    Ledger _ledger;
};

/// Half the width where that will do: up to 32 GiB.
std::unique_ptr<DaFirstFitArena::Books> DaFirstFitArena::Books::open(std::uint64_t base,
                                                                     std::uint64_t size) {
    constexpr std::uint64_t LARGEST = DaBlockLedger<std::uint32_t>::NONE;
    if (base % GRANULE == 0 && size % GRANULE == 0 && size / GRANULE < LARGEST) {
        return std::make_unique<InUnits<std::uint32_t, GRANULE>>(base, size);
    }
    return std::make_unique<InUnits<std::uint64_t, 1>>(base, size);
}

DaFirstFitArena::DaFirstFitArena(void* base, std::uint64_t size, const char* name)
    : _name(name != nullptr ? name : "<Unnamed arena>"),
      _size(size),
      _books(Books::open(checkedBase(base, size), size)) {}

DaFirstFitArena::~DaFirstFitArena() = default;

void* DaFirstFitArena::allocate(std::uint64_t size, std::uint64_t alignment) {
    ORV_ASSERT((alignment & (alignment - 1)) == 0);
    if (size == 0) size = 1;
    const std::uint64_t bytes = (size + (GRANULE - 1)) & ~(GRANULE - 1);
    if (bytes < size || bytes > _size) return nullptr;
    return _books->allocate(bytes, alignment > 0 ? alignment : 1);
}

void DaFirstFitArena::deallocate(void* block) {
    if (_books->deallocate(block)) return;
    Assertions::throwAssertionFailed(ORV_FILE, 185, "blockEntry != _allocatedBlocks.end()");
}

DaArenaStatistics DaFirstFitArena::getStatistics() const noexcept {
    return _books->getStatistics();
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
    _books->visitFreeBlocks([&](std::uint64_t offset, std::uint64_t bytes) {
        stream << formatText("    %8llu  %8llu\n", wide(offset), wide(bytes));
    });
}

}  // namespace Orv

#include "daFirstFitArena.h"

#include <algorithm>
#include <limits>
#include <ostream>

#include "assertions.h"
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

DaFirstFitArena::DaFirstFitArena(void* base, std::uint64_t size, const char* name)
    : _name(name != nullptr ? name : "<Unnamed arena>"),
      _base(checkedBase(base, size)),
      _size(size),
      _unit(fitsNarrow(_base, size) ? GRANULE : 1),
      _ledger(openLedger(_base, size)) {}

bool DaFirstFitArena::fitsNarrow(std::uint64_t base, std::uint64_t size) noexcept {
    return base % GRANULE == 0 && size % GRANULE == 0 && size / GRANULE < NarrowLedger::NONE;
}

std::variant<DaFirstFitArena::NarrowLedger, DaFirstFitArena::WideLedger>
DaFirstFitArena::openLedger(std::uint64_t base, std::uint64_t size) {
    if (!fitsNarrow(base, size)) return WideLedger(size, base);
    return NarrowLedger(static_cast<std::uint32_t>(size / GRANULE),
                        static_cast<std::uint32_t>(base / GRANULE));
}

void* DaFirstFitArena::allocate(std::uint64_t size, std::uint64_t alignment) {
    ORV_ASSERT((alignment & (alignment - 1)) == 0);
    if (size == 0) size = 1;
    const std::uint64_t bytes = (size + (GRANULE - 1)) & ~(GRANULE - 1);
    if (bytes < size || bytes > _size) return nullptr;
    if (alignment == 0) alignment = 1;

    const std::uint64_t mask = (alignment - 1) / _unit;
    const std::uint64_t length = bytes / _unit;
    const auto allocateFrom = [&]<class Word>(DaBlockLedger<Word>& ledger) -> void* {
        constexpr Word NONE = DaBlockLedger<Word>::NONE;
        Word start = NONE;
        if (mask <= std::numeric_limits<Word>::max()) {
            start = ledger.allocate(static_cast<Word>(length), static_cast<Word>(mask));
        } else {
            // The arena has one address at the most that is aligned so far.
            const std::uint64_t offset = (0 - _base) & (alignment - 1);
            if (offset < _size &&
                ledger.allocateAt(static_cast<Word>(offset / _unit), static_cast<Word>(length))) {
                start = static_cast<Word>(offset / _unit);
            }
        }
        return start == NONE ? nullptr : pointerTo(_base + start * _unit);
    };
    return std::visit(allocateFrom, _ledger);
}

void DaFirstFitArena::deallocate(void* block) {
    const std::uint64_t offset = addressOf(block) - _base;
    const bool isInside = offset < _size && offset % _unit == 0;
    const bool isTaken =
        isInside && std::visit(
                        [&]<class Word>(DaBlockLedger<Word>& ledger) {
                            return ledger.deallocate(static_cast<Word>(offset / _unit));
                        },
                        _ledger);
    if (!isTaken) {
        Assertions::throwAssertionFailed(ORV_FILE, 185, "blockEntry != _allocatedBlocks.end()");
    }
}

DaArenaStatistics DaFirstFitArena::getStatistics() const noexcept {
    DaArenaStatistics statistics;
    statistics.size = _size;
    std::visit(
        [&](const auto& ledger) {
            statistics.freeBytes = ledger.getFreeLength() * _unit;
            statistics.nbFreeBlocks = ledger.getNbFreeBlocks();
            statistics.nbAllocatedBlocks = ledger.getNbAllocatedBlocks();
            ledger.visitFreeBlocks([&](auto block) {
                statistics.largestFreeBlock =
                    std::max(statistics.largestFreeBlock, block.length * _unit);
            });
        },
        _ledger);
    return statistics;
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
    std::visit(
        [&](const auto& ledger) {
            ledger.visitFreeBlocks([&](auto block) {
                stream << formatText("    %8llu  %8llu\n", wide(block.address * _unit),
                                     wide(block.length * _unit));
            });
        },
        _ledger);
}

}  // namespace Orv

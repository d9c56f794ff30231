#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <limits>

#include "daBookAllocatorPrivate.h"

namespace Orv {

class MbBufferImp;

/// Finds the number that belongs to a buffer: a hash table with open addressing, at most three
/// quarters full. Needs memory only to grow.
class MbBufferIndex {
public:
    static constexpr std::uint32_t NONE = std::numeric_limits<std::uint32_t>::max();

    /// NONE if the buffer is not in.
    std::uint32_t find(const MbBufferImp* buffer) const noexcept {
        const Slot* const slot = findSlot(buffer);
        return slot != nullptr && slot->buffer != nullptr ? slot->number : NONE;
    }

    /// Makes room for @p nbBuffers, so that inserting them does not throw.
    void reserve(std::size_t nbBuffers) {
        const std::size_t nbSlots = std::bit_ceil(nbBuffers + nbBuffers / 3 + 1);
        if (nbSlots > _slots.size()) rehash(nbSlots < NB_MIN ? NB_MIN : nbSlots);
    }

    /// A buffer that is not in, into room that was reserved.
    void insert(const MbBufferImp* buffer, std::uint32_t number) noexcept {
        *findSlot(buffer) = {buffer, number};
        ++_nbBuffers;
    }

    /// For a buffer that is in.
    void setNumber(const MbBufferImp* buffer, std::uint32_t number) noexcept {
        findSlot(buffer)->number = number;
    }

    /// @return the number of a buffer that was in, else NONE.
    std::uint32_t remove(const MbBufferImp* buffer) noexcept;

    std::size_t getNbBuffers() const noexcept { return _nbBuffers; }

private:
    static constexpr std::size_t NB_MIN = 8;

    struct Slot {
        const MbBufferImp* buffer = nullptr;  // null: free
        std::uint32_t number = 0;
    };

    DaBookVector<Slot> _slots;  // a power of two of them, or none
    std::size_t _nbBuffers = 0;

    std::size_t homeOf(const MbBufferImp* buffer) const noexcept {
        // Multiplied by 2^64 divided by the golden ratio, so that all bits count for the upper ones.
        const std::uint64_t product =
            static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(buffer)) *
            0x9E3779B97F4A7C15u;
        return static_cast<std::size_t>(product >> 32) & (_slots.size() - 1);
    }

    /// The buffer's slot, or the free one where it would go; null while there are none.
    const Slot* findSlot(const MbBufferImp* buffer) const noexcept {
        if (_slots.empty()) return nullptr;
        std::size_t i = homeOf(buffer);
        while (_slots[i].buffer != nullptr && _slots[i].buffer != buffer) {
            i = (i + 1) & (_slots.size() - 1);
        }
        return &_slots[i];
    }
    Slot* findSlot(const MbBufferImp* buffer) noexcept {
        return const_cast<Slot*>(static_cast<const MbBufferIndex*>(this)->findSlot(buffer));
    }

    void rehash(std::size_t nbSlots) {
        DaBookVector<Slot> slots(nbSlots);
        slots.swap(_slots);
        for (const Slot& slot : slots) {
            if (slot.buffer != nullptr) *findSlot(slot.buffer) = slot;
        }
    }
};

inline std::uint32_t MbBufferIndex::remove(const MbBufferImp* buffer) noexcept {
    Slot* const found = findSlot(buffer);
    if (found == nullptr || found->buffer == nullptr) return NONE;
    const std::uint32_t number = found->number;
    const std::size_t mask = _slots.size() - 1;
    std::size_t hole = static_cast<std::size_t>(found - _slots.data());
    // Those behind that could have stood in the hole move up, so that no look-up ends there early.
    for (std::size_t i = (hole + 1) & mask; _slots[i].buffer != nullptr; i = (i + 1) & mask) {
        if (((i - homeOf(_slots[i].buffer)) & mask) < ((i - hole) & mask)) continue;
        _slots[hole] = _slots[i];
        hole = i;
    }
    _slots[hole] = {};
    --_nbBuffers;
    return number;
}

}  // namespace Orv

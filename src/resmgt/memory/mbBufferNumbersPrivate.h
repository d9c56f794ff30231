#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <limits>

#include "daBookAllocatorPrivate.h"

namespace Orv {

class MbBufferImp;

/// What a strategy knows about the buffers that are in it: a hash table of records with fixed
/// numbers, by which they may refer to each other.
///
/// A buffer that leaves keeps its record for when it comes back, as buffers that are used do at
/// once. Records are taken from it when others want them and half of all are kept in vain. So
/// memory is needed only while the number of buffers grows.
template <class Data>
class MbBufferNumbers {
public:
    static constexpr std::uint32_t NONE = std::numeric_limits<std::uint32_t>::max();

    struct Record {
        MbBufferImp* buffer = nullptr;
        Data data{};
        bool isIn = false;
        bool isUnused = true;  // of no buffer
    };

    /// Number of a buffer that is in, else NONE.
    std::uint32_t find(const MbBufferImp* buffer) const noexcept {
        const std::uint32_t number = lookUp(buffer);
        return number != NONE && _records[number].isIn ? number : NONE;
    }

    void reserve(std::size_t nbBuffers) {
        _records.reserve(nbBuffers);
        growSlots(nbBuffers);
    }

    /// The buffer's number, from now on in; of one that is in already, nothing changes.
    /// @throws std::bad_alloc, with nothing changed.
    std::uint32_t insert(MbBufferImp* buffer) {
        std::uint32_t number = lookUp(buffer);
        if (number == NONE) number = makeRecord(buffer);
        _nbIn += !_records[number].isIn;
        _records[number].isIn = true;
        return number;
    }

    /// For a buffer that is in.
    void remove(std::uint32_t number) noexcept {
        _records[number].isIn = false;
        _lastRemoved = number;
        --_nbIn;
    }

    Data& operator[](std::uint32_t number) noexcept { return _records[number].data; }
    MbBufferImp* getBuffer(std::uint32_t number) const noexcept { return _records[number].buffer; }
    std::size_t getNbIn() const noexcept { return _nbIn; }

private:
    static constexpr std::size_t NB_MIN = 8;

    DaBookVector<Record> _records;
    DaBookVector<std::uint32_t> _slots;   // numbers by hash; a power of two of them, or none
    DaBookVector<std::uint32_t> _unused;  // records of no buffer; has room for all
    std::uint32_t _lastRemoved = NONE;
    std::size_t _nbIn = 0;

    std::size_t homeOf(const MbBufferImp* buffer) const noexcept {
        // Multiplied by 2^64 divided by the golden ratio: all bits count for the upper ones.
        const std::uint64_t product =
            static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(buffer)) *
            0x9E3779B97F4A7C15u;
        return static_cast<std::size_t>(product >> 32) & (_slots.size() - 1);
    }

    std::uint32_t lookUp(const MbBufferImp* buffer) const noexcept {
        if (_lastRemoved != NONE && _records[_lastRemoved].buffer == buffer) return _lastRemoved;
        if (_slots.empty()) return NONE;
        for (std::size_t i = homeOf(buffer);; i = (i + 1) & (_slots.size() - 1)) {
            const std::uint32_t number = _slots[i];
            if (number == NONE || _records[number].buffer == buffer) return number;
        }
    }

    void enter(std::uint32_t number) noexcept {
        std::size_t i = homeOf(_records[number].buffer);
        while (_slots[i] != NONE) i = (i + 1) & (_slots.size() - 1);
        _slots[i] = number;
    }

    /// Enters all records anew, in as many slots as there are now.
    void enterAll() noexcept {
        for (std::uint32_t& slot : _slots) slot = NONE;
        for (std::uint32_t number = 0; number < _records.size(); ++number) {
            if (!_records[number].isUnused) enter(number);
        }
    }

    /// Three quarters are used at the most.
    void growSlots(std::size_t nbRecords) {
        const std::size_t nbSlots = std::bit_ceil(nbRecords + nbRecords / 3 + 8);
        if (nbSlots <= _slots.size()) return;
        DaBookVector<std::uint32_t> slots(nbSlots, NONE);
        slots.swap(_slots);
        enterAll();
    }

    std::uint32_t makeRecord(MbBufferImp* buffer) {
        if (_unused.empty() && _nbIn < _records.size() / 2 && _records.size() >= NB_MIN)
            forgetOthers();
        if (_unused.empty()) {
            growSlots(_records.size() + 1);
            _unused.reserve(_records.size() + 1);
            _records.push_back({});  // the last that may throw
            _unused.push_back(static_cast<std::uint32_t>(_records.size() - 1));
        }
        const std::uint32_t number = _unused.back();
        _unused.pop_back();
        _records[number].buffer = buffer;
        _records[number].isUnused = false;
        enter(number);
        return number;
    }

    void forgetOthers() noexcept {
        for (std::uint32_t number = 0; number < _records.size(); ++number) {
            Record& record = _records[number];
            if (record.isIn || record.isUnused) continue;
            record.isUnused = true;
            _unused.push_back(number);
        }
        _lastRemoved = NONE;
        enterAll();
    }
};

}  // namespace Orv

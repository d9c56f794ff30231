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
/// A buffer that leaves keeps its record for when it comes back, as those do that are in use or
/// unloaded for a while. Its record is taken from it when others want one and half of all are kept
/// in vain. So memory is needed only while the number of buffers grows. Record 0 is no buffer's and
/// free for the user.
///
/// @tparam Data  16 bytes with the buffer, if it is to be fast; has a member `place`, of 32 bits,
///               which is below OUT exactly while the buffer is in: the user sets it.
template <class Data>
class MbBufferNumbers {
public:
    static constexpr std::uint32_t NONE = std::numeric_limits<std::uint32_t>::max();
    static constexpr std::uint32_t OUT = NONE - 1;

    /// @param nbBuffers  room is made for so many.
    explicit MbBufferNumbers(std::size_t nbBuffers) {
        _records.reserve(nbBuffers + 1);
        growSlots(nbBuffers + 1);
        _records.push_back({});
    }

    /// Number of a buffer that is in, else NONE.
    std::uint32_t find(const MbBufferImp* buffer) const noexcept {
        const std::uint32_t number = lookUp(buffer, hashOf(buffer));
        return number != NONE && isIn(_records[number]) ? number : NONE;
    }

    /// Number of a buffer whose data the caller sets then; NONE if it is in already.
    /// @throws std::bad_alloc, with nothing changed.
    std::uint32_t insert(MbBufferImp* buffer) {
        std::uint32_t number = lookUp(buffer, hashOf(buffer));
        if (number == NONE) number = makeRecord(buffer);
        if (isIn(_records[number])) return NONE;
        ++_nbIn;
        return number;
    }

    void remove(std::uint32_t number) noexcept {
        _records[number].data.place = OUT;
        --_nbIn;
    }

    Data& operator[](std::uint32_t number) noexcept { return _records[number].data; }
    MbBufferImp* getBuffer(std::uint32_t number) const noexcept { return _records[number].buffer; }
    std::size_t getNbIn() const noexcept { return _nbIn; }

private:
    static constexpr std::uint32_t UNUSED = NONE;  // place of a record of no buffer
    static constexpr std::size_t NB_MIN = 8;

    struct Record {
        MbBufferImp* buffer = nullptr;
        Data data{};
    };
    struct Slot {
        std::uint32_t number = NONE;
        std::uint32_t hash = 0;  // tells nearly all others apart without a look at their records
    };

    DaBookVector<Record> _records;
    DaBookVector<Slot> _slots;            // a power of two of them, or none
    DaBookVector<std::uint32_t> _unused;  // records of no buffer; has room for all
    std::size_t _mask = 0;                // of places in _slots
    unsigned _shift = 0;                  // what a hash has more than such a place
    std::uint32_t _lastRemoved = 0;       // or any other record
    std::size_t _nbIn = 0;

    static bool isIn(const Record& record) noexcept { return record.data.place < OUT; }

    static std::uint32_t hashOf(const MbBufferImp* buffer) noexcept {
        // Times 2^64 divided by the golden ratio: the upper bits spread evenly what lies in memory
        // at equal distances.
        const auto key = static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(buffer));
        return static_cast<std::uint32_t>((key * 0x9E3779B97F4A7C15u) >> 32);
    }

    std::size_t homeOf(std::uint32_t hash) const noexcept {
        return static_cast<std::size_t>(hash >> _shift);
    }

    std::uint32_t lookUp(const MbBufferImp* buffer, std::uint32_t hash) const noexcept {
        for (std::size_t i = homeOf(hash);; i = (i + 1) & _mask) {
            const Slot slot = _slots[i];
            if (slot.number == NONE) return NONE;
            if (slot.hash == hash && _records[slot.number].buffer == buffer) return slot.number;
        }
    }

    void enter(std::uint32_t number, std::uint32_t hash) noexcept {
        std::size_t i = homeOf(hash);
        while (_slots[i].number != NONE) i = (i + 1) & _mask;
        _slots[i] = {number, hash};
    }

    /// Enters all records anew, in as many slots as there are now.
    void enterAll() noexcept {
        for (Slot& slot : _slots) slot = {};
        for (std::uint32_t number = 1; number < _records.size(); ++number) {
            const Record& record = _records[number];
            if (record.data.place != UNUSED) enter(number, hashOf(record.buffer));
        }
    }

    /// Three quarters are used at the most.
    void growSlots(std::size_t nbRecords) {
        const std::size_t nbSlots = std::bit_ceil(nbRecords + nbRecords / 3 + NB_MIN);
        if (nbSlots <= _slots.size()) return;
        DaBookVector<Slot> slots(nbSlots);
        slots.swap(_slots);
        _mask = nbSlots - 1;
        _shift = 32 - static_cast<unsigned>(std::countr_zero(nbSlots));
        enterAll();
    }

    [[gnu::noinline]] std::uint32_t makeRecord(MbBufferImp* buffer) {
        if (_unused.empty() && _records.size() >= NB_MIN && _nbIn < _records.size() / 2) {
            forgetOthers();
        }
        if (_unused.empty()) addRecord();
        const std::uint32_t number = _unused.back();
        _unused.pop_back();
        _records[number].buffer = buffer;
        _records[number].data.place = OUT;
        enter(number, hashOf(buffer));
        return number;
    }

    void addRecord() {
        growSlots(_records.size() + 1);
        if (_unused.capacity() <= _records.size()) _unused.reserve(2 * _records.size() + NB_MIN);
        _records.push_back({});  // the last that may throw
        _records.back().data.place = UNUSED;
        _unused.push_back(static_cast<std::uint32_t>(_records.size() - 1));
    }

    void forgetOthers() noexcept {
        for (std::uint32_t number = 1; number < _records.size(); ++number) {
            Record& record = _records[number];
            if (record.data.place != OUT) continue;
            record.data.place = UNUSED;
            _unused.push_back(number);
        }
        enterAll();
    }
};

}  // namespace Orv

#pragma once

#include <cstdint>
#include <vector>

#include "mtAlarmHandle.h"

namespace Orv {

/// Alarms in the order in which they are due; among equal times the one added last comes first.
///
/// A heap with four children per node, which lie side by side, over numbered places: moving an entry
/// touches two small arrays and never the handle. Adding and removing among a hundred thousand touch
/// a handful of entries.
///
/// - Threads: one at a time.
class MtAlarmQueue {
public:
    using Place = std::uint32_t;
    static constexpr Place NOWHERE = 0xFFFFFFFF;

    bool isEmpty() const noexcept { return _heap.empty(); }
    std::size_t getNbAlarms() const noexcept { return _heap.size(); }

    /// Makes sure that one more fits.
    /// @throws std::length_error "list too long", std::bad_alloc
    void makeRoom();

    /// @param seconds  not NaN
    /// @return the alarm's place until remove(); makeRoom() was called.
    Place add(double seconds, RCShdPtr<MtAlarmHandle> handle) noexcept;

    double getFirstTime() const noexcept { return _heap.front().seconds; }  ///< If not empty.

    /// Takes the first alarm, if there is one, out of the order; it keeps its place.
    Place takeFirst() noexcept;
    void putBack(Place place, double seconds) noexcept;  ///< As if it were added now.

    /// Ends the place, whether or not its alarm stands in the order.
    RCShdPtr<MtAlarmHandle> remove(Place place) noexcept;

    const RCShdPtr<MtAlarmHandle>& getHandle(Place place) const noexcept {
        return _seats[place].handle;
    }

private:
    struct Entry {
        double seconds;
        Place place;
    };
    struct Seat {
        RCShdPtr<MtAlarmHandle> handle;
        std::uint64_t order = 0;  // rises with each addition
    };

    static constexpr std::size_t NB_CHILDREN = 4;

    std::vector<Entry> _heap;
    std::vector<std::uint32_t>
        _positions;            // by place: in the heap, NOWHERE, or the next free place
    std::vector<Seat> _seats;  // by place
    Place _firstFree = NOWHERE;
    std::uint64_t _nbAdded = 0;

    bool isBefore(const Entry& left, const Entry& right) const noexcept;
    void put(std::size_t position, const Entry& entry) noexcept;
    void rise(std::size_t position, const Entry& entry) noexcept;
    void sink(std::size_t position, const Entry& entry) noexcept;
    void takeOut(std::size_t position) noexcept;
};

}  // namespace Orv

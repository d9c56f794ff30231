#include <algorithm>
#include <stdexcept>

#include "mtAlarmQueuePrivate.h"

namespace Orv {

void MtAlarmQueue::makeRoom() {
    if (_firstFree != NOWHERE) return;
    if (_seats.size() >= NOWHERE) throw std::length_error("list too long");
    if (_seats.size() < _seats.capacity()) return;
    const std::size_t capacity = std::max<std::size_t>(16, 2 * _seats.size());
    _heap.reserve(capacity);
    _positions.reserve(capacity);
    _seats.reserve(capacity);  // last: the others have at least its capacity
}

MtAlarmQueue::Place MtAlarmQueue::add(double seconds, RCShdPtr<MtAlarmHandle> handle) noexcept {
    Place place = _firstFree;
    if (place == NOWHERE) {
        place = static_cast<Place>(_seats.size());
        _seats.emplace_back();
        _positions.push_back(NOWHERE);
    } else {
        _firstFree = _positions[place];
    }
    _seats[place].handle = std::move(handle);
    putBack(place, seconds);
    return place;
}

void MtAlarmQueue::putBack(Place place, double seconds) noexcept {
    _seats[place].order = ++_nbAdded;
    _heap.emplace_back();
    rise(_heap.size() - 1, {seconds, place});
}

MtAlarmQueue::Place MtAlarmQueue::takeFirst() noexcept {
    if (_heap.empty()) return NOWHERE;
    const Place place = _heap.front().place;
    takeOut(0);
    return place;
}

RCShdPtr<MtAlarmHandle> MtAlarmQueue::remove(Place place) noexcept {
    if (_positions[place] != NOWHERE) takeOut(_positions[place]);
    _positions[place] = _firstFree;
    _firstFree = place;
    return std::move(_seats[place].handle);
}

void MtAlarmQueue::takeOut(std::size_t position) noexcept {
    _positions[_heap[position].place] = NOWHERE;
    const Entry last = _heap.back();
    _heap.pop_back();
    if (position == _heap.size()) return;
    // The last entry fills the gap; mostly it is a late one among late ones and stays there.
    if (position > 0 && isBefore(last, _heap[(position - 1) / NB_CHILDREN])) {
        rise(position, last);
    } else {
        sink(position, last);
    }
}

bool MtAlarmQueue::isBefore(const Entry& left, const Entry& right) const noexcept {
    if (left.seconds != right.seconds) return left.seconds < right.seconds;
    return _seats[left.place].order > _seats[right.place].order;
}

void MtAlarmQueue::put(std::size_t position, const Entry& entry) noexcept {
    _heap[position] = entry;
    _positions[entry.place] = static_cast<std::uint32_t>(position);
}

void MtAlarmQueue::rise(std::size_t position, const Entry& entry) noexcept {
    while (position > 0) {
        const std::size_t parent = (position - 1) / NB_CHILDREN;
        if (!isBefore(entry, _heap[parent])) break;
        put(position, _heap[parent]);
        position = parent;
    }
    put(position, entry);
}

void MtAlarmQueue::sink(std::size_t position, const Entry& entry) noexcept {
    for (;;) {
        const std::size_t first = position * NB_CHILDREN + 1;
        if (first >= _heap.size()) break;
        const std::size_t end = std::min(first + NB_CHILDREN, _heap.size());
        std::size_t best = first;
        for (std::size_t child = first + 1; child < end; ++child) {
            if (isBefore(_heap[child], _heap[best])) best = child;
        }
        if (!isBefore(_heap[best], entry)) break;
        put(position, _heap[best]);
        position = best;
    }
    put(position, entry);
}

}  // namespace Orv

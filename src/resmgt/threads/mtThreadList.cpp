#include <algorithm>

#include "assertions.h"
#include "mtThread.h"
#include "mtThreadListPrivate.h"

namespace Orv {

void MtThreadList::add(MtThread& thread) {
    auto seat = std::make_shared<Seat>();
    seat->thread = &thread;
    const LkGuard guard(_lock);
    ORV_ASSERT_TEXT(findNoLock(&thread) == nullptr, "findNoLock( thread ) == 0");
    _seats.push_back(std::move(seat));
}

void MtThreadList::remove(MtThread& thread) {
    SeatPtr seat;
    {
        const LkGuard guard(_lock);
        ORV_ASSERT_TEXT(findNoLock(&thread) == &thread, "findNoLock( thread ) == thread");
        const auto found = std::find_if(_seats.begin(), _seats.end(), [&](const SeatPtr& other) {
            return other->thread == &thread;
        });
        seat = *found;
        seat->thread = nullptr;
        _seats.erase(found);
    }
    const LkGuard noLongerInUse(seat->inUse);
}

void MtThreadList::forEach(const std::function<void(MtThread&)>& action) {
    std::vector<SeatPtr> seats;
    {
        const LkGuard guard(_lock);
        seats = _seats;
    }
    for (const SeatPtr& seat : seats) {
        const LkGuard inUse(seat->inUse);
        if (MtThread* const thread = seat->thread) action(*thread);
    }
}

void MtThreadList::forEachLocked(const std::function<void(MtThread&)>& action) const {
    const LkGuard guard(_lock);
    for (const SeatPtr& seat : _seats) action(*seat->thread);
}

void MtThreadList::whileLocked(const std::function<void()>& action) const {
    const LkGuard guard(_lock);
    action();
}

std::size_t MtThreadList::getSize() const {
    const LkGuard guard(_lock);
    return _seats.size();
}

std::vector<LiString> MtThreadList::getNames() const {
    std::vector<LiString> names;
    forEachLocked([&](const MtThread& thread) { names.push_back(thread.getName()); });
    return names;
}

MtThread* MtThreadList::findNoLock(const MtThread* thread) const {
    for (const SeatPtr& seat : _seats) {
        if (seat->thread == thread) return seat->thread;
    }
    return nullptr;
}

}  // namespace Orv

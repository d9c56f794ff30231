#include <algorithm>

#include "assertions.h"
#include "priority.h"
#include "priorityNotifierPrivate.h"

namespace Orv {

void PriorityNotifier::add(Priority& priority) noexcept {
    PriorityLink& link = *priority._link;
    link.priority = &priority;
    if (!link.isReady) link.unreadySeat.take(_unready);
}

void PriorityNotifier::remove(Priority& priority) noexcept {
    PriorityLink& link = *priority._link;
    if (link.unreadySeat.isTaken()) link.unreadySeat.leave(_unready);
    if (link.queueSeat.isTaken()) link.queueSeat.leave(_queue);
    link.priority = nullptr;
    link.due.reset();
    link.told.reset();
}

void PriorityNotifier::noteUse(const Priority& priority) noexcept {
    PriorityLink& link = *priority._link;
    if (!link.unreadySeat.isTaken()) return;
    link.unreadySeat.leave(_unready);
    link.isReady = true;
    queueIfChanged(link);
}

void PriorityNotifier::noteNumber(const Priority& priority) noexcept {
    PriorityLink& link = *priority._link;
    link.due = {priority._number, priority._isTied};
    queueIfChanged(link);
}

/// Who is telling it at the moment looks again afterwards.
void PriorityNotifier::queueIfChanged(PriorityLink& link) noexcept {
    if (!link.isReady || link.queueSeat.isTaken() || link.isRunning) return;
    if (link.told != link.due) link.queueSeat.take(_queue);
}

bool PriorityNotifier::deliver() {
    if (!begin()) return false;
    LinkPtr link;
    while ((link = takeNext(link)) != nullptr) tell(*link);
    return true;
}

bool PriorityNotifier::begin() {
    const LkGuard guard(_lock);
    noteOwnAsReady();
    if (_queue.empty()) return false;
    const LkThreadId self(LkThreadId::CURRENT_THREAD);
    if (std::find(_tellers.begin(), _tellers.end(), self) != _tellers.end()) return false;
    _tellers.push_back(self);
    return true;
}

/// What this thread made is whole by now: a constructor does not bring its manager up to date.
void PriorityNotifier::noteOwnAsReady() noexcept {
    for (auto next = _unready.begin(); next != _unready.end();) {
        const PriorityLink& link = **next++;
        if (link.maker.isCurrentThread()) noteUse(*link.priority);
    }
}

PriorityNotifier::LinkPtr PriorityNotifier::takeNext(const LinkPtr& previous) noexcept {
    const LkGuard guard(_lock);
    if (previous != nullptr) {
        previous->isRunning = false;
        if (previous->priority != nullptr) queueIfChanged(*previous);
    }
    if (_queue.empty()) {
        std::erase(_tellers, LkThreadId(LkThreadId::CURRENT_THREAD));
        return nullptr;
    }
    PriorityLink& link = *_queue.front();
    link.queueSeat.leave(_queue);
    link.isRunning = true;
    return link.shared_from_this();
}

void PriorityNotifier::tell(PriorityLink& link) const {
    const LkGuard running(link.running);
    Priority* priority = nullptr;
    int number = 0;
    {
        const LkGuard guard(_lock);
        priority = link.priority;
        if (priority == nullptr) return;
        number = link.due->first;
        link.told = link.due;
    }
    // Who removes it from here on waits for `running`.
    try {
        priority->updatePriority(number);
    } catch (...) {
        Assertions::traceCurrentException("telling a priority its number");
    }
}

void PriorityNotifier::waitForCall(const PriorityLink& link) {
    const LkGuard running(link.running);
}

}  // namespace Orv

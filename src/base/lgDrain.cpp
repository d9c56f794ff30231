#include <algorithm>

#include "formatText.h"
#include "lgDrainPrivate.h"

namespace Orv {

void LgDrain::adopt(LgQueue* newQueues) noexcept {
    while (newQueues != nullptr) {
        LgQueue* const queue = newQueues;
        newQueues = queue->_next;
        queue->_observedAt = _lastNow;  // it had no record when the queues were looked at last
        queue->_next = _queues;
        _queues = queue;
    }
}

/// @return the time up to which no further record can come.
std::int64_t LgDrain::observeAll(std::int64_t now) {
    std::size_t nbQueues = 0;
    for (LgQueue* queue = _queues; queue != nullptr; queue = queue->_next) ++nbQueues;
    _fronts.reserve(nbQueues);

    std::int64_t until = now;
    for (LgQueue* queue = _queues; queue != nullptr; queue = queue->_next) {
        until = std::min(until, queue->observe(now));
    }
    return until;
}

void LgDrain::addFront(LgQueue& queue, std::int64_t until) noexcept {
    const LgRecord* const record = queue.front();
    if (record == nullptr || record->nanoseconds > until) return;
    _fronts.push_back({record->nanoseconds, &queue});  // has room: reserved by observeAll()
    std::ranges::push_heap(_fronts, std::ranges::greater(), &Front::nanoseconds);
}

void LgDrain::mergeUntil(std::int64_t until) noexcept {
    for (LgQueue* queue = _queues; queue != nullptr; queue = queue->_next) addFront(*queue, until);
    while (!_fronts.empty()) {
        std::ranges::pop_heap(_fronts, std::ranges::greater(), &Front::nanoseconds);
        LgQueue& queue = *_fronts.back().queue;
        _fronts.pop_back();
        write(queue);
        addFront(queue, until);
    }
}

void LgDrain::write(LgQueue& queue) noexcept {
    const LgRecord& record = *queue.front();
    if (record.kind == LgRecord::Kind::THREAD_NAME) {
        try {
            queue.renameThread(record.text);
        } catch (const std::bad_alloc&) {
            // The old name must do.
        }
    }
    _sinks.write(record, queue.getThread());
    queue.pop();
}

void LgDrain::reportLosses(LgQueue& queue, std::int64_t now) noexcept {
    const std::uint64_t nbLost = queue.takeNbLost();
    if (nbLost == 0) return;
    char text[64];
    const int length = std::snprintf(text, sizeof text, "%llu messages lost: the queue was full",
                                     static_cast<unsigned long long>(nbLost));
    _sinks.write({.severity = LgSeverity::WARNING,
                  .category = "log",
                  .text = {text, static_cast<std::size_t>(length)},
                  .nanoseconds = now},
                 queue.getThread());
}

LgDrain::Result LgDrain::pass(std::int64_t now, LgQueue* newQueues) {
    adopt(newQueues);
    Result result;
    result.writtenUntil = observeAll(now);
    mergeUntil(result.writtenUntil);

    result.isEmptied = true;
    LgQueue** link = &_queues;
    while (*link != nullptr) {
        LgQueue& queue = **link;
        reportLosses(queue, result.writtenUntil);
        if (queue.isFinished()) {
            _sinks.threadEnded(queue.getThread());
            *link = queue._next;
            delete &queue;
            ++result.nbRemoved;
        } else {
            if (queue.front() != nullptr) result.isEmptied = false;
            link = &queue._next;
        }
    }
    _sinks.flush(result.writtenUntil);
    _lastNow = now;
    return result;
}

}  // namespace Orv

#pragma once

#include <cstdint>
#include <vector>

#include "lgQueue.h"
#include "lgSinkListPrivate.h"

namespace Orv {

/// Empties the queues into the sinks, in time order. One thread at a time, see LgDrainLock.
class LgDrain {
public:
    struct Result {
        std::int64_t writtenUntil = 0;  // every record up to this time has been written
        std::size_t nbRemoved = 0;      // queues whose threads have ended
        bool isEmptied = false;         // false if a record waits for a thread that is at one
    };

    /// Takes new queues, writes what is surely earlier than anything still to come, and removes
    /// the queues that have served.
    /// @param now  the time, read before @p newQueues was taken.
    /// @param newQueues  a list through LgQueue::_next; owned from here on.
    /// @throws std::bad_alloc with every record still queued.
    Result pass(std::int64_t now, LgQueue* newQueues);

    LgSinkList& getSinks() noexcept { return _sinks; }

private:
    struct Front {
        std::int64_t nanoseconds;
        LgQueue* queue;
    };

    void adopt(LgQueue* newQueues) noexcept;
    std::int64_t observeAll(std::int64_t now);
    void mergeUntil(std::int64_t until) noexcept;
    void addFront(LgQueue& queue, std::int64_t until) noexcept;
    void write(LgQueue& queue) noexcept;
    void reportLosses(LgQueue& queue, std::int64_t now) noexcept;

    LgSinkList _sinks;
    LgQueue* _queues = nullptr;
    std::int64_t _lastNow = 0;
    std::vector<Front> _fronts;  // a heap with the earliest on top
};

}  // namespace Orv

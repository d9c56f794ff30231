#include "assertions.h"
#include "mtTaskQueuePrivate.h"

namespace Orv {

MtTaskQueue::MtTaskQueue(std::size_t capacity) : _ring(capacity) {
    ORV_ASSERT(capacity > 0);
}

void MtTaskQueue::prepare() {
    const LkGuard guard(_mutex);
    _state = SHUT;
}

void MtTaskQueue::open() {
    const LkGuard guard(_mutex);
    if (_state == SHUT) _state = OPEN;
}

void MtTaskQueue::close() {
    const LkGuard guard(_mutex);
    _state = CLOSE;
    _notEmpty.broadcast();
    _notFull.broadcast();
}

MtTaskQueue::Result MtTaskQueue::tryPut(MtTask& task) {
    const LkGuard guard(_mutex);
    return putNoLock(task);
}

MtTaskQueue::Result MtTaskQueue::put(MtTask& task) {
    const LkGuard guard(_mutex);
    for (;;) {
        const Result result = putNoLock(task);
        if (result != FULL) return result;
        _notFull.wait(guard);
    }
}

MtTaskQueue::Result MtTaskQueue::putNoLock(MtTask& task) {
    if (_state != OPEN) return CLOSED;
    if (_nbTasks == _ring.size()) return FULL;
    _ring[(_first + _nbTasks) % _ring.size()] = std::move(task);
    ++_nbTasks;
    _notEmpty.signal();  // under the mutex: afterwards the queue may be gone
    return DONE;
}

bool MtTaskQueue::take(MtTask& task, const std::function<bool()>& isOver) {
    const LkGuard guard(_mutex);
    for (;;) {
        if (isOver && isOver()) {
            // The signal that woke this thread may have been meant for a task.
            if (_nbTasks > 0) _notEmpty.signal();
            return false;
        }
        if (_nbTasks > 0) break;
        if (_state == CLOSE) return false;
        _notEmpty.wait(guard);
    }
    task = std::move(_ring[_first]);
    _first = (_first + 1) % _ring.size();
    --_nbTasks;
    _notFull.signal();
    return true;
}

void MtTaskQueue::wakeTakers() {
    const LkGuard guard(_mutex);
    _notEmpty.broadcast();
}

std::size_t MtTaskQueue::getNbTasks() const {
    const LkGuard guard(_mutex);
    return _nbTasks;
}

}  // namespace Orv

#include "mtTaskPool.h"

#include <cxxabi.h>

#include "assertions.h"
#include "lgLog.h"
#include "mtEx.h"
#include "mtTaskQueuePrivate.h"

namespace Orv {

namespace {

std::uint64_t getTimelineId(const MtTask& task) noexcept {
    return reinterpret_cast<std::uintptr_t>(task.getWork().get());
}

/// Counts a worker that waits.
class Helper {
public:
    explicit Helper(std::atomic<unsigned>& count) : _count(count) { ++_count; }
    ~Helper() { --_count; }
    Helper(const Helper&) = delete;
    Helper& operator=(const Helper&) = delete;

private:
    std::atomic<unsigned>& _count;
};

}  // namespace

/// A task that a worker runs, perhaps in the midst of another one; done when this goes, however the
/// task ended.
class MtTaskPool::Running {
public:
    Running(MtTaskPool& pool, MtTask& task, unsigned worker)
        : _pool(pool), _task(task), _innermost(pool._innermost[worker]), _outer(_innermost) {
        _innermost = this;
    }
    ~Running() {
        _innermost = _outer;
        _pool.noteDone(_task);
    }
    Running(const Running&) = delete;
    Running& operator=(const Running&) = delete;

    const MtRequestTag& getTag() const noexcept { return _task.getTag(); }
    const Running* getOuter() const noexcept { return _outer; }

private:
    MtTaskPool& _pool;
    MtTask& _task;
    const Running*& _innermost;
    const Running* const _outer;
};

MtTaskPool::MtTaskPool(const LiString& name, unsigned nbThreads, std::size_t queueCapacity,
                       bool placeOnProcessors, unsigned stackSize)
    : MtThreadPool(name, nbThreads, placeOnProcessors, stackSize),
      _queue(std::make_unique<MtTaskQueue>(queueCapacity)),
      _innermost(nbThreads) {
    ORV_ASSERT(nbThreads > 0);
}

MtTaskPool::~MtTaskPool() {
    try {
        stop();
    } catch (...) {
        Assertions::traceCurrentException("destroying a task pool");
    }
}

void MtTaskPool::submit(MtTask task) {
    ORV_ASSERT(!task.isNull());
    const bool isCounted = !task.getTag().isNull();
    if (isCounted) _requests.incRequestCount(task.getTag());
    LgLog::beginAsync("task", getName().getText(), getTimelineId(task));
    const unsigned worker = findWorker();
    switch (worker == NO_WORKER ? _queue->put(task) : _queue->tryPut(task)) {
        case MtTaskQueue::DONE:
            return;
        case MtTaskQueue::FULL:
            return run(task, worker);
        case MtTaskQueue::CLOSED:
            break;
    }
    LgLog::endAsync("task", getName().getText(), getTimelineId(task));
    if (isCounted) _requests.decRequestCount(task.getTag());
    throw MtEx::ExPoolStopped(ORV_FILE, __LINE__, getName().getChars());
}

void MtTaskPool::wait(const MtRequestTag& tag) {
    if (const unsigned worker = findWorker(); worker != NO_WORKER) runWhileWaiting(tag, worker);
    _requests.waitRequestCountZero(tag);
}

void MtTaskPool::runWhileWaiting(const MtRequestTag& tag, unsigned worker) {
    ORV_ASSERT(!runsUnder(tag, worker));
    const auto isZero = [&] { return _requests.getRequestCount(tag) == 0; };
    const auto takeTask = [&](MtTask& task) {
        // Counted before isZero() asks: who brings the count to 0 after that sees the helper.
        const Helper helper(_nbHelpers);
        return _queue->take(task, isZero);
    };
    for (MtTask task; takeTask(task);) run(task, worker);
}

void MtTaskPool::run(MtTask& task, unsigned worker) {
    const Running running(*this, task, worker);
    try {
        task.run();
    } catch (abi::__forced_unwind&) {
        throw;  // somebody ends the thread with the C library's means
    } catch (...) {
        Assertions::traceCurrentException("running a task");
    }
}

void MtTaskPool::noteDone(MtTask& task) noexcept {
    try {
        const MtRequestTag tag = task.getTag();
        LgLog::endAsync("task", getName().getText(), getTimelineId(task));
        task = MtTask();
        if (tag.isNull()) return;
        _requests.decRequestCount(tag);
        if (_nbHelpers != 0) _queue->wakeTakers();
    } catch (...) {
        Assertions::traceCurrentException("counting a task as done");
    }
}

bool MtTaskPool::runsUnder(const MtRequestTag& tag, unsigned worker) const noexcept {
    const Running* running = _innermost[worker];
    while (running != nullptr && !(running->getTag() == tag)) running = running->getOuter();
    return running != nullptr && !tag.isNull();
}

std::size_t MtTaskPool::getNbQueued() const {
    return _queue->getNbTasks();
}

void MtTaskPool::performTask(unsigned worker) {
    MtTask task;
    while (_queue->take(task)) run(task, worker);  // until the queue is closed and empty
}

void MtTaskPool::stopThreads() {
    _queue->close();
}

void MtTaskPool::prepareThreads() {
    _queue->prepare();
}

void MtTaskPool::threadsStarted() {
    _queue->open();
}

}  // namespace Orv

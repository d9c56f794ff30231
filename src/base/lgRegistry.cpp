#include "lgRegistry.h"

#include <exception>
#include <thread>
#include <utility>

#include "assertions.h"
#include "lgClockPrivate.h"
#include "lgDrainLockPrivate.h"
#include "lgDrainPrivate.h"
#include "lgNative.h"
#include "lgTextSink.h"
#include "threadSlot.h"

namespace Orv {

using std::chrono::milliseconds;

/// A thread's part in the log.
struct LgRegistry::ThreadState {
    LgThread thread;
    LgQueue* queue = nullptr;  // null before the first record and after unregisterThread()

    static void end(void* state) noexcept;
};

struct LgRegistry::Parts {
    LgDrainLock lock;
    LgDrain drain ORV_GUARDED_BY(lock);
    LgWakeup wakeup;
    ThreadSlot threadSlot{ThreadSlot::LOG, ThreadState::end};
    const std::shared_ptr<LgSink> standardError = std::make_shared<LgStandardErrorSink>();

    LgDrain::Result drainOnce(LgRegistry& registry) noexcept ORV_REQUIRES(lock);
};

std::atomic<bool> LgRegistry::_isTimelineOn{false};

namespace {

/// How often a thread that logs empties the queues again for what others have logged meanwhile,
/// before it leaves that to the next thread that logs.
constexpr int MOST_ROUNDS = 8;

constexpr milliseconds LONGEST_FLUSH(1000);
constexpr milliseconds LONGEST_FLUSH_AT_EXIT(250);  // for a reader that is at the last lines
constexpr milliseconds READER_PATIENCE(100);

}  // namespace

LgRegistry& LgRegistry::getInstance() {
    static auto* const registry = new LgRegistry;
    return *registry;
}

LgRegistry::LgRegistry() : _parts(std::make_unique<Parts>()) {
    _parts->lock.lock();
    _parts->drain.getSinks().add(_parts->standardError);
    _parts->lock.unlock();
    LgSystem::callAtExit([] { getInstance().drainAtExit(); });
}

// The calling thread

LgThread LgRegistry::makeThread() {
    return {.number = _nbThreads.fetch_add(1, std::memory_order_relaxed) + 1,
            .osId = LgSystem::getThreadId()};
}

/// The calling thread's state, made at first; null when the thread's end has been noticed.
LgRegistry::ThreadState* LgRegistry::getState() {
    if (void* const value = _parts->threadSlot.get()) return static_cast<ThreadState*>(value);
    if (ThreadSlot::hasEnded()) return nullptr;
    auto state = std::make_unique<ThreadState>(ThreadState{.thread = makeThread()});
    _parts->threadSlot.set(state.get());
    return state.release();
}

void LgRegistry::ThreadState::end(void* state) noexcept {
    const std::unique_ptr<ThreadState> ended(static_cast<ThreadState*>(state));
    if (ended->queue != nullptr) getInstance().abandon(*ended->queue);
}

void LgRegistry::registerThread(std::string_view name) {
    ThreadState* const state = getState();
    if (state == nullptr) return;
    state->thread.name = name;
    if (state->queue == nullptr) {
        state->queue = new LgQueue(state->thread);
    } else if (!state->queue->_isPublished) {
        state->queue->renameThread(name);
    } else {
        log({.kind = LgRecord::Kind::THREAD_NAME, .text = name});
    }
}

void LgRegistry::unregisterThread() noexcept {
    void* const value = _parts->threadSlot.get();
    if (value == nullptr) return;
    LgQueue* const queue = std::exchange(static_cast<ThreadState*>(value)->queue, nullptr);
    if (queue != nullptr) abandon(*queue);
}

void LgRegistry::log(const LgRecord& record) noexcept {
    if (_parts->lock.isHeldByCaller()) return;
    try {
        if (ThreadState* const state = getState()) {
            if (state->queue == nullptr) state->queue = new LgQueue(state->thread);
            push(*state->queue, record);
            announce();
        } else {  // nothing would notice that the thread has left a queue behind
            const auto queue = new LgQueue(makeThread());
            push(*queue, record);
            abandon(*queue);
        }
    } catch (...) {
        // No memory for a queue: the record is lost.
    }
}

void LgRegistry::push(LgQueue& queue, const LgRecord& record) noexcept {
    if (!queue._isPublished) publish(queue);
    queue.push(record);
}

void LgRegistry::publish(LgQueue& queue) noexcept {
    queue._isPublished = true;
    _nbQueues.fetch_add(1, std::memory_order_relaxed);
    queue._next = _newQueues.load(std::memory_order_relaxed);
    while (!_newQueues.compare_exchange_weak(queue._next, &queue, std::memory_order_seq_cst)) {
    }
}

void LgRegistry::abandon(LgQueue& queue) noexcept {
    if (!queue._isPublished) {
        delete &queue;  // nobody else has ever known it
        return;
    }
    queue.creatorExits();
    announce();
}

// Emptying the queues. Whoever queues a record announces it afterwards; whoever empties the queues
// takes the announcement back beforehand and looks for a new one after releasing the lock. So a
// thread that finds the announcement made, or the lock taken, may go its way.

void LgRegistry::announce() noexcept {
    const bool isExiting = _isExiting.load(std::memory_order_relaxed);
    if (_isPending.load(std::memory_order_seq_cst) && !isExiting) return;
    _isPending.store(true, std::memory_order_seq_cst);
    if (_hasReader.load(std::memory_order_seq_cst) && !isExiting) {
        if (_isReaderAsleep.load(std::memory_order_seq_cst)) _parts->wakeup.wake();
    } else {
        drainPending();
    }
}

void LgRegistry::drainPending() noexcept {
    for (int round = 0; _isPending.load(std::memory_order_seq_cst); ++round) {
        if (round == MOST_ROUNDS) {
            handOver();
            return;
        }
        if (!_parts->lock.tryLock()) return;
        _parts->drainOnce(*this);
        _parts->lock.unlock();
    }
}

/// Leaves what is queued to the next thread that logs or to a reader that has come meanwhile.
void LgRegistry::handOver() noexcept {
    _isPending.store(false, std::memory_order_seq_cst);
    if (!_hasReader.load(std::memory_order_seq_cst)) return;
    _isPending.store(true, std::memory_order_seq_cst);
    _parts->wakeup.wake();
}

LgDrain::Result LgRegistry::Parts::drainOnce(LgRegistry& registry) noexcept {
    registry._isPending.store(false, std::memory_order_seq_cst);
    LgDrain::Result result;
    try {
        const std::int64_t now = LgClock::now();
        result = drain.pass(now, registry._newQueues.exchange(nullptr, std::memory_order_seq_cst));
        registry._nbQueues.fetch_sub(result.nbRemoved, std::memory_order_relaxed);
    } catch (...) {
        // Out of memory: everything stays queued, and the caller learns that nothing was written.
    }
    return result;
}

bool LgRegistry::flush() noexcept {
    return flushWithin(LONGEST_FLUSH);
}

bool LgRegistry::flushWithin(milliseconds limit) noexcept {
    if (_parts->lock.isHeldByCaller()) return false;
    const std::int64_t start = LgClock::now();
    const std::int64_t end = start + std::chrono::nanoseconds(limit).count();
    while (_parts->lock.lockWithin(limit)) {
        const LgDrain::Result result = _parts->drainOnce(*this);
        _parts->lock.unlock();
        drainPending();
        if (result.writtenUntil >= start) return true;
        if (LgClock::now() >= end) return false;
        std::this_thread::sleep_for(milliseconds(1));  // a thread is in the middle of logging
    }
    drainPending();
    return false;
}

void LgRegistry::drainAtExit() noexcept {
    const bool isFirst = !_isExiting.exchange(true, std::memory_order_relaxed);
    flushWithin(isFirst ? LONGEST_FLUSH_AT_EXIT : milliseconds(0));
}

// Sinks

/// Runs the action on the list of sinks while no sink is being called.
template <class Action>
void LgRegistry::changeSinks(Action action) {
    ORV_ASSERT_TEXT(!_parts->lock.isHeldByCaller(), "no sink calls this");
    _parts->lock.lock();
    std::exception_ptr error;
    try {
        action(_parts->drain.getSinks());
    } catch (...) {
        error = std::current_exception();
    }
    _isTimelineOn.store(_parts->drain.getSinks().wantTimeline(), std::memory_order_relaxed);
    _parts->lock.unlock();
    drainPending();
    if (error) std::rethrow_exception(error);
}

void LgRegistry::addSink(std::shared_ptr<LgSink> sink) {
    ORV_ASSERT(sink != nullptr);
    changeSinks([&](LgSinkList& sinks) { sinks.add(std::move(sink)); });
}

bool LgRegistry::removeSink(const LgSink& sink) {
    flush();
    std::shared_ptr<LgSink> removed;  // goes when the lock is free again, since it may log
    changeSinks([&](LgSinkList& sinks) { removed = sinks.remove(sink); });
    return removed != nullptr;
}

void LgRegistry::setStandardErrorOn(bool isOn) {
    flush();
    changeSinks([&](LgSinkList& sinks) {
        sinks.remove(*_parts->standardError);
        if (isOn) sinks.add(_parts->standardError);
    });
}

std::size_t LgRegistry::getNbQueues() const noexcept {
    return _nbQueues.load(std::memory_order_relaxed);
}

// For the reader

bool LgRegistry::startReader() noexcept {
    return !_hasReader.exchange(true, std::memory_order_seq_cst);
}

void LgRegistry::stopReader() noexcept {
    _hasReader.store(false, std::memory_order_seq_cst);
    flush();
    drainPending();  // what was announced to the reader when it had already looked
}

/// @return whether everything was written.
bool LgRegistry::drainForReader() noexcept {
    if (!_parts->lock.lockWithin(READER_PATIENCE)) return false;
    const LgDrain::Result result = _parts->drainOnce(*this);
    _parts->lock.unlock();
    return result.isEmptied;
}

void LgRegistry::sleepUntilLogged(const std::atomic<bool>& isStopped) noexcept {
    _isReaderAsleep.store(true, std::memory_order_seq_cst);
    const bool hasWork =
        _isPending.load(std::memory_order_seq_cst) || isStopped.load(std::memory_order_seq_cst);
    if (!hasWork) _parts->wakeup.wait();
    _isReaderAsleep.store(false, std::memory_order_seq_cst);
}

void LgRegistry::wakeReader() noexcept {
    _parts->wakeup.wake();
}

}  // namespace Orv

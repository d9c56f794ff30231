#pragma once

#include <atomic>
#include <chrono>
#include <cstddef>
#include <memory>
#include <string_view>

#include "baseApi.h"
#include "lgRecord.h"

namespace Orv {

class LgQueue;
class LgSink;

/// The log of the process: a queue for each thread that logs, and the sinks they are written to.
///
/// A thread gets its queue with its first record, which then goes in without a lock. An LgReader
/// writes the queues out in time order; without one, the thread that has logged does, unless
/// another is at it. When the process exits, what is still queued is written. To log, see LgLog and
/// ORV_TRACE. At first the only sink is standard error.
///
/// - Threads: every member may be called by any thread, before main() and after it, under any lock.
/// - Memory: a thread's queue goes once the thread has ended and the queue is written out.
class ORV_BASE_API LgRegistry {
public:
    static LgRegistry& getInstance();

    // The calling thread

    /// Names the thread in the log; again: renames it. Threads that are not registered log, too.
    void registerThread(std::string_view name);

    /// Tells the thread's queue that its creator exits, ahead of the end that the log notices by
    /// itself. The thread may still log; it then keeps its name and gets a new queue.
    void unregisterThread() noexcept;

    /// Queues the record, or drops it, as LgQueue::push() does. Drops what a sink logs.
    void log(const LgRecord& record) noexcept;

    // Sinks: not to be called by a sink

    /// From now on the sink gets what is written. May wait for a sink that is writing.
    void addSink(std::shared_ptr<LgSink> sink);

    /// Writes what was logged so far, then lets the sink go. May wait for a sink that is writing.
    /// @return whether it was there.
    bool removeSink(const LgSink& sink);

    void setStandardErrorOn(bool isOn);

    /// Writes what was logged before the call; for instance ahead of an abort.
    /// @return false if a sink kept another thread busy for a second, or when called by a sink.
    bool flush() noexcept;

    std::size_t getNbQueues() const noexcept;  ///< Queues of threads that have logged.

    static bool isTimelineOn() noexcept { return _isTimelineOn.load(std::memory_order_relaxed); }

private:
    friend class LgReader;
    struct Parts;
    struct ThreadState;

    LgRegistry();
    ~LgRegistry() = delete;  // lives as long as the process

    LgThread makeThread();
    ThreadState* getState();
    void push(LgQueue& queue, const LgRecord& record) noexcept;
    void publish(LgQueue& queue) noexcept;
    void abandon(LgQueue& queue) noexcept;
    void announce() noexcept;
    void drainPending() noexcept;
    void handOver() noexcept;
    bool flushWithin(std::chrono::milliseconds limit) noexcept;
    void drainAtExit() noexcept;

    template <class Action>
    void changeSinks(Action action);

    // For the reader
    bool startReader() noexcept;
    void stopReader() noexcept;
    bool drainForReader() noexcept;
    void sleepUntilLogged(const std::atomic<bool>& isStopped) noexcept;
    void wakeReader() noexcept;

    static std::atomic<bool> _isTimelineOn;

    std::atomic<LgQueue*> _newQueues{nullptr};  // a stack that only the draining thread takes from
    std::atomic<bool> _isPending{false};  // something was logged since the queues were looked at
    std::atomic<bool> _hasReader{false};
    std::atomic<bool> _isReaderAsleep{false};
    std::atomic<bool> _isExiting{false};  // the reader may be gone
    std::atomic<std::size_t> _nbQueues{0};
    std::atomic<std::uint64_t> _nbThreads{0};
    const std::unique_ptr<Parts> _parts;
};

}  // namespace Orv

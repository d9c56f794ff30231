#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>

#include "lgRecord.h"

namespace Orv {

/// The records that one thread has logged and nobody has written yet: a ring without a lock.
///
/// A full queue drops the newest record and counts it. Texts up to 128 bytes stand in the ring,
/// longer ones on the heap.
///
/// - Threads: the creator's members for the one thread that logs, the reader's members for one
///   thread at a time. Neither ever waits for the other.
/// - Memory: about 100 KiB, taken with the first record.
class ORV_BASE_API LgQueue {
public:
    static constexpr std::size_t CAPACITY = 512;

    /// @param capacity  in records, a power of two.
    explicit LgQueue(LgThread creator, std::size_t capacity = CAPACITY);
    ~LgQueue();

    LgQueue(const LgQueue&) = delete;
    LgQueue& operator=(const LgQueue&) = delete;

    // The creator's members

    /// Stamps a copy of the record with the time and queues it.
    /// @return false if it was dropped, for want of room or memory.
    bool push(const LgRecord& record) noexcept;

    /// The creator's last call: nothing is pushed after it.
    void creatorExits() noexcept { _isAbandoned.store(true, std::memory_order_release); }

    // The reader's members

    /// Looks how far the creator has come; front() then goes up to there.
    /// @param now  the monotonic time, read before this call.
    /// @return every record that this queue does not show yet is later than this.
    std::int64_t observe(std::int64_t now) noexcept;

    const LgRecord* front() const noexcept;  ///< The oldest record; null at the end.
    void pop() noexcept;                     ///< Removes the oldest record.

    /// Records dropped since the last call and before observe(). 0 while there are any to read, so
    /// that the loss is reported behind what was logged before it.
    std::uint64_t takeNbLost() noexcept;

    bool isFinished() const noexcept;  ///< Empty, and the creator had exited when observed.

    const LgThread& getThread() const noexcept { return _thread; }
    void renameThread(std::string_view name) { _thread.name = name; }

private:
    friend class LgRegistry;
    friend class LgDrain;
    struct Slot;

    bool prepare(std::string_view text, std::uint64_t tail,
                 std::unique_ptr<char[]>& longText) noexcept;
    bool isFull(std::uint64_t tail) noexcept;
    Slot& slotAt(std::uint64_t position) const noexcept;

    // Twice the number of records pushed, plus one while the creator is at the next one.
    alignas(64) std::atomic<std::uint64_t> _progress{0};
    std::atomic<std::uint64_t> _nbLost{0};
    std::atomic<bool> _isAbandoned{false};
    std::uint64_t _knownHead = 0;  // the creator's latest look at _head
    Slot* _slots = nullptr;        // null before the first push
    bool _isPublished = false;     // the creator's: the log knows this queue
    const std::size_t _capacity;

    alignas(64) std::atomic<std::uint64_t> _head{0};  // number of records popped
    std::uint64_t _observedProgress = 0;
    std::uint64_t _nbObservedLost = 0;
    std::uint64_t _nbReportedLost = 0;
    std::int64_t _observedAt = 0;  // when observe() was called last
    std::int64_t _quietUntil = 0;  // what observe() has returned
    std::int64_t _pushSeenAt = 0;  // when the record being made was seen first
    bool _isFinalView = false;     // the creator had exited before the last observe()
    LgThread _thread;
    LgQueue* _next = nullptr;  // in the log's list
};

}  // namespace Orv

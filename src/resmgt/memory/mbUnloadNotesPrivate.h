#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <exception>

#include "daBookAllocatorPrivate.h"

namespace Orv {

class MbBufferImp;
class MbUnloadStrategy;

/// What buffers have told their pool about being unloadable and the strategy does not know yet.
///
/// Buffers are locked and unlocked all the time, victims are sought now and then. So a lock takes
/// no lock of the pool: it stamps the buffer, and puts it on a list unless it is there already. The
/// list is applied to the strategy, in the order of the stamps, when the strategy is to be used.
///
/// - Threads: note() by the thread that holds the buffer's mutex; all else under the pool's.
class MbUnloadNotes {
public:
    MbUnloadNotes() = default;
    ~MbUnloadNotes();

    MbUnloadNotes(const MbUnloadNotes&) = delete;
    MbUnloadNotes& operator=(const MbUnloadNotes&) = delete;

    void note(MbBufferImp& buffer, bool isUnloadable) noexcept;

    /// Makes room for the notes of so many buffers.
    void reserve(std::size_t nbBuffers) { _batch.reserve(nbBuffers); }

    /// Tells the strategy all that is noted. What it refuses by throwing stays noted.
    /// @return the latest of its exceptions, or null.
    std::exception_ptr applyTo(MbUnloadStrategy& strategy) noexcept;

    /// Takes a buffer out of the strategy, if it is in.
    static void withdraw(MbUnloadStrategy& strategy, MbBufferImp& buffer) noexcept;

private:
    struct Note {
        std::uint64_t since;  // 0: not unloadable
        MbBufferImp* buffer;
    };

    std::atomic<MbBufferImp*> _first{nullptr};
    DaBookVector<Note> _batch;  // empty but in applyTo(); has room for all buffers

    void push(MbBufferImp& buffer) noexcept;
    void takeAll() noexcept;
};

}  // namespace Orv

#pragma once

#include <atomic>
#include <cstdint>

namespace Orv {

class MbBufferImp;

/// What an MbPoolManager keeps about a buffer, in the buffer. Nobody else touches it.
struct MbPoolEntry {
    // See MbUnloadNotes
    std::atomic<std::uint64_t> unloadableSince{0};  ///< 0: it is not unloadable.
    std::atomic<bool> isNoted{false};
    MbBufferImp* nextNoted = nullptr;
    std::uint64_t insertedSince = 0;  ///< What the strategy knows; 0: not inserted.

    // The pool's list of its buffers
    MbBufferImp* previous = nullptr;
    MbBufferImp* next = nullptr;
};

}  // namespace Orv

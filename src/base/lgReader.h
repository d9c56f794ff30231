#pragma once

#include <atomic>

#include "baseApi.h"

namespace Orv {

/// Writes what all threads log, in time order, on the thread that runs it.
///
/// While a reader runs, no thread that logs waits for a sink. It sleeps while nothing is logged.
///
/// - Threads: run() on one thread, stop() by any; destroy it when run() has returned.
class ORV_BASE_API LgReader {
public:
    LgReader() = default;

    LgReader(const LgReader&) = delete;
    LgReader& operator=(const LgReader&) = delete;

    /// Works until stop(); then what was logged before has been written. One reader runs at a time
    /// in a process.
    void run();

    /// Makes run() return, also one that begins later. Does not wait.
    void stop() noexcept;

private:
    std::atomic<bool> _isStopped{false};
};

}  // namespace Orv

#pragma once

#include <chrono>
#include <condition_variable>
#include <gtest/gtest.h>
#include <mutex>

#include "testLimits.h"

namespace Orv {

/// Counts what threads have reached and lets others wait for it: orders threads without sleeping.
///
/// A wait that does not end in time is a test failure and returns false, so that the test goes on
/// to its end instead of hanging.
class TestCounter {
public:
    void add(int n = 1) {
        // Notified under the lock: who was waiting may destroy the counter at once.
        const std::lock_guard guard(_mutex);
        _count += n;
        _changed.notify_all();
    }

    int get() const {
        const std::lock_guard guard(_mutex);
        return _count;
    }

    /// Waits until the count is @p n or more.
    bool waitFor(int n) const {
        std::unique_lock lock(_mutex);
        const std::chrono::duration<double> limit(getWaitLimitSeconds());
        if (_changed.wait_for(lock, limit, [&] { return _count >= n; })) return true;
        ADD_FAILURE() << "waited in vain for " << n << "; came to " << _count;
        return false;
    }

private:
    mutable std::mutex _mutex;
    mutable std::condition_variable _changed;
    int _count = 0;
};

/// A gate that opens once, for all who wait and all who come later.
class Gate {
public:
    void open() { _opened.add(); }
    bool isOpen() const { return _opened.get() > 0; }
    bool wait() const { return _opened.waitFor(1); }  ///< False, and a failure, after the limit.

private:
    TestCounter _opened;
};

}  // namespace Orv

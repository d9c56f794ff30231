#pragma once

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>

namespace Orv {

/// Ends the test program when a test runs longer than its limit: names the test, shows what every
/// thread waits for, exits with an error. The way out after the last test is watched as well, and
/// the program of a death test as a whole.
class TestWatchdog {
public:
    /// Starts to watch the tests of this program, until the process ends. Call it after GoogleTest
    /// has read the arguments.
    static void install();

    /// From now on waits for @p what to come to its end: for the next call.
    void watch(const std::string& what);

private:
    using Clock = std::chrono::steady_clock;

    std::mutex _mutex;
    std::condition_variable _changed;
    std::string _watched;
    Clock::time_point _deadline;
    double _limitSeconds = 0;

    [[noreturn]] void run();
    [[noreturn]] void strike() const;
};

}  // namespace Orv

#pragma once

#include <cstdint>
#include <mutex>

#include "baseApi.h"
#include "dtTimeMark.h"
#include "wakeableSleeper.h"

namespace Orv {

/// Ticks at a steady rate: the n-th tick is due n intervals after the start, by the monotonic
/// clock, so that neither the work between ticks nor a late wake-up lets the rate drift.
///
/// Ticks that pass while nobody waits are late, not lost: the next wait() returns at once with the
/// number of the latest one. The rate is kept on Windows with a high-resolution timer where the
/// system has one.
///
/// - Threads: one thread waits; every other member may be called by any thread. Destroy it only
///   when nobody waits.
class ORV_BASE_API PeriodicTimer {
public:
    static constexpr double SHORTEST_SECONDS = 1e-6;

    /// The timer stands still until start().
    /// @param intervalSeconds  finite and at least SHORTEST_SECONDS, else an assertion.
    explicit PeriodicTimer(double intervalSeconds);

    PeriodicTimer(const PeriodicTimer&) = delete;
    PeriodicTimer& operator=(const PeriodicTimer&) = delete;

    void start();  ///< Counts from 0: the first tick is due one interval from now.
    void stop();   ///< Ends a wait under way, and those to come until the next start().

    /// Blocks until a tick is due that was not told yet.
    /// @return how many ticks were due since the start, at least 1; 0 if the timer stands still.
    std::uint64_t wait();

    /// Changes the rate, for a wait under way, too: the next tick is due one new interval after
    /// the last one that was due, or at once where that is past.
    /// @return the interval before, in seconds.
    double setInterval(double intervalSeconds);

    double getInterval() const;            ///< In seconds.
    std::uint64_t getNbLateTicks() const;  ///< Ticks since the start that a later one overtook.

private:
    mutable std::mutex _lock;
    double _interval;  // seconds
    bool _isRunning = false;
    DtTimeMark _base;  // when the tick numbered _baseTicks was due
    std::uint64_t _baseTicks = 0;
    std::uint64_t _toldTicks = 0;
    std::uint64_t _lateTicks = 0;
    WakeableSleeper _sleeper;

    DtTimeMark deadlineOf(std::uint64_t tick) const noexcept;
    std::uint64_t findDueTick(const DtTimeMark& now) const noexcept;
};

}  // namespace Orv

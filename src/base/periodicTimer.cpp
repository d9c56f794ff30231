#include "periodicTimer.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include "assertions.h"

namespace Orv {

namespace {

double checkInterval(double intervalSeconds) {
    ORV_ASSERT(std::isfinite(intervalSeconds) &&
               intervalSeconds >= PeriodicTimer::SHORTEST_SECONDS);
    return intervalSeconds;
}

}  // namespace

PeriodicTimer::PeriodicTimer(double intervalSeconds) : _interval(checkInterval(intervalSeconds)) {}

void PeriodicTimer::start() {
    const std::lock_guard guard(_lock);
    _base = DtTimeMark::now();
    _baseTicks = _toldTicks = _lateTicks = 0;
    _isRunning = true;
    _sleeper.wake();
}

void PeriodicTimer::stop() {
    const std::lock_guard guard(_lock);
    _isRunning = false;
    _sleeper.wake();
}

std::uint64_t PeriodicTimer::wait() {
    std::unique_lock lock(_lock);
    while (_isRunning) {
        const std::uint64_t due = findDueTick(DtTimeMark::now());
        if (due > _toldTicks) {
            _lateTicks += due - _toldTicks - 1;
            return _toldTicks = due;
        }
        const DtTimeMark deadline = deadlineOf(_toldTicks + 1);
        lock.unlock();
        _sleeper.sleepUntil(deadline);
        lock.lock();
    }
    return 0;
}

double PeriodicTimer::setInterval(double intervalSeconds) {
    checkInterval(intervalSeconds);
    const std::lock_guard guard(_lock);
    if (_isRunning) {
        const DtTimeMark now = DtTimeMark::now();
        const std::uint64_t due = findDueTick(now);
        // A tick long ago must not make many of the new, shorter intervals due.
        _base = std::max(deadlineOf(due), now - intervalSeconds);
        _baseTicks = due;
    }
    const double before = std::exchange(_interval, intervalSeconds);
    _sleeper.wake();
    return before;
}

double PeriodicTimer::getInterval() const {
    const std::lock_guard guard(_lock);
    return _interval;
}

std::uint64_t PeriodicTimer::getNbLateTicks() const {
    const std::lock_guard guard(_lock);
    return _lateTicks;
}

/// Each deadline is computed from the start, so that rounding does not add up.
DtTimeMark PeriodicTimer::deadlineOf(std::uint64_t tick) const noexcept {
    return _base + static_cast<double>(tick - _baseTicks) * _interval;
}

/// The last tick whose deadline has come.
std::uint64_t PeriodicTimer::findDueTick(const DtTimeMark& now) const noexcept {
    const double nbIntervals = std::floor((now - _base) / _interval);
    std::uint64_t tick = _baseTicks + static_cast<std::uint64_t>(std::max(nbIntervals, 0.0));
    // The quotient may be off by the rounding of a deadline to its nanosecond.
    while (tick > _baseTicks && deadlineOf(tick) > now) --tick;
    while (deadlineOf(tick + 1) <= now) ++tick;
    return tick;
}

}  // namespace Orv

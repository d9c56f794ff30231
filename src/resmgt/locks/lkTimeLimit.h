#pragma once

#include <chrono>
#include <cstdint>

#include "resmgtApi.h"

namespace Orv {

/// When a wait gives up: the limit of a whole call, however often the call wakes in between.
///
/// It runs on the monotonic clock, so setting the wall clock moves no limit.
///
/// - Threads: a value.
class ORV_RESMGT_API LkTimeLimit {
public:
    using Clock = std::chrono::steady_clock;

    /// A count of milliseconds that stands for "without limit".
    static constexpr std::uint32_t INFINITE_MILLISECONDS = 0xFFFFFFFFU;
    /// The longest finite limit, about 49.7 days.
    static constexpr std::uint32_t LONGEST_MILLISECONDS = INFINITE_MILLISECONDS - 1;

    LkTimeLimit() noexcept = default;  ///< Never gives up.

    /// Gives up after @p seconds from now. Negative seconds and NaN are 0, which looks once; more
    /// than the longest finite limit is cut to it and never becomes the infinite one.
    explicit LkTimeLimit(double seconds) noexcept : LkTimeLimit(toMilliseconds(seconds)) {}

    /// Whole milliseconds, rounded half up, cut as above.
    static std::uint32_t toMilliseconds(double seconds) noexcept;

    bool isInfinite() const noexcept { return _milliseconds == INFINITE_MILLISECONDS; }
    bool isZero() const noexcept { return _milliseconds == 0; }

    /// Rounded up, so that a wait of this length does not end early; 0 once the time has run out.
    std::uint32_t getRemainingMilliseconds() const noexcept;

    Clock::time_point getDeadline() const noexcept { return _deadline; }  ///< If not infinite.

private:
    std::uint32_t _milliseconds = INFINITE_MILLISECONDS;
    Clock::time_point _deadline;

    explicit LkTimeLimit(std::uint32_t milliseconds) noexcept;
};

}  // namespace Orv

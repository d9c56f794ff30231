#pragma once

#include <compare>
#include <cstdint>

#include "baseApi.h"

namespace Orv {

/// A length of time, or a place on a line of time that starts at zero, to the nanosecond.
///
/// Which line is meant is up to the interface that takes it. A moment of the running clock is a
/// DtTimeMark, a date an OsDateTypes::DateRep, a place in a stream of frames a DtTimeIndex.
///
/// - Range: 292 years in both directions; sums beyond it stop at its ends.
class ORV_BASE_API DtTime {
public:
    constexpr DtTime() noexcept = default;

    /// Rounds to the nanosecond; NaN is no time at all.
    explicit DtTime(double seconds) noexcept;
    static constexpr DtTime fromNanoseconds(std::int64_t nanoseconds) noexcept {
        DtTime time;
        time._nanoseconds = nanoseconds;
        return time;
    }

    constexpr double getSeconds() const noexcept {
        return static_cast<double>(_nanoseconds) * 1e-9;
    }
    constexpr std::int64_t getNanoseconds() const noexcept { return _nanoseconds; }

    DtTime& operator+=(const DtTime& other) noexcept;
    DtTime& operator-=(const DtTime& other) noexcept;
    DtTime operator-() const noexcept { return DtTime() -= *this; }

    friend DtTime operator+(DtTime a, const DtTime& b) noexcept { return a += b; }
    friend DtTime operator-(DtTime a, const DtTime& b) noexcept { return a -= b; }
    friend constexpr auto operator<=>(const DtTime&, const DtTime&) noexcept = default;

private:
    std::int64_t _nanoseconds = 0;
};

}  // namespace Orv

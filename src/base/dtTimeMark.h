#pragma once

#include <compare>
#include <cstdint>

#include "baseApi.h"

namespace Orv {

/// A moment on the monotonic clock, to the nanosecond: it never jumps, and it differs from process
/// to process and from start to start.
///
/// Deadlines and measurements are marks; for the date see OsDateUtil, and DtRefTime for the way
/// from one to the other.
///
/// - Range: 292 years from the clock's start; sums beyond it stop at its end.
class ORV_BASE_API DtTimeMark {
public:
    /// The zero mark, which lies before every reading of the clock.
    constexpr DtTimeMark() noexcept = default;

    static DtTimeMark now() noexcept;
    static constexpr DtTimeMark fromNanoseconds(std::int64_t nanoseconds) noexcept {
        return DtTimeMark(nanoseconds);
    }

    constexpr bool isZero() const noexcept { return _nanoseconds == 0; }
    constexpr std::int64_t getNanoseconds() const noexcept { return _nanoseconds; }

    /// Nanoseconds from @p earlier to here, negative if that is later; stops at the range's ends.
    std::int64_t getNanosecondsSince(const DtTimeMark& earlier) const noexcept;

    /// Moves the mark, rounded to the nanosecond; NaN moves it by nothing.
    DtTimeMark& operator+=(double seconds) noexcept;
    DtTimeMark& operator-=(double seconds) noexcept { return *this += -seconds; }

    friend DtTimeMark operator+(DtTimeMark mark, double seconds) noexcept {
        return mark += seconds;
    }
    friend DtTimeMark operator-(DtTimeMark mark, double seconds) noexcept {
        return mark -= seconds;
    }

    /// Seconds from @p earlier to @p later.
    friend double operator-(const DtTimeMark& later, const DtTimeMark& earlier) noexcept {
        return static_cast<double>(later.getNanosecondsSince(earlier)) * 1e-9;
    }

    friend constexpr auto operator<=>(const DtTimeMark&, const DtTimeMark&) noexcept = default;

private:
    std::int64_t _nanoseconds = 0;

    explicit constexpr DtTimeMark(std::int64_t nanoseconds) noexcept : _nanoseconds(nanoseconds) {}
};

}  // namespace Orv

#pragma once

#include <compare>
#include <cstdint>
#include <iosfwd>

#include "baseApi.h"

namespace Orv {

/// A number of frames, or the frame of that number; negative ones lie before the start.
///
/// Counts beyond 64 bits are an assertion ("frame count in range"), with nothing changed.
class ORV_BASE_API DtTimeIndex {
public:
    constexpr DtTimeIndex() noexcept = default;
    constexpr DtTimeIndex(std::int64_t frames) noexcept : _frames(frames) {}

    constexpr std::int64_t getFrames() const noexcept { return _frames; }

    DtTimeIndex& operator+=(const DtTimeIndex& other);
    DtTimeIndex& operator-=(const DtTimeIndex& other);
    DtTimeIndex& operator++() { return *this += 1; }
    DtTimeIndex& operator--() { return *this -= 1; }

    friend DtTimeIndex operator+(DtTimeIndex a, const DtTimeIndex& b) { return a += b; }
    friend DtTimeIndex operator-(DtTimeIndex a, const DtTimeIndex& b) { return a -= b; }
    friend constexpr auto operator<=>(const DtTimeIndex&, const DtTimeIndex&) noexcept = default;

private:
    std::int64_t _frames = 0;
};

ORV_BASE_API std::ostream& operator<<(std::ostream&, const DtTimeIndex&);

}  // namespace Orv

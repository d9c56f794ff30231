#include "lkTimeLimit.h"

namespace Orv {

LkTimeLimit::LkTimeLimit(std::uint32_t milliseconds) noexcept : _milliseconds(milliseconds) {
    if (!isZero()) _deadline = Clock::now() + std::chrono::milliseconds(milliseconds);
}

std::uint32_t LkTimeLimit::toMilliseconds(double seconds) noexcept {
    if (!(seconds > 0)) return 0;  // NaN as well
    const double milliseconds = seconds * 1000 + 0.5;
    if (milliseconds >= LONGEST_MILLISECONDS) return LONGEST_MILLISECONDS;
    return static_cast<std::uint32_t>(milliseconds);
}

std::uint32_t LkTimeLimit::getRemainingMilliseconds() const noexcept {
    if (isInfinite()) return INFINITE_MILLISECONDS;
    if (isZero()) return 0;
    const auto remaining =
        std::chrono::ceil<std::chrono::milliseconds>(_deadline - Clock::now()).count();
    return remaining > 0 ? static_cast<std::uint32_t>(remaining) : 0;
}

}  // namespace Orv

#pragma once

#include <cmath>
#include <cstdint>
#include <limits>

namespace Orv {

/// Arithmetic on 64-bit counts that stops at the ends of their range instead of overflowing.
class Saturate {
public:
    static constexpr std::int64_t MAX = std::numeric_limits<std::int64_t>::max();
    static constexpr std::int64_t MIN = std::numeric_limits<std::int64_t>::min();

    static constexpr std::int64_t add(std::int64_t a, std::int64_t b) noexcept {
        std::int64_t sum = 0;
        return __builtin_add_overflow(a, b, &sum) ? (b < 0 ? MIN : MAX) : sum;
    }

    static constexpr std::int64_t subtract(std::int64_t a, std::int64_t b) noexcept {
        std::int64_t difference = 0;
        return __builtin_sub_overflow(a, b, &difference) ? (b < 0 ? MAX : MIN) : difference;
    }

    static constexpr std::int64_t multiply(std::int64_t a, std::int64_t b) noexcept {
        std::int64_t product = 0;
        return __builtin_mul_overflow(a, b, &product) ? ((a < 0) == (b < 0) ? MAX : MIN) : product;
    }

    /// Adds the count nearest to @p value, halves away from zero; NaN adds nothing.
    static std::int64_t addRounded(std::int64_t count, double value) noexcept {
        if (std::isnan(value)) return count;
        if (value >= 0x1p63) return MAX;
        if (value < -0x1p63) return MIN;
        return add(count, std::llround(value));
    }
};

}  // namespace Orv

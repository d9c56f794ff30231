#pragma once

#include <array>
#include <cstdint>

#include "baseApi.h"

namespace Orv {

/// Uniform random numbers; defined for double.
template <class T>
class RnNumRecUniformRng;

/// Seeded uniform generator over [0, 1): one seed gives one sequence, on every platform.
///
/// xoshiro256** of Blackman and Vigna (doi 10.1145/3460772), of period 2^256 - 1, its state filled
/// by SplitMix64; each number has 53 random bits. Not for secrets: the sequence can be guessed.
///
/// - Threads: one generator is used by one thread at a time.
template <>
class ORV_BASE_API RnNumRecUniformRng<double> {
public:
    static constexpr std::uint64_t DEFAULT_SEED = 1;

    explicit RnNumRecUniformRng(std::uint64_t seed = DEFAULT_SEED) noexcept { setSeed(seed); }

    void setSeed(std::uint64_t seed) noexcept;  ///< Starts the sequence of @p seed.

    double next() noexcept;  ///< At least 0 and below 1, a multiple of 2^-53.

private:
    std::array<std::uint64_t, 4> _state;  // never all zero
};

}  // namespace Orv

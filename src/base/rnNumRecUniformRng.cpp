#include "rnNumRecUniformRng.h"

#include <bit>

namespace Orv {

void RnNumRecUniformRng<double>::setSeed(std::uint64_t seed) noexcept {
    // SplitMix64 gives each value once in its period, so four in a row are never all zero.
    for (std::uint64_t& word : _state) {
        seed += 0x9e3779b97f4a7c15;
        std::uint64_t mixed = (seed ^ (seed >> 30)) * 0xbf58476d1ce4e5b9;
        mixed = (mixed ^ (mixed >> 27)) * 0x94d049bb133111eb;
        word = mixed ^ (mixed >> 31);
    }
}

double RnNumRecUniformRng<double>::next() noexcept {
    const std::uint64_t result = std::rotl(_state[1] * 5, 7) * 9;
    const std::uint64_t shifted = _state[1] << 17;
    _state[2] ^= _state[0];
    _state[3] ^= _state[1];
    _state[1] ^= _state[2];
    _state[0] ^= _state[3];
    _state[2] ^= shifted;
    _state[3] = std::rotl(_state[3], 45);
    return static_cast<double>(result >> 11) * 0x1p-53;
}

}  // namespace Orv

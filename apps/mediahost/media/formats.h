#pragma once

#include <cstddef>
#include <cstdint>
#include <orv/rational.h>
#include <string>

namespace MediaHost {

/// How the pictures of a track lie in memory: the planes one after the other, without padding.
struct PictureFormat {
    static constexpr int RGB24 = -1;  ///< Three bytes to a pixel; all else are FFmpeg's numbers.

    int width = 0;
    int height = 0;
    int pixels = RGB24;
    std::string pixelName = "rgb24";
    Orv::Rational rate{25};  ///< Pictures per second, on average.
    std::size_t nbBytes = 0;
};

/// Samples are floats, those of all channels beside each other.
struct SoundFormat {
    int rate = 0;  ///< Samples per second and channel.
    int nbChannels = 0;
};

/// Samples per channel in a block of sound, but for the last block of a track.
inline constexpr int BLOCK_SAMPLES = 2048;

/// What stands before the data in the buffer of every unit.
struct alignas(64) UnitHeader {
    double seconds = 0;          ///< When the unit begins, from the start of the track.
    std::int32_t nbSamples = 0;  ///< Per channel; 0 for a picture.
};

inline const std::byte* getUnitData(const void* unit) {
    return static_cast<const std::byte*>(unit) + sizeof(UnitHeader);
}
inline std::byte* getUnitData(void* unit) {
    return static_cast<std::byte*>(unit) + sizeof(UnitHeader);
}

}  // namespace MediaHost

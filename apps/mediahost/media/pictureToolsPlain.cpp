// Without FFmpeg: only the simulated pictures are there to be scaled.

#include <cstdio>
#include <zlib.h>

#include "pictureTools.h"

namespace MediaHost {

struct PictureScaler::Parts {};

PictureScaler::PictureScaler() = default;
PictureScaler::~PictureScaler() = default;

void PictureScaler::scale(const PictureFormat& format, const std::byte* picture, int width,
                          int height, std::vector<std::uint8_t>& pixels) {
    const auto* source = reinterpret_cast<const std::uint8_t*>(picture);
    pixels.clear();
    for (int y = 0; y < height; ++y) {
        const std::ptrdiff_t row = static_cast<std::ptrdiff_t>(y) * format.height / height;
        for (int x = 0; x < width; ++x) {
            const std::ptrdiff_t column = static_cast<std::ptrdiff_t>(x) * format.width / width;
            const std::uint8_t* pixel = source + (row * format.width + column) * 3;
            pixels.insert(pixels.end(), pixel, pixel + 3);
        }
    }
}

std::string getChecksum(const std::byte* data, std::size_t nbBytes) {
    const uLong sum = crc32_z(0, reinterpret_cast<const unsigned char*>(data), nbBytes);
    char text[16];
    std::snprintf(text, sizeof text, "crc32:%08lx", static_cast<unsigned long>(sum));
    return text;
}

}  // namespace MediaHost

#pragma once

#include <memory>
#include <string>
#include <vector>

#include "formats.h"

namespace MediaHost {

/// Turns pictures of one format into RGB pictures of another size.
///
/// - Threads: one at a time.
class PictureScaler {
public:
    PictureScaler();
    ~PictureScaler();

    /// @param pixels  resized to width * height * 3.
    void scale(const PictureFormat& format, const std::byte* picture, int width, int height,
               std::vector<std::uint8_t>& pixels);

private:
    struct Parts;
    std::unique_ptr<Parts> _parts;
};

/// The MD5 sum (RFC 1321) of some bytes, as 32 hexadecimal digits; without FFmpeg "crc32:" and the
/// CRC-32.
std::string getChecksum(const std::byte* data, std::size_t nbBytes);

}  // namespace MediaHost

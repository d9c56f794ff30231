#include "pngFile.h"

#include <cstring>
#include <string>
#include <vector>
#include <zlib.h>

#include "mediaError.h"
#include "outputFile.h"

namespace MediaHost {

namespace {

using Bytes = std::vector<unsigned char>;

void appendNumber(Bytes& bytes, std::uint32_t number) {
    for (int shift = 24; shift >= 0; shift -= 8) {
        bytes.push_back(static_cast<unsigned char>(number >> shift));
    }
}

void writeChunk(OutputFile& file, const char* type, const Bytes& data) {
    Bytes chunk;
    appendNumber(chunk, static_cast<std::uint32_t>(data.size()));
    chunk.insert(chunk.end(), type, type + 4);
    chunk.insert(chunk.end(), data.begin(), data.end());
    const uLong sum = crc32(0, chunk.data() + 4, static_cast<uInt>(chunk.size() - 4));
    appendNumber(chunk, static_cast<std::uint32_t>(sum));
    file.write(chunk.data(), chunk.size());
}

// Each row as its difference from the row above, which compresses better than the row.
Bytes filterRows(const RgbView& picture) {
    const std::size_t rowBytes = static_cast<std::size_t>(picture.width) * 3;
    Bytes rows;
    rows.reserve((rowBytes + 1) * static_cast<std::size_t>(picture.height));
    for (int y = 0; y < picture.height; ++y) {
        const std::uint8_t* row = picture.pixels + static_cast<std::size_t>(y) * rowBytes;
        rows.push_back(y == 0 ? 0 : 2);
        for (std::size_t i = 0; i < rowBytes; ++i) {
            rows.push_back(y == 0 ? row[i]
                                  : static_cast<unsigned char>(row[i] - *(row + i - rowBytes)));
        }
    }
    return rows;
}

}  // namespace

void writePng(const std::filesystem::path& path, const RgbView& picture) {
    const Bytes rows = filterRows(picture);
    Bytes packed(compressBound(static_cast<uLong>(rows.size())));
    auto nbPacked = static_cast<uLongf>(packed.size());
    if (compress2(packed.data(), &nbPacked, rows.data(), static_cast<uLong>(rows.size()), 6) !=
        Z_OK) {
        throw MediaError("cannot compress \"" + path.string() + '"');
    }
    packed.resize(nbPacked);

    Bytes header;
    appendNumber(header, static_cast<std::uint32_t>(picture.width));
    appendNumber(header, static_cast<std::uint32_t>(picture.height));
    header.insert(header.end(), {8, 2, 0, 0, 0});  // 8 bits, colours, nothing special
    OutputFile file(path);
    file.write("\x89PNG\r\n\x1A\n", 8);
    writeChunk(file, "IHDR", header);
    writeChunk(file, "IDAT", packed);
    writeChunk(file, "IEND", {});
    file.commit();
}

}  // namespace MediaHost

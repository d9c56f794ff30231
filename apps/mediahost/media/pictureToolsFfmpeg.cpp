#include "mediaError.h"
#include "pictureTools.h"

extern "C" {
#include <libavutil/imgutils.h>
#include <libavutil/md5.h>
#include <libavutil/mem.h>
#include <libswscale/swscale.h>
}

namespace MediaHost {

struct PictureScaler::Parts {
    SwsContext* context = nullptr;
    ~Parts() { sws_freeContext(context); }
};

PictureScaler::PictureScaler() : _parts(new Parts) {}
PictureScaler::~PictureScaler() = default;

void PictureScaler::scale(const PictureFormat& format, const std::byte* picture, int width,
                          int height, std::vector<std::uint8_t>& pixels) {
    const auto source = format.pixels == PictureFormat::RGB24
                            ? AV_PIX_FMT_RGB24
                            : static_cast<AVPixelFormat>(format.pixels);
    _parts->context =
        sws_getCachedContext(_parts->context, format.width, format.height, source, width, height,
                             AV_PIX_FMT_RGB24, SWS_AREA, nullptr, nullptr, nullptr);
    if (_parts->context == nullptr) {
        throw MediaError("pictures of the format " + format.pixelName + " cannot be shown");
    }
    std::uint8_t* planes[4];
    int rowBytes[4];
    av_image_fill_arrays(planes, rowBytes, reinterpret_cast<const std::uint8_t*>(picture), source,
                         format.width, format.height, 1);
    pixels.resize(static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 3);
    std::uint8_t* out[4] = {pixels.data()};
    const int outBytes[4] = {width * 3};
    sws_scale(_parts->context, planes, rowBytes, 0, format.height, out, outBytes);
}

std::string getChecksum(const std::byte* data, std::size_t nbBytes) {
    std::uint8_t sum[16];
    av_md5_sum(sum, reinterpret_cast<const std::uint8_t*>(data), nbBytes);
    std::string text;
    for (const std::uint8_t byte : sum) {
        text += "0123456789abcdef"[byte >> 4];
        text += "0123456789abcdef"[byte & 15];
    }
    return text;
}

}  // namespace MediaHost

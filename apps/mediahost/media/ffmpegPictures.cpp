#include "ffmpegPictures.h"

#include <algorithm>
#include <cstring>

#include "mediaError.h"

extern "C" {
#include <libavutil/imgutils.h>
#include <libavutil/pixdesc.h>
#include <libswscale/swscale.h>
}

namespace MediaHost {

namespace {

// Of bytes all over the picture: enough to tell a picture from its neighbours, and quick.
std::uint64_t takePrint(const AVFrame& frame) {
    constexpr int NB_ROWS = 16;
    const int rowBytes =
        av_image_get_linesize(static_cast<AVPixelFormat>(frame.format), frame.width, 0);
    std::uint64_t print = 14695981039346656037ULL;
    for (int i = 0; i < NB_ROWS; ++i) {
        const std::ptrdiff_t row = static_cast<std::ptrdiff_t>(frame.height) * i / NB_ROWS;
        const std::uint8_t* bytes = frame.data[0] + row * frame.linesize[0];
        for (int at = 0; at + 8 <= rowBytes; at += 8) {
            std::uint64_t word = 0;
            std::memcpy(&word, bytes + at, sizeof word);
            print = (print ^ word) * 1099511628211ULL;
        }
    }
    return print;
}

}  // namespace

FfmpegPictures::FfmpegPictures(std::unique_ptr<FfmpegInput> input) : _input(std::move(input)) {
    readFormat();
}

FfmpegPictures::~FfmpegPictures() {
    sws_freeContext(_scaler);
}

void FfmpegPictures::readFormat() {
    const AVCodecContext& codec = _input->getCodec();
    if (codec.width <= 0 || codec.height <= 0 || codec.pix_fmt == AV_PIX_FMT_NONE) {
        throw MediaError("the size of the pictures is unknown");
    }
    _format.width = codec.width;
    _format.height = codec.height;
    _format.pixels = codec.pix_fmt;
    _format.pixelName = av_get_pix_fmt_name(codec.pix_fmt);
    const int nbBytes = av_image_get_buffer_size(codec.pix_fmt, codec.width, codec.height, 1);
    if (nbBytes <= 0) throw MediaError("pictures of this size cannot be kept");
    _format.nbBytes = static_cast<std::size_t>(nbBytes);
    AVRational rate = _input->getStream().avg_frame_rate;
    if (rate.num <= 0 || rate.den <= 0) rate = _input->getStream().r_frame_rate;
    if (rate.num <= 0 || rate.den <= 0) rate = {25, 1};
    _format.rate = Orv::Rational(rate.num, rate.den);
}

bool FfmpegPictures::next() {
    while (!advance()) {
        if (_frame == nullptr) return false;
    }
    return true;
}

// Decodes one picture. Returns false if there is none, or if it is not clear which one it is.
bool FfmpegPictures::advance() {
    _frame = _input->read();
    if (_frame == nullptr) {
        if (_isLocating) return seekEarlier();
        if (!_isComplete) _isComplete = _nextUnit == static_cast<std::int64_t>(_known.size());
        return false;
    }
    ++_nbDecoded;
    return recall({_frame->best_effort_timestamp, takePrint(*_frame), _frame->key_frame != 0});
}

// Finds out which picture this is.
bool FfmpegPictures::recall(const Known& seen) {
    if (_isLocating) {
        const auto found = std::lower_bound(
            _known.begin(), _known.end(), seen.timestamp,
            [](const Known& known, std::int64_t at) { return known.timestamp < at; });
        if (found == _known.end() || found->timestamp != seen.timestamp) return false;
        const std::int64_t unit = found - _known.begin();
        if (unit > _wantedUnit) return seekEarlier();
        _nextUnit = unit;
        _isLocating = false;
    }
    if (_nextUnit == static_cast<std::int64_t>(_known.size())) {
        // Without rising times nothing can be found by them.
        if (!_known.empty() && seen.timestamp <= _known.back().timestamp) _isSeekable = false;
        if (seen.timestamp == AV_NOPTS_VALUE) _isSeekable = false;
        _known.push_back(seen);
    } else if (_known[static_cast<std::size_t>(_nextUnit)].print != seen.print && _isSeekable) {
        const std::int64_t wanted = _nextUnit;
        _isSeekable = false;
        restart(0);
        while (_nextUnit < wanted && advance()) {
        }
        return advance();
    }
    _unit = _nextUnit++;
    return true;
}

// Some formats are sought by a guess, and this one was too late.
bool FfmpegPictures::seekEarlier() {
    _nbUnitsBefore = _nbUnitsBefore * 2 + 8;
    seek(_wantedUnit);
    return advance();
}

void FfmpegPictures::restart(std::int64_t unit) {
    _input->rewind();
    _frame = nullptr;
    _isLocating = false;
    _nextUnit = unit;
}

bool FfmpegPictures::isOfFormat(const AVFrame& frame) const {
    return frame.width == _format.width && frame.height == _format.height &&
           frame.format == _format.pixels;
}

void FfmpegPictures::copy(void* unit) {
    auto* header = static_cast<UnitHeader*>(unit);
    const Known& known = _known[static_cast<std::size_t>(_unit)];
    const bool isTimed = known.timestamp != AV_NOPTS_VALUE && _known[0].timestamp != AV_NOPTS_VALUE;
    header->seconds = isTimed ? _input->toSeconds(known.timestamp - _known[0].timestamp)
                              : static_cast<double>(_unit) / _format.rate.toDouble();
    header->nbSamples = 0;

    const auto pixels = static_cast<AVPixelFormat>(_format.pixels);
    auto* data = reinterpret_cast<std::uint8_t*>(getUnitData(unit));
    if (isOfFormat(*_frame)) {
        av_image_copy_to_buffer(data, static_cast<int>(_format.nbBytes), _frame->data,
                                _frame->linesize, pixels, _format.width, _format.height, 1);
        return;
    }
    _scaler = sws_getCachedContext(_scaler, _frame->width, _frame->height,
                                   static_cast<AVPixelFormat>(_frame->format), _format.width,
                                   _format.height, pixels, SWS_BICUBIC, nullptr, nullptr, nullptr);
    if (_scaler == nullptr) throw MediaError("a picture of another size cannot be scaled");
    std::uint8_t* planes[4];
    int rowBytes[4];
    av_image_fill_arrays(planes, rowBytes, data, pixels, _format.width, _format.height, 1);
    sws_scale(_scaler, _frame->data, _frame->linesize, 0, _frame->height, planes, rowBytes);
    ++_nbScaled;
}

std::int64_t FfmpegPictures::findKey(std::int64_t unit) const {
    std::int64_t key = std::min(unit, static_cast<std::int64_t>(_known.size()) - 1);
    while (key > 0 && !_known[static_cast<std::size_t>(key)].isKey) --key;
    return std::max<std::int64_t>(key, 0);
}

bool FfmpegPictures::isSeekQuicker(std::int64_t unit) const {
    return _isSeekable && findKey(unit - _nbUnitsBefore) > _nextUnit;
}

void FfmpegPictures::seek(std::int64_t unit) {
    const std::int64_t key = findKey(unit - _nbUnitsBefore);
    _wantedUnit = unit;
    if (key > 0 && _isSeekable && _input->seek(_known[static_cast<std::size_t>(key)].timestamp)) {
        _isLocating = true;
        _nextUnit = key;
    } else {
        restart(0);
    }
}

std::optional<std::int64_t> FfmpegPictures::getNbUnits() const {
    if (!_isComplete) return std::nullopt;
    return static_cast<std::int64_t>(_known.size());
}

}  // namespace MediaHost

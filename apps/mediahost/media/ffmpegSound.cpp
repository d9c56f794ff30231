#include "ffmpegSound.h"

#include <algorithm>
#include <cstring>

#include "mediaError.h"

extern "C" {
#include <libavutil/channel_layout.h>
#include <libswresample/swresample.h>
}

namespace MediaHost {

FfmpegSound::FfmpegSound(std::unique_ptr<FfmpegInput> input) : _input(std::move(input)) {
    const AVCodecContext& codec = _input->getCodec();
    if (codec.sample_rate <= 0 || codec.ch_layout.nb_channels <= 0) {
        throw MediaError("rate or channels of the sound are unknown");
    }
    _format.rate = codec.sample_rate;
    _format.nbChannels = std::min(codec.ch_layout.nb_channels, 2);
}

FfmpegSound::~FfmpegSound() {
    swr_free(&_converter);
}

std::size_t FfmpegSound::getUnitBytes() const {
    return sizeof(UnitHeader) +
           sizeof(float) * BLOCK_SAMPLES * static_cast<std::size_t>(_format.nbChannels);
}

bool FfmpegSound::next() {
    const std::size_t wanted = BLOCK_SAMPLES * static_cast<std::size_t>(_format.nbChannels);
    while (_waiting.size() < wanted && decodePiece()) {
    }
    if (_waiting.empty()) return false;
    const auto end =
        _waiting.begin() + static_cast<std::ptrdiff_t>(std::min(wanted, _waiting.size()));
    _block.assign(_waiting.begin(), end);
    _waiting.erase(_waiting.begin(), end);
    _unit = _nextUnit++;
    ++_nbDecoded;
    return true;
}

// Decodes one piece and adds what is wanted of it to _waiting. Returns false at the end.
bool FfmpegSound::decodePiece() {
    const AVFrame* frame = _input->read();
    if (frame == nullptr) {
        if (_isLocating) {
            restart();
            return true;
        }
        if (!_isComplete) {
            _isComplete = true;
            _nbSamples = _nextSample;
        }
        return false;
    }
    const std::int64_t timestamp = frame->best_effort_timestamp;
    if (_isLocating && !locate(timestamp)) return true;
    if (_known.empty() || _nextSample > _known.back().sample) {
        if (timestamp == AV_NOPTS_VALUE ||
            (!_known.empty() && timestamp <= _known.back().timestamp)) {
            _isSeekable = false;
        }
        _known.push_back({timestamp, _nextSample});
    }
    convert(*frame);
    const std::int64_t nbSamples =
        static_cast<std::int64_t>(_converted.size()) / _format.nbChannels;
    const std::int64_t nbDropped =
        std::clamp<std::int64_t>(_wantedSample - _nextSample, 0, nbSamples);
    _nextSample += nbSamples;
    _waiting.insert(_waiting.end(), _converted.begin() + nbDropped * _format.nbChannels,
                    _converted.end());
    return true;
}

bool FfmpegSound::locate(std::int64_t timestamp) {
    const auto found =
        std::lower_bound(_known.begin(), _known.end(), timestamp,
                         [](const Known& known, std::int64_t at) { return known.timestamp < at; });
    if (found != _known.end() && found->timestamp == timestamp && found->sample <= _wantedSample) {
        _nextSample = found->sample;
        _isLocating = false;
        return true;
    }
    const bool isPast = found == _known.end() || found->sample > _wantedSample;
    if (isPast) {
        // Some formats are sought by a guess, and this one was too late.
        _nbSettling *= 2;
        seek(_nextUnit);
    }
    return false;
}

void FfmpegSound::convert(const AVFrame& frame) {
    const int nbChannels = frame.ch_layout.nb_channels;
    if (_converter == nullptr || frame.sample_rate != _sourceRate ||
        nbChannels != _sourceChannels || frame.format != _sourceSamples) {
        swr_free(&_converter);
        AVChannelLayout layout;
        av_channel_layout_default(&layout, _format.nbChannels);
        AVChannelLayout sourceLayout = frame.ch_layout;
        if (sourceLayout.order == AV_CHANNEL_ORDER_UNSPEC) {
            av_channel_layout_default(&sourceLayout, nbChannels);
        }
        const int code = swr_alloc_set_opts2(
            &_converter, &layout, AV_SAMPLE_FMT_FLT, _format.rate, &sourceLayout,
            static_cast<AVSampleFormat>(frame.format), frame.sample_rate, 0, nullptr);
        if (code < 0 || swr_init(_converter) < 0) throw MediaError("sound cannot be converted");
        _sourceRate = frame.sample_rate;
        _sourceChannels = nbChannels;
        _sourceSamples = frame.format;
    }
    const int room = swr_get_out_samples(_converter, frame.nb_samples);
    _converted.resize(static_cast<std::size_t>(std::max(room, 0)) *
                      static_cast<std::size_t>(_format.nbChannels));
    auto* out = reinterpret_cast<std::uint8_t*>(_converted.data());
    const int nbSamples =
        swr_convert(_converter, &out, room, const_cast<const std::uint8_t**>(frame.extended_data),
                    frame.nb_samples);
    if (nbSamples < 0) throw MediaError("sound cannot be converted");
    _converted.resize(static_cast<std::size_t>(nbSamples) *
                      static_cast<std::size_t>(_format.nbChannels));
}

void FfmpegSound::copy(void* unit) {
    auto* header = static_cast<UnitHeader*>(unit);
    header->seconds = static_cast<double>(_unit) * BLOCK_SAMPLES / _format.rate;
    header->nbSamples = static_cast<std::int32_t>(_block.size()) / _format.nbChannels;
    std::memcpy(getUnitData(unit), _block.data(), _block.size() * sizeof(float));
}

bool FfmpegSound::isSeekQuicker(std::int64_t unit) const {
    return _isSeekable && unit > _nextUnit + 256 && !_known.empty() &&
           unit * BLOCK_SAMPLES < _known.back().sample;
}

void FfmpegSound::seek(std::int64_t unit) {
    _waiting.clear();
    _wantedSample = unit * BLOCK_SAMPLES;
    _nextUnit = unit;
    const auto at = std::upper_bound(
        _known.begin(), _known.end(), _wantedSample,
        [](std::int64_t sample, const Known& known) { return sample < known.sample; });
    const std::ptrdiff_t piece = at - _known.begin() - 1 - _nbSettling;
    if (_isSeekable && piece > 0 &&
        _input->seek(_known[static_cast<std::size_t>(piece)].timestamp)) {
        _isLocating = true;
    } else {
        restart();
    }
}

void FfmpegSound::restart() {
    _input->rewind();
    _isLocating = false;
    _nextSample = 0;
}

std::optional<std::int64_t> FfmpegSound::getNbUnits() const {
    if (!_isComplete) return std::nullopt;
    return (_nbSamples + BLOCK_SAMPLES - 1) / BLOCK_SAMPLES;
}

}  // namespace MediaHost

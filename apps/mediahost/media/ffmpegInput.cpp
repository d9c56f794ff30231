#include "ffmpegInput.h"

#include <new>

#include "mediaError.h"
#include "process.h"

extern "C" {
#include <libavutil/log.h>
}

namespace MediaHost {

namespace {

const char* nameOf(AVMediaType type) {
    return type == AVMEDIA_TYPE_VIDEO ? "picture" : "sound";
}

FfmpegFormat openFile(const std::string& path) {
    av_log_set_level(AV_LOG_FATAL);  // damaged pieces are counted and reported
    AVFormatContext* opened = avformat_alloc_context();
    if (opened == nullptr) throw std::bad_alloc();
    // Ctrl-C ends a wait for what does not come, from a network or a pipe.
    opened->interrupt_callback.callback = [](void*) { return Process::isInterrupted() ? 1 : 0; };
    int code = avformat_open_input(&opened, path.c_str(), nullptr, nullptr);
    if (code < 0) {
        throw MediaError("cannot open \"" + path + "\": " + describeFfmpegError(code));
    }
    FfmpegFormat format(opened);
    code = avformat_find_stream_info(format.get(), nullptr);
    if (code < 0) {
        throw MediaError("cannot read \"" + path + "\": " + describeFfmpegError(code));
    }
    return format;
}

}  // namespace

std::string describeFfmpegError(int code) {
    char text[AV_ERROR_MAX_STRING_SIZE] = {};
    av_strerror(code, text, sizeof text);
    return text;
}

FfmpegInput::FfmpegInput(const std::string& path, AVMediaType type, int nbThreads)
    : _path(path),
      _type(type),
      _nbThreads(nbThreads),
      _frame(av_frame_alloc()),
      _packet(av_packet_alloc()) {}

std::unique_ptr<FfmpegInput> FfmpegInput::tryOpen(const std::string& path, AVMediaType type,
                                                  int nbThreads) {
    std::unique_ptr<FfmpegInput> input(new FfmpegInput(path, type, nbThreads));
    if (!input->open()) input.reset();
    return input;
}

// Returns false if there is no such stream. The cover of an album is no picture to be played.
bool FfmpegInput::open() {
    _codec.reset();
    _format = openFile(_path);
    const AVCodec* decoder = nullptr;
    const int number = av_find_best_stream(_format.get(), _type, -1, -1, &decoder, 0);
    if (number == AVERROR_STREAM_NOT_FOUND) return false;
    if (number < 0 || decoder == nullptr) {
        throw MediaError('"' + _path + "\" has no " + nameOf(_type) + " that can be decoded");
    }
    for (unsigned i = 0; i < _format->nb_streams; ++i) {
        if (i != static_cast<unsigned>(number)) _format->streams[i]->discard = AVDISCARD_ALL;
    }
    _stream = _format->streams[number];
    if ((_stream->disposition & AV_DISPOSITION_ATTACHED_PIC) != 0) return false;
    _codec.reset(avcodec_alloc_context3(decoder));
    avcodec_parameters_to_context(_codec.get(), _stream->codecpar);
    _codec->pkt_timebase = _stream->time_base;
    _codec->thread_count = _nbThreads;
    const int code = avcodec_open2(_codec.get(), decoder, nullptr);
    if (code < 0) {
        throw MediaError("cannot decode the " + std::string(nameOf(_type)) + " of \"" + _path +
                         "\" (" + decoder->name + "): " + describeFfmpegError(code));
    }
    _isDraining = false;
    return true;
}

AVFrame* FfmpegInput::read() {
    for (;;) {
        const int code = avcodec_receive_frame(_codec.get(), _frame.get());
        if (code == 0) return _frame.get();
        if (code == AVERROR_EOF) return nullptr;
        if (code != AVERROR(EAGAIN)) {
            ++_nbFaults;
            if (_isDraining) return nullptr;
        }
        if (!feed()) return nullptr;
    }
}

// Gives the decoder one packet, or tells it that there are no more.
bool FfmpegInput::feed() {
    if (_isDraining) return false;
    for (;;) {
        const int code = av_read_frame(_format.get(), _packet.get());
        if (code < 0) {
            // A file that is cut off may end in the middle of something.
            if (code != AVERROR_EOF && code != AVERROR_EXIT) ++_nbFaults;
            _isDraining = true;
            return avcodec_send_packet(_codec.get(), nullptr) >= 0;
        }
        const bool isOurs = _packet->stream_index == _stream->index;
        if (isOurs && avcodec_send_packet(_codec.get(), _packet.get()) < 0) ++_nbFaults;
        av_packet_unref(_packet.get());
        if (isOurs) return true;
    }
}

bool FfmpegInput::seek(std::int64_t timestamp) {
    if (av_seek_frame(_format.get(), _stream->index, timestamp, AVSEEK_FLAG_BACKWARD) < 0) {
        return false;
    }
    avcodec_flush_buffers(_codec.get());
    _isDraining = false;
    return true;
}

// Opened again rather than sought: then everything is as it was the first time, for every format.
void FfmpegInput::rewind() {
    if (!open()) throw MediaError("\"" + _path + "\" has changed");
}

double FfmpegInput::toSeconds(std::int64_t timestamp) const {
    return static_cast<double>(timestamp) * av_q2d(_stream->time_base);
}

double FfmpegInput::getSeconds() const {
    if (_stream->duration > 0) return toSeconds(_stream->duration);
    return _format->duration > 0 ? static_cast<double>(_format->duration) / AV_TIME_BASE : 0;
}

}  // namespace MediaHost

#include <exception>

#include "encodedFile.h"
#include "ffmpegInput.h"
#include "mediaError.h"

extern "C" {
#include <libavutil/imgutils.h>
#include <libavutil/pixdesc.h>
#include <libswscale/swscale.h>
}

namespace MediaHost {

namespace {

constexpr int IO_BYTES = 1 << 16;
constexpr int FINEST_RATE = 65535;   // some kinds of files count time in 16 bits
constexpr int CONSTANT_QUALITY = 4;  // of 1 to 31, the lower the better

void freeMuxer(AVFormatContext** muxer) {
    avformat_free_context(*muxer);
}
void freeIo(AVIOContext** io) {
    if (*io != nullptr) av_freep(&(*io)->buffer);
    avio_context_free(io);
}
using Muxer = std::unique_ptr<AVFormatContext, FfmpegDeleter<AVFormatContext, freeMuxer>>;
using Io = std::unique_ptr<AVIOContext, FfmpegDeleter<AVIOContext, freeIo>>;

/// The file as the muxer sees it. What goes wrong with it is kept for after the muxer's return.
class Sink {
public:
    explicit Sink(OutputFile& file) : _file(file) {}

    void rethrow() const {
        if (_error) std::rethrow_exception(_error);
    }

    static int write(void* self, std::uint8_t* bytes, int nbBytes) {
        return static_cast<Sink*>(self)->guarded([&](Sink& sink) {
            sink._file.write(bytes, static_cast<std::size_t>(nbBytes));
            return nbBytes;
        });
    }
    static std::int64_t seek(void* self, std::int64_t position, int whence) {
        if (whence != SEEK_SET) return AVERROR(EINVAL);
        return static_cast<Sink*>(self)->guarded([&](Sink& sink) {
            sink._file.seek(static_cast<std::uint64_t>(position));
            return position;
        });
    }

private:
    OutputFile& _file;
    std::exception_ptr _error;

    template <class Work>
    auto guarded(Work work) -> decltype(work(*this)) {
        try {
            return work(*this);
        } catch (...) {
            if (!_error) _error = std::current_exception();
            return AVERROR(EIO);
        }
    }
};

}  // namespace

struct EncodedFile::Parts {
    const std::string name;
    Sink sink;
    Io io;
    Muxer muxer;
    FfmpegCodec codec;
    FfmpegFrame frame{av_frame_alloc()};
    FfmpegPacket packet{av_packet_alloc()};
    SwsContext* scaler = nullptr;
    std::int64_t nbPictures = 0;

    explicit Parts(OutputFile& file) : name(file.getPath().string()), sink(file) {}
    ~Parts() { sws_freeContext(scaler); }
    Parts(const Parts&) = delete;
    Parts& operator=(const Parts&) = delete;

    void check(int code) const {
        sink.rethrow();
        if (code >= 0) return;
        throw MediaError("cannot encode \"" + name + "\": " + describeFfmpegError(code));
    }
    void openMuxer();
    void openCodec(const PictureFormat& format);
    void encode(const AVFrame* picture);
};

void EncodedFile::Parts::openMuxer() {
    const AVOutputFormat* kind = av_guess_format(nullptr, name.c_str(), nullptr);
    if (kind == nullptr || kind->video_codec == AV_CODEC_ID_NONE ||
        (kind->flags & AVFMT_NOFILE) != 0) {
        throw MediaError("cannot encode \"" + name +
                         "\": expected a name that ends as films do, such as .mp4");
    }
    AVFormatContext* made = nullptr;
    check(avformat_alloc_output_context2(&made, kind, nullptr, nullptr));
    muxer.reset(made);
    auto* buffer = static_cast<unsigned char*>(av_malloc(IO_BYTES));
    io.reset(avio_alloc_context(buffer, IO_BYTES, 1, &sink, nullptr, Sink::write, Sink::seek));
    muxer->pb = io.get();
}

void EncodedFile::Parts::openCodec(const PictureFormat& format) {
    const AVCodec* encoder = avcodec_find_encoder(muxer->oformat->video_codec);
    if (encoder == nullptr) check(AVERROR_ENCODER_NOT_FOUND);
    codec.reset(avcodec_alloc_context3(encoder));
    codec->width = format.width & ~1;
    codec->height = format.height & ~1;
    codec->pix_fmt = encoder->pix_fmts != nullptr ? encoder->pix_fmts[0] : AV_PIX_FMT_YUV420P;
    av_reduce(&codec->framerate.num, &codec->framerate.den, format.rate.getNumerator(),
              format.rate.getDenominator(), FINEST_RATE);
    codec->time_base = av_inv_q(codec->framerate);
    codec->flags |= AV_CODEC_FLAG_QSCALE;
    codec->global_quality = FF_QP2LAMBDA * CONSTANT_QUALITY;
    if ((muxer->oformat->flags & AVFMT_GLOBALHEADER) != 0) {
        codec->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    }
    check(avcodec_open2(codec.get(), encoder, nullptr));
    AVStream* stream = avformat_new_stream(muxer.get(), nullptr);
    if (stream == nullptr) check(AVERROR(ENOMEM));
    check(avcodec_parameters_from_context(stream->codecpar, codec.get()));
    stream->time_base = codec->time_base;
    stream->avg_frame_rate = codec->framerate;
    frame->width = codec->width;
    frame->height = codec->height;
    frame->format = codec->pix_fmt;
    check(av_frame_get_buffer(frame.get(), 0));
}

// Without a picture: what the encoder still has in it.
void EncodedFile::Parts::encode(const AVFrame* picture) {
    check(avcodec_send_frame(codec.get(), picture));
    for (;;) {
        const int code = avcodec_receive_packet(codec.get(), packet.get());
        if (code == AVERROR(EAGAIN) || code == AVERROR_EOF) return;
        check(code);
        packet->stream_index = 0;
        if (packet->duration == 0) packet->duration = 1;
        av_packet_rescale_ts(packet.get(), codec->time_base, muxer->streams[0]->time_base);
        check(av_interleaved_write_frame(muxer.get(), packet.get()));
    }
}

EncodedFile::EncodedFile(const std::filesystem::path& path, const PictureFormat& format)
    : _format(format), _file(path), _parts(new Parts(_file)) {
    av_log_set_level(AV_LOG_FATAL);
    _parts->openMuxer();
    _parts->openCodec(format);
    _parts->check(avformat_write_header(_parts->muxer.get(), nullptr));
}

EncodedFile::~EncodedFile() = default;

void EncodedFile::write(const PictureFormat& format, const std::byte* picture) {
    if (format.width != _format.width || format.height != _format.height ||
        format.pixels != _format.pixels) {
        throw MediaError("\"" + _parts->name + "\" began with pictures of another format");
    }
    Parts& parts = *_parts;
    const auto source = format.pixels == PictureFormat::RGB24
                            ? AV_PIX_FMT_RGB24
                            : static_cast<AVPixelFormat>(format.pixels);
    AVFrame& frame = *parts.frame;
    parts.scaler = sws_getCachedContext(parts.scaler, frame.width, frame.height, source,
                                        frame.width, frame.height, parts.codec->pix_fmt,
                                        SWS_BICUBIC, nullptr, nullptr, nullptr);
    if (parts.scaler == nullptr) parts.check(AVERROR(EINVAL));
    parts.check(av_frame_make_writable(&frame));
    std::uint8_t* planes[4];
    int rowBytes[4];
    av_image_fill_arrays(planes, rowBytes, reinterpret_cast<const std::uint8_t*>(picture), source,
                         format.width, format.height, 1);
    sws_scale(parts.scaler, planes, rowBytes, 0, frame.height, frame.data, frame.linesize);
    frame.pts = parts.nbPictures++;
    frame.quality = parts.codec->global_quality;
    parts.encode(&frame);
}

void EncodedFile::commit() {
    _parts->encode(nullptr);
    _parts->check(av_write_trailer(_parts->muxer.get()));
    avio_flush(_parts->io.get());
    _parts->check(0);
    _file.commit();
}

}  // namespace MediaHost

#pragma once

#include <cstdint>
#include <memory>
#include <string>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
}

namespace MediaHost {

template <class T, void (*DESTROY)(T**)>
struct FfmpegDeleter {
    void operator()(T* object) const { DESTROY(&object); }
};
using FfmpegFormat =
    std::unique_ptr<AVFormatContext, FfmpegDeleter<AVFormatContext, avformat_close_input>>;
using FfmpegCodec =
    std::unique_ptr<AVCodecContext, FfmpegDeleter<AVCodecContext, avcodec_free_context>>;
using FfmpegFrame = std::unique_ptr<AVFrame, FfmpegDeleter<AVFrame, av_frame_free>>;
using FfmpegPacket = std::unique_ptr<AVPacket, FfmpegDeleter<AVPacket, av_packet_free>>;

std::string describeFfmpegError(int code);

/// One stream of a file, decoded frame by frame.
///
/// - Threads: one at a time; decoding itself uses @p nbThreads.
class FfmpegInput {
public:
    /// An input for a stream of that kind, or null if the file has none.
    /// @param nbThreads  0: as many as the machine has processors.
    /// @throws MediaError if the file cannot be opened, is no media, or cannot be decoded.
    static std::unique_ptr<FfmpegInput> tryOpen(const std::string& path, AVMediaType type,
                                                int nbThreads);

    /// Decodes the next frame, leaving out what is damaged.
    /// @return null at the end; else borrowed until the next call.
    AVFrame* read();

    /// @return false if the file cannot be sought there.
    bool seek(std::int64_t timestamp);
    void rewind();

    const AVStream& getStream() const { return *_stream; }
    const AVCodecContext& getCodec() const { return *_codec; }
    double getSeconds() const;  ///< The length that the file claims; 0 if it does not.
    double toSeconds(std::int64_t timestamp) const;
    std::uint64_t getNbFaults() const { return _nbFaults; }

private:
    const std::string _path;
    const AVMediaType _type;
    const int _nbThreads;
    FfmpegFormat _format;
    AVStream* _stream = nullptr;  // of _format
    FfmpegCodec _codec;
    FfmpegFrame _frame;
    FfmpegPacket _packet;
    bool _isDraining = false;
    std::uint64_t _nbFaults = 0;

    FfmpegInput(const std::string& path, AVMediaType type, int nbThreads);
    bool open();
    bool feed();
};

}  // namespace MediaHost

#pragma once

#include <vector>

#include "ffmpegInput.h"
#include "unitDecoder.h"

struct SwrContext;

namespace MediaHost {

/// The sound of a file in blocks of BLOCK_SAMPLES samples; more than two channels become two.
///
/// Going back begins a while before the block that is wanted, because what a codec makes of a piece
/// depends on those before it.
class FfmpegSound : public UnitDecoder {
public:
    explicit FfmpegSound(std::unique_ptr<FfmpegInput> input);
    ~FfmpegSound() override;

    const SoundFormat& getFormat() const { return _format; }
    std::string getCodecName() const { return _input->getCodec().codec->name; }
    double getSeconds() const { return _input->getSeconds(); }

    std::size_t getUnitBytes() const override;
    bool next() override;
    std::int64_t getUnit() const override { return _unit; }
    std::int64_t getNextUnit() const override { return _nextUnit; }
    void copy(void* unit) override;
    void seek(std::int64_t unit) override;
    bool isSeekQuicker(std::int64_t unit) const override;
    std::optional<std::int64_t> getNbUnits() const override;
    std::uint64_t getNbFaults() const override { return _input->getNbFaults(); }
    std::uint64_t getNbDecoded() const override { return _nbDecoded; }

private:
    struct Known {
        std::int64_t timestamp;
        std::int64_t sample;  // the first one
    };
    const std::unique_ptr<FfmpegInput> _input;
    SoundFormat _format;
    SwrContext* _converter = nullptr;
    int _sourceRate = 0, _sourceChannels = 0, _sourceSamples = -1;  // what _converter takes
    std::vector<Known> _known;
    bool _isComplete = false;
    bool _isSeekable = true;
    std::int64_t _nbSamples = 0;   // of the track, once complete
    std::int64_t _nextSample = 0;  // the first one of the next piece
    std::int64_t _nbSettling = 8;  // pieces decoded before those that are used
    bool _isLocating = false;
    std::int64_t _wantedSample = 0;  // what comes earlier is dropped
    std::vector<float> _waiting;     // decoded, from _nextUnit on
    std::vector<float> _block;       // the one at hand
    std::vector<float> _converted;
    std::int64_t _unit = -1;
    std::int64_t _nextUnit = 0;
    std::uint64_t _nbDecoded = 0;

    bool decodePiece();
    void convert(const AVFrame& frame);
    bool locate(std::int64_t timestamp);
    void restart();
};

}  // namespace MediaHost

#pragma once

#include <vector>

#include "ffmpegInput.h"
#include "unitDecoder.h"

struct SwsContext;

namespace MediaHost {

/// The pictures of a file, as the decoder gives them: same pixel format, nothing scaled. Where their
/// size or format changes on the way, they are scaled to those of the first one.
///
/// Pictures are numbered in the order they are shown. What is known of them, when each is due and
/// which ones decoding can begin at, is learnt as they are decoded; so going back needs no table of
/// contents in the file. A picture decoded again is compared with what it was the first time; if it
/// differs, the file cannot be sought reliably, and is then read from the start instead.
class FfmpegPictures : public UnitDecoder {
public:
    explicit FfmpegPictures(std::unique_ptr<FfmpegInput> input);
    ~FfmpegPictures() override;

    const PictureFormat& getFormat() const { return _format; }
    std::string getCodecName() const { return _input->getCodec().codec->name; }
    double getSeconds() const { return _input->getSeconds(); }
    std::uint64_t getNbScaled() const { return _nbScaled; }

    std::size_t getUnitBytes() const override { return sizeof(UnitHeader) + _format.nbBytes; }
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
        std::uint64_t print;  // of some of the bytes
        bool isKey;
    };

    const std::unique_ptr<FfmpegInput> _input;
    PictureFormat _format;
    SwsContext* _scaler = nullptr;
    AVFrame* _frame = nullptr;  // the input's, or null
    std::vector<Known> _known;
    bool _isComplete = false;         // _known is
    bool _isSeekable = true;          // as far as is known
    bool _isLocating = false;         // after a seek, until it is clear which picture has come
    std::int64_t _wantedUnit = 0;     // of the latest seek
    std::int64_t _nbUnitsBefore = 0;  // so much earlier is sought
    std::int64_t _unit = -1;
    std::int64_t _nextUnit = 0;
    std::uint64_t _nbScaled = 0;
    std::uint64_t _nbDecoded = 0;

    bool isOfFormat(const AVFrame& frame) const;
    void readFormat();
    bool advance();
    bool recall(const Known& seen);
    std::int64_t findKey(std::int64_t unit) const;
    bool seekEarlier();
    void restart(std::int64_t unit);
};

}  // namespace MediaHost

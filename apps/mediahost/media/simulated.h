#pragma once

#include <orv/liTimeCode.h>
#include <orv/rcShdPtr.h>
#include <vector>

#include "unitDecoder.h"

namespace MediaHost {

/// Colour bars with the timecode of each picture burnt in, and a mark that moves with the time.
class PatternPictures : public UnitDecoder {
public:
    /// @param nbPictures  at least 0.
    PatternPictures(int width, int height, const Orv::Rational& rate, std::int64_t nbPictures,
                    Orv::RCShdPtr<Orv::LiTimeCode> timecode);

    const PictureFormat& getFormat() const { return _format; }

    std::size_t getUnitBytes() const override { return sizeof(UnitHeader) + _format.nbBytes; }
    bool next() override;
    std::int64_t getUnit() const override { return _nextUnit - 1; }
    std::int64_t getNextUnit() const override { return _nextUnit; }
    void copy(void* unit) override;
    void seek(std::int64_t unit) override { _nextUnit = unit; }
    bool isSeekQuicker(std::int64_t unit) const override { return unit > _nextUnit; }
    std::optional<std::int64_t> getNbUnits() const override { return _nbPictures; }
    std::uint64_t getNbDecoded() const override { return _nbDecoded; }

private:
    const std::int64_t _nbPictures;
    const Orv::RCShdPtr<Orv::LiTimeCode> _timecode;
    PictureFormat _format;
    std::vector<std::uint8_t> _bars;  // a whole picture
    std::int64_t _nextUnit = 0;
    std::uint64_t _nbDecoded = 0;
};

/// A sine tone, the same on both channels, with a click at the start of each second.
class ToneSound : public UnitDecoder {
public:
    ToneSound(int rate, double hertz, std::int64_t nbSamples);

    const SoundFormat& getFormat() const { return _format; }

    std::size_t getUnitBytes() const override {
        return sizeof(UnitHeader) + sizeof(float) * BLOCK_SAMPLES * 2;
    }
    bool next() override;
    std::int64_t getUnit() const override { return _nextUnit - 1; }
    std::int64_t getNextUnit() const override { return _nextUnit; }
    void copy(void* unit) override;
    void seek(std::int64_t unit) override { _nextUnit = unit; }
    bool isSeekQuicker(std::int64_t unit) const override { return unit > _nextUnit; }
    std::optional<std::int64_t> getNbUnits() const override;
    std::uint64_t getNbDecoded() const override { return _nbDecoded; }

private:
    const SoundFormat _format;
    const double _hertz;
    const std::int64_t _nbSamples;
    std::int64_t _nextUnit = 0;
    std::uint64_t _nbDecoded = 0;
};

}  // namespace MediaHost

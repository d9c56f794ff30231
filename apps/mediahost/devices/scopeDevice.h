#pragma once

#include "mediaDevice.h"
#include "settings.h"

namespace MediaHost {

/// Looks at sound that goes through it, streams "audio" and "through": levels as properties, and the
/// waveform of all of it, which becomes the picture "waveform.png".
class ScopeDevice : public MediaDevice {
public:
    ScopeDevice(const Orv::LiString& name, HostContext& context, Settings settings);

protected:
    void finish(bool isWhole) override;

private:
    struct Extent {
        float lowest = 0, highest = 0;
    };
    static constexpr std::size_t NB_COLUMNS = 1200;

    Orv::RCShdPtr<Source> _through;
    SoundFormat _format;
    std::vector<Extent> _extents;  // of _samplesPerExtent samples each, the last one maybe of less
    std::int64_t _samplesPerExtent = 64;
    std::int64_t _nbSamples = 0;
    double _sumOfSquares = 0;
    float _peak = 0;

    void take(const Orv::RCShdPtr<SoundBuf>& buf);
    void add(float sample);
    void halve();
    void draw() const;
};

}  // namespace MediaHost

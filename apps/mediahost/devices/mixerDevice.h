#pragma once

#include <deque>

#include "mediaDevice.h"
#include "settings.h"

namespace MediaHost {

/// Adds up to four channels of sound: streams "channel1" to "channel4" in, "out" out. Each has a
/// gain and a mute, and so has the sum; meters tell the peaks of the last tenth of a second.
///
/// Channels are of one rate; a mono channel goes to both sides of a stereo sum.
class MixerDevice : public MediaDevice {
public:
    static constexpr int NB_CHANNELS = 4;

    MixerDevice(const Orv::LiString& name, HostContext& context, Settings settings);

protected:
    void finish(bool isWhole) override;

private:
    using Peaks = Orv::Vector<float>;

    struct Strip {
        double gain = 0;  // dB
        bool isMuted = false;
        float peak = 0;       // since the last notification
        float shownPeak = 0;  // dB full scale
        Orv::RCShdPtr<Orv::DevMDStdProperty<float>> meter;

        float getFactor() const;
    };
    struct Channel : Strip {
        Orv::RCShdPtr<Sink> input;
        std::deque<Orv::RCShdPtr<SoundBuf>> waiting;
        std::size_t nbTaken = 0;  // samples of the first one
    };

    Channel _channels[NB_CHANNELS];
    Strip _master;
    Orv::RCShdPtr<Source> _out;
    SoundFormat _format;  // of the sum; rate 0 until the first piece
    std::int64_t _nbSinceNotified = 0;

    void addStrip(const std::string& set, Strip& strip);
    void take(std::size_t channel, const Orv::RCShdPtr<SoundBuf>& buf);
    bool canMix() const;
    void mix();
    void addChannel(Channel& channel, std::vector<float>& sum, std::size_t nbSamples) const;
    void notifyMeters(std::size_t nbSamples);
};

}  // namespace MediaHost

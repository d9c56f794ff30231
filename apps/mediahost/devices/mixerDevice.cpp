#include "mixerDevice.h"

#include <algorithm>
#include <cmath>

namespace MediaHost {

namespace {

constexpr float SILENCE = -120;  // dB

float toDecibels(float level) {
    return std::max(SILENCE, 20 * std::log10(std::max(level, 1e-6F)));
}

float findPeak(const std::vector<float>& samples) {
    float peak = 0;
    for (const float sample : samples) peak = std::max(peak, std::abs(sample));
    return peak;
}

}  // namespace

float MixerDevice::Strip::getFactor() const {
    if (isMuted) return 0;
    // Exactly 1 for 0 dB: what goes through unchanged stays what it was.
    return gain == 0 ? 1.0F : static_cast<float>(std::pow(10, gain / 20));
}

MixerDevice::MixerDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : MediaDevice(name, context) {
    settings.check();
    for (std::size_t i = 0; i < NB_CHANNELS; ++i) {
        const std::string channel = "channel" + std::to_string(i + 1);
        addStrip(channel, _channels[i]);
        _channels[i].input =
            addInput<SoundBuf>(channel.c_str(), "sound/*",
                               [this, i](const Orv::RCShdPtr<SoundBuf>& buf) { take(i, buf); });
    }
    addStrip("master", _master);
    _out = addOutput("out", "sound/float");
}

void MixerDevice::addStrip(const std::string& set, Strip& strip) {
    const auto gain = Orv::DevMDPropertyDescriptor<double>::create();
    gain->setUnit("dB").setRange(-60, 12).setDefault(0);
    addProperty<double>((set + ":gain").c_str(), "amplification", [&strip] { return strip.gain; },
                        [&strip](const double& value) { strip.gain = value; }, gain);
    addProperty<bool>((set + ":mute").c_str(), "silence", [&strip] { return strip.isMuted; },
                      [&strip](const bool& value) { strip.isMuted = value; });
    const auto level = Orv::DevMDPropertyDescriptor<float>::create();
    level->setUnit("dBFS");
    strip.shownPeak = SILENCE;
    strip.meter =
        addProperty<float>((set + ":peak").c_str(), "highest level of the last tenth second",
                           [&strip] { return strip.shownPeak; }, nullptr, level);
}

void MixerDevice::take(std::size_t channel, const Orv::RCShdPtr<SoundBuf>& buf) {
    if (_format.rate == 0) _format = buf->getFormat();
    if (buf->getFormat().rate != _format.rate) {
        throw MediaError("channel" + std::to_string(channel + 1) + " brings sound at " +
                         std::to_string(buf->getFormat().rate) + " Hz, the others at " +
                         std::to_string(_format.rate) + " Hz");
    }
    _format.nbChannels = std::max(_format.nbChannels, buf->getFormat().nbChannels);
    if (buf->getNbSamples() > 0) _channels[channel].waiting.push_back(buf);
    while (canMix()) mix();
}

// Every channel that is not at its end has something, and at least one has.
bool MixerDevice::canMix() const {
    bool hasAny = false;
    for (const Channel& channel : _channels) {
        const bool has = !channel.waiting.empty();
        if (!has && channel.input->isOpen()) return false;
        hasAny = hasAny || has;
    }
    return hasAny;
}

void MixerDevice::mix() {
    std::size_t nbSamples = SIZE_MAX;
    for (const Channel& channel : _channels) {
        if (channel.waiting.empty()) continue;
        nbSamples = std::min(nbSamples, channel.waiting.front()->getNbSamples() - channel.nbTaken);
    }
    std::vector<float> sum(nbSamples * static_cast<std::size_t>(_format.nbChannels));
    for (Channel& channel : _channels) {
        if (!channel.waiting.empty()) addChannel(channel, sum, nbSamples);
    }
    const float factor = _master.getFactor();
    for (float& sample : sum) sample *= factor;
    _master.peak = std::max(_master.peak, findPeak(sum));
    notifyMeters(nbSamples);
    _out->push(
        createElem(Orv::RCShdPtr<Orv::DevMDStreamBuf>(new SoundBuf(_format, std::move(sum)))));
}

void MixerDevice::addChannel(Channel& channel, std::vector<float>& sum,
                             std::size_t nbSamples) const {
    const SoundBuf& buf = *channel.waiting.front();
    const auto nbIn = static_cast<std::size_t>(buf.getFormat().nbChannels);
    const auto nbOut = static_cast<std::size_t>(_format.nbChannels);
    const float factor = channel.getFactor();
    for (std::size_t i = 0; i < nbSamples; ++i) {
        for (std::size_t side = 0; side < nbOut; ++side) {
            const std::size_t at = (channel.nbTaken + i) * nbIn + std::min(side, nbIn - 1);
            const float value = buf.getSamples()[at] * factor;
            channel.peak = std::max(channel.peak, std::abs(value));
            sum[i * nbOut + side] += value;
        }
    }
    channel.nbTaken += nbSamples;
    if (channel.nbTaken == buf.getNbSamples()) {
        channel.waiting.pop_front();
        channel.nbTaken = 0;
    }
}

void MixerDevice::notifyMeters(std::size_t nbSamples) {
    _nbSinceNotified += static_cast<std::int64_t>(nbSamples);
    if (_nbSinceNotified < _format.rate / 10) return;
    _nbSinceNotified = 0;
    const auto show = [](Strip& strip) {
        const float peak = toDecibels(std::exchange(strip.peak, 0.0F));
        if (peak == strip.shownPeak) return;
        strip.shownPeak = peak;
        strip.meter->notify(1);
    };
    for (Channel& channel : _channels) show(channel);
    show(_master);
}

void MixerDevice::finish(bool isWhole) {
    while (isWhole && canMix()) mix();
    _out->push(createNews(Elem::END));
}

}  // namespace MediaHost

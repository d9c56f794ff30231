#include "speakerDevice.h"

#include <chrono>
#include <thread>

namespace MediaHost {

SpeakerDevice::SpeakerDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : MediaDevice(name, context) {
    settings.check();
    addInput<SoundBuf>("audio", "sound/*",
                       [this](const Orv::RCShdPtr<SoundBuf>& buf) { take(buf); });
    _through = addOutput("through", "sound/float");
    addProperty<std::int64_t>("played", "samples until now, per channel",
                              [this] { return _nbPlayed; });
    addProperty<std::int64_t>("dropped", "samples that came too soon to be played, per channel",
                              [this] { return _nbDropped; });
}

void SpeakerDevice::take(const Orv::RCShdPtr<SoundBuf>& buf) {
    if (!_speaker) {
        _speaker = Speaker::create(buf->getFormat());
        _nbChannels = buf->getFormat().nbChannels;
    }
    if (buf->getFormat().nbChannels != _nbChannels) {
        throw MediaError("the sound has become stereo on the way");
    }
    const auto nbSamples = static_cast<std::int64_t>(buf->getNbSamples());
    if (_speaker->getQueuedSeconds() > MOST_QUEUED_SECONDS) {
        _nbDropped += nbSamples;
    } else {
        _speaker->play(buf->getSamples());
        _nbPlayed += nbSamples;
    }
    _through->push(createElem(buf));
}

// What waits is heard out, unless the system has stopped playing.
void SpeakerDevice::finish(bool isWhole) {
    _through->push(createNews(Elem::END));
    if (!isWhole || !_speaker) return;
    constexpr std::chrono::duration<double> STEP(0.01);
    const std::chrono::duration<double> most(_speaker->getQueuedSeconds() + 0.5);
    for (auto waited = STEP; _speaker->getQueuedSeconds() > 0 && waited < most; waited += STEP) {
        std::this_thread::sleep_for(STEP);
    }
}

void SpeakerDevice::close() {
    _speaker.reset();
}

}  // namespace MediaHost

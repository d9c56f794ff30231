#pragma once

#include <memory>

#include "mediaDevice.h"
#include "settings.h"
#include "speaker.h"

namespace MediaHost {

/// Lets the sound that goes through it be heard, streams "audio" and "through". It follows the
/// host's clock: sound that comes sooner than it is played is left out once a second of it waits.
class SpeakerDevice : public MediaDevice {
public:
    SpeakerDevice(const Orv::LiString& name, HostContext& context, Settings settings);

protected:
    void finish(bool isWhole) override;
    void close() override;

private:
    static constexpr double MOST_QUEUED_SECONDS = 1;

    Orv::RCShdPtr<Source> _through;
    std::unique_ptr<Speaker> _speaker;  // null until the first sound
    int _nbChannels = 0;
    std::int64_t _nbPlayed = 0, _nbDropped = 0;  // samples per channel

    void take(const Orv::RCShdPtr<SoundBuf>& buf);
};

}  // namespace MediaHost

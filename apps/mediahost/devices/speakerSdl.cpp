#include <SDL.h>

#include "mediaError.h"
#include "speaker.h"

namespace MediaHost {

namespace {

constexpr Uint16 BLOCK = 1024;  // samples that SDL asks the system to play at a time

class SdlSpeaker : public Speaker {
public:
    explicit SdlSpeaker(const SoundFormat& format)
        : _bytesPerSecond(static_cast<double>(format.rate) * format.nbChannels * sizeof(float)) {
        // Ctrl-C is the host's own.
        SDL_SetHint(SDL_HINT_NO_SIGNAL_HANDLERS, "1");
        if (SDL_InitSubSystem(SDL_INIT_AUDIO) != 0) fail();
        SDL_AudioSpec wanted{};
        wanted.freq = format.rate;
        wanted.format = AUDIO_F32SYS;
        wanted.channels = static_cast<Uint8>(format.nbChannels);
        wanted.samples = BLOCK;
        _device = SDL_OpenAudioDevice(nullptr, 0, &wanted, nullptr, 0);
        if (_device == 0) {
            SDL_QuitSubSystem(SDL_INIT_AUDIO);
            fail();
        }
        SDL_PauseAudioDevice(_device, 0);
    }
    ~SdlSpeaker() override {
        SDL_CloseAudioDevice(_device);
        SDL_QuitSubSystem(SDL_INIT_AUDIO);
    }

    void play(std::span<const float> samples) override {
        if (SDL_QueueAudio(_device, samples.data(), static_cast<Uint32>(samples.size_bytes())) != 0)
            fail();
    }
    double getQueuedSeconds() override { return SDL_GetQueuedAudioSize(_device) / _bytesPerSecond; }

private:
    const double _bytesPerSecond;
    SDL_AudioDeviceID _device = 0;

    [[noreturn]] static void fail() {
        throw MediaError(std::string("sound cannot be heard: ") + SDL_GetError());
    }
};

}  // namespace

std::unique_ptr<Speaker> Speaker::create(const SoundFormat& format) {
    return std::make_unique<SdlSpeaker>(format);
}

}  // namespace MediaHost

#include "simulatedDevices.h"

#include <cmath>

#include "simulated.h"

namespace MediaHost {

namespace {

constexpr double STANDARD_SECONDS = 8;
constexpr double MOST_SECONDS = 366.0 * 86400;

}  // namespace

PatternDevice::PatternDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : SourceDevice(name, context) {
    const auto width = static_cast<int>(settings.getNumber("width", 1280, 16, 8192));
    const auto height = static_cast<int>(settings.getNumber("height", 720, 16, 8192));
    const Orv::Rational rate = settings.getRate("rate", context.timecode->getEditRate());
    const double seconds = settings.getReal("seconds", STANDARD_SECONDS, 0, MOST_SECONDS);
    settings.check();
    setDuration(seconds);
    auto decoder = std::make_unique<PatternPictures>(
        width, height, rate, std::llround(seconds * rate.toDouble()), context.timecode);
    const PictureFormat format = decoder->getFormat();
    addPictures(std::move(decoder), format);
}

ToneDevice::ToneDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : SourceDevice(name, context) {
    const auto rate = static_cast<int>(settings.getNumber("rate", 48000, 8000, 192000));
    const double hertz = settings.getReal("hertz", 440, 1, 20000);
    const double seconds = settings.getReal("seconds", STANDARD_SECONDS, 0, MOST_SECONDS);
    settings.check();
    setDuration(seconds);
    auto decoder = std::make_unique<ToneSound>(rate, hertz, std::llround(seconds * rate));
    const SoundFormat format = decoder->getFormat();
    addSound(std::move(decoder), format);
}

}  // namespace MediaHost

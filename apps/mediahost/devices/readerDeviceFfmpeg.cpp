#include <algorithm>
#include <exception>
#include <orv/mtThreadFactory.h>
#include <orv/mtThreadProtocol.h>

#include "ffmpegPictures.h"
#include "ffmpegSound.h"
#include "readerDevice.h"

namespace MediaHost {

namespace {

constexpr unsigned STACK_BYTES = 1 << 20;  // decoders want more than the standard

}  // namespace

bool ReaderDevice::isAvailable() {
    return true;
}

void ReaderDevice::openFile() {
    // Both at once: to find out what is in a file, some of it is decoded.
    std::unique_ptr<FfmpegInput> sound;
    std::exception_ptr soundError;
    const auto openSound = [&] {
        try {
            sound = FfmpegInput::tryOpen(_file, AVMEDIA_TYPE_AUDIO, 1);
        } catch (...) {
            soundError = std::current_exception();
        }
    };
    Orv::ObjPtr<Orv::MtThread> opening = Orv::MtThreadFactory::getInstance().create(
        getName() + " opening", Orv::MtThreadFunction::create(openSound), false, STACK_BYTES);
    opening->start();
    auto pictures = FfmpegInput::tryOpen(_file, AVMEDIA_TYPE_VIDEO, static_cast<int>(_nbThreads));
    opening.reset();  // joins
    if (soundError) std::rethrow_exception(soundError);
    if (!pictures && !sound) {
        throw MediaError('"' + _file + "\" has neither pictures nor sound");
    }
    double seconds = 0;
    if (pictures) {
        auto decoder = std::make_unique<FfmpegPictures>(std::move(pictures));
        const PictureFormat format = decoder->getFormat();
        seconds = decoder->getSeconds();
        _codecs = decoder->getCodecName();
        addPictures(std::move(decoder), format);
    }
    if (sound) {
        auto decoder = std::make_unique<FfmpegSound>(std::move(sound));
        const SoundFormat format = decoder->getFormat();
        seconds = std::max(seconds, decoder->getSeconds());
        _codecs += (_codecs.empty() ? "" : ", ") + decoder->getCodecName();
        addSound(std::move(decoder), format);
    }
    setDuration(seconds);
}

}  // namespace MediaHost
